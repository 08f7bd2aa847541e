// Thresholds, Trim and VectorSlope: one strict test per element that lets
// NaN and equal values through with their own bits, the low side of Trim
// first, and a ramp computed from the index at each element.

#include <kestaccel/BasicMath.h>

#include <cmath>
#include <complex>
#include <cstdint>
#include <functional>
#include <limits>
#include <random>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#include "support/TestSupport.h"

namespace {

namespace ku = kestaccel::utility;
using kestaccel_test::Bits;
using kestaccel_test::FromBits;
using kestaccel_test::GuardedBuffer;
using kestaccel_test::RandomReals;
using kestaccel_test::SameBits;
using kestaccel_test::SameBitsArray;
using kestaccel_test::SeedTrace;

// Overloads that must not exist: Trim is float only. Each detector first
// sees the member that does exist.
template <class T, class = void>
struct HasTrim : std::false_type {};
template <class T>
struct HasTrim<T, std::void_t<decltype(ku::Trim(0u, std::declval<T*>(), std::declval<T>(), std::declval<T>()))>>
    : std::true_type {};
template <class T, class = void>
struct HasThresholdLT : std::false_type {};
template <class T>
struct HasThresholdLT<T, std::void_t<decltype(ku::Threshold_LT_InPlace(0u, std::declval<T*>(), std::declval<T>()))>>
    : std::true_type {};
static_assert(HasTrim<float>::value, "");
static_assert(!HasTrim<double>::value, "Trim is float only");
static_assert(HasThresholdLT<float>::value && HasThresholdLT<double>::value, "");
static_assert(!HasThresholdLT<std::complex<float>>::value && !HasThresholdLT<std::complex<double>>::value,
              "no complex thresholds");

template <class T>
T QuietNaN(std::uint32_t payload)
{
    return FromBits<T>(Bits(std::numeric_limits<T>::quiet_NaN()) | payload);
}

// Each member with its definition written out as the scalar rule for one
// element. In-place members are run through the same rule.
template <class T>
struct ThresholdCase {
    std::string name;
    std::function<void(unsigned int n, const T* src, T* dst, T level, T value)> run;
    std::function<T(T x, T level, T value)> rule;
};

template <class T>
std::vector<ThresholdCase<T>> ThresholdCases()
{
    auto copyThen = [](unsigned int n, const T* src, T* dst) {
        for (unsigned int i = 0; i < n; ++i) dst[i] = src[i];
    };
    return {
        {"Threshold_LT_InPlace",
         [=](unsigned int n, const T* s, T* d, T level, T) { copyThen(n, s, d); ku::Threshold_LT_InPlace(n, d, level); },
         [](T x, T level, T) { return level > x ? level : x; }},
        {"Threshold_GT_InPlace",
         [=](unsigned int n, const T* s, T* d, T level, T) { copyThen(n, s, d); ku::Threshold_GT_InPlace(n, d, level); },
         [](T x, T level, T) { return level < x ? level : x; }},
        {"Threshold_LTVal", [](unsigned int n, const T* s, T* d, T level, T value) { ku::Threshold_LTVal(n, s, d, level, value); },
         [](T x, T level, T value) { return level > x ? value : x; }},
        {"Threshold_LTVal_InPlace",
         [=](unsigned int n, const T* s, T* d, T level, T value) {
             copyThen(n, s, d);
             ku::Threshold_LTVal_InPlace(n, d, level, value);
         },
         [](T x, T level, T value) { return level > x ? value : x; }},
        {"Threshold_GTVal", [](unsigned int n, const T* s, T* d, T level, T value) { ku::Threshold_GTVal(n, s, d, level, value); },
         [](T x, T level, T value) { return x > level ? value : x; }},
        {"Threshold_GTVal_InPlace",
         [=](unsigned int n, const T* s, T* d, T level, T value) {
             copyThen(n, s, d);
             ku::Threshold_GTVal_InPlace(n, d, level, value);
         },
         [](T x, T level, T value) { return x > level ? value : x; }},
    };
}

template <class T>
class Thresholds : public ::testing::Test {};
using FloatingTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(Thresholds, FloatingTypes);

template <class T>
std::vector<T> Run(const ThresholdCase<T>& c, const std::vector<T>& src, T level, T value)
{
    GuardedBuffer<T> dst(src.size());
    c.run(static_cast<unsigned int>(src.size()), src.data(), dst.data(), level, value);
    EXPECT_TRUE(dst.Intact()) << c.name;
    return dst.values();
}

TYPED_TEST(Thresholds, EqualElementsPassAndStrictlyBeyondAreReplaced)
{
    using T = TypeParam;
    const std::vector<T> x = {T(-1), T(0), T(1)};
    const auto cases = ThresholdCases<T>();
    EXPECT_TRUE(SameBitsArray(std::vector<T>{T(0), T(0), T(1)}, Run(cases[0], x, T(0), T(0))));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{T(-1), T(0), T(0)}, Run(cases[1], x, T(0), T(0))));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{T(5), T(0), T(1)}, Run(cases[2], x, T(0), T(5))));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{T(5), T(0), T(1)}, Run(cases[3], x, T(0), T(5))));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{T(-1), T(0), T(-5)}, Run(cases[4], x, T(0), T(-5))));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{T(-1), T(0), T(-5)}, Run(cases[5], x, T(0), T(-5))));
}

