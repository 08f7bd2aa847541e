// Reductions and statistics: strict ascending summation from +0 in the
// element's type (the float NormL2 alone accumulating in double), the
// two-pass sample deviation, the tie-breaks and NaN behaviour of the scans,
// and the bit-exact selection of MaxEvery/MinEvery.

#include <kestaccel/BasicMath.h>
#include <kestaccel/DSP.h>

#include <cmath>
#include <complex>
#include <cstdint>
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

// ---------------------------------------------------------------------------
// Overloads that must not exist. A detector per name tells whether a call
// with the given argument types resolves; each is first shown to see the
// float member, so a broken detector cannot pass silently. The return
// type in the probe is only a label.
// ---------------------------------------------------------------------------
#define KESTACCEL_TEST_DETECTOR(Name)                                                                   \
    template <class Args, class = void>                                                                 \
    struct Has##Name : std::false_type {};                                                              \
    template <class R, class... A>                                                                      \
    struct Has##Name<R(A...), std::void_t<decltype(ku::Name(std::declval<A>()...))>> : std::true_type {};

KESTACCEL_TEST_DETECTOR(Sum)
KESTACCEL_TEST_DETECTOR(Max)
KESTACCEL_TEST_DETECTOR(MaxIndex)
KESTACCEL_TEST_DETECTOR(MinIndex)
KESTACCEL_TEST_DETECTOR(MinMax)
KESTACCEL_TEST_DETECTOR(MinMaxIndex)
KESTACCEL_TEST_DETECTOR(MaxEvery)
KESTACCEL_TEST_DETECTOR(MinEvery)
KESTACCEL_TEST_DETECTOR(MaxEvery_InPlace)
KESTACCEL_TEST_DETECTOR(MinEvery_InPlace)
KESTACCEL_TEST_DETECTOR(DotProduct)
#undef KESTACCEL_TEST_DETECTOR

using U = unsigned int;
template <class T>
using Cx = std::complex<T>;

static_assert(HasMaxIndex<U(U, const float*, float*)>::value, "");
static_assert(!HasMaxIndex<U(U, const double*, double*)>::value, "MaxIndex is float only");
static_assert(HasMinIndex<U(U, const float*, float*)>::value, "");
static_assert(!HasMinIndex<U(U, const double*, double*)>::value, "MinIndex is float only");
static_assert(HasMinMax<void(U, const float*, float&, float&)>::value, "");
static_assert(!HasMinMax<void(U, const double*, double&, double&)>::value, "MinMax is float only");
static_assert(HasMinMax<void(const float*, U)>::value, "");
static_assert(!HasMinMax<void(const double*, U)>::value, "the peak-magnitude MinMax is float only");
static_assert(HasMinMaxIndex<void(U, const float*, float&, float&, U&, U&)>::value, "");
static_assert(!HasMinMaxIndex<void(U, const double*, double&, double&, U&, U&)>::value, "MinMaxIndex is float only");
static_assert(HasMaxEvery<void(U, const float*, const float*, float*)>::value, "");
static_assert(!HasMaxEvery<void(U, const double*, const double*, double*)>::value, "MaxEvery is float only");
static_assert(HasMinEvery<void(U, const float*, const float*, float*)>::value, "");
static_assert(!HasMinEvery<void(U, const double*, const double*, double*)>::value, "MinEvery is float only");
static_assert(HasMaxEvery_InPlace<void(U, const float*, float*)>::value, "");
static_assert(!HasMaxEvery_InPlace<void(U, const double*, double*)>::value, "");
static_assert(HasMinEvery_InPlace<void(U, const float*, float*)>::value, "");
static_assert(!HasMinEvery_InPlace<void(U, const double*, double*)>::value, "");
static_assert(HasSum<void(U, const double*)>::value, "");
static_assert(!HasSum<void(U, const Cx<float>*)>::value && !HasSum<void(U, const Cx<double>*)>::value,
              "no complex Sum");
