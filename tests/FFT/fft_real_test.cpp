// Real transforms through the public interface: the packed spectrum with its
// exact zeros, known spectra at size 8, the Hartley inverse and the part the
// DC and Nyquist imaginary entries play in it, and the small sizes.

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

template <class E>
class FFTReal : public ::testing::Test {
protected:
    using State = typename fft_test::States<E>::Real;

    // N samples in, N + 2 out (inverse: the other way), guarded, on the
    // given state or one of its own.
    static std::vector<E> Run(unsigned int order, const std::vector<E>& x, bool inverse = false, State* shared = nullptr)
    {
        StateHolder<State> own(order);
        State* state = shared != nullptr ? shared : own.get();
        GuardedBuffer<E> out(inverse ? x.size() - 2 : x.size() + 2);
        if (inverse) {
            FFTInv(x.data(), out.data(), state, nullptr);
        } else {
            FFTFwd(x.data(), out.data(), state, nullptr);
        }
        EXPECT_TRUE(out.Intact());
        return out.values();
    }
};
using Elements = ::testing::Types<float, double>;
TYPED_TEST_SUITE(FFTReal, Elements);

TYPED_TEST(FFTReal, KnownSpectraOfSizeEight)
{
    using E = TypeParam;
    for (E v : TestFixture::Run(2, std::vector<E>(4))) EXPECT_EQ(v, E(0));
    for (unsigned int m = 0; m < 8; ++m) {
        SCOPED_TRACE("impulse at " + std::to_string(m));
        std::vector<E> x(8);
        x[m] = E(1);
        const auto spectrum = TestFixture::Run(3, x);
        for (unsigned int k = 0; k <= 4; ++k) {
            const auto root = fft_test::EighthRoot(k * m);
            EXPECT_TRUE(Agrees<E>(root.real(), spectrum[2 * k], 1)) << "bin " << k;
            EXPECT_TRUE(Agrees<E>(root.imag(), spectrum[2 * k + 1], 1)) << "bin " << k;
        }
        EXPECT_TRUE(SameBits(E(0), spectrum[1]));
        EXPECT_TRUE(SameBits(E(0), spectrum[9]));
        // And back: the impulse again.
        const auto back = TestFixture::Run(3, spectrum, true);
        for (unsigned int n = 0; n < 8; ++n) EXPECT_TRUE(Agrees<E>(n == m ? 1 : 0, back[n], 1)) << n;
    }

    const long double r2 = 2.414213562373095, r0 = 0.41421356237309515;
    const struct {
        std::vector<E> input;
        std::vector<long double> spectrum;
    } steps[] = {
        {{0, 0, 0, 0, 1, 1, 1, 1}, {4, 0, -1, r2, 0, 0, -1, r0, 0, 0}},
        {{0, 0, 1, 1, 1, 1, 0, 0}, {4, 0, -r2, -1, 0, 0, r0, 1, 0, 0}},
    };
    for (const auto& step : steps) {
        const auto spectrum = TestFixture::Run(3, step.input);
        for (unsigned int i = 0; i < 10; ++i) EXPECT_TRUE(Agrees<E>(step.spectrum[i], spectrum[i], 2)) << "step, " << i;
    }
}

// Imaginary entries at DC and Nyquist are read: each adds
// (p + q (-1)^n) / N to sample n.
TYPED_TEST(FFTReal, InverseReadsDcAndNyquistImaginaryParts)
{
    using E = TypeParam;
    const auto x = TestFixture::Run(3, {1, 1, 1, 0, 1, 0, 1, 0, 1, E(0.5)}, true);
    for (unsigned int n = 0; n < 8; ++n) {
        const long double expected = (n == 0 ? 1.0L : 0.0L) + (1.0L + 0.5L * (n % 2 ? -1 : 1)) / 8;
        EXPECT_TRUE(Agrees<E>(expected, x[n], 1)) << n;
    }
}

// On data in [0, 1). One state serves block after block: its scratch keeps
// no meaning between calls, so the forward transform repeated after an
// inverse gives the same bits.
TYPED_TEST(FFTReal, ForwardThenInverseOnOneState)
{
    using E = TypeParam;
    const std::uint32_t seed = 52;
    SCOPED_TRACE(kestaccel_test::SeedTrace(seed));
    const auto x = kestaccel_test::RandomReals<E>(256, seed, E(0), E(1));
    StateHolder<typename TestFixture::State> state(8);
    const auto spectrum = TestFixture::Run(8, x, false, state.get());
    const auto back = TestFixture::Run(8, spectrum, true, state.get());
    for (unsigned int i = 0; i < 256; ++i) EXPECT_TRUE(Agrees<E>(x[i], back[i], 100)) << i;
    EXPECT_TRUE(kestaccel_test::SameBitsArray(spectrum, TestFixture::Run(8, x, false, state.get())));
}

// Sizes 1 and 2 (orders 32 and 1, 33) run without tables: one sample is
// copied with a zero imaginary part, two are a sum and a difference, and the
// inverse of two ignores the imaginary entries.
TYPED_TEST(FFTReal, OneAndTwoSamples)
{
    using E = TypeParam;
    const auto one = TestFixture::Run(32, {E(-0.0)});
    EXPECT_TRUE(SameBits(E(-0.0), one[0]));
    EXPECT_TRUE(SameBits(E(0), one[1]));
    EXPECT_TRUE(SameBits(E(-2.5), TestFixture::Run(32, {E(-2.5), E(7), E(9)}, true)[0]));

    const E a = E(0.1), b = E(0.7), nan = std::numeric_limits<E>::quiet_NaN();
    for (unsigned int order : {1u, 33u}) {
        SCOPED_TRACE("order " + std::to_string(order));
        const std::vector<E> two = {E(b + a), E(0), E(a - b), E(0)};
        EXPECT_TRUE(kestaccel_test::SameBitsArray(two, TestFixture::Run(order, {a, b})));
        const std::vector<E> back = {E((b + a) * E(0.5)), E((a - b) * E(0.5))};
        EXPECT_TRUE(kestaccel_test::SameBitsArray(back, TestFixture::Run(order, {a, nan, b, nan}, true)));
    }
}

}  // namespace
