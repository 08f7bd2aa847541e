#pragma once

// The in-place power-of-two complex transform: decimation in time, radix 2,
// on data put in bit-reversed order first. Forward is unscaled with
// exp(-2 pi i k n / N); the inverse conjugates, runs the forward transform
// and scales by 1/N.

#include <cstddef>
#include <cstdint>

#include "transform/FFT/FFTPlan.h"

namespace kestaccel {
namespace transform {
namespace cpp {

template <class E>
void ComplexFFTForward(const FFTPlan<E>& plan, E* a)
{
    const std::size_t n = plan.size;
    if (n == 1) return;
    for (std::size_t i = 0; i + 1 < n; ++i) {
        const std::size_t p = plan.swapTable[i];
        if (p != i) {
            const E re = a[2 * i], im = a[2 * i + 1];
            a[2 * i] = a[2 * p];
            a[2 * i + 1] = a[2 * p + 1];
            a[2 * p] = re;
            a[2 * p + 1] = im;
        }
    }
    for (std::size_t i = 0; i < n; i += 2) {
        const E xr = a[2 * i], xi = a[2 * i + 1], yr = a[2 * i + 2], yi = a[2 * i + 3];
        a[2 * i] = xr + yr;
        a[2 * i + 1] = xi + yi;
        a[2 * i + 2] = xr - yr;
        a[2 * i + 3] = xi - yi;
    }
    if (plan.order > 1) {
        for (std::size_t b = 0; b < n; b += 4) {
            E* q = a + 2 * b;
            const E ar = q[0], ai = q[1], br = q[4], bi = q[5];
            q[0] = ar + br;
            q[1] = ai + bi;
            q[4] = ar - br;
            q[5] = ai - bi;
            // The factor of the second pair is -i.
            const E xr = q[2], xi = q[3], yr = q[6], yi = q[7];
            q[2] = xr + yi;
            q[3] = xi - yr;
            q[6] = xr - yi;
            q[7] = xi + yr;
        }
    }
    for (std::uint32_t s = 3; s <= plan.order; ++s) {
        const std::size_t half = std::size_t(1) << (s - 1);
        const std::size_t span = half * 2;
        const std::size_t stride = std::size_t(1) << (plan.order - s);
        for (std::size_t j = 0; j < half; ++j) {
            const E wr = plan.twiddles[2 * j * stride], wi = plan.twiddles[2 * j * stride + 1];
            for (std::size_t i = j; i < n; i += span) {
                const std::size_t p = i + half;
                const E tr = a[2 * p] * wr - a[2 * p + 1] * wi;
                const E ti = a[2 * p] * wi + a[2 * p + 1] * wr;
                a[2 * p] = a[2 * i] - tr;
                a[2 * p + 1] = a[2 * i + 1] - ti;
                a[2 * i] = a[2 * i] + tr;
                a[2 * i + 1] = a[2 * i + 1] + ti;
            }
        }
    }
}

template <class E>
void ComplexFFTInverse(const FFTPlan<E>& plan, E* a)
{
    const std::size_t n = plan.size;
    if (n == 1) return;
    const E scale = E(1) / static_cast<E>(plan.size);
    for (std::size_t i = 0; i < n; ++i) a[2 * i + 1] = -a[2 * i + 1];
    ComplexFFTForward(plan, a);
    for (std::size_t i = 0; i < n; ++i) {
        a[2 * i] = a[2 * i] * scale;
        a[2 * i + 1] = a[2 * i + 1] * -scale;
    }
}

}  // namespace cpp
}  // namespace transform
}  // namespace kestaccel
