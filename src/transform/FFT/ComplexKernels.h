#pragma once

// The power-of-two complex transform: decimation in time, radix 2, on data
// in bit-reversed order. Forward is unscaled with exp(-2 pi i k n / N); the
// inverse conjugates the input, runs the forward transform and multiplies
// the real parts by 1/N and the imaginary parts by -1/N.
//
// The butterflies of a stage are independent, so they run in an order that
// suits the machine (Butterflies.h says why the bits stay the same):
// - the permutation and the first stages run as one pass over groups of 8
//   or 16 points held in locals (FirstPassKernels.h);
// - the later stages run two or three at a time: the points that meet in
//   those stages pass through all of them before they are stored again,
//   and the butterfly loop runs over consecutive points, so it vectorises;
// - the stages work on split arrays or on the blocked form, never on
//   interleaved pairs, which would cost a shuffle per vector; the last pass
//   writes the result in the form the caller asked for, scaled there when
//   the inverse needs it.
// Transforms of one group (up to 8 or 16 points) take all their stages in
// locals and write the result directly.
//
// kLanes, the points of a block, is one vector of the build's width
// (kVectorLanes) unless a test asks for another: the results are the same
// bits for every width.
//
// The loop kernels are kept out of line: inlined into their caller, g++
// loses what their restrict parameters promise and leaves them scalar.

#include <cstddef>
#include <cstdint>

#include "transform/FFT/Butterflies.h"
#include "transform/FFT/FFTPlan.h"
#include "transform/FFT/FirstPassKernels.h"

