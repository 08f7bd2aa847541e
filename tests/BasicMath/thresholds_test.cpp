// Thresholds, Trim and VectorSlope: one strict test per element that lets
// NaN and equal values through with their own bits, the low side of Trim
// first, and a ramp computed from the index at each element.

#include <kestaccel/BasicMath.h>

#include <cmath>
#include <functional>
#include <utility>

#include "support/TestSupport.h"

namespace {

namespace ku = kestaccel::utility;
using namespace kestaccel_test;

// Gaps that stay gaps: Trim is float only, and nothing is complex.
KESTACCEL_PROBE(HasTrim, ku::Trim(0u, Arg<T*>(), Arg<T>(), Arg<T>()))
KESTACCEL_PROBE(HasThresholdLT, ku::Threshold_LT_InPlace(0u, Arg<T*>(), Arg<T>()))
static_assert(kGap<HasTrim, float, double> && kGap<HasThresholdLT, double, std::complex<double>> &&
                  kGap<HasThresholdLT, float, std::complex<float>>, "uneven on purpose");

// Each member with its definition written out as the scalar rule for one
// element, (level, value) being (low, high) for Trim. In-place members run
// on a copy of the source in dst.
template <class T>
struct ThresholdCase {
    std::string name;
    bool inPlace;
    std::function<void(unsigned int n, T* dst, const T* src, T level, T value)> run;
    std::function<T(T x, T level, T value)> rule;
};

template <class T>
std::vector<ThresholdCase<T>> ThresholdCases()
{
    std::vector<ThresholdCase<T>> cases = {
        {"Threshold_LT_InPlace", true, [](auto n, T* d, const T*, T l, T) { ku::Threshold_LT_InPlace(n, d, l); },
         [](T x, T level, T) { return level > x ? level : x; }},
        {"Threshold_GT_InPlace", true, [](auto n, T* d, const T*, T l, T) { ku::Threshold_GT_InPlace(n, d, l); },
         [](T x, T level, T) { return level < x ? level : x; }},
        {"Threshold_LTVal", false, [](auto n, T* d, const T* s, T l, T v) { ku::Threshold_LTVal(n, s, d, l, v); },
         [](T x, T level, T value) { return level > x ? value : x; }},
        {"Threshold_LTVal_InPlace", true,
         [](auto n, T* d, const T*, T l, T v) { ku::Threshold_LTVal_InPlace(n, d, l, v); },
         [](T x, T level, T value) { return level > x ? value : x; }},
        {"Threshold_GTVal", false, [](auto n, T* d, const T* s, T l, T v) { ku::Threshold_GTVal(n, s, d, l, v); },
         [](T x, T level, T value) { return x > level ? value : x; }},
        {"Threshold_GTVal_InPlace", true,
         [](auto n, T* d, const T*, T l, T v) { ku::Threshold_GTVal_InPlace(n, d, l, v); },
         [](T x, T level, T value) { return x > level ? value : x; }},
    };
    if constexpr (std::is_same<T, float>::value)
        cases.push_back({"Trim", true, [](auto n, T* d, const T*, T low, T high) { ku::Trim(n, d, low, high); },
                         [](T x, T low, T high) { return low > x ? low : (high < x ? high : x); }});
    return cases;
}

template <class T>
class Thresholds : public ::testing::Test {};
using FloatingTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(Thresholds, FloatingTypes);

template <class T>
std::vector<T> RunCase(const ThresholdCase<T>& c, const std::vector<T>& src, T level, T value)
{
    // An out-of-place member must write every element, so dst starts as a NaN.
    GuardedBuffer<T> dst(src.size(), QuietNaN<T>(0x7E));
    for (std::size_t i = 0; c.inPlace && i < src.size(); ++i) dst[i] = src[i];
    c.run(static_cast<unsigned int>(src.size()), dst.data(), src.data(), level, value);
    EXPECT_TRUE(dst.Intact()) << c.name;
    return dst.values();
}

// By hand: +0 against -0 and a NaN level leave every element's own bits.
TYPED_TEST(Thresholds, SignedZerosAndNaNLevelPass)
{
    using T = TypeParam;
    const std::vector<T> x = {T(-3), QuietNaN<T>(0x55), T(3), -QuietNaN<T>(0x99), T(0)}, zeros = {T(0), -T(0)};
    for (const auto& c : ThresholdCases<T>()) {
        SCOPED_TRACE(c.name);
        EXPECT_TRUE(SameBitsArray(x, RunCase(c, x, QuietNaN<T>(1), T(7))));
        EXPECT_TRUE(SameBitsArray(zeros, RunCase(c, zeros, -T(0), T(9))));
        EXPECT_TRUE(SameBitsArray(zeros, RunCase(c, zeros, T(0), T(9))));
    }
}

// Random data with ties against the level, signed zeros and NaNs.
template <class T>
std::vector<T> LevelRichReals(std::size_t count, std::uint32_t seed, T level)
{
    auto values = RandomReals<T>(count, seed, T(-2), T(2));
    std::mt19937 engine(seed + 17u);
    for (auto& v : values) {
        const auto k = engine() % 8;
        v = k == 0 ? level : k == 1 ? QuietNaN<T>(engine() % 64 + 1) : k == 2 ? -T(0) : k == 3 ? T(0) : v;
    }
    return values;
}

// The (level, value) pairs put the value on either side of the level, a NaN
// value (stored as given), a -0 level among +0 and -0, and a NaN level; for
// Trim they are (low, high), the first with low above high.
TYPED_TEST(Thresholds, MatchTheScalarRuleOnRandomAndOverlappingData)
{
    using T = TypeParam;
    const std::pair<T, T> parameters[] = {
        {T(0.25), T(-9.5)}, {T(-0.5), T(0.75)}, {-T(0), QuietNaN<T>(0x42)}, {QuietNaN<T>(0x24), T(7)}};
    std::uint32_t seed = 2000;
    for (const auto& c : ThresholdCases<T>()) {
        for (const auto& [level, value] : parameters) {
            for (unsigned int n : SizesWithZero()) {
                SCOPED_TRACE(c.name + " size " + std::to_string(n) + " " + SeedTrace(seed));
                const auto x = LevelRichReals<T>(n, seed++, level);
                std::vector<T> expected(n);
                for (std::size_t i = 0; i < n; ++i) expected[i] = c.rule(x[i], level, value);
                EXPECT_TRUE(SameBitsArray(expected, RunCase(c, x, level, value)));
            }
        }
        if (c.inPlace) continue;
        // dst one element behind src: the replacement written at i is read
        // as the source of i + 1.
        auto buffer = LevelRichReals<T>(132, seed++, T(0)), expected = buffer;
        for (std::size_t i = 0; i + 1 < buffer.size(); ++i) expected[i + 1] = c.rule(expected[i], T(0), T(3));
        c.run(131u, buffer.data() + 1, buffer.data(), T(0), T(3));
        EXPECT_TRUE(SameBitsArray(expected, buffer)) << c.name << " overlapping";
    }
}

// The low side is tested first: with low above high every other element
// becomes high. A NaN bound disables its side.
TEST(TrimFloat, LowIsTestedFirstAndNaNPasses)
{
    const auto trim = ThresholdCases<float>().back();
    const float nan = QuietNaN<float>(0x321);
    EXPECT_TRUE(SameBitsArray({-1, -1, 0, 1, 1}, RunCase(trim, {-2, -1, 0, 1, 2}, -1.0f, 1.0f)));
    EXPECT_TRUE(SameBitsArray({1, 1, -1}, RunCase(trim, {-2, 0, 2}, 1.0f, -1.0f)));
    EXPECT_TRUE(SameBitsArray({-5, 1}, RunCase(trim, {-5, 5}, nan, 1.0f)));
    EXPECT_TRUE(SameBitsArray({-1, 5}, RunCase(trim, {-5, 5}, -1.0f, nan)));
}

// ---------------------------------------------------------------------------
// VectorSlope.
// ---------------------------------------------------------------------------
// T(i) * slope + offset with two roundings, never a running sum; the data
// must tell both a running sum and a fused step apart.
TYPED_TEST(Thresholds, VectorSlopeComputesEachElementFromItsIndex)
{
    using T = TypeParam;
    std::uint32_t seed = 2300;
    bool driftSeen = false, fusedSeen = false;
    for (unsigned int n : SizesWithZero()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto params = RandomReals<T>(2, seed++, T(-100), T(100));
        const T offset = params[0], slope = params[1];
        GuardedBuffer<T> dst(n);
        ku::VectorSlope(n, dst.data(), offset, slope);
        EXPECT_TRUE(dst.Intact());
        T running = offset;
        for (unsigned int i = 0; i < n; ++i, running = running + slope) {
            const T product = static_cast<T>(i) * slope, expected = product + offset;
            ASSERT_TRUE(SameBits(expected, dst[i])) << "index " << i;
            driftSeen = driftSeen || Bits(running) != Bits(expected);
            fusedSeen = fusedSeen || Bits(std::fma(static_cast<T>(i), slope, offset)) != Bits(expected);
        }
    }
    EXPECT_TRUE(driftSeen && fusedSeen) << "the data must tell a running sum and a fused step apart";
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
        const float product = static_cast<float>(i) * slope;
        EXPECT_TRUE(SameBits(product + offset, dst[i])) << "index " << i;
        const float wide = static_cast<float>(static_cast<double>(i) * slope) + offset;
        widerIndexSeen = widerIndexSeen || Bits(wide) != Bits(dst[i]);
    }
    EXPECT_TRUE(widerIndexSeen) << "the range must tell a wider index apart";
}

}  // namespace
