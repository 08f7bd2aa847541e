// Elementwise functions: each float member against the single-precision
// runtime function called here (a widened double call differs in the last
// bit on some of these inputs), the two sign rules of Abs and Abs_InPlace,
// Flip against Flip_InPlace, the overflow of CartToPolar against Magnitude,
// Normalize without a zero test, and both inverted thresholds.

#include <kestaccel/BasicMath.h>

#include <math.h>

#include <cmath>
#include <complex>
#include <cstring>
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
using kestaccel_test::Bits;
using kestaccel_test::FromBits;
using kestaccel_test::GuardedBuffer;
using kestaccel_test::RandomComplex;
using kestaccel_test::RandomReals;
using kestaccel_test::SameBits;
using kestaccel_test::SameBitsArray;
using kestaccel_test::SeedTrace;

// Gaps that stay gaps. Each detector is first shown to see the member that
// does exist, so that a false answer means something.
template <class T, class = void>
struct HasLnInPlace : std::false_type {};
template <class T>
struct HasLnInPlace<T, std::void_t<decltype(ku::Ln_InPlace(0u, std::declval<T*>()))>> : std::true_type {};
template <class T, class = void>
struct HasPowPrec26 : std::false_type {};
template <class T>
struct HasPowPrec26<T, std::void_t<decltype(ku::Pow_Prec26(0u, std::declval<const T*>(), std::declval<const T*>(),
                                                           std::declval<T*>()))>> : std::true_type {};
template <class T, class = void>
struct HasInversePrec26 : std::false_type {};
template <class T>
struct HasInversePrec26<T, std::void_t<decltype(ku::Inverse_Prec26(0u, std::declval<const T*>(), std::declval<T*>()))>>
    : std::true_type {};
template <class T, class = void>
struct HasLnPrec11 : std::false_type {};
template <class T>
struct HasLnPrec11<T, std::void_t<decltype(ku::Ln_Prec11(0u, std::declval<const T*>(), std::declval<T*>()))>>
    : std::true_type {};
template <class T, class = void>
struct HasCartToPolar : std::false_type {};
template <class T>
struct HasCartToPolar<T, std::void_t<decltype(ku::CartToPolar(0u, std::declval<const T*>(), std::declval<T*>(),
                                                              std::declval<T*>()))>> : std::true_type {};
template <class T, class = void>
struct HasPolarToCart : std::false_type {};
template <class T>
struct HasPolarToCart<T, std::void_t<decltype(ku::PolarToCart(0u, std::declval<const T*>(), std::declval<const T*>(),
                                                              std::declval<T*>()))>> : std::true_type {};
// Magnitude of a complex vector exists; of an interleaved real buffer it does not.
template <class S, class D, class = void>
struct HasMagnitudeOf : std::false_type {};
template <class S, class D>
struct HasMagnitudeOf<S, D, std::void_t<decltype(ku::Magnitude(0u, std::declval<const S*>(), std::declval<D*>()))>>
    : std::true_type {};
// The complex threshold is a real scalar.
template <class Z, class K, class = void>
struct HasInvertThreshold : std::false_type {};
template <class Z, class K>
struct HasInvertThreshold<Z, K, std::void_t<decltype(ku::Invert_Threshold_InPlace(0u, std::declval<Z*>(), std::declval<K>()))>>
    : std::true_type {};

static_assert(HasLnInPlace<float>::value && !HasLnInPlace<double>::value, "Ln_InPlace is float only");
static_assert(HasPowPrec26<double>::value && !HasPowPrec26<float>::value, "Pow_Prec26 is double only");
static_assert(HasInversePrec26<double>::value && !HasInversePrec26<float>::value, "Inverse_Prec26 is double only");
static_assert(HasLnPrec11<float>::value && !HasLnPrec11<double>::value, "Ln_Prec11 is float only");
static_assert(HasCartToPolar<float>::value && !HasCartToPolar<double>::value, "CartToPolar is float only");
static_assert(HasPolarToCart<float>::value && !HasPolarToCart<double>::value, "PolarToCart is float only");
static_assert(HasMagnitudeOf<std::complex<float>, float>::value && !HasMagnitudeOf<float, float>::value,
              "no Magnitude of an interleaved real buffer");
static_assert(HasMagnitudeOf<std::complex<double>, double>::value && !HasMagnitudeOf<double, double>::value,
              "no Magnitude of an interleaved real buffer");