static_assert(HasMax<void(U, const double*)>::value, "");
static_assert(!HasMax<void(U, const Cx<float>*)>::value, "no complex Max");
static_assert(HasDotProduct<void(U, const double*, const double*)>::value, "");
static_assert(!HasDotProduct<void(U, const Cx<float>*, const Cx<float>*)>::value, "no complex DotProduct");

// ---------------------------------------------------------------------------
// Reference loops: the definitions written out plainly.
// ---------------------------------------------------------------------------
template <class T>
T LoopSum(const std::vector<T>& x)
{
    T acc = T(0);
    for (T v : x) acc = acc + v;
    return acc;
}

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
using FloatingTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(Reductions, FloatingTypes);

TYPED_TEST(Reductions, EmptyVectorsGivePositiveZeroWithoutReading)
{
    using T = TypeParam;
    EXPECT_TRUE(SameBits(T(0), ku::Sum(0u, static_cast<const T*>(nullptr))));
    EXPECT_TRUE(SameBits(T(0), ku::Mean(0u, static_cast<const T*>(nullptr))));
    EXPECT_TRUE(SameBits(T(0), ku::NormL1(0u, static_cast<const T*>(nullptr))));
    EXPECT_TRUE(SameBits(T(0), ku::NormL2(0u, static_cast<const T*>(nullptr))));
    EXPECT_TRUE(SameBits(T(0), ku::DotProduct(0u, static_cast<const T*>(nullptr), static_cast<const T*>(nullptr))));
}

TYPED_TEST(Reductions, SumIsStrictlyLeftToRight)
{
    using T = TypeParam;
    // Large enough that big + 1 rounds back to big in T: left to right the 1
    // is lost, any other order keeps it.
    const T big = std::ldexp(T(1), std::numeric_limits<T>::digits + 2);
    const std::vector<T> x = {big, T(1), -big};
    EXPECT_TRUE(SameBits(T(0), ku::Sum(3u, x.data())));
    const std::vector<T> reordered = {T(1), big, -big};
    EXPECT_TRUE(SameBits(T(0), ku::Sum(3u, reordered.data())));
    const std::vector<T> cancelFirst = {big, -big, T(1)};
    EXPECT_TRUE(SameBits(T(1), ku::Sum(3u, cancelFirst.data())));
}

TEST(ReductionsFloat, SumOfTheLargeValueExample)
{
    const float x[] = {1e8f, 1.0f, -1e8f};
    EXPECT_TRUE(SameBits(0.0f, ku::Sum(3u, x)));
}

TYPED_TEST(Reductions, SumsStartFromPositiveZero)
{
    using T = TypeParam;
    const std::vector<T> zeros(5, -T(0));
    EXPECT_TRUE(SameBits(T(0), ku::Sum(5u, zeros.data())));
    EXPECT_TRUE(SameBits(T(0), ku::Mean(5u, zeros.data())));
    EXPECT_TRUE(SameBits(T(0), ku::NormL1(5u, zeros.data())));
    EXPECT_TRUE(SameBits(T(0), ku::DotProduct(5u, zeros.data(), std::vector<T>(5, T(1)).data())));
}

TYPED_TEST(Reductions, SumMeanNormL1MatchTheSequentialLoop)
{
    using T = TypeParam;
    std::uint32_t seed = 200;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto x = WideReals<T>(n, seed++);
        std::vector<T> magnitudes(n);
        for (std::size_t i = 0; i < n; ++i) magnitudes[i] = std::fabs(x[i]);
        const T sum = LoopSum(x);
        EXPECT_TRUE(SameBits(sum, ku::Sum(n, x.data())));
        EXPECT_TRUE(SameBits(T(sum / static_cast<T>(n)), ku::Mean(n, x.data())));
        EXPECT_TRUE(SameBits(LoopSum(magnitudes), ku::NormL1(n, x.data())));
    }
}

