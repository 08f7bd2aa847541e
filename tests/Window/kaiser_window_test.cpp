// WindowKaiser against a plain evaluation written here from the rational
// I0 approximation, and that approximation against the runtime's own
// std::cyl_bessel_i.

#include <kestaccel/Window.h>

#include <cmath>
#include <cstdint>
#include <vector>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace ku = kestaccel::utility;

double ReferenceI0(double x)
{
    if (x == 0.0) return 1.0;
    static const double c[15] = {
        1440482982.27235,     356644482.244025,     21641557.2361227,    571661.130563785,
        8307.92541809429,     75.4337328948189,     0.463076284721,      0.00202591084143397,
        6.54858370096785e-06, 1.60224679395361e-08, 3.0093112711296e-11, 4.35125971262668e-14,
        4.794402575483e-17,   3.80715242345326e-20, 2.10580722890567e-23,
    };
    const double y = x * x;
    double p = c[14];
    for (int k = 13; k >= 0; --k) p = p * y + c[k];
    const double q = ((y - 3076.46912682801) * y + 3476263.32405882) * y - 1440482982.27235;
    return (-p) / q;
}

// Factor of sample i, in double, then rounded to the element type.
template <class T>
T KaiserFactor(unsigned int i, unsigned int n, T alpha)
{
    const double a = alpha;
    const double m = static_cast<double>(n - 1u) * 0.5;
    const double inv = 1.0 / ReferenceI0(a * m);
    const double d = static_cast<double>(i) - m;
    const double r = std::sqrt(m * m - d * d);
    return static_cast<T>(ReferenceI0(r * a) * inv);
}

template <class T>
std::vector<T> Expected(unsigned int n, std::vector<T> data, T alpha)
{
    for (unsigned int i = 0; i < (n + 1) / 2; ++i) {
        const T w = KaiserFactor(i, n, alpha);
        data[i] = w * data[i];
        if (i < n / 2) data[n - 1 - i] = w * data[n - 1 - i];
    }
    return data;
}

template <class T>
class KaiserWindow : public ::testing::Test {};
using ElementTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(KaiserWindow, ElementTypes);

const unsigned int kSizes[] = {2, 3, 4, 5, 8, 9, 16, 31, 64, 65, 256, 1001};

TYPED_TEST(KaiserWindow, MatchesPlainEvaluationBitForBit)
{
    using T = TypeParam;
    for (unsigned int n : kSizes) {
        // Shape parameters alpha * (n - 1) / 2 of 0.5, 4 and 12, and a negative alpha.
        for (double beta : {0.5, 4.0, 12.0, -6.0}) {
            const T alpha = static_cast<T>(2.0 * beta / (n - 1));
            const std::uint32_t seed = 500 + n;
            SCOPED_TRACE(SeedTrace(seed));
            SCOPED_TRACE("n=" + std::to_string(n) + " beta=" + std::to_string(beta));
            const auto src = RandomReals<T>(n, seed);
            GuardedBuffer<T> dst(n);
            ku::WindowKaiser(n, src.data(), dst.data(), alpha);
            EXPECT_TRUE(SameBitsArray(Expected(n, src, alpha), dst.values()));
            EXPECT_TRUE(dst.Intact());
        }
    }
}

TYPED_TEST(KaiserWindow, BothHalvesAgreeBitForBit)
{
    using T = TypeParam;
    for (unsigned int n : kSizes) {
        const std::vector<T> ones(n, T(1));
        std::vector<T> w(n);
        ku::WindowKaiser(n, ones.data(), w.data(), static_cast<T>(16.0 / (n - 1)));
        for (unsigned int i = 0; i < n / 2; ++i) ASSERT_TRUE(SameBits(w[i], w[n - 1 - i])) << "n=" << n << " i=" << i;
    }
}

// In place, the centre of an odd window is multiplied once. Its factor is
// I0(t) * (1 / I0(t)), which is 1 up to rounding; the alphas below are
// chosen among those where it is not exactly 1, so a second multiplication
// would show. (In float that factor always rounds to 1.)
TEST(KaiserWindow, InPlaceWritesOddCentreOnce)
{
    using T = double;
    unsigned int cases = 0;
    for (unsigned int n : {5u, 9u, 31u, 65u, 1001u}) {
        for (int k = 1; k <= 40; ++k) {
            const T alpha = static_cast<T>(0.37 * k / (n - 1));
            if (Bits(KaiserFactor(n / 2, n, alpha)) == Bits(T(1))) continue;
            ++cases;
            const std::uint32_t seed = 700 + n;
            SCOPED_TRACE(SeedTrace(seed));
            auto data = RandomReals<T>(n, seed);
            const auto expected = Expected(n, data, alpha);
            ku::WindowKaiser(n, data.data(), data.data(), alpha);
            ASSERT_TRUE(SameBitsArray(expected, data)) << "n=" << n << " k=" << k;
        }
    }
    EXPECT_GT(cases, 10u);
}

