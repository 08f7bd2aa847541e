#pragma once

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <type_traits>

#include "utility/BasicMath/RuntimeMath.h"

// One-input functions of real vectors. Plain ascending loops with a
// full-width index; the arithmetic ones vectorise behind the compiler's
// overlap test, the others call the runtime once per element in the
// element's own precision.
namespace kestaccel {
namespace utility {
namespace cpp {

template <class T>
void Sqr(unsigned int count, const T* src, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = src[i] * src[i];
}

template <class T>
void Sqr_InPlace(unsigned int count, T* srcDst)
{
    Sqr(count, srcDst, srcDst);
}

// The square root instruction is correctly rounded; a negative element goes
// to the runtime's sqrtf or sqrt, which returns the NaN.
template <class T>
void Sqrt(unsigned int count, const T* src, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = runtime::Sqrt(src[i]);
}

template <class T>
void Sqrt_InPlace(unsigned int count, T* srcDst)
{
    Sqrt(count, srcDst, srcDst);
}

template <class T>
void Exp(unsigned int count, const T* src, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = runtime::Exp(src[i]);
}

template <class T>
void Exp_InPlace(unsigned int count, T* srcDst)
{
    Exp(count, srcDst, srcDst);
}

template <class T>
void Ln(unsigned int count, const T* src, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = runtime::Log(src[i]);
}

// Single precision only; double has no in-place logarithm.
inline void Ln_InPlace(unsigned int count, float* srcDst) { Ln(count, srcDst, srcDst); }

// The precision in these names selects nothing: all give the bits of Ln.
inline void Ln_Prec11(unsigned int count, const float* src, float* dst) { Ln(count, src, dst); }
inline void Ln_Prec21(unsigned int count, const float* src, float* dst) { Ln(count, src, dst); }
inline void Ln_Prec24(unsigned int count, const float* src, float* dst) { Ln(count, src, dst); }

// a[i] is the base, b[i] the exponent: the reverse of the Sub and Div order.
template <class T>
void Pow(unsigned int count, const T* a, const T* b, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = runtime::Pow(a[i], b[i]);
}

inline void Pow_Prec26(unsigned int count, const double* a, const double* b, double* dst) { Pow(count, a, b, dst); }

// One true division per element; a zero gives an infinity of its sign.
template <class T>
void Inverse(unsigned int count, const T* src, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = T(1) / src[i];
}

inline void Inverse_Prec26(unsigned int count, const double* src, double* dst) { Inverse(count, src, dst); }

// Negates only what compares below zero: -0 and a NaN with its sign bit set
// come out as they went in. Abs_InPlace follows another rule on purpose.
template <class T>
void Abs(unsigned int count, const T* src, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) {
        const T x = src[i];
        dst[i] = T(0) > x ? -x : x;
    }
}

// Clears the sign bit of every element unconditionally: -0 becomes +0 and a
// negative NaN a positive one, unlike Abs.
template <class T>
void Abs_InPlace(unsigned int count, T* srcDst)
{
    using Bits = std::conditional_t<sizeof(T) == 4, std::uint32_t, std::uint64_t>;
    const Bits magnitudeMask = ~(Bits(1) << (8 * sizeof(T) - 1));
    for (std::size_t i = 0; i < count; ++i) {
        Bits bits;
        std::memcpy(&bits, &srcDst[i], sizeof bits);
        bits &= magnitudeMask;
        std::memcpy(&srcDst[i], &bits, sizeof bits);
    }
}

// Nearest integer, ties away from zero, whatever the processor's rounding
// mode; the result stays in T.
template <class T>
void Round(unsigned int count, const T* src, T* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = runtime::Round(src[i]);
}

// A forward copy reading from the back of src. With dst == src the second
// half reads what the first half wrote; Flip_InPlace is the reversal.
template <class T>
void Flip(unsigned int count, const T* src, T* dst)
{
    const std::size_t last = std::size_t(count) - 1;
    for (std::size_t i = 0; i < count; ++i) dst[i] = src[last - i];
}

// Swaps the outermost pair and moves inward; an odd middle stays put.
template <class T>
void Flip_InPlace(unsigned int count, T* srcDst)
{
    const std::size_t half = count / 2;
    const std::size_t last = std::size_t(count) - 1;
    for (std::size_t i = 0; i < half; ++i) {
        const T front = srcDst[i];
        srcDst[i] = srcDst[last - i];
        srcDst[last - i] = front;
    }
}

// Subtract and round, then divide and round. No zero test on the divisor,
// unlike DivConstant: a zero divisor writes infinities and NaNs.
template <class T>
void Normalize(unsigned int count, const T* src, T* dst, T offset, T divisor)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = (src[i] - offset) / divisor;
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
