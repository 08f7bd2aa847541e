// The four cosine-type windows against their closed formulas, evaluated here
// with the stated constants in the stated order, compared bit for bit.

#include <kestaccel/Window.h>

#include <cmath>
#include <cstdint>
#include <vector>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace ku = kestaccel::utility;

// The constants of each element type, from their bit patterns.
template <class T>
struct Constants;

template <>
struct Constants<float> {
    static float TwoPi() { return FromBits<float>(0x40C90FDBu); }
    static float C054() { return FromBits<float>(0x3F0A3D71u); }
    static float C046() { return FromBits<float>(0x3EEB851Fu); }
};

template <>
struct Constants<double> {
    static double TwoPi() { return FromBits<double>(0x401921FB54442D18ull); }
    static double C054() { return 0.54; }
    static double C046() { return 0.46; }
};

// n is passed through a volatile so that 0/0 for n = 1 is evaluated at run
// time, with the same NaN the library produces.
template <class T>
T Angle(unsigned int i, unsigned int n)
{
    volatile unsigned int nv = n;
    const T numerator = static_cast<T>(i) * Constants<T>::TwoPi();
    return numerator / static_cast<T>(nv - 1u);
}

template <class T>
T BartlettFactor(unsigned int i, unsigned int n)
{
    volatile unsigned int nv = n;
    const T t = static_cast<T>(i);
    return (t + t) / static_cast<T>(nv - 1u);
}

template <class T>
T HannFactor(unsigned int i, unsigned int n)
{
    const T c = std::cos(Angle<T>(i, n));
    return T(0.5) - c * T(0.5);
}

template <class T>
T HammingFactor(unsigned int i, unsigned int n)
{
    const T c = std::cos(Angle<T>(i, n));
    return Constants<T>::C054() - c * Constants<T>::C046();
}

float BlackmanFactor(unsigned int i, unsigned int n, float alpha)
{
    const float x = Angle<float>(i, n);
    const float first = (alpha + 1.0f) * 0.5f;
    const float second = first - cosf(x) * 0.5f;
    return second - cosf(x + x) * (alpha * 0.5f);
}

// The double member takes its cosines in single precision.
double BlackmanFactor(unsigned int i, unsigned int n, double alpha)
{
    const double x = Angle<double>(i, n);
    const double c1 = static_cast<double>(cosf(static_cast<float>(x)));
    const double c2 = static_cast<double>(cosf(static_cast<float>(x + x)));
    const double first = (alpha + 1.0) * 0.5;
    const double second = first - c1 * 0.5;
    return second - c2 * (alpha * 0.5);
}

enum class Shape { Bartlett, Hann, Hamming, Blackman };

const char* ShapeName(Shape s)
{
    switch (s) {
    case Shape::Bartlett: return "Bartlett";
    case Shape::Hann: return "Hann";
    case Shape::Hamming: return "Hamming";
    case Shape::Blackman: return "Blackman";
    }
    return "?";
}

template <class T>
T Factor(Shape s, unsigned int i, unsigned int n, T alpha)
{
    switch (s) {
    case Shape::Bartlett: return BartlettFactor<T>(i, n);
    case Shape::Hann: return HannFactor<T>(i, n);
    case Shape::Hamming: return HammingFactor<T>(i, n);
    case Shape::Blackman: return BlackmanFactor(i, n, alpha);
    }
    return T(0);
}

template <class T>
void Apply(Shape s, unsigned int n, const T* src, T* dst, T alpha)
{
    switch (s) {
    case Shape::Bartlett: ku::WindowBartlett(n, src, dst); break;
    case Shape::Hann: ku::WindowHann(n, src, dst); break;
    case Shape::Hamming: ku::WindowHamming(n, src, dst); break;
    case Shape::Blackman: ku::WindowBlackman(n, src, dst, alpha); break;
    }
}

// The plain loop over the first half, mirrored. With `inPlace` the mirrored
// sample is read after the first write, as the library's in-place call does.
template <class T>
std::vector<T> Expected(Shape s, unsigned int n, std::vector<T> data, T alpha)
{
    const unsigned int half = (n >> 1) + (n & 1u);
    std::vector<T> out = data;
    for (unsigned int i = 0; i < half; ++i) {
        const T w = Factor<T>(s, i, n, alpha);
        out[i] = w * data[i];
        out[n - 1 - i] = w * data[n - 1 - i];
    }
    return out;
}

