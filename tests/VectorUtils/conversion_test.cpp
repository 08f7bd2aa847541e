// Convert: the hand-worked values of each overload (limits, wraps, the
// indefinite value, the mixed float/double path), then every overload against
// a plain loop written here around the runtime's pow, powf, lroundf and
// lround, bit for bit, on seeded random data with halves, huge values, NaN
// and infinities; rounding under every rounding mode; exact round trips.

#include <kestaccel/VectorUtils.h>

#include <cfenv>
#include <climits>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <random>
#include <vector>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
using kestcore::utility::int24_t;
namespace ku = kestaccel::utility;

const float kNaN = std::numeric_limits<float>::quiet_NaN();
const float kInf = std::numeric_limits<float>::infinity();

int24_t Packed(unsigned char b0, unsigned char b1, unsigned char b2)
{
    int24_t word;
    word.bytes[0] = b0;
    word.bytes[1] = b1;
    word.bytes[2] = b2;
    return word;
}

// ---------------------------------------------------------------------------
// The reference: plain scalar steps, one element at a time.
// ---------------------------------------------------------------------------

// Truncation and rounding to 32 bits; the indefinite value for NaN and for
// results outside int, made explicit so that the reference does not depend on
// the width of long.
int RefTruncate(float x)
{
    if (std::isnan(x) || x < -2147483648.0f || x >= 2147483648.0f) return INT_MIN;
    return static_cast<int>(x);
}

int RefTruncate(double x)
{
    if (std::isnan(x) || x <= -2147483649.0 || x >= 2147483648.0) return INT_MIN;
    return static_cast<int>(x);
}

int RefRound(float x)
{
    if (std::isnan(x) || x < -2147483648.0f || x >= 2147483648.0f) return INT_MIN;
    return static_cast<int>(std::lroundf(x));
}

int RefRound(double x)
{
    if (std::isnan(x) || x <= -2147483648.5 || x >= 2147483647.5) return INT_MIN;
    return static_cast<int>(std::lround(x));
}

template <class Dst>
Dst RefStore(int value);

template <>
unsigned char RefStore<unsigned char>(int value)
{
    return static_cast<unsigned char>(static_cast<unsigned int>(value) & 0xFFu);
}

template <>
short RefStore<short>(int value)
{
    const int low = static_cast<int>(static_cast<unsigned int>(value) & 0xFFFFu);
    return static_cast<short>(low >= 32768 ? low - 65536 : low);
}

template <>
int RefStore<int>(int value)
{
    return value;
}

template <>
int24_t RefStore<int24_t>(int value)
{
    const int v = value > 8388607 ? 8388607 : (value < -8388608 ? -8388608 : value);
    const unsigned int u = static_cast<unsigned int>(v);
    return Packed(static_cast<unsigned char>(u), static_cast<unsigned char>(u >> 8), static_cast<unsigned char>(u >> 16));
}

int RefInt24Value(int24_t word)
{
    int v = word.bytes[0] | (word.bytes[1] << 8) | (word.bytes[2] << 16);
    if (v & 0x800000) v -= 0x1000000;
    return v;
}

template <class Dst>
Dst RefFromFloat(float x, int scale, bool round)
{
    float v = x;
    if (scale != 0) {
        const float m = std::pow(2.0f, 0.0f - static_cast<float>(scale));
        if (x >= 1.0f) v = m;
        else if (x <= -1.0f) v = -m;
        else v = x * m;
    }
    return RefStore<Dst>(round ? RefRound(v) : RefTruncate(v));
}

int RefFromDouble(double x, int scale, bool round)
{
    if (scale == 0) return round ? RefRound(x) : RefTruncate(x);
    const float m = std::pow(2.0f, 0.0f - static_cast<float>(scale));
    if (x >= 1.0) return round ? RefRound(m) : RefTruncate(m);
    if (x <= -1.0) return round ? RefRound(-m) : RefTruncate(-m);
    const double v = static_cast<double>(m) * x;
    return round ? RefRound(v) : RefTruncate(v);
}

template <class Real>
Real RefToReal(int value, int scale)
{
    if (scale == 0) return static_cast<Real>(value);
    const Real m = static_cast<Real>(std::pow(2.0, static_cast<double>(-scale)));
    return static_cast<Real>(value) * m;
}

::testing::AssertionResult SameWords(const int24_t* expected, const int24_t* actual, std::size_t count)
{
    for (std::size_t i = 0; i < count; ++i) {
        if (!(expected[i] == actual[i]))
            return ::testing::AssertionFailure() << "expected " << RefInt24Value(expected[i]) << ", got "
                                                 << RefInt24Value(actual[i]) << " at index " << i;
    }
    return ::testing::AssertionSuccess();
}

