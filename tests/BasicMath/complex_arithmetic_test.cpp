// Complex arithmetic: the plain product on the components (no fusion, no
// recovery of infinities), the scaled quotient with its branch order and its
// one NaN, operand order, the zero test of the constant forms only, and the
// ascending-loop semantics on overlapping buffers.

#include <kestaccel/BasicMath.h>

#include <cmath>
#include <complex>
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
using kestaccel_test::FromBits;
using kestaccel_test::GuardedBuffer;
using kestaccel_test::RandomComplex;
using kestaccel_test::RandomReals;
using kestaccel_test::SameBits;
using kestaccel_test::SameBitsArray;
using kestaccel_test::SeedTrace;

// Gaps that stay gaps: the complex family has no AddConstantProduct and no
// DivConstantRev. Each detector is shown to see the real member it mirrors.
template <class T, class = void>
struct HasAddConstantProduct : std::false_type {};
template <class T>
struct HasAddConstantProduct<
    T, std::void_t<decltype(ku::AddConstantProduct(0u, std::declval<const T*>(), std::declval<T*>(), std::declval<T>()))>>
    : std::true_type {};
template <class T, class = void>
struct HasDivConstantRev : std::false_type {};
template <class T>
struct HasDivConstantRev<
    T, std::void_t<decltype(ku::DivConstantRev(0u, std::declval<T>(), std::declval<const T*>(), std::declval<T*>()))>>
    : std::true_type {};
template <class T, class = void>
struct HasShortScaledMul : std::false_type {};
template <class T>
struct HasShortScaledMul<
    T, std::void_t<decltype(ku::MulConstant_InPlace(0u, std::declval<T*>(), std::declval<T>(), 0))>>
    : std::true_type {};
static_assert(HasAddConstantProduct<float>::value && HasAddConstantProduct<double>::value, "detector sees the real member");
static_assert(!HasAddConstantProduct<std::complex<float>>::value, "no complex AddConstantProduct");
static_assert(!HasAddConstantProduct<std::complex<double>>::value, "no complex AddConstantProduct");
static_assert(HasDivConstantRev<float>::value, "detector sees the float member");
static_assert(!HasDivConstantRev<std::complex<float>>::value, "no complex DivConstantRev");
static_assert(!HasDivConstantRev<std::complex<double>>::value, "no complex DivConstantRev");
static_assert(HasShortScaledMul<short>::value, "detector sees the short member");
static_assert(!HasShortScaledMul<std::complex<float>>::value, "no scaled complex MulConstant_InPlace");

// The quiet NaN with a clear sign, and with a payload in its low bits.
template <class T>
T QuietNaN(std::uint32_t payload = 0)
{
    using B = kestaccel_test::BitsType<T>;
    const B quiet = sizeof(T) == 4 ? B(0x7FC00000u) : B(0x7FF8000000000000ull);
    return FromBits<T>(quiet | B(payload));
}

// The definitions written out in the test, independent of the library.
template <class T>
std::complex<T> Product(std::complex<T> x, std::complex<T> y)
{
    const T rr = x.real() * y.real();
    const T ii = x.imag() * y.imag();
    const T ri = x.real() * y.imag();
    const T ir = x.imag() * y.real();
    return {rr - ii, ri + ir};
}

template <class T>
std::complex<T> SmithQuotient(std::complex<T> u, std::complex<T> v)
{
    const T ur = u.real(), ui = u.imag(), vr = v.real(), vi = v.imag();
    const std::complex<T> nan(QuietNaN<T>(), QuietNaN<T>());
    if (vr != vr || vi != vi) return nan;
    if (std::fabs(vr) > std::fabs(vi)) {
        const T w = vi / vr;
        const T d = vr + w * vi;
        if (d != d || d == 0) return nan;
        return {(ur + ui * w) / d, (ui - ur * w) / d};
    }
    if (vi == 0) return nan;
    const T w = vr / vi;
    const T d = vi + w * vr;
    if (d != d || d == 0) return nan;
    return {(ur * w + ui) / d, (ui * w - ur) / d};
}