TYPED_TEST(Thresholds, NaNElementsAndNaNLevelsChangeNothing)
{
    using T = TypeParam;
    const T nan = QuietNaN<T>(0x1234);
    const T negNan = -QuietNaN<T>(0x99);
    const std::vector<T> x = {T(-3), nan, T(3), negNan, T(0)};
    for (const auto& c : ThresholdCases<T>()) {
        SCOPED_TRACE(c.name);
        const auto out = Run(c, x, T(0), T(7));
        EXPECT_TRUE(SameBits(nan, out[1]));
        EXPECT_TRUE(SameBits(negNan, out[3]));
        EXPECT_TRUE(SameBitsArray(x, Run(c, x, nan, T(7))));
    }
}

TYPED_TEST(Thresholds, SignedZerosCompareEqualAndKeepTheirBits)
{
    using T = TypeParam;
    const std::vector<T> x = {T(0), -T(0)};
    for (const auto& c : ThresholdCases<T>()) {
        SCOPED_TRACE(c.name);
        EXPECT_TRUE(SameBitsArray(x, Run(c, x, -T(0), T(9))));
        EXPECT_TRUE(SameBitsArray(x, Run(c, x, T(0), T(9))));
    }
}

TYPED_TEST(Thresholds, ValueIsStoredAsGivenEvenOnTheOtherSide)
{
    using T = TypeParam;
    const T nan = QuietNaN<T>(0x55);
    const std::vector<T> x = {T(-2), T(2)};
    const auto cases = ThresholdCases<T>();
    EXPECT_TRUE(SameBitsArray(std::vector<T>{T(100), T(2)}, Run(cases[2], x, T(0), T(100))));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{nan, T(2)}, Run(cases[3], x, T(0), nan)));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{T(-2), T(-100)}, Run(cases[4], x, T(0), T(-100))));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{T(-2), nan}, Run(cases[5], x, T(0), nan)));
}

// Random data with ties against the level, signed zeros and NaNs, across
// sizes that reach the vector body and the scalar tail.
template <class T>
std::vector<T> LevelRichReals(std::size_t count, std::uint32_t seed, T level)
{
    auto values = RandomReals<T>(count, seed, T(-2), T(2));
    std::mt19937 engine(seed + 17u);
    for (auto& v : values) {
        switch (engine() % 8) {
            case 0: v = level; break;
            case 1: v = QuietNaN<T>(engine() % 64 + 1); break;
            case 2: v = -T(0); break;
            default: break;
        }
    }
    return values;
}

TYPED_TEST(Thresholds, MatchTheScalarRuleOnRandomData)
{
    using T = TypeParam;
    std::uint32_t seed = 2000;
    const T level = T(0.25), value = T(-9.5);
    for (const auto& c : ThresholdCases<T>()) {
        for (unsigned int n : kestaccel_test::InterestingSizes()) {
            SCOPED_TRACE(c.name + " size " + std::to_string(n) + " " + SeedTrace(seed));
            const auto x = LevelRichReals<T>(n, seed++, level);
            std::vector<T> expected(n);
            for (std::size_t i = 0; i < n; ++i) expected[i] = c.rule(x[i], level, value);
            EXPECT_TRUE(SameBitsArray(expected, Run(c, x, level, value)));
        }
    }
}