template <class T>
std::vector<T> ExpectedInPlace(Shape s, unsigned int n, std::vector<T> data, T alpha)
{
    const unsigned int half = (n >> 1) + (n & 1u);
    for (unsigned int i = 0; i < half; ++i) {
        const T w = Factor<T>(s, i, n, alpha);
        data[i] = w * data[i];
        data[n - 1 - i] = w * data[n - 1 - i];
    }
    return data;
}

const Shape kShapes[] = {Shape::Bartlett, Shape::Hann, Shape::Hamming, Shape::Blackman};
const unsigned int kSizes[] = {2, 3, 4, 5, 7, 8, 16, 17, 64, 255, 256, 1001, 1024};

template <class T>
class CosineWindow : public ::testing::Test {};
using ElementTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(CosineWindow, ElementTypes);

TYPED_TEST(CosineWindow, MatchesClosedFormulaBitForBit)
{
    using T = TypeParam;
    const T alpha = T(-0.16);
    for (Shape s : kShapes) {
        for (unsigned int n : kSizes) {
            const std::uint32_t seed = 100 + n;
            SCOPED_TRACE(SeedTrace(seed));
            SCOPED_TRACE(std::string(ShapeName(s)) + " n=" + std::to_string(n));
            const auto src = RandomReals<T>(n, seed);
            GuardedBuffer<T> dst(n);
            Apply(s, n, src.data(), dst.data(), alpha);
            EXPECT_TRUE(SameBitsArray(Expected(s, n, src, alpha), dst.values()));
            EXPECT_TRUE(dst.Intact());
        }
    }
}

TYPED_TEST(CosineWindow, BothHalvesAgreeBitForBit)
{
    using T = TypeParam;
    for (Shape s : kShapes) {
        for (unsigned int n : kSizes) {
            SCOPED_TRACE(std::string(ShapeName(s)) + " n=" + std::to_string(n));
            const std::vector<T> ones(n, T(1));
            std::vector<T> w(n);
            Apply(s, n, ones.data(), w.data(), T(0.3));
            for (unsigned int i = 0; i < n / 2; ++i) ASSERT_TRUE(SameBits(w[i], w[n - 1 - i])) << "at " << i;
        }
    }
}

TYPED_TEST(CosineWindow, InPlaceMultipliesOddCentreTwice)
{
    using T = TypeParam;
    const T alpha = T(-0.16);
    for (Shape s : kShapes) {
        for (unsigned int n : {5u, 17u, 255u, 1001u}) {
            const std::uint32_t seed = 300 + n;
            SCOPED_TRACE(SeedTrace(seed));
            SCOPED_TRACE(std::string(ShapeName(s)) + " n=" + std::to_string(n));
            auto data = RandomReals<T>(n, seed);
            const auto expected = ExpectedInPlace(s, n, data, alpha);
            Apply(s, n, data.data(), data.data(), alpha);
            EXPECT_TRUE(SameBitsArray(expected, data));
        }
    }
}

TYPED_TEST(CosineWindow, CountZeroWritesNothing)
{
    using T = TypeParam;
    for (Shape s : kShapes) {
        GuardedBuffer<T> dst(0);
        Apply<T>(s, 0, nullptr, dst.data(), T(0.5));
        EXPECT_TRUE(dst.Intact()) << ShapeName(s);
        Apply<T>(s, 0, nullptr, nullptr, T(0.5));
    }
}

TYPED_TEST(CosineWindow, SingleSampleIsNaNWhateverTheSource)
{
    using T = TypeParam;
    for (Shape s : kShapes) {
        for (T value : {T(1), T(0), T(-2.5)}) {
            SCOPED_TRACE(ShapeName(s));
            GuardedBuffer<T> dst(1);
            Apply(s, 1, &value, dst.data(), T(-0.16));
            EXPECT_TRUE(std::isnan(dst[0]));
            EXPECT_TRUE(SameBits(Factor<T>(s, 0, 1, T(-0.16)) * value, dst[0]));
            EXPECT_TRUE(dst.Intact());
        }
    }
}

