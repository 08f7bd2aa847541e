#pragma once

#include <cmath>
#include <complex>
#include <cstdint>
#include <cstring>
#include <type_traits>

// The one complex division of the library: Smith's scaled quotient, written
// out so that every divide member gives the same bits on every platform. A
// language runtime's own complex division is free to differ (scaling by
// powers of two, Annex G recovery of infinities), so it is never used.
namespace kestaccel {
namespace utility {
namespace cpp {

// The quiet NaN with a clear sign and a zero payload: the only value a bad
// denominator produces, in both components.
template <class T>
inline T DefaultNaN()
{
    static_assert(std::is_same<T, float>::value || std::is_same<T, double>::value, "float or double");
    using Bits = std::conditional_t<sizeof(T) == 4, std::uint32_t, std::uint64_t>;
    const Bits bits = sizeof(T) == 4 ? Bits(0x7FC00000u) : Bits(0x7FF8000000000000ull);
    T value;
    std::memcpy(&value, &bits, sizeof value);
    return value;
}

// u / v by Smith's method. Only the denominator is tested; a NaN in the
// numerator travels through the arithmetic. Every operation is rounded to T
// in the order of the method:
//
//   |vr| > |vi|:  w = vi / vr, d = vr + w * vi,
//                 ((ur + ui * w) / d, (ui - ur * w) / d)
//   otherwise:    w = vr / vi, d = vi + w * vr,
//                 ((ur * w + ui) / d, (ui * w - ur) / d)
//
// so equal magnitudes take the second form. The denominator is bad, and the
// result (NaN, NaN), when d is NaN or zero. That one test also covers a NaN
// part of v (the comparison fails, w and d become NaN) and a zero v (the
// second form then divides 0 by 0).
//
// The work is split in two so that a constant divisor is scaled once. Both
// forms of the numerator are computed and one is selected, without a
// branch, so that a loop over elements can run several at once; the
// selected bits are those of the form taken.
template <class T>
struct ScaledDivisor {
    T w;
    T d;
    bool realLarger;
};

template <class T>
inline ScaledDivisor<T> ScaleDivisor(T vr, T vi)
{
    const bool realLarger = std::fabs(vr) > std::fabs(vi);
    const T larger = realLarger ? vr : vi;
    const T smaller = realLarger ? vi : vr;
    const T w = smaller / larger;
    return {w, larger + w * smaller, realLarger};
}

template <class T>
inline std::complex<T> Divide(T ur, T ui, ScaledDivisor<T> v)
{
    const T reFirst = ur + ui * v.w, reSecond = ur * v.w + ui;
    const T imFirst = ui - ur * v.w, imSecond = ui * v.w - ur;
    const T re = (v.realLarger ? reFirst : reSecond) / v.d;
    const T im = (v.realLarger ? imFirst : imSecond) / v.d;
    const bool bad = (v.d != v.d) | (v.d == T(0));
    return std::complex<T>(bad ? DefaultNaN<T>() : re, bad ? DefaultNaN<T>() : im);
}

template <class T>
inline std::complex<T> Quotient(T ur, T ui, T vr, T vi)
{
    return Divide(ur, ui, ScaleDivisor(vr, vi));
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