template <class T>
::testing::AssertionResult SameValues(const std::vector<T>& expected, const std::vector<T>& actual)
{
    if (expected.size() != actual.size()) return ::testing::AssertionFailure() << "sizes differ";
    if constexpr (std::is_same_v<T, int24_t>) {
        return SameWords(expected.data(), actual.data(), expected.size());
    } else if constexpr (std::is_floating_point_v<T>) {
        return SameBitsArray(expected, actual);
    } else {
        for (std::size_t i = 0; i < expected.size(); ++i) {
            if (expected[i] != actual[i])
                return ::testing::AssertionFailure() << "expected " << +expected[i] << ", got " << +actual[i]
                                                     << " at index " << i;
        }
        return ::testing::AssertionSuccess();
    }
}

// One call of the library on a guarded destination.
template <class Src, class Dst, class... Args>
std::vector<Dst> Converted(const std::vector<Src>& src, Args... args)
{
    GuardedBuffer<Dst> dst(src.size());
    ku::Convert(static_cast<unsigned int>(src.size()), src.data(), dst.data(), args...);
    EXPECT_TRUE(dst.Intact());
    return dst.values();
}

// Floating sources that reach every branch: in-range values, halves before
// and after scaling, the limits and their neighbours, huge values, NaN with
// payloads and either sign, infinities, signed zeros, subnormals.
template <class Real>
std::vector<Real> MixedSources(std::size_t count, std::uint32_t seed, int scale)
{
    std::mt19937 engine(seed);
    std::uniform_real_distribution<Real> unit(Real(-1.25), Real(1.25));
    std::uniform_int_distribution<int> whole(-70000, 70000);
    std::uniform_int_distribution<int> sixteen(-32768, 32767);
    const Real full = std::pow(Real(2), static_cast<Real>(-scale));
    const Real nan = std::numeric_limits<Real>::quiet_NaN();
    const Real specials[] = {Real(0.5), Real(-0.5), Real(1.5), Real(-1.5), Real(2.5), Real(-2.5), Real(1), Real(-1),
                             std::nextafter(Real(1), Real(0)), std::nextafter(Real(-1), Real(0)), Real(-0.0), Real(0),
                             Real(70000), Real(1e10), Real(-1e10), Real(3e9), Real(-3e9), Real(2147483648.0),
                             Real(-2147483648.0), Real(2147483520.0), Real(-2147483520.0), Real(2147483647.5),
                             Real(-2147483648.5), Real(2147483647.0), Real(-2147483649.0), Real(0.49999997f),
                             Real(-0.49999997f), Real(8388607.5), Real(-8388608.5), nan, -nan,
                             FromBits<Real>(Bits(nan) | 0x15u), std::numeric_limits<Real>::infinity(),
                             -std::numeric_limits<Real>::infinity(), std::numeric_limits<Real>::denorm_min(),
                             Real(1e-40f)};
    const std::size_t specialCount = sizeof specials / sizeof specials[0];
    std::vector<Real> values(count);
    for (std::size_t i = 0; i < count; ++i) {
        switch (i % 6) {
        case 0: values[i] = specials[(i / 6) % specialCount]; break;
        case 1: values[i] = unit(engine); break;
        // A half after scaling: (k + 0.5) / full.
        case 2: values[i] = (static_cast<Real>(sixteen(engine)) + Real(0.5)) / (scale == 0 ? Real(1) : full); break;
        case 3: values[i] = static_cast<Real>(whole(engine)) + Real(0.5); break;
        case 4: values[i] = unit(engine) * Real(4e9); break;
        default: values[i] = unit(engine) * Real(0.001); break;
        }
    }
    return values;
}

const int kToIntegerScales[] = {0, 1, -1, -7, -8, -15, -16, -23, -24, -31, -32, 3, -40};

// ---------------------------------------------------------------------------
// Hand-worked values.
// ---------------------------------------------------------------------------

TEST(ConvertHandWorked, BytesPassByValue)
{
    const std::vector<unsigned char> src = {0, 128, 255};
    const auto dst = Converted<unsigned char, float>(src);
    EXPECT_TRUE(SameBits(0.0f, dst[0]));
    EXPECT_TRUE(SameBits(128.0f, dst[1]));
    EXPECT_TRUE(SameBits(255.0f, dst[2]));
}

