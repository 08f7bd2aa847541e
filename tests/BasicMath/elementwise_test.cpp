// Elementwise functions: the float members call the single-precision runtime
// (a widened call differs in the last bit), and the odd rules of Abs and Flip.

#include <kestaccel/BasicMath.h>

#include <math.h>

#include <algorithm>
#include <cmath>
#include <complex>
#include <limits>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#include "support/TestSupport.h"

#if defined(_WIN64)
extern "C" float __cdecl _hypotf(float x, float y);
#endif

namespace {

namespace ku = kestaccel::utility;
using namespace kestaccel_test;

// Gaps that stay gaps; each probe first sees the member that does exist.
KESTACCEL_PROBE(HasLnInPlace, ku::Ln_InPlace(0u, Arg<T*>()))
KESTACCEL_PROBE(HasPowPrec26, ku::Pow_Prec26(0u, Arg<const T*>(), Arg<const T*>(), Arg<T*>()))
KESTACCEL_PROBE(HasInversePrec26, ku::Inverse_Prec26(0u, Arg<const T*>(), Arg<T*>()))
KESTACCEL_PROBE(HasLnPrec11, ku::Ln_Prec11(0u, Arg<const T*>(), Arg<T*>()))
KESTACCEL_PROBE(HasCartToPolar, ku::CartToPolar(0u, Arg<const T*>(), Arg<T*>(), Arg<T*>()))
KESTACCEL_PROBE(HasPolarToCart, ku::PolarToCart(0u, Arg<const T*>(), Arg<const T*>(), Arg<T*>()))
// T is a pair of argument types: no Magnitude of an interleaved real buffer,
// and the complex threshold is a real scalar.
KESTACCEL_PROBE(HasMagnitudeOf, ku::Magnitude(0u, Arg<const typename T::first_type*>(), Arg<typename T::second_type*>()))
KESTACCEL_PROBE(HasInvertThreshold,
                ku::Invert_Threshold_InPlace(0u, Arg<typename T::first_type*>(), Arg<typename T::second_type>()))
using CF = std::complex<float>;
static_assert(kGap<HasLnInPlace, float, double> && kGap<HasLnPrec11, float, double>, "float only");
static_assert(kGap<HasPowPrec26, double, float> && kGap<HasInversePrec26, double, float>, "double only");
static_assert(kGap<HasCartToPolar, float, double> && kGap<HasPolarToCart, float, double>, "float only");
static_assert(kGap<HasMagnitudeOf, std::pair<CF, float>, std::pair<float, float>> &&
                  kGap<HasMagnitudeOf, std::pair<std::complex<double>, double>, std::pair<double, double>>,
              "no Magnitude of an interleaved real buffer");
static_assert(kGap<HasInvertThreshold, std::pair<CF, float>, std::pair<CF, CF>>, "the complex threshold is real");

// The runtime in each precision, called from the test itself.
template <class T>
struct Runtime {
    static constexpr bool kFloat = std::is_same<T, float>::value;
    static T Exp(T x) { if constexpr (kFloat) return ::expf(x); else return ::exp(x); }
    static T Log(T x) { if constexpr (kFloat) return ::logf(x); else return ::log(x); }
    static T Pow(T x, T y) { if constexpr (kFloat) return ::powf(x, y); else return ::pow(x, y); }
    static T Sqrt(T x) { if constexpr (kFloat) return ::sqrtf(x); else return ::sqrt(x); }
    static T Round(T x) { if constexpr (kFloat) return ::roundf(x); else return ::round(x); }
#if defined(_WIN32)
    static T Hypot(T x, T y) { if constexpr (kFloat) return ::_hypotf(x, y); else return ::hypot(x, y); }
#else
    static T Hypot(T x, T y) { if constexpr (kFloat) return ::hypotf(x, y); else return ::hypot(x, y); }
#endif
};

// What Abs_InPlace does: the sign bit cleared, whatever the value.
template <class T>
T ClearSign(T x)
{
    return FromBits<T>(Bits(x) & ~(BitsType<T>(1) << (8 * sizeof(T) - 1)));
}

// Random values with the specials every function must pass through.
template <class T>
std::vector<T> WithSpecials(std::vector<T> values)
{
    const T inf = std::numeric_limits<T>::infinity();
    const T specials[] = {T(0), -T(0), inf, -inf, std::numeric_limits<T>::quiet_NaN(), -QuietNaN<T>(0x123),
                          std::numeric_limits<T>::denorm_min(), T(-1), T(1), T(0.5), T(-2.5)};
    for (std::size_t k = 0; k < sizeof specials / sizeof specials[0] && k < values.size(); ++k)
        values[(k * 37) % values.size()] = specials[k];
    return values;
}

template <class T>
class Elementwise : public ::testing::Test {};
TYPED_TEST_SUITE(Elementwise, FloatingTypes);

constexpr unsigned int kRuntimeSamples = 16000;

// A member of the library as a callable whose element type picks the overload.
#define MEMBER(f) [](auto... a) -> decltype(ku::f(a...)) { ku::f(a...); }

// The members that call the runtime: the float ones must give the bits of the
// float function, not of a widened call, which the finite results tell apart.
TYPED_TEST(Elementwise, RuntimeFunctionsOfTheirPrecision)
{
    using T = TypeParam;
    using R = Runtime<T>;
    const std::uint32_t seed = 1100;
    SCOPED_TRACE(SeedTrace(seed));
    const auto exponents = WithSpecials(RandomReals<T>(kRuntimeSamples, seed, T(-87), T(88)));
    ExpectMatches(exponents, R::Exp, MEMBER(Exp));
    ExpectMatches(exponents, R::Exp, MEMBER(Exp_InPlace));
    ExpectMatches(exponents, R::Round, MEMBER(Round));

    // Logarithms over many decades, and the negative numbers that give NaN.
    auto logs = RandomReals<T>(kRuntimeSamples, seed + 1, T(-30), T(30));
    for (std::size_t i = 0; i < logs.size(); ++i) logs[i] = (i % 17 == 3 ? T(-1) : T(1)) * std::pow(T(10), logs[i]);
    logs = WithSpecials(logs);
    ExpectMatches(logs, R::Log, MEMBER(Ln));
    if constexpr (std::is_same<T, float>::value) {  // every Ln name gives the bits of logf
        ExpectMatches(logs, R::Log, MEMBER(Ln_Prec11));
        ExpectMatches(logs, R::Log, MEMBER(Ln_Prec21));
        ExpectMatches(logs, R::Log, MEMBER(Ln_Prec24));
        ExpectMatches(logs, R::Log, MEMBER(Ln_InPlace));
    }

    // Pow takes the first vector as the base; a negative base with an
    // integral exponent has a real power.
    auto base = WithSpecials(RandomReals<T>(kRuntimeSamples, seed + 2, T(0), T(50)));
    auto exponent = RandomReals<T>(kRuntimeSamples, seed + 3, T(-12), T(12));
    for (std::size_t i = 0; i < base.size(); i += 13) base[i] = -base[i], exponent[i] = std::round(exponent[i]);
    const auto power = [&](T x, std::size_t i) { return R::Pow(x, exponent[i]); };
    ExpectMatches(base, power, [&](unsigned int n, const T* a, T* d) { ku::Pow(n, a, exponent.data(), d); });
    if constexpr (std::is_same<T, double>::value)
        ExpectMatches(base, power, [&](unsigned int n, const T* a, T* d) { ku::Pow_Prec26(n, a, exponent.data(), d); });
}

// The plain passes over every size, against the definition written here.
TYPED_TEST(Elementwise, PlainPassesOverEverySize)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    std::uint32_t seed = 1300;
    for (unsigned int n : InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto in = WithSpecials(RandomReals<T>(n, seed++, T(-1e3), T(1e3)));
        const auto square = [](T x) { return x * x; };
        const auto inverse = [](T x) { return T(1) / x; };
        ExpectMatches(in, square, MEMBER(Sqr));
        ExpectMatches(in, square, MEMBER(Sqr_InPlace));
        ExpectMatches(in, Runtime<T>::Sqrt, MEMBER(Sqrt));
        ExpectMatches(in, Runtime<T>::Sqrt, MEMBER(Sqrt_InPlace));
        ExpectMatches(in, inverse, MEMBER(Inverse));
        if constexpr (std::is_same<T, double>::value) ExpectMatches(in, inverse, MEMBER(Inverse_Prec26));
        // Abs tests 0 > x; Abs_InPlace clears the sign bit unconditionally.
        ExpectMatches(in, [](T x) { return T(0) > x ? -x : x; }, MEMBER(Abs));
        ExpectMatches(in, ClearSign<T>, MEMBER(Abs_InPlace));
        // Subtract and round, then divide: offset and divisor in that order.
        ExpectMatches(in, [](T x) { return (x - T(0.3)) / T(-1.7); },
                      [](unsigned int k, const T* s, T* d) { ku::Normalize(k, s, d, T(0.3), T(-1.7)); });

        // The hypotenuse of the runtime, split and joined, where the sum of
        // squares of the power spectrum overflows.
        auto z = RandomComplex<T>(n, seed++, T(-1e3), T(1e3));
        z[n / 2] = {sizeof(T) == 4 ? T(3e19) : T(3e154), 0};
        std::vector<T> re(n), im(n);
        for (std::size_t i = 0; i < n; ++i) re[i] = z[i].real(), im[i] = z[i].imag();
        ExpectMatches(re, [&](T x, std::size_t i) { return Runtime<T>::Hypot(x, im[i]); },
                      [&](unsigned int k, const T* s, T* d) { ku::Magnitude(k, s, im.data(), d); });
        ExpectMatches(z, [](Z v) { return Runtime<T>::Hypot(v.real(), v.imag()); }, MEMBER(Magnitude));
        ExpectMatches(z, [](Z v) { return v.real() * v.real() + v.imag() * v.imag(); }, MEMBER(PowerSpectr));
        // Over its own source, value i lands on a component already read.
        ku::PowerSpectr(n, z.data(), reinterpret_cast<T*>(z.data()));
        for (std::size_t j = 0; j < 2 * n; ++j) {
            const T expected = j < n ? re[j] * re[j] + im[j] * im[j] : (j % 2 ? im[j / 2] : re[j / 2]);
            ASSERT_TRUE(SameBits(expected, reinterpret_cast<const T*>(z.data())[j])) << "PowerSpectr over its source at " << j;
        }

        // Flip_InPlace reverses; Flip is a forward copy, so one element ahead
        // of its source it reads back what it wrote.
        ExpectMatches(in, [&in](T, std::size_t i) { return in[in.size() - 1 - i]; }, MEMBER(Flip_InPlace));
        GuardedBuffer<T> dst(n), none(0);
        ku::Flip(n, in.data(), dst.data());
        ku::Flip(0, in.data(), none.data());
        EXPECT_TRUE(SameBitsArray(std::vector<T>(in.rbegin(), in.rend()), dst.values()) && dst.Intact() && none.Intact());
        std::vector<T> ahead = in;
        ahead.push_back(T(0.75));
        auto aheadExpected = ahead;
        for (std::size_t i = 0; i < n; ++i) aheadExpected[1 + i] = aheadExpected[n - 1 - i];
        ku::Flip(n, ahead.data(), ahead.data() + 1);
        EXPECT_TRUE(SameBitsArray(aheadExpected, ahead)) << "Flip one element ahead";
    }
}

