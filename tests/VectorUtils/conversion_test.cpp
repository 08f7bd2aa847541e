// Convert: limits, wraps, saturation and the indefinite value by hand, then
// every overload against a plain loop, under every rounding mode.

#include <kestaccel/VectorUtils.h>

#include <algorithm>
#include <cfenv>
#include <climits>
#include <cmath>
#include <cstring>
#include <limits>
#include <random>
#include <vector>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
using kestcore::utility::int24_t;
namespace ku = kestaccel::utility;
using Ints = std::vector<long long>;

// Round half away from zero, as lroundf and lround do; MinGW's adds one half
// (0.49999997f rounds up to 1), so there the exact fraction decides.
template <class Real>
long RoundHalfAway(Real x)
{
#if defined(__MINGW32__)
    const Real whole = std::trunc(x);
    const Real fraction = x - whole;
    return static_cast<long>(whole) + (fraction >= Real(0.5) ? 1 : 0) - (fraction <= Real(-0.5) ? 1 : 0);
#else
    if constexpr (std::is_same_v<Real, float>) return std::lroundf(x);
    else return std::lround(x);
#endif
}

// Truncation or rounding; NaN and results outside int give the indefinite value.
template <class Real>
int RefInt(Real x, bool round)
{
    const double v = x;
    if (std::isnan(v) || v <= (round ? -2147483648.5 : -2147483649.0) || v >= (round ? 2147483647.5 : 2147483648.0))
        return INT_MIN;
    if (!round) return static_cast<int>(x);
    return static_cast<int>(RoundHalfAway(x));
}

// 8 and 16 bits keep the low bits, 32 all of them, 24 saturate.
template <class Dst>
Dst RefStore(int value)
{
    if constexpr (std::is_same_v<Dst, int24_t>) return int24_t(std::min(std::max(value, -8388608), 8388607));
    const long long low = static_cast<long long>(value) & (sizeof(Dst) == 1 ? 0xFF : 0xFFFF);
    if constexpr (sizeof(Dst) == 4) return value;
    else return static_cast<Dst>(std::is_signed_v<Dst> && low >= 32768 ? low - 65536 : low);
}

template <class Dst>
Dst RefFromReal(float x, int scale, bool round)
{
    const float m = std::pow(2.0f, 0.0f - static_cast<float>(scale));
    return RefStore<Dst>(RefInt(scale == 0 ? x : (x >= 1.0f ? m : (x <= -1.0f ? -m : x * m)), round));
}

// A double source: limited elements take the float +-m, the others (double)m * x.
template <class Dst>
Dst RefFromReal(double x, int scale, bool round)
{
    const float m = std::pow(2.0f, 0.0f - static_cast<float>(scale));
    if (scale == 0) return RefInt(x, round);
    return x >= 1.0 ? RefInt(m, round) : (x <= -1.0 ? RefInt(-m, round) : RefInt(static_cast<double>(m) * x, round));
}

template <class Real>
Real RefToReal(int value, int scale)
{
    const Real m = static_cast<Real>(std::pow(2.0, static_cast<double>(-scale)));
    return scale == 0 ? static_cast<Real>(value) : static_cast<Real>(value) * m;
}