TYPED_TEST(Reductions, NormL1ClearsTheSignOfEveryTerm)
{
    using T = TypeParam;
    const std::vector<T> x = {T(-1.5), T(2), -std::numeric_limits<T>::infinity()};
    EXPECT_TRUE(SameBits(T(3.5), ku::NormL1(2u, x.data())));
    EXPECT_TRUE(SameBits(std::numeric_limits<T>::infinity(), ku::NormL1(3u, x.data())));
    // The sign bit is cleared on a NaN too, so the NaN that comes out is the
    // positive one with the element's payload.
    const T negativeNaN = -FromBits<T>(Bits(std::numeric_limits<T>::quiet_NaN()) | 0x9);
    const T withNaN[] = {T(2), negativeNaN};
    const T expected = (T(0) + std::fabs(withNaN[0])) + std::fabs(withNaN[1]);
    ASSERT_NE(Bits(expected), Bits(T(T(0) + withNaN[0]) + withNaN[1])) << "the case must see the sign of the NaN";
    EXPECT_TRUE(SameBits(expected, ku::NormL1(2u, withNaN)));
}

TEST(ReductionsFloat, NormL2SquaresInFloatAndSumsInDouble)
{
    std::uint32_t seed = 300;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto x = WideReals<float>(n, seed++);
        double acc = 0.0;
        for (float v : x) {
            const float square = v * v;
            acc = acc + static_cast<double>(square);
        }
        EXPECT_TRUE(SameBits(static_cast<float>(std::sqrt(acc)), ku::NormL2(n, x.data())));
    }
}

TEST(ReductionsFloat, NormL2SquareOverflowsAsAFloat)
{
    const float big = 1e20f;
    EXPECT_TRUE(SameBits(std::numeric_limits<float>::infinity(), ku::NormL2(1u, &big)));
    const double bigDouble = 1e20;
    EXPECT_TRUE(SameBits(1e20, ku::NormL2(1u, &bigDouble)));
}

TEST(ReductionsFloat, NormL2OfManySmallElementsKeepsTheDoubleAccuracy)
{
    // The square of 0.1f added 100000 times drifts in a float accumulator.
    const std::vector<float> x(100000, 0.1f);
    const float square = 0.1f * 0.1f;
    double exact = 0.0;
    float drifting = 0.0f;
    for (std::size_t i = 0; i < x.size(); ++i) {
        exact = exact + static_cast<double>(square);
        drifting = drifting + square;
    }
    const float result = ku::NormL2(static_cast<unsigned int>(x.size()), x.data());
    EXPECT_TRUE(SameBits(static_cast<float>(std::sqrt(exact)), result));
    EXPECT_NE(Bits(std::sqrt(drifting)), Bits(result)) << "a float accumulator must give other bits here";
}

TEST(ReductionsDouble, NormL2MatchesTheSequentialLoop)
{
    std::uint32_t seed = 350;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto x = WideReals<double>(n, seed++);
        double acc = 0.0;
        for (double v : x) acc = acc + v * v;
        EXPECT_TRUE(SameBits(std::sqrt(acc), ku::NormL2(n, x.data())));
    }
}

TYPED_TEST(Reductions, StandardDeviationIsTheTwoPassSampleForm)
{
    using T = TypeParam;
    std::uint32_t seed = 400;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        if (n < 2) continue;
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        // A large mean with small spread: a one-pass formula loses the digits.
        const auto x = RandomReals<T>(n, seed++, T(1000), T(1001));
        const T mean = LoopSum(x) / static_cast<T>(n);
        T acc = T(0);
        for (T v : x) {
            const T d = mean - v;
            acc = acc + d * d;
        }
        const T expected = std::sqrt(acc / static_cast<T>(n - 1));
        T result = T(-1);
        ku::StandardDeviation(n, x.data(), result);
        EXPECT_TRUE(SameBits(expected, result));
    }
}

TYPED_TEST(Reductions, StandardDeviationDividesByCountMinusOne)
{
    using T = TypeParam;
    const T x[] = {T(2), T(4)};
    T result = T(0);
    ku::StandardDeviation(2u, x, result);
    EXPECT_TRUE(SameBits(T(std::sqrt(T(2))), result));
}

