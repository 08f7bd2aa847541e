// The cosine windows against their closed formulas and Kaiser against the
// rational I0 approximation, bit for bit; that approximation against std::cyl_bessel_i.

#include <kestaccel/Window.h>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace ku = kestaccel::utility;

// The constants of each element type, from their bit patterns.
template <class T>
struct K {
    static T TwoPi()
    {
        return sizeof(T) == 4 ? T(FromBits<float>(0x40C90FDBu)) : T(FromBits<double>(0x401921FB54442D18ull));
    }
    static T C054() { return sizeof(T) == 4 ? T(FromBits<float>(0x3F0A3D71u)) : T(0.54); }
    static T C046() { return sizeof(T) == 4 ? T(FromBits<float>(0x3EEB851Fu)) : T(0.46); }
};

enum Shape { Bartlett, Hann, Hamming, Blackman };
const char* const kNames[] = {"Bartlett", "Hann", "Hamming", "Blackman"};

// Blackman takes its cosines in single precision for both element types.
float CosF(float x) { return cosf(x); }
double CosF(double x) { return static_cast<double>(cosf(static_cast<float>(x))); }

// n passes through a volatile so that 0/0 for n = 1 is evaluated at run time.
template <class T>
T Factor(Shape s, unsigned int i, unsigned int n, T alpha)
{
    volatile unsigned int nv = n;
    const T t = static_cast<T>(i), d = static_cast<T>(nv - 1u);
    const T x = t * K<T>::TwoPi() / d;
    switch (s) {
    case Bartlett: return (t + t) / d;
    case Hann: return T(0.5) - std::cos(x) * T(0.5);
    case Hamming: return K<T>::C054() - std::cos(x) * K<T>::C046();
    case Blackman: return (alpha + T(1)) * T(0.5) - CosF(x) * T(0.5) - CosF(x + x) * (alpha * T(0.5));
    }
    return T(0);
}

template <class T>
void Apply(Shape s, unsigned int n, const T* src, T* dst, T alpha)
{
    switch (s) {
    case Bartlett: ku::WindowBartlett(n, src, dst); break;
    case Hann: ku::WindowHann(n, src, dst); break;
    case Hamming: ku::WindowHamming(n, src, dst); break;
    case Blackman: ku::WindowBlackman(n, src, dst, alpha); break;
    }
}

template <class T>
std::vector<T> OnesWindow(Shape s, unsigned int n, T alpha)
{
    std::vector<T> w(n, T(1));
    Apply(s, n, w.data(), w.data(), alpha);
    return w;
}

// The first half, mirrored. In place the mirrored sample is read after the
// first write, so an odd centre is multiplied twice.
template <class T>
std::vector<T> Expected(Shape s, unsigned int n, const std::vector<T>& src, T alpha, bool inPlace)
{
    std::vector<T> out = src;
    const T* in = inPlace ? out.data() : src.data();
    for (unsigned int i = 0; i < (n >> 1) + (n & 1u); ++i) {
        const T w = Factor(s, i, n, alpha);
        out[i] = w * in[i];
        out[n - 1 - i] = w * in[n - 1 - i];
    }
    return out;
}

template <class T>
class CosineWindow : public ::testing::Test {};
TYPED_TEST_SUITE(CosineWindow, FloatingTypes);

// Out of place and in place; n = 0 writes nothing, n = 1 is 0/0, NaN; the
// window of ones at another alpha is exactly symmetric.
TYPED_TEST(CosineWindow, MatchesClosedFormulaBitForBit)
{
    using T = TypeParam;
    const T alpha = T(-0.16);
    for (Shape s : {Bartlett, Hann, Hamming, Blackman}) {
        for (unsigned int n : {0u, 1u, 2u, 3u, 4u, 5u, 7u, 8u, 16u, 17u, 64u, 255u, 256u, 1001u, 1024u}) {
            const std::uint32_t seed = 100 + n;
            SCOPED_TRACE(SeedTrace(seed) + ", " + kNames[s] + " n=" + std::to_string(n));
            const auto src = RandomReals<T>(n, seed);
            GuardedBuffer<T> dst(n);
            Apply(s, n, src.data(), dst.data(), alpha);
            EXPECT_TRUE(SameBitsArray(Expected(s, n, src, alpha, false), dst.values()) && dst.Intact());
            if (n == 1) {
                EXPECT_TRUE(std::isnan(dst[0]));
            }
            auto data = src;
            Apply(s, n, data.data(), data.data(), alpha);
            EXPECT_TRUE(SameBitsArray(Expected(s, n, src, alpha, true), data));
            const auto w = OnesWindow(s, n, T(0.3));
            for (unsigned int i = 0; i < n / 2; ++i) ASSERT_TRUE(SameBits(w[i], w[n - 1 - i])) << "at " << i;
        }
    }
}

