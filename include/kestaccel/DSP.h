#pragma once

#include <complex>

#include "kestaccel/Common.h"

namespace kestaccel {
namespace utility {

// ---------------------------------------------------------------------------
// Dot product.
//
//   DotProduct(n, a, b)   a[0]*b[0] + a[1]*b[1] + ..., each product rounded
//                         to the element type before it is added, the sum
//                         running from +0 in ascending index order in that
//                         type (no widening, no fused multiply-add). Count 0
//                         gives 0.
// ---------------------------------------------------------------------------
KESTACCEL_API float DotProduct(unsigned int count, const float* a, const float* b);
KESTACCEL_API double DotProduct(unsigned int count, const double* a, const double* b);

// ---------------------------------------------------------------------------
// Convolution and rate change.
// ---------------------------------------------------------------------------
// Convolve: full linear convolution by direct summation into
// countA + countB - 1 elements: dst[k] = sum over j of a[j] * b[k - j],
// summed from +0 in the element type (float sums in float) in ascending
// order of j, the index into the first array. The order never depends on
// the sizes, so swapping a and b gives the same values up to rounding only.
// Both counts must be at least 1 (two zero counts wrap around). dst must not
// overlap a or b. The workBuffer of the six-argument form is never touched
// and may be null; ConvolutionWorkBufferSize answers 0 for any counts.
//
// UpSample: n * factor outputs; src[i] goes to dst[i * factor + *phase] and
// every other output is 0. *phase is read, not changed; a phase at or above
// factor gives only zeros. Not in place when factor is above 1.
//
// DownSample: keeps src[P], src[P + factor], ... of this block, where
// P = *phase, writing (n - P + factor - 1) / factor samples (the count is
// not returned), and sets *phase to (P - n % factor + factor) % factor, the
// offset of the next grid point in the following block; blocks of any
// length then form one continuous decimation. Start a stream with a phase
// below factor. In place is safe. factor 0 divides by zero.
KESTACCEL_API void Convolve(unsigned int countA, const float* a, unsigned int countB, const float* b, float* dst,
                            float* workBuffer);
KESTACCEL_API void Convolve(unsigned int countA, const float* a, unsigned int countB, const float* b, float* dst);
KESTACCEL_API void Convolve(unsigned int countA, const double* a, unsigned int countB, const double* b, double* dst,
                            double* workBuffer);
KESTACCEL_API void Convolve(unsigned int countA, const double* a, unsigned int countB, const double* b, double* dst);
KESTACCEL_API unsigned long long ConvolutionWorkBufferSize(unsigned int countA, unsigned int countB);
KESTACCEL_API void UpSample(unsigned int n, const float* src, float* dst, unsigned int factor, unsigned int* phase);
KESTACCEL_API void UpSample(unsigned int n, const double* src, double* dst, unsigned int factor, unsigned int* phase);
KESTACCEL_API void DownSample(unsigned int n, const float* src, float* dst, unsigned int factor, unsigned int* phase);
KESTACCEL_API void DownSample(unsigned int n, const double* src, double* dst, unsigned int factor,
                              unsigned int* phase);

}  // namespace utility
}  // namespace kestaccel
