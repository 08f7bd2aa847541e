#pragma once

// The arithmetic of the complex transform, and the layouts it runs on.
//
// Every butterfly is the radix-2 butterfly of the plain loop nest (twiddle
// loop outside, strided butterfly loop inside), with the same operands in
// the same order. The kernels only change the order in which the
// independent butterflies of a stage run, and where the points are held,
// so their results are the same bits.

#include <cstddef>

// The width of the vectors the build may use, from the compiler's own
// macros (GCC, Clang and MSVC all define these): the kernels work on blocks
// of one vector of parts, so a build for wider vectors works on wider
// blocks. Where nothing is known, 16 bytes.
#if defined(__AVX512F__)
#define KESTACCEL_FFT_VECTOR_BYTES 64
#define KESTACCEL_FFT_WIDTH_NAMESPACE width64
#elif defined(__AVX__)
#define KESTACCEL_FFT_VECTOR_BYTES 32
#define KESTACCEL_FFT_WIDTH_NAMESPACE width32
#else
#define KESTACCEL_FFT_VECTOR_BYTES 16
#define KESTACCEL_FFT_WIDTH_NAMESPACE width16
#endif

// Loop hints for g++: unroll a loop before the vectoriser sees the loop
// around it, and take the iterations of a loop over the lanes of a block as
// independent (they touch distinct elements, which g++ cannot always tell
// through the offsets). Other compilers build the same loops without them.
#if defined(__GNUC__) && !defined(__clang__)
#define KESTACCEL_FFT_PRAGMA(text) _Pragma(#text)
#else
#define KESTACCEL_FFT_PRAGMA(text)
#endif
#define KESTACCEL_FFT_UNROLL(n) KESTACCEL_FFT_PRAGMA(GCC unroll n)
#define KESTACCEL_FFT_INDEPENDENT_LANES KESTACCEL_FFT_PRAGMA(GCC ivdep)

namespace kestaccel {
namespace transform {
namespace cpp {

// The kernel headers put their code in an inline namespace named after the
// width: the white-box tests compile them for the baseline and link the
// library's objects, which a wider build compiles for its own width, so
// the two sets must not share a name.
inline namespace KESTACCEL_FFT_WIDTH_NAMESPACE {

// Points per block, one vector of parts, for the build's width.
template <class E>
constexpr std::size_t kVectorLanes = KESTACCEL_FFT_VECTOR_BYTES / sizeof(E);

// Where point k keeps its two parts:
// - kPairs: interleaved (re, im) pairs, re[2k] and re[2k + 1];
// - kSplit: two arrays, re[k] and im[k];
// - kBlocked: blocks of kLanes points, their real parts then their
//   imaginary parts, so that a block fills two vectors without shuffles
//   and covers the same bytes as the same points in pairs.
// The working forms are kSplit and kBlocked; kPairs is read and written at
// the ends only.
enum class Form { kPairs, kSplit, kBlocked };

// Part accessors for point start + t; in the blocked form start must be a
// multiple of kLanes and t below it. The blocked and pair forms use only
// the first pointer.
template <class E, Form F, std::size_t kLanes>
struct Points;

template <class E, std::size_t kLanes>
struct Points<E, Form::kPairs, kLanes> {
    template <class P>
    static P& Re(P* re, P*, std::size_t start, std::size_t t) { return re[2 * (start + t)]; }
    template <class P>
    static P& Im(P* re, P*, std::size_t start, std::size_t t) { return re[2 * (start + t) + 1]; }
    static constexpr std::size_t Offset(std::size_t k) { return 2 * k; }
};

template <class E, std::size_t kLanes>
struct Points<E, Form::kSplit, kLanes> {
    template <class P>
    static P& Re(P* re, P*, std::size_t start, std::size_t t) { return re[start + t]; }
    template <class P>
    static P& Im(P*, P* im, std::size_t start, std::size_t t) { return im[start + t]; }
    static constexpr std::size_t Offset(std::size_t k) { return k; }
};

template <class E, std::size_t kLanes>
struct Points<E, Form::kBlocked, kLanes> {
    template <class P>
    static P& Re(P* re, P*, std::size_t start, std::size_t t) { return re[2 * start + t]; }
    template <class P>
    static P& Im(P* re, P*, std::size_t start, std::size_t t) { return re[2 * start + kLanes + t]; }
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

// The stage of half span kHalf (from 4) and those after it, up to the
// span of the group; w points at the factors of that stage.
template <class E, std::size_t kGroup, std::size_t kHalf>
inline void GroupStagesFrom(E* r, E* m, const E* w)
{
    if constexpr (kHalf < kGroup) {
        KESTACCEL_FFT_UNROLL(2)
        for (std::size_t b = 0; b < kGroup; b += 2 * kHalf) {
            KESTACCEL_FFT_UNROLL(8)
            for (std::size_t j = 0; j < kHalf; ++j)
                Butterfly(r[b + j], m[b + j], r[b + j + kHalf], m[b + j + kHalf], w[2 * j], w[2 * j + 1]);
        }
        GroupStagesFrom<E, kGroup, 2 * kHalf>(r, m, w + 2 * kHalf);
    }
}

// Stages 1 to log2(kSpan) on a group of kGroup points in bit-reversed
// order, kSpan (4 to 16) at a time; w holds the factors of stage 3 on as
// (re, im) pairs, the 4 of stage 3 first, then the 8 of stage 4.
template <class E, std::size_t kGroup, std::size_t kSpan>
inline void FirstStages(E* r, E* m, const E* w)
{
    static_assert(kSpan == 4 || kSpan == 8 || kSpan == 16, "spans of 4 to 16 points");
    KESTACCEL_FFT_UNROLL(4)
    for (std::size_t b = 0; b < kGroup; b += 4) StagesOneTwo(r + b, m + b);
    KESTACCEL_FFT_UNROLL(4)
    for (std::size_t b = 0; b < kGroup; b += kSpan) GroupStagesFrom<E, kSpan, 4>(r + b, m + b, w);
}

}  // namespace KESTACCEL_FFT_WIDTH_NAMESPACE
}  // namespace cpp
}  // namespace transform
}  // namespace kestaccel
