// Real transforms through the public interface: the packed spectrum with its
// exact zeros, known spectra at size 8, the Hartley inverse and the part the
// DC and Nyquist imaginary entries play in it, and the small sizes.

#include <cmath>
#include <cstdint>
#include <limits>
#include <vector>

#include "FFTTestSupport.h"

namespace {

using namespace kestaccel::transform;
using fft_test::Agrees;
using fft_test::StateHolder;
using kestaccel_test::GuardedBuffer;
using kestaccel_test::SameBits;
using kestaccel_test::SeedTrace;

template <class E>
class FFTReal : public ::testing::Test {
protected:
    using State = typename fft_test::States<E>::Real;

    static std::vector<E> Forward(unsigned int order, const std::vector<E>& x)
    {
        StateHolder<State> state(order);
        GuardedBuffer<E> out(x.size() + 2);
        FFTFwd(x.data(), out.data(), state.get(), nullptr);
        EXPECT_TRUE(out.Intact());
        return out.values();
    }
    static std::vector<E> Inverse(unsigned int order, const std::vector<E>& spectrum)
    {
        StateHolder<State> state(order);
        GuardedBuffer<E> out(spectrum.size() - 2);
        FFTInv(spectrum.data(), out.data(), state.get(), nullptr);
        EXPECT_TRUE(out.Intact());
        return out.values();
    }
};
using Elements = ::testing::Types<float, double>;
TYPED_TEST_SUITE(FFTReal, Elements);

TYPED_TEST(FFTReal, ZerosOfSizeFour)
{
    using E = TypeParam;
    for (E v : TestFixture::Forward(2, std::vector<E>(4))) EXPECT_EQ(v, E(0));
}

TYPED_TEST(FFTReal, ImpulsesOfSizeEight)
{
    using E = TypeParam;
    for (unsigned int m = 0; m < 8; ++m) {
        SCOPED_TRACE("impulse at " + std::to_string(m));
        std::vector<E> x(8);
        x[m] = E(1);
        const auto spectrum = TestFixture::Forward(3, x);
        for (unsigned int k = 0; k <= 4; ++k) {
            const auto root = fft_test::EighthRoot(k * m);
            EXPECT_TRUE(Agrees<E>(root.real(), spectrum[2 * k], 1)) << "bin " << k;
            EXPECT_TRUE(Agrees<E>(root.imag(), spectrum[2 * k + 1], 1)) << "bin " << k;
        }
        EXPECT_TRUE(SameBits(E(0), spectrum[1]));
        EXPECT_TRUE(SameBits(E(0), spectrum[9]));

        // And back: the impulse again.
        const auto back = TestFixture::Inverse(3, spectrum);
        for (unsigned int n = 0; n < 8; ++n) EXPECT_TRUE(Agrees<E>(n == m ? 1 : 0, back[n], 1)) << n;
    }
}

TYPED_TEST(FFTReal, StepsOfSizeEight)
{
    using E = TypeParam;
    const long double r2 = 2.414213562373095, r0 = 0.41421356237309515;
    const struct {
        std::vector<E> input;
        std::vector<long double> spectrum;
    } cases[] = {
        {{0, 0, 0, 0, 1, 1, 1, 1}, {4, 0, -1, r2, 0, 0, -1, r0, 0, 0}},
        {{0, 0, 1, 1, 1, 1, 0, 0}, {4, 0, -r2, -1, 0, 0, r0, 1, 0, 0}},
    };
    for (const auto& c : cases) {
        const auto spectrum = TestFixture::Forward(3, c.input);
        for (unsigned int i = 0; i < 10; ++i) EXPECT_TRUE(Agrees<E>(c.spectrum[i], spectrum[i], 2)) << i;
    }
}

// Imaginary entries at DC and Nyquist are read: each adds
// (p + q (-1)^n) / N to sample n.
TYPED_TEST(FFTReal, InverseReadsDcAndNyquistImaginaryParts)
{
    using E = TypeParam;
    std::vector<E> spectrum(10);
    for (unsigned int k = 0; k <= 4; ++k) spectrum[2 * k] = E(1);
    spectrum[1] = E(1);
    spectrum[9] = E(0.5);
    const auto x = TestFixture::Inverse(3, spectrum);
    for (unsigned int n = 0; n < 8; ++n) {
        const long double expected = (n == 0 ? 1.0L : 0.0L) + (1.0L + 0.5L * (n % 2 ? -1 : 1)) / 8;
        EXPECT_TRUE(Agrees<E>(expected, x[n], 1)) << n;
    }
}

TYPED_TEST(FFTReal, ForwardThenInverseAtOrderEight)
{
    using E = TypeParam;
    const std::uint32_t seed = 52;
    SCOPED_TRACE(SeedTrace(seed));
    const auto x = kestaccel_test::RandomReals<E>(256, seed, E(0), E(1));
    const auto back = TestFixture::Inverse(8, TestFixture::Forward(8, x));
    for (unsigned int i = 0; i < 256; ++i) EXPECT_TRUE(Agrees<E>(x[i], back[i], 100)) << i;
}

// Sizes 1 and 2 (orders 32 and 1, 33) run without tables: one sample is
// copied with a zero imaginary part, two are a sum and a difference, and the
// inverse of two ignores the imaginary entries.
TYPED_TEST(FFTReal, OneAndTwoSamples)
{
    using E = TypeParam;
    const auto one = TestFixture::Forward(32, {E(-0.0)});
    EXPECT_TRUE(SameBits(E(-0.0), one[0]));
    EXPECT_TRUE(SameBits(E(0), one[1]));
    EXPECT_TRUE(SameBits(E(-2.5), TestFixture::Inverse(32, {E(-2.5), E(7), E(9)})[0]));

    const E a = E(0.1), b = E(0.7);
    for (unsigned int order : {1u, 33u}) {
        SCOPED_TRACE("order " + std::to_string(order));
        const auto two = TestFixture::Forward(order, {a, b});
        EXPECT_TRUE(SameBits(E(b + a), two[0]));
        EXPECT_TRUE(SameBits(E(0), two[1]));
        EXPECT_TRUE(SameBits(E(a - b), two[2]));
        EXPECT_TRUE(SameBits(E(0), two[3]));
        const E nan = std::numeric_limits<E>::quiet_NaN();
        const auto back = TestFixture::Inverse(order, {a, nan, b, nan});
        EXPECT_TRUE(SameBits(E((b + a) * E(0.5)), back[0]));
        EXPECT_TRUE(SameBits(E((a - b) * E(0.5)), back[1]));
    }
}

// The source is copied into the plan's scratch before anything is written.
TYPED_TEST(FFTReal, ForwardInPlace)
{
    using E = TypeParam;
    const std::uint32_t seed = 61;
    SCOPED_TRACE(SeedTrace(seed));
    auto buffer = kestaccel_test::RandomReals<E>(66, seed);
    const auto expected = TestFixture::Forward(6, std::vector<E>(buffer.begin(), buffer.begin() + 64));
    StateHolder<typename TestFixture::State> state(6);
    FFTFwd(buffer.data(), buffer.data(), state.get(), nullptr);
    EXPECT_TRUE(kestaccel_test::SameBitsArray(expected, buffer));
}

// A state serves block after block: the scratch keeps no meaning between
// calls.
TYPED_TEST(FFTReal, RepeatedCallsOnOneStateAgree)
{
    using E = TypeParam;
    const std::uint32_t seed = 62;
    SCOPED_TRACE(SeedTrace(seed));
    const auto x = kestaccel_test::RandomReals<E>(128, seed), y = kestaccel_test::RandomReals<E>(128, seed + 1);
    StateHolder<typename TestFixture::State> state(7);
    std::vector<E> first(130), again(130), other(130);
    FFTFwd(x.data(), first.data(), state.get(), nullptr);
    FFTFwd(y.data(), other.data(), state.get(), nullptr);
    std::vector<E> back(128);
    FFTInv(other.data(), back.data(), state.get(), nullptr);
    FFTFwd(x.data(), again.data(), state.get(), nullptr);
    EXPECT_TRUE(kestaccel_test::SameBitsArray(first, again));
}

}  // namespace