TYPED_TEST(Elementwise, HandWorkedValues)
{
    using T = TypeParam;
    const T two = 2, ten = 10, five = 5;
    T out = 0;
    ku::Pow(1, &two, &ten, &out);
    EXPECT_TRUE(SameBits(T(1024), out)) << "the first vector is the base";
    ku::Normalize(1, &five, &out, T(0), T(0));
    EXPECT_TRUE(SameBits(std::numeric_limits<T>::infinity(), out)) << "no zero test on the divisor";

    // The ties of round: away from zero, and -0.4 keeps its sign.
    const std::vector<T> ties = {T(1.5), T(2.5), T(-1.5), T(-2.5), T(0.5), T(-0.4)};
    std::vector<T> rounded(ties.size());
    ku::Round(static_cast<unsigned int>(ties.size()), ties.data(), rounded.data());
    EXPECT_TRUE(SameBitsArray(std::vector<T>{T(2), T(3), T(-2), T(-3), T(1), -T(0)}, rounded));

    // The two sign rules part on -0 and on a NaN with its sign bit set.
    const T negativeNaN = -QuietNaN<T>(0x123);
    const std::vector<T> odd = {-T(0), negativeNaN, T(-3)};
    std::vector<T> abs(3), absInPlace = odd;
    ku::Abs(3, odd.data(), abs.data());
    ku::Abs_InPlace(3, absInPlace.data());
    EXPECT_TRUE(SameBitsArray(std::vector<T>{-T(0), negativeNaN, T(3)}, abs));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{T(0), ClearSign(negativeNaN), T(3)}, absInPlace));

    // Flip onto its own source ends as a palindrome of its last half.
    std::vector<T> four = {1, 2, 3, 4};
    ku::Flip(4, four.data(), four.data());
    EXPECT_TRUE(SameBitsArray(std::vector<T>{4, 3, 3, 4}, four));
}

