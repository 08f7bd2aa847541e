#pragma once

// The in-place power-of-two complex transform: decimation in time, radix 2,
// on data put in bit-reversed order first. Forward is unscaled with
// exp(-2 pi i k n / N); the inverse conjugates, runs the forward transform
// and scales by 1/N.
//
// Every butterfly is the radix-2 butterfly of the plain loop nest (twiddle
// loop outside, strided butterfly loop inside), with the same operands in
// the same order; only the order in which the independent butterflies of a
// stage run differs. So the results are the same bits:
// - stages 1 to 3 run together on each group of 8 points, held in locals;
// - later stages run in pairs: four points a quarter block apart pass
//   through both stages before they are stored again;
// - the butterfly loop runs over consecutive points, so it vectorises.
// The kernels serve two layouts: interleaved (re, im) pairs, where point k
// is re[2k], re[2k + 1] and the im pointer is not read (so that g++ sees one
// interleaved group and vectorises it), and split arrays, where point k is
// re[k], im[k].
//
// The loop kernels are kept out of line: inlined into their caller, g++
// loses what their restrict parameters promise and leaves them scalar.

#include <cstddef>
#include <cstdint>

#include "transform/FFT/FFTPlan.h"

namespace kestaccel {
namespace transform {
namespace cpp {

template <bool kPairs>
struct Layout;

template <>
struct Layout<true> {
    static constexpr std::size_t kStep = 2;
    template <class P>
    static P& Re(P* re, P*, std::size_t k) { return re[2 * k]; }
    template <class P>
    static P& Im(P* re, P*, std::size_t k) { return re[2 * k + 1]; }
};

template <>
struct Layout<false> {
    static constexpr std::size_t kStep = 1;
    template <class P>
    static P& Re(P* re, P*, std::size_t k) { return re[k]; }
    template <class P>
    static P& Im(P*, P* im, std::size_t k) { return im[k]; }
};

// The bit-reversal exchanges, walked upwards through the swap table. An
// entry equal to its index exchanges the point with itself, which changes
// nothing; doing so unconditionally saves a branch that mispredicts half
// the time.
template <class E, bool kPairs>
void SwapByTable(std::size_t n, const std::uint32_t* __restrict table, E* __restrict re, E* __restrict im)
{
    using L = Layout<kPairs>;
    for (std::size_t i = 0; i + 1 < n; ++i) {
        const std::size_t p = table[i];
        const E r = L::Re(re, im, i), m = L::Im(re, im, i);
        L::Re(re, im, i) = L::Re(re, im, p);
        L::Im(re, im, i) = L::Im(re, im, p);
        L::Re(re, im, p) = r;
        L::Im(re, im, p) = m;
    }
}

// (x, y) becomes (x + y, x - y).
template <class E>
inline void SumDifference(E& xr, E& xi, E& yr, E& yi)
{
    const E ar = xr, ai = xi;
    xr = ar + yr;
    xi = ai + yi;
    yr = ar - yr;
    yi = ai - yi;
}

// (x, y) becomes (x - i y, x + i y): the butterfly with the factor -i,
// written without multiplications.
template <class E>
inline void MinusIButterfly(E& xr, E& xi, E& yr, E& yi)
{
    const E ar = xr, ai = xi, br = yr, bi = yi;
    xr = ar + bi;
    xi = ai - br;
    yr = ar - bi;
    yi = ai + br;
}

// (x, y) becomes (x + y w, x - y w), the product formed as
// (yr wr - yi wi, yr wi + yi wr).
template <class E>
inline void Butterfly(E& xr, E& xi, E& yr, E& yi, E wr, E wi)
{
    const E tr = yr * wr - yi * wi;
    const E ti = yr * wi + yi * wr;
    yr = xr - tr;
    yi = xi - ti;
    xr = xr + tr;
    xi = xi + ti;
}

// Stages 1 and 2 on each group of 4 points.
template <class E, bool kPairs>
[[gnu::noinline]] void StagesOneTwo(std::size_t groups, E* __restrict re, E* __restrict im)
{
    using L = Layout<kPairs>;
    for (std::size_t g = 0; g < groups; ++g) {
        const std::size_t b = 4 * g;
        E r[4], m[4];
        for (std::size_t t = 0; t < 4; ++t) {
            r[t] = L::Re(re, im, b + t);
            m[t] = L::Im(re, im, b + t);
        }
        SumDifference(r[0], m[0], r[1], m[1]);
        SumDifference(r[2], m[2], r[3], m[3]);
        SumDifference(r[0], m[0], r[2], m[2]);
        MinusIButterfly(r[1], m[1], r[3], m[3]);
        for (std::size_t t = 0; t < 4; ++t) {
            L::Re(re, im, b + t) = r[t];
            L::Im(re, im, b + t) = m[t];
        }
    }
}

// Stages 1, 2 and 3 on each group of 8 points; w holds the four stage-3
// factors as (re, im) pairs.
template <class E, bool kPairs>
[[gnu::noinline]] void StagesOneToThree(std::size_t groups, E* __restrict re, E* __restrict im, const E* __restrict w)
{
    using L = Layout<kPairs>;
    const E w0r = w[0], w0i = w[1], w1r = w[2], w1i = w[3], w2r = w[4], w2i = w[5], w3r = w[6], w3i = w[7];
    for (std::size_t g = 0; g < groups; ++g) {
        const std::size_t b = 8 * g;
        E r[8], m[8];
        for (std::size_t t = 0; t < 8; ++t) {
            r[t] = L::Re(re, im, b + t);
            m[t] = L::Im(re, im, b + t);
        }
        SumDifference(r[0], m[0], r[1], m[1]);
        SumDifference(r[2], m[2], r[3], m[3]);
        SumDifference(r[4], m[4], r[5], m[5]);
        SumDifference(r[6], m[6], r[7], m[7]);
        SumDifference(r[0], m[0], r[2], m[2]);
        MinusIButterfly(r[1], m[1], r[3], m[3]);
        SumDifference(r[4], m[4], r[6], m[6]);
        MinusIButterfly(r[5], m[5], r[7], m[7]);
        Butterfly(r[0], m[0], r[4], m[4], w0r, w0i);
        Butterfly(r[1], m[1], r[5], m[5], w1r, w1i);
        Butterfly(r[2], m[2], r[6], m[6], w2r, w2i);
        Butterfly(r[3], m[3], r[7], m[7], w3r, w3i);
        for (std::size_t t = 0; t < 8; ++t) {
            L::Re(re, im, b + t) = r[t];
            L::Im(re, im, b + t) = m[t];
        }
    }
}

// The factors of a stage are gathered from the strided table into small
// split arrays, a chunk of kChunk butterfly positions at a time, so that
// every block of the stage reads them contiguously.
constexpr std::size_t kChunk = 128;

template <class E>
struct FactorChunk {
    E re[kChunk];
    E im[kChunk];

