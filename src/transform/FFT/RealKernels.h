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

namespace kestaccel {
namespace transform {
namespace cpp {

// Splits the half-size spectrum Z (split arrays) into the spectra of the
// even samples e and the odd samples o, and combines them into the packed
// spectrum X[k] = e[k] + w^k o[k]. Bins k and H - k come from the same pair
// a = Z[k], b = Z[H - k] (k the lower one): the upper bin takes the
// conjugates of the lower bin's e and o. Each loop forms e and o itself with
// the same operations, so every value is that of storing the split first
// and combining afterwards; the two loops store upwards and vectorise.
template <class E>
struct EvenOdd {
    E oRe, oIm, eRe, eIm;
};

template <class E>
inline EvenOdd<E> Split(E ar, E ai, E br, E bi)
{
    return {(ai + bi) * E(0.5), (ar - br) * E(-0.5), (br + ar) * E(0.5), (ai - bi) * E(0.5)};
}

template <class E>
[[gnu::noinline]] void CombineLower(std::size_t h, const E* __restrict zr, const E* __restrict zi,
                                    const E* __restrict w, E* __restrict dst)
{
    for (std::size_t k = 1; k < h / 2; ++k) {
        const EvenOdd<E> v = Split(zr[k], zi[k], zr[h - k], zi[h - k]);
        const E wr = w[2 * (k - 1)], wi = w[2 * (k - 1) + 1];
        dst[2 * k] = (wr * v.oRe + v.eRe) - v.oIm * wi;
        dst[2 * k + 1] = (v.oRe * wi + v.eIm) + wr * v.oIm;
    }
}

template <class E>
[[gnu::noinline]] void CombineUpper(std::size_t h, const E* __restrict zr, const E* __restrict zi,
                                    const E* __restrict w, E* __restrict dst)
{
    for (std::size_t j = h / 2 + 1; j < h; ++j) {
        const EvenOdd<E> v = Split(zr[h - j], zi[h - j], zr[j], zi[j]);
        const E oIm = -v.oIm, eIm = -v.eIm;
        const E wr = w[2 * (j - 1)], wi = w[2 * (j - 1) + 1];
        dst[2 * j] = (wr * v.oRe + v.eRe) - oIm * wi;
        dst[2 * j + 1] = (v.oRe * wi + eIm) + wr * oIm;
    }
}

// The spectrum leaves the scratch through Copy, whose byte count is formed in
// 32 bits. From N * sizeof(E) = 4 GiB on, that count is a multiple of 4 GiB
// plus the two elements of bin 0, and only those reach dst.
template <class E>
bool RealCopyWraps(unsigned int size)
{
    return utility::cpp::ByteCountWraps<E>(size + 2);
}

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
    // The samples, seen as H pairs, go into the scratch as split arrays in
    // bit-reversed order; the complex transform of H points runs there.
    plan.forwardScratch.Resize(2 * plan.size + 2);
    // From 32 samples up, the imaginary parts start 16 elements past the end
    // of the real ones, so the two streams do not sit a multiple of 4 KiB
    // apart (the scratch holds 2N + 2 elements).
    E* zr = plan.forwardScratch.data();
    E* zi = zr + h + (h >= 16 ? 16 : 0);
    const FFTPlan<E>& half = *plan.halfPlan;
    PairsToSplitForward(half, src, zr, zi);
    if (RealCopyWraps<E>(plan.size)) {
        // Bin 0 alone: the rest of the spectrum would not be copied out.
        dst[0] = zr[0] + zi[0];
        dst[1] = E(0) + E(0);
        return;
    }

    const E* w = plan.twiddles;
    CombineLower(h, zr, zi, w, dst);
    CombineUpper(h, zr, zi, w, dst);
    // The middle bin has o = (Z[Q].im, 0) and e = (Z[Q].re, 0).
    const E oRe = zi[q], eRe = zr[q], oIm = E(0), eIm = E(0);
    const E wr = w[2 * (q - 1)], wi = w[2 * (q - 1) + 1];
    dst[2 * q] = (wr * oRe + eRe) - oIm * wi;
    dst[2 * q + 1] = (oRe * wi + eIm) + wr * oIm;
    // DC and Nyquist: Z[0].re plus and minus Z[0].im, with zero imaginary
    // parts formed as 0 + 0 and 0 - 0.
    const E z0Re = zr[0], z0Im = zi[0];
    dst[2 * h] = z0Re - z0Im;
    dst[2 * h + 1] = E(0) - E(0);
    dst[0] = z0Re + z0Im;
    dst[1] = E(0) + E(0);
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
