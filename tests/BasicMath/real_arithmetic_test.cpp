// Real arithmetic against the scalar definitions, bit for bit, and the scaled
// short multiply.

#include <kestaccel/BasicMath.h>

#include <cmath>
#include <limits>
#include <random>
#include <string>
#include <vector>

#include "support/TestSupport.h"

namespace {

namespace ku = kestaccel::utility;
using namespace kestaccel_test;

// Gaps that stay gaps.
KESTACCEL_PROBE(HasDivConstantRev, ku::DivConstantRev(0u, Arg<T>(), Arg<const T*>(), Arg<T*>()))
KESTACCEL_PROBE(HasAdd, ku::Add(0u, Arg<const T*>(), Arg<const T*>(), Arg<T*>()))
static_assert(HasDivConstantRev<float>::value && !HasDivConstantRev<double>::value, "DivConstantRev is float only");
static_assert(HasAdd<double>::value && !HasAdd<short>::value && !HasAdd<int>::value, "no integer Add");

template <class T>
class RealArithmetic : public ::testing::Test {};
TYPED_TEST_SUITE(RealArithmetic, FloatingTypes);

// Every fifth element special; the NaNs of a and b never meet, since either
// payload may come out of two NaN operands.
template <class T>
std::vector<T> Operands(std::size_t n, std::uint32_t seed, bool second)
{
    const T inf = std::numeric_limits<T>::infinity(), tiny = std::numeric_limits<T>::denorm_min();
    const T first[] = {T(0), -T(0), inf, -inf, QuietNaN<T>(0x21), -QuietNaN<T>(0x5), tiny, T(1)};
    const T other[] = {-T(0), T(0), inf, T(1), tiny, -inf, QuietNaN<T>(0x7), -QuietNaN<T>(0x9)};
    const T* specials = second ? other : first;
    auto v = RandomReals<T>(n, seed, T(-3), T(3));
    for (std::size_t i = 0; i < n; i += 5) v[i] = specials[(i / 5) % 8];
    return v;
}

// Each constant meets every member; a zero divisor constant is checked by hand.
TYPED_TEST(RealArithmetic, MembersMatchTheirDefinitionsBitForBit)
{
    using T = TypeParam;
    using P = const T*;
    using U = unsigned int;
    using I = std::size_t;
    const T constants[] = {T(0.3), T(0), T(3), -T(0), std::numeric_limits<T>::infinity(), T(-2.5)};
    const auto& sizes = InterestingSizes();
    for (std::size_t s = 0; s < sizes.size(); ++s) {
        const unsigned int n = sizes[s];
        const std::uint32_t seed = 100 + 3 * static_cast<std::uint32_t>(s);
        const T c = constants[s % 6];
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed) + " constant " + HexBits(c));
        const auto a = Operands<T>(n, seed, false), b = Operands<T>(n, seed + 1, true), d = RandomReals<T>(n, seed + 2);
        ExpectMatches(a, [&](T x, I i) { return x + b[i]; }, [&](U k, P x, T* o) { ku::Add(k, x, b.data(), o); });
        ExpectMatches(a, [&](T x, I i) { return b[i] - x; }, [&](U k, P x, T* o) { ku::Sub(k, x, b.data(), o); });
        ExpectMatches(a, [&](T x, I i) { return x * b[i]; }, [&](U k, P x, T* o) { ku::Mul(k, x, b.data(), o); });
        ExpectMatches(a, [&](T x, I i) { return b[i] / x; }, [&](U k, P x, T* o) { ku::Div(k, x, b.data(), o); });
        ExpectMatches(b, [&](T y, I i) { return a[i] + y; }, [&](U k, T* io) { ku::Add_InPlace(k, a.data(), io); });
        ExpectMatches(b, [&](T y, I i) { return y - a[i]; }, [&](U k, T* io) { ku::Sub_InPlace(k, a.data(), io); });
        ExpectMatches(b, [&](T y, I i) { return a[i] * y; }, [&](U k, T* io) { ku::Mul_InPlace(k, a.data(), io); });
        ExpectMatches(b, [&](T y, I i) { return y / a[i]; }, [&](U k, T* io) { ku::Div_InPlace(k, a.data(), io); });
        ExpectMatches(d, [&](T y, I i) { return T(a[i] * b[i]) + y; },
                      [&](U k, T* io) { ku::AddProduct(k, a.data(), b.data(), io); });
        ExpectMatches(d, [&](T y, I i) { return T(b[i] * c) + y; },
                      [&](U k, T* io) { ku::AddConstantProduct(k, b.data(), io, c); });
        ExpectMatches(b, [&](T x) { return c + x; }, [&](U k, P x, T* o) { ku::AddConstant(k, x, c, o); });
        ExpectMatches(b, [&](T x) { return c + x; }, [&](U k, T* io) { ku::AddConstant_InPlace(k, io, c); });
        ExpectMatches(b, [&](T x) { return x - c; }, [&](U k, P x, T* o) { ku::SubConstant(k, x, c, o); });
        ExpectMatches(b, [&](T x) { return x - c; }, [&](U k, T* io) { ku::SubConstant_InPlace(k, io, c); });
        ExpectMatches(b, [&](T x) { return c - x; }, [&](U k, P x, T* o) { ku::SubConstantRev(k, x, c, o); });
        ExpectMatches(b, [&](T x) { return c - x; }, [&](U k, T* io) { ku::SubConstantRev_InPlace(k, io, c); });
        ExpectMatches(b, [&](T x) { return c * x; }, [&](U k, P x, T* o) { ku::MulConstant(k, x, o, c); });
        ExpectMatches(b, [&](T x) { return c * x; }, [&](U k, T* io) { ku::MulConstant_InPlace(k, io, c); });
        if (c == T(0)) continue;
        ExpectMatches(b, [&](T x) { return x / c; }, [&](U k, P x, T* o) { ku::DivConstant(k, x, o, c); });
        ExpectMatches(b, [&](T x) { return x / c; }, [&](U k, T* io) { ku::DivConstant_InPlace(k, io, c); });
        if constexpr (HasDivConstantRev<T>::value)
            ExpectMatches(b, [&](T x) { return c / x; }, [&](U k, P x, T* o) { ku::DivConstantRev(k, c, x, o); });
    }
    // srcDst one element ahead of the first vector.
    auto buffer = RandomReals<T>(258, 99), expected = buffer;
    const auto other = RandomReals<T>(257, 98);
    for (std::size_t i = 0; i < other.size(); ++i) expected[i + 1] = T(expected[i] * other[i]) + expected[i + 1];
    ku::AddProduct(257u, buffer.data(), other.data(), buffer.data() + 1);
    EXPECT_TRUE(SameBitsArray(expected, buffer));
}

