#pragma once

#include <complex>
#include <cstddef>

#include "utility/BasicMath/ComplexQuotient.h"

// Element-wise arithmetic on complex vectors. A std::complex<T> array is the
// same memory as an array of 2 * count T values (real first), and the loops
// work on those components directly: the compiler then vectorises them
// behind its run-time overlap test, and no operator of std::complex is
// involved. That matters for the product, which std::complex hands to a
// runtime helper that repairs infinities (Annex G); here (inf, 0) * (1, 0) is
// (inf, NaN), exactly what the four products give.
//
// Every loop reads all components of element i before it writes element i,
// so a destination that coincides with a source, or lies behind it, sees
// what the plain ascending loop over whole elements sees.
namespace kestaccel {
namespace utility {
namespace cpp {

namespace detail {

template <class T>
const T* Components(const std::complex<T>* z) { return reinterpret_cast<const T*>(z); }

template <class T>
T* Components(std::complex<T>* z) { return reinterpret_cast<T*>(z); }

// The product (xr, xi) * (yr, yi) on the components: four products, each
// rounded, then one difference and one sum. Every product member uses it, so
// MulConstant equals Mul by a vector of equal elements, bit for bit.
template <class T>
void Product(T xr, T xi, T yr, T yi, T& re, T& im)
{
    re = xr * yr - xi * yi;
    im = xr * yi + xi * yr;
}

// Element i is read whole, both components of both operands, before it is
// written, so a destination that starts half an element after a source sees
// what the loop over whole elements sees.
template <class T, class Op>
void EachElement(unsigned int count, const std::complex<T>* a, const std::complex<T>* b, std::complex<T>* dst, Op op)
{
    const T* x = Components(a);
    const T* y = Components(b);
    T* out = Components(dst);
    for (std::size_t i = 0; i < count; ++i) {
        const T xr = x[2 * i], xi = x[2 * i + 1], yr = y[2 * i], yi = y[2 * i + 1];
        out[2 * i] = op(xr, yr);
        out[2 * i + 1] = op(xi, yi);
    }
}

}  // namespace detail

template <class T>
void Add(unsigned int count, const std::complex<T>* a, const std::complex<T>* b, std::complex<T>* dst)
{
    detail::EachElement(count, a, b, dst, [](T x, T y) { return x + y; });
}

template <class T>
void Add_InPlace(unsigned int count, const std::complex<T>* src, std::complex<T>* srcDst)
{
    Add(count, src, srcDst, srcDst);
}

// The first vector is the subtrahend, as in the real family.
template <class T>
void Sub(unsigned int count, const std::complex<T>* a, const std::complex<T>* b, std::complex<T>* dst)
{
    detail::EachElement(count, a, b, dst, [](T x, T y) { return y - x; });
}

template <class T>
void Sub_InPlace(unsigned int count, const std::complex<T>* src, std::complex<T>* srcDst)
{
    Sub(count, src, srcDst, srcDst);
}

template <class T>
void AddConstant(unsigned int count, const std::complex<T>* src, std::complex<T> constant, std::complex<T>* dst)
{
    const T cr = constant.real(), ci = constant.imag();
    const T* x = detail::Components(src);
    T* out = detail::Components(dst);
    for (std::size_t i = 0; i < count; ++i) {
        const T re = cr + x[2 * i];
        const T im = ci + x[2 * i + 1];
        out[2 * i] = re;
        out[2 * i + 1] = im;
    }
}

template <class T>
void AddConstant_InPlace(unsigned int count, std::complex<T>* srcDst, std::complex<T> constant)
{
    AddConstant(count, srcDst, constant, srcDst);
}

template <class T>
void SubConstant(unsigned int count, const std::complex<T>* src, std::complex<T> constant, std::complex<T>* dst)
{
    const T cr = constant.real(), ci = constant.imag();
    const T* x = detail::Components(src);
    T* out = detail::Components(dst);
    for (std::size_t i = 0; i < count; ++i) {
        const T re = x[2 * i] - cr;
        const T im = x[2 * i + 1] - ci;
        out[2 * i] = re;
        out[2 * i + 1] = im;
    }
}

template <class T>
void SubConstant_InPlace(unsigned int count, std::complex<T>* srcDst, std::complex<T> constant)
{
    SubConstant(count, srcDst, constant, srcDst);
}

template <class T>
void SubConstantRev(unsigned int count, const std::complex<T>* src, std::complex<T> constant, std::complex<T>* dst)
{
    const T cr = constant.real(), ci = constant.imag();
    const T* x = detail::Components(src);
    T* out = detail::Components(dst);
    for (std::size_t i = 0; i < count; ++i) {
        const T re = cr - x[2 * i];
        const T im = ci - x[2 * i + 1];
        out[2 * i] = re;
        out[2 * i + 1] = im;
    }
}

template <class T>
void SubConstantRev_InPlace(unsigned int count, std::complex<T>* srcDst, std::complex<T> constant)
{
    SubConstantRev(count, srcDst, constant, srcDst);
}

template <class T>
void Mul(unsigned int count, const std::complex<T>* a, const std::complex<T>* b, std::complex<T>* dst)
{
    const T* x = detail::Components(a);
    const T* y = detail::Components(b);
    T* out = detail::Components(dst);
    for (std::size_t i = 0; i < count; ++i) {
        T re, im;
        detail::Product(x[2 * i], x[2 * i + 1], y[2 * i], y[2 * i + 1], re, im);
        out[2 * i] = re;
        out[2 * i + 1] = im;
    }
}

template <class T>
void Mul_InPlace(unsigned int count, const std::complex<T>* src, std::complex<T>* srcDst)
{
    Mul(count, src, srcDst, srcDst);
}

template <class T>
void MulConstant(unsigned int count, const std::complex<T>* src, std::complex<T>* dst, std::complex<T> constant)
{
    const T yr = constant.real(), yi = constant.imag();
    const T* x = detail::Components(src);
    T* out = detail::Components(dst);
    for (std::size_t i = 0; i < count; ++i) {
        T re, im;
        detail::Product(x[2 * i], x[2 * i + 1], yr, yi, re, im);
        out[2 * i] = re;
        out[2 * i + 1] = im;
    }
}

template <class T>
void MulConstant_InPlace(unsigned int count, std::complex<T>* srcDst, std::complex<T> constant)
{
    MulConstant(count, srcDst, srcDst, constant);
}

// The product is rounded component by component before srcDst is added.
template <class T>
void AddProduct(unsigned int count, const std::complex<T>* a, const std::complex<T>* b, std::complex<T>* srcDst)
{
    const T* x = detail::Components(a);
    const T* y = detail::Components(b);
    T* io = detail::Components(srcDst);
    for (std::size_t i = 0; i < count; ++i) {
        T pr, pi;
        detail::Product(x[2 * i], x[2 * i + 1], y[2 * i], y[2 * i + 1], pr, pi);
        const T re = pr + io[2 * i];
        const T im = pi + io[2 * i + 1];
        io[2 * i] = re;
        io[2 * i + 1] = im;
    }
}

// b[i] over a[i]: the first vector is the divisor. A zero or NaN divisor
// element gives (NaN, NaN) at that index only; there is no whole-call test.
template <class T>
void Div(unsigned int count, const std::complex<T>* a, const std::complex<T>* b, std::complex<T>* dst)
{
    const T* v = detail::Components(a);
    const T* u = detail::Components(b);
    T* out = detail::Components(dst);
    for (std::size_t i = 0; i < count; ++i) {
        const T vr = v[2 * i], vi = v[2 * i + 1];
        const T ur = u[2 * i], ui = u[2 * i + 1];
        const std::complex<T> q = Quotient(ur, ui, vr, vi);
        out[2 * i] = q.real();
        out[2 * i + 1] = q.imag();
    }
}

template <class T>
void Div_InPlace(unsigned int count, const std::complex<T>* src, std::complex<T>* srcDst)
{
    Div(count, src, srcDst, srcDst);
}

// The constant forms test the constant once: both parts equal to zero (+0 or
// -0) skip the call and write nothing. A constant with a NaN part passes the
// test, and the quotient then fills the destination with (NaN, NaN).
template <class T>
bool IsZeroDivisor(std::complex<T> constant)
{
    return constant.real() == T(0) && constant.imag() == T(0);
}

template <class T>
void DivConstant(unsigned int count, const std::complex<T>* src, std::complex<T>* dst, std::complex<T> constant)
{
    if (IsZeroDivisor(constant)) return;
    const ScaledDivisor<T> v = ScaleDivisor(constant.real(), constant.imag());
    const T* u = detail::Components(src);
    T* out = detail::Components(dst);
    for (std::size_t i = 0; i < count; ++i) {
        const T ur = u[2 * i], ui = u[2 * i + 1];
        const std::complex<T> q = Divide(ur, ui, v);
        out[2 * i] = q.real();
        out[2 * i + 1] = q.imag();
    }
}

template <class T>
void DivConstant_InPlace(unsigned int count, std::complex<T>* srcDst, std::complex<T> constant)
{
    DivConstant(count, srcDst, srcDst, constant);
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
