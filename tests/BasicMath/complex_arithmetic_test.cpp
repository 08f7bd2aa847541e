// Complex arithmetic: the plain product (no fusion, no recovery of
// infinities), the scaled quotient with its branch order and its one NaN.

#include <kestaccel/BasicMath.h>

#include <algorithm>
#include <cmath>
#include <complex>
#include <limits>
#include <vector>

#include "support/TestSupport.h"

namespace {

namespace ku = kestaccel::utility;
using namespace kestaccel_test;

// Gaps that stay gaps; each probe first sees the real member it mirrors.
KESTACCEL_PROBE(HasAddConstantProduct, ku::AddConstantProduct(0u, Arg<const T*>(), Arg<T*>(), Arg<T>()))
KESTACCEL_PROBE(HasDivConstantRev, ku::DivConstantRev(0u, Arg<T>(), Arg<const T*>(), Arg<T*>()))
KESTACCEL_PROBE(HasShortScaledMul, ku::MulConstant_InPlace(0u, Arg<T*>(), Arg<T>(), 0))
using CF = std::complex<float>;
using CD = std::complex<double>;
static_assert(kGap<HasAddConstantProduct, double, CF> && !HasAddConstantProduct<CD>::value, "no complex form");
static_assert(kGap<HasDivConstantRev, float, CF> && !HasDivConstantRev<CD>::value, "no complex form");
static_assert(kGap<HasShortScaledMul, short, CF>, "no scaled complex MulConstant_InPlace");

// Four rounded products, then one rounded difference and one rounded sum.
template <class T>
std::complex<T> Product(std::complex<T> x, std::complex<T> y)
{
    const T rr = x.real() * y.real(), ii = x.imag() * y.imag();
    const T ri = x.real() * y.imag(), ir = x.imag() * y.real();
    return {rr - ii, ri + ir};
}

// u / v, scaled; equal sizes of vr and vi take the second branch.
template <class T>
std::complex<T> SmithQuotient(std::complex<T> u, std::complex<T> v)
{
    const T ur = u.real(), ui = u.imag(), vr = v.real(), vi = v.imag();
    const std::complex<T> nan(QuietNaN<T>(), QuietNaN<T>());
    if (vr != vr || vi != vi) return nan;
    const bool first = std::fabs(vr) > std::fabs(vi);
    if (!first && vi == 0) return nan;
    const T w = first ? vi / vr : vr / vi;
    const T d = first ? vr + w * vi : vi + w * vr;
    if (d != d || d == 0) return nan;
    if (first) return {(ur + ui * w) / d, (ui - ur * w) / d};
    return {(ur * w + ui) / d, (ui * w - ur) / d};
}

// Random elements with the awkward ones mixed in: equal sizes of either sign,
// zeros of every sign, infinities and NaNs in either part.
template <class T>
std::vector<std::complex<T>> AwkwardComplex(std::size_t count, std::uint32_t seed)
{
    auto values = RandomComplex<T>(count, seed, T(-4), T(4));
    const T inf = std::numeric_limits<T>::infinity(), nan = QuietNaN<T>(0x1234), z = T(0);
    for (std::size_t i = 0; i < count; ++i) {
        const T re = values[i].real(), im = values[i].imag();
        const std::complex<T> awkward[] = {{re, -re}, {re, re}, {z, z},      {-z, z},     {z, -z},    {-z, -z}, {inf, im},
                                           {re, -inf}, {inf, inf}, {nan, im}, {re, -nan}, {re, T(1e-30)}};
        if (i % 2) values[i] = awkward[(i / 2) % 12];
    }
    return values;
}

template <class T>
class ComplexArithmetic : public ::testing::Test {};
TYPED_TEST_SUITE(ComplexArithmetic, FloatingTypes);

// Bits must agree, but a NaN of the hardware's arithmetic may carry either
// operand's payload (a sum may be commuted); the library's fixed NaN is exact.
template <class T>
::testing::AssertionResult SameResults(const std::vector<std::complex<T>>& expected, const std::complex<T>* actual)
{
    for (std::size_t i = 0; i < expected.size(); ++i) {
        for (int part = 0; part < 2; ++part) {
            const T e = part ? expected[i].imag() : expected[i].real(), a = part ? actual[i].imag() : actual[i].real();
            if (Bits(e) != Bits(QuietNaN<T>()) && std::isnan(e) && std::isnan(a)) continue;
            auto r = SameBits(e, a);
            if (!r) return r << (part ? " in the imaginary" : " in the real") << " part at index " << i;
        }
    }
    return ::testing::AssertionSuccess();
}

template <class T>
struct Case {
    const char* name;
    void (*run)(unsigned int, const std::complex<T>*, const std::complex<T>*, std::complex<T>*);
    void (*runInPlace)(unsigned int, const std::complex<T>*, std::complex<T>*);  // none for AddProduct
    // Of the first vector, the second, and what dst held before.
    std::complex<T> (*expected)(std::complex<T>, std::complex<T>, std::complex<T>);
    bool constant;  // the first "vector" is then the constant, only its element 0 is read
};

// Each member out of place and in place on every size, and with dst one
// element ahead of the first source; a zero constant divisor writes nothing.
TYPED_TEST(ComplexArithmetic, MembersMatchTheirDefinitions)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    using C = const Z*;
    const Case<T> cases[] = {
        {"Add", ku::Add, ku::Add_InPlace, [](Z a, Z b, Z) { return Z(a.real() + b.real(), a.imag() + b.imag()); }, false},
        {"Sub", ku::Sub, ku::Sub_InPlace, [](Z a, Z b, Z) { return Z(b.real() - a.real(), b.imag() - a.imag()); }, false},
        {"Mul", ku::Mul, ku::Mul_InPlace, [](Z a, Z b, Z) { return Product(a, b); }, false},
        {"Div", ku::Div, ku::Div_InPlace, [](Z a, Z b, Z) { return SmithQuotient(b, a); }, false},
        {"AddProduct", ku::AddProduct, nullptr,
         [](Z a, Z b, Z d) { return Z(Product(a, b).real() + d.real(), Product(a, b).imag() + d.imag()); }, false},
        {"AddConstant", [](unsigned int n, C k, C s, Z* d) { ku::AddConstant(n, s, *k, d); },
         [](unsigned int n, C k, Z* io) { ku::AddConstant_InPlace(n, io, *k); },
         [](Z k, Z x, Z) { return Z(k.real() + x.real(), k.imag() + x.imag()); }, true},
        {"SubConstant", [](unsigned int n, C k, C s, Z* d) { ku::SubConstant(n, s, *k, d); },
         [](unsigned int n, C k, Z* io) { ku::SubConstant_InPlace(n, io, *k); },
         [](Z k, Z x, Z) { return Z(x.real() - k.real(), x.imag() - k.imag()); }, true},
        {"SubConstantRev", [](unsigned int n, C k, C s, Z* d) { ku::SubConstantRev(n, s, *k, d); },
         [](unsigned int n, C k, Z* io) { ku::SubConstantRev_InPlace(n, io, *k); },
         [](Z k, Z x, Z) { return Z(k.real() - x.real(), k.imag() - x.imag()); }, true},
        {"MulConstant", [](unsigned int n, C k, C s, Z* d) { ku::MulConstant(n, s, d, *k); },
         [](unsigned int n, C k, Z* io) { ku::MulConstant_InPlace(n, io, *k); }, [](Z k, Z x, Z) { return Product(x, k); }, true},
        {"DivConstant", [](unsigned int n, C k, C s, Z* d) { ku::DivConstant(n, s, d, *k); },
         [](unsigned int n, C k, Z* io) { ku::DivConstant_InPlace(n, io, *k); },
         [](Z k, Z x, Z d) { return k.real() == T(0) && k.imag() == T(0) ? d : SmithQuotient(x, k); }, true},
    };
    const T inf = std::numeric_limits<T>::infinity();
    const Z constants[] = {{T(0.7), T(-1.3)}, {T(1), T(-1)},  {T(-2), T(2)},     {T(3), T(0.25)}, {inf, T(1)},
                           {T(0), T(2.5)},    {-T(0), T(0)}, {T(1e-20), T(0)}, {T(0), QuietNaN<T>(7)}};
    const auto& sizes = InterestingSizes();
    std::uint32_t seed = 700;
    for (const auto& c : cases) {
        for (std::size_t s = 0; s < sizes.size(); ++s) {
            const unsigned int n = sizes[s];
            SCOPED_TRACE(::testing::Message() << c.name << " size " << n << " " << SeedTrace(seed) << " constant "
                                              << (c.constant ? constants[s % 9] : Z()));
            const auto a = c.constant ? std::vector<Z>(n, constants[s % 9]) : AwkwardComplex<T>(n, seed++);
            const auto b = AwkwardComplex<T>(n, seed++);
            const auto before = RandomComplex<T>(n, seed++, T(-16), T(16));
            std::vector<Z> expected(n), expectedInPlace(n);
            for (std::size_t i = 0; i < n; ++i) {
                expected[i] = c.expected(a[i], b[i], before[i]);
                expectedInPlace[i] = c.expected(a[i], b[i], b[i]);
            }
            GuardedBuffer<Z> dst(n), srcDst(n), none(0);
            std::copy(before.begin(), before.end(), dst.data());
            c.run(n, a.data(), b.data(), dst.data());
            c.run(0, a.data(), nullptr, nullptr);  // null pointers are fine when nothing is to be done
            EXPECT_TRUE(SameResults(expected, dst.data()));
            if (c.runInPlace) {
                std::copy(b.begin(), b.end(), srcDst.data());
                c.runInPlace(n, a.data(), srcDst.data());
                c.runInPlace(0, a.data(), none.data());
                EXPECT_TRUE(SameResults(expectedInPlace, srcDst.data()));
            }
            EXPECT_TRUE(dst.Intact() && srcDst.Intact() && none.Intact());
            if (c.constant) continue;

            auto buffer = RandomComplex<T>(n + 1, seed++, T(0.5), T(2));
            auto chained = buffer;
            const auto other = RandomComplex<T>(n, seed++, T(0.5), T(2));
            for (std::size_t i = 0; i < n; ++i) chained[i + 1] = c.expected(chained[i], other[i], chained[i + 1]);
            c.run(n, buffer.data(), other.data(), buffer.data() + 1);
            EXPECT_TRUE(SameResults(chained, buffer.data())) << "dst one element ahead";
        }
    }
}

