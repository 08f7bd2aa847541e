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

// u / v. Only the denominator is tested; a NaN in the numerator travels
// through the arithmetic. Equal magnitudes take the second branch, and every
// operation is rounded to T in the order written.
template <class T>
inline std::complex<T> Quotient(T ur, T ui, T vr, T vi)
{
    const std::complex<T> bad(DefaultNaN<T>(), DefaultNaN<T>());
    if (std::isnan(vr) || std::isnan(vi)) return bad;
    if (std::fabs(vr) > std::fabs(vi)) {
        const T w = vi / vr;
        const T d = vr + w * vi;
        if (std::isnan(d) || d == T(0)) return bad;
        return std::complex<T>((ur + ui * w) / d, (ui - ur * w) / d);
    }
    // Here |vr| <= |vi|, so a zero vi means a zero denominator.
    if (vi == T(0)) return bad;
    const T w = vr / vi;
    const T d = vi + w * vr;
    if (std::isnan(d) || d == T(0)) return bad;
    return std::complex<T>((ur * w + ui) / d, (ui * w - ur) / d);
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
