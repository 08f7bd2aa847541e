#pragma once

// Element-wise arithmetic, elementwise functions, reductions, thresholds,
// channel layout and half precision, over float, double and complex vectors.
//
// Every element-wise result is that of the plain scalar loop in ascending
// index order, also when buffers overlap; each operation is rounded on its
// own (no fused multiply-add, no reassociation). A count of 0 touches no
// pointer.
//
// Results are the same bits on every supported build, except those that
// come from the maths runtime (Exp, Ln, Pow, Round, Magnitude, the phase of
// CartToPolar, PolarToCart), which agree wherever the runtimes agree. A
// computed NaN is only promised to be a NaN: its sign and payload are open.
// A NaN that is copied, moved, set, interleaved or selected by a comparison
// keeps its bits, and so does the complex quotient's own NaN. See
// docs/same-bits.md.

#include <complex>

#include "kestaccel/Common.h"

namespace kestaccel {
namespace utility {

// ---------------------------------------------------------------------------
// Real arithmetic, float and double.
//
//   Add(n, a, b, dst)              dst[i] = a[i] + b[i]
//   Add_InPlace(n, src, srcDst)    srcDst[i] = src[i] + srcDst[i]
//   Sub(n, a, b, dst)              dst[i] = b[i] - a[i]      (second minus first)
//   Sub_InPlace(n, src, srcDst)    srcDst[i] = srcDst[i] - src[i]
//   Mul(n, a, b, dst)              dst[i] = a[i] * b[i]
//   Mul_InPlace(n, src, srcDst)    srcDst[i] = src[i] * srcDst[i]
//   Div(n, a, b, dst)              dst[i] = b[i] / a[i]      (second over first)
//   Div_InPlace(n, src, srcDst)    srcDst[i] = srcDst[i] / src[i]
//   AddConstant                    dst[i] = c + src[i]
//   SubConstant                    dst[i] = src[i] - c
//   SubConstantRev                 dst[i] = c - src[i]
//   MulConstant                    dst[i] = c * src[i]
//   DivConstant                    dst[i] = src[i] / c
//   DivConstantRev (float only)    dst[i] = c / src[i]
//   AddProduct(n, a, b, srcDst)    srcDst[i] = (a[i] * b[i]) + srcDst[i]
//   AddConstantProduct             srcDst[i] = (src[i] * c) + srcDst[i]
//
// Mind the reversed operands of Sub and Div. Division is a true division per
// element, never a multiplication by a reciprocal. The Div*Constant* forms
// test the constant once: when it compares equal to zero the call writes
// nothing at all (for DivConstantRev the constant is the numerator). The
// vector Div forms follow IEEE arithmetic for zero divisors. AddProduct and
// AddConstantProduct round the product, then the sum.
//
// MulConstant_InPlace on short: the 32-bit product element * constant is
// wrapped to 16 bits first, then scaled by 2^-scale in double, narrowed to
// float, and rounded: ties to even for positive values, toward zero for
// negative ones. The low 16 bits are stored; nothing saturates.
// ---------------------------------------------------------------------------
KESTACCEL_API void Add(unsigned int count, const float* a, const float* b, float* dst);
KESTACCEL_API void Add(unsigned int count, const double* a, const double* b, double* dst);
KESTACCEL_API void Add_InPlace(unsigned int count, const float* src, float* srcDst);
KESTACCEL_API void Add_InPlace(unsigned int count, const double* src, double* srcDst);
KESTACCEL_API void Sub(unsigned int count, const float* a, const float* b, float* dst);
KESTACCEL_API void Sub(unsigned int count, const double* a, const double* b, double* dst);
KESTACCEL_API void Sub_InPlace(unsigned int count, const float* src, float* srcDst);
KESTACCEL_API void Sub_InPlace(unsigned int count, const double* src, double* srcDst);
KESTACCEL_API void Mul(unsigned int count, const float* a, const float* b, float* dst);
KESTACCEL_API void Mul(unsigned int count, const double* a, const double* b, double* dst);
KESTACCEL_API void Mul_InPlace(unsigned int count, const float* src, float* srcDst);
KESTACCEL_API void Mul_InPlace(unsigned int count, const double* src, double* srcDst);
KESTACCEL_API void Div(unsigned int count, const float* a, const float* b, float* dst);
KESTACCEL_API void Div(unsigned int count, const double* a, const double* b, double* dst);
KESTACCEL_API void Div_InPlace(unsigned int count, const float* src, float* srcDst);
KESTACCEL_API void Div_InPlace(unsigned int count, const double* src, double* srcDst);

KESTACCEL_API void AddConstant(unsigned int count, const float* src, float constant, float* dst);
KESTACCEL_API void AddConstant(unsigned int count, const double* src, double constant, double* dst);
KESTACCEL_API void AddConstant_InPlace(unsigned int count, float* srcDst, float constant);
KESTACCEL_API void AddConstant_InPlace(unsigned int count, double* srcDst, double constant);
KESTACCEL_API void SubConstant(unsigned int count, const float* src, float constant, float* dst);
KESTACCEL_API void SubConstant(unsigned int count, const double* src, double constant, double* dst);
KESTACCEL_API void SubConstant_InPlace(unsigned int count, float* srcDst, float constant);
KESTACCEL_API void SubConstant_InPlace(unsigned int count, double* srcDst, double constant);
KESTACCEL_API void SubConstantRev(unsigned int count, const float* src, float constant, float* dst);
KESTACCEL_API void SubConstantRev(unsigned int count, const double* src, double constant, double* dst);
KESTACCEL_API void SubConstantRev_InPlace(unsigned int count, float* srcDst, float constant);
KESTACCEL_API void SubConstantRev_InPlace(unsigned int count, double* srcDst, double constant);
KESTACCEL_API void MulConstant(unsigned int count, const float* src, float* dst, float constant);
KESTACCEL_API void MulConstant(unsigned int count, const double* src, double* dst, double constant);
KESTACCEL_API void MulConstant_InPlace(unsigned int count, float* srcDst, float constant);
KESTACCEL_API void MulConstant_InPlace(unsigned int count, double* srcDst, double constant);
KESTACCEL_API void DivConstant(unsigned int count, const float* src, float* dst, float constant);
KESTACCEL_API void DivConstant(unsigned int count, const double* src, double* dst, double constant);
KESTACCEL_API void DivConstant_InPlace(unsigned int count, float* srcDst, float constant);
KESTACCEL_API void DivConstant_InPlace(unsigned int count, double* srcDst, double constant);
KESTACCEL_API void DivConstantRev(unsigned int count, float constant, const float* src, float* dst);

KESTACCEL_API void AddProduct(unsigned int count, const float* a, const float* b, float* srcDst);
KESTACCEL_API void AddProduct(unsigned int count, const double* a, const double* b, double* srcDst);
KESTACCEL_API void AddConstantProduct(unsigned int count, const float* src, float* srcDst, float constant);
KESTACCEL_API void AddConstantProduct(unsigned int count, const double* src, double* srcDst, double constant);

KESTACCEL_API void MulConstant_InPlace(unsigned int count, short* srcDst, short constant, int scale);

// ---------------------------------------------------------------------------
// Complex arithmetic.
// ---------------------------------------------------------------------------
// The names, operand order and zero tests of the real family, on
// std::complex<float> and std::complex<double> elements; all arithmetic is on
// the components in their own type.
//
//   Add, Add_InPlace, AddConstant      component-wise sums (constant first)
//   Sub(n, a, b, dst)                  dst[i] = b[i] - a[i]  (second minus first)
//   Sub_InPlace(n, src, srcDst)        srcDst[i] = srcDst[i] - src[i]
//   SubConstant, SubConstantRev        src[i] - c, c - src[i]
//   Mul, Mul_InPlace, MulConstant      x * y, x the first operand, y the second
//                                      (src[i], then srcDst[i] or c)
//   AddProduct(n, a, b, srcDst)        srcDst[i] = (a[i] * b[i]) + srcDst[i]
//   Div(n, a, b, dst)                  dst[i] = b[i] / a[i]  (second over first)
//   Div_InPlace(n, src, srcDst)        srcDst[i] = srcDst[i] / src[i]
//   DivConstant, DivConstant_InPlace   src[i] / c
//
// The product is the plain formula on the components,
//   (xr * yr - xi * yi, xr * yi + xi * yr),
// every product rounded, then the difference and the sum; nothing repairs
// infinities, so (inf, 0) * (1, 0) is (inf, NaN). AddProduct rounds the
// product's parts before adding srcDst.
//
// The quotient u / v is Smith's scaled division: when |vr| > |vi| it scales
// by w = vi / vr, otherwise (equal sizes included) by w = vr / vi. A
// denominator that is zero, has a NaN part, or whose scaled size d is zero or
// NaN gives (NaN, NaN), the quiet NaN with a clear sign and zero payload
// (0x7FC00000, 0x7FF8000000000000) in both parts; it never gives an infinity.
// A NaN numerator just travels through. Div and Div_InPlace have no
// whole-call test, so a zero element of the divisor marks only its own
// index. DivConstant and DivConstant_InPlace return at once, writing nothing,
// when both parts of the constant compare equal to zero.
//
// There is no complex AddConstantProduct and no complex DivConstantRev.

KESTACCEL_API void Add(unsigned int count, const std::complex<float>* a, const std::complex<float>* b, std::complex<float>* dst);
KESTACCEL_API void Add(unsigned int count, const std::complex<double>* a, const std::complex<double>* b, std::complex<double>* dst);
KESTACCEL_API void Add_InPlace(unsigned int count, const std::complex<float>* src, std::complex<float>* srcDst);
KESTACCEL_API void Add_InPlace(unsigned int count, const std::complex<double>* src, std::complex<double>* srcDst);
KESTACCEL_API void Sub(unsigned int count, const std::complex<float>* a, const std::complex<float>* b, std::complex<float>* dst);
KESTACCEL_API void Sub(unsigned int count, const std::complex<double>* a, const std::complex<double>* b, std::complex<double>* dst);
KESTACCEL_API void Sub_InPlace(unsigned int count, const std::complex<float>* src, std::complex<float>* srcDst);
KESTACCEL_API void Sub_InPlace(unsigned int count, const std::complex<double>* src, std::complex<double>* srcDst);
KESTACCEL_API void AddConstant(unsigned int count, const std::complex<float>* src, std::complex<float> constant, std::complex<float>* dst);
KESTACCEL_API void AddConstant(unsigned int count, const std::complex<double>* src, std::complex<double> constant, std::complex<double>* dst);
KESTACCEL_API void AddConstant_InPlace(unsigned int count, std::complex<float>* srcDst, std::complex<float> constant);
KESTACCEL_API void AddConstant_InPlace(unsigned int count, std::complex<double>* srcDst, std::complex<double> constant);
KESTACCEL_API void SubConstant(unsigned int count, const std::complex<float>* src, std::complex<float> constant, std::complex<float>* dst);
KESTACCEL_API void SubConstant(unsigned int count, const std::complex<double>* src, std::complex<double> constant, std::complex<double>* dst);
KESTACCEL_API void SubConstant_InPlace(unsigned int count, std::complex<float>* srcDst, std::complex<float> constant);
KESTACCEL_API void SubConstant_InPlace(unsigned int count, std::complex<double>* srcDst, std::complex<double> constant);
KESTACCEL_API void SubConstantRev(unsigned int count, const std::complex<float>* src, std::complex<float> constant, std::complex<float>* dst);
KESTACCEL_API void SubConstantRev(unsigned int count, const std::complex<double>* src, std::complex<double> constant, std::complex<double>* dst);
KESTACCEL_API void SubConstantRev_InPlace(unsigned int count, std::complex<float>* srcDst, std::complex<float> constant);
KESTACCEL_API void SubConstantRev_InPlace(unsigned int count, std::complex<double>* srcDst, std::complex<double> constant);
KESTACCEL_API void Mul(unsigned int count, const std::complex<float>* a, const std::complex<float>* b, std::complex<float>* dst);
KESTACCEL_API void Mul(unsigned int count, const std::complex<double>* a, const std::complex<double>* b, std::complex<double>* dst);
KESTACCEL_API void Mul_InPlace(unsigned int count, const std::complex<float>* src, std::complex<float>* srcDst);
KESTACCEL_API void Mul_InPlace(unsigned int count, const std::complex<double>* src, std::complex<double>* srcDst);
KESTACCEL_API void MulConstant(unsigned int count, const std::complex<float>* src, std::complex<float>* dst, std::complex<float> constant);
KESTACCEL_API void MulConstant(unsigned int count, const std::complex<double>* src, std::complex<double>* dst, std::complex<double> constant);
KESTACCEL_API void MulConstant_InPlace(unsigned int count, std::complex<float>* srcDst, std::complex<float> constant);
KESTACCEL_API void MulConstant_InPlace(unsigned int count, std::complex<double>* srcDst, std::complex<double> constant);
KESTACCEL_API void AddProduct(unsigned int count, const std::complex<float>* a, const std::complex<float>* b, std::complex<float>* srcDst);
KESTACCEL_API void AddProduct(unsigned int count, const std::complex<double>* a, const std::complex<double>* b, std::complex<double>* srcDst);
KESTACCEL_API void Div(unsigned int count, const std::complex<float>* a, const std::complex<float>* b, std::complex<float>* dst);
KESTACCEL_API void Div(unsigned int count, const std::complex<double>* a, const std::complex<double>* b, std::complex<double>* dst);
KESTACCEL_API void Div_InPlace(unsigned int count, const std::complex<float>* src, std::complex<float>* srcDst);
KESTACCEL_API void Div_InPlace(unsigned int count, const std::complex<double>* src, std::complex<double>* srcDst);
KESTACCEL_API void DivConstant(unsigned int count, const std::complex<float>* src, std::complex<float>* dst, std::complex<float> constant);
KESTACCEL_API void DivConstant(unsigned int count, const std::complex<double>* src, std::complex<double>* dst, std::complex<double> constant);
KESTACCEL_API void DivConstant_InPlace(unsigned int count, std::complex<float>* srcDst, std::complex<float> constant);
KESTACCEL_API void DivConstant_InPlace(unsigned int count, std::complex<double>* srcDst, std::complex<double> constant);

// ---------------------------------------------------------------------------
// Elementwise functions.
// ---------------------------------------------------------------------------
// float and double unless marked.
//
//   Sqr, Sqr_InPlace          x * x
//   Sqrt, Sqrt_InPlace        correctly rounded root; -0 gives -0, a negative
//                             element the runtime's NaN
//   Exp, Exp_InPlace          expf / exp
//   Ln                        logf / log; Ln_InPlace is float only, and
//                             Ln_Prec11, Ln_Prec21, Ln_Prec24 (float) are Ln
//   Pow(n, a, b, dst)         powf / pow with a[i] the BASE, b[i] the exponent
//                             (unlike Sub and Div); Pow_Prec26 (double) is Pow
//   Inverse                   1 / x by true division; Inverse_Prec26 (double)
//                             is Inverse
//   Abs                       -x where 0 > x, else x unchanged: -0 and a
//                             negative NaN keep their sign bit
//   Abs_InPlace               clears the sign bit of every element: -0 gives
//                             +0, a negative NaN a positive one
//   Round                     nearest, ties away from zero (roundf / round)
//   Flip                      dst[i] = src[n - 1 - i], a forward copy; with
//                             dst == src it is not a reversal (use
//                             Flip_InPlace, which swaps pairs inward)
//   Magnitude                 hypotf / hypot of (re[i], im[i]), or of the
//                             parts of a complex element; no overflow between
//   PowerSpectr               re * re + im * im in the element's type
//   CartToPolar (float)       src holds (re, im) pairs; magnitude[i] =
//                             sqrtf(re * re + im * im), which overflows above
//                             about 1.8e19, phase[i] = atan2f(im, re);
//                             magnitude must not overlap src
//   PolarToCart (float)       dst[2i] = cosf(phase[i]) * magnitude[i],
//                             dst[2i + 1] = sinf(phase[i]) * magnitude[i]
//   Normalize(n, src, dst, offset, divisor)
//                             (src[i] - offset) / divisor; no zero test
//
// A float member calls the single-precision runtime function, never the
// double one on a widened value. Exp, Ln, Pow, Round, Magnitude, the phase
// of CartToPolar and PolarToCart give the runtime's bits, the same wherever
// the runtimes agree; Sqrt is correctly rounded everywhere.
//
// Invert_Threshold_InPlace(n, srcDst, threshold) replaces each element by its
// inverse, limited in size to 1 / threshold. Nothing happens when
// 0 >= threshold. With eps the type's machine epsilon (2^-23, 2^-52):
//   real, threshold <= eps: x <= eps (every negative x too) gives +inf,
//     otherwise 1 / x;
//   real, otherwise: |x| >= threshold gives 1 / x; a smaller x gives
//     1 / threshold when x > 0 or |x| <= eps, else -1 / threshold (a NaN
//     too);
//   complex, p = im * im + re * re: p <= eps (compared in double) gives
//     (1 / threshold, +0); threshold^2 > p gives (re / m, -im / m) with
//     m = sqrt(p) * threshold; otherwise (re / p, -im / p).

KESTACCEL_API void Sqr(unsigned int count, const float* src, float* dst);
KESTACCEL_API void Sqr(unsigned int count, const double* src, double* dst);
KESTACCEL_API void Sqr_InPlace(unsigned int count, float* srcDst);
KESTACCEL_API void Sqr_InPlace(unsigned int count, double* srcDst);
KESTACCEL_API void Sqrt(unsigned int count, const float* src, float* dst);
KESTACCEL_API void Sqrt(unsigned int count, const double* src, double* dst);
KESTACCEL_API void Sqrt_InPlace(unsigned int count, float* srcDst);
KESTACCEL_API void Sqrt_InPlace(unsigned int count, double* srcDst);
KESTACCEL_API void Exp(unsigned int count, const float* src, float* dst);
KESTACCEL_API void Exp(unsigned int count, const double* src, double* dst);
KESTACCEL_API void Exp_InPlace(unsigned int count, float* srcDst);
KESTACCEL_API void Exp_InPlace(unsigned int count, double* srcDst);
KESTACCEL_API void Ln(unsigned int count, const float* src, float* dst);
KESTACCEL_API void Ln(unsigned int count, const double* src, double* dst);
KESTACCEL_API void Ln_InPlace(unsigned int count, float* srcDst);
KESTACCEL_API void Ln_Prec11(unsigned int count, const float* src, float* dst);
KESTACCEL_API void Ln_Prec21(unsigned int count, const float* src, float* dst);
KESTACCEL_API void Ln_Prec24(unsigned int count, const float* src, float* dst);
KESTACCEL_API void Pow(unsigned int count, const float* a, const float* b, float* dst);
KESTACCEL_API void Pow(unsigned int count, const double* a, const double* b, double* dst);
KESTACCEL_API void Pow_Prec26(unsigned int count, const double* a, const double* b, double* dst);
KESTACCEL_API void Inverse(unsigned int count, const float* src, float* dst);
KESTACCEL_API void Inverse(unsigned int count, const double* src, double* dst);
KESTACCEL_API void Inverse_Prec26(unsigned int count, const double* src, double* dst);
KESTACCEL_API void Abs(unsigned int count, const float* src, float* dst);
KESTACCEL_API void Abs(unsigned int count, const double* src, double* dst);
KESTACCEL_API void Abs_InPlace(unsigned int count, float* srcDst);
KESTACCEL_API void Abs_InPlace(unsigned int count, double* srcDst);
KESTACCEL_API void Round(unsigned int count, const float* src, float* dst);
KESTACCEL_API void Round(unsigned int count, const double* src, double* dst);
KESTACCEL_API void Flip(unsigned int count, const float* src, float* dst);
KESTACCEL_API void Flip(unsigned int count, const double* src, double* dst);
KESTACCEL_API void Flip_InPlace(unsigned int count, float* srcDst);
KESTACCEL_API void Flip_InPlace(unsigned int count, double* srcDst);
KESTACCEL_API void Magnitude(unsigned int count, const float* re, const float* im, float* dst);
KESTACCEL_API void Magnitude(unsigned int count, const double* re, const double* im, double* dst);
KESTACCEL_API void Magnitude(unsigned int count, const std::complex<float>* src, float* dst);
KESTACCEL_API void Magnitude(unsigned int count, const std::complex<double>* src, double* dst);
KESTACCEL_API void PowerSpectr(unsigned int count, const std::complex<float>* src, float* dst);
KESTACCEL_API void PowerSpectr(unsigned int count, const std::complex<double>* src, double* dst);
KESTACCEL_API void CartToPolar(unsigned int count, const float* src, float* magnitude, float* phase);
KESTACCEL_API void PolarToCart(unsigned int count, const float* magnitude, const float* phase, float* dst);
KESTACCEL_API void Normalize(unsigned int count, const float* src, float* dst, float offset, float divisor);
KESTACCEL_API void Normalize(unsigned int count, const double* src, double* dst, double offset, double divisor);
KESTACCEL_API void Invert_Threshold_InPlace(unsigned int count, float* srcDst, float threshold);
KESTACCEL_API void Invert_Threshold_InPlace(unsigned int count, double* srcDst, double threshold);
KESTACCEL_API void Invert_Threshold_InPlace(unsigned int count, std::complex<float>* srcDst, float threshold);
KESTACCEL_API void Invert_Threshold_InPlace(unsigned int count, std::complex<double>* srcDst, double threshold);

// ---------------------------------------------------------------------------
// Reductions and statistics.
//
// Sums, means and norms accumulate strictly in ascending index order from +0
// in one accumulator of the element's type: no partial sums, no pairing, no
// compensation. So Sum of {1e8f, 1, -1e8f} is 0 and a sum of -0 elements is
// +0. Count 0 gives 0.
//
//   Sum(n, src)                    src[0] + src[1] + ...
//   Mean(n, src)                   Sum / n, n converted from its unsigned value
//   NormL1(n, src)                 sum of |src[i]|
//   NormL2(n, src)                 sqrt of the sum of squares. On float each
//                                  square is rounded to float (it overflows
//                                  and underflows as a float) and only the
//                                  sum runs in double; the root is rounded
//                                  once to float.
//   StandardDeviation(n, src, r)   sample deviation: two passes (mean, then
//                                  squared deviations), divided by n - 1.
//                                  For n < 2 `r` is not written.
//
// Scans report positions; all tests are strict, and a NaN never wins a
// comparison, so a NaN at element 0 stays the result of Max/Min/MaxIndex/
// MinIndex. Max, Min, MinMax with references and MinMaxIndex read src[0]
// even for count 0.
//
//   Max, Min, MaxIndex, MinIndex   the first of equal elements wins. The index
//                                  functions return 0 for count 0 and store
//                                  the element through `value` unless null.
//   MinMax(n, src, min, max),      one paired scan: the minimum is the first
//   MinMaxIndex(n, src, min, max,  of the smallest elements, the maximum the
//               minIdx, maxIdx)    LAST of the largest (MaxIndex of {1,3,3,2}
//                                  is 1, MinMaxIndex's maximum index is 2).
//   MinMax(src, n)                 peak magnitude: the larger of -minimum and
//                                  maximum (pointer first, count second).
//                                  Count 0 gives 0; when either is NaN the
//                                  maximum element is returned as it is.
// In the paired scan a NaN at element 0 stays the minimum; a later NaN may
// become the maximum (as the larger of its pair, or the last single
// element) until the next element tested for the maximum replaces it. The
// peak-magnitude form pairs elements 0 and 1 first, the others start the
// pairs at element 1, which only matters with NaNs.
//
//   MaxEvery(n, a, b, dst)         b[i] if b[i] > a[i], else a[i]
//   MaxEvery_InPlace(n, src, sd)   sd[i] if sd[i] > src[i], else src[i]
//   MinEvery(n, a, b, dst)         b[i] if a[i] > b[i], else a[i]
//   MinEvery_InPlace(n, src, sd)   sd[i] if src[i] > sd[i], else src[i]
// The selected element is copied bit for bit; on equal values, +0 against -0
// or a NaN the first vector's element is taken, so a NaN there propagates
// and a NaN in the second vector does not.
//
// Only float has MaxIndex, MinIndex, MinMax, MinMaxIndex, MaxEvery and
// MinEvery. DotProduct is declared in kestaccel/DSP.h.
// ---------------------------------------------------------------------------
KESTACCEL_API float Sum(unsigned int count, const float* src);
KESTACCEL_API double Sum(unsigned int count, const double* src);
KESTACCEL_API float Mean(unsigned int count, const float* src);
KESTACCEL_API double Mean(unsigned int count, const double* src);
KESTACCEL_API float NormL1(unsigned int count, const float* src);
KESTACCEL_API double NormL1(unsigned int count, const double* src);
KESTACCEL_API float NormL2(unsigned int count, const float* src);
KESTACCEL_API double NormL2(unsigned int count, const double* src);
KESTACCEL_API void StandardDeviation(unsigned int count, const float* src, float& result);
KESTACCEL_API void StandardDeviation(unsigned int count, const double* src, double& result);

KESTACCEL_API float Max(unsigned int count, const float* src);
KESTACCEL_API double Max(unsigned int count, const double* src);
KESTACCEL_API float Min(unsigned int count, const float* src);
KESTACCEL_API double Min(unsigned int count, const double* src);
KESTACCEL_API unsigned int MaxIndex(unsigned int count, const float* src, float* value);
KESTACCEL_API unsigned int MinIndex(unsigned int count, const float* src, float* value);
KESTACCEL_API void MinMax(unsigned int count, const float* src, float& minimum, float& maximum);
KESTACCEL_API float MinMax(const float* src, unsigned int count);
KESTACCEL_API void MinMaxIndex(unsigned int count, const float* src, float& minimum, float& maximum,
                               unsigned int& minimumIndex, unsigned int& maximumIndex);

KESTACCEL_API void MaxEvery(unsigned int count, const float* a, const float* b, float* dst);
KESTACCEL_API void MaxEvery_InPlace(unsigned int count, const float* src, float* srcDst);
KESTACCEL_API void MinEvery(unsigned int count, const float* a, const float* b, float* dst);
KESTACCEL_API void MinEvery_InPlace(unsigned int count, const float* src, float* srcDst);

// ---------------------------------------------------------------------------
// Thresholds, trimming and ramps.
//
// Each element is tested once, strictly; when the test is false (equal to
// the level, +0 against -0, a NaN element or a NaN level) the element stands
// with its own bits.
//
//   Threshold_LT_InPlace(n, sd, level)          level if level > x, else x
//   Threshold_GT_InPlace(n, sd, level)          level if level < x, else x
//   Threshold_LTVal(n, src, dst, level, value)  value if level > x, else x
//   Threshold_GTVal(n, src, dst, level, value)  value if x > level, else x
//   (and the _InPlace forms of the two Val members)
//   Trim(n, sd, low, high)   low if low > x; else high if high < x; else x.
//                            The low test comes first and wins, so with
//                            low > high every other element becomes high.
//                            A NaN low or high disables that side. float only.
//   VectorSlope(n, dst, offset, slope)   dst[i] = T(i) * slope + offset,
//                            from the index at each element (no drift);
//                            the product and the sum round separately.
//
// `value` is stored as given, whichever side of the level it lies on.
// There are no out-of-place LT/GT forms and no double Trim.
// ---------------------------------------------------------------------------
KESTACCEL_API void Threshold_LT_InPlace(unsigned int count, float* srcDst, float level);
KESTACCEL_API void Threshold_LT_InPlace(unsigned int count, double* srcDst, double level);
KESTACCEL_API void Threshold_GT_InPlace(unsigned int count, float* srcDst, float level);
KESTACCEL_API void Threshold_GT_InPlace(unsigned int count, double* srcDst, double level);
KESTACCEL_API void Threshold_LTVal(unsigned int count, const float* src, float* dst, float level, float value);
KESTACCEL_API void Threshold_LTVal(unsigned int count, const double* src, double* dst, double level, double value);
KESTACCEL_API void Threshold_LTVal_InPlace(unsigned int count, float* srcDst, float level, float value);
KESTACCEL_API void Threshold_LTVal_InPlace(unsigned int count, double* srcDst, double level, double value);
KESTACCEL_API void Threshold_GTVal(unsigned int count, const float* src, float* dst, float level, float value);
KESTACCEL_API void Threshold_GTVal(unsigned int count, const double* src, double* dst, double level, double value);
KESTACCEL_API void Threshold_GTVal_InPlace(unsigned int count, float* srcDst, float level, float value);
KESTACCEL_API void Threshold_GTVal_InPlace(unsigned int count, double* srcDst, double level, double value);
KESTACCEL_API void Trim(unsigned int count, float* srcDst, float low, float high);
KESTACCEL_API void VectorSlope(unsigned int count, float* dst, float offset, float slope);
KESTACCEL_API void VectorSlope(unsigned int count, double* dst, double offset, double slope);

// ---------------------------------------------------------------------------
// Channel layout (Interleave, Deinterleave).
// ---------------------------------------------------------------------------
//
// Interleave(n, a, b, dst)        dst[2i] = a[i], dst[2i + 1] = b[i]
// Deinterleave(n, src, a, b)      a[i] = src[2i], b[i] = src[2i + 1]
// Interleave(channels, frames, sources, dst)
// Deinterleave(channels, frames, src, destinations)
//
// Element c of frame f of an interleaved buffer stands at f * channels + c.
// The N-channel forms take the number of channels first, then frames, and an
// array of `channels` pointers that is read anew for every element, so it
// must stay valid and unchanged for the whole call. The interleaved buffer is
// walked in memory order (frames outer, channels inner); one channel copies.
// Values move unchanged, bits and all. With 0 frames or 0 channels nothing is
// touched and the pointer array is not read.
// ---------------------------------------------------------------------------
KESTACCEL_API void Interleave(unsigned int count, const float* a, const float* b, float* dst);
KESTACCEL_API void Interleave(unsigned int count, const double* a, const double* b, double* dst);
KESTACCEL_API void Interleave(unsigned int channels, unsigned int frames, const float* const* sources, float* dst);
KESTACCEL_API void Interleave(unsigned int channels, unsigned int frames, const double* const* sources, double* dst);
KESTACCEL_API void Deinterleave(unsigned int count, const float* src, float* a, float* b);
KESTACCEL_API void Deinterleave(unsigned int count, const double* src, double* a, double* b);
KESTACCEL_API void Deinterleave(unsigned int channels, unsigned int frames, const float* src, float* const* destinations);
KESTACCEL_API void Deinterleave(unsigned int channels, unsigned int frames, const double* src, double* const* destinations);

// ---------------------------------------------------------------------------
// Half precision.
// ---------------------------------------------------------------------------
//
// Field-moving packing of floats into IEEE binary16 words and back; not an
// IEEE conversion. Float to half: the sign moves to bit 15, the 8-bit
// exponent e becomes (e - 112) mod 32, the top ten fraction bits are kept
// (truncated, never rounded); only +0.0 gives the word 0. So 65536.0 gives
// 7C00, 131072.0 and 2^-15 give 0000, +inf gives 3C00 (1.0), the quiet NaN
// 3E00 (1.5), -0.0 gives C000 (-2.0). Half to float: exponent + 112, fraction
// shifted up, no infinity, NaN or subnormal; only the word 0 gives +0.0
// (8000 gives -2^-15, 7C00 gives 65536.0). Normal half words come back
// exactly; floats of normal half range give the correctly rounded word or
// the one below it in magnitude.
//
// The order is source, destination, count, and the source is not const,
// though it is only read.
// ---------------------------------------------------------------------------
KESTACCEL_API void ConvertFloat2Half(float* src, unsigned short* dst, unsigned int count);
KESTACCEL_API void ConvertHalf2Float(unsigned short* src, float* dst, unsigned int count);

}  // namespace utility
}  // namespace kestaccel
