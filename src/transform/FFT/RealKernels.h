#pragma once

// The transform of N real samples through a complex transform of N/2
// points. The forward result is the packed half spectrum: N + 2 elements,
// (re, im) of bins 0 .. N/2, with exact zeros as the imaginary parts of DC
// and Nyquist. The inverse uses the Hartley identity and runs the forward
// transform a second time, so it needs neither a conjugate table nor a
// second kernel.

#include <cstddef>

#include "transform/FFT/ComplexKernels.h"
#include "transform/FFT/FFTPlan.h"
#include "utility/VectorUtils/BufferKernels.h"

namespace kestaccel {
namespace transform {
namespace cpp {

template <class E>
void RealFFTForward(FFTPlan<E>& plan, const E* src, E* dst)
{
    const std::size_t n = plan.size;
    if (n == 1) {
        dst[0] = src[0];
        dst[1] = E(0);
        return;
    }
    if (n == 2) {
        const E x0 = src[0], x1 = src[1];
        dst[0] = x1 + x0;
        dst[1] = E(0);
        dst[2] = x0 - x1;
        dst[3] = E(0);
        return;
    }
    const std::size_t h = n / 2, q = n / 4;
    plan.forwardScratch.Resize(2 * plan.size + 2);
    E* s = plan.forwardScratch.data();
    if (src != s) utility::cpp::Copy(plan.size, src, s);
    ComplexFFTForward(*plan.halfPlan, s);

    // Split Z into the spectra of the even (e) and odd (o) samples. The
    // conjugates go to the mirrored bins so that the combine loop below
    // needs no case for the upper half.
    for (std::size_t k = 1; k < q; ++k) {
        const std::size_t j = h - k;
        const E ar = s[2 * k], ai = s[2 * k + 1], br = s[2 * j], bi = s[2 * j + 1];
        const E oRe = (ai + bi) * E(0.5);
        const E oIm = (ar - br) * E(-0.5);
        const E eRe = (br + ar) * E(0.5);
        const E eIm = (ai - bi) * E(0.5);
        s[2 * (h + k)] = oRe;
        s[2 * (h + k) + 1] = oIm;
        s[2 * (2 * h - k)] = oRe;
        s[2 * (2 * h - k) + 1] = -oIm;
        s[2 * k] = eRe;
        s[2 * k + 1] = eIm;
        s[2 * j] = eRe;
        s[2 * j + 1] = -eIm;
    }
    s[2 * (h + q)] = s[2 * q + 1];
    s[2 * (h + q) + 1] = E(0);
    s[2 * q + 1] = E(0);

    const E z0Re = s[0], z0Im = s[1];
    s[2 * h] = z0Re - z0Im;
    s[2 * h + 1] = E(0) - E(0);
    s[0] = z0Re + z0Im;
    s[1] = E(0) + E(0);

    const E* w = plan.twiddles;
    for (std::size_t k = 1; k < h; ++k) {
        const E wr = w[2 * (k - 1)], wi = w[2 * (k - 1) + 1];
        const E oRe = s[2 * (h + k)], oIm = s[2 * (h + k) + 1];
        const E eRe = s[2 * k], eIm = s[2 * k + 1];
        s[2 * k] = (wr * oRe + eRe) - oIm * wi;
        s[2 * k + 1] = (oRe * wi + eIm) + wr * oIm;
    }
    utility::cpp::Copy(plan.size + 2, s, dst);
}

// State is FFTState_Float or FFTState_Double; its plan is a real plan.
template <class State, class E>
void RealFFTInverse(const E* src, E* dst, State* state)
{
    FFTPlan<E>& plan = state->plan;
    const std::size_t n = plan.size;
    const E scale = E(1) / static_cast<E>(plan.size);
    if (n == 1) {
        dst[0] = src[0];
        return;
    }
    if (n == 2) {
        dst[0] = (src[2] + src[0]) * scale;
        dst[1] = (src[0] - src[2]) * scale;
        return;
    }
    const std::size_t h = n / 2;
    // Hartley sums: Re X[k] + Im X[k], the upper bins through
    // X[k] = conj X[N - k].
    for (std::size_t k = 0; k <= h; ++k) dst[k] = src[2 * k + 1] + src[2 * k];
    for (std::size_t k = h + 1; k < n; ++k) dst[k] = src[2 * (n - k)] - src[2 * (n - k) + 1];
    plan.inverseScratch.Resize(2 * plan.size + 2);
    E* y = plan.inverseScratch.data();
    RealFFTForward(plan, dst, y);
    for (std::size_t k = 0; k <= h; ++k) dst[k] = (y[2 * k + 1] + y[2 * k]) * scale;
    for (std::size_t k = h + 1; k < n; ++k) dst[k] = (y[2 * (n - k)] - y[2 * (n - k) + 1]) * scale;
}

}  // namespace cpp
}  // namespace transform
}  // namespace kestaccel
