#pragma once

#include <complex>

#include "kestaccel/Common.h"

namespace kestaccel {
namespace utility {

// ---------------------------------------------------------------------------
// Matrix product: c = a * b, with a of rows x inner, b of inner x cols and
// c of rows x cols (note the order of the dimension arguments), all dense
// in the one storage order given, without strides, conjugation or
// transposition. The product is Eigen's, single-threaded, through maps of
// the caller's buffers: each element is within 32 machine epsilons of the
// naive sum for operands in [-1, 1], but its bits may depend on how Eigen
// was built (its summation order follows the vector width). c is written
// only once the product is complete, so it may be the same buffer as a or
// b; the call allocates a temporary for that.
// An order other than RowMajor (0) or ColMajor (1) leaves c untouched;
// rows or cols of 0 write nothing; inner of 0 fills c with zeros.
// Throws std::bad_alloc if the temporary cannot be had, before c is touched.
// ---------------------------------------------------------------------------
KESTACCEL_API void Multiply(MatrixDataOrder order, int rows, int cols, int inner, const float* a, const float* b,
                            float* c);
KESTACCEL_API void Multiply(MatrixDataOrder order, int rows, int cols, int inner, const double* a, const double* b,
                            double* c);
KESTACCEL_API void Multiply(MatrixDataOrder order, int rows, int cols, int inner, const std::complex<float>* a,
                            const std::complex<float>* b, std::complex<float>* c);
KESTACCEL_API void Multiply(MatrixDataOrder order, int rows, int cols, int inner, const std::complex<double>* a,
                            const std::complex<double>* b, std::complex<double>* c);

}  // namespace utility
}  // namespace kestaccel