TEST(ConvertHandWorked, IntegersUnscaled)
{
    const std::vector<short> shorts = {0, -32768, 32767};
    const auto f16 = Converted<short, float>(shorts, 0);
    const auto d16 = Converted<short, double>(shorts, 0);
    const float fExpected[] = {0.0f, -32768.0f, 32767.0f};
    const double dExpected[] = {0.0, -32768.0, 32767.0};
    for (int i = 0; i < 3; ++i) {
        EXPECT_TRUE(SameBits(fExpected[i], f16[i]));
        EXPECT_TRUE(SameBits(dExpected[i], d16[i]));
    }

    const std::vector<int> ints = {0, INT_MIN, INT_MAX};
    const auto f32 = Converted<int, float>(ints, 0);
    const auto d32 = Converted<int, double>(ints, 0);
    EXPECT_TRUE(SameBits(0.0f, f32[0]));
    EXPECT_TRUE(SameBits(-2147483648.0f, f32[1]));
    EXPECT_TRUE(SameBits(2147483648.0f, f32[2]));  // rounded to nearest
    EXPECT_TRUE(SameBits(0.0, d32[0]));
    EXPECT_TRUE(SameBits(-2147483648.0, d32[1]));
    EXPECT_TRUE(SameBits(2147483647.0, d32[2]));

    const std::vector<int24_t> packed = {Packed(0, 0, 0), Packed(0, 0, 0x80), Packed(0xFF, 0xFF, 0x7F)};
    const auto f24 = Converted<int24_t, float>(packed, 0);
    EXPECT_TRUE(SameBits(0.0f, f24[0]));
    EXPECT_TRUE(SameBits(-8388608.0f, f24[1]));
    EXPECT_TRUE(SameBits(8388607.0f, f24[2]));
}

TEST(ConvertHandWorked, IntegersScaledToUnitRange)
{
    const auto f16 = Converted<short, float>(std::vector<short>{-32768, 16384}, 15);
    EXPECT_TRUE(SameBits(-1.0f, f16[0]));
    EXPECT_TRUE(SameBits(0.5f, f16[1]));
    const auto d16 = Converted<short, double>(std::vector<short>{-32768, 16384}, 15);
    EXPECT_TRUE(SameBits(-1.0, d16[0]));
    EXPECT_TRUE(SameBits(0.5, d16[1]));

    EXPECT_TRUE(SameBits(-1.0f, Converted<int24_t, float>(std::vector<int24_t>{Packed(0, 0, 0x80)}, 23)[0]));
    EXPECT_TRUE(SameBits(-1.0f, Converted<int, float>(std::vector<int>{INT_MIN}, 31)[0]));
    EXPECT_TRUE(SameBits(-1.0, Converted<int, double>(std::vector<int>{INT_MIN}, 31)[0]));

    // A negative exponent multiplies.
    EXPECT_TRUE(SameBits(12.0f, Converted<short, float>(std::vector<short>{3}, -2)[0]));
    EXPECT_TRUE(SameBits(12.0, Converted<short, double>(std::vector<short>{3}, -2)[0]));
    EXPECT_TRUE(SameBits(12.0f, Converted<int, float>(std::vector<int>{3}, -2)[0]));
    EXPECT_TRUE(SameBits(12.0, Converted<int, double>(std::vector<int>{3}, -2)[0]));
    EXPECT_TRUE(SameBits(12.0f, Converted<int24_t, float>(std::vector<int24_t>{Packed(3, 0, 0)}, -2)[0]));
}

// The multiplier of a float destination is the double 2^-scale narrowed to
// float: 2^-140 survives as a float subnormal, and 2^-160 becomes zero.
TEST(ConvertHandWorked, FloatMultiplierIsNarrowedDoublePower)
{
    const auto f = Converted<int, float>(std::vector<int>{1, -1}, 140);
    EXPECT_TRUE(SameBits(std::ldexp(1.0f, -140), f[0]));
    EXPECT_TRUE(SameBits(-std::ldexp(1.0f, -140), f[1]));
    const auto z = Converted<int, float>(std::vector<int>{1, -1}, 160);
    EXPECT_TRUE(SameBits(0.0f, z[0]));
    EXPECT_TRUE(SameBits(-0.0f, z[1]));
    // 2^-150 is half the smallest float subnormal and narrows to zero, so
    // 3 * m is +0 here; a product formed in double and narrowed afterwards
    // would give 1.5 * 2^-149, rounded to 2^-148.
    EXPECT_TRUE(SameBits(0.0f, Converted<int, float>(std::vector<int>{3}, 150)[0]));
    // The double destination keeps 2^-160.
    EXPECT_TRUE(SameBits(std::ldexp(1.0, -160), Converted<int, double>(std::vector<int>{1}, 160)[0]));
}

TEST(ConvertHandWorked, SixteenBitLimitsWrap)
{
    const std::vector<float> src = {0.5f, 1.0f, 1.5f, -1.0f, -1.5f};
    const auto truncated = Converted<float, short>(src, -15, false);
    EXPECT_EQ((std::vector<short>{16384, -32768, -32768, -32768, -32768}), truncated);
    const auto rounded = Converted<float, short>(src, -15, true);
    EXPECT_EQ((std::vector<short>{16384, -32768, -32768, -32768, -32768}), rounded);

    // m = 0.5 at scale 1: every limited source truncates to 0.
    EXPECT_EQ((std::vector<short>{0, 0, 0}), (Converted<float, short>(std::vector<float>{1.0f, 7.0f, 1e30f}, 1, false)));
}