TYPED_TEST(ComplexArithmetic, HandWorkedValues)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    const T inf = std::numeric_limits<T>::infinity();
    // One element through each member; the vector forms take (a, b).
    const auto sub = [](Z a, Z b) { Z out; ku::Sub(1, &a, &b, &out); return out; };
    const auto div = [](Z a, Z b) { Z out; ku::Div(1, &a, &b, &out); return out; };
    const auto divConstant = [](Z x, Z k) { Z out(7, 7); ku::DivConstant(1, &x, &out, k); return out; };
    const auto mul = [](Z a, Z b) { Z out; ku::Mul(1, &a, &b, &out); return out; };
    const auto mulConstant = [](Z x, Z k) { Z out; ku::MulConstant(1, &x, &out, k); return out; };
    const auto bothNaN = [](Z z) { return std::isnan(z.real()) && std::isnan(z.imag()); };
    EXPECT_TRUE(SameBits(Z(2, 4), sub(Z(1, 1), Z(3, 5)))) << "Sub is the second vector minus the first";
    EXPECT_TRUE(SameBits(Z(2, 3), div(Z(2, 0), Z(4, 6)))) << "Div is the second vector over the first";

    // The plain formula: inf * 0 gives NaN parts that a runtime multiply would
    // recover to infinities.
    for (const Z product : {mul(Z(inf, 0), Z(1, 0)), mulConstant(Z(inf, 0), Z(1, 0))})
        EXPECT_TRUE(SameBits(inf, product.real()) && std::isnan(product.imag()));
    EXPECT_TRUE(bothNaN(mul(Z(inf, inf), Z(1, 0))) && bothNaN(mulConstant(Z(1, 0), Z(inf, inf))));

    const Z i(0, 1), zeros(0, 0);
    Z acc(1, 1), out;
    ku::AddProduct(1, &i, &i, &acc);
    EXPECT_TRUE(SameBits(Z(0, 1), acc)) << "i * i + (1, 1)";
    ku::SubConstantRev(1, &zeros, Z(0, 0), &out);
    EXPECT_TRUE(SameBits(Z(0, 0), out)) << "0 - (+0) is +0; a negated difference would give -0";

    // Equal sizes take the second branch: (1 + i) / (1 - i) has w = -1 and
    // d = -2, so the real part is (1 * -1 + 1) / -2 = -0; the first would give +0.
    EXPECT_TRUE(SameBits(Z(-T(0), 1), div(Z(1, -1), Z(1, 1))));
    EXPECT_TRUE(SameBits(Z(-T(0), 1), divConstant(Z(1, 1), Z(1, -1))));

    // An infinite real part with a finite imaginary one is a valid divisor:
    // (3 - 4i) / inf is ((3 + 0) / inf, (-4 - 0) / inf).
    EXPECT_TRUE(SameBits(Z(0, -T(0)), div(Z(inf, 1), Z(3, -4))));
    // A zero or NaN divisor element gives the one NaN, clear sign and zero
    // payload, in both parts; a zero constant writes nothing.
    const Z nan(QuietNaN<T>(), QuietNaN<T>());
    for (const Z v : {Z(-T(0), 0), Z(0, -T(0)), Z(inf, inf), Z(QuietNaN<T>(99), 1), Z(1, -QuietNaN<T>(5))})
        EXPECT_TRUE(SameBits(nan, div(v, Z(3, -4)))) << v;
    EXPECT_TRUE(SameBits(Z(7, 7), divConstant(Z(1, 1), Z(-T(0), -T(0)))));
}

}  // namespace