// Sub and Div take the second vector first; 0 - (+0) is +0, not a negated -0; a
// NaN constant is not zero; a zero divisor (numerator for Rev) skips the call.
TYPED_TEST(RealArithmetic, HandWorkedOddities)
{
    using T = TypeParam;
    const T a[2] = {1, 2}, b[2] = {10, 20}, nan = QuietNaN<T>(0x15);
    T d[2], zeros[2] = {T(0), -T(0)};
    ku::Sub(2u, a, b, d);
    EXPECT_TRUE(SameBitsArray(std::vector<T>{9, 18}, {d[0], d[1]}));
    ku::Div(2u, a, b, d);
    EXPECT_TRUE(SameBitsArray(std::vector<T>{10, 10}, {d[0], d[1]}));
    ku::SubConstantRev_InPlace(2u, zeros, T(0));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{0, 0}, {zeros[0], zeros[1]}));
    ku::DivConstant(2u, a, d, nan);
    EXPECT_TRUE(SameBitsArray(std::vector<T>{nan, nan}, {d[0], d[1]}));
    for (const T zero : {T(0), -T(0)}) {
        T kept[2] = {5, 5};
        ku::DivConstant(2u, a, kept, zero);
        ku::DivConstant_InPlace(2u, kept, zero);
        if constexpr (HasDivConstantRev<T>::value) ku::DivConstantRev(2u, zero, a, kept);
        EXPECT_TRUE(SameBitsArray(std::vector<T>{5, 5}, {kept[0], kept[1]}));
    }
}

// a * a = 1 + 2e + e^2 rounds to 1 + 2e, and adding -(1 + 2e) gives 0; a
// fused multiply-add keeps the e^2.
TYPED_TEST(RealArithmetic, AddProductRoundsTheProductThenTheSum)
{
    using T = TypeParam;
    const T e = std::ldexp(T(1), -(std::numeric_limits<T>::digits / 2 + 1));
    const T a[1] = {T(1) + e};
    T viaVector[1] = {-(T(1) + 2 * e)}, viaConstant[1] = {viaVector[0]};
    ASSERT_NE(T(0), std::fma(a[0], a[0], viaVector[0])) << "the inputs must tell fused from unfused";
    ku::AddProduct(1u, a, a, viaVector);
    ku::AddConstantProduct(1u, a, viaConstant, a[0]);
    EXPECT_TRUE(SameBits(T(0), viaVector[0]));
    EXPECT_TRUE(SameBits(T(0), viaConstant[0]));
}

// MulConstant_InPlace on short.
std::vector<short> ScaleShorts(std::vector<short> values, short constant, int scale)
{
    ku::MulConstant_InPlace(static_cast<unsigned int>(values.size()), values.data(), constant, scale);
    return values;
}

TEST(MulConstantShort, HandWorkedCorners)
{
    using V = std::vector<short>;
    // Ties to even above zero, toward zero below; then 2^-2 steps around a half.
    EXPECT_EQ(ScaleShorts({3, 5, 7, 1, -1, -3, -5}, 1, 1), (V{2, 2, 4, 0, 0, -1, -2}));
    EXPECT_EQ(ScaleShorts({5, 7, -5, -7}, 1, 2), (V{1, 2, -1, -1}));
    // The product wraps to 16 bits before scaling: 90000 becomes 24464, / 16.
    EXPECT_EQ(ScaleShorts({20000}, 2, 0), (V{-25536}));
    EXPECT_EQ(ScaleShorts({300}, 300, 4), (V{1529}));
    // A negative scale scales up, and the low 16 bits of 3 * 2^14 are stored.
    EXPECT_EQ(ScaleShorts({3}, 1, -2), (V{12}));
    EXPECT_EQ(ScaleShorts({3}, 1, -14), (V{-16384}));
    // Past 2^31 truncation gives 0x80000000; a positive value then has a
    // fraction above one half and stores the low bits of 0x80000001.
    EXPECT_EQ(ScaleShorts({1, -1, 1000, -1000}, 1, -40), (V{1, 0, 1, 0}));
    ku::MulConstant_InPlace(0u, static_cast<short*>(nullptr), short(3), 1);
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
            const int t = static_cast<int>(f);  // |scale| <= 20 stays within int
            const float frac = f - static_cast<float>(t);
            const int rounded = (frac > 0.5f || (frac == 0.5f && (t & 1))) ? t + 1 : t;
            ASSERT_EQ(static_cast<short>(rounded), result[i]) << "round " << round << " index " << i;
        }
    }
}

}  // namespace