TEST(ConvertHandWorked, RoundingAwayFromZeroAgainstTruncation)
{
    const std::vector<float> src = {2.5f, -2.5f, 0.5f, -0.5f, 1.49999988f, -1.49999988f};
    EXPECT_EQ((std::vector<short>{3, -3, 1, -1, 1, -1}), (Converted<float, short>(src, 0, true)));
    EXPECT_EQ((std::vector<short>{2, -2, 0, 0, 1, -1}), (Converted<float, short>(src, 0, false)));
    EXPECT_EQ((std::vector<int>{3, -3, 1, -1, 1, -1}), (Converted<float, int>(src, 0, true)));
    const std::vector<double> wide = {2.5, -2.5, 0.5, -0.5, 0.49999999999999994, -0.49999999999999994};
    EXPECT_EQ((std::vector<int>{3, -3, 1, -1, 0, 0}), (Converted<double, int>(wide, 0, true)));
    EXPECT_EQ((std::vector<int>{2, -2, 0, 0, 0, 0}), (Converted<double, int>(wide, 0, false)));
}

TEST(ConvertHandWorked, EightBitLimitsWrap)
{
    const std::vector<float> src = {1.0f, -1.0f, 0.5f, -0.5f};
    EXPECT_EQ((std::vector<unsigned char>{128, 128, 64, 192}), (Converted<float, unsigned char>(src, -7, false)));
}

TEST(ConvertHandWorked, TwentyFourBitSaturates)
{
    const std::vector<float> src = {1.0f, -1.0f, 0.5f};
    const auto dst = Converted<float, int24_t>(src, -23, false);
    EXPECT_EQ(8388607, RefInt24Value(dst[0]));
    EXPECT_EQ(-8388608, RefInt24Value(dst[1]));
    EXPECT_EQ(4194304, RefInt24Value(dst[2]));
}

TEST(ConvertHandWorked, ThirtyTwoBitLimitIsIndefinite)
{
    const std::vector<float> src = {1.0f, -1.0f, 0.5f};
    EXPECT_EQ((std::vector<int>{INT_MIN, INT_MIN, 1073741824}), (Converted<float, int>(src, -31, false)));
    EXPECT_EQ((std::vector<int>{INT_MIN, INT_MIN, 1073741824}), (Converted<float, int>(src, -31, true)));

    const std::vector<double> wide = {0.5, 1.0, -1.0};
    EXPECT_EQ((std::vector<int>{1073741824, INT_MIN, INT_MIN}), (Converted<double, int>(wide, -31, false)));
}

// scale 0 has no limit: 70000 keeps its low bits, 1e10 truncates to the
// indefinite value, whose low 8 and 16 bits are 0 and which saturates in 24.
TEST(ConvertHandWorked, UnscaledOutOfRange)
{
    const std::vector<float> src = {70000.0f, 1e10f, -70000.0f};
    EXPECT_EQ((std::vector<short>{4464, 0, -4464}), (Converted<float, short>(src, 0, false)));
    EXPECT_EQ((std::vector<unsigned char>{0x70, 0, 0x90}), (Converted<float, unsigned char>(src, 0, false)));
    EXPECT_EQ((std::vector<int>{70000, INT_MIN, -70000}), (Converted<float, int>(src, 0, false)));
    const auto packed = Converted<float, int24_t>(src, 0, false);
    EXPECT_EQ(70000, RefInt24Value(packed[0]));
    EXPECT_EQ(-8388608, RefInt24Value(packed[1]));
    EXPECT_EQ((std::vector<int>{70000, INT_MIN, -70000}), (Converted<double, int>(std::vector<double>{70000.0, 1e10, -70000.0}, 0, false)));
}

TEST(ConvertHandWorked, NaNBecomesIndefinite)
{
    const std::vector<float> src = {kNaN, -kNaN};
    for (int scale : {0, -15}) {
        for (bool round : {false, true}) {
            SCOPED_TRACE(::testing::Message() << "scale " << scale << " round " << round);
            EXPECT_EQ((std::vector<short>{0, 0}), (Converted<float, short>(src, scale, round)));
            EXPECT_EQ((std::vector<unsigned char>{0, 0}), (Converted<float, unsigned char>(src, scale, round)));
            EXPECT_EQ((std::vector<int>{INT_MIN, INT_MIN}), (Converted<float, int>(src, scale, round)));
            EXPECT_EQ(-8388608, RefInt24Value(Converted<float, int24_t>(src, scale, round)[0]));
            const std::vector<double> wide = {std::nan(""), -std::nan("")};
            EXPECT_EQ((std::vector<int>{INT_MIN, INT_MIN}), (Converted<double, int>(wide, scale, round)));
        }
    }
}