// Random elements with the awkward ones mixed in: equal sizes of opposite
// sign, signed zeros, infinities and NaNs in either part.
template <class T>
std::vector<std::complex<T>> AwkwardComplex(std::size_t count, std::uint32_t seed)
{
    auto values = RandomComplex<T>(count, seed, T(-4), T(4));
    const T inf = std::numeric_limits<T>::infinity();
    const T nan = QuietNaN<T>(0x1234);
    for (std::size_t i = 0; i < count; ++i) {
        auto& z = values[i];
        switch (i % 11) {
        case 1: z = {z.real(), -z.real()}; break;
        case 3: z = {z.real(), z.real()}; break;
        case 5: z = {T(0), T(0)}; break;
        case 6: z = {-T(0), T(0)}; break;
        case 7: z = {inf, z.imag()}; break;
        case 8: z = {z.real(), -inf}; break;
        case 9: z = {nan, z.imag()}; break;
        case 10: z = {z.real(), T(1e-30)}; break;
        default: break;
        }
    }
    return values;
}

template <class T>
class ComplexArithmetic : public ::testing::Test {
protected:
    using Z = std::complex<T>;
};
using FloatingTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(ComplexArithmetic, FloatingTypes);

// Bits must agree, except that a NaN produced by the hardware's own
// arithmetic may carry either operand's payload (the compiler is free to
// commute an addition). The library's fixed NaN is always compared exactly.
template <class T>
::testing::AssertionResult SameResult(T expected, T actual)
{
    if (Bits(expected) != Bits(QuietNaN<T>()) && std::isnan(expected) && std::isnan(actual))
        return ::testing::AssertionSuccess();
    return SameBits(expected, actual);
}

template <class T>
::testing::AssertionResult SameResults(const std::vector<std::complex<T>>& expected, const std::complex<T>* actual)
{
    for (std::size_t i = 0; i < expected.size(); ++i) {
        auto re = SameResult(expected[i].real(), actual[i].real());
        if (!re) return re << " in the real part at index " << i << " of " << expected.size();
        auto im = SameResult(expected[i].imag(), actual[i].imag());
        if (!im) return im << " in the imaginary part at index " << i << " of " << expected.size();
    }
    return ::testing::AssertionSuccess();
}

template <class T>
using Binary = std::function<std::complex<T>(std::complex<T>, std::complex<T>)>;

template <class T>
struct VectorCase {
    std::string name;
    void (*run)(unsigned int, const std::complex<T>*, const std::complex<T>*, std::complex<T>*);
    void (*runInPlace)(unsigned int, const std::complex<T>*, std::complex<T>*);
    Binary<T> expected;  // of (first vector, second vector)
};

template <class T>
std::vector<VectorCase<T>> VectorCases()
{
    using Z = std::complex<T>;
    return {
        {"Add", ku::Add, ku::Add_InPlace, [](Z a, Z b) { return Z(a.real() + b.real(), a.imag() + b.imag()); }},
        {"Sub", ku::Sub, ku::Sub_InPlace, [](Z a, Z b) { return Z(b.real() - a.real(), b.imag() - a.imag()); }},
        {"Mul", ku::Mul, ku::Mul_InPlace, [](Z a, Z b) { return Product(a, b); }},
        {"Div", ku::Div, ku::Div_InPlace, [](Z a, Z b) { return SmithQuotient(b, a); }},
    };
}

TYPED_TEST(ComplexArithmetic, VectorMembersMatchTheirDefinitions)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    std::uint32_t seed = 700;
    for (const auto& c : VectorCases<T>()) {
        for (unsigned int n : kestaccel_test::InterestingSizes()) {
            SCOPED_TRACE(c.name + " size " + std::to_string(n) + " " + SeedTrace(seed));
            const auto a = AwkwardComplex<T>(n, seed++);
            const auto b = AwkwardComplex<T>(n, seed++);
            std::vector<Z> expected(n);
            for (std::size_t i = 0; i < n; ++i) expected[i] = c.expected(a[i], b[i]);

            GuardedBuffer<Z> dst(n);
            c.run(n, a.data(), b.data(), dst.data());
            EXPECT_TRUE(SameResults(expected, dst.data()));
            EXPECT_TRUE(dst.Intact());

            // The in-place form takes the second vector as the buffer.
            GuardedBuffer<Z> srcDst(n);
            for (std::size_t i = 0; i < n; ++i) srcDst[i] = b[i];
            c.runInPlace(n, a.data(), srcDst.data());
            EXPECT_TRUE(SameResults(expected, srcDst.data()));
            EXPECT_TRUE(srcDst.Intact());
        }
    }
}