TYPED_TEST(Reductions, StandardDeviationOfFewerThanTwoLeavesTheResult)
{
    using T = TypeParam;
    const T sentinel = FromBits<T>(Bits(std::numeric_limits<T>::quiet_NaN()) | 0x5);
    const T one = T(7);
    T result = sentinel;
    ku::StandardDeviation(1u, &one, result);
    EXPECT_TRUE(SameBits(sentinel, result));
    ku::StandardDeviation(0u, static_cast<const T*>(nullptr), result);
    EXPECT_TRUE(SameBits(sentinel, result));
}

TYPED_TEST(Reductions, DotProductRoundsEachProductBeforeAdding)
{
    using T = TypeParam;
    // a * a = 1 + 2e + e^2 rounds to 1 + 2e; after -(1 + 2e) is already in
    // the accumulator a fused step would keep the e^2.
    const T e = std::ldexp(T(1), -(std::numeric_limits<T>::digits / 2 + 1));
    const T a = T(1) + e;
    const T c = -(T(1) + T(2) * e);
    const T x[] = {T(1), a};
    const T y[] = {c, a};
    ASSERT_NE(T(0), std::fma(a, a, c)) << "the case must tell a fused step apart";
    EXPECT_TRUE(SameBits(T(0), ku::DotProduct(2u, x, y)));
}

TYPED_TEST(Reductions, DotProductMatchesTheSequentialLoop)
{
    using T = TypeParam;
    std::uint32_t seed = 500;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto a = WideReals<T>(n, seed++);
        const auto b = WideReals<T>(n, seed++);
        T acc = T(0);
        for (std::size_t i = 0; i < n; ++i) {
            const T product = a[i] * b[i];
            acc = acc + product;
        }
        EXPECT_TRUE(SameBits(acc, ku::DotProduct(n, a.data(), b.data())));
    }
}

// ---------------------------------------------------------------------------
// Scans.
// ---------------------------------------------------------------------------
template <class T>
T QuietNaN(std::uint32_t payload)
{
    return FromBits<T>(Bits(std::numeric_limits<T>::quiet_NaN()) | payload);
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
        if (k == 0)
            v = QuietNaN<T>(1u + static_cast<std::uint32_t>(engine() % 1000));
        else if (k == 1)
            v = -T(0);
        else if (k == 2)
            v = T(0);
        else
            v = static_cast<T>(k - 8);
    }
    return values;
}

template <class T>
std::size_t LoopFirstMax(const std::vector<T>& x, std::size_t n)
{
    std::size_t best = 0;
    for (std::size_t i = 1; i < n; ++i)
        if (x[i] > x[best]) best = i;
    return best;
}

template <class T>
std::size_t LoopFirstMin(const std::vector<T>& x, std::size_t n)
{
    std::size_t best = 0;
    for (std::size_t i = 1; i < n; ++i)
        if (x[best] > x[i]) best = i;
    return best;
}

TYPED_TEST(Reductions, MaxAndMinKeepTheFirstOfEquals)
{
    using T = TypeParam;
    const T z[] = {-T(0), T(0), -T(0)};
    EXPECT_TRUE(SameBits(-T(0), ku::Max(3u, z)));
    EXPECT_TRUE(SameBits(-T(0), ku::Min(3u, z)));
    EXPECT_TRUE(SameBits(T(0), ku::Max(2u, z + 1)));
    EXPECT_TRUE(SameBits(T(0), ku::Min(2u, z + 1)));
}

TYPED_TEST(Reductions, MaxAndMinSkipNaNUnlessItIsFirst)
{
    using T = TypeParam;
    const T nan = QuietNaN<T>(0x2A);
    const T later[] = {T(1), nan, T(3)};
    EXPECT_TRUE(SameBits(T(3), ku::Max(3u, later)));
    EXPECT_TRUE(SameBits(T(1), ku::Min(3u, later)));
    const T first[] = {nan, T(1), T(3)};
    EXPECT_TRUE(SameBits(nan, ku::Max(3u, first)));
    EXPECT_TRUE(SameBits(nan, ku::Min(3u, first)));
}

