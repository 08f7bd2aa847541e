#pragma once

#include <Eigen/Core>

#include "kestaccel/Common.h"

// Dense matrix product through Eigen, over the caller's buffers as they lie.
namespace kestaccel {
namespace utility {
namespace cpp {

// Plain assignment, not noalias(): Eigen evaluates the whole product into a
// temporary and copies it to c afterwards, so c may be the same buffer as a
// or b. That temporary is the one allocation, on every call.
template <class T, int StorageOrder>
void MultiplyMapped(int rows, int cols, int inner, const T* a, const T* b, T* c)
{
    using Matrix = Eigen::Matrix<T, Eigen::Dynamic, Eigen::Dynamic, StorageOrder>;
    const Eigen::Map<const Matrix> lhs(a, static_cast<Eigen::Index>(rows), static_cast<Eigen::Index>(inner));
    const Eigen::Map<const Matrix> rhs(b, static_cast<Eigen::Index>(inner), static_cast<Eigen::Index>(cols));
    Eigen::Map<Matrix> result(c, static_cast<Eigen::Index>(rows), static_cast<Eigen::Index>(cols));
    result = lhs * rhs;
}

// c (rows x cols) = a (rows x inner) * b (inner x cols), all three dense in
// the one storage order. An order that names neither leaves c untouched.
template <class T>
void Multiply(MatrixDataOrder order, int rows, int cols, int inner, const T* a, const T* b, T* c)
{
    if (order == RowMajor) {
        MultiplyMapped<T, Eigen::RowMajor>(rows, cols, inner, a, b, c);
    } else if (order == ColMajor) {
        MultiplyMapped<T, Eigen::ColMajor>(rows, cols, inner, a, b, c);
    }
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