TYPED_TEST(Thresholds, OverlappingOutOfPlaceFormsFollowTheAscendingLoop)
{
    using T = TypeParam;
    const unsigned int n = 131;
    const auto x = LevelRichReals<T>(n + 1, 2100, T(0));
    // dst one element behind src: the replacement written at i is read as
    // the source of i + 1.
    for (int form = 0; form < 2; ++form) {
        std::vector<T> buffer = x, expected = x;
        for (std::size_t i = 0; i < n; ++i) {
            const T v = expected[i];
            expected[i + 1] = form == 0 ? (T(0) > v ? T(3) : v) : (v > T(0) ? T(-3) : v);
        }
        if (form == 0)
            ku::Threshold_LTVal(n, buffer.data(), buffer.data() + 1, T(0), T(3));
        else
            ku::Threshold_GTVal(n, buffer.data(), buffer.data() + 1, T(0), T(-3));
        EXPECT_TRUE(SameBitsArray(expected, buffer)) << "form " << form;
    }
}

TYPED_TEST(Thresholds, CountZeroWritesNothing)
{
    using T = TypeParam;
    T* none = nullptr;
    ku::Threshold_LT_InPlace(0u, none, T(1));
    ku::Threshold_GT_InPlace(0u, none, T(1));
    ku::Threshold_LTVal(0u, none, none, T(1), T(2));
    ku::Threshold_LTVal_InPlace(0u, none, T(1), T(2));
    ku::Threshold_GTVal(0u, none, none, T(1), T(2));
    ku::Threshold_GTVal_InPlace(0u, none, T(1), T(2));
    ku::VectorSlope(0u, none, T(1), T(2));
    GuardedBuffer<T> guarded(0);
    ku::VectorSlope(0u, guarded.data(), T(1), T(2));
    EXPECT_TRUE(guarded.Intact());
}

// ---------------------------------------------------------------------------
// Trim.
// ---------------------------------------------------------------------------
float TrimRule(float x, float low, float high) { return low > x ? low : (high < x ? high : x); }

std::vector<float> Trimmed(std::vector<float> x, float low, float high)
{
    ku::Trim(static_cast<unsigned int>(x.size()), x.data(), low, high);
    return x;
}

TEST(TrimFloat, ClampsBothSides)
{
    EXPECT_TRUE(SameBitsArray(std::vector<float>{-1, -1, 0, 1, 1}, Trimmed({-2, -1, 0, 1, 2}, -1.0f, 1.0f)));
}

TEST(TrimFloat, LowIsTestedFirstWhenTheBoundsCross)
{
    EXPECT_TRUE(SameBitsArray(std::vector<float>{1, 1, -1}, Trimmed({-2, 0, 2}, 1.0f, -1.0f)));
}

TEST(TrimFloat, NaNElementStaysAndNaNBoundDisablesItsSide)
{
    const float nan = QuietNaN<float>(0x321);
    EXPECT_TRUE(SameBitsArray(std::vector<float>{nan, -1, 1}, Trimmed({nan, -5, 5}, -1.0f, 1.0f)));
    EXPECT_TRUE(SameBitsArray(std::vector<float>{-5, 1}, Trimmed({-5, 5}, nan, 1.0f)));
    EXPECT_TRUE(SameBitsArray(std::vector<float>{-1, 5}, Trimmed({-5, 5}, -1.0f, nan)));
    EXPECT_TRUE(SameBitsArray(std::vector<float>{0.0f, -0.0f}, Trimmed({0.0f, -0.0f}, -0.0f, 0.0f)));
    EXPECT_TRUE(SameBitsArray(std::vector<float>{0.0f, -0.0f}, Trimmed({0.0f, -0.0f}, 0.0f, -0.0f)));
}

