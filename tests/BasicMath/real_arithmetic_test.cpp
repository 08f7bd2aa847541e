// Real arithmetic: operand order, one rounding per operator, the zero tests
// of the constant forms, ascending-order semantics on overlapping buffers,
// and the scaled short multiply.

#include <kestaccel/BasicMath.h>
#include <kestaccel/VectorUtils.h>

#include <climits>
#include <random>
#include <cmath>
#include <functional>
#include <limits>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#include "support/TestSupport.h"

namespace {

namespace ku = kestaccel::utility;
using kestaccel_test::Bits;
using kestaccel_test::GuardedBuffer;
using kestaccel_test::RandomReals;
using kestaccel_test::SameBits;
using kestaccel_test::SameBitsArray;
using kestaccel_test::SeedTrace;

// Gaps that stay gaps.
template <class T, class = void>
struct HasDivConstantRev : std::false_type {};
template <class T>
struct HasDivConstantRev<T, std::void_t<decltype(ku::DivConstantRev(0u, std::declval<T>(), std::declval<const T*>(), std::declval<T*>()))>>
    : std::true_type {};
template <class T, class = void>
struct HasShortAdd : std::false_type {};
template <class T>
struct HasShortAdd<T, std::void_t<decltype(ku::Add(0u, std::declval<const T*>(), std::declval<const T*>(), std::declval<T*>()))>>
    : std::true_type {};
static_assert(HasDivConstantRev<float>::value, "");
static_assert(!HasDivConstantRev<double>::value, "DivConstantRev exists for float only");
static_assert(!HasShortAdd<short>::value && !HasShortAdd<int>::value, "no integer Add");

template <class T>
class RealArithmetic : public ::testing::Test {};
using FloatingTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(RealArithmetic, FloatingTypes);

// Each two-vector member beside the scalar loop that defines it. The
// reference lambdas are the definitions written out; Sub and Div take the
// second vector as the minuend and the dividend.
template <class T>
struct BinaryCase {
    std::string name;
    void (*run)(unsigned int, const T*, const T*, T*);
    std::function<T(T a, T b)> expected;
};

template <class T>
std::vector<BinaryCase<T>> BinaryCases()
{
    return {
        {"Add", ku::Add, [](T a, T b) { return a + b; }},
        {"Sub", ku::Sub, [](T a, T b) { return b - a; }},
        {"Mul", ku::Mul, [](T a, T b) { return a * b; }},
        {"Div", ku::Div, [](T a, T b) { return b / a; }},
    };
}

TYPED_TEST(RealArithmetic, TwoVectorMembersMatchTheirDefinitionBitForBit)
{
    using T = TypeParam;
    std::uint32_t seed = 100;
    for (const auto& c : BinaryCases<T>()) {
        for (unsigned int n : kestaccel_test::InterestingSizes()) {
            SCOPED_TRACE(c.name + " size " + std::to_string(n) + " " + SeedTrace(seed));
            const auto a = RandomReals<T>(n, seed++, T(-3), T(3));
            const auto b = RandomReals<T>(n, seed++, T(-3), T(3));
            GuardedBuffer<T> dst(n);
            c.run(n, a.data(), b.data(), dst.data());
            std::vector<T> expected(n);
            for (unsigned int i = 0; i < n; ++i) expected[i] = c.expected(a[i], b[i]);
            EXPECT_TRUE(SameBitsArray(expected, dst.values()));
            EXPECT_TRUE(dst.Intact());
        }
    }
}

TYPED_TEST(RealArithmetic, SubAndDivTakeTheSecondVectorFirst)
{
    using T = TypeParam;
    const T a[2] = {1, 2}, b[2] = {10, 20};
    T dst[2];
    ku::Sub(2u, a, b, dst);
    EXPECT_EQ(dst[0], T(9));
    EXPECT_EQ(dst[1], T(18));
    ku::Div(2u, a, b, dst);
    EXPECT_EQ(dst[0], T(10));
    EXPECT_EQ(dst[1], T(10));
}

TYPED_TEST(RealArithmetic, InPlaceFormsAgreeWithTheThreeBufferForms)
{
    using T = TypeParam;
    const unsigned int n = 1023;
    const auto x = RandomReals<T>(n, 7, T(-2), T(2));
    const auto y = RandomReals<T>(n, 8, T(-2), T(2));
    using ThreeBuffer = void (*)(unsigned int, const T*, const T*, T*);
    using InPlace = void (*)(unsigned int, const T*, T*);
    const std::pair<ThreeBuffer, InPlace> pairs[] = {
        {ku::Add, ku::Add_InPlace}, {ku::Sub, ku::Sub_InPlace}, {ku::Mul, ku::Mul_InPlace}, {ku::Div, ku::Div_InPlace}};
    for (const auto& [threeBuffer, inPlace] : pairs) {
        auto viaThree = y, viaInPlace = y;
        threeBuffer(n, x.data(), viaThree.data(), viaThree.data());
        inPlace(n, x.data(), viaInPlace.data());
        EXPECT_TRUE(SameBitsArray(viaThree, viaInPlace));
    }
}

TYPED_TEST(RealArithmetic, DestinationOneBehindASourceSeesTheValuesAlreadyWritten)
{
    // dst = a + 1 in the same buffer: the ascending loop reads at i + 1 the
    // sum it has just stored, so the result is a running sum.
    using T = TypeParam;
    for (unsigned int n : {7u, 64u, 1000u}) {
        const auto init = RandomReals<T>(n + 1, 42 + n);
        const auto b = RandomReals<T>(n, 43 + n);
        auto buffer = init;
        ku::Add(n, buffer.data(), b.data(), buffer.data() + 1);
        auto expected = init;
        for (unsigned int i = 0; i < n; ++i) expected[i + 1] = expected[i] + b[i];
        EXPECT_TRUE(SameBitsArray(expected, buffer)) << n;

        buffer = init;
        ku::MulConstant(n, buffer.data(), buffer.data() + 1, T(1.5));
        expected = init;
        for (unsigned int i = 0; i < n; ++i) expected[i + 1] = T(1.5) * expected[i];
        EXPECT_TRUE(SameBitsArray(expected, buffer)) << n;
    }
}

TYPED_TEST(RealArithmetic, DestinationEqualToBothSources)
{
    using T = TypeParam;
    auto x = RandomReals<T>(100, 5);
    const auto original = x;
    ku::Add(100u, x.data(), x.data(), x.data());
    for (unsigned int i = 0; i < 100; ++i) EXPECT_TRUE(SameBits(T(original[i] + original[i]), x[i]));
}

TYPED_TEST(RealArithmetic, ConstantMembersMatchTheirDefinitionBitForBit)
{
    using T = TypeParam;
    const unsigned int n = 517;
    const auto src = RandomReals<T>(n, 9, T(-5), T(5));
    const T c = T(0.3);
    struct Case {
        const char* name;
        std::function<void(T*)> run;
        std::function<T(T)> expected;
    };
    const Case cases[] = {
        {"AddConstant", [&](T* d) { ku::AddConstant(n, src.data(), c, d); }, [&](T x) { return c + x; }},
        {"SubConstant", [&](T* d) { ku::SubConstant(n, src.data(), c, d); }, [&](T x) { return x - c; }},
        {"SubConstantRev", [&](T* d) { ku::SubConstantRev(n, src.data(), c, d); }, [&](T x) { return c - x; }},
        {"MulConstant", [&](T* d) { ku::MulConstant(n, src.data(), d, c); }, [&](T x) { return c * x; }},
        {"DivConstant", [&](T* d) { ku::DivConstant(n, src.data(), d, c); }, [&](T x) { return x / c; }},
        {"AddConstant_InPlace", [&](T* d) { ku::Copy(n, src.data(), d); ku::AddConstant_InPlace(n, d, c); }, [&](T x) { return c + x; }},
        {"SubConstant_InPlace", [&](T* d) { ku::Copy(n, src.data(), d); ku::SubConstant_InPlace(n, d, c); }, [&](T x) { return x - c; }},
        {"SubConstantRev_InPlace", [&](T* d) { ku::Copy(n, src.data(), d); ku::SubConstantRev_InPlace(n, d, c); }, [&](T x) { return c - x; }},
        {"MulConstant_InPlace", [&](T* d) { ku::Copy(n, src.data(), d); ku::MulConstant_InPlace(n, d, c); }, [&](T x) { return c * x; }},
        {"DivConstant_InPlace", [&](T* d) { ku::Copy(n, src.data(), d); ku::DivConstant_InPlace(n, d, c); }, [&](T x) { return x / c; }},
    };
    for (const auto& k : cases) {
        SCOPED_TRACE(k.name);
        GuardedBuffer<T> dst(n);
        k.run(dst.data());
        std::vector<T> expected(n);
        for (unsigned int i = 0; i < n; ++i) expected[i] = k.expected(src[i]);
        EXPECT_TRUE(SameBitsArray(expected, dst.values()));
        EXPECT_TRUE(dst.Intact());
    }
}

TYPED_TEST(RealArithmetic, DivConstantDividesAndDoesNotMultiplyByTheReciprocal)
{
    using T = TypeParam;
    const unsigned int n = 4096;
    const auto src = RandomReals<T>(n, 31, T(1), T(1000));
    std::vector<T> divided(n), multiplied(n);
    ku::DivConstant(n, src.data(), divided.data(), T(3));
    ku::MulConstant(n, src.data(), multiplied.data(), T(1) / T(3));
    unsigned int differing = 0;
    for (unsigned int i = 0; i < n; ++i) {
        EXPECT_TRUE(SameBits(T(src[i] / T(3)), divided[i])) << i;
        differing += Bits(divided[i]) != Bits(multiplied[i]);
    }
    EXPECT_GT(differing, 0u) << "the data must tell a division from a product with 1/3";
}

TYPED_TEST(RealArithmetic, ZeroConstantSkipsTheWholeCall)
{
    using T = TypeParam;
    const T src[3] = {1, -2, 0};
    const T poison = kestaccel_test::FromBits<T>(sizeof(T) == 4 ? 0x7FA0BEEFu : 0x7FF4DEADBEEF0000ull);
    for (T zero : {T(0), T(-0.0)}) {
        T dst[3] = {poison, poison, poison};
        ku::DivConstant(3u, src, dst, zero);
        for (T v : dst) EXPECT_TRUE(SameBits(poison, v));
        T srcDst[3] = {1, -2, 0};
        ku::DivConstant_InPlace(3u, srcDst, zero);
        for (int i = 0; i < 3; ++i) EXPECT_TRUE(SameBits(src[i], srcDst[i]));
    }
}

TYPED_TEST(RealArithmetic, NaNConstantIsNotZeroAndFillsWithNaN)
{
    using T = TypeParam;
    const T src[2] = {1, 2};
    T dst[2] = {0, 0};
    ku::DivConstant(2u, src, dst, std::numeric_limits<T>::quiet_NaN());
    EXPECT_TRUE(std::isnan(dst[0]) && std::isnan(dst[1]));
}

TYPED_TEST(RealArithmetic, VectorDivisionFollowsIEEEForZeroDivisors)
{
    using T = TypeParam;
    const T a[4] = {0, T(-0.0), 0, 2};
    const T b[4] = {3, 3, 0, -4};
    T dst[4];
    ku::Div(4u, a, b, dst);
    EXPECT_EQ(dst[0], std::numeric_limits<T>::infinity());
    EXPECT_EQ(dst[1], -std::numeric_limits<T>::infinity());
    EXPECT_TRUE(std::isnan(dst[2]));
    EXPECT_EQ(dst[3], T(-2));
}

TYPED_TEST(RealArithmetic, SubConstantRevOfZeroSubtractsRatherThanNegates)
{
    using T = TypeParam;
    T srcDst[2] = {T(0), T(-0.0)};
    ku::SubConstantRev_InPlace(2u, srcDst, T(0));
    EXPECT_TRUE(SameBits(T(0), srcDst[0])) << "0 - (+0) is +0; a negation would give -0";
    EXPECT_TRUE(SameBits(T(0), srcDst[1])) << "0 - (-0) is +0";
}

// Inputs where one fused multiply-add and two roundings give different bits:
// a*b = 1 + 2^-(k-1) + 2^-2k rounds to 1 + 2^-(k-1), and adding
// -(1 + 2^-(k-1)) gives 0, while a fused operation keeps 2^-2k.
template <class T>
T ProductTail()
{
    return std::is_same<T, float>::value ? std::ldexp(T(1), -12) : std::ldexp(T(1), -27);
}

TYPED_TEST(RealArithmetic, AddProductRoundsTheProductThenTheSum)
{
    using T = TypeParam;
    const T e = ProductTail<T>();
    const T a[1] = {T(1) + e}, b[1] = {T(1) + e};
    T srcDst[1] = {-(T(1) + 2 * e)};
    const T fused = std::fma(a[0], b[0], srcDst[0]);
    ku::AddProduct(1u, a, b, srcDst);
    EXPECT_TRUE(SameBits(T(0), srcDst[0]));
    EXPECT_NE(Bits(fused), Bits(srcDst[0])) << "the inputs must tell fused from unfused";

    T acc[1] = {-(T(1) + 2 * e)};
    ku::AddConstantProduct(1u, a, acc, T(1) + e);
    EXPECT_TRUE(SameBits(T(0), acc[0]));
}

TYPED_TEST(RealArithmetic, AddProductMatchesTwoRoundingsOnRandomData)
{
    using T = TypeParam;
    const unsigned int n = 2048;
    const auto a = RandomReals<T>(n, 61), b = RandomReals<T>(n, 62), c = RandomReals<T>(n, 63);
    auto viaProduct = c, viaConstant = c;
    ku::AddProduct(n, a.data(), b.data(), viaProduct.data());
    ku::AddConstantProduct(n, a.data(), viaConstant.data(), T(0.7));
    for (unsigned int i = 0; i < n; ++i) {
        const T product = a[i] * b[i];
        EXPECT_TRUE(SameBits(T(product + c[i]), viaProduct[i])) << i;
        const T scaled = a[i] * T(0.7);
        EXPECT_TRUE(SameBits(T(scaled + c[i]), viaConstant[i])) << i;
    }
}

TYPED_TEST(RealArithmetic, AddConstantProductOnOneBufferGivesXTimesCPlusX)
{
    using T = TypeParam;
    auto x = RandomReals<T>(64, 77);
    const auto original = x;
    ku::AddConstantProduct(64u, x.data(), x.data(), T(0.25));
    for (unsigned int i = 0; i < 64; ++i) {
        const T product = original[i] * T(0.25);
        EXPECT_TRUE(SameBits(T(product + original[i]), x[i])) << i;
    }
}

TYPED_TEST(RealArithmetic, CountZeroTouchesNoPointer)
{
    using T = TypeParam;
    T* null = nullptr;
    ku::Add(0u, null, null, null);
    ku::Sub_InPlace(0u, null, null);
    ku::DivConstant(0u, null, null, T(2));
    ku::AddProduct(0u, null, null, null);
    ku::AddConstantProduct(0u, null, null, T(2));
    SUCCEED() << "nothing was touched";
}

// ---------------------------------------------------------------------------
// DivConstantRev: the zero test is on the numerator.
// ---------------------------------------------------------------------------
TEST(DivConstantRev, ZeroNumeratorSkipsTheCall)
{
    const float src[3] = {2, 4, 8};
    float dst[3] = {-1, -1, -1};
    ku::DivConstantRev(3u, 0.0f, src, dst);
    ku::DivConstantRev(3u, -0.0f, src, dst);
    for (float v : dst) EXPECT_EQ(v, -1.0f);
}

TEST(DivConstantRev, ZeroElementsGiveSignedInfinities)
{
    const float src[3] = {0.0f, -0.0f, 4.0f};
    float dst[3];
    ku::DivConstantRev(3u, 1.0f, src, dst);
    EXPECT_EQ(dst[0], std::numeric_limits<float>::infinity());
    EXPECT_EQ(dst[1], -std::numeric_limits<float>::infinity());
    EXPECT_EQ(dst[2], 0.25f);
}

// ---------------------------------------------------------------------------
// MulConstant_InPlace on short.
// ---------------------------------------------------------------------------
std::vector<short> ScaleShorts(std::vector<short> values, short constant, int scale)
{
    ku::MulConstant_InPlace(static_cast<unsigned int>(values.size()), values.data(), constant, scale);
    return values;
}

TEST(MulConstantShort, RoundsHalfToEvenAboveZeroAndTowardZeroBelow)
{
    EXPECT_EQ(ScaleShorts({3, 5, 7, 1, -1, -3, -5}, 1, 1), (std::vector<short>{2, 2, 4, 0, 0, -1, -2}));
    // Just above and below a half: 2^-2 steps.
    EXPECT_EQ(ScaleShorts({5, 7, -5, -7}, 1, 2), (std::vector<short>{1, 2, -1, -1}));
}

TEST(MulConstantShort, ProductWrapsBeforeScaling)
{
    EXPECT_EQ(ScaleShorts({20000}, 2, 0), (std::vector<short>{-25536}));
    for (int scale : {-3, 0, 4}) {
        const auto scaled = ScaleShorts({300}, 300, scale);
        const auto expected = ScaleShorts({24464}, 1, scale);
        EXPECT_EQ(scaled, expected) << "300 * 300 wraps to 24464 whatever the scale (" << scale << ")";
    }
    EXPECT_EQ(ScaleShorts({300}, 300, 0), (std::vector<short>{24464}));
}

TEST(MulConstantShort, NegativeScaleScalesUpAndStoresTheLowBits)
{
    EXPECT_EQ(ScaleShorts({3}, 1, -2), (std::vector<short>{12}));
    // 3 * 2^14 = 49152 does not fit: the low 16 bits are stored, no saturation.
    EXPECT_EQ(ScaleShorts({3}, 1, -14), (std::vector<short>{static_cast<short>(-16384)}));
}

TEST(MulConstantShort, ValuesBeyondTheIntRangeGiveTheIndefiniteInteger)
{
    // f passes 2^31: truncation gives 0x80000000. A positive f then has a
    // fraction above one half and stores 0x80000001's low bits, 1; a negative
    // f stores 0x80000000's, 0.
    EXPECT_EQ(ScaleShorts({1, -1, 1000, -1000}, 1, -40), (std::vector<short>{1, 0, 1, 0}));
}

TEST(MulConstantShort, CountZeroReadsNothing)
{
    ku::MulConstant_InPlace(0u, static_cast<short*>(nullptr), short(3), 1);
    SUCCEED() << "nothing was touched";
}

TEST(MulConstantShort, MatchesTheStagedDefinitionOnRandomData)
{
    std::mt19937 engine(2024);
    std::uniform_int_distribution<int> sample(-32768, 32767), scaleDist(-20, 20);
    for (int round = 0; round < 200; ++round) {
        const short constant = static_cast<short>(sample(engine));
        const int scale = scaleDist(engine);
        std::vector<short> values(37);
        for (auto& v : values) v = static_cast<short>(sample(engine));
        const auto result = ScaleShorts(values, constant, scale);
        for (std::size_t i = 0; i < values.size(); ++i) {
            const short wrapped = static_cast<short>(values[i] * constant);
            const float f = static_cast<float>(wrapped * std::ldexp(1.0, -scale));
            // With |scale| <= 20 every value stays within the int range.
            const int t = static_cast<int>(f);
            const float frac = f - static_cast<float>(t);
            const int rounded = (frac > 0.5f || (frac == 0.5f && (t & 1))) ? t + 1 : t;
            ASSERT_EQ(static_cast<short>(rounded), result[i]) << "round " << round << " index " << i;
        }
    }
}

}  // namespace
