#pragma once

#include <algorithm>
#include <cstddef>

// The outputs of a block of the FIR filter. Every output is one float sum
// that starts at +0 and adds taps[k] * x[i - k] for k from m = tapCount - 1
// down to 0, oldest sample first, each product and each sum rounded to float.
// x[t] is delay[m + t] for t < 0 and src[t] from t = 0 on.
//
// Outputs are independent of each other, so the main loop forms eight
// consecutive outputs at once, each in its own accumulator and in the same
// order of summation as the plain loop: the compiler turns the eight lanes
// into vector operations, and no bit changes. The tap loop around them must
// stay scalar (see KernelFlags.cmake).
namespace kestaccel {
namespace filter {
namespace cpp {

constexpr std::size_t kFIROutputsAtOnce = 8;

// Sample t of the joined stream, t counted from the block's first sample.
inline float FIRSample(const float* delay, std::size_t m, const float* src, std::ptrdiff_t t)
{
    return t < 0 ? delay[static_cast<std::ptrdiff_t>(m) + t] : src[t];
}

// Output i, alone: the delay-line part, then the block part.
inline float FIROutput(const float* taps, std::size_t m, const float* delay, const float* src, std::size_t i)
{
    float sum = 0.0f;
    std::size_t k = m;
    for (; k > i; --k) sum += taps[k] * delay[m + i - k];
    for (std::size_t j = i - k; j <= i; ++j, --k) sum += taps[k] * src[j];
    return sum;
}

// Eight outputs from i0 on. Step j (0 to m) pairs taps[m - j] with sample
// i0 + l - m + j in lane l. The steps split into three runs: all lanes in the
// delay line, lanes on both sides of its end (at most seven steps), all lanes
// in the block.
inline void FIROutputs8(const float* taps, std::size_t m, const float* delay, const float* src, std::size_t i0,
                        float* out)
{
    constexpr std::size_t W = kFIROutputsAtOnce;
    float sum[W] = {};
    const std::size_t firstAllInBlock = m > i0 ? m - i0 : 0;
    const std::size_t firstAnyInBlock = m > i0 + (W - 1) ? m - i0 - (W - 1) : 0;
    std::size_t j = 0;
    for (; j < firstAnyInBlock; ++j) {
        const float tap = taps[m - j];
        const float* x = delay + i0 + j;
        for (std::size_t l = 0; l < W; ++l) sum[l] += tap * x[l];
    }
    for (; j < firstAllInBlock; ++j) {
        const float tap = taps[m - j];
        const std::ptrdiff_t t0 = static_cast<std::ptrdiff_t>(i0 + j) - static_cast<std::ptrdiff_t>(m);
        for (std::size_t l = 0; l < W; ++l) {
            sum[l] += tap * FIRSample(delay, m, src, t0 + static_cast<std::ptrdiff_t>(l));
        }
    }
    for (; j <= m; ++j) {
        const float tap = taps[m - j];
        const float* x = src + (i0 + j - m);
        for (std::size_t l = 0; l < W; ++l) sum[l] += tap * x[l];
    }
    for (std::size_t l = 0; l < W; ++l) out[l] = sum[l];
}

// All count outputs of a block into out, which must not overlap src.
inline void FIROutputs(const float* taps, std::size_t m, const float* delay, const float* src, std::size_t count,
                       float* out)
{
    std::size_t i = 0;
    for (; i + kFIROutputsAtOnce <= count; i += kFIROutputsAtOnce) {
        FIROutputs8(taps, m, delay, src, i, out + i);
    }
    for (; i < count; ++i) out[i] = FIROutput(taps, m, delay, src, i);
}

}  // namespace cpp
}  // namespace filter
}  // namespace kestaccel