TYPED_TEST(CosineWindow, TwoSamplesUseTheFirstFactorForBoth)
{
    using T = TypeParam;
    const T src[2] = {T(1), T(1)};
    T dst[2];
    ku::WindowBartlett(2, src, dst);
    EXPECT_TRUE(SameBits(T(0), dst[0]));
    EXPECT_TRUE(SameBits(T(0), dst[1]));
    ku::WindowHann(2, src, dst);
    EXPECT_TRUE(SameBits(T(0), dst[0]));
    EXPECT_TRUE(SameBits(T(0), dst[1]));
    ku::WindowHamming(2, src, dst);
    const T pedestal = Constants<T>::C054() - Constants<T>::C046();
    EXPECT_TRUE(SameBits(pedestal, dst[0]));
    EXPECT_TRUE(SameBits(pedestal, dst[1]));
}

TYPED_TEST(CosineWindow, TriangleRisesToOneAtTheCentre)
{
    using T = TypeParam;
    const unsigned int n = 9;
    const std::vector<T> ones(n, T(1));
    std::vector<T> w(n);
    ku::WindowBartlett(n, ones.data(), w.data());
    EXPECT_TRUE(SameBits(T(0), w[0]));
    EXPECT_TRUE(SameBits(T(0.25), w[1]));
    EXPECT_TRUE(SameBits(T(1), w[4]));
    EXPECT_TRUE(SameBits(T(0.75), w[5]));
}

TYPED_TEST(CosineWindow, NaNInSourceStaysInPlace)
{
    using T = TypeParam;
    const unsigned int n = 11;
    auto src = RandomReals<T>(n, 7);
    src[3] = std::numeric_limits<T>::quiet_NaN();
    for (Shape s : kShapes) {
        std::vector<T> dst(n);
        Apply(s, n, src.data(), dst.data(), T(0.2));
        for (unsigned int i = 0; i < n; ++i) EXPECT_EQ(i == 3, std::isnan(dst[i])) << ShapeName(s) << " at " << i;
    }
}

// Hamming for float uses the float constants, not the double ones narrowed
// after the arithmetic: the formula in double, rounded once, differs.
TEST(WindowHamming, FloatUsesFloatConstants)
{
    const unsigned int n = 33;
    const std::vector<float> ones(n, 1.0f);
    std::vector<float> w(n);
    ku::WindowHamming(n, ones.data(), w.data());
    unsigned int differing = 0;
    for (unsigned int i = 0; i < n; ++i) {
        const double x = static_cast<double>(static_cast<float>(i) * 6.2831855f / static_cast<float>(n - 1));
        const float wide = static_cast<float>(0.54 - std::cos(x) * 0.46);
        differing += Bits(wide) != Bits(w[i]);
        EXPECT_TRUE(SameBits(HammingFactor<float>(i < (n + 1) / 2 ? i : n - 1 - i, n), w[i])) << "at " << i;
    }
    EXPECT_GT(differing, 0u);
}

// The double Blackman takes single-precision cosines: the all-double
// formula differs from it in most samples.
TEST(WindowBlackman, DoubleTakesSinglePrecisionCosines)
{
    const unsigned int n = 64;
    const double alpha = -0.16;
    const std::vector<double> ones(n, 1.0);
    std::vector<double> w(n);
    ku::WindowBlackman(n, ones.data(), w.data(), alpha);
    unsigned int differing = 0;
    for (unsigned int i = 0; i < n / 2; ++i) {
        const double x = Angle<double>(i, n);
        const double allDouble = (alpha + 1.0) * 0.5 - std::cos(x) * 0.5 - std::cos(x + x) * (alpha * 0.5);
        differing += Bits(allDouble) != Bits(w[i]);
        EXPECT_NEAR(allDouble, w[i], 1e-6);
    }
    EXPECT_GT(differing, n / 4);
}

TEST(WindowBlackman, ClassicCoefficientsAtAlphaMinusPointSixteen)
{
    const unsigned int n = 51;
    const std::vector<float> ones(n, 1.0f);
    std::vector<float> w(n);
    ku::WindowBlackman(n, ones.data(), w.data(), -0.16f);
    const double pi = 3.141592653589793;
    for (unsigned int i = 0; i < n; ++i) {
        const double classic = 0.42 - 0.5 * std::cos(2 * pi * i / (n - 1)) + 0.08 * std::cos(4 * pi * i / (n - 1));
        EXPECT_NEAR(classic, w[i], 2e-6) << "at " << i;
    }
}

}  // namespace