TYPED_TEST(KaiserWindow, AlphaZeroIsTheIdentity)
{
    using T = TypeParam;
    for (unsigned int n : {1u, 2u, 3u, 64u, 1001u}) {
        auto src = RandomReals<T>(n, 900 + n, T(-1e6), T(1e6));
        src[0] = -T(0);
        src[n - 1] = std::numeric_limits<T>::quiet_NaN();
        GuardedBuffer<T> dst(n);
        ku::WindowKaiser(n, src.data(), dst.data(), T(0));
        EXPECT_TRUE(SameBitsArray(src, dst.values())) << "n=" << n;
        EXPECT_TRUE(dst.Intact());
    }
}

TYPED_TEST(KaiserWindow, SingleSampleIsCopied)
{
    using T = TypeParam;
    for (T value : {T(-3.25), -T(0), T(7)}) {
        GuardedBuffer<T> dst(1);
        ku::WindowKaiser(1, &value, dst.data(), T(5));
        EXPECT_TRUE(SameBits(value, dst[0]));
        EXPECT_TRUE(dst.Intact());
    }
}

TYPED_TEST(KaiserWindow, TwoSamplesBothTakeTheEdgeFactor)
{
    using T = TypeParam;
    const T src[2] = {T(1), T(-1)};
    T dst[2];
    const T alpha = T(3);
    ku::WindowKaiser(2, src, dst, alpha);
    const T edge = static_cast<T>(1.0 / ReferenceI0(static_cast<double>(alpha) * 0.5));
    EXPECT_TRUE(SameBits(edge, dst[0]));
    EXPECT_TRUE(SameBits(-edge, dst[1]));
}

TYPED_TEST(KaiserWindow, CountZeroWritesNothingWhateverAlpha)
{
    using T = TypeParam;
    for (T alpha : {T(0), T(1), std::numeric_limits<T>::quiet_NaN()}) {
        GuardedBuffer<T> dst(0);
        ku::WindowKaiser(0, static_cast<const T*>(nullptr), dst.data(), alpha);
        EXPECT_TRUE(dst.Intact());
    }
}

// The edge factor is 1 / I0(alpha * m). Against the runtime's Bessel
// function the approximation holds to a few units of 1e-15 up to 15, which
// also checks the coefficient table here and in the library independently.
TEST(KaiserWindow, EdgeFactorFollowsTheBesselFunction)
{
    const unsigned int n = 21;  // m = 10
    const std::vector<double> ones(n, 1.0);
    std::vector<double> w(n);
    for (double x = 0.25; x <= 15.0; x += 0.25) {
        ku::WindowKaiser(n, ones.data(), w.data(), x / 10.0);
        const double truth = std::cyl_bessel_i(0.0, (x / 10.0) * 10.0);
        EXPECT_NEAR(1.0, (1.0 / w[0]) / truth, 2e-14) << "x=" << x;
    }
}

TEST(KaiserWindow, FloatRoundsEachFactorBeforeMultiplying)
{
    const unsigned int n = 129;
    const float alpha = 0.1f;
    const auto src = RandomReals<float>(n, 1234);
    std::vector<float> dst(n);
    ku::WindowKaiser(n, src.data(), dst.data(), alpha);
    unsigned int differing = 0;
    for (unsigned int i = 0; i < (n + 1) / 2; ++i) {
        const double a = alpha;
        const double m = (n - 1) * 0.5;
        const double d = i - m;
        const double wide = ReferenceI0(std::sqrt(m * m - d * d) * a) * (1.0 / ReferenceI0(a * m));
        differing += Bits(static_cast<float>(wide * src[i])) != Bits(dst[i]);
        EXPECT_TRUE(SameBits(static_cast<float>(wide) * src[i], dst[i])) << "at " << i;
    }
    EXPECT_GT(differing, 0u);
}

}  // namespace