// Overload 12 keeps the float m for limited elements and multiplies the
// others in double: 0.1 * 2^31 is 214748364.8 in double, while the float
// 0.1f * 2^31 would give 214748368.
TEST(ConvertHandWorked, DoubleToIntMixesFloatLimitAndDoubleProduct)
{
    EXPECT_EQ((std::vector<int>{214748364, -214748364}), (Converted<double, int>(std::vector<double>{0.1, -0.1}, -31, false)));
    // m = 0.5f at scale 1: lroundf(0.5f) is 1, lroundf(-0.5f) is -1.
    EXPECT_EQ((std::vector<int>{1, -1, 0}), (Converted<double, int>(std::vector<double>{1.0, -3.0, 0.75}, 1, true)));
    EXPECT_EQ((std::vector<int>{0, 0}), (Converted<double, int>(std::vector<double>{1.0, -3.0}, 1, false)));
}

TEST(ConvertHandWorked, IntToPackedShiftsAndSaturates)
{
    const std::vector<int> src = {0x7FFFFF00, -256, -257, 511};
    const auto shifted = Converted<int, int24_t>(src, 8);
    EXPECT_EQ(8388607, RefInt24Value(shifted[0]));
    EXPECT_EQ(-1, RefInt24Value(shifted[1]));
    EXPECT_EQ(-2, RefInt24Value(shifted[2]));  // toward minus infinity
    EXPECT_EQ(1, RefInt24Value(shifted[3]));   // bits dropped, no rounding
    const auto plain = Converted<int, int24_t>(std::vector<int>{8388608, -8388609, -5}, 0);
    EXPECT_EQ(8388607, RefInt24Value(plain[0]));
    EXPECT_EQ(-8388608, RefInt24Value(plain[1]));
    EXPECT_EQ(-5, RefInt24Value(plain[2]));
    // Only the low five bits of scale count: 40 shifts by 8, -24 by 8 too.
    EXPECT_EQ(-1, RefInt24Value(Converted<int, int24_t>(std::vector<int>{-256}, 40)[0]));
    EXPECT_EQ(-1, RefInt24Value(Converted<int, int24_t>(std::vector<int>{-256}, -24)[0]));
}

TEST(ConvertHandWorked, PackedToIntSignExtends)
{
    const auto dst = Converted<int24_t, int>(std::vector<int24_t>{Packed(0xFF, 0xFF, 0xFF), Packed(0xFF, 0xFF, 0x7F), Packed(0, 0, 0x80)});
    EXPECT_EQ((std::vector<int>{-1, 8388607, -8388608}), dst);
}

TEST(ConvertHandWorked, WideningAndNarrowing)
{
    const auto narrowed = Converted<double, float>(std::vector<double>{1e300, -1e300, -0.0, 0.1});
    EXPECT_TRUE(SameBits(kInf, narrowed[0]));
    EXPECT_TRUE(SameBits(-kInf, narrowed[1]));
    EXPECT_TRUE(SameBits(-0.0f, narrowed[2]));
    EXPECT_TRUE(SameBits(static_cast<float>(0.1), narrowed[3]));
    const auto widened = Converted<float, double>(std::vector<float>{-0.0f, 0.1f, kInf});
    EXPECT_TRUE(SameBits(-0.0, widened[0]));
    EXPECT_TRUE(SameBits(static_cast<double>(0.1f), widened[1]));
    EXPECT_TRUE(SameBits(std::numeric_limits<double>::infinity(), widened[2]));
}

TEST(ConvertHandWorked, EmptyCallsTouchNothing)
{
    ku::Convert(0, static_cast<const unsigned char*>(nullptr), static_cast<float*>(nullptr));
    ku::Convert(0, static_cast<const short*>(nullptr), static_cast<float*>(nullptr), 15);
    ku::Convert(0, static_cast<const short*>(nullptr), static_cast<double*>(nullptr), 15);
    ku::Convert(0, static_cast<const int*>(nullptr), static_cast<float*>(nullptr), 31);
    ku::Convert(0, static_cast<const int*>(nullptr), static_cast<double*>(nullptr), 31);
    ku::Convert(0, static_cast<const int*>(nullptr), static_cast<int24_t*>(nullptr), 8);
    ku::Convert(0, static_cast<const float*>(nullptr), static_cast<unsigned char*>(nullptr), -7, true);
    ku::Convert(0, static_cast<const float*>(nullptr), static_cast<short*>(nullptr), -15, true);
    ku::Convert(0, static_cast<const float*>(nullptr), static_cast<int*>(nullptr), -31, false);
    ku::Convert(0, static_cast<const float*>(nullptr), static_cast<double*>(nullptr));
    ku::Convert(0, static_cast<const float*>(nullptr), static_cast<int24_t*>(nullptr), -23, true);
    ku::Convert(0, static_cast<const double*>(nullptr), static_cast<int*>(nullptr), -31, true);
    ku::Convert(0, static_cast<const double*>(nullptr), static_cast<float*>(nullptr));
    ku::Convert(0, static_cast<const int24_t*>(nullptr), static_cast<int*>(nullptr));
    ku::Convert(0, static_cast<const int24_t*>(nullptr), static_cast<float*>(nullptr), 23);
    GuardedBuffer<short> untouched(0);
    const float one = 1.0f;
    ku::Convert(0, &one, untouched.data(), -15, true);
    EXPECT_TRUE(untouched.Intact());
}