static_assert(HasInvertThreshold<std::complex<float>, float>::value &&
                  !HasInvertThreshold<std::complex<float>, std::complex<float>>::value,
              "the complex threshold is real");

// The runtime in each precision, called from the test itself.
template <class T>
struct Runtime;
template <>
struct Runtime<float> {
    static float Exp(float x) { return ::expf(x); }
    static float Log(float x) { return ::logf(x); }
    static float Pow(float x, float y) { return ::powf(x, y); }
    static float Sqrt(float x) { return ::sqrtf(x); }
    static float Round(float x) { return ::roundf(x); }
#if defined(_WIN32)
    static float Hypot(float x, float y) { return ::_hypotf(x, y); }
#else
    static float Hypot(float x, float y) { return ::hypotf(x, y); }
#endif
};
template <>
struct Runtime<double> {
    static double Exp(double x) { return ::exp(x); }
    static double Log(double x) { return ::log(x); }
    static double Pow(double x, double y) { return ::pow(x, y); }
    static double Sqrt(double x) { return ::sqrt(x); }
    static double Round(double x) { return ::round(x); }
    static double Hypot(double x, double y) { return ::hypot(x, y); }
};

template <class T>
T NegativeNaN()
{
    using B = kestaccel_test::BitsType<T>;
    return FromBits<T>(sizeof(T) == 4 ? B(0xFFC00123u) : B(0xFFF8000000000123ull));
}

// Random values with the specials every function must pass through.
template <class T>
std::vector<T> WithSpecials(std::vector<T> values)
{
    const T inf = std::numeric_limits<T>::infinity();
    const T specials[] = {T(0), -T(0), inf, -inf, std::numeric_limits<T>::quiet_NaN(), NegativeNaN<T>(),
                          std::numeric_limits<T>::denorm_min(), T(-1), T(1), T(0.5), T(-2.5)};
    for (std::size_t k = 0; k < sizeof specials / sizeof specials[0] && k < values.size(); ++k)
        values[(k * 37) % values.size()] = specials[k];
    return values;
}

template <class T>
class Elementwise : public ::testing::Test {};
using FloatingTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(Elementwise, FloatingTypes);

constexpr unsigned int kRuntimeSamples = 4000;

// out[i] against f(in[i]) for a member of shape (count, src, dst).
template <class T, class Member, class Reference>
void ExpectUnaryMatches(Member member, Reference reference, const std::vector<T>& in)
{
    const auto n = static_cast<unsigned int>(in.size());
    std::vector<T> expected(n);
    for (std::size_t i = 0; i < n; ++i) expected[i] = reference(in[i]);
    GuardedBuffer<T> dst(n);
    member(n, in.data(), dst.data());
    EXPECT_TRUE(SameBitsArray(expected.data(), dst.data(), n));
    EXPECT_TRUE(dst.Intact());
}

// The in-place form of the same function.
template <class T, class Member, class Reference>
void ExpectInPlaceMatches(Member member, Reference reference, const std::vector<T>& in)
{
    const auto n = static_cast<unsigned int>(in.size());
    std::vector<T> expected(n);
    for (std::size_t i = 0; i < n; ++i) expected[i] = reference(in[i]);
    GuardedBuffer<T> srcDst(n);
    for (std::size_t i = 0; i < n; ++i) srcDst[i] = in[i];
    member(n, srcDst.data());
    EXPECT_TRUE(SameBitsArray(expected.data(), srcDst.data(), n));
    EXPECT_TRUE(srcDst.Intact());
}

TYPED_TEST(Elementwise, ExpAndLnAreTheRuntimeFunctionsOfTheirPrecision)
{
    using T = TypeParam;
    using R = Runtime<T>;
    const std::uint32_t seed = 1100;
    SCOPED_TRACE(SeedTrace(seed));
    const auto exponents = WithSpecials(RandomReals<T>(kRuntimeSamples, seed, T(-100), T(100)));
    ExpectUnaryMatches<T>([](unsigned int n, const T* s, T* d) { ku::Exp(n, s, d); }, R::Exp, exponents);
    ExpectInPlaceMatches<T>([](unsigned int n, T* io) { ku::Exp_InPlace(n, io); }, R::Exp, exponents);

    // Logarithms over many decades, and the negative numbers that give NaN.
    auto logs = RandomReals<T>(kRuntimeSamples, seed + 1, T(-30), T(30));
    for (std::size_t i = 0; i < logs.size(); ++i) logs[i] = (i % 17 == 3 ? T(-1) : T(1)) * std::pow(T(10), logs[i]);
    logs = WithSpecials(logs);
    ExpectUnaryMatches<T>([](unsigned int n, const T* s, T* d) { ku::Ln(n, s, d); }, R::Log, logs);
}

