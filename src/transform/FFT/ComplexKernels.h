#pragma once

// The power-of-two complex transform: decimation in time, radix 2, on data
// in bit-reversed order. Forward is unscaled with exp(-2 pi i k n / N); the
// inverse conjugates the input, runs the forward transform and multiplies
// the real parts by 1/N and the imaginary parts by -1/N.
//
// The butterflies of a stage are independent, so they run in an order that
// suits the machine (Butterflies.h says why the bits stay the same):
// - the permutation and stages 1 and 2 (or 1 to 3) run as one pass over
//   groups of 4 (or 8) points held in locals (FirstPassKernels.h);
// - later stages run in pairs: four points a quarter block apart pass
//   through both stages before they are stored again, and the butterfly
//   loop runs over consecutive points, so it vectorises;
// - the stages work on split arrays or on the blocked form, never on
//   interleaved pairs, which would cost a shuffle per vector; the last pair
//   of stages writes the result in the form the caller asked for, scaled
//   there when the inverse needs it.
//
// The loop kernels are kept out of line: inlined into their caller, g++
// loses what their restrict parameters promise and leaves them scalar.

#include <cstddef>
#include <cstdint>
#include <type_traits>

#include "transform/FFT/Butterflies.h"
#include "transform/FFT/FFTPlan.h"
#include "transform/FFT/FirstPassKernels.h"

namespace kestaccel {
namespace transform {
namespace cpp {

// The factors of a stage are gathered from the strided table into small
// split arrays, a chunk of kChunk butterfly positions at a time, so that
// every block of the stage reads them contiguously.
constexpr std::size_t kChunk = 128;

template <class E>
struct FactorChunk {
    E re[kChunk];
    E im[kChunk];

    // Pairs first, first + 1, ... of the table at the given stride. The
    // strides of the last stages, 1 and 2, are spelled out: as constants
    // they give g++ a plain deinterleaving loop.
    void Gather(const E* tw, std::size_t first, std::size_t count, std::size_t stride)
    {
        if (stride == 1) {
            GatherAt<1>(tw + 2 * first, count, 1);
        } else if (stride == 2) {
            GatherAt<2>(tw + 4 * first, count, 2);
        } else {
            GatherAt<0>(tw + 2 * first * stride, count, stride);
        }
    }

    // The q factors of stage s from the 2q of stage s + 1, held whole in b
    // (the first q) and c (the next q): stage s reads the table at twice the
    // stride, so its factors are every other one of those.
    void EveryOtherOf(const FactorChunk& b, const FactorChunk& c, std::size_t q)
    {
        const std::size_t half = q / 2;
        for (std::size_t t = 0; t < half; ++t) {
            re[t] = b.re[2 * t];
            im[t] = b.im[2 * t];
        }
        for (std::size_t t = 0; t < half; ++t) {
            re[half + t] = c.re[2 * t];
            im[half + t] = c.im[2 * t];
        }
    }

    template <std::size_t kStride>
    void GatherAt(const E* from, std::size_t count, std::size_t stride)
    {
        const std::size_t step = kStride != 0 ? kStride : stride;
        for (std::size_t t = 0; t < count; ++t) {
            re[t] = from[2 * t * step];
            im[t] = from[2 * t * step + 1];
        }
    }
};

// Where a pair of stages leaves its result: over the working array in its
// own form; over it as interleaved pairs (a block covers the same bytes as
// its points in pairs); or in separate split arrays. Only the last pair
// writes anything but kInPlace. With kScale the real parts are multiplied
// by scale and the imaginary parts by -scale, which undoes the inverse's
// conjugation and divides by N in one step.
enum class Output { kInPlace, kPairsInPlace, kSplitArrays };

template <class E, Form F, Output kOut, bool kScale>
struct Writer {
    E scale;
    E negScale;