TYPED_TEST(ComplexArithmetic, AddProductRoundsTheProductThenAdds)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    std::uint32_t seed = 800;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto a = AwkwardComplex<T>(n, seed++);
        const auto b = AwkwardComplex<T>(n, seed++);
        const auto acc = RandomComplex<T>(n, seed++, T(-16), T(16));
        std::vector<Z> expected(n);
        for (std::size_t i = 0; i < n; ++i) {
            const Z p = Product(a[i], b[i]);
            expected[i] = Z(p.real() + acc[i].real(), p.imag() + acc[i].imag());
        }
        GuardedBuffer<Z> srcDst(n);
        for (std::size_t i = 0; i < n; ++i) srcDst[i] = acc[i];
        ku::AddProduct(n, a.data(), b.data(), srcDst.data());
        EXPECT_TRUE(SameResults(expected, srcDst.data()));
        EXPECT_TRUE(srcDst.Intact());
    }
}

template <class T>
struct ConstantCase {
    std::string name;
    void (*run)(unsigned int, const std::complex<T>*, std::complex<T>*, std::complex<T>);
    void (*runInPlace)(unsigned int, std::complex<T>*, std::complex<T>);
    Binary<T> expected;  // of (element, constant)
};

// The members whose constant comes before dst are wrapped into one shape.
template <class T>
std::vector<ConstantCase<T>> ConstantCases()
{
    using Z = std::complex<T>;
    return {
        {"AddConstant", [](unsigned int n, const Z* s, Z* d, Z c) { ku::AddConstant(n, s, c, d); }, ku::AddConstant_InPlace,
         [](Z x, Z c) { return Z(c.real() + x.real(), c.imag() + x.imag()); }},
        {"SubConstant", [](unsigned int n, const Z* s, Z* d, Z c) { ku::SubConstant(n, s, c, d); }, ku::SubConstant_InPlace,
         [](Z x, Z c) { return Z(x.real() - c.real(), x.imag() - c.imag()); }},
        {"SubConstantRev", [](unsigned int n, const Z* s, Z* d, Z c) { ku::SubConstantRev(n, s, c, d); },
         ku::SubConstantRev_InPlace, [](Z x, Z c) { return Z(c.real() - x.real(), c.imag() - x.imag()); }},
        {"MulConstant", ku::MulConstant, ku::MulConstant_InPlace, [](Z x, Z c) { return Product(x, c); }},
        {"DivConstant", ku::DivConstant, ku::DivConstant_InPlace, [](Z x, Z c) { return SmithQuotient(x, c); }},
    };
}

TYPED_TEST(ComplexArithmetic, ConstantMembersMatchTheirDefinitions)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    const T inf = std::numeric_limits<T>::infinity();
    const std::vector<Z> constants = {{T(0.7), T(-1.3)}, {T(1), T(-1)},   {T(-2), T(2)},  {T(3), T(0.25)},
                                      {inf, T(1)},        {T(0), T(2.5)}, {T(1e-20), T(0)}, {T(0), QuietNaN<T>(7)}};
    std::uint32_t seed = 900;
    for (const auto& c : ConstantCases<T>()) {
        for (const Z k : constants) {
            for (unsigned int n : {1u, 7u, 64u, 1023u}) {
                SCOPED_TRACE(c.name + " size " + std::to_string(n) + " " + SeedTrace(seed));
                const auto src = AwkwardComplex<T>(n, seed++);
                std::vector<Z> expected(n);
                for (std::size_t i = 0; i < n; ++i) expected[i] = c.expected(src[i], k);

                GuardedBuffer<Z> dst(n);
                c.run(n, src.data(), dst.data(), k);
                EXPECT_TRUE(SameResults(expected, dst.data()));
                EXPECT_TRUE(dst.Intact());

                GuardedBuffer<Z> srcDst(n);
                for (std::size_t i = 0; i < n; ++i) srcDst[i] = src[i];
                c.runInPlace(n, srcDst.data(), k);
                EXPECT_TRUE(SameResults(expected, srcDst.data()));
                EXPECT_TRUE(srcDst.Intact());
            }
        }
    }
}

TYPED_TEST(ComplexArithmetic, MulConstantEqualsMulByAVectorOfThatConstant)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    const std::uint32_t seed = 950;
    SCOPED_TRACE(SeedTrace(seed));
    const unsigned int n = 1000;
    const auto src = RandomComplex<T>(n, seed, T(-1e3), T(1e3));
    const Z k(T(0.1), T(-7.3));
    const std::vector<Z> ks(n, k);
    std::vector<Z> byVector(n), byConstant(n);
    ku::Mul(n, src.data(), ks.data(), byVector.data());
    ku::MulConstant(n, src.data(), byConstant.data(), k);
    EXPECT_TRUE(SameBitsArray(byVector, byConstant));
}