// CartToPolar: sqrtf of squares summed in float (3e19 overflows), atan2f;
// PolarToCart: cosf and sinf times the magnitude.
TEST(ElementwiseFloat, PolarConversionsUseTheFloatRuntime)
{
    const std::uint32_t seed = 1900;
    SCOPED_TRACE(SeedTrace(seed));
    const unsigned int n = kRuntimeSamples;
    auto src = WithSpecials(RandomReals<float>(2 * n, seed, -50.0f, 50.0f));
    src[100] = 3e19f;
    const auto radius = RandomReals<float>(n, seed + 1, 0.0f, 100.0f);
    const auto angle = WithSpecials(RandomReals<float>(n, seed + 2, -1e4f, 1e4f));
    GuardedBuffer<float> magnitude(n), phase(n), cart(2 * n), none(0);
    ku::CartToPolar(n, src.data(), magnitude.data(), phase.data());
    ku::PolarToCart(n, radius.data(), angle.data(), cart.data());
    ku::CartToPolar(0, src.data(), none.data(), none.data());
    ku::PolarToCart(0, radius.data(), angle.data(), none.data());
    for (unsigned int i = 0; i < n; ++i) {
        const float re = src[2 * i], im = src[2 * i + 1];
        ASSERT_TRUE(SameBits(::sqrtf(re * re + im * im), magnitude[i])) << "index " << i;
        ASSERT_TRUE(SameBits(::atan2f(im, re), phase[i])) << "index " << i;
        ASSERT_TRUE(SameBits(::cosf(angle[i]) * radius[i], cart[2 * i])) << "index " << i;
        ASSERT_TRUE(SameBits(::sinf(angle[i]) * radius[i], cart[2 * i + 1])) << "index " << i;
    }
    EXPECT_TRUE(magnitude.Intact() && phase.Intact() && cart.Intact() && none.Intact());
    EXPECT_TRUE(SameBits(std::numeric_limits<float>::infinity(), magnitude[50]));
}