TYPED_TEST(Reductions, MaxAndMinMatchThePositionScan)
{
    using T = TypeParam;
    std::uint32_t seed = 600;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto x = TieRichReals<T>(n, seed++);
        EXPECT_TRUE(SameBits(x[LoopFirstMax(x, n)], ku::Max(n, x.data())));
        EXPECT_TRUE(SameBits(x[LoopFirstMin(x, n)], ku::Min(n, x.data())));
    }
}

TEST(ScansFloat, IndexScansReportTheFirstOfEquals)
{
    const float up[] = {1, 3, 3, 2};
    float value = 0;
    EXPECT_EQ(1u, ku::MaxIndex(4u, up, &value));
    EXPECT_TRUE(SameBits(3.0f, value));
    const float down[] = {2, 1, 1, 3};
    EXPECT_EQ(1u, ku::MinIndex(4u, down, &value));
    EXPECT_TRUE(SameBits(1.0f, value));
    const float zeros[] = {0.0f, -0.0f, 0.0f, -0.0f};
    EXPECT_EQ(0u, ku::MaxIndex(3u, zeros + 1, &value));
    EXPECT_TRUE(SameBits(-0.0f, value));
    EXPECT_EQ(0u, ku::MinIndex(4u, zeros, &value));
    EXPECT_TRUE(SameBits(0.0f, value));
}

TYPED_TEST(Reductions, MaxAndMinReadElementZeroForCountZero)
{
    using T = TypeParam;
    const T x[] = {T(7), T(9), T(1)};
    EXPECT_TRUE(SameBits(T(7), ku::Max(0u, x)));
    EXPECT_TRUE(SameBits(T(7), ku::Min(0u, x)));
}

TEST(ScansFloat, IndexScansAcceptANullValueAndCountZero)
{
    EXPECT_EQ(0u, ku::MaxIndex(0u, nullptr, nullptr));
    EXPECT_EQ(0u, ku::MinIndex(0u, nullptr, nullptr));
    const float x[] = {4, 9, 1};
    EXPECT_EQ(1u, ku::MaxIndex(3u, x, nullptr));
    EXPECT_EQ(2u, ku::MinIndex(3u, x, nullptr));
    float value = -1;
    EXPECT_EQ(0u, ku::MaxIndex(0u, x, &value));
    EXPECT_TRUE(SameBits(4.0f, value));
    value = -1;
    EXPECT_EQ(0u, ku::MinIndex(0u, x, &value));
    EXPECT_TRUE(SameBits(4.0f, value));
}

TEST(ScansFloat, IndexScansMatchThePositionScanAndCopyBits)
{
    std::uint32_t seed = 700;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto x = TieRichReals<float>(n, seed++);
        float value = 0;
        const std::size_t hi = LoopFirstMax(x, n);
        EXPECT_EQ(hi, ku::MaxIndex(n, x.data(), &value));
        EXPECT_TRUE(SameBits(x[hi], value));
        const std::size_t lo = LoopFirstMin(x, n);
        EXPECT_EQ(lo, ku::MinIndex(n, x.data(), &value));
        EXPECT_TRUE(SameBits(x[lo], value));
    }
}

// The paired scan written out step by step: pairs from `start`, the smaller
// of a pair against the minimum, the larger against the maximum with the
// inverted test, a last single element on its own.
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
        const std::size_t p = i, q = i + 1;
        if (x[p] > x[q]) {
            if (x[s.lo] > x[q]) s.lo = q;
            if (!(x[s.hi] > x[p])) s.hi = p;
        } else {
            if (x[s.lo] > x[p]) s.lo = p;
            if (!(x[s.hi] > x[q])) s.hi = q;
        }
    }
    return s;
}

