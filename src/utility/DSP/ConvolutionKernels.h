#pragma once

#include <cstddef>

// Direct linear convolution, zero-stuffing up-sampling and phase-carrying
// down-sampling. The output length, the rate-change indices and the phase
// update are unsigned 32-bit arithmetic and wrap as the interface defines.
namespace kestaccel {
namespace utility {
namespace cpp {

// Convolve keeps one running sum per output, in dst, and advances the
// outputs together, so that the inner loops run over independent outputs
// and vectorise without changing a bit. Every output still receives exactly
// the terms b[k - j] * a[j] with j in [max(0, k - countB + 1),
// min(k, countA - 1)], one at a time, in ascending j, from +0: the bits of
// the one-output-at-a-time loop.
//
// The inner loop runs along the longer array. Each pass adds the terms of
// kConvolveGroup consecutive indices of the shorter array to every output
// (in ascending j within the pass), which keeps each output in a register
// for that many terms instead of loading and storing it for every term.
// The few outputs at either end of a pass, which lack some of the pass's
// terms, are done one at a time with the same order.
constexpr std::size_t kConvolveGroup = 4;
static_assert(kConvolveGroup == 4, "the full passes below are written out for four terms");

// The shorter array is b: passes go down b (m descending), which for a
// fixed output k = j + m means ascending j.
template <class T>
void ConvolveAlongA(std::size_t countA, const T* a, std::size_t countB, const T* b, T* dst)
{
    constexpr std::size_t G = kConvolveGroup;
    std::size_t m = countB;
    if (countA >= G) {
        for (; m >= G; m -= G) {
            // Terms d = 0 .. G - 1 use b[top - d] with a[k - top + d].
            const std::size_t top = m - 1;
            const auto termsFor = [&](std::size_t k, std::size_t dFirst, std::size_t dLast) {
                T acc = dst[k];
                for (std::size_t d = dFirst; d <= dLast; ++d) acc = acc + b[top - d] * a[k - top + d];
                dst[k] = acc;
            };
            for (std::size_t k = top + 1 - G; k < top; ++k) termsFor(k, top - k, G - 1);
            const T b0 = b[top], b1 = b[top - 1], b2 = b[top - 2], b3 = b[top - 3];
            T* out = dst + top;
            const std::size_t full = countA - (G - 1);
            for (std::size_t t = 0; t < full; ++t) {
                T acc = out[t];
                acc = acc + b0 * a[t];
                acc = acc + b1 * a[t + 1];
                acc = acc + b2 * a[t + 2];
                acc = acc + b3 * a[t + 3];
                out[t] = acc;
            }
            for (std::size_t k = top + full; k < top + countA; ++k) termsFor(k, 0, top + countA - 1 - k);
        }
    }
    while (m-- > 0) {
        const T bm = b[m];
        T* out = dst + m;
        for (std::size_t j = 0; j < countA; ++j) out[j] = out[j] + bm * a[j];
    }
}

// The shorter array is a: passes go up a (j ascending).
template <class T>
void ConvolveAlongB(std::size_t countA, const T* a, std::size_t countB, const T* b, T* dst)
{
    constexpr std::size_t G = kConvolveGroup;
    std::size_t j = 0;
    if (countB >= G) {
        for (; j + G <= countA; j += G) {
            // Terms d = 0 .. G - 1 use b[k - j - d] with a[j + d].
            const auto termsFor = [&](std::size_t k, std::size_t dFirst, std::size_t dLast) {
                T acc = dst[k];
                for (std::size_t d = dFirst; d <= dLast; ++d) acc = acc + b[k - j - d] * a[j + d];
                dst[k] = acc;
            };
            for (std::size_t k = j; k < j + G - 1; ++k) termsFor(k, 0, k - j);
            const T a0 = a[j], a1 = a[j + 1], a2 = a[j + 2], a3 = a[j + 3];
            T* out = dst + j;
            for (std::size_t t = G - 1; t < countB; ++t) {
                T acc = out[t];
                acc = acc + b[t] * a0;
                acc = acc + b[t - 1] * a1;
                acc = acc + b[t - 2] * a2;
                acc = acc + b[t - 3] * a3;
                out[t] = acc;
            }
            for (std::size_t k = j + countB; k < j + countB + G - 1; ++k) termsFor(k, k - j - countB + 1, G - 1);
        }
    }
    for (; j < countA; ++j) {
        const T aj = a[j];
        T* out = dst + j;
        for (std::size_t m = 0; m < countB; ++m) out[m] = out[m] + b[m] * aj;
    }
}

// dst[k] = sum over j of b[k - j] * a[j] for k = 0 .. countA + countB - 2,
// summed from +0 in the element type in ascending order of j, the index into
// the first array. The direct method at every size, so the order of
// summation never changes. dst must not overlap a or b.
template <class T>
void Convolve(unsigned int countA, const T* a, unsigned int countB, const T* b, T* dst)
{
    const unsigned int total = countA - 1u + countB;
    for (std::size_t k = 0; k < total; ++k) dst[k] = T(0);
    if (countB >= countA) {
        ConvolveAlongB<T>(countA, a, countB, b, dst);
    } else {
        ConvolveAlongA<T>(countA, a, countB, b, dst);
    }
}

template <class T>
void Convolve(unsigned int countA, const T* a, unsigned int countB, const T* b, T* dst, T* /*workBuffer*/)
{
    Convolve(countA, a, countB, b, dst);
}

// No work area is ever needed.
inline unsigned long long ConvolutionWorkBufferSize(unsigned int /*countA*/, unsigned int /*countB*/) { return 0; }

// factor outputs per input: src[i] at offset *phase of its block, zeros
// elsewhere. The phase is read for each element and never changed; a phase
// at or above factor gives only zeros. Not in place for factor above 1.
template <class T>
void UpSample(unsigned int n, const T* src, T* dst, unsigned int factor, unsigned int* phase)
{
    for (unsigned int i = 0; i < n; ++i) {
        for (unsigned int j = 0; j < factor; ++j) {
            const unsigned int index = i * factor + j;
            if (j == *phase) {
                dst[index] = src[i];
            } else {
                dst[index] = T(0);
            }
        }
    }
}

// Keeps src[phase], src[phase + factor], ... of this block, and moves the
// phase on to the offset of the next grid point in the following block, so
// blocks of any length form one continuous decimation. Reads run ahead of
// writes, so in place is safe.
template <class T>
void DownSample(unsigned int n, const T* src, T* dst, unsigned int factor, unsigned int* phase)
{
    const unsigned int p = *phase;
    const unsigned int count = (n - p + factor - 1u) / factor;
    for (unsigned int i = 0; i < count; ++i) dst[i] = src[i * factor + p];
    *phase = (p - n % factor + factor) % factor;
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
