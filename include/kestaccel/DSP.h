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
// @@section convolution

}  // namespace utility
}  // namespace kestaccel