TEST(ElementwiseFloat, EveryLnNameGivesTheBitsOfLogf)
{
    const std::uint32_t seed = 1150;
    SCOPED_TRACE(SeedTrace(seed));
    auto in = RandomReals<float>(kRuntimeSamples, seed, 1e-6f, 1e6f);
    in = WithSpecials(in);
    const auto logf = Runtime<float>::Log;
    ExpectUnaryMatches<float>([](unsigned int n, const float* s, float* d) { ku::Ln_Prec11(n, s, d); }, logf, in);
    ExpectUnaryMatches<float>([](unsigned int n, const float* s, float* d) { ku::Ln_Prec21(n, s, d); }, logf, in);
    ExpectUnaryMatches<float>([](unsigned int n, const float* s, float* d) { ku::Ln_Prec24(n, s, d); }, logf, in);
    ExpectInPlaceMatches<float>([](unsigned int n, float* io) { ku::Ln_InPlace(n, io); }, logf, in);
}

TYPED_TEST(Elementwise, PowTakesTheFirstVectorAsTheBase)
{
    using T = TypeParam;
    const T two = 2, ten = 10;
    T out = 0;
    ku::Pow(1, &two, &ten, &out);
    EXPECT_TRUE(SameBits(T(1024), out));

    const std::uint32_t seed = 1200;
    SCOPED_TRACE(SeedTrace(seed));
    auto base = WithSpecials(RandomReals<T>(kRuntimeSamples, seed, T(0), T(50)));
    auto exponent = RandomReals<T>(kRuntimeSamples, seed + 1, T(-12), T(12));
    for (std::size_t i = 0; i < base.size(); i += 13) {
        base[i] = -base[i];                  // a negative base with an integral
        exponent[i] = std::round(exponent[i]);  // exponent has a real power
    }
    std::vector<T> expected(base.size());
    for (std::size_t i = 0; i < base.size(); ++i) expected[i] = Runtime<T>::Pow(base[i], exponent[i]);
    GuardedBuffer<T> dst(base.size());
    ku::Pow(static_cast<unsigned int>(base.size()), base.data(), exponent.data(), dst.data());
    EXPECT_TRUE(SameBitsArray(expected.data(), dst.data(), base.size()));
    EXPECT_TRUE(dst.Intact());
    if (std::is_same<T, double>::value) {
        std::vector<double> prec(base.size());
        ku::Pow_Prec26(static_cast<unsigned int>(base.size()), reinterpret_cast<const double*>(base.data()),
                       reinterpret_cast<const double*>(exponent.data()), prec.data());
        EXPECT_TRUE(SameBitsArray(reinterpret_cast<const double*>(expected.data()), prec.data(), prec.size()));
    }
}

TYPED_TEST(Elementwise, SqrtRoundAndSqrFollowTheirDefinitions)
{
    using T = TypeParam;
    using R = Runtime<T>;
    std::uint32_t seed = 1300;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto in = WithSpecials(RandomReals<T>(n, seed++, T(-1e4), T(1e4)));
        ExpectUnaryMatches<T>([](unsigned int k, const T* s, T* d) { ku::Sqrt(k, s, d); }, R::Sqrt, in);
        ExpectInPlaceMatches<T>([](unsigned int k, T* io) { ku::Sqrt_InPlace(k, io); }, R::Sqrt, in);
        ExpectUnaryMatches<T>([](unsigned int k, const T* s, T* d) { ku::Round(k, s, d); }, R::Round, in);
        const auto square = [](T x) { return x * x; };
        ExpectUnaryMatches<T>([](unsigned int k, const T* s, T* d) { ku::Sqr(k, s, d); }, square, in);
        ExpectInPlaceMatches<T>([](unsigned int k, T* io) { ku::Sqr_InPlace(k, io); }, square, in);
    }
    // The ties of round: away from zero, and -0.4 keeps its sign.
    const std::vector<T> ties = {T(1.5), T(2.5), T(-1.5), T(-2.5), T(0.5), T(-0.4)};
    std::vector<T> rounded(ties.size());
    ku::Round(static_cast<unsigned int>(ties.size()), ties.data(), rounded.data());
    EXPECT_TRUE(SameBitsArray(std::vector<T>{T(2), T(3), T(-2), T(-3), T(1), -T(0)}, rounded));
    // The root of -0 is -0.
    const T negativeZero = -T(0);
    T root = 1;
    ku::Sqrt(1, &negativeZero, &root);
    EXPECT_TRUE(SameBits(-T(0), root));
}

