// The four cosine-type windows against their closed formulas, evaluated with
// the stated constants in the stated order, bit for bit.

#include <kestaccel/Window.h>

#include <cmath>
#include <cstdint>
#include <string>
#include <vector>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace ku = kestaccel::utility;

// The constants of each element type, from their bit patterns.
template <class T>
struct K;
template <>
struct K<float> {
    static float TwoPi() { return FromBits<float>(0x40C90FDBu); }
    static float C054() { return FromBits<float>(0x3F0A3D71u); }
    static float C046() { return FromBits<float>(0x3EEB851Fu); }
};
template <>
struct K<double> {
    static double TwoPi() { return FromBits<double>(0x401921FB54442D18ull); }
    static double C054() { return 0.54; }
    static double C046() { return 0.46; }
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
using ElementTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(CosineWindow, ElementTypes);

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

// By hand: n = 2 uses the first factor for both samples; the triangle is
// exactly 0 at the ends and 1 at the centre.
TYPED_TEST(CosineWindow, HandWorkedValues)
{
    using T = TypeParam;
    const T p = K<T>::C054() - K<T>::C046();
    EXPECT_TRUE(SameBitsArray({T(0), T(0)}, OnesWindow(Hann, 2, T(0))));
    EXPECT_TRUE(SameBitsArray({p, p}, OnesWindow(Hamming, 2, T(0))));
    const std::vector<T> triangle = {0, T(0.25), T(0.5), T(0.75), 1, T(0.75), T(0.5), T(0.25), 0};
    EXPECT_TRUE(SameBitsArray(triangle, OnesWindow(Bartlett, 9, T(0))));
}

}  // namespace