// Both thresholds written out. The real one tests the size of x, but at or
// below epsilon x itself; the complex one the squared size, in double.
template <class T>
T InvertedWithThreshold(T x, T threshold)
{
    const T eps = std::numeric_limits<T>::epsilon();
    if (T(0) >= threshold) return x;
    if (threshold <= eps) return x <= eps ? std::numeric_limits<T>::infinity() : T(1) / x;
    const T s = std::fabs(x);
    if (s >= threshold) return T(1) / x;
    if (s <= eps || s - x <= eps) return T(1) / threshold;
    return T(-1) / threshold;
}

template <class T>
std::complex<T> InvertedWithThreshold(std::complex<T> z, T threshold)
{
    const T re = z.real(), im = z.imag(), p = im * im + re * re;
    if (T(0) >= threshold) return z;
    if (static_cast<double>(p) <= static_cast<double>(std::numeric_limits<T>::epsilon())) return {T(1) / threshold, T(0)};
    const T m = threshold * threshold > p ? std::sqrt(p) * threshold : p;
    return {re / m, -im / m};
}

// By hand: a tiny threshold sends negatives to +infinity, a NaN threshold
// passes the early test (its NaN's sign is not fixed), and tiny complex elements.
TYPED_TEST(Elementwise, InvertThreshold)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    const T inf = std::numeric_limits<T>::infinity(), eps = std::numeric_limits<T>::epsilon();
    std::vector<T> tiny = {-3, 0, 2};
    ku::Invert_Threshold_InPlace(3, tiny.data(), T(1e-20));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{inf, inf, T(0.5)}, tiny));
    std::vector<Z> zs = {{T(0.25), 0}, {0, 0}, {-T(1e-30), -T(1e-30)}};
    ku::Invert_Threshold_InPlace(3, zs.data(), T(0.5));
    EXPECT_TRUE(SameBitsArray(std::vector<Z>{{2, -T(0)}, {2, T(0)}, {2, T(0)}}, zs));
    std::vector<T> unlimited = {2, T(0.25), T(-0.25), 0, -2};
    std::vector<Z> zUnlimited = {{2, 0}, {0, 0}};
    ku::Invert_Threshold_InPlace(5, unlimited.data(), QuietNaN<T>());
    ku::Invert_Threshold_InPlace(2, zUnlimited.data(), QuietNaN<T>());
    for (const T x : unlimited) EXPECT_TRUE(std::isnan(x));
    EXPECT_TRUE(SameBits(Z(T(0.5), -T(0)), zUnlimited[0]));
    EXPECT_TRUE(std::isnan(zUnlimited[1].real()) && SameBits(T(0), zUnlimited[1].imag()));

    std::uint32_t seed = 2000;
    for (const T threshold : {T(0.75), T(3), eps, eps / 4, T(2) * eps, T(0.6), T(1e-3), T(7), T(0), -T(0), T(-1)}) {
        for (unsigned int n : InterestingSizes()) {
            SCOPED_TRACE(::testing::Message() << "threshold " << threshold << " size " << n << " " << SeedTrace(seed));
            auto in = WithSpecials(RandomReals<T>(n, seed++, T(-4), T(4)));
            for (std::size_t i = 0; i < n; i += 7) in[i] *= (i % 2 ? eps : T(1e-3));
            auto zIn = RandomComplex<T>(n, seed++, T(-2), T(2));
            for (std::size_t i = 0; i < n; i += 5) zIn[i] *= T(1e-4);
            const auto run = [threshold](unsigned int k, auto* io) { ku::Invert_Threshold_InPlace(k, io, threshold); };
            ExpectMatches(in, [threshold](T x) { return InvertedWithThreshold(x, threshold); }, run);
            ExpectMatches(zIn, [threshold](Z z) { return InvertedWithThreshold(z, threshold); }, run);
        }
    }
}

}  // namespace