    // Point start + t of a stream held at re/im in the working array; the
    // split output of that stream starts at outRe/outIm.
    void Put(E* re, E* im, E* outRe, E* outIm, std::size_t start, std::size_t t, E xr, E xi) const
    {
        const E yr = kScale ? xr * scale : xr;
        const E yi = kScale ? xi * negScale : xi;
        if constexpr (kOut == Output::kInPlace) {
            Points<E, F>::Re(re, im, start, t) = yr;
            Points<E, F>::Im(re, im, start, t) = yi;
        } else if constexpr (kOut == Output::kPairsInPlace) {
            Points<E, Form::kPairs>::Re(re, im, start, t) = yr;
            Points<E, Form::kPairs>::Im(re, im, start, t) = yi;
        } else {
            outRe[start + t] = yr;
            outIm[start + t] = yi;
        }
    }
};

// Two consecutive stages s and s + 1 over blocks of 4q points, q the half
// span of stage s. Points j, j + q, j + 2q, j + 3q: stage s pairs the first
// two and the last two with factor a[j]; stage s + 1 then pairs j with
// j + 2q (factor b[j]) and j + q with j + 3q (factor c[j]). The four
// streams start at r0 .. r3 (and i0 .. i3 in the split form), their split
// outputs, if any, at o0r/o0i .. o3r/o3i. Each block of kLanes points is
// read whole before anything is written, since the pair output rewrites
// the bytes of the block in another order.
template <class E, Form F, Output kOut, bool kScale>
[[gnu::noinline]] void StagePairRun(std::size_t blocks, std::size_t span, std::size_t count, E* __restrict r0,
                                    E* __restrict i0, E* __restrict r1, E* __restrict i1, E* __restrict r2,
                                    E* __restrict i2, E* __restrict r3, E* __restrict i3, const E* __restrict ar_,
                                    const E* __restrict ai_, const E* __restrict br_, const E* __restrict bi_,
                                    const E* __restrict cr_, const E* __restrict ci_, E* __restrict o0r,
                                    E* __restrict o0i, E* __restrict o1r, E* __restrict o1i, E* __restrict o2r,
                                    E* __restrict o2i, E* __restrict o3r, E* __restrict o3i, E scale)
{
    using P = Points<E, F>;
    constexpr std::size_t lanes = kLanes<E>;
    const Writer<E, F, kOut, kScale> out{scale, -scale};
    for (std::size_t b = 0; b < blocks; ++b) {
        const std::size_t o = b * span;
        for (std::size_t j = 0; j < count; j += lanes) {
            const std::size_t k = o + j;
            E ar[lanes], ai[lanes], br[lanes], bi[lanes], cr[lanes], ci[lanes], dr[lanes], di[lanes];
            for (std::size_t t = 0; t < lanes; ++t) {
                ar[t] = P::Re(r0, i0, k, t), ai[t] = P::Im(r0, i0, k, t), br[t] = P::Re(r1, i1, k, t);
                bi[t] = P::Im(r1, i1, k, t), cr[t] = P::Re(r2, i2, k, t), ci[t] = P::Im(r2, i2, k, t);
                dr[t] = P::Re(r3, i3, k, t), di[t] = P::Im(r3, i3, k, t);
            }
            for (std::size_t t = 0; t < lanes; ++t) {
                const std::size_t u = j + t;
                Butterfly(ar[t], ai[t], br[t], bi[t], ar_[u], ai_[u]);
                Butterfly(cr[t], ci[t], dr[t], di[t], ar_[u], ai_[u]);
                Butterfly(ar[t], ai[t], cr[t], ci[t], br_[u], bi_[u]);
                Butterfly(br[t], bi[t], dr[t], di[t], cr_[u], ci_[u]);
            }
            for (std::size_t t = 0; t < lanes; ++t) {
                out.Put(r0, i0, o0r, o0i, k, t, ar[t], ai[t]);
                out.Put(r1, i1, o1r, o1i, k, t, br[t], bi[t]);
                out.Put(r2, i2, o2r, o2i, k, t, cr[t], ci[t]);
                out.Put(r3, i3, o3r, o3i, k, t, dr[t], di[t]);
            }
        }
    }
}

// Split parts of count points into pairs.
template <class E>
[[gnu::noinline]] void InterleaveParts(std::size_t count, const E* __restrict re, const E* __restrict im,
                                       E* __restrict pairs)
{
    for (std::size_t k = 0; k < count; ++k) {
        pairs[2 * k] = re[k];
        pairs[2 * k + 1] = im[k];
    }
}

// Stages s and s + 1; the last pair (s + 1 = order) writes the output.
// Pairs go through split arrays on the stack, a chunk at a time, and are
// interleaved from there: written by the butterfly loop itself, they make
// g++ arrange the whole loop around interleaved vectors, with twice the
// instructions. The pairs of a chunk's points cover the bytes of the same
// points in the blocked form, which no other chunk reads.
template <class E, Form F, Output kOut, bool kScale>
void StagePair(const FFTPlan<E>& plan, std::uint32_t s, E* re, E* im, E* outRe, E* outIm, E scale)
{
    using P = Points<E, F>;
    static_assert(kOut != Output::kPairsInPlace || F == Form::kBlocked, "pairs come from the blocked form");
    const std::size_t n = plan.size;
    const std::size_t q = std::size_t(1) << (s - 1);
    const std::size_t strideB = std::size_t(1) << (plan.order - s - 1);
    // Output streams exist only for split arrays; null pointers stay unused.
    const auto at = [](E* p, std::size_t k) { return p == nullptr ? p : p + k; };
    FactorChunk<E> a, b, c;
    for (std::size_t j0 = 0; j0 < q; j0 += kChunk) {
        const std::size_t count = q - j0 < kChunk ? q - j0 : kChunk;
        b.Gather(plan.twiddles, j0, count, strideB);
        c.Gather(plan.twiddles, j0 + q, count, strideB);
        if (q <= kChunk) a.EveryOtherOf(b, c, q);
        else a.Gather(plan.twiddles, j0, count, 2 * strideB);
        const std::size_t o0 = P::Offset(j0), o1 = P::Offset(j0 + q), o2 = P::Offset(j0 + 2 * q),
                          o3 = P::Offset(j0 + 3 * q);
        if constexpr (kOut == Output::kPairsInPlace) {
            // Only the last pair writes pairs, and it spans one block.
            E partsRe[4][kChunk], partsIm[4][kChunk];
            StagePairRun<E, F, Output::kSplitArrays, kScale>(
                1, 4 * q, count, re + o0, im + o0, re + o1, im + o1, re + o2, im + o2, re + o3, im + o3, a.re, a.im,
                b.re, b.im, c.re, c.im, partsRe[0], partsIm[0], partsRe[1], partsIm[1], partsRe[2], partsIm[2],
                partsRe[3], partsIm[3], scale);
            for (std::size_t m = 0; m < 4; ++m) InterleaveParts(count, partsRe[m], partsIm[m], re + 2 * (j0 + m * q));
        } else {
            StagePairRun<E, F, kOut, kScale>(n >> (s + 1), 4 * q, count, re + o0, im + o0, re + o1, im + o1,
                                             re + o2, im + o2, re + o3, im + o3, a.re, a.im, b.re, b.im, c.re, c.im,
                                             at(outRe, j0), at(outIm, j0), at(outRe, j0 + q), at(outIm, j0 + q),
                                             at(outRe, j0 + 2 * q), at(outIm, j0 + 2 * q), at(outRe, j0 + 3 * q),
                                             at(outIm, j0 + 3 * q), scale);
        }
    }
}

// When the first pass took every stage (4 or 8 points), only the output
// step remains.
template <class E, Form F, Output kOut, bool kScale>
[[gnu::noinline]] void WriteOut(std::size_t n, E* __restrict re, E* __restrict im, E* __restrict outRe,
                                E* __restrict outIm, E scale)
{
    using P = Points<E, F>;
    constexpr std::size_t lanes = kLanes<E>;
    const Writer<E, F, kOut, kScale> out{scale, -scale};
    for (std::size_t j = 0; j < n; j += lanes) {
        E xr[lanes], xi[lanes];
        for (std::size_t t = 0; t < lanes; ++t) {
            xr[t] = P::Re(re, im, j, t);
            xi[t] = P::Im(re, im, j, t);
        }
        for (std::size_t t = 0; t < lanes; ++t) out.Put(re, im, outRe, outIm, j, t, xr[t], xi[t]);
    }
}

// The stages from s on, on the working array after the first pass; the
// last pair writes the output.
template <class E, Form F, Output kOut, bool kScale>
void RemainingStages(const FFTPlan<E>& plan, std::uint32_t s, E* re, E* im, E* outRe, E* outIm, E scale)
{
    if (s > plan.order) {
        if (kOut != Output::kInPlace || kScale) WriteOut<E, F, kOut, kScale>(plan.size, re, im, outRe, outIm, scale);
        return;
    }
    for (; s + 1 < plan.order; s += 2) StagePair<E, F, Output::kInPlace, false>(plan, s, re, im, nullptr, nullptr, scale);
    StagePair<E, F, kOut, kScale>(plan, s, re, im, outRe, outIm, scale);
}

// The four stage-3 factors of a plan (at an eighth of its table apart), for
// the first pass of an odd order.
template <class E>
struct StageThreeFactors {
    E w[8] = {};