TEST(ScansFloat, MinMaxIndexTakesTheLastOfTheLargest)
{
    const float x[] = {1, 3, 3, 2};
    float mn = 0, mx = 0;
    unsigned int iMin = 9, iMax = 9;
    ku::MinMaxIndex(4u, x, mn, mx, iMin, iMax);
    EXPECT_TRUE(SameBits(1.0f, mn));
    EXPECT_TRUE(SameBits(3.0f, mx));
    EXPECT_EQ(0u, iMin);
    EXPECT_EQ(2u, iMax);

    const float single[] = {5};
    ku::MinMaxIndex(1u, single, mn, mx, iMin, iMax);
    EXPECT_TRUE(SameBits(5.0f, mn));
    EXPECT_TRUE(SameBits(5.0f, mx));
    EXPECT_EQ(0u, iMin);
    EXPECT_EQ(0u, iMax);

    // Signed zeros tell the first from the last of equals on both sides.
    const float zeros[] = {-0.0f, 0.0f, -0.0f, 0.0f, -0.0f};
    ku::MinMaxIndex(5u, zeros, mn, mx, iMin, iMax);
    EXPECT_EQ(0u, iMin);
    EXPECT_EQ(4u, iMax);
    EXPECT_TRUE(SameBits(-0.0f, mx));
}

TEST(ScansFloat, MinMaxIndexReadsElementZeroForCountZero)
{
    const float x[] = {-7};
    float mn = 0, mx = 0;
    unsigned int iMin = 9, iMax = 9;
    ku::MinMaxIndex(0u, x, mn, mx, iMin, iMax);
    EXPECT_TRUE(SameBits(-7.0f, mn));
    EXPECT_TRUE(SameBits(-7.0f, mx));
    EXPECT_EQ(0u, iMin);
    EXPECT_EQ(0u, iMax);
    mn = mx = 0;
    ku::MinMax(0u, x, mn, mx);
    EXPECT_TRUE(SameBits(-7.0f, mn));
    EXPECT_TRUE(SameBits(-7.0f, mx));
}

TEST(ScansFloat, PairedScanNaNPlacements)
{
    const float nan = QuietNaN<float>(0x3);
    float mn = 0, mx = 0;
    unsigned int iMin = 9, iMax = 9;
    // NaN as the larger element of a pair (first test false): it becomes the
    // maximum, and the next element so tested replaces it.
    const float q[] = {0, 1, nan};
    ku::MinMaxIndex(3u, q, mn, mx, iMin, iMax);
    EXPECT_EQ(2u, iMax);
    EXPECT_TRUE(SameBits(nan, mx));
    const float qThenMore[] = {0, 1, nan, 2, 1};
    ku::MinMaxIndex(5u, qThenMore, mn, mx, iMin, iMax);
    EXPECT_EQ(3u, iMax);
    EXPECT_TRUE(SameBits(2.0f, mx));
    // NaN as the first of a pair is passed over.
    const float p[] = {0, nan, 1};
    ku::MinMaxIndex(3u, p, mn, mx, iMin, iMax);
    EXPECT_EQ(2u, iMax);
    EXPECT_EQ(0u, iMin);
    // NaN in element 0 stays the minimum.
    const float first[] = {nan, -5, 5};
    ku::MinMaxIndex(3u, first, mn, mx, iMin, iMax);
    EXPECT_EQ(0u, iMin);
    EXPECT_TRUE(SameBits(nan, mn));
    EXPECT_EQ(2u, iMax);
}

TEST(ScansFloat, MinMaxIndexAndMinMaxMatchThePairedScan)
{
    std::uint32_t seed = 800;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto x = TieRichReals<float>(n, seed++);
        const Pair s = LoopPairedScan(x, n, 1, {0, 0});
        float mn = 0, mx = 0;
        unsigned int iMin = 0, iMax = 0;
        ku::MinMaxIndex(n, x.data(), mn, mx, iMin, iMax);
        EXPECT_EQ(s.lo, iMin);
        EXPECT_EQ(s.hi, iMax);
        EXPECT_TRUE(SameBits(x[s.lo], mn));
        EXPECT_TRUE(SameBits(x[s.hi], mx));
        float mn2 = 0, mx2 = 0;
        ku::MinMax(n, x.data(), mn2, mx2);
        EXPECT_TRUE(SameBits(x[s.lo], mn2));
        EXPECT_TRUE(SameBits(x[s.hi], mx2));

        const auto y = RandomReals<float>(n, seed++);
        const Pair t = LoopPairedScan(y, n, 1, {0, 0});
        ku::MinMaxIndex(n, y.data(), mn, mx, iMin, iMax);
        EXPECT_EQ(t.lo, iMin);
        EXPECT_EQ(t.hi, iMax);
    }
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

