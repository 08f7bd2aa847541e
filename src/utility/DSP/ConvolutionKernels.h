#pragma once

#include <cstddef>

// Direct linear convolution, zero-stuffing up-sampling and phase-carrying
// down-sampling. All index arithmetic is unsigned 32-bit, as the interface
// defines it.
namespace kestaccel {
namespace utility {
namespace cpp {

// dst[k] = sum over j of b[k - j] * a[j], from +0, in the element type, in
// ascending order of j (the index into the first array), for k = 0 ..
// countA + countB - 2. The direct method at every size, so the order of
// summation never changes.
//
// Each output keeps its own running sum in dst, and the outputs are
// advanced together, one term at a time, so that the inner loop runs over
// independent elements and vectorises without changing a bit. The term
// loop is chosen so the inner loop is the longer array:
//   - over j ascending, adding b[m] * a[j] to dst[j + m] for every m;
//   - over m descending, adding b[m] * a[j] to dst[j + m] for every j,
//     which for a fixed output k = j + m again meets j in ascending order.
// Either way every output sees exactly the terms with j in
// [max(0, k - countB + 1), min(k, countA - 1)], in ascending j, and so has
// the bits of the one-output-at-a-time loop. dst must not overlap a or b.
template <class T>
void Convolve(unsigned int countA, const T* a, unsigned int countB, const T* b, T* dst)
{
    const unsigned int total = countA - 1u + countB;
    for (std::size_t k = 0; k < total; ++k) dst[k] = T(0);
    if (countB >= countA) {
        for (std::size_t j = 0; j < countA; ++j) {
            const T aj = a[j];
            T* out = dst + j;
            for (std::size_t m = 0; m < countB; ++m) out[m] = out[m] + b[m] * aj;
        }
    } else {
        for (std::size_t m = countB; m-- > 0;) {
            const T bm = b[m];
            T* out = dst + m;
            for (std::size_t j = 0; j < countA; ++j) out[j] = out[j] + bm * a[j];
        }
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