double ReferenceI0(double x)
{
    if (x == 0.0) return 1.0;
    static const double c[15] = {
        1440482982.27235, 356644482.244025, 21641557.2361227, 571661.130563785, 8307.92541809429,
        75.4337328948189, 0.463076284721, 0.00202591084143397, 6.54858370096785e-06, 1.60224679395361e-08,
        3.0093112711296e-11, 4.35125971262668e-14, 4.794402575483e-17, 3.80715242345326e-20, 2.10580722890567e-23,
    };
    const double y = x * x;
    double p = c[14];
    for (int k = 13; k >= 0; --k) p = p * y + c[k];
    const double q = ((y - 3076.46912682801) * y + 3476263.32405882) * y - 1440482982.27235;
    return (-p) / q;
}

// In double, rounded to the element type.
template <class T>
T KaiserFactor(unsigned int i, unsigned int n, T alpha)
{
    const double a = alpha;
    const double m = static_cast<double>(n - 1u) * 0.5;
    const double inv = 1.0 / ReferenceI0(a * m);
    const double d = static_cast<double>(i) - m;
    return static_cast<T>(ReferenceI0(std::sqrt(m * m - d * d) * a) * inv);
}

// The mirror is written only below the centre: in place an odd centre is
// multiplied once.
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
TYPED_TEST_SUITE(KaiserWindow, FloatingTypes);

// In place an odd centre is multiplied once (its factor is not always 1);
// alpha = 0 and n = 1 copy the source, -0 and NaN too; ones stay symmetric.
TYPED_TEST(KaiserWindow, MatchesPlainEvaluationBitForBit)
{
    using T = TypeParam;
    for (unsigned int n : {0u, 1u, 2u, 3u, 4u, 5u, 8u, 9u, 16u, 31u, 64u, 65u, 256u, 1001u}) {
        // alpha * (n - 1) / 2 from 0 to 12, and negative.
        for (double beta : {0.0, 0.5, 1.3, 2.2, 4.0, 7.4, 12.0, -6.0, -3.7}) {
            const T alpha = static_cast<T>(n > 1 ? 2.0 * beta / (n - 1) : beta);
            const std::uint32_t seed = 500 + n;
            SCOPED_TRACE(SeedTrace(seed) + ", n=" + std::to_string(n) + " beta=" + std::to_string(beta));
            auto src = RandomReals<T>(n, seed, T(-1e6), T(1e6));
            if (n > 2) src[1] = std::numeric_limits<T>::quiet_NaN();
            if (n > 0) src[0] = -T(0);
            GuardedBuffer<T> dst(n);
            ku::WindowKaiser(n, src.data(), dst.data(), alpha);
            EXPECT_TRUE(SameBitsArray(Expected(n, src, alpha), dst.values()) && dst.Intact());
            if (beta == 0.0 || n == 1) {
                EXPECT_TRUE(SameBitsArray(src, dst.values()));
            }
            auto data = src;
            ku::WindowKaiser(n, data.data(), data.data(), alpha);
            EXPECT_TRUE(SameBitsArray(Expected(n, src, alpha), data));
            std::vector<T> w(n, T(1));
            ku::WindowKaiser(n, w.data(), w.data(), alpha);
            for (unsigned int i = 0; i < n / 2; ++i) ASSERT_TRUE(SameBits(w[i], w[n - 1 - i])) << "at " << i;
        }
    }
}

// The edge factor is 1 / I0(alpha m): within 2e-14 of the runtime's Bessel
// function up to 15, which checks both coefficient tables independently.
TEST(KaiserWindow, EdgeFactorFollowsTheBesselFunction)
{
    const std::vector<double> ones(21, 1.0);  // m = 10
    std::vector<double> w(21);
    for (double x = 0.25; x <= 15.0; x += 0.25) {
        ku::WindowKaiser(21, ones.data(), w.data(), x / 10.0);
        EXPECT_NEAR(1.0, (1.0 / w[0]) / std::cyl_bessel_i(0.0, (x / 10.0) * 10.0), 2e-14) << "x=" << x;
    }
}

}  // namespace
