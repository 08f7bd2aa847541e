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
inline namespace KESTACCEL_FFT_WIDTH_NAMESPACE {

// Splits the half-size spectrum Z (split arrays) into the spectra of the
// even samples e and the odd samples o, and combines them into the packed
// spectrum X[k] = e[k] + w^k o[k]. Bins k and H - k come from the same pair
// a = Z[k], b = Z[H - k] (k the lower one): the upper bin takes the
// conjugates of the lower bin's e and o. Each pair is split once for both
// bins, with the operations of storing the split first and combining
// afterwards.
template <class E>
struct EvenOdd {
    E oRe, oIm, eRe, eIm;
};

template <class E>
inline EvenOdd<E> Split(E ar, E ai, E br, E bi)
{
    return {(ai + bi) * E(0.5), (ar - br) * E(-0.5), (br + ar) * E(0.5), (ai - bi) * E(0.5)};
}

// Bins k and H - k for k = 1 .. H/2 - 1, kLanes values of k at a time (H/2
// is kLanes at least). The mirrored operands of a block are read into
// locals in its order first, so that the loop over its lanes runs upwards
// everywhere and vectorises across bins; the (re, im) of a bin then never
// share a vector, where g++ would fuse a product into their add/subtract
// pair under AVX-512. The lanes of the last block past H/2 - 1 read valid
// elements and are not stored.
template <class E, std::size_t kLanes>
[[gnu::noinline]] void CombineBins(std::size_t h, const E* __restrict zr, const E* __restrict zi,
                                   const E* __restrict w, E* __restrict dst)
{
    const std::size_t q = h / 2;
    for (std::size_t k0 = 1; k0 < q; k0 += kLanes) {
        E br[kLanes], bi[kLanes], ur[kLanes], ui[kLanes];
        for (std::size_t t = 0; t < kLanes; ++t) {
            br[t] = zr[h - k0 - t];
            bi[t] = zi[h - k0 - t];
        }
        for (std::size_t t = 0; t < kLanes; ++t) {
            ur[t] = w[2 * (h - k0 - t - 1)];
            ui[t] = w[2 * (h - k0 - t - 1) + 1];
        }
        E lowRe[kLanes], lowIm[kLanes], upRe[kLanes], upIm[kLanes];
        KESTACCEL_FFT_INDEPENDENT_LANES
        for (std::size_t t = 0; t < kLanes; ++t) {
            const std::size_t k = k0 + t;
            const EvenOdd<E> v = Split(zr[k], zi[k], br[t], bi[t]);
            const E wr = w[2 * (k - 1)], wi = w[2 * (k - 1) + 1];
            lowRe[t] = (wr * v.oRe + v.eRe) - v.oIm * wi;
            lowIm[t] = (v.oRe * wi + v.eIm) + wr * v.oIm;
            const E oIm = -v.oIm, eIm = -v.eIm;
            upRe[t] = (ur[t] * v.oRe + v.eRe) - oIm * ui[t];
            upIm[t] = (v.oRe * ui[t] + eIm) + ur[t] * oIm;
        }
        const std::size_t count = q - k0 < kLanes ? q - k0 : kLanes;
        for (std::size_t t = 0; t < count; ++t) {
            dst[2 * (k0 + t)] = lowRe[t];
            dst[2 * (k0 + t) + 1] = lowIm[t];
        }
        const std::size_t top = h - k0 - count + 1;
        for (std::size_t u = 0; u < count; ++u) {
            dst[2 * (top + u)] = upRe[count - 1 - u];
            dst[2 * (top + u) + 1] = upIm[count - 1 - u];
        }
    }
}

// The bins below H/2 and above it, kLanes at a time where H/2 allows it,
// else two.
template <class E, std::size_t kLanes>
void Combine(std::size_t h, const E* zr, const E* zi, const E* w, E* dst)
{
    if (h / 2 >= kLanes) {
        CombineBins<E, kLanes>(h, zr, zi, w, dst);
    } else if (h / 2 >= 2) {
        CombineBins<E, 2>(h, zr, zi, w, dst);
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

// kLanes is the block of the kernels, as in ComplexKernels.h.
template <class E, std::size_t kLanes = kVectorLanes<E>>
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
    PairsToSplitForward<E, kLanes>(half, src, zr, zi);
    if (RealCopyWraps<E>(plan.size)) {
        // Bin 0 alone: the rest of the spectrum would not be copied out.
        dst[0] = zr[0] + zi[0];
        dst[1] = E(0) + E(0);
        return;
    }

    const E* w = plan.twiddles;
    Combine<E, kLanes>(h, zr, zi, w, dst);
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
template <class State, class E, std::size_t kLanes = kVectorLanes<E>>
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
    RealFFTForward<E, kLanes>(plan, dst, y);
    for (std::size_t k = 0; k <= h; ++k) dst[k] = (y[2 * k + 1] + y[2 * k]) * scale;
    for (std::size_t k = h + 1; k < n; ++k) dst[k] = (y[2 * (n - k)] - y[2 * (n - k) + 1]) * scale;
}

}  // namespace KESTACCEL_FFT_WIDTH_NAMESPACE
}  // namespace cpp
}  // namespace transform
}  // namespace kestaccel