// ---------------------------------------------------------------------------
// Every overload against the plain loop.
// ---------------------------------------------------------------------------

template <class Dst>
class FloatToIntegerTest : public ::testing::Test {};
using IntegerDestinations = ::testing::Types<unsigned char, short, int, int24_t>;
TYPED_TEST_SUITE(FloatToIntegerTest, IntegerDestinations);

TYPED_TEST(FloatToIntegerTest, MatchesPlainLoop)
{
    using Dst = TypeParam;
    for (int scale : kToIntegerScales) {
        for (bool round : {false, true}) {
            for (unsigned int n : {1u, 7u, 16u, 33u, 4099u}) {
                const std::uint32_t seed = 1000 + 7 * n + static_cast<std::uint32_t>(scale + 64);
                SCOPED_TRACE(SeedTrace(seed));
                SCOPED_TRACE(::testing::Message() << "scale " << scale << " round " << round << " count " << n);
                const auto src = MixedSources<float>(n, seed, scale);
                std::vector<Dst> expected(n);
                for (std::size_t i = 0; i < n; ++i) expected[i] = RefFromFloat<Dst>(src[i], scale, round);
                ASSERT_TRUE(SameValues(expected, (Converted<float, Dst>(src, scale, round))));
            }
        }
    }
}

TEST(DoubleToInt, MatchesPlainLoop)
{
    for (int scale : kToIntegerScales) {
        for (bool round : {false, true}) {
            for (unsigned int n : {1u, 3u, 16u, 4099u}) {
                const std::uint32_t seed = 2000 + 7 * n + static_cast<std::uint32_t>(scale + 64);
                SCOPED_TRACE(SeedTrace(seed));
                SCOPED_TRACE(::testing::Message() << "scale " << scale << " round " << round << " count " << n);
                const auto src = MixedSources<double>(n, seed, scale);
                std::vector<int> expected(n);
                for (std::size_t i = 0; i < n; ++i) expected[i] = RefFromDouble(src[i], scale, round);
                ASSERT_TRUE(SameValues(expected, (Converted<double, int>(src, scale, round))));
            }
        }
    }
}

// A sweep over the float bit patterns with a stride prime to every power of
// two, so that every exponent, both signs, NaNs and infinities are met with
// varied fractions: the written-out rounding and truncation against lroundf
// and the truncating conversion, through the unscaled int path.
TEST(FloatToInt, BitPatternSweepMatchesRuntime)
{
    const std::uint32_t stride = 4099;
    std::vector<float> src;
    src.reserve((1ull << 32) / stride + 1);
    for (std::uint64_t u = 0; u < (1ull << 32); u += stride) src.push_back(FromBits<float>(static_cast<std::uint32_t>(u)));
    for (bool round : {false, true}) {
        SCOPED_TRACE(::testing::Message() << "round " << round);
        const auto dst = Converted<float, int>(src, 0, round);
        for (std::size_t i = 0; i < src.size(); ++i)
            ASSERT_EQ(round ? RefRound(src[i]) : RefTruncate(src[i]), dst[i]) << std::hexfloat << src[i];
    }
}

template <class Src>
std::vector<Src> RandomIntegers(std::size_t count, std::uint32_t seed)
{
    std::mt19937 engine(seed);
    std::vector<Src> values(count);
    if constexpr (std::is_same_v<Src, int24_t>) {
        for (auto& v : values) v = Packed(engine() & 0xFF, engine() & 0xFF, engine() & 0xFF);
        values[0] = Packed(0, 0, 0x80);
    } else {
        std::uniform_int_distribution<Src> dist(std::numeric_limits<Src>::min(), std::numeric_limits<Src>::max());
        for (auto& v : values) v = dist(engine);
        values[0] = std::numeric_limits<Src>::min();
        if (count > 1) values[1] = std::numeric_limits<Src>::max();
    }
    return values;
}

template <class Src>
int ValueOf(Src v)
{
    if constexpr (std::is_same_v<Src, int24_t>) return RefInt24Value(v);
    else return static_cast<int>(v);
}

template <class Src, class Real>
void CheckIntegerToReal(std::uint32_t seedBase)
{
    for (int scale : {0, 15, 23, 31, 1, -2, -20, 140, 1100, -200}) {
        for (unsigned int n : {1u, 5u, 16u, 4099u}) {
            const std::uint32_t seed = seedBase + n + static_cast<std::uint32_t>(scale + 2000);
            SCOPED_TRACE(SeedTrace(seed));
            SCOPED_TRACE(::testing::Message() << "scale " << scale << " count " << n);
            const auto src = RandomIntegers<Src>(n, seed);
            std::vector<Real> expected(n);
            for (std::size_t i = 0; i < n; ++i) expected[i] = RefToReal<Real>(ValueOf(src[i]), scale);
            ASSERT_TRUE(SameBitsArray(expected, (Converted<Src, Real>(src, scale))));
        }
    }
}