TYPED_TEST(ComplexArithmetic, HandWorkedValues)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    const T inf = std::numeric_limits<T>::infinity();
    Z out;

    const Z one_one(1, 1), three_five(3, 5);
    ku::Sub(1, &one_one, &three_five, &out);
    EXPECT_TRUE(SameBits(Z(2, 4), out)) << "Sub is the second vector minus the first";

    const Z two(2, 0), four_six(4, 6);
    ku::Div(1, &two, &four_six, &out);
    EXPECT_TRUE(SameBits(Z(2, 3), out)) << "Div is the second vector over the first";

    // The plain formula: inf * 0 in the imaginary part is NaN, and nothing
    // recovers it, as a runtime complex multiply would.
    const Z infinite(inf, 0), unit(1, 0);
    ku::Mul(1, &infinite, &unit, &out);
    EXPECT_TRUE(SameBits(inf, out.real()));
    EXPECT_TRUE(std::isnan(out.imag()));
    ku::MulConstant(1, &infinite, &out, unit);
    EXPECT_TRUE(SameBits(inf, out.real()));
    EXPECT_TRUE(std::isnan(out.imag()));
    // inf - inf * 0 and inf * 0 + inf: both parts NaN, where a recovering
    // multiply would give (inf, inf).
    const Z corner(inf, inf);
    ku::Mul(1, &corner, &unit, &out);
    EXPECT_TRUE(std::isnan(out.real()) && std::isnan(out.imag()));
    ku::MulConstant(1, &unit, &out, corner);
    EXPECT_TRUE(std::isnan(out.real()) && std::isnan(out.imag()));

    const Z i(0, 1);
    Z acc(1, 1);
    ku::AddProduct(1, &i, &i, &acc);
    EXPECT_TRUE(SameBits(Z(0, 1), acc)) << "i * i + (1, 1)";

    // 0 - (+0) is +0; a negated difference would give -0.
    const Z zeros(0, 0);
    ku::SubConstantRev(1, &zeros, Z(0, 0), &out);
    EXPECT_TRUE(SameBits(Z(0, 0), out));
}

TYPED_TEST(ComplexArithmetic, EqualSizesTakeTheSecondBranch)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    // (1 + i) / (1 - i) is i. With w = vr / vi = -1 and d = -2 the real part
    // is (1 * -1 + 1) / -2 = -0; the first branch would give +0.
    const Z denominator(1, -1), numerator(1, 1);
    Z out;
    ku::Div(1, &denominator, &numerator, &out);
    EXPECT_TRUE(SameBits(Z(-T(0), 1), out));
    ku::DivConstant(1, &numerator, &out, denominator);
    EXPECT_TRUE(SameBits(Z(-T(0), 1), out));
}

TYPED_TEST(ComplexArithmetic, BadDenominatorsGiveTheQuietNaNInBothParts)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    const T inf = std::numeric_limits<T>::infinity();
    const T nan = QuietNaN<T>();
    const Z numerator(3, -4);
    const std::vector<Z> denominators = {{0, 0},         {-T(0), 0},           {0, -T(0)},         {-T(0), -T(0)},
                                         {inf, inf},     {-inf, inf},          {QuietNaN<T>(99), 1}, {1, -QuietNaN<T>(5)},
                                         {inf, QuietNaN<T>(3)}};
    for (const Z v : denominators) {
        SCOPED_TRACE(::testing::Message() << "denominator (" << v.real() << ", " << v.imag() << ")");
        Z out(7, 7);
        ku::Div(1, &v, &numerator, &out);
        EXPECT_TRUE(SameBits(Z(nan, nan), out));
        Z inPlace = numerator;
        ku::Div_InPlace(1, &v, &inPlace);
        EXPECT_TRUE(SameBits(Z(nan, nan), inPlace));
    }

    // Only the element with the zero denominator is marked.
    const unsigned int n = 9;
    std::vector<Z> a(n, Z(2, -1)), b(n, Z(5, 5));
    a[4] = Z(0, 0);
    std::vector<Z> dst(n);
    ku::Div(n, a.data(), b.data(), dst.data());
    for (unsigned int k = 0; k < n; ++k) {
        SCOPED_TRACE("index " + std::to_string(k));
        EXPECT_TRUE(SameBits(k == 4 ? Z(nan, nan) : SmithQuotient(b[k], a[k]), dst[k]));
    }

    // An infinite real part with a finite imaginary one is a valid divisor.
    const Z large(inf, 1);
    Z out;
    ku::Div(1, &large, &numerator, &out);
    EXPECT_TRUE(SameBits(Z(0, -T(0)), out)) << "(3 - 4i) / inf: (3 + 0) / inf, (-4 - 0) / inf";
}