TEST(TrimFloat, MatchesTheScalarRuleOnRandomData)
{
    std::uint32_t seed = 2200;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        for (auto bounds : {std::make_pair(-0.5f, 0.75f), std::make_pair(0.5f, -0.5f)}) {
            SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
            const auto x = LevelRichReals<float>(n, seed++, bounds.first);
            std::vector<float> expected(n);
            for (std::size_t i = 0; i < n; ++i) expected[i] = TrimRule(x[i], bounds.first, bounds.second);
            GuardedBuffer<float> buffer(n);
            for (std::size_t i = 0; i < n; ++i) buffer[i] = x[i];
            ku::Trim(n, buffer.data(), bounds.first, bounds.second);
            EXPECT_TRUE(SameBitsArray(expected, buffer.values()));
            EXPECT_TRUE(buffer.Intact());
        }
    }
}

// ---------------------------------------------------------------------------
// VectorSlope.
// ---------------------------------------------------------------------------
TYPED_TEST(Thresholds, VectorSlopeTakesTheStartThenTheStep)
{
    using T = TypeParam;
    GuardedBuffer<T> dst(4);
    ku::VectorSlope(4u, dst.data(), T(1), T(0.5));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{T(1), T(1.5), T(2), T(2.5)}, dst.values()));
    EXPECT_TRUE(dst.Intact());
}

TYPED_TEST(Thresholds, VectorSlopeOfZeroesIsPositiveZero)
{
    using T = TypeParam;
    std::vector<T> dst(9, T(-1));
    ku::VectorSlope(9u, dst.data(), T(0), T(0));
    EXPECT_TRUE(SameBitsArray(std::vector<T>(9, T(0)), dst));
}

TYPED_TEST(Thresholds, VectorSlopeComputesEachElementFromItsIndex)
{
    using T = TypeParam;
    std::uint32_t seed = 2300;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto params = RandomReals<T>(2, seed++, T(-100), T(100));
        const T offset = params[0], slope = params[1];
        std::vector<T> expected(n);
        for (unsigned int i = 0; i < n; ++i) {
            const T product = static_cast<T>(i) * slope;
            expected[i] = product + offset;
        }
        GuardedBuffer<T> dst(n);
        ku::VectorSlope(n, dst.data(), offset, slope);
        EXPECT_TRUE(SameBitsArray(expected, dst.values()));
        EXPECT_TRUE(dst.Intact());
    }
}

TEST(VectorSlopeFloat, NoDriftAndNoFusedStep)
{
    const unsigned int n = 4099;
    const float slope = 0.1f, offset = 0.3f;
    std::vector<float> dst(n);
    ku::VectorSlope(n, dst.data(), offset, slope);
    const float third = 3.0f * 0.1f;
    EXPECT_TRUE(SameBits(third + 0.0f, [] {
        float d[4];
        ku::VectorSlope(4u, d, 0.0f, 0.1f);
        return d[3];
    }()));
    // A running sum of the step and a fused multiply-add each differ from
    // the two-rounding form somewhere on this ramp.
    float running = offset;
    bool driftSeen = false, fusedSeen = false;
    for (unsigned int i = 0; i < n; ++i) {
        const float product = static_cast<float>(i) * slope;
        EXPECT_TRUE(SameBits(product + offset, dst[i])) << "index " << i;
        driftSeen = driftSeen || Bits(running) != Bits(dst[i]);
        fusedSeen = fusedSeen || Bits(std::fma(static_cast<float>(i), slope, offset)) != Bits(dst[i]);
        running = running + slope;
    }
    EXPECT_TRUE(driftSeen);
    EXPECT_TRUE(fusedSeen);
}

TEST(VectorSlopeFloat, IndexAbove2To24IsRoundedToFloat)
{
    // 64 MiB, once: the only way to reach indices that float cannot hold.
    const unsigned int n = (1u << 24) + 33u;
    const float slope = 1.0f + std::ldexp(1.0f, -20), offset = -0.75f;
    std::vector<float> dst(n);
    ku::VectorSlope(n, dst.data(), offset, slope);
    bool widerIndexSeen = false;
    for (unsigned int i = (1u << 24) - 8u; i < n; ++i) {
        const float index = static_cast<float>(i);
        const float product = index * slope;
        EXPECT_TRUE(SameBits(product + offset, dst[i])) << "index " << i;
        const float wide = static_cast<float>(static_cast<double>(i) * slope) + offset;
        widerIndexSeen = widerIndexSeen || Bits(wide) != Bits(dst[i]);
    }
    EXPECT_TRUE(widerIndexSeen) << "the range must tell a wider index apart";
}

}  // namespace