TYPED_TEST(Elementwise, InverseIsOneTrueDivision)
{
    using T = TypeParam;
    std::uint32_t seed = 1400;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto in = WithSpecials(RandomReals<T>(n, seed++, T(-1e3), T(1e3)));
        const auto inverse = [](T x) { return T(1) / x; };
        ExpectUnaryMatches<T>([](unsigned int k, const T* s, T* d) { ku::Inverse(k, s, d); }, inverse, in);
        if (std::is_same<T, double>::value) {
            ExpectUnaryMatches<T>(
                [](unsigned int k, const T* s, T* d) {
                    ku::Inverse_Prec26(k, reinterpret_cast<const double*>(s), reinterpret_cast<double*>(d));
                },
                inverse, in);
        }
    }
    const T zeros[] = {T(0), -T(0)};
    T out[2];
    ku::Inverse(2, zeros, out);
    EXPECT_TRUE(SameBits(std::numeric_limits<T>::infinity(), out[0]));
    EXPECT_TRUE(SameBits(-std::numeric_limits<T>::infinity(), out[1]));
}

TYPED_TEST(Elementwise, AbsAndAbsInPlaceKeepTheirOwnSignRules)
{
    using T = TypeParam;
    using B = kestaccel_test::BitsType<T>;
    const B signBit = B(1) << (8 * sizeof(T) - 1);
    std::uint32_t seed = 1500;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto in = WithSpecials(RandomReals<T>(n, seed++, T(-5), T(5)));
        ExpectUnaryMatches<T>([](unsigned int k, const T* s, T* d) { ku::Abs(k, s, d); },
                              [](T x) { return T(0) > x ? -x : x; }, in);
        ExpectInPlaceMatches<T>([](unsigned int k, T* io) { ku::Abs_InPlace(k, io); },
                                [signBit](T x) { return FromBits<T>(Bits(x) & ~signBit); }, in);
    }
    // The two rules part on -0 and on a NaN with its sign bit set.
    const std::vector<T> odd = {-T(0), NegativeNaN<T>(), T(-3)};
    std::vector<T> abs(odd.size()), absInPlace = odd;
    ku::Abs(3, odd.data(), abs.data());
    ku::Abs_InPlace(3, absInPlace.data());
    EXPECT_TRUE(SameBits(-T(0), abs[0]));
    EXPECT_TRUE(SameBits(NegativeNaN<T>(), abs[1]));
    EXPECT_TRUE(SameBits(T(3), abs[2]));
    EXPECT_TRUE(SameBits(T(0), absInPlace[0]));
    EXPECT_TRUE(SameBits(FromBits<T>(Bits(NegativeNaN<T>()) & ~signBit), absInPlace[1]));
    EXPECT_TRUE(SameBits(T(3), absInPlace[2]));
}

TYPED_TEST(Elementwise, FlipCopiesForwardAndFlipInPlaceSwaps)
{
    using T = TypeParam;
    std::uint32_t seed = 1600;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto in = RandomReals<T>(n, seed++);
        const std::vector<T> reversed(in.rbegin(), in.rend());
        GuardedBuffer<T> dst(n);
        ku::Flip(n, in.data(), dst.data());
        EXPECT_TRUE(SameBitsArray(reversed.data(), dst.data(), n));
        EXPECT_TRUE(dst.Intact());
        GuardedBuffer<T> srcDst(n);
        for (std::size_t i = 0; i < n; ++i) srcDst[i] = in[i];
        ku::Flip_InPlace(n, srcDst.data());
        EXPECT_TRUE(SameBitsArray(reversed.data(), srcDst.data(), n));
        EXPECT_TRUE(srcDst.Intact());

        // Flip onto its own source: the second half reads the first half's
        // output, as the forward loop does.
        std::vector<T> expected = in;
        for (std::size_t i = 0; i < n; ++i) expected[i] = expected[n - 1 - i];
        std::vector<T> self = in;
        ku::Flip(n, self.data(), self.data());
        EXPECT_TRUE(SameBitsArray(expected, self));
    }
    std::vector<T> four = {1, 2, 3, 4};
    ku::Flip(4, four.data(), four.data());
    EXPECT_TRUE(SameBitsArray(std::vector<T>{4, 3, 3, 4}, four));
    std::vector<T> three = {1, 2, 3}, two = {1, 2}, one = {7};
    ku::Flip_InPlace(3, three.data());
    ku::Flip_InPlace(2, two.data());
    ku::Flip_InPlace(1, one.data());
    EXPECT_TRUE(SameBitsArray(std::vector<T>{3, 2, 1}, three));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{2, 1}, two));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{7}, one));
}