TEST(ScansFloat, PeakMagnitudeExamples)
{
    EXPECT_TRUE(SameBits(0.0f, ku::MinMax(static_cast<const float*>(nullptr), 0u)));
    const float a[] = {-3, 2};
    EXPECT_TRUE(SameBits(3.0f, ku::MinMax(a, 2u)));
    const float b[] = {1, 2};
    EXPECT_TRUE(SameBits(2.0f, ku::MinMax(b, 2u)));
    const float c[] = {-1, -2};
    EXPECT_TRUE(SameBits(2.0f, ku::MinMax(c, 2u)));
    const float d[] = {-4};
    EXPECT_TRUE(SameBits(4.0f, ku::MinMax(d, 1u)));
    const float e[] = {0};
    EXPECT_TRUE(SameBits(0.0f, ku::MinMax(e, 1u)));
}

TEST(ScansFloat, PeakMagnitudePairsElementsZeroAndOne)
{
    // With the first pair at (0, 1) the NaN becomes the maximum and is the
    // result; pairing from index 1 as MinMaxIndex does would give 1.
    const float nan = QuietNaN<float>(0x11);
    const std::vector<float> x = {1, nan, 0};
    EXPECT_TRUE(SameBits(nan, ku::MinMax(x.data(), 3u)));
    const Pair other = LoopPairedScan(x, 3, 1, {0, 0});
    EXPECT_TRUE(SameBits(1.0f, x[other.hi])) << "the case must tell the two pairings apart";
    // A NaN minimum: the result is the maximum element, negative here.
    const float y[] = {nan, -5};
    EXPECT_TRUE(SameBits(-5.0f, ku::MinMax(y, 2u)));
}

TEST(ScansFloat, PeakMagnitudeMatchesItsScan)
{
    std::uint32_t seed = 900;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto x = TieRichReals<float>(n, seed++);
        EXPECT_TRUE(SameBits(LoopPeak(x, n), ku::MinMax(x.data(), n)));
        const auto y = RandomReals<float>(n, seed++, -4.0f, 3.0f);
        EXPECT_TRUE(SameBits(LoopPeak(y, n), ku::MinMax(y.data(), n)));
    }
}

// ---------------------------------------------------------------------------
// Element-wise maximum and minimum.
// ---------------------------------------------------------------------------
const float kInf = std::numeric_limits<float>::infinity();

TEST(EveryFloat, MaxEveryCopiesTheSelectedElement)
{
    const std::vector<float> a = {1, 0, 0.1f, -0.0f, 0, -kInf, -kInf};
    const std::vector<float> b = {-1, 1, 0, -0.01f, kInf, 1, kInf};
    const std::vector<float> expected = {1, 1, 0.1f, -0.0f, kInf, 1, kInf};
    GuardedBuffer<float> dst(a.size());
    ku::MaxEvery(7u, a.data(), b.data(), dst.data());
    EXPECT_TRUE(SameBitsArray(expected, dst.values()));
    EXPECT_TRUE(dst.Intact());
    std::vector<float> srcDst = b;
    ku::MaxEvery_InPlace(7u, a.data(), srcDst.data());
    EXPECT_TRUE(SameBitsArray(expected, srcDst));
}

TEST(EveryFloat, MinEveryCopiesTheSelectedElement)
{
    const std::vector<float> a = {1, -0.01f, 0.1f, -0.0f, 0, -kInf, -kInf};
    const std::vector<float> b = {-1, 1, 0, -0.01f, kInf, 1, kInf};
    const std::vector<float> expected = {-1, -0.01f, 0, -0.01f, 0, -kInf, -kInf};
    GuardedBuffer<float> dst(a.size());
    ku::MinEvery(7u, a.data(), b.data(), dst.data());
    EXPECT_TRUE(SameBitsArray(expected, dst.values()));
    EXPECT_TRUE(dst.Intact());
    std::vector<float> srcDst = b;
    ku::MinEvery_InPlace(7u, a.data(), srcDst.data());
    EXPECT_TRUE(SameBitsArray(expected, srcDst));
}