TYPED_TEST(ComplexArithmetic, ZeroConstantSkipsTheWholeCall)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    const unsigned int n = 5;
    const auto src = RandomComplex<T>(n, 960);
    const Z marker(T(-123.5), T(77.25));
    for (const Z zero : {Z(0, 0), Z(-T(0), 0), Z(0, -T(0)), Z(-T(0), -T(0))}) {
        SCOPED_TRACE(::testing::Message() << "constant (" << Bits(zero.real()) << ", " << Bits(zero.imag()) << ")");
        std::vector<Z> dst(n, marker);
        ku::DivConstant(n, src.data(), dst.data(), zero);
        EXPECT_TRUE(SameBitsArray(std::vector<Z>(n, marker), dst));
        std::vector<Z> srcDst = src;
        ku::DivConstant_InPlace(n, srcDst.data(), zero);
        EXPECT_TRUE(SameBitsArray(src, srcDst));
    }
    // A NaN part fails the zero test; every quotient is then the fixed NaN.
    const Z nanConstant(0, QuietNaN<T>(42));
    std::vector<Z> dst(n, marker);
    ku::DivConstant(n, src.data(), dst.data(), nanConstant);
    EXPECT_TRUE(SameBitsArray(std::vector<Z>(n, Z(QuietNaN<T>(), QuietNaN<T>())), dst));
}

// A destination one element ahead of a source reads, at each index, the value
// written at the index before: the plain loop over whole elements.
TYPED_TEST(ComplexArithmetic, OverlappingBuffersFollowTheAscendingLoop)
{
    using T = TypeParam;
    std::uint32_t seed = 970;
    for (const auto& c : VectorCases<T>()) {
        for (unsigned int n : {3u, 17u, 64u, 1023u}) {
            SCOPED_TRACE(c.name + " size " + std::to_string(n) + " " + SeedTrace(seed));
            auto buffer = RandomComplex<T>(n + 1, seed++, T(0.5), T(2));
            const auto other = RandomComplex<T>(n, seed++, T(0.5), T(2));
            auto expected = buffer;
            for (std::size_t i = 0; i < n; ++i) expected[i + 1] = c.expected(expected[i], other[i]);
            c.run(n, buffer.data(), other.data(), buffer.data() + 1);
            EXPECT_TRUE(SameResults(expected, buffer.data()));
        }
    }
}

TYPED_TEST(ComplexArithmetic, CountZeroTouchesNothing)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    const Z marker(T(-9.5), T(3.25));
    const std::vector<Z> in(1, Z(2, 3));
    std::vector<Z> out(1, marker);
    const Z* a = in.data();
    Z* d = out.data();
    const Z k(1, 1);
    ku::Add(0, a, a, d);
    ku::Add_InPlace(0, a, d);
    ku::Sub(0, a, a, d);
    ku::Sub_InPlace(0, a, d);
    ku::AddConstant(0, a, k, d);
    ku::AddConstant_InPlace(0, d, k);
    ku::SubConstant(0, a, k, d);
    ku::SubConstant_InPlace(0, d, k);
    ku::SubConstantRev(0, a, k, d);
    ku::SubConstantRev_InPlace(0, d, k);
    ku::Mul(0, a, a, d);
    ku::Mul_InPlace(0, a, d);
    ku::MulConstant(0, a, d, k);
    ku::MulConstant_InPlace(0, d, k);
    ku::AddProduct(0, a, a, d);
    ku::Div(0, a, a, d);
    ku::Div_InPlace(0, a, d);
    ku::DivConstant(0, a, d, k);
    ku::DivConstant_InPlace(0, d, k);
    EXPECT_TRUE(SameBits(marker, out[0]));

    // Null pointers are accepted when nothing is to be done.
    ku::Mul(0, static_cast<const Z*>(nullptr), static_cast<const Z*>(nullptr), static_cast<Z*>(nullptr));
    ku::Div(0, static_cast<const Z*>(nullptr), static_cast<const Z*>(nullptr), static_cast<Z*>(nullptr));
}

}  // namespace