TEST(IntegerToReal, MatchesPlainLoop)
{
    CheckIntegerToReal<short, float>(3000);
    CheckIntegerToReal<short, double>(3100);
    CheckIntegerToReal<int, float>(3200);
    CheckIntegerToReal<int, double>(3300);
    CheckIntegerToReal<int24_t, float>(3400);
}

TEST(IntegerToReal, BytesAndPackedToIntMatchPlainLoop)
{
    for (unsigned int n : {1u, 17u, 4099u}) {
        SCOPED_TRACE(SeedTrace(3500 + n));
        std::mt19937 engine(3500 + n);
        std::vector<unsigned char> bytes(n);
        for (auto& b : bytes) b = static_cast<unsigned char>(engine() >> 24);
        const auto f = Converted<unsigned char, float>(bytes);
        for (std::size_t i = 0; i < n; ++i) ASSERT_TRUE(SameBits(static_cast<float>(static_cast<int>(bytes[i])), f[i]));

        const auto packed = RandomIntegers<int24_t>(n, 3600 + n);
        const auto ints = Converted<int24_t, int>(packed);
        for (std::size_t i = 0; i < n; ++i) ASSERT_EQ(RefInt24Value(packed[i]), ints[i]) << "index " << i;
    }
}

TEST(IntToPacked, MatchesFloorDivisionAndSaturation)
{
    for (int scale : {0, 1, 7, 8, 16, 23, 31, 32, 40, -1, -24}) {
        const std::uint32_t seed = 3700 + static_cast<std::uint32_t>(scale + 100);
        SCOPED_TRACE(SeedTrace(seed));
        SCOPED_TRACE(::testing::Message() << "scale " << scale);
        const auto src = RandomIntegers<int>(1029, seed);
        const long long divisor = 1LL << (scale & 31);
        std::vector<int24_t> expected(src.size());
        for (std::size_t i = 0; i < src.size(); ++i) {
            const long long x = src[i];
            const long long q = x >= 0 ? x / divisor : -((-x + divisor - 1) / divisor);
            expected[i] = RefStore<int24_t>(static_cast<int>(q));
        }
        ASSERT_TRUE(SameValues(expected, (Converted<int, int24_t>(src, scale))));
    }
}

TEST(FloatDouble, MatchesPlainConversions)
{
    const auto doubles = MixedSources<double>(4099, 3800, 0);
    const auto narrowed = Converted<double, float>(doubles);
    for (std::size_t i = 0; i < doubles.size(); ++i) ASSERT_TRUE(SameBits(static_cast<float>(doubles[i]), narrowed[i]));
    const auto floats = MixedSources<float>(4099, 3801, 0);
    const auto widened = Converted<float, double>(floats);
    for (std::size_t i = 0; i < floats.size(); ++i) ASSERT_TRUE(SameBits(static_cast<double>(floats[i]), widened[i]));
}

// ---------------------------------------------------------------------------
// Rounding mode, round trips, same buffer.
// ---------------------------------------------------------------------------

class RoundingModeGuard {
public:
    explicit RoundingModeGuard(int mode) : saved_(std::fegetround()) { std::fesetround(mode); }
    ~RoundingModeGuard() { std::fesetround(saved_); }
    RoundingModeGuard(const RoundingModeGuard&) = delete;
    RoundingModeGuard& operator=(const RoundingModeGuard&) = delete;

private:
    int saved_;
};

// Expected values come from the default mode; the library must give the same
// integers under every mode (the products with m are exact powers-of-two
// scalings of normal values, so only the rounding step could differ).
TEST(ConvertRoundingMode, IndependentOfProcessorMode)
{
    for (int scale : {0, -15, -31}) {
        std::vector<float> src;
        for (float v : MixedSources<float>(2048, 3900, scale)) {
            if (std::fabs(v) >= 1e-30f || v == 0.0f || std::isnan(v)) src.push_back(v);
        }
        std::vector<double> wide(src.begin(), src.end());
        for (bool round : {true, false}) {
            std::vector<short> expectedShort(src.size());
            std::vector<int> expectedInt(src.size()), expectedWide(src.size());
            for (std::size_t i = 0; i < src.size(); ++i) {
                expectedShort[i] = RefFromFloat<short>(src[i], scale, round);
                expectedInt[i] = RefFromFloat<int>(src[i], scale, round);
                expectedWide[i] = RefFromDouble(wide[i], scale, round);
            }
            for (int mode : {FE_UPWARD, FE_DOWNWARD, FE_TOWARDZERO, FE_TONEAREST}) {
                SCOPED_TRACE(::testing::Message() << "scale " << scale << " round " << round << " mode " << mode);
                std::vector<short> gotShort;
                std::vector<int> gotInt, gotWide;
                {
                    RoundingModeGuard guard(mode);
                    gotShort = Converted<float, short>(src, scale, round);
                    gotInt = Converted<float, int>(src, scale, round);
                    gotWide = Converted<double, int>(wide, scale, round);
                }
                EXPECT_TRUE(SameValues(expectedShort, gotShort));
                EXPECT_TRUE(SameValues(expectedInt, gotInt));
                EXPECT_TRUE(SameValues(expectedWide, gotWide));
            }
        }
    }
}

