// Reductions: strict ascending sums from +0 in the element's type, the
// tie-breaks and NaN rules of the scans, and MaxEvery/MinEvery.

#include <kestaccel/BasicMath.h>
#include <kestaccel/DSP.h>

#include <algorithm>
#include <cmath>
#include <utility>

#include "support/TestSupport.h"

namespace {

namespace ku = kestaccel::utility;
using namespace kestaccel_test;

// Overloads that must not exist; each probe must also see the one that does.
#define GAP(Probe, Has, Lacks, ...) \
    KESTACCEL_PROBE(Probe, __VA_ARGS__) static_assert(Probe<Has>::value && !Probe<Lacks>::value, #Probe);
GAP(MaxIndexProbe, float, double, ku::MaxIndex(0u, Arg<const T*>(), Arg<T*>()))
GAP(MinIndexProbe, float, double, ku::MinIndex(0u, Arg<const T*>(), Arg<T*>()))
GAP(MinMaxProbe, float, double, ku::MinMax(0u, Arg<const T*>(), Arg<T&>(), Arg<T&>()))
GAP(PeakProbe, float, double, ku::MinMax(Arg<const T*>(), 0u))
GAP(MinMaxIndexProbe, float, double,
    ku::MinMaxIndex(0u, Arg<const T*>(), Arg<T&>(), Arg<T&>(), Arg<unsigned&>(), Arg<unsigned&>()))
GAP(MaxEveryProbe, float, double, ku::MaxEvery(0u, Arg<const T*>(), Arg<const T*>(), Arg<T*>()))
GAP(MinEveryProbe, float, double, ku::MinEvery(0u, Arg<const T*>(), Arg<const T*>(), Arg<T*>()))
GAP(MaxEveryInPlaceProbe, float, double, ku::MaxEvery_InPlace(0u, Arg<const T*>(), Arg<T*>()))
GAP(MinEveryInPlaceProbe, float, double, ku::MinEvery_InPlace(0u, Arg<const T*>(), Arg<T*>()))
GAP(SumProbe, double, std::complex<float>, ku::Sum(0u, Arg<const T*>()))
GAP(SumDoubleProbe, double, std::complex<double>, ku::Sum(0u, Arg<const T*>()))
GAP(MaxProbe, double, std::complex<float>, ku::Max(0u, Arg<const T*>()))
GAP(DotProductProbe, double, std::complex<float>, ku::DotProduct(0u, Arg<const T*>(), Arg<const T*>()))
#undef GAP

// Values spread over many binades, so that any change of summation order
// changes the rounded sum.
template <class T>
std::vector<T> WideReals(std::size_t count, std::uint32_t seed)
{
    auto values = RandomReals<T>(count, seed);
    std::mt19937 engine(seed + 7919u);
    std::uniform_int_distribution<int> exponent(-18, 18);
    for (auto& v : values) v = std::ldexp(v, exponent(engine));
    return values;
}

template <class T>
class Reductions : public ::testing::Test {};
TYPED_TEST_SUITE(Reductions, FloatingTypes);

TYPED_TEST(Reductions, ZerosAndEmptyVectorsGivePositiveZeroAndNormL1ClearsANaNSign)
{
    using T = TypeParam;
    const std::vector<T> zeros(5, -T(0)), ones(5, T(1));
    // Count 0 gets null pointers: nothing may be read.
    for (unsigned int n : {0u, 5u}) {
        const T* x = n == 0 ? nullptr : zeros.data();
        const T* y = n == 0 ? nullptr : ones.data();
        EXPECT_TRUE(SameBitsArray(std::vector<T>(5, T(0)), {ku::Sum(n, x), ku::Mean(n, x), ku::NormL1(n, x),
                                                             ku::NormL2(n, x), ku::DotProduct(n, x, y)}));
    }
    // The NaN that comes out is the positive one with the element's payload.
    const T withNaN[] = {T(2), -QuietNaN<T>(0x9)};
    const T expected = (T(0) + std::fabs(withNaN[0])) + std::fabs(withNaN[1]);
    ASSERT_NE(Bits(expected), Bits(T(T(0) + withNaN[0]) + withNaN[1])) << "the case must see the sign of the NaN";
    EXPECT_TRUE(SameBits(expected, ku::NormL1(2u, withNaN)));
}

// The sequential loops; the deviation on a large mean with a small spread,
// where a one-pass formula loses the digits.
TYPED_TEST(Reductions, SumsMatchTheSequentialLoops)
{
    using T = TypeParam;
    std::uint32_t seed = 200;
    for (unsigned int n : InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto a = WideReals<T>(n, seed++);
        const auto b = WideReals<T>(n, seed++);
        const auto c = RandomReals<T>(n, seed++, T(1000), T(1001));
        T sum = T(0), magnitudes = T(0), dot = T(0), sumC = T(0), deviations = T(0);
        double squares = 0.0;  // each square rounded to T, the float ones then summed in double
        for (std::size_t i = 0; i < n; ++i) {
            sum = sum + a[i];
            magnitudes = magnitudes + std::fabs(a[i]);
            const T square = a[i] * a[i], product = a[i] * b[i];
            squares = squares + static_cast<double>(square);
            dot = dot + product;
            sumC = sumC + c[i];
        }
        const T mean = sum / static_cast<T>(n), norm = static_cast<T>(std::sqrt(squares)), meanC = sumC / static_cast<T>(n);
        for (std::size_t i = 0; i < n; ++i) deviations = deviations + T(meanC - c[i]) * T(meanC - c[i]);
        const T untouched = QuietNaN<T>(0x5);  // fewer than two elements leave the result as it was
        T deviation = untouched;
        ku::StandardDeviation(n, c.data(), deviation);
        EXPECT_TRUE(SameBitsArray({sum, mean, magnitudes, norm, dot, n < 2 ? untouched : T(std::sqrt(deviations / T(n - 1)))},
                                  std::vector<T>{ku::Sum(n, a.data()), ku::Mean(n, a.data()), ku::NormL1(n, a.data()),
                                                 ku::NormL2(n, a.data()), ku::DotProduct(n, a.data(), b.data()), deviation}));
    }
    T deviation = QuietNaN<T>(0x5);
    ku::StandardDeviation(0u, static_cast<const T*>(nullptr), deviation);
    EXPECT_TRUE(SameBits(QuietNaN<T>(0x5), deviation));
}

// Sum adds in float (1e8 + 1 loses the 1); NormL2 squares in float (1e20
// overflows) and sums in double (a float sum of 100000 squares drifts).
TEST(ReductionsFloat, SumAddsInFloatAndNormL2SquaresInFloatAndSumsInDouble)
{
    const float large[] = {1e8f, 1.0f, -1e8f}, big = 1e20f;
    const double bigDouble = 1e20;
    EXPECT_TRUE(SameBits(0.0f, ku::Sum(3u, large)));
    EXPECT_TRUE(SameBits(std::numeric_limits<float>::infinity(), ku::NormL2(1u, &big)));
    EXPECT_TRUE(SameBits(1e20, ku::NormL2(1u, &bigDouble)));
    const std::vector<float> x(100000, 0.1f);
    const float square = 0.1f * 0.1f;
    double exact = 0.0;
    float drifting = 0.0f;
    for (std::size_t i = 0; i < x.size(); ++i) { exact += square; drifting += square; }
    const float result = ku::NormL2(static_cast<unsigned int>(x.size()), x.data());
    EXPECT_TRUE(SameBits(static_cast<float>(std::sqrt(exact)), result));
    EXPECT_NE(Bits(std::sqrt(drifting)), Bits(result)) << "a float accumulator must give other bits here";
}

TYPED_TEST(Reductions, DotProductRoundsEachProductBeforeAdding)
{
    using T = TypeParam;
    // a * a = 1 + 2e + e^2 rounds to 1 + 2e; after -(1 + 2e) is already in
    // the accumulator a fused step would keep the e^2.
    const T e = std::ldexp(T(1), -(std::numeric_limits<T>::digits / 2 + 1));
    const T a = T(1) + e, c = -(T(1) + T(2) * e);
    const T x[] = {T(1), a}, y[] = {c, a};
    ASSERT_NE(T(0), std::fma(a, a, c)) << "the case must tell a fused step apart";
    EXPECT_TRUE(SameBits(T(0), ku::DotProduct(2u, x, y)));
}

// Random data rich in ties, signed zeros and NaNs of distinct payloads.
template <class T>
std::vector<T> TieRichReals(std::size_t count, std::uint32_t seed)
{
    std::mt19937 engine(seed);
    std::uniform_int_distribution<int> pick(0, 15);
    std::vector<T> values(count);
    for (auto& v : values) {
        const int k = pick(engine);
        v = k == 0 ? QuietNaN<T>(1u + engine() % 1000) : k == 1 ? -T(0) : k == 2 ? T(0) : static_cast<T>(k - 8);
    }
    return values;
}

// The first of equals wins (-0 against +0 tells), a later NaN never wins, a NaN
// at element 0 stays, and count 0 reads element 0 (index 0, value if asked).
TYPED_TEST(Reductions, ScansKeepTheFirstOfEqualsAndSkipLaterNaN)
{
    using T = TypeParam;
    const T nan = QuietNaN<T>(0x2A);
    const T z[] = {-T(0), T(0), -T(0)}, later[] = {T(1), nan, T(3)}, first[] = {nan, T(1), T(3)};
    EXPECT_TRUE(SameBitsArray({-T(0), -T(0), T(0), T(0), T(3), T(1), nan, nan, T(1), T(1)},
                              std::vector<T>{ku::Max(3u, z), ku::Min(3u, z), ku::Max(2u, z + 1), ku::Min(2u, z + 1),
                                             ku::Max(3u, later), ku::Min(3u, later), ku::Max(3u, first),
                                             ku::Min(3u, first), ku::Max(0u, later), ku::Min(0u, later)}));
    if constexpr (std::is_same<T, float>::value) {
        const float up[] = {1, 3, 3, 2}, down[] = {2, 1, 1, 3}, zeros[] = {0.0f, -0.0f, 0.0f, -0.0f};
        float v[4] = {};
        EXPECT_EQ((std::vector<unsigned int>{1, 1, 0, 0, 0, 0, 0, 0}),
                  (std::vector<unsigned int>{ku::MaxIndex(4u, up, nullptr), ku::MinIndex(4u, down, &v[0]),
                                             ku::MaxIndex(3u, zeros + 1, &v[1]), ku::MinIndex(4u, zeros, nullptr),
                                             ku::MaxIndex(0u, nullptr, nullptr), ku::MinIndex(0u, nullptr, nullptr),
                                             ku::MaxIndex(0u, down, &v[2]), ku::MinIndex(0u, up, &v[3])}));
        EXPECT_TRUE(SameBitsArray(std::vector<float>{1.0f, -0.0f, 2.0f, 1.0f}, std::vector<float>(v, v + 4)));
    }
}

// The paired scan: the smaller of each pair against the minimum, the larger
// against the maximum with the inverted test, a last single element alone.
struct Pair {
    std::size_t lo;
    std::size_t hi;
};

Pair LoopPairedScan(const std::vector<float>& x, std::size_t n, std::size_t start, Pair s)
{
    for (std::size_t i = start; i < n; i += 2) {
        if (i == n - 1) {
            if (x[s.lo] > x[i])
                s.lo = i;
            else if (!(x[s.hi] > x[i]))
                s.hi = i;
            break;
        }
        const std::size_t smaller = x[i] > x[i + 1] ? i + 1 : i, larger = smaller == i ? i + 1 : i;
        if (x[s.lo] > x[smaller]) s.lo = smaller;
        if (!(x[s.hi] > x[larger])) s.hi = larger;
    }
    return s;
}

float LoopPeak(const std::vector<float>& x, std::size_t n)
{
    if (n == 0) return 0.0f;
    Pair s{0, 0};
    if (n > 1) s = x[0] > x[1] ? Pair{1, 0} : Pair{0, 1};
    s = LoopPairedScan(x, n, 2, s);
    const float negated = -x[s.lo];
    return negated > x[s.hi] ? negated : x[s.hi];
}

// MinMaxIndex and MinMax over the first n elements: the expected positions,
// and copies of those elements as the values.
::testing::AssertionResult PairedScanGives(const std::vector<float>& x, unsigned int n, std::size_t lo, std::size_t hi)
{
    float mn = 1, mx = 1, mn2 = 1, mx2 = 1;
    unsigned int iMin = 99, iMax = 99;
    ku::MinMaxIndex(n, x.data(), mn, mx, iMin, iMax);
    ku::MinMax(n, x.data(), mn2, mx2);
    if (iMin != lo || iMax != hi)
        return ::testing::AssertionFailure() << "indices " << iMin << ", " << iMax << ", not " << lo << ", " << hi;
    return SameBitsArray(std::vector<float>{x[lo], x[hi], x[lo], x[hi]}, std::vector<float>{mn, mx, mn2, mx2});
}

TEST(ScansFloat, PairedScanTakesTheFirstSmallestAndTheLastLargest)
{
    EXPECT_TRUE(PairedScanGives({1, 3, 3, 2}, 4, 0, 2));
    EXPECT_TRUE(PairedScanGives({5}, 1, 0, 0));
    EXPECT_TRUE(PairedScanGives({-0.0f, 0.0f, -0.0f, 0.0f, -0.0f}, 5, 0, 4));
    EXPECT_TRUE(PairedScanGives({-7}, 0, 0, 0)) << "count 0 reads element 0";
    const float nan = QuietNaN<float>(0x3);
    // NaN as the larger element of a pair (first test false) becomes the
    // maximum, and the next element so tested replaces it.
    EXPECT_TRUE(PairedScanGives({0, 1, nan}, 3, 0, 2));
    EXPECT_TRUE(PairedScanGives({0, 1, nan, 2, 1}, 5, 0, 3));
    // A last single element that becomes the minimum is not tested as a maximum.
    EXPECT_TRUE(PairedScanGives({0, 1, nan, -5}, 4, 3, 2));
    // NaN as the first of a pair is passed over; NaN in element 0 stays the minimum.
    EXPECT_TRUE(PairedScanGives({0, nan, 1}, 3, 0, 2));
    EXPECT_TRUE(PairedScanGives({nan, -5, 5}, 3, 0, 2));
}

// The peak magnitude pairs elements 0 and 1 first: the NaN then becomes the
// maximum and is the result, where pairing from index 1 would give 1.
TEST(ScansFloat, PeakMagnitude)
{
    EXPECT_TRUE(SameBits(0.0f, ku::MinMax(static_cast<const float*>(nullptr), 0u)));
    const float nan = QuietNaN<float>(0x11);
    const std::vector<float> x = {1, nan, 0};
    EXPECT_TRUE(SameBits(nan, ku::MinMax(x.data(), 3u)));
    EXPECT_TRUE(SameBits(1.0f, x[LoopPairedScan(x, 3, 1, {0, 0}).hi])) << "the case must tell the pairings apart";
    // A NaN minimum: the result is the maximum element, negative here.
    const float y[] = {nan, -5};
    EXPECT_TRUE(SameBits(-5.0f, ku::MinMax(y, 2u)));
}

TYPED_TEST(Reductions, ScansMatchTheLoopsWrittenOut)
{
    using T = TypeParam;
    std::uint32_t seed = 600;
    for (unsigned int n : InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        for (const auto& x : {TieRichReals<T>(n, seed), RandomReals<T>(n, seed + 1, T(-4), T(3))}) {
            std::size_t hi = 0, lo = 0;  // the first of equals
            for (std::size_t i = 1; i < n; ++i) {
                if (x[i] > x[hi]) hi = i;
                if (x[lo] > x[i]) lo = i;
            }
            EXPECT_TRUE(SameBits(x[hi], ku::Max(n, x.data())));
            EXPECT_TRUE(SameBits(x[lo], ku::Min(n, x.data())));
            if constexpr (std::is_same<T, float>::value) {
                float value = 0;
                EXPECT_EQ(hi, ku::MaxIndex(n, x.data(), &value));
                EXPECT_TRUE(SameBits(x[hi], value));
                EXPECT_EQ(lo, ku::MinIndex(n, x.data(), &value));
                EXPECT_TRUE(SameBits(x[lo], value));
                const Pair s = LoopPairedScan(x, n, 1, {0, 0});
                EXPECT_TRUE(PairedScanGives(x, n, s.lo, s.hi));
                EXPECT_TRUE(SameBits(LoopPeak(x, n), ku::MinMax(x.data(), n)));
            }
        }
        seed += 2;
    }
}

float MaxOf(float first, float second) { return second > first ? second : first; }
float MinOf(float first, float second) { return first > second ? second : first; }

// On a NaN, equal values or +0 against -0 the first vector's element is taken.
TEST(EveryFloat, TheFirstOperandWinsOnNaNAndEquality)
{
    const float nan = QuietNaN<float>(0x77);
    const std::vector<float> first = {nan, 1, 0.0f, -0.0f, 2}, second = {1, nan, -0.0f, 0.0f, 2};
    for (const auto run : {ku::MaxEvery, ku::MinEvery}) {
        std::vector<float> dst(5);
        run(5u, first.data(), second.data(), dst.data());
        EXPECT_TRUE(SameBitsArray(first, dst));
    }
    for (const auto run : {ku::MaxEvery_InPlace, ku::MinEvery_InPlace}) {
        auto srcDst = second;
        run(5u, first.data(), srcDst.data());
        EXPECT_TRUE(SameBitsArray(first, srcDst));
    }
}

// The checker also puts dst one element either side of the first vector;
// srcDst one element ahead of src gives the running minimum of the prefix.
TEST(EveryFloat, MatchTheScalarLoopOnRandomAndOverlappingData)
{
    using V = const float*;
    std::uint32_t seed = 1000;
    for (unsigned int n : InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto a = TieRichReals<float>(n, seed++), b = TieRichReals<float>(n, seed++);
        ExpectMatches(a, [&b](float x, std::size_t i) { return MaxOf(x, b[i]); },
                      [&b](unsigned int k, V s, float* d) { ku::MaxEvery(k, s, b.data(), d); });
        ExpectMatches(a, [&b](float x, std::size_t i) { return MinOf(x, b[i]); },
                      [&b](unsigned int k, V s, float* d) { ku::MinEvery(k, s, b.data(), d); });
        ExpectMatches(b, [&a](float x, std::size_t i) { return MaxOf(a[i], x); },
                      [&a](unsigned int k, float* io) { ku::MaxEvery_InPlace(k, a.data(), io); });
        ExpectMatches(b, [&a](float x, std::size_t i) { return MinOf(a[i], x); },
                      [&a](unsigned int k, float* io) { ku::MinEvery_InPlace(k, a.data(), io); });
    }
    auto buffer = RandomReals<float>(258, 1100), expected = buffer;
    for (std::size_t i = 0; i + 1 < buffer.size(); ++i) expected[i + 1] = MinOf(expected[i], expected[i + 1]);
    ku::MinEvery_InPlace(257u, buffer.data(), buffer.data() + 1);
    EXPECT_TRUE(SameBitsArray(expected, buffer));
}

}  // namespace
