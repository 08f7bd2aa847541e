#pragma once

#include <climits>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstring>

#include <kestcore/utility/int24_t.h>

#include "common/FloatToInt.h"
#include "utility/VectorUtils/PackedBlocks.h"

// Sample conversion between integer PCM and floating point.
//
// Full scale is reached through a power-of-two exponent: the multiplier is
// 2^-scale in both directions. Integer to floating takes it from the double
// pow; floating to integer from the single-precision powf, and limits the
// source to +-1 before scaling (so a full-scale source becomes exactly +-m,
// which may wrap in the destination). Every loop is chosen once per call, and
// its body is made of selects and exact operations only, so that the
// compiler can vectorise it without changing a bit.
namespace kestaccel {
namespace utility {
namespace cpp {

using kestcore::utility::int24_t;

// ---------------------------------------------------------------------------
// Integer results of floating values.
// ---------------------------------------------------------------------------

// Round to nearest, halfway cases away from zero: the in-range results of
// lroundf. Written out because the library call blocks vectorisation and
// returns a long, 32 bits on some platforms and 64 on others. trunc(x) and
// the fraction x - trunc(x) are exact, and the fraction is only compared
// with one half, so the processor's rounding mode has no say (an added
// 0.49999997 would depend on it). A result outside the range of int, and a
// NaN, give -2147483648, as truncation does: such an x is replaced by 0, so
// its rounded value is 0 and the OR sets the sign bit alone. (A select there
// would let g++ move the rounding under a branch, and with SSE4.1 its
// trunc then keeps the loop scalar.)
inline int RoundToInt32(float value)
{
    const bool inRange = value >= -2147483648.0f && value < 2147483648.0f;
    const float x = inRange ? value : 0.0f;
    const int whole = static_cast<int>(x);
    const float fraction = x - static_cast<float>(whole);
    const int rounded = whole + (fraction >= 0.5f ? 1 : 0) - (fraction <= -0.5f ? 1 : 0);
    return rounded | (inRange ? 0 : INT_MIN);
}

// The same for lround of a double. Halves at the edges of int round out of
// range, hence the bounds at +-0.5. The step of one is added in double (an
// exact sum of small integers), and the indefinite value is selected as the
// double -2^31, because g++ does not vectorise a double comparison that
// selects an int.
inline int RoundToInt32(double value)
{
    const bool inRange = value > -2147483648.5 && value < 2147483647.5;
    const double x = inRange ? value : 0.0;
    const double whole = static_cast<double>(static_cast<int>(x));
    const double fraction = x - whole;
    const double step = (fraction >= 0.5 ? 1.0 : 0.0) - (fraction <= -0.5 ? 1.0 : 0.0);
    return static_cast<int>(inRange ? whole + step : -2147483648.0);
}

template <bool kRound, class Real>
inline int ToInt32(Real value)
{
    return kRound ? RoundToInt32(value) : detail::TruncateToInt32(value);
}

// The store rule of each destination: 8 and 16 bits keep the low bits (a
// wrap, no limit), 32 bits keep everything. 24 bits saturate through the
// type's conversion from int (in PackInBlocks).
template <class Dst>
inline Dst StoreInt32(int value);

template <>
inline unsigned char StoreInt32<unsigned char>(int value)
{
    return static_cast<unsigned char>(value);
}

template <>
inline short StoreInt32<short>(int value)
{
    return static_cast<short>(static_cast<unsigned short>(value));
}

template <>
inline int StoreInt32<int>(int value)
{
    return value;
}

// The limit on the source: anything at or beyond +-1 becomes exactly +-m; a
// NaN fails both tests and is scaled like any other value. Taken as written
// for the multipliers above 2^30, whose products need the range test.
inline float LimitAndScale(float x, float m)
{
    return x >= 1.0f ? m : (x <= -1.0f ? -m : x * m);
}

// The limit and scale in the common case, with every decision made on the
// float before one conversion. A source inside (-1, 1) scales exactly by
// the power of two `by`; one at or beyond +-1 becomes +-by; a NaN becomes
// +0 and then kIndefinite: the indefinite value or, where the store keeps
// only the low bits (all zero in it), plain 0, which drops its test. The
// choice is made on the bit patterns, not by selects: with selects g++
// converts both candidates and chooses between the integers, narrowed to
// the destination's width, at twice the cost.
//
// Truncation takes by = m, rounding by = 2m: with t = trunc(2v), rounding v
// half away from zero gives (t + 1) >> 1 for t > 0 and t >> 1 otherwise
// (trunc(2v) is 2 trunc(v) plus one exactly where the fraction reaches one
// half), from the one conversion and without the rounding mode. Doubling
// is exact, so +-2m gives the integers of +-m, as the general path does.
// |v| <= by must convert without a range test, hence by <= 2^30.
// kSignedLimit false gives +by to the sources beyond -1 as well, for
// destinations that cannot tell +m from -m (SignOfLimitIsLost): one AND
// and one OR fewer per vector.
template <bool kRound, int kIndefinite, bool kSignedLimit = true>
inline int LimitAndScaleToInt32(float x, float by)
{
    const float magnitude = std::fabs(x);
    const std::uint32_t inside = 0u - static_cast<std::uint32_t>(magnitude < 1.0f);
    const std::uint32_t beyond = 0u - static_cast<std::uint32_t>(magnitude >= 1.0f);
    const float scaled = x * by;
    const float limit = kSignedLimit ? std::copysign(by, x) : by;
    std::uint32_t scaledBits, limitBits;
    std::memcpy(&scaledBits, &scaled, sizeof scaledBits);
    std::memcpy(&limitBits, &limit, sizeof limitBits);
    const std::uint32_t chosenBits = (inside & scaledBits) | (beyond & limitBits);
    float chosen;
    std::memcpy(&chosen, &chosenBits, sizeof chosen);
    const int t = static_cast<int>(chosen);
    const int value = kRound ? (t + (t > 0 ? 1 : 0)) >> 1 : t;
    return value | ((inside | beyond) != 0 ? 0 : kIndefinite);
}

constexpr float kShortPathLimit = 1073741824.0f;  // 2^30

// A store that keeps the low 8 or 16 bits turns +m and -m into the same
// bits once m, a power of two, is at least 2^7 or 2^15: from scale -7 or
// -15 on, which includes full-scale 16-bit PCM.
template <class Dst>
inline bool SignOfLimitIsLost(float m)
{
    return sizeof(Dst) <= sizeof(short) && m >= static_cast<float>(1u << (8 * sizeof(Dst) - 1));
}

template <class Dst>
constexpr int kIndefiniteAfterStore = sizeof(Dst) <= sizeof(short) ? 0 : INT_MIN;

// 2^-scale for integer sources, from the double pow. The exponent is negated
// as an integer, wrapping as the hardware does for the lowest int.
inline double IntegerToRealMultiplier(int scale)
{
    const int negated = static_cast<int>(0u - static_cast<unsigned int>(scale));
    return std::pow(2.0, static_cast<double>(negated));
}

// 2^-scale for floating sources, from the single-precision powf.
inline float RealToIntegerMultiplier(int scale)
{
    return std::pow(2.0f, 0.0f - static_cast<float>(scale));
}

// ---------------------------------------------------------------------------
// Element loops. Each path hands its per-element step to one of these; the
// packed 24-bit forms go through blocks so that the arithmetic still
// vectorises.
// ---------------------------------------------------------------------------

template <class Src, class Dst, class ToInt>
void StoreEach(unsigned int count, const Src* src, Dst* dst, ToInt toInt)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = StoreInt32<Dst>(toInt(src[i]));
}

template <class Src, class ToInt>
void StoreEach(unsigned int count, const Src* src, int24_t* dst, ToInt toInt)
{
    PackInBlocks(count, src, dst, toInt);
}

template <class Src, class Real, class FromInt>
void ReadEach(unsigned int count, const Src* src, Real* dst, FromInt fromInt)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = fromInt(static_cast<int>(src[i]));
}

template <class Real, class FromInt>
void ReadEach(unsigned int count, const int24_t* src, Real* dst, FromInt fromInt)
{
    UnpackInBlocks(count, src, dst, fromInt);
}

// ---------------------------------------------------------------------------
// The paths, chosen once per call.
// ---------------------------------------------------------------------------

template <class Src, class Real>
void IntegerToReal(unsigned int count, const Src* src, Real* dst, int scale)
{
    if (scale == 0) {
        ReadEach(count, src, dst, [](int x) { return static_cast<Real>(x); });
    } else {
        const Real m = static_cast<Real>(IntegerToRealMultiplier(scale));
        ReadEach(count, src, dst, [m](int x) { return static_cast<Real>(x) * m; });
    }
}

template <bool kRound, class Dst>
void FloatToIntegerUnscaled(unsigned int count, const float* src, Dst* dst)
{
    StoreEach(count, src, dst, [](float x) { return ToInt32<kRound>(x); });
}

template <bool kRound, class Dst>
void FloatToIntegerScaled(unsigned int count, const float* src, Dst* dst, float m)
{
    const float by = kRound ? m + m : m;
    if (by <= kShortPathLimit && SignOfLimitIsLost<Dst>(m)) {
        StoreEach(count, src, dst,
                  [by](float x) { return LimitAndScaleToInt32<kRound, kIndefiniteAfterStore<Dst>, false>(x, by); });
    } else if (by <= kShortPathLimit) {
        StoreEach(count, src, dst,
                  [by](float x) { return LimitAndScaleToInt32<kRound, kIndefiniteAfterStore<Dst>>(x, by); });
    } else {
        StoreEach(count, src, dst, [m](float x) { return ToInt32<kRound>(LimitAndScale(x, m)); });
    }
}

template <class Dst>
void FloatToInteger(unsigned int count, const float* src, Dst* dst, int scale, bool round)
{
    if (scale == 0) {
        if (round) FloatToIntegerUnscaled<true>(count, src, dst);
        else FloatToIntegerUnscaled<false>(count, src, dst);
        return;
    }
    const float m = RealToIntegerMultiplier(scale);
    if (round) FloatToIntegerScaled<true>(count, src, dst, m);
    else FloatToIntegerScaled<false>(count, src, dst, m);
}

template <bool kRound>
void DoubleToInt32Unscaled(unsigned int count, const double* src, int* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = ToInt32<kRound>(src[i]);
}

// Limited elements take the integer of the float m or -m (lroundf or
// truncation of the float); elements in range are scaled and converted in
// double. Both limit results are fixed for the call.
template <bool kRound>
void DoubleToInt32Scaled(unsigned int count, const double* src, int* dst, float m)
{
    const int high = ToInt32<kRound>(m);
    const int low = ToInt32<kRound>(-m);
    const double scale = static_cast<double>(m);
    for (std::size_t i = 0; i < count; ++i) {
        const double x = src[i];
        const int inside = ToInt32<kRound>(scale * x);
        dst[i] = x >= 1.0 ? high : (x <= -1.0 ? low : inside);
    }
}

// ---------------------------------------------------------------------------
// The Convert overloads.
// ---------------------------------------------------------------------------

// An 8-bit sample is unsigned and passes by value: no bias, no scale.
inline void Convert(unsigned int count, const unsigned char* src, float* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = static_cast<float>(src[i]);
}

inline void Convert(unsigned int count, const short* src, float* dst, int scale)
{
    IntegerToReal(count, src, dst, scale);
}

inline void Convert(unsigned int count, const short* src, double* dst, int scale)
{
    IntegerToReal(count, src, dst, scale);
}

inline void Convert(unsigned int count, const int* src, float* dst, int scale)
{
    IntegerToReal(count, src, dst, scale);
}

inline void Convert(unsigned int count, const int* src, double* dst, int scale)
{
    IntegerToReal(count, src, dst, scale);
}

// Here scale counts right shifts (low five bits), the opposite sign of the
// floating-to-integer exponent; the arithmetic shift drops bits, so negative
// samples round toward minus infinity, and the store saturates.
inline void Convert(unsigned int count, const int* src, int24_t* dst, int scale)
{
    const int shift = scale & 31;
    StoreEach(count, src, dst, [shift](int x) { return x >> shift; });
}

inline void Convert(unsigned int count, const float* src, unsigned char* dst, int scale, bool round)
{
    FloatToInteger(count, src, dst, scale, round);
}

inline void Convert(unsigned int count, const float* src, short* dst, int scale, bool round)
{
    FloatToInteger(count, src, dst, scale, round);
}

inline void Convert(unsigned int count, const float* src, int* dst, int scale, bool round)
{
    FloatToInteger(count, src, dst, scale, round);
}

inline void Convert(unsigned int count, const float* src, double* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = static_cast<double>(src[i]);
}

inline void Convert(unsigned int count, const float* src, int24_t* dst, int scale, bool round)
{
    FloatToInteger(count, src, dst, scale, round);
}

// The multiplier is still the float from powf; the limit compares doubles.
inline void Convert(unsigned int count, const double* src, int* dst, int scale, bool round)
{
    if (scale == 0) {
        if (round) DoubleToInt32Unscaled<true>(count, src, dst);
        else DoubleToInt32Unscaled<false>(count, src, dst);
        return;
    }
    const float m = RealToIntegerMultiplier(scale);
    if (round) DoubleToInt32Scaled<true>(count, src, dst, m);
    else DoubleToInt32Scaled<false>(count, src, dst, m);
}

// One IEEE narrowing under the current rounding mode; overflow gives infinity.
inline void Convert(unsigned int count, const double* src, float* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = static_cast<float>(src[i]);
}

// Plain sign extension of bit 23; the value is not shifted up.
inline void Convert(unsigned int count, const int24_t* src, int* dst)
{
    for (std::size_t i = 0; i < count; ++i) dst[i] = static_cast<int>(src[i]);
}

inline void Convert(unsigned int count, const int24_t* src, float* dst, int scale)
{
    IntegerToReal(count, src, dst, scale);
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