// A destination that overlaps its source, one element ahead or behind, sees
// exactly what the plain ascending loop sees: the vectorised kernels must
// fall back where the overlap would change a value.
TYPED_TEST(Elementwise, OverlappingBuffersFollowTheAscendingLoop)
{
    using T = TypeParam;
    using Unary = void (*)(unsigned int, const T*, T*);
    struct Case {
        const char* name;
        Unary run;
        T (*expected)(T);
    };
    const Case cases[] = {
        {"Sqr", [](unsigned int n, const T* s, T* d) { ku::Sqr(n, s, d); }, [](T x) { return x * x; }},
        {"Inverse", [](unsigned int n, const T* s, T* d) { ku::Inverse(n, s, d); }, [](T x) { return T(1) / x; }},
        {"Abs", [](unsigned int n, const T* s, T* d) { ku::Abs(n, s, d); }, [](T x) { return T(0) > x ? -x : x; }},
        {"Normalize", [](unsigned int n, const T* s, T* d) { ku::Normalize(n, s, d, T(0.25), T(3)); },
         [](T x) { return (x - T(0.25)) / T(3); }},
    };
    std::uint32_t seed = 1750;
    for (const auto& c : cases) {
        for (unsigned int n : {5u, 33u, 1023u}) {
            for (const int shift : {1, -1}) {
                SCOPED_TRACE(std::string(c.name) + " size " + std::to_string(n) + " shift " + std::to_string(shift) +
                             " " + SeedTrace(seed));
                auto buffer = RandomReals<T>(n + 1, seed++, T(-2), T(2));
                auto expected = buffer;
                const std::size_t from = shift > 0 ? 0 : 1, to = shift > 0 ? 1 : 0;
                for (std::size_t i = 0; i < n; ++i) expected[to + i] = c.expected(expected[from + i]);
                c.run(n, buffer.data() + from, buffer.data() + to);
                EXPECT_TRUE(SameBitsArray(expected, buffer));
            }
        }
    }

    // Flip one element ahead of its source reads back what it wrote.
    for (unsigned int n : {6u, 101u}) {
        auto buffer = RandomReals<T>(n + 1, seed++);
        auto expected = buffer;
        for (std::size_t i = 0; i < n; ++i) expected[1 + i] = expected[n - 1 - i];
        ku::Flip(n, buffer.data(), buffer.data() + 1);
        EXPECT_TRUE(SameBitsArray(expected, buffer)) << "size " << n;
    }

    // The power spectrum written over its own complex source: value i lands
    // on a component already read.
    for (unsigned int n : {7u, 64u, 1023u}) {
        auto z = RandomComplex<T>(n, seed++);
        std::vector<T> expected(2 * n);
        std::memcpy(expected.data(), z.data(), sizeof(T) * 2 * n);
        for (std::size_t i = 0; i < n; ++i)
            expected[i] = expected[2 * i] * expected[2 * i] + expected[2 * i + 1] * expected[2 * i + 1];
        T* parts = reinterpret_cast<T*>(z.data());
        ku::PowerSpectr(n, z.data(), parts);
        EXPECT_TRUE(SameBitsArray(expected.data(), parts, 2 * n)) << "size " << n;
    }
}

