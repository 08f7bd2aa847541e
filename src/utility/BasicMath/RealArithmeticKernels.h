#pragma once

#include <cmath>
#include <cstddef>

#include "common/FloatToInt.h"

// Element-wise arithmetic on real vectors. Each loop is the plain scalar loop
// in ascending index order with a full-width index. The compiler vectorises
// these loops behind a run-time overlap test, so overlapping buffers (a
// destination one element behind a source) still see the values already
// written, exactly as the scalar loop does.
namespace kestaccel {
namespace utility {
namespace cpp {

template <class T>
void Add(unsigned int count, const T* a, const T* b, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = a[i] + b[i];
}

template <class T>
void Add_InPlace(unsigned int count, const T* src, T* srcDst)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = src[i] + srcDst[i];
}

// The first vector is the subtrahend.
template <class T>
void Sub(unsigned int count, const T* a, const T* b, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = b[i] - a[i];
}

template <class T>
void Sub_InPlace(unsigned int count, const T* src, T* srcDst)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = srcDst[i] - src[i];
}

template <class T>
void Mul(unsigned int count, const T* a, const T* b, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = a[i] * b[i];
}

template <class T>
void Mul_InPlace(unsigned int count, const T* src, T* srcDst)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = src[i] * srcDst[i];
}

// The first vector is the divisor. No zero test: IEEE gives inf or NaN.
template <class T>
void Div(unsigned int count, const T* a, const T* b, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = b[i] / a[i];
}

template <class T>
void Div_InPlace(unsigned int count, const T* src, T* srcDst)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = srcDst[i] / src[i];
}

template <class T>
void AddConstant(unsigned int count, const T* src, T constant, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = constant + src[i];
}

template <class T>
void AddConstant_InPlace(unsigned int count, T* srcDst, T constant)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = constant + srcDst[i];
}

template <class T>
void SubConstant(unsigned int count, const T* src, T constant, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = src[i] - constant;
}

template <class T>
void SubConstant_InPlace(unsigned int count, T* srcDst, T constant)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = srcDst[i] - constant;
}

template <class T>
void SubConstantRev(unsigned int count, const T* src, T constant, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = constant - src[i];
}

template <class T>
void SubConstantRev_InPlace(unsigned int count, T* srcDst, T constant)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = constant - srcDst[i];
}

template <class T>
void MulConstant(unsigned int count, const T* src, T* dst, T constant)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = constant * src[i];
}

template <class T>
void MulConstant_InPlace(unsigned int count, T* srcDst, T constant)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = constant * srcDst[i];
}

// The constant forms of division test the constant once, before the loop: a
// constant equal to zero (+0 or -0) skips the whole call and writes nothing.
// Each element is a true division, never a product with a reciprocal.
template <class T>
void DivConstant(unsigned int count, const T* src, T* dst, T constant)
{
    if (constant == T(0)) return;
    for (std::size_t i = 0; i < count; ++i) dst[i] = src[i] / constant;
}

template <class T>
void DivConstant_InPlace(unsigned int count, T* srcDst, T constant)
{
    if (constant == T(0)) return;
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = srcDst[i] / constant;
}

// Here the tested constant is the numerator: a zero numerator skips the call,
// while a zero element of src (the real divisor) gives an infinity.
inline void DivConstantRev(unsigned int count, float constant, const float* src, float* dst)
{
    if (constant == 0.0f) return;
    for (std::size_t i = 0; i < count; ++i) dst[i] = constant / src[i];
}

// Two roundings: the product is rounded to T before the addition. The build
// forbids contraction into a fused multiply-add.
template <class T>
void AddProduct(unsigned int count, const T* a, const T* b, T* srcDst)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = (a[i] * b[i]) + srcDst[i];
}

template <class T>
void AddConstantProduct(unsigned int count, const T* src, T* srcDst, T constant)
{
    for (std::size_t i = 0; i < count; ++i) srcDst[i] = (src[i] * constant) + srcDst[i];
}

// The one integer member: srcDst[i] * constant * 2^-scale. The product wraps
// to 16 bits before any scaling; the scaled value is narrowed to float and
// rounded half to even only when positive (a negative value has a fraction of
// zero or less and is truncated toward zero, ties included). Only the low 16
// bits of the result are stored.
inline void MulConstant_InPlace(unsigned int count, short* srcDst, short constant, int scale)
{
    if (count == 0) return;
    const int exponent = static_cast<int>(0u - static_cast<unsigned int>(scale));
    const double factor = std::pow(2.0, static_cast<double>(exponent));
    for (std::size_t i = 0; i < count; ++i) {
        const short wrapped = static_cast<short>(static_cast<int>(srcDst[i]) * static_cast<int>(constant));
        const float f = static_cast<float>(static_cast<double>(wrapped) * factor);
        const int t = detail::TruncateToInt32(f);
        const float frac = f - static_cast<float>(t);
        unsigned int result = static_cast<unsigned int>(t);
        if (frac > 0.5f || (frac == 0.5f && (t & 1) != 0)) result += 1u;
        srcDst[i] = static_cast<short>(result);
    }
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