    explicit StageThreeFactors(const FFTPlan<E>& plan)
    {
        if ((plan.order & 1u) == 0) return;
        const std::size_t stride = std::size_t(1) << (plan.order - 3);
        for (std::size_t t = 0; t < 4; ++t) {
            w[2 * t] = plan.twiddles[2 * t * stride];
            w[2 * t + 1] = plan.twiddles[2 * t * stride + 1];
        }
    }
};

// Transforms of 2 points: one butterfly, with the inverse's conjugation
// and scaling around it.
template <class E, bool kInverse>
void TwoPoints(const E* srcRe, const E* srcIm, std::size_t srcStep, E* re, E* im, std::size_t step)
{
    E xr = srcRe[0], xi = srcIm[0], yr = srcRe[srcStep], yi = srcIm[srcStep];
    if (kInverse) {
        xi = -xi;
        yi = -yi;
    }
    SumDifference(xr, xi, yr, yi);
    const E scale = E(1) / E(2), negScale = -scale;
    re[0] = kInverse ? xr * scale : xr;
    im[0] = kInverse ? xi * negScale : xi;
    re[step] = kInverse ? yr * scale : yr;
    im[step] = kInverse ? yi * negScale : yi;
}

// The first pass, by groups of 4 points for even orders and 8 for odd ones
// (so that an even number of stages remains for the pairs), then the
// remaining stages. firstPass(group, w) runs the pass for that group size.
template <class E, Form F, Output kOut, bool kInverse, class FirstPassFn>
void StagesFrom(const FFTPlan<E>& plan, E* re, E* im, E* outRe, E* outIm, FirstPassFn firstPass)
{
    const StageThreeFactors<E> factors(plan);
    const E scale = E(1) / static_cast<E>(plan.size);
    if ((plan.order & 1u) == 0) {
        firstPass(std::integral_constant<std::size_t, 4>{}, factors.w);
        RemainingStages<E, F, kOut, kInverse>(plan, 3, re, im, outRe, outIm, scale);
    } else {
        firstPass(std::integral_constant<std::size_t, 8>{}, factors.w);
        RemainingStages<E, F, kOut, kInverse>(plan, 4, re, im, outRe, outIm, scale);
    }
}

// The transform of plan.size points read from a distinct source in form
// kSrc, worked on in re/im in form F and left as kOut says. One point is
// copied as it is; two take a single butterfly.
template <class E, Form kSrc, Form F, Output kOut, bool kInverse>
void TransformFrom(const FFTPlan<E>& plan, const E* srcRe, const E* srcIm, E* re, E* im, E* outRe, E* outIm)
{
    if (plan.size <= 2) {
        E* finalRe = kOut == Output::kSplitArrays ? outRe : re;
        E* finalIm = kOut == Output::kSplitArrays ? outIm : kOut == Output::kPairsInPlace ? re + 1 : im;
        const std::size_t finalStep = kOut == Output::kPairsInPlace ? 2 : 1;
        if (plan.size == 1) {
            finalRe[0] = srcRe[0];
            finalIm[0] = srcIm[0];
        } else {
            TwoPoints<E, kInverse>(srcRe, srcIm, Points<E, kSrc>::Offset(1), finalRe, finalIm, finalStep);
        }
        return;
    }
    StagesFrom<E, F, kOut, kInverse>(plan, re, im, outRe, outIm, [&](auto group, const E* w) {
        FirstPass<E, kSrc, F, kInverse, decltype(group)::value>(plan.order, srcRe, srcIm, re, im, w);
    });
}

// Interleaved pairs in place: the swap-table exchanges, then the same
// stages, the first pass turning each group into the blocked form.
template <class E, bool kInverse>
void PairsInPlace(const FFTPlan<E>& plan, E* pairs)
{
    const std::size_t n = plan.size;
    if (n == 1) return;
    if (n == 2) {
        TwoPoints<E, kInverse>(pairs, pairs + 1, 2, pairs, pairs + 1, 2);
        return;
    }
    SwapByTable(n, plan.swapTable, pairs);
    StagesFrom<E, Form::kBlocked, Output::kPairsInPlace, kInverse>(
        plan, pairs, pairs, nullptr, nullptr, [&](auto group, const E* w) {
            constexpr std::size_t kGroup = decltype(group)::value;
            FirstStagesInPlace<E, kInverse, kGroup>(n / kGroup, pairs, w);
        });
}

// Interleaved pairs from a distinct source into dst, which is also the
// work array: the same bits as copying first and transforming in place.
template <class E, bool kInverse>
void PairsInto(const FFTPlan<E>& plan, const E* src, E* dst)
{
    TransformFrom<E, Form::kPairs, Form::kBlocked, Output::kPairsInPlace, kInverse>(plan, src, src + 1, dst, dst,
                                                                                   nullptr, nullptr);
}

// Split arrays through a work array of 2 * size elements in the blocked
// form; the last stages write the destination arrays. The work array keeps
// the stages away from the caller's arrays, which often lie a multiple of
// 4 KiB apart and would make loads wait on unrelated stores.
template <class E, bool kInverse>
void SplitVia(const FFTPlan<E>& plan, const E* srcRe, const E* srcIm, E* work, E* re, E* im)
{
    TransformFrom<E, Form::kSplit, Form::kBlocked, Output::kSplitArrays, kInverse>(plan, srcRe, srcIm, work, work,
                                                                                  re, im);
}

// The forward transform of pairs from a distinct source into split arrays,
// which are also the work arrays (the real transform's half).
template <class E>
void PairsToSplitForward(const FFTPlan<E>& plan, const E* src, E* re, E* im)
{
    TransformFrom<E, Form::kPairs, Form::kSplit, Output::kInPlace, false>(plan, src, src + 1, re, im, nullptr, nullptr);
}

template <class E>
void ComplexFFTForward(const FFTPlan<E>& plan, E* pairs)
{
    PairsInPlace<E, false>(plan, pairs);
}

template <class E>
void ComplexFFTInverse(const FFTPlan<E>& plan, E* pairs)
{
    PairsInPlace<E, true>(plan, pairs);
}

}  // namespace cpp
}  // namespace transform
}  // namespace kestaccel
