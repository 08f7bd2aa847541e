// Thresholds and Trim: one strict test per element, which NaN and equal
// values pass with their own bits; VectorSlope from the index.

#include <kestaccel/BasicMath.h>

#include <cmath>
#include <random>
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

// Each member with (level, value), (low, high) for Trim, and its rule for one
// element, handed to check(name, rule, member).
template <class T, class Check>
void EachMember(T level, T value, Check check)
{
    using U = unsigned int;
    const auto lt = [=](T x) { return level > x ? value : x; };
    const auto gt = [=](T x) { return x > level ? value : x; };
    check("Threshold_LT_InPlace", [=](T x) { return level > x ? level : x; },
          [=](U n, T* io) { ku::Threshold_LT_InPlace(n, io, level); });
    check("Threshold_GT_InPlace", [=](T x) { return level < x ? level : x; },
          [=](U n, T* io) { ku::Threshold_GT_InPlace(n, io, level); });
    check("Threshold_LTVal", lt, [=](U n, const T* s, T* d) { ku::Threshold_LTVal(n, s, d, level, value); });
    check("Threshold_LTVal_InPlace", lt, [=](U n, T* io) { ku::Threshold_LTVal_InPlace(n, io, level, value); });
    check("Threshold_GTVal", gt, [=](U n, const T* s, T* d) { ku::Threshold_GTVal(n, s, d, level, value); });
    check("Threshold_GTVal_InPlace", gt, [=](U n, T* io) { ku::Threshold_GTVal_InPlace(n, io, level, value); });
    if constexpr (HasTrim<T>::value)
        check("Trim", [=](T x) { return level > x ? level : (value < x ? value : x); },
              [=](U n, T* io) { ku::Trim(n, io, level, value); });
}

template <class T>
class Thresholds : public ::testing::Test {};
TYPED_TEST_SUITE(Thresholds, FloatingTypes);

// By hand: +0 against -0 and a NaN level leave every element's own bits.
TYPED_TEST(Thresholds, SignedZerosAndNaNLevelPass)
{
    using T = TypeParam;
    const std::vector<T> x = {T(-3), QuietNaN<T>(0x55), T(3), -QuietNaN<T>(0x99), T(0)}, zeros = {T(0), -T(0)};
    const auto stands = [](const std::vector<T>& in) {
        return [&in](const char* name, auto, auto member) {
            constexpr bool inPlace = std::is_invocable<decltype(member), unsigned int, T*>::value;
            std::vector<T> out = inPlace ? in : std::vector<T>(in.size(), QuietNaN<T>(0x7E));
            if constexpr (inPlace) member(static_cast<unsigned int>(in.size()), out.data());
            else member(static_cast<unsigned int>(in.size()), in.data(), out.data());
            EXPECT_TRUE(SameBitsArray(in, out)) << name;
        };
    };
    EachMember(QuietNaN<T>(1), T(7), stands(x));
    EachMember(T(0), T(9), stands(zeros));
    EachMember(-T(0), T(9), stands(zeros));
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

// Values either side of the level, a NaN value, a -0 and a NaN level; for
// Trim (low, high), the first with low above high.
TYPED_TEST(Thresholds, MatchTheScalarRuleOnRandomAndOverlappingData)
{
    using T = TypeParam;
    const std::pair<T, T> parameters[] = {
        {T(0.25), T(-9.5)}, {T(-0.5), T(0.75)}, {-T(0), QuietNaN<T>(0x42)}, {QuietNaN<T>(0x24), T(7)}};
    std::uint32_t seed = 2000;
    for (const auto& [level, value] : parameters) {
        for (unsigned int n : InterestingSizes()) {
            SCOPED_TRACE(::testing::Message() << "level " << level << " value " << value << " size " << n << " "
                                              << SeedTrace(seed));
            const auto x = LevelRichReals<T>(n, seed++, level);
            EachMember(level, value, [&x](const char* name, auto rule, auto member) {
                SCOPED_TRACE(name);
                ExpectMatches(x, rule, member);
            });
        }
    }
}

// The low side is tested first: with low above high every other element
// becomes high. A NaN bound disables its side.
TEST(TrimFloat, LowIsTestedFirstAndNaNPasses)
{
    const auto trim = [](std::vector<float> x, float low, float high) {
        ku::Trim(static_cast<unsigned int>(x.size()), x.data(), low, high);
        return x;
    };
    const float nan = QuietNaN<float>(0x321);
    EXPECT_TRUE(SameBitsArray({-1, -1, 0, 1, 1}, trim({-2, -1, 0, 1, 2}, -1.0f, 1.0f)));
    EXPECT_TRUE(SameBitsArray({1, 1, -1}, trim({-2, 0, 2}, 1.0f, -1.0f)));
    EXPECT_TRUE(SameBitsArray({-5, 1}, trim({-5, 5}, nan, 1.0f)));
    EXPECT_TRUE(SameBitsArray({-1, 5}, trim({-5, 5}, -1.0f, nan)));
}

// T(i) * slope + offset, two roundings; the data must tell a running sum and a
// fused step apart.
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
