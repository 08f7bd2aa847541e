#pragma once

// The arithmetic of the complex transform, and the layouts it runs on.
//
// Every butterfly is the radix-2 butterfly of the plain loop nest (twiddle
// loop outside, strided butterfly loop inside), with the same operands in
// the same order. The kernels only change the order in which the
// independent butterflies of a stage run, and where the points are held,
// so their results are the same bits.

#include <cstddef>

namespace kestaccel {
namespace transform {
namespace cpp {

// Where point k keeps its two parts:
// - kPairs: interleaved (re, im) pairs, re[2k] and re[2k + 1];
// - kSplit: two arrays, re[k] and im[k];
// - kBlocked: blocks of kLanes points, their real parts then their
//   imaginary parts, so that a block of kLanes points fills two vectors
//   without shuffles and covers the same bytes as the same points in pairs.
// The working forms are kSplit and kBlocked; kPairs is read and written at
// the ends only.
enum class Form { kPairs, kSplit, kBlocked };

// Points per block: one 16-byte vector of parts.
template <class E>
constexpr std::size_t kLanes = 16 / sizeof(E);

// Part accessors for point start + t; in the blocked form start must be a
// multiple of kLanes and t below it. The blocked and pair forms use only
// the first pointer.
template <class E, Form F>
struct Points;

template <class E>
struct Points<E, Form::kPairs> {
    template <class P>
    static P& Re(P* re, P*, std::size_t start, std::size_t t) { return re[2 * (start + t)]; }
    template <class P>
    static P& Im(P* re, P*, std::size_t start, std::size_t t) { return re[2 * (start + t) + 1]; }
    static constexpr std::size_t Offset(std::size_t k) { return 2 * k; }
};

template <class E>
struct Points<E, Form::kSplit> {
    template <class P>
    static P& Re(P* re, P*, std::size_t start, std::size_t t) { return re[start + t]; }
    template <class P>
    static P& Im(P*, P* im, std::size_t start, std::size_t t) { return im[start + t]; }
    static constexpr std::size_t Offset(std::size_t k) { return k; }
};

template <class E>
struct Points<E, Form::kBlocked> {
    template <class P>
    static P& Re(P* re, P*, std::size_t start, std::size_t t) { return re[2 * start + t]; }
    template <class P>
    static P& Im(P* re, P*, std::size_t start, std::size_t t) { return re[2 * start + kLanes<E> + t]; }
    static constexpr std::size_t Offset(std::size_t k) { return 2 * k; }
};

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

// Stages 1 and 2 on a group of 4 points in bit-reversed order.
template <class E>
inline void StagesOneTwo(E* r, E* m)
{
    SumDifference(r[0], m[0], r[1], m[1]);
    SumDifference(r[2], m[2], r[3], m[3]);
    SumDifference(r[0], m[0], r[2], m[2]);
    MinusIButterfly(r[1], m[1], r[3], m[3]);
}

// Stages 1 to 3 on a group of 8 points; w holds the four stage-3 factors as
// (re, im) pairs.
template <class E>
inline void StagesOneToThree(E* r, E* m, const E* w)
{
    StagesOneTwo(r, m);
    StagesOneTwo(r + 4, m + 4);
    Butterfly(r[0], m[0], r[4], m[4], w[0], w[1]);
    Butterfly(r[1], m[1], r[5], m[5], w[2], w[3]);
    Butterfly(r[2], m[2], r[6], m[6], w[4], w[5]);
    Butterfly(r[3], m[3], r[7], m[7], w[6], w[7]);
}

}  // namespace cpp
}  // namespace transform
}  // namespace kestaccel