    // Pairs first, first + 1, ... of the table at the given stride.
    void Gather(const E* tw, std::size_t first, std::size_t count, std::size_t stride)
    {
        for (std::size_t t = 0; t < count; ++t) {
            re[t] = tw[2 * (first + t) * stride];
            im[t] = tw[2 * (first + t) * stride + 1];
        }
    }
};

// Two consecutive stages s and s + 1 over blocks of 4q points, q the half
// span of stage s. Points j, j + q, j + 2q, j + 3q: stage s pairs the first
// two and the last two with factor a[j]; stage s + 1 then pairs j with
// j + 2q (factor b[j]) and j + q with j + 3q (factor c[j]).
template <class E, bool kPairs>
[[gnu::noinline]] void StagePairRun(std::size_t blocks, std::size_t span, std::size_t count, E* __restrict r0,
                                    E* __restrict i0, E* __restrict r1, E* __restrict i1, E* __restrict r2,
                                    E* __restrict i2, E* __restrict r3, E* __restrict i3, const E* __restrict ar_,
                                    const E* __restrict ai_, const E* __restrict br_, const E* __restrict bi_,
                                    const E* __restrict cr_, const E* __restrict ci_)
{
    using L = Layout<kPairs>;
    for (std::size_t b = 0; b < blocks; ++b) {
        const std::size_t o = b * span;
        for (std::size_t j = 0; j < count; ++j) {
            const std::size_t k = o + j;
            E ar = L::Re(r0, i0, k), ai = L::Im(r0, i0, k), br = L::Re(r1, i1, k), bi = L::Im(r1, i1, k);
            E cr = L::Re(r2, i2, k), ci = L::Im(r2, i2, k), dr = L::Re(r3, i3, k), di = L::Im(r3, i3, k);
            Butterfly(ar, ai, br, bi, ar_[j], ai_[j]);
            Butterfly(cr, ci, dr, di, ar_[j], ai_[j]);
            Butterfly(ar, ai, cr, ci, br_[j], bi_[j]);
            Butterfly(br, bi, dr, di, cr_[j], ci_[j]);
            L::Re(r0, i0, k) = ar;
            L::Im(r0, i0, k) = ai;
            L::Re(r1, i1, k) = br;
            L::Im(r1, i1, k) = bi;
            L::Re(r2, i2, k) = cr;
            L::Im(r2, i2, k) = ci;
            L::Re(r3, i3, k) = dr;
            L::Im(r3, i3, k) = di;
        }
    }
}

// The last two stages: a single block of 4q = N points, whose factors are
// the table itself at strides 2 and 1, read in place instead of gathered.
template <class E, bool kPairs>
[[gnu::noinline]] void LastStagePairRun(std::size_t q, E* __restrict r0, E* __restrict i0, E* __restrict r1,
                                        E* __restrict i1, E* __restrict r2, E* __restrict i2, E* __restrict r3,
                                        E* __restrict i3, const E* __restrict tw, const E* __restrict twUpper)
{
    using L = Layout<kPairs>;
    for (std::size_t j = 0; j < q; ++j) {
        E ar = L::Re(r0, i0, j), ai = L::Im(r0, i0, j), br = L::Re(r1, i1, j), bi = L::Im(r1, i1, j);
        E cr = L::Re(r2, i2, j), ci = L::Im(r2, i2, j), dr = L::Re(r3, i3, j), di = L::Im(r3, i3, j);
        const E war = tw[4 * j], wai = tw[4 * j + 1];
        Butterfly(ar, ai, br, bi, war, wai);
        Butterfly(cr, ci, dr, di, war, wai);
        Butterfly(ar, ai, cr, ci, tw[2 * j], tw[2 * j + 1]);
        Butterfly(br, bi, dr, di, twUpper[2 * j], twUpper[2 * j + 1]);
        L::Re(r0, i0, j) = ar;
        L::Im(r0, i0, j) = ai;
        L::Re(r1, i1, j) = br;
        L::Im(r1, i1, j) = bi;
        L::Re(r2, i2, j) = cr;
        L::Im(r2, i2, j) = ci;
        L::Re(r3, i3, j) = dr;
        L::Im(r3, i3, j) = di;
    }
}

// Point k of the layout starts at element k * kStep of both pointers.
template <bool kPairs>
constexpr std::size_t Offset(std::size_t k)
{
    return k * Layout<kPairs>::kStep;
}

template <class E, bool kPairs>
void StagePair(const FFTPlan<E>& plan, std::uint32_t s, E* re, E* im)
{
    const std::size_t n = plan.size;
    const std::size_t q = std::size_t(1) << (s - 1);
    const std::size_t strideB = std::size_t(1) << (plan.order - s - 1);
    if (4 * q == n) {
        LastStagePairRun<E, kPairs>(q, re, im, re + Offset<kPairs>(q), im + Offset<kPairs>(q), re + Offset<kPairs>(2 * q),
                                    im + Offset<kPairs>(2 * q), re + Offset<kPairs>(3 * q), im + Offset<kPairs>(3 * q),
                                    plan.twiddles, plan.twiddles + 2 * q);
        return;
    }
    FactorChunk<E> a, b, c;
    for (std::size_t j0 = 0; j0 < q; j0 += kChunk) {
        const std::size_t count = q - j0 < kChunk ? q - j0 : kChunk;
        a.Gather(plan.twiddles, j0, count, 2 * strideB);
        b.Gather(plan.twiddles, j0, count, strideB);
        c.Gather(plan.twiddles, j0 + q, count, strideB);
        StagePairRun<E, kPairs>(n / (4 * q), 4 * q, count, re + Offset<kPairs>(j0), im + Offset<kPairs>(j0),
                                re + Offset<kPairs>(j0 + q), im + Offset<kPairs>(j0 + q),
                                re + Offset<kPairs>(j0 + 2 * q), im + Offset<kPairs>(j0 + 2 * q),
                                re + Offset<kPairs>(j0 + 3 * q), im + Offset<kPairs>(j0 + 3 * q), a.re, a.im, b.re,
                                b.im, c.re, c.im);
    }
}

// The bit-reversal permutation as a copy between distinct arrays, from the
// swap table alone, with the result of a copy followed by the exchanges in
// place. kConjugate negates the imaginary parts on the way, as the inverse
// needs; the layouts of source and destination may differ.
//
// Small transforms walk the table downwards and write both partners of
// every entry: each point ends at its place, because an entry equal to its
// index whose partner lies below is rewritten later by that partner's
// entry. Large ones, whose arrays overflow the caches, copy straight first
// and then let every entry exchange its two points from the source, tile by
// tile: 2^kTileBits high index bits by 2^kTileBits low ones, so that the
// points of a tile and their partners share a few cache lines. There an
// entry equal to its index stores the destination's own value back instead
// of branching, and the order of the entries no longer matters.
constexpr std::uint32_t kTileBits = 4;
constexpr std::uint32_t kLargestUntiledOrder = 12;

template <class E, bool kSrcPairs, bool kConjugate>
inline E SourceIm(const E* srcRe, const E* srcIm, std::size_t k)
{
    const E v = Layout<kSrcPairs>::Im(srcRe, srcIm, k);
    return kConjugate ? -v : v;
}

template <class E, bool kSrcPairs, bool kDstPairs, bool kConjugate>
[[gnu::noinline]] void ScatterDownwards(std::size_t n, const std::uint32_t* __restrict table,
                                        const E* __restrict srcRe, const E* __restrict srcIm, E* __restrict dstRe,
                                        E* __restrict dstIm)
{
    using S = Layout<kSrcPairs>;
    using D = Layout<kDstPairs>;
    D::Re(dstRe, dstIm, n - 1) = S::Re(srcRe, srcIm, n - 1);
    D::Im(dstRe, dstIm, n - 1) = SourceIm<E, kSrcPairs, kConjugate>(srcRe, srcIm, n - 1);
    for (std::size_t i = n - 1; i-- > 0;) {
        const std::size_t p = table[i];
        const E pr = S::Re(srcRe, srcIm, p), ir = S::Re(srcRe, srcIm, i);
        const E pi = SourceIm<E, kSrcPairs, kConjugate>(srcRe, srcIm, p);
        const E ii = SourceIm<E, kSrcPairs, kConjugate>(srcRe, srcIm, i);
        D::Re(dstRe, dstIm, i) = pr;
        D::Im(dstRe, dstIm, i) = pi;
        D::Re(dstRe, dstIm, p) = ir;
        D::Im(dstRe, dstIm, p) = ii;
    }
}

template <class E, bool kSrcPairs, bool kDstPairs, bool kConjugate>
[[gnu::noinline]] void CopyLayout(std::size_t n, const E* __restrict srcRe, const E* __restrict srcIm,
                                  E* __restrict dstRe, E* __restrict dstIm)
{
    using S = Layout<kSrcPairs>;
    using D = Layout<kDstPairs>;
    for (std::size_t i = 0; i < n; ++i) {
        D::Re(dstRe, dstIm, i) = S::Re(srcRe, srcIm, i);
        D::Im(dstRe, dstIm, i) = SourceIm<E, kSrcPairs, kConjugate>(srcRe, srcIm, i);
    }
}

template <class E, bool kSrcPairs, bool kDstPairs, bool kConjugate>
[[gnu::noinline]] void ExchangeTiles(std::size_t n, std::uint32_t order, const std::uint32_t* __restrict table,
                                     const E* __restrict srcRe, const E* __restrict srcIm, E* __restrict dstRe,
                                     E* __restrict dstIm)
{
    using S = Layout<kSrcPairs>;
    using D = Layout<kDstPairs>;
    const std::size_t tile = std::size_t(1) << kTileBits;
    const std::size_t middles = std::size_t(1) << (order - 2 * kTileBits);
    const std::uint32_t highShift = order - kTileBits;
    for (std::size_t m = 0; m < middles; ++m) {
        for (std::size_t a = 0; a < tile; ++a) {
            const std::size_t first = (a << highShift) | (m << kTileBits);
            // The last point is its own partner and has no entry.
            const std::size_t end = first + tile < n - 1 ? first + tile : n - 1;
            for (std::size_t i = first; i < end; ++i) {
                const std::size_t p = table[i];
                const bool exchange = p != i;
                const E pr = S::Re(srcRe, srcIm, p), ir = S::Re(srcRe, srcIm, i);
                const E pi = SourceIm<E, kSrcPairs, kConjugate>(srcRe, srcIm, p);
                const E ii = SourceIm<E, kSrcPairs, kConjugate>(srcRe, srcIm, i);
                const E cr = D::Re(dstRe, dstIm, i), ci = D::Im(dstRe, dstIm, i);
                D::Re(dstRe, dstIm, i) = exchange ? pr : cr;
                D::Im(dstRe, dstIm, i) = exchange ? pi : ci;
                D::Re(dstRe, dstIm, p) = exchange ? ir : cr;
                D::Im(dstRe, dstIm, p) = exchange ? ii : ci;
            }
        }
    }
}

template <class E, bool kSrcPairs, bool kDstPairs, bool kConjugate>
void PermuteInto(std::size_t n, std::uint32_t order, const std::uint32_t* table, const E* srcRe, const E* srcIm,
                 E* dstRe, E* dstIm)
{
    if (order <= kLargestUntiledOrder) {
        ScatterDownwards<E, kSrcPairs, kDstPairs, kConjugate>(n, table, srcRe, srcIm, dstRe, dstIm);
        return;
    }
    CopyLayout<E, kSrcPairs, kDstPairs, kConjugate>(n, srcRe, srcIm, dstRe, dstIm);
    ExchangeTiles<E, kSrcPairs, kDstPairs, kConjugate>(n, order, table, srcRe, srcIm, dstRe, dstIm);
}

// Everything after the permutation: the stages, on data in bit-reversed
// order.
template <class E, bool kPairs>
void Stages(const FFTPlan<E>& plan, E* re, E* im)
{
    const std::size_t n = plan.size;
    const std::uint32_t order = plan.order;
    if (order == 1) {
        SumDifference(Layout<kPairs>::Re(re, im, 0), Layout<kPairs>::Im(re, im, 0), Layout<kPairs>::Re(re, im, 1),
                      Layout<kPairs>::Im(re, im, 1));
        return;
    }
    // The stages after the first pass run in pairs; the first pass takes
    // two or three stages so that an even number remains.
    std::uint32_t s;
    if ((order & 1u) == 0) {
        StagesOneTwo<E, kPairs>(n / 4, re, im);
        s = 3;
    } else {
        const E* tw = plan.twiddles;
        const std::size_t stride = std::size_t(1) << (order - 3);
        const E w[8] = {tw[0], tw[1], tw[2 * stride], tw[2 * stride + 1],
                        tw[4 * stride], tw[4 * stride + 1], tw[6 * stride], tw[6 * stride + 1]};
        StagesOneToThree<E, kPairs>(n / 8, re, im, w);
        s = 4;
    }
    for (; s + 1 <= order; s += 2) StagePair<E, kPairs>(plan, s, re, im);
}

template <class E, bool kPairs>
[[gnu::noinline]] void NegateImaginary(std::size_t n, E* __restrict re, E* __restrict im)
{
    using L = Layout<kPairs>;
    for (std::size_t i = 0; i < n; ++i) L::Im(re, im, i) = -L::Im(re, im, i);
}

// re times scale, im times -scale: the second product undoes the
// conjugation and scales in one step.
template <class E, bool kPairs>
[[gnu::noinline]] void ScaleConjugate(std::size_t n, E* __restrict re, E* __restrict im, E scale)
{
    using L = Layout<kPairs>;
    const E negScale = -scale;
    for (std::size_t i = 0; i < n; ++i) {
        L::Re(re, im, i) = L::Re(re, im, i) * scale;
        L::Im(re, im, i) = L::Im(re, im, i) * negScale;
    }
}

// Pairs out to split arrays, each re times scale and im times -scale when
// kScale is set: the last step of the inverse fused with the split.
template <class E, bool kScale>
[[gnu::noinline]] void PairsToSplit(std::size_t n, const E* __restrict pairs, E* __restrict re, E* __restrict im,
                                    E scale)
{
    const E negScale = -scale;
    for (std::size_t i = 0; i < n; ++i) {
        re[i] = kScale ? pairs[2 * i] * scale : pairs[2 * i];
        im[i] = kScale ? pairs[2 * i + 1] * negScale : pairs[2 * i + 1];
    }
}

// The transform of `size` points in place; kPairs selects the layout.
template <class E, bool kPairs>
void ForwardInPlace(const FFTPlan<E>& plan, E* re, E* im)
{
    if (plan.size == 1) return;
    SwapByTable<E, kPairs>(plan.size, plan.swapTable, re, im);
    Stages<E, kPairs>(plan, re, im);
}

template <class E, bool kPairs>
void InverseInPlace(const FFTPlan<E>& plan, E* re, E* im)
{
    const std::size_t n = plan.size;
    if (n == 1) return;
    const E scale = E(1) / static_cast<E>(plan.size);
    NegateImaginary<E, kPairs>(n, re, im);
    ForwardInPlace<E, kPairs>(plan, re, im);
    ScaleConjugate<E, kPairs>(n, re, im, scale);
}

// The same transforms from a source array into a distinct destination of
// the same layout: the same bits as copying first and transforming in place.
template <class E, bool kPairs>
void ForwardInto(const FFTPlan<E>& plan, const E* srcRe, const E* srcIm, E* re, E* im)
{
    if (plan.size == 1) {
        Layout<kPairs>::Re(re, im, 0) = Layout<kPairs>::Re(srcRe, srcIm, 0);
        Layout<kPairs>::Im(re, im, 0) = Layout<kPairs>::Im(srcRe, srcIm, 0);
        return;
    }
    PermuteInto<E, kPairs, kPairs, false>(plan.size, plan.order, plan.swapTable, srcRe, srcIm, re, im);
    Stages<E, kPairs>(plan, re, im);
}

template <class E, bool kPairs>
void InverseInto(const FFTPlan<E>& plan, const E* srcRe, const E* srcIm, E* re, E* im)
{
    const std::size_t n = plan.size;
    if (n == 1) {
        ForwardInto<E, kPairs>(plan, srcRe, srcIm, re, im);
        return;
    }
    const E scale = E(1) / static_cast<E>(plan.size);
    PermuteInto<E, kPairs, kPairs, true>(n, plan.order, plan.swapTable, srcRe, srcIm, re, im);
    Stages<E, kPairs>(plan, re, im);
    ScaleConjugate<E, kPairs>(n, re, im, scale);
}

// Split arrays through a work array of pairs (2 * size elements): the
// source is permuted into pairs, transformed there and split out into the
// destination. The same bits as the transforms on pairs; the work array
// keeps the real and imaginary streams apart from the caller's arrays,
// which often lie a multiple of 4 KiB apart and would make loads wait on
// unrelated stores.
template <class E>
void SplitForwardVia(const FFTPlan<E>& plan, const E* srcRe, const E* srcIm, E* work, E* re, E* im)
{
    if (plan.size == 1) {
        re[0] = srcRe[0];
        im[0] = srcIm[0];
        return;
    }
    PermuteInto<E, false, true, false>(plan.size, plan.order, plan.swapTable, srcRe, srcIm, work, work + 1);
    Stages<E, true>(plan, work, work + 1);
    PairsToSplit<E, false>(plan.size, work, re, im, E(1));
}

template <class E>
void SplitInverseVia(const FFTPlan<E>& plan, const E* srcRe, const E* srcIm, E* work, E* re, E* im)
{
    if (plan.size == 1) {
        re[0] = srcRe[0];
        im[0] = srcIm[0];
        return;
    }
    const E scale = E(1) / static_cast<E>(plan.size);
    PermuteInto<E, false, true, true>(plan.size, plan.order, plan.swapTable, srcRe, srcIm, work, work + 1);
    Stages<E, true>(plan, work, work + 1);
    PairsToSplit<E, true>(plan.size, work, re, im, scale);
}

// Interleaved (re, im) pairs, size of them, in place.
template <class E>
void ComplexFFTForward(const FFTPlan<E>& plan, E* pairs)
{
    ForwardInPlace<E, true>(plan, pairs, pairs + 1);
}

template <class E>
void ComplexFFTInverse(const FFTPlan<E>& plan, E* pairs)
{
    InverseInPlace<E, true>(plan, pairs, pairs + 1);
}

}  // namespace cpp
}  // namespace transform
}  // namespace kestaccel