TYPED_TEST(Elementwise, NormalizeSubtractsThenDividesWithoutAZeroTest)
{
    using T = TypeParam;
    std::uint32_t seed = 1700;
    const T offset = T(0.3), divisor = T(-1.7);
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto in = WithSpecials(RandomReals<T>(n, seed++, T(-10), T(10)));
        ExpectUnaryMatches<T>([=](unsigned int k, const T* s, T* d) { ku::Normalize(k, s, d, offset, divisor); },
                              [=](T x) { return (x - offset) / divisor; }, in);
    }
    const T five = 5;
    T out = 0;
    ku::Normalize(1, &five, &out, T(1), T(2));
    EXPECT_TRUE(SameBits(T(2), out));
    ku::Normalize(1, &five, &out, T(0), T(0));
    EXPECT_TRUE(SameBits(std::numeric_limits<T>::infinity(), out));
}

TYPED_TEST(Elementwise, MagnitudeAndPowerSpectrum)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    std::uint32_t seed = 1800;
    for (unsigned int n : kestaccel_test::InterestingSizes()) {
        SCOPED_TRACE("size " + std::to_string(n) + " " + SeedTrace(seed));
        const auto z = RandomComplex<T>(n, seed++, T(-1e3), T(1e3));
        std::vector<T> re(n), im(n), hyp(n), power(n);
        for (std::size_t i = 0; i < n; ++i) {
            re[i] = z[i].real();
            im[i] = z[i].imag();
            hyp[i] = Runtime<T>::Hypot(re[i], im[i]);
            power[i] = re[i] * re[i] + im[i] * im[i];
        }
        GuardedBuffer<T> split(n), joined(n), spectrum(n);
        ku::Magnitude(n, re.data(), im.data(), split.data());
        ku::Magnitude(n, z.data(), joined.data());
        ku::PowerSpectr(n, z.data(), spectrum.data());
        EXPECT_TRUE(SameBitsArray(hyp.data(), split.data(), n));
        EXPECT_TRUE(SameBitsArray(hyp.data(), joined.data(), n));
        EXPECT_TRUE(SameBitsArray(power.data(), spectrum.data(), n));
        EXPECT_TRUE(split.Intact() && joined.Intact() && spectrum.Intact());
    }
    // The hypotenuse does not overflow where the sum of squares does.
    const T big = sizeof(T) == 4 ? T(3e19) : T(3e154);
    const Z large(big, 0);
    T magnitude = 0, power = 0;
    ku::Magnitude(1, &large, &magnitude);
    ku::PowerSpectr(1, &large, &power);
    EXPECT_TRUE(SameBits(big, magnitude));
    EXPECT_TRUE(SameBits(std::numeric_limits<T>::infinity(), power));
}

TEST(ElementwiseFloat, CartToPolarSumsInFloatAndTakesAtan2f)
{
    const std::uint32_t seed = 1900;
    SCOPED_TRACE(SeedTrace(seed));
    const unsigned int n = kRuntimeSamples;
    auto src = WithSpecials(RandomReals<float>(2 * n, seed, -50.0f, 50.0f));
    GuardedBuffer<float> magnitude(n), phase(n);
    ku::CartToPolar(n, src.data(), magnitude.data(), phase.data());
    for (unsigned int i = 0; i < n; ++i) {
        const float re = src[2 * i], im = src[2 * i + 1];
        ASSERT_TRUE(SameBits(::sqrtf(re * re + im * im), magnitude[i])) << "index " << i;
        ASSERT_TRUE(SameBits(::atan2f(im, re), phase[i])) << "index " << i;
    }
    EXPECT_TRUE(magnitude.Intact() && phase.Intact());

    // (0, 1), (-1, 0) and a pair whose squares overflow single precision.
    const float pairs[] = {0.0f, 1.0f, -1.0f, 0.0f, 3e19f, 0.0f};
    float m[3], p[3], hyp = 0;
    ku::CartToPolar(3, pairs, m, p);
    EXPECT_TRUE(SameBits(1.0f, m[0]));
    EXPECT_TRUE(SameBits(static_cast<float>(M_PI / 2), p[0]));
    EXPECT_TRUE(SameBits(1.0f, m[1]));
    EXPECT_TRUE(SameBits(static_cast<float>(M_PI), p[1]));
    EXPECT_TRUE(SameBits(std::numeric_limits<float>::infinity(), m[2]));
    ku::Magnitude(1, &pairs[4], &pairs[5], &hyp);
    EXPECT_TRUE(SameBits(3e19f, hyp));
}