TEST(EveryFloat, FirstVectorWinsOnNaNAndSignedZero)
{
    const float nan = QuietNaN<float>(0x77);
    const std::vector<float> a = {nan, 1, 0.0f, -0.0f};
    const std::vector<float> b = {1, nan, -0.0f, 0.0f};
    for (auto run : {ku::MaxEvery, ku::MinEvery}) {
        std::vector<float> dst(4);
        run(4u, a.data(), b.data(), dst.data());
        EXPECT_TRUE(SameBitsArray(a, dst));
    }
    for (auto run : {ku::MaxEvery_InPlace, ku::MinEvery_InPlace}) {
        std::vector<float> srcDst = b;
        run(4u, a.data(), srcDst.data());
        EXPECT_TRUE(SameBitsArray(a, srcDst));
    }
}

// Definitions written out, for the random and overlapping cases.
float MaxOf(float first, float second) { return second > first ? second : first; }
float MinOf(float first, float second) { return first > second ? second : first; }

TEST(EveryFloat, MatchTheScalarLoopOnRandomData)
{
    std::uint32_t seed = 1000;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto a = TieRichReals<float>(n, seed++);
        const auto b = TieRichReals<float>(n, seed++);
        std::vector<float> maxRef(n), minRef(n);
        for (std::size_t i = 0; i < n; ++i) {
            maxRef[i] = MaxOf(a[i], b[i]);
            minRef[i] = MinOf(a[i], b[i]);
        }
        GuardedBuffer<float> dst(n);
        ku::MaxEvery(n, a.data(), b.data(), dst.data());
        EXPECT_TRUE(SameBitsArray(maxRef, dst.values()));
        EXPECT_TRUE(dst.Intact());
        ku::MinEvery(n, a.data(), b.data(), dst.data());
        EXPECT_TRUE(SameBitsArray(minRef, dst.values()));
        EXPECT_TRUE(dst.Intact());
        GuardedBuffer<float> srcDst(n);
        for (std::size_t i = 0; i < n; ++i) srcDst[i] = b[i];
        ku::MaxEvery_InPlace(n, a.data(), srcDst.data());
        EXPECT_TRUE(SameBitsArray(maxRef, srcDst.values()));
        EXPECT_TRUE(srcDst.Intact());
        for (std::size_t i = 0; i < n; ++i) srcDst[i] = b[i];
        ku::MinEvery_InPlace(n, a.data(), srcDst.data());
        EXPECT_TRUE(SameBitsArray(minRef, srcDst.values()));
        EXPECT_TRUE(srcDst.Intact());
    }
}

TEST(EveryFloat, OverlappingDestinationSeesValuesAlreadyWritten)
{
    const unsigned int n = 257;
    const auto a = RandomReals<float>(n + 1, 1100);
    const auto b = RandomReals<float>(n, 1101);
    // dst one element behind a: each result is read back as the next a.
    std::vector<float> buffer = a, expected = a;
    for (std::size_t i = 0; i < n; ++i) expected[i + 1] = MaxOf(expected[i], b[i]);
    ku::MaxEvery(n, buffer.data(), b.data(), buffer.data() + 1);
    EXPECT_TRUE(SameBitsArray(expected, buffer));
    // srcDst one element behind src: the running minimum of the prefix.
    buffer = a;
    std::vector<float> check = a;
    for (std::size_t i = 0; i < n; ++i) check[i + 1] = MinOf(check[i], check[i + 1]);
    ku::MinEvery_InPlace(n, buffer.data(), buffer.data() + 1);
    EXPECT_TRUE(SameBitsArray(check, buffer));
}

}  // namespace