TEST(ConvertRoundTrip, ShortThroughFloatIsExact)
{
    std::vector<short> all(65536);
    for (int i = 0; i < 65536; ++i) all[i] = static_cast<short>(i - 32768);
    const auto unit = Converted<short, float>(all, 15);
    EXPECT_TRUE(SameBits(-1.0f, unit[0]));
    for (bool round : {false, true}) {
        SCOPED_TRACE(::testing::Message() << "round " << round);
        EXPECT_EQ(all, (Converted<float, short>(unit, -15, round)));
    }
}

TEST(ConvertRoundTrip, PackedThroughFloatIsExact)
{
    auto packed = RandomIntegers<int24_t>(4099, 4000);
    packed[1] = Packed(0xFF, 0xFF, 0x7F);
    const auto unit = Converted<int24_t, float>(packed, 23);
    for (bool round : {false, true}) {
        SCOPED_TRACE(::testing::Message() << "round " << round);
        EXPECT_TRUE(SameValues(packed, (Converted<float, int24_t>(unit, -23, round))));
    }
}

// Source and destination on one buffer of equal element size: each element
// is read before it is written, as in the ascending scalar loop.
TEST(ConvertSameBuffer, FloatAndIntInPlace)
{
    const std::size_t n = 1031;
    const auto floats = MixedSources<float>(n, 4100, -15);
    void* raw = std::malloc(n * sizeof(float));
    ASSERT_NE(nullptr, raw);
    std::memcpy(raw, floats.data(), n * sizeof(float));
    ku::Convert(static_cast<unsigned int>(n), static_cast<const float*>(raw), static_cast<int*>(raw), -15, true);
    std::vector<int> ints(n);
    std::memcpy(ints.data(), raw, n * sizeof(int));
    for (std::size_t i = 0; i < n; ++i) ASSERT_EQ(RefFromFloat<int>(floats[i], -15, true), ints[i]) << "index " << i;

    ku::Convert(static_cast<unsigned int>(n), static_cast<const int*>(raw), static_cast<float*>(raw), 15);
    std::vector<float> back(n);
    std::memcpy(back.data(), raw, n * sizeof(float));
    for (std::size_t i = 0; i < n; ++i) ASSERT_TRUE(SameBits(RefToReal<float>(ints[i], 15), back[i])) << "index " << i;
    std::free(raw);
}

// Floats packed to 24 bits on their own buffer, as audio code does to save
// a copy: each 3-byte write lands behind the 4-byte reads still to come, so
// the result is the ascending element loop's, emulated here byte by byte.
TEST(ConvertSameBuffer, PackedInPlaceFollowsAscendingOrder)
{
    const std::size_t n = 1000;
    const auto floats = MixedSources<float>(n, 4200, -23);
    std::vector<unsigned char> expected(n * sizeof(float));
    std::memcpy(expected.data(), floats.data(), expected.size());
    for (std::size_t i = 0; i < n; ++i) {
        float x;
        std::memcpy(&x, &expected[4 * i], sizeof x);
        const int24_t word = RefStore<int24_t>(RefFromFloat<int>(x, -23, true));
        std::memcpy(&expected[3 * i], word.bytes, 3);
    }
    void* raw = std::malloc(n * sizeof(float));
    ASSERT_NE(nullptr, raw);
    std::memcpy(raw, floats.data(), n * sizeof(float));
    ku::Convert(static_cast<unsigned int>(n), static_cast<const float*>(raw), static_cast<int24_t*>(raw), -23, true);
    EXPECT_EQ(0, std::memcmp(expected.data(), raw, expected.size()));

    // The same for ints shifted down to 24 bits.
    const auto ints = RandomIntegers<int>(n, 4201);
    std::memcpy(raw, ints.data(), n * sizeof(int));
    ku::Convert(static_cast<unsigned int>(n), static_cast<const int*>(raw), static_cast<int24_t*>(raw), 8);
    for (std::size_t i = 0; i < n; ++i) {
        const int24_t word = RefStore<int24_t>(static_cast<int>(std::floor(ints[i] / 256.0)));
        ASSERT_EQ(0, std::memcmp(word.bytes, static_cast<unsigned char*>(raw) + 3 * i, 3)) << "index " << i;
    }
    std::free(raw);
}

}  // namespace