TEST(ElementwiseFloat, PolarToCartMultipliesCosfAndSinfByTheMagnitude)
{
    const std::uint32_t seed = 1950;
    SCOPED_TRACE(SeedTrace(seed));
    const unsigned int n = kRuntimeSamples;
    const auto magnitude = RandomReals<float>(n, seed, 0.0f, 100.0f);
    const auto phase = WithSpecials(RandomReals<float>(n, seed + 1, -1e4f, 1e4f));
    GuardedBuffer<float> dst(2 * n);
    ku::PolarToCart(n, magnitude.data(), phase.data(), dst.data());
    for (unsigned int i = 0; i < n; ++i) {
        ASSERT_TRUE(SameBits(::cosf(phase[i]) * magnitude[i], dst[2 * i])) << "index " << i;
        ASSERT_TRUE(SameBits(::sinf(phase[i]) * magnitude[i], dst[2 * i + 1])) << "index " << i;
    }
    EXPECT_TRUE(dst.Intact());
}

// The real threshold written out from its definition.
template <class T>
T InvertedWithThreshold(T x, T threshold)
{
    const T eps = std::numeric_limits<T>::epsilon();
    if (threshold <= eps) return x <= eps ? std::numeric_limits<T>::infinity() : T(1) / x;
    const T s = std::fabs(x);
    if (s >= threshold) return T(1) / x;
    if (s <= eps || s - x <= eps) return T(1) / threshold;
    return T(-1) / threshold;
}

TYPED_TEST(Elementwise, RealInvertThreshold)
{
    using T = TypeParam;
    const std::vector<T> hand = {2, T(0.25), T(-0.25), 0, -2};
    std::vector<T> out = hand;
    ku::Invert_Threshold_InPlace(5, out.data(), T(0.5));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{T(0.5), 2, -2, 2, T(-0.5)}, out));

    // At or below epsilon the test is on x: negatives go to +infinity.
    const T inf = std::numeric_limits<T>::infinity();
    std::vector<T> tiny = {-3, 0, 2};
    ku::Invert_Threshold_InPlace(3, tiny.data(), T(1e-20));
    EXPECT_TRUE(SameBitsArray(std::vector<T>{inf, inf, T(0.5)}, tiny));

    // A NaN element falls through to -1 / threshold.
    T nan = std::numeric_limits<T>::quiet_NaN();
    ku::Invert_Threshold_InPlace(1, &nan, T(0.5));
    EXPECT_TRUE(SameBits(T(-2), nan));

    for (const T threshold : {T(0), -T(0), T(-1)}) {
        std::vector<T> same = hand;
        ku::Invert_Threshold_InPlace(5, same.data(), threshold);
        EXPECT_TRUE(SameBitsArray(hand, same));
    }

    // A NaN threshold passes the early test; no size reaches it, so every
    // element becomes one of the NaN limits.
    std::vector<T> unlimited = hand;
    ku::Invert_Threshold_InPlace(5, unlimited.data(), std::numeric_limits<T>::quiet_NaN());
    for (const T x : unlimited) EXPECT_TRUE(std::isnan(x));

    std::uint32_t seed = 2000;
    const T eps = std::numeric_limits<T>::epsilon();
    for (const T threshold : {T(0.75), T(3), eps, eps / 4, T(2) * eps}) {
        SCOPED_TRACE(::testing::Message() << "threshold " << threshold << " " << SeedTrace(seed));
        auto in = WithSpecials(RandomReals<T>(1000, seed++, T(-4), T(4)));
        for (std::size_t i = 0; i < in.size(); i += 7) in[i] *= (i % 2 ? eps : T(1e-3));
        ExpectInPlaceMatches<T>([=](unsigned int k, T* io) { ku::Invert_Threshold_InPlace(k, io, threshold); },
                                [=](T x) { return InvertedWithThreshold(x, threshold); }, in);
    }
}

template <class T>
std::complex<T> ComplexInvertedWithThreshold(std::complex<T> z, T threshold)
{
    const T re = z.real(), im = z.imag();
    const T p = im * im + re * re;
    if (static_cast<double>(p) <= static_cast<double>(std::numeric_limits<T>::epsilon())) return {T(1) / threshold, T(0)};
    const T limit = threshold * threshold;
    if (limit > p) {
        const T m = std::sqrt(p) * threshold;
        return {re / m, -im / m};
    }
    return {re / p, -im / p};
}