namespace kestaccel {
namespace transform {
namespace cpp {
inline namespace KESTACCEL_FFT_WIDTH_NAMESPACE {

// The first pass takes the first log2(span) stages, where span, the points
// that meet in them, is a block at least (the later stages pair points a
// block apart or more) and 4 at least. With blocks of 4 or fewer it takes a
// stage more when that saves a pass; wider, the 16 points of a group would
// not fit in the registers. It works on groups of 8 points at least, the
// fewest whose stored points fill a cache line, and its stages run across a
// run of groups, one vector's worth (at least 4).
template <std::size_t kLanes>
constexpr std::size_t kNarrowSpan = kLanes > 4 ? kLanes : 4;
template <std::size_t kLanes>
constexpr std::size_t kWideSpan = kLanes > 4 ? kNarrowSpan<kLanes> : 2 * kNarrowSpan<kLanes>;
template <std::size_t kSpan>
constexpr std::size_t kGroupPoints = kSpan > 8 ? kSpan : 8;
template <std::size_t kLanes>
constexpr std::size_t kRunGroups = kLanes > 4 ? kLanes : 4;

// Passes over the data for the stages after the first pass: three stages
// at a time (RemainingStages).
constexpr unsigned int PassesFor(unsigned int stages) { return (stages + 2) / 3; }

template <std::size_t kLanes>
bool WideFirstPass(std::uint32_t order)
{
    constexpr unsigned int narrow = Log2(kNarrowSpan<kLanes>), wide = Log2(kWideSpan<kLanes>);
    return wide > narrow && PassesFor(order - wide) < PassesFor(order - narrow);
}

// The factors of stages 3 onwards of a first pass of kGroup points, read
// from the table (stage s at a stride of N / 2^s), as FirstStages takes
// them.
template <class E>
struct FirstPassFactors {
    E w[2 * (4 + 8)] = {};

    FirstPassFactors(const FFTPlan<E>& plan, std::size_t group)
    {
        E* to = w;
        for (std::uint32_t s = 3; (std::size_t(1) << s) <= group; ++s) {
            const std::size_t half = std::size_t(1) << (s - 1), stride = std::size_t(1) << (plan.order - s);
            for (std::size_t j = 0; j < half; ++j) {
                to[2 * j] = plan.twiddles[2 * j * stride];
                to[2 * j + 1] = plan.twiddles[2 * j * stride + 1];
            }
            to += 2 * half;
        }
    }
};

// A pass takes stages s to s + K - 1 over blocks of 2^K q points, q the
// half span of stage s: its 2^K streams, points j + p q (p < 2^K), meet
// only each other. Stage s + i pairs streams p and p + 2^i (bit i of p
// clear) with factor (p mod 2^i) q + j of that stage. The factors are
// gathered from the strided table into split arrays, a chunk of up to
// kChunk positions j at a time, so that every block of the pass reads them
// contiguously: stage s + i holds 2^i rows (row r for p mod 2^i = r) of
// `count` positions, one after the other from row 2^i - 1 on.
constexpr std::size_t kChunk = 128;

template <class E, unsigned int K>
struct FactorChunk {
    static constexpr std::size_t kRows = (std::size_t(1) << K) - 1;
    E re[kRows * kChunk];
    E im[kRows * kChunk];

    // The factors of positions first .. first + count - 1 of each row of
    // stages s to s + stages - 1. When the chunk holds all q positions, the
    // rows of a stage are its first 2^i q factors in order, and they are
    // every other one of the next stage's (read at twice its stride): only
    // the last stage is read from the table.
    void Gather(const FFTPlan<E>& plan, std::uint32_t s, unsigned int stages, std::size_t first, std::size_t count)
    {
        if (stages == 0) return;
        const std::size_t q = std::size_t(1) << (s - 1);
        if (count == q) {
            const unsigned int last = stages - 1;
            const std::size_t rows = std::size_t(1) << last;
            GatherRow(plan.twiddles, rows * q, std::size_t(1) << (plan.order - s - last), re + (rows - 1) * q,
                      im + (rows - 1) * q);
            for (std::size_t r = rows / 2; r >= 1; r /= 2)
                EveryOther(re + (2 * r - 1) * q, im + (2 * r - 1) * q, r * q, re + (r - 1) * q, im + (r - 1) * q);
            return;
        }
        for (unsigned int i = 0; i < stages; ++i) {
            const std::size_t stride = std::size_t(1) << (plan.order - s - i);
            for (std::size_t r = 0; r < (std::size_t(1) << i); ++r) {
                const std::size_t row = (std::size_t(1) << i) - 1 + r;
                GatherRow(plan.twiddles + 2 * (r * q + first) * stride, count, stride, re + row * count,
                          im + row * count);
            }
        }
    }

    // The strides of the last stages, 1, 2 and 4, are spelled out: as
    // constants they give g++ a plain deinterleaving loop.
    static void GatherRow(const E* from, std::size_t count, std::size_t stride, E* toRe, E* toIm)
    {
        switch (stride) {
        case 1:
            return GatherAt<1>(from, count, 1, toRe, toIm);
        case 2:
            return GatherAt<2>(from, count, 2, toRe, toIm);
        case 4:
            return GatherAt<4>(from, count, 4, toRe, toIm);
        default:
            return GatherAt<0>(from, count, stride, toRe, toIm);
        }
    }

    template <std::size_t kStride>
    static void GatherAt(const E* from, std::size_t count, std::size_t stride, E* toRe, E* toIm)
    {
        const std::size_t step = kStride != 0 ? kStride : stride;
        for (std::size_t t = 0; t < count; ++t) {
            toRe[t] = from[2 * t * step];
            toIm[t] = from[2 * t * step + 1];
        }
    }

    static void EveryOther(const E* fromRe, const E* fromIm, std::size_t count, E* toRe, E* toIm)
    {
        for (std::size_t t = 0; t < count; ++t) {
            toRe[t] = fromRe[2 * t];
            toIm[t] = fromIm[2 * t];
        }
    }
};

// Where a pass leaves its result: over the working array in its own form;
// over it as interleaved pairs (a block covers the same bytes as its
// points in pairs); or in separate split arrays. Only the last pass writes
// anything but kInPlace. With kScale the real parts are multiplied by scale
// and the imaginary parts by -scale, which undoes the inverse's
// conjugation and divides by N in one step.
enum class Output { kInPlace, kPairsInPlace, kSplitArrays };

// Stages s to s + K - 1 over `blocks` blocks of span points, for the
// positions j below count (a multiple of kLanes) of the chunk that re/im
// (and outRe/outIm) start at. The factors are those of the chunk; with
// kLastFromTable the last stage's come from the table instead, which holds
// them in order when that stage is the transform's last (pairs at stride
// 1, tw at the chunk's first one): deinterleaved as they are loaded, they
// cost no gathering. The
// loop over the lanes of a block holds each lane's 2^K points in locals;
// lanes touch distinct elements, so it vectorises whole. A pair output
// rewrites the bytes of a block in another order, so its blocks are all
// read before any is written.
template <class E, Form F, unsigned int K, Output kOut, bool kScale, bool kLastFromTable, std::size_t kLanes>
[[gnu::noinline]] void StagesRun(std::size_t blocks, std::size_t span, std::size_t q, std::size_t count,
                                 E* __restrict re, E* __restrict im, const E* __restrict fr,
                                 const E* __restrict fi, const E* __restrict tw, E* __restrict outRe,
                                 E* __restrict outIm, E scale)
{
    using P = Points<E, F, kLanes>;
    constexpr std::size_t kStreams = std::size_t(1) << K;
    const E negScale = -scale;
    for (std::size_t b = 0; b < blocks; ++b) {
        for (std::size_t j = 0; j < count; j += kLanes) {
            const std::size_t k = b * span + j;
            E pairRe[kOut == Output::kPairsInPlace ? kStreams : 1][kLanes];
            E pairIm[kOut == Output::kPairsInPlace ? kStreams : 1][kLanes];
            KESTACCEL_FFT_INDEPENDENT_LANES
            for (std::size_t t = 0; t < kLanes; ++t) {
                E xr[kStreams], xi[kStreams];
                KESTACCEL_FFT_UNROLL(8)
                for (std::size_t p = 0; p < kStreams; ++p) {
                    xr[p] = P::Re(re, im, k + p * q, t);
                    xi[p] = P::Im(re, im, k + p * q, t);
                }
                KESTACCEL_FFT_UNROLL(3)
                for (unsigned int i = 0; i < K; ++i) {
                    const std::size_t h = std::size_t(1) << i;
                    KESTACCEL_FFT_UNROLL(8)
                    for (std::size_t p = 0; p < kStreams; ++p) {
                        if ((p & h) != 0) continue;
                        if (kLastFromTable && i + 1 == K) {
                            const std::size_t f = 2 * ((p & (h - 1)) * q + j + t);
                            Butterfly(xr[p], xi[p], xr[p + h], xi[p + h], tw[f], tw[f + 1]);
                        } else {
                            const std::size_t f = (h - 1 + (p & (h - 1))) * count + j + t;
                            Butterfly(xr[p], xi[p], xr[p + h], xi[p + h], fr[f], fi[f]);
                        }
                    }
                }
                KESTACCEL_FFT_UNROLL(8)
                for (std::size_t p = 0; p < kStreams; ++p) {
                    const E yr = kScale ? xr[p] * scale : xr[p];
                    const E yi = kScale ? xi[p] * negScale : xi[p];
                    if constexpr (kOut == Output::kInPlace) {
                        P::Re(re, im, k + p * q, t) = yr;
                        P::Im(re, im, k + p * q, t) = yi;
                    } else if constexpr (kOut == Output::kSplitArrays) {
                        outRe[k + p * q + t] = yr;
                        outIm[k + p * q + t] = yi;
                    } else {
                        pairRe[p][t] = yr;
                        pairIm[p][t] = yi;
                    }
                }
            }
            if constexpr (kOut == Output::kPairsInPlace) {
                KESTACCEL_FFT_UNROLL(8)
                for (std::size_t p = 0; p < kStreams; ++p) {
                    // Left a loop: the loop vectoriser interleaves it with
                    // shuffles, which it does not do once it is unrolled.
                    KESTACCEL_FFT_UNROLL(1)
                    for (std::size_t t = 0; t < kLanes; ++t) {
                        re[2 * (k + p * q + t)] = pairRe[p][t];
                        re[2 * (k + p * q + t) + 1] = pairIm[p][t];
                    }
                }
            }
        }
    }
}

// Stages s to s + K - 1 over the whole working array, a chunk of factors at
// a time; kLast when they end with the transform's last stage.
template <class E, Form F, unsigned int K, Output kOut, bool kScale, bool kLast, std::size_t kLanes>
void StagesPass(const FFTPlan<E>& plan, std::uint32_t s, E* re, E* im, E* outRe, E* outIm, E scale)
{
    static_assert(kOut != Output::kPairsInPlace || F == Form::kBlocked, "pairs come from the blocked form");
    using P = Points<E, F, kLanes>;
    const std::size_t q = std::size_t(1) << (s - 1), span = q << K;
    FactorChunk<E, K> factors;
    for (std::size_t j0 = 0; j0 < q; j0 += kChunk) {
        const std::size_t count = q - j0 < kChunk ? q - j0 : kChunk;
        factors.Gather(plan, s, kLast ? K - 1 : K, j0, count);
        // Output arrays exist only for split output; null ones stay unused.
        E* const toRe = outRe == nullptr ? outRe : outRe + j0;
        E* const toIm = outIm == nullptr ? outIm : outIm + j0;
        StagesRun<E, F, K, kOut, kScale, kLast, kLanes>(plan.size / span, span, q, count, re + P::Offset(j0),
                                                        im + P::Offset(j0), factors.re, factors.im,
                                                        plan.twiddles + 2 * j0, toRe, toIm, scale);
    }
}

// The stages from s on, after the first pass, three at a time while more
// than four are left, then two at a time (one when one is left): fewer
// passes over the data, each with its points in registers. The last pass
// writes the output.
template <class E, Form F, Output kOut, bool kScale, std::size_t kLanes>
void RemainingStages(const FFTPlan<E>& plan, std::uint32_t s, E* re, E* im, E* outRe, E* outIm, E scale)
{
    for (;;) {
        switch (plan.order + 1 - s) {
        case 1:
            return StagesPass<E, F, 1, kOut, kScale, true, kLanes>(plan, s, re, im, outRe, outIm, scale);
        case 2:
            return StagesPass<E, F, 2, kOut, kScale, true, kLanes>(plan, s, re, im, outRe, outIm, scale);
        case 3:
            return StagesPass<E, F, 3, kOut, kScale, true, kLanes>(plan, s, re, im, outRe, outIm, scale);
        case 4:
            StagesPass<E, F, 2, Output::kInPlace, false, false, kLanes>(plan, s, re, im, nullptr, nullptr, scale);
            s += 2;
            break;
        default:
            StagesPass<E, F, 3, Output::kInPlace, false, false, kLanes>(plan, s, re, im, nullptr, nullptr, scale);
            s += 3;
            break;
        }
    }
}

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

// A transform of kGroup points (4 to 16) in locals: every point is read
// before any is written, so the source may be the destination.
template <class E, Form kSrc, Form kDst, bool kInverse, std::size_t kGroup>
[[gnu::noinline]] void OneGroup(const FFTPlan<E>& plan, const E* srcRe, const E* srcIm, E* dstRe, E* dstIm)
{
    E r[kGroup], m[kGroup];
    for (std::size_t t = 0; t < kGroup; ++t) {
        const std::size_t p = ReversedPosition<kGroup>(t);
        r[t] = Points<E, kSrc, 1>::Re(srcRe, srcIm, p, 0);
        m[t] = kInverse ? -Points<E, kSrc, 1>::Im(srcRe, srcIm, p, 0) : Points<E, kSrc, 1>::Im(srcRe, srcIm, p, 0);
    }
    const FirstPassFactors<E> factors(plan, kGroup);
    FirstStages<E, kGroup, kGroup>(r, m, factors.w);
    const E scale = E(1) / static_cast<E>(kGroup), negScale = -scale;
    for (std::size_t t = 0; t < kGroup; ++t) {
        Points<E, kDst, 1>::Re(dstRe, dstIm, t, 0) = kInverse ? r[t] * scale : r[t];
        Points<E, kDst, 1>::Im(dstRe, dstIm, t, 0) = kInverse ? m[t] * negScale : m[t];
    }
}

// The transforms of up to 16 points, from a source in form kSrc into a
// destination in form kDst (pairs or split): one point is copied as it is,
// two take a single butterfly, more take one group.
template <class E, Form kSrc, Form kDst, bool kInverse>
void SmallTransform(const FFTPlan<E>& plan, const E* srcRe, const E* srcIm, E* dstRe, E* dstIm)
{
    switch (plan.size) {
    case 1:
        dstRe[0] = srcRe[0];
        dstIm[0] = srcIm[0];
        break;
    case 2:
        TwoPoints<E, kInverse>(srcRe, srcIm, Points<E, kSrc, 1>::Offset(1), dstRe, dstIm,
                               Points<E, kDst, 1>::Offset(1));
        break;
    case 4:
        OneGroup<E, kSrc, kDst, kInverse, 4>(plan, srcRe, srcIm, dstRe, dstIm);
        break;
    case 8:
        OneGroup<E, kSrc, kDst, kInverse, 8>(plan, srcRe, srcIm, dstRe, dstIm);
        break;
    default:
        OneGroup<E, kSrc, kDst, kInverse, 16>(plan, srcRe, srcIm, dstRe, dstIm);
        break;
    }
}

// Up to 16 points, the transform is done in locals.
template <class E>
bool IsSmall(const FFTPlan<E>& plan)
{
    return plan.size <= 16;
}

// The transform of plan.size points (more than 16) read from a distinct
// source in form kSrc, worked on in re/im in form F and left as kOut says,
// with a first pass of kSpan.
template <class E, Form kSrc, Form F, Output kOut, bool kInverse, std::size_t kLanes, std::size_t kSpan>
void TransformWithSpan(const FFTPlan<E>& plan, const E* srcRe, const E* srcIm, E* re, E* im, E* outRe, E* outIm)
{
    const FirstPassFactors<E> factors(plan, kSpan);
    FirstPass<E, kSrc, F, kInverse, kGroupPoints<kSpan>, kSpan, kLanes, kRunGroups<kLanes>>(plan.order, srcRe, srcIm,
                                                                                          re, im, factors.w);
    const E scale = E(1) / static_cast<E>(plan.size);
    RemainingStages<E, F, kOut, kInverse, kLanes>(plan, Log2(kSpan) + 1, re, im, outRe, outIm, scale);
}

template <class E, Form kSrc, Form F, Output kOut, bool kInverse, std::size_t kLanes>
void TransformFrom(const FFTPlan<E>& plan, const E* srcRe, const E* srcIm, E* re, E* im, E* outRe, E* outIm)
{
    if (WideFirstPass<kLanes>(plan.order)) {
        TransformWithSpan<E, kSrc, F, kOut, kInverse, kLanes, kWideSpan<kLanes>>(plan, srcRe, srcIm, re, im, outRe,
                                                                                 outIm);
    } else {
        TransformWithSpan<E, kSrc, F, kOut, kInverse, kLanes, kNarrowSpan<kLanes>>(plan, srcRe, srcIm, re, im, outRe,
                                                                                   outIm);
    }
}

// In place after the swap-table exchanges, each group of the first pass
// turned into the blocked form over its own bytes.
template <class E, bool kInverse, std::size_t kLanes, std::size_t kSpan>
void PairsInPlaceWithSpan(const FFTPlan<E>& plan, E* pairs)
{
    constexpr std::size_t kGroup = kGroupPoints<kSpan>;
    const FirstPassFactors<E> factors(plan, kSpan);
    FirstStagesInPlace<E, kInverse, kGroup, kSpan, kLanes>(plan.size / kGroup, pairs, factors.w);
    const E scale = E(1) / static_cast<E>(plan.size);
    RemainingStages<E, Form::kBlocked, Output::kPairsInPlace, kInverse, kLanes>(plan, Log2(kSpan) + 1, pairs, pairs,
                                                                                 nullptr, nullptr, scale);
}

// Interleaved pairs in place: the swap-table exchanges, then the same
// stages, the first pass turning each group into the blocked form.
template <class E, bool kInverse, std::size_t kLanes = kVectorLanes<E>>
void PairsInPlace(const FFTPlan<E>& plan, E* pairs)
{
    if (IsSmall(plan)) return SmallTransform<E, Form::kPairs, Form::kPairs, kInverse>(plan, pairs, pairs + 1, pairs, pairs + 1);
    SwapByTable(plan.size, plan.swapTable, pairs);
    if (WideFirstPass<kLanes>(plan.order)) {
        PairsInPlaceWithSpan<E, kInverse, kLanes, kWideSpan<kLanes>>(plan, pairs);
    } else {
        PairsInPlaceWithSpan<E, kInverse, kLanes, kNarrowSpan<kLanes>>(plan, pairs);
    }
}

// Interleaved pairs from a distinct source into dst, which is also the
// work array: the same bits as copying first and transforming in place.
template <class E, bool kInverse, std::size_t kLanes = kVectorLanes<E>>
void PairsInto(const FFTPlan<E>& plan, const E* src, E* dst)
{
    if (IsSmall(plan)) return SmallTransform<E, Form::kPairs, Form::kPairs, kInverse>(plan, src, src + 1, dst, dst + 1);
    TransformFrom<E, Form::kPairs, Form::kBlocked, Output::kPairsInPlace, kInverse, kLanes>(plan, src, src + 1, dst,
                                                                                           dst, nullptr, nullptr);
}

// Split arrays through a work array of 2 * size elements in the blocked
// form; the last stages write the destination arrays. The work array keeps
// the stages away from the caller's arrays, which often lie a multiple of
// 4 KiB apart and would make loads wait on unrelated stores.
template <class E, bool kInverse, std::size_t kLanes = kVectorLanes<E>>
void SplitVia(const FFTPlan<E>& plan, const E* srcRe, const E* srcIm, E* work, E* re, E* im)
{
    if (IsSmall(plan)) return SmallTransform<E, Form::kSplit, Form::kSplit, kInverse>(plan, srcRe, srcIm, re, im);
    TransformFrom<E, Form::kSplit, Form::kBlocked, Output::kSplitArrays, kInverse, kLanes>(plan, srcRe, srcIm, work,
                                                                                          work, re, im);
}

// The forward transform of pairs from a distinct source into split arrays,
// which are also the work arrays (the real transform's half).
template <class E, std::size_t kLanes = kVectorLanes<E>>
void PairsToSplitForward(const FFTPlan<E>& plan, const E* src, E* re, E* im)
{
    if (IsSmall(plan)) return SmallTransform<E, Form::kPairs, Form::kSplit, false>(plan, src, src + 1, re, im);
    TransformFrom<E, Form::kPairs, Form::kSplit, Output::kInPlace, false, kLanes>(plan, src, src + 1, re, im, nullptr,
                                                                                 nullptr);
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

}  // namespace KESTACCEL_FFT_WIDTH_NAMESPACE
}  // namespace cpp
}  // namespace transform
}  // namespace kestaccel