// Bits for floating values, values otherwise (a packed word's value is its bytes).
template <class T>
::testing::AssertionResult Same(const std::vector<T>& expected, const std::vector<T>& actual)
{
    if constexpr (std::is_floating_point_v<T>) return SameBitsArray(expected, actual);
    else return SameBitsArray(Ints(expected.begin(), expected.end()), Ints(actual.begin(), actual.end()));
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

// 37 copies of one value reach the vectorised body and the tail.
template <class Dst, class Src, class... Args>
Ints Copies(Src x, Args... args)
{
    const auto dst = Converted<Src, Dst>(std::vector<Src>(37, x), args...);
    return Ints(dst.begin(), dst.end());
}

// Floating sources for every branch: halves before and after scaling, the
// limits and their neighbours, huge values, NaNs, infinities, signed zeros.
template <class Real>
std::vector<Real> MixedSources(std::size_t count, std::uint32_t seed, int scale)
{
    std::mt19937 engine(seed);
    std::uniform_real_distribution<Real> unit(Real(-1.25), Real(1.25));
    std::uniform_int_distribution<int> whole(-70000, 70000);
    std::uniform_int_distribution<int> sixteen(-32768, 32767);
    const Real full = scale == 0 ? Real(1) : std::pow(Real(2), static_cast<Real>(-scale));
    const Real nan = std::numeric_limits<Real>::quiet_NaN(), inf = std::numeric_limits<Real>::infinity();
    const Real specials[] = {Real(0.5), Real(-0.5), Real(1.5), Real(-1.5), Real(2.5), Real(-2.5), Real(1), Real(-1),
                             std::nextafter(Real(1), Real(0)), std::nextafter(Real(-1), Real(0)), Real(-0.0), Real(0),
                             Real(70000), Real(1e10), Real(-1e10), Real(3e9), Real(-3e9), Real(2147483648.0),
                             Real(-2147483648.0), Real(2147483520.0), Real(-2147483520.0), Real(2147483647.5),
                             Real(-2147483648.5), Real(2147483647.0), Real(-2147483649.0), Real(0.49999997f),
                             Real(-0.49999997f), Real(8388607.5), Real(-8388608.5), nan, -nan,
                             FromBits<Real>(Bits(nan) | 0x15u), inf, -inf, std::numeric_limits<Real>::denorm_min(),
                             Real(1e-40f)};
    std::vector<Real> values(count);
    for (std::size_t i = 0; i < count; ++i) {
        switch (i % 6) {
        case 0: values[i] = specials[(i / 6) % (sizeof specials / sizeof specials[0])]; break;
        case 1: values[i] = unit(engine); break;
        case 2: values[i] = (static_cast<Real>(sixteen(engine)) + Real(0.5)) / full; break;  // a half after scaling
        case 3: values[i] = static_cast<Real>(whole(engine)) + Real(0.5); break;
        case 4: values[i] = unit(engine) * Real(4e9); break;
        default: values[i] = unit(engine) * Real(0.001); break;
        }
    }
    return values;
}

// Random samples with the lowest and highest value first.
template <class Src>
std::vector<Src> RandomIntegers(std::size_t count, std::uint32_t seed)
{
    const bool packed = std::is_same_v<Src, int24_t>;
    const int low = packed ? -8388608 : static_cast<int>(std::numeric_limits<Src>::min());
    const int high = packed ? 8388607 : static_cast<int>(std::numeric_limits<Src>::max());
    std::mt19937 engine(seed);
    std::uniform_int_distribution<int> dist(low, high);
    std::vector<Src> values(count);
    for (std::size_t i = 0; i < count; ++i) values[i] = static_cast<Src>(i == 0 ? low : i == 1 ? high : dist(engine));
    return values;
}

// Float sources to every integer destination (both rounding flags unless
// `round` is 0 or 1), and the same source as a double to int.
TEST(ConvertHandWorked, FloatToIntegerTable)
{
    const float nan = std::numeric_limits<float>::quiet_NaN();
    const struct { float x; int scale, round; long long u8, s16, s32, s24; } rows[] = {
        // Limits wrap in 8 and 16 bits, saturate in 24, are indefinite in 32.
        {1.0f, -15, 2, 0, -32768, 32768, 32768},       {1.5f, -15, 2, 0, -32768, 32768, 32768},
        {1.0f, -7, 2, 128, 128, 128, 128},             {-1.0f, -7, 2, 128, -128, -128, -128},
        {-0.5f, -7, 2, 192, -64, -64, -64},            {1.0f, -23, 2, 0, 0, 8388608, 8388607},
        {-1.0f, -23, 2, 0, 0, -8388608, -8388608},     {1.0f, -31, 2, 0, 0, INT_MIN, -8388608},
        {0.5f, -31, 2, 0, 0, 1073741824, 8388607},
        // scale 0 has no limit: 70000 keeps its low bits, 1e10 is indefinite.
        {70000.0f, 0, 2, 0x70, 4464, 70000, 70000},    {1e10f, 0, 2, 0, 0, INT_MIN, -8388608},
        // m = 0.5 at scale 1: a limited source truncates to 0, rounds to 1.
        {1e30f, 1, 0, 0, 0, 0, 0},                     {1e30f, 1, 1, 1, 1, 1, 1},
        {nan, 0, 2, 0, 0, INT_MIN, -8388608},          {-nan, -15, 2, 0, 0, INT_MIN, -8388608},
        // Halves away from zero against truncation.
        {2.5f, 0, 1, 3, 3, 3, 3},                      {-2.5f, 0, 1, 253, -3, -3, -3},
        {-0.5f, 0, 1, 255, -1, -1, -1},                {1.49999988f, 0, 1, 1, 1, 1, 1},
        {-2.5f, 0, 0, 254, -2, -2, -2},                {-0.5f, 0, 0, 0, 0, 0, 0},
    };
    for (const auto& r : rows) {
        for (bool round : {false, true}) {
            if (r.round != 2 && r.round != static_cast<int>(round)) continue;
            SCOPED_TRACE(::testing::Message() << r.x << " scale " << r.scale << " round " << round);
            EXPECT_EQ(Ints(37, r.u8), Copies<unsigned char>(r.x, r.scale, round));
            EXPECT_EQ(Ints(37, r.s16), Copies<short>(r.x, r.scale, round));
            EXPECT_EQ(Ints(37, r.s32), Copies<int>(r.x, r.scale, round));
            EXPECT_EQ(Ints(37, r.s24), Copies<int24_t>(r.x, r.scale, round));
            EXPECT_EQ(Ints(37, r.s32), Copies<int>(static_cast<double>(r.x), r.scale, round));
        }
    }
}

// Limited elements take the float m, the others multiply in double: 0.1 * 2^31
// gives 214748364, 0.1f * 2^31 would give 214748368.
TEST(ConvertHandWorked, DoubleToIntMixesFloatLimitAndDoubleProduct)
{
    const struct { double x; int scale; bool round; long long expected; } rows[] = {
        {0.1, -31, false, 214748364}, {-0.1, -31, false, -214748364}, {1.0, 1, true, 1}, {-3.0, 1, true, -1},
        {0.75, 1, true, 0}, {-3.0, 1, false, 0}, {-1e10, 0, false, INT_MIN}, {0.49999999999999994, 0, true, 0},
        {-0.49999999999999994, 0, true, 0}};
    for (const auto& r : rows)
        EXPECT_EQ(Ints(37, r.expected), Copies<int>(r.x, r.scale, r.round)) << r.x << " scale " << r.scale;
}

// The float multiplier is the narrowed double 2^-scale: 2^-150 becomes 0, so
// 3 * m is +0, not 2^-148.
TEST(ConvertHandWorked, IntegerToRealTable)
{
    const struct { int v, scale; float f; double d; } rows[] = {
        {-32768, 15, -1.0f, -1.0}, {3, -2, 12.0f, 12.0}, {3, 150, 0.0f, std::ldexp(3.0, -150)},
        {-1, 160, -0.0f, -std::ldexp(1.0, -160)}};
    for (const auto& r : rows) {
        SCOPED_TRACE(::testing::Message() << r.v << " scale " << r.scale);
        EXPECT_TRUE(SameBits(r.f, Converted<int, float>({r.v}, r.scale)[0]));
        EXPECT_TRUE(SameBits(r.d, Converted<int, double>({r.v}, r.scale)[0]));
        if (r.v < -8388608 || r.v > 8388607) continue;
        EXPECT_TRUE(SameBits(r.f, Converted<int24_t, float>({int24_t(r.v)}, r.scale)[0]));
        if (r.v < -32768 || r.v > 32767) continue;
        EXPECT_TRUE(SameBits(r.f, Converted<short, float>({static_cast<short>(r.v)}, r.scale)[0]));
        EXPECT_TRUE(SameBits(r.d, Converted<short, double>({static_cast<short>(r.v)}, r.scale)[0]));
    }
    // Bytes are unsigned and pass by value.
    EXPECT_TRUE(SameBitsArray(std::vector<float>{0.0f, 128.0f, 255.0f}, Converted<unsigned char, float>({0, 128, 255})));
}

TEST(ConvertHandWorked, PackedAndWidth)
{
    // Shifted right by the low five bits of scale (toward minus infinity),
    // then saturated; 40 and -24 both shift by 8.
    const struct { int v, scale, expected; } shifts[] = {
        {0x7FFFFF00, 8, 8388607}, {-257, 8, -2}, {511, 8, 1}, {-8388609, 0, -8388608}, {-256, 40, -1}, {-256, -24, -1}};
    for (const auto& s : shifts)
        EXPECT_EQ(s.expected, static_cast<int>(Converted<int, int24_t>({s.v}, s.scale)[0])) << s.v << " >> " << s.scale;
    EXPECT_TRUE((Converted<int, int24_t>({}, 8).empty()));  // count 0: the guard sees no write

    // Sign extension of bit 23 (bytes FF FF FF, FF FF 7F, 00 00 80), no shift.
    EXPECT_EQ((std::vector<int>{-1, 8388607, -8388608}), (Converted<int24_t, int>({-1, 8388607, -8388608})));
}

template <class Dst, class Src, class Ref, class... Args>
::testing::AssertionResult MatchesLoop(const std::vector<Src>& src, Ref ref, Args... args)
{
    std::vector<Dst> expected;
    for (const Src& x : src) expected.push_back(static_cast<Dst>(ref(x)));
    return Same(expected, (Converted<Src, Dst>(src, args...)));
}

const unsigned int kCounts[] = {0, 1, 7, 16, 33, 4099};

// Scales -6 and -14 are the last at which +m and -m still differ in the
// low 8 and 16 bits, so the limit's sign must survive there.
template <class Real, class Dst>
void CheckFromReal(std::uint32_t seedBase)
{
    for (int scale : {0, 1, -1, -6, -7, -8, -14, -15, -16, -23, -24, -30, -31, -32, 3, -40, 140}) {
        for (bool round : {false, true}) {
            for (unsigned int n : kCounts) {
                const std::uint32_t seed = seedBase + 7 * n + static_cast<std::uint32_t>(scale + 64);
                SCOPED_TRACE(::testing::Message() << SeedTrace(seed) << " scale " << scale << " round " << round
                                                  << " count " << n);
                const auto ref = [&](Real x) { return RefFromReal<Dst>(x, scale, round); };
                ASSERT_TRUE(MatchesLoop<Dst>(MixedSources<Real>(n, seed, scale), ref, scale, round));
            }
        }
    }
}

template <class Src, class Real>
void CheckToReal(std::uint32_t seedBase)
{
    for (int scale : {0, 15, 23, 31, 1, -2, -20, 140, 150, 160, 1100, -200}) {
        for (unsigned int n : kCounts) {
            const std::uint32_t seed = seedBase + n + static_cast<std::uint32_t>(scale + 2000);
            SCOPED_TRACE(::testing::Message() << SeedTrace(seed) << " scale " << scale << " count " << n);
            const auto ref = [scale](Src x) { return RefToReal<Real>(static_cast<int>(x), scale); };
            ASSERT_TRUE(MatchesLoop<Real>(RandomIntegers<Src>(n, seed), ref, scale));
        }
    }
}

// Every overload; int to packed is a floor division by 2^(scale & 31), then
// saturation; float bit patterns of every exponent through the unscaled path.
void CheckEveryOverload()
{
    CheckFromReal<float, unsigned char>(1000);
    CheckFromReal<float, short>(1100);
    CheckFromReal<float, int>(1200);
    CheckFromReal<float, int24_t>(1300);
    CheckFromReal<double, int>(2000);
    CheckToReal<short, float>(3000);
    CheckToReal<short, double>(3100);
    CheckToReal<int, float>(3200);
    CheckToReal<int, double>(3300);
    CheckToReal<int24_t, float>(3400);
    for (unsigned int n : kCounts) {
        SCOPED_TRACE(SeedTrace(3500 + n));
        ASSERT_TRUE(MatchesLoop<float>(RandomIntegers<unsigned char>(n, 3500 + n), [](unsigned char b) { return float(int(b)); }));
        ASSERT_TRUE(MatchesLoop<int>(RandomIntegers<int24_t>(n, 3600 + n), [](int24_t w) { return int(w); }));
        ASSERT_TRUE(MatchesLoop<float>(MixedSources<double>(n, 3700 + n, 0), [](double x) { return float(x); }));
        ASSERT_TRUE(MatchesLoop<double>(MixedSources<float>(n, 3800 + n, 0), [](float x) { return double(x); }));
    }
    for (int scale : {0, 1, 7, 8, 16, 23, 31, 32, 40, -1, -24}) {
        const std::uint32_t seed = 3900 + static_cast<std::uint32_t>(scale + 100);
        SCOPED_TRACE(::testing::Message() << SeedTrace(seed) << " scale " << scale);
        const long long divisor = 1LL << (scale & 31);
        const auto floorDivide = [divisor](long long x) {
            return RefStore<int24_t>(static_cast<int>(x >= 0 ? x / divisor : -((-x + divisor - 1) / divisor)));
        };
        ASSERT_TRUE(MatchesLoop<int24_t>(RandomIntegers<int>(1029, seed), floorDivide, scale));
    }
    std::vector<float> bits;
    for (std::uint64_t u = 0; u < (1ull << 32); u += 16411) bits.push_back(FromBits<float>(static_cast<std::uint32_t>(u)));
    for (bool round : {false, true})
        ASSERT_TRUE(MatchesLoop<int>(bits, [round](float x) { return RefInt(x, round); }, 0, round)) << round;
}

// Under every rounding mode: halfway cases must not depend on it (an added
// 0.49999997 would), and the reference loops follow the same mode.
TEST(ConvertDifferential, EveryOverloadMatchesPlainLoopInEveryRoundingMode)
{
    const int saved = std::fegetround();
    for (int mode : {FE_TONEAREST, FE_UPWARD, FE_DOWNWARD, FE_TOWARDZERO}) {
        SCOPED_TRACE(::testing::Message() << "rounding mode " << mode);
        std::fesetround(mode);
        CheckEveryOverload();
        std::fesetround(saved);
    }
}

// Every short, and random 24-bit words, through the unit float range and back.
TEST(ConvertRoundTrip, ShortAndPackedThroughFloatAreExact)
{
    std::vector<short> all(65536);
    for (int i = 0; i < 65536; ++i) all[i] = static_cast<short>(i - 32768);
    const auto unit = Converted<short, float>(all, 15);
    const auto packed = RandomIntegers<int24_t>(4099, 4000);
    const auto packedUnit = Converted<int24_t, float>(packed, 23);
    for (bool round : {false, true}) {
        EXPECT_TRUE(Same(all, (Converted<float, short>(unit, -15, round)))) << "round " << round;
        EXPECT_TRUE(Same(packed, (Converted<float, int24_t>(packedUnit, -23, round)))) << "round " << round;
    }
}

// One buffer, dst `offset` bytes in, against the ascending loop run on `bytes`:
// a blocked fast path would read too early.
template <class Src, class Dst, class Ref, class... Args>
::testing::AssertionResult InPlaceMatchesLoop(std::vector<unsigned char>& bytes, std::size_t offset, Ref ref,
                                              Args... args)
{
    std::vector<unsigned char> raw = bytes;
    const std::size_t n = (bytes.size() - offset) / std::max(sizeof(Src), sizeof(Dst));
    ku::Convert(static_cast<unsigned int>(n), reinterpret_cast<const Src*>(raw.data()),
                reinterpret_cast<Dst*>(raw.data() + offset), args...);
    for (std::size_t i = 0; i < n; ++i) {
        Src x;
        std::memcpy(&x, &bytes[i * sizeof(Src)], sizeof x);
        const Dst y = ref(x);
        std::memcpy(&bytes[offset + i * sizeof(Dst)], &y, sizeof y);
    }
    if (raw == bytes) return ::testing::AssertionSuccess();
    return ::testing::AssertionFailure() << "differs from the ascending element loop, offset " << offset;
}

TEST(ConvertSameBuffer, FollowsAscendingOrder)
{
    const auto floats = MixedSources<float>(1031, 4100, -23);
    const auto ints = RandomIntegers<int>(1031, 4201);
    std::vector<unsigned char> bytes(1031 * 4);
    std::memcpy(bytes.data(), floats.data(), bytes.size());
    EXPECT_TRUE((InPlaceMatchesLoop<float, int>(bytes, 0, [](float x) { return RefFromReal<int>(x, -15, true); }, -15, true)));
    EXPECT_TRUE((InPlaceMatchesLoop<int, float>(bytes, 0, [](int v) { return RefToReal<float>(v, 15); }, 15)));
    const auto pack = [](float x) { return RefFromReal<int24_t>(x, -23, true); };
    const auto shift = [](int v) { return RefStore<int24_t>(static_cast<int>(std::floor(v / 256.0))); };
    for (std::size_t offset : {0, 4}) {
        std::memcpy(bytes.data(), floats.data(), bytes.size());
        EXPECT_TRUE((InPlaceMatchesLoop<float, int24_t>(bytes, offset, pack, -23, true)));
        std::memcpy(bytes.data(), ints.data(), bytes.size());
        EXPECT_TRUE((InPlaceMatchesLoop<int, int24_t>(bytes, offset, shift, 8)));
        EXPECT_TRUE((InPlaceMatchesLoop<int24_t, float>(bytes, offset, [](int v) { return RefToReal<float>(v, 23); }, 23)));
        EXPECT_TRUE((InPlaceMatchesLoop<int24_t, int>(bytes, offset, [](int v) { return v; })));
    }
}

}  // namespace