TYPED_TEST(Elementwise, ComplexInvertThreshold)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    std::vector<Z> hand = {{T(0.25), 0}, {0, 0}, {2, 0}, {-T(1e-30), -T(1e-30)}};
    ku::Invert_Threshold_InPlace(4, hand.data(), T(0.5));
    EXPECT_TRUE(SameBits(Z(2, -T(0)), hand[0]));
    EXPECT_TRUE(SameBits(Z(2, T(0)), hand[1]));
    EXPECT_TRUE(SameBits(Z(T(0.5), -T(0)), hand[2]));
    EXPECT_TRUE(SameBits(Z(2, T(0)), hand[3])) << "a tiny element in any direction gives (top, +0)";

    Z nan(std::numeric_limits<T>::quiet_NaN(), 1);
    ku::Invert_Threshold_InPlace(1, &nan, T(0.5));
    EXPECT_TRUE(std::isnan(nan.real()) && std::isnan(nan.imag()));

    // A NaN threshold passes the early test; limit > p then fails, so a
    // normal element takes the unlimited inverse.
    std::vector<Z> unlimited = {{2, 0}, {0, 0}};
    ku::Invert_Threshold_InPlace(2, unlimited.data(), std::numeric_limits<T>::quiet_NaN());
    EXPECT_TRUE(SameBits(Z(T(0.5), -T(0)), unlimited[0]));
    EXPECT_TRUE(std::isnan(unlimited[1].real()));
    EXPECT_TRUE(SameBits(T(0), unlimited[1].imag()));

    const auto original = RandomComplex<T>(16, 2090);
    for (const T threshold : {T(0), T(-2)}) {
        auto same = original;
        ku::Invert_Threshold_InPlace(16, same.data(), threshold);
        EXPECT_TRUE(SameBitsArray(original, same));
    }

    std::uint32_t seed = 2100;
    for (const T threshold : {T(0.6), T(1e-3), T(7)}) {
        for (unsigned int n : kestaccel_test::InterestingSizes()) {
            SCOPED_TRACE(::testing::Message() << "threshold " << threshold << " size " << n << " " << SeedTrace(seed));
            auto in = RandomComplex<T>(n, seed++, T(-2), T(2));
            for (std::size_t i = 0; i < n; i += 5) in[i] *= T(1e-4);
            std::vector<Z> expected(n);
            for (std::size_t i = 0; i < n; ++i) expected[i] = ComplexInvertedWithThreshold(in[i], threshold);
            GuardedBuffer<Z> srcDst(n);
            for (std::size_t i = 0; i < n; ++i) srcDst[i] = in[i];
            ku::Invert_Threshold_InPlace(n, srcDst.data(), threshold);
            EXPECT_TRUE(SameBitsArray(expected.data(), srcDst.data(), n));
            EXPECT_TRUE(srcDst.Intact());
        }
    }
}

TYPED_TEST(Elementwise, CountZeroTouchesNothing)
{
    using T = TypeParam;
    using Z = std::complex<T>;
    const T marker = T(-77.5);
    const std::vector<T> in(2, T(3));
    const std::vector<Z> zin(1, Z(3, 4));
    std::vector<T> out(2, marker);
    std::vector<Z> zout(1, Z(marker, marker));
    const T* s = in.data();
    T* d = out.data();
    ku::Sqr(0, s, d);
    ku::Sqr_InPlace(0, d);
    ku::Sqrt(0, s, d);
    ku::Sqrt_InPlace(0, d);
    ku::Exp(0, s, d);
    ku::Exp_InPlace(0, d);
    ku::Ln(0, s, d);
    ku::Pow(0, s, s, d);
    ku::Inverse(0, s, d);
    ku::Abs(0, s, d);
    ku::Abs_InPlace(0, d);
    ku::Round(0, s, d);
    ku::Flip(0, s, d);
    ku::Flip_InPlace(0, d);
    ku::Magnitude(0, s, s, d);
    ku::Magnitude(0, zin.data(), d);
    ku::PowerSpectr(0, zin.data(), d);
    ku::Normalize(0, s, d, T(1), T(0));
    ku::Invert_Threshold_InPlace(0, d, T(0.5));
    ku::Invert_Threshold_InPlace(0, zout.data(), T(0.5));
    EXPECT_TRUE(SameBitsArray(std::vector<T>(2, marker), out));
    EXPECT_TRUE(SameBits(Z(marker, marker), zout[0]));
}

}  // namespace
