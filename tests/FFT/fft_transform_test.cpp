// Complex and real transforms through the public interface: known spectra
// at size 8, zeros, round trips, layouts and placements, the small orders,
// accuracy against a long-double direct DFT, and allocation.

#include <algorithm>
#include <cmath>
#include <complex>
#include <cstdint>
#include <cstdio>
#include <limits>
#include <vector>

#include "FFTTestSupport.h"
#include "support/AllocationCount.h"

namespace {

using fft_test::Agrees;
using fft_test::StateHolder;
using fft_test::Transform;
using kestaccel_test::GuardedBuffer;
using kestaccel_test::SameBits;
using kestaccel_test::SameBitsArray;
using kestaccel_test::SeedTrace;

template <class E>
std::vector<std::complex<E>> Pairs(const E* re, const E* im, std::size_t n)
{
    std::vector<std::complex<E>> pairs(n);
    for (std::size_t i = 0; i < n; ++i) pairs[i] = {re[i], im[i]};
    return pairs;
}

template <class E>
class FFT : public ::testing::Test {
protected:
    using Real = typename fft_test::States<E>::Real;
    using Interleaved = typename fft_test::States<E>::Interleaved;
    using Deinterleaved = typename fft_test::States<E>::Deinterleaved;

    // Out of place into a guarded buffer, on a state of its own.
    static std::vector<std::complex<E>> Complex(unsigned int order, const std::vector<std::complex<E>>& x,
                                                bool inverse = false)
    {
        StateHolder<Interleaved> state(order);
        GuardedBuffer<std::complex<E>> out(x.size());
        Transform(inverse, state.get(), x.data(), out.data());
        EXPECT_TRUE(out.Intact());
        return out.values();
    }

    // N samples in, N + 2 out (the inverse the other way).
    static std::vector<E> RealRun(unsigned int order, const std::vector<E>& x, bool inverse = false,
                                  Real* shared = nullptr)
    {
        StateHolder<Real> own(order);
        GuardedBuffer<E> out(inverse ? x.size() - 2 : x.size() + 2);
        Transform(inverse, shared != nullptr ? shared : own.get(), x.data(), out.data());
        EXPECT_TRUE(out.Intact());
        return out.values();
    }
};
using Elements = ::testing::Types<float, double>;
TYPED_TEST_SUITE(FFT, Elements);

// Impulses within 1 eps (the real spectrum exactly real at DC and Nyquist,
// and back to the impulse); a step within 2 eps, complex and real.
TYPED_TEST(FFT, KnownSpectraOfSizeEight)
{
    using E = TypeParam;
    for (unsigned int m = 0; m < 8; ++m) {
        SCOPED_TRACE("impulse at " + std::to_string(m));
        std::vector<E> x(8);
        x[m] = E(1);
        const auto spectrum = TestFixture::Complex(3, {x.begin(), x.end()});
        const auto real = TestFixture::RealRun(3, x);
        for (unsigned int k = 0; k < 8; ++k) {
            const auto root = fft_test::EighthRoot(k * m);
            EXPECT_TRUE(Agrees<E>(root.real(), spectrum[k].real(), 1)) << "bin " << k;
            EXPECT_TRUE(Agrees<E>(root.imag(), spectrum[k].imag(), 1)) << "bin " << k;
            if (k > 4) continue;
            EXPECT_TRUE(Agrees<E>(root.real(), real[2 * k], 1)) << "real, bin " << k;
            EXPECT_TRUE(Agrees<E>(root.imag(), real[2 * k + 1], 1)) << "real, bin " << k;
        }
        EXPECT_TRUE(SameBits(E(0), real[1]) && SameBits(E(0), real[9]));
        const auto back = TestFixture::RealRun(3, real, true);
        for (unsigned int n = 0; n < 8; ++n) EXPECT_TRUE(Agrees<E>(n == m ? 1 : 0, back[n], 1)) << n;
    }
    const long double r2 = 2.414213562373095, r0 = 0.41421356237309515;
    const long double re[8] = {4, -1, 0, -1, 0, -1, 0, -1}, im[8] = {0, r2, 0, r0, 0, -r0, 0, -r2};
    const std::vector<E> step = {0, 0, 0, 0, 1, 1, 1, 1};
    const auto spectrum = TestFixture::Complex(3, {step.begin(), step.end()});
    const auto real = TestFixture::RealRun(3, step);
    for (unsigned int k = 0; k < 8; ++k) {
        EXPECT_TRUE(Agrees<E>(re[k], spectrum[k].real(), 2) && Agrees<E>(im[k], spectrum[k].imag(), 2)) << k;
        if (k <= 4) {
            EXPECT_TRUE(Agrees<E>(re[k], real[2 * k], 2) && Agrees<E>(im[k], real[2 * k + 1], 2)) << k;
        }
    }
    const long double shifted[10] = {4, 0, -r2, -1, 0, 0, r0, 1, 0, 0};
    const auto other = TestFixture::RealRun(3, {0, 0, 1, 1, 1, 1, 0, 0});
    for (unsigned int i = 0; i < 10; ++i) EXPECT_TRUE(Agrees<E>(shifted[i], other[i], 2)) << i;
}

// Compared by value: a zero may come out as -0.
TYPED_TEST(FFT, ZerosStayExactlyZero)
{
    using E = TypeParam;
    for (unsigned int order : {1u, 2u, 3u, 8u}) {
        const std::vector<E> zeros(1u << order);
        for (bool inverse : {false, true}) {
            for (const auto& v : TestFixture::Complex(order, {zeros.begin(), zeros.end()}, inverse)) EXPECT_EQ(v, E(0));
        }
        const auto spectrum = TestFixture::RealRun(order, zeros);
        for (E v : spectrum) EXPECT_EQ(v, E(0));
        for (E v : TestFixture::RealRun(order, spectrum, true)) EXPECT_EQ(v, E(0));
    }
}

// On data in [0, 1), where the relative form of the rule means something.
// The real state is reused: its scratch keeps nothing between calls.
TYPED_TEST(FFT, ForwardThenInverseAtOrderEight)
{
    using E = TypeParam;
    const std::uint32_t seed = 31;
    SCOPED_TRACE(SeedTrace(seed));
    const auto x = kestaccel_test::RandomComplex<E>(256, seed, E(0), E(1));
    const auto back = TestFixture::Complex(8, TestFixture::Complex(8, x), true);
    const auto samples = kestaccel_test::RandomReals<E>(256, seed + 1, E(0), E(1));
    StateHolder<typename TestFixture::Real> state(8);
    const auto spectrum = TestFixture::RealRun(8, samples, false, state.get());
    const auto realBack = TestFixture::RealRun(8, spectrum, true, state.get());
    for (unsigned int i = 0; i < 256; ++i) {
        EXPECT_TRUE(Agrees<E>(x[i].real(), back[i].real(), 100) && Agrees<E>(x[i].imag(), back[i].imag(), 100)) << i;
        EXPECT_TRUE(Agrees<E>(samples[i], realBack[i], 100)) << i;
    }
    EXPECT_TRUE(SameBitsArray(spectrum, TestFixture::RealRun(8, samples, false, state.get())));
}

// The DC and Nyquist imaginary entries p and q add (p + q (-1)^n) / N.
TYPED_TEST(FFT, RealInverseReadsDcAndNyquistImaginaryParts)
{
    using E = TypeParam;
    const auto x = TestFixture::RealRun(3, {1, 1, 1, 0, 1, 0, 1, 0, 1, E(0.5)}, true);
    for (unsigned int n = 0; n < 8; ++n) {
        const long double expected = (n == 0 ? 1.0L : 0.0L) + (1.0L + 0.5L * (n % 2 ? -1 : 1)) / 8;
        EXPECT_TRUE(Agrees<E>(expected, x[n], 1)) << n;
    }
}

// Every placement gives the bits of the interleaved transform in place:
// out of place, overlapping, and split arrays distinct, in place, or with
// the imaginary destination over the real source.
TYPED_TEST(FFT, LayoutsAndPlacementsAgreeBitForBit)
{
    using E = TypeParam;
    for (unsigned int order = 1; order <= 12; ++order) {
        const unsigned int n = 1u << order;
        const std::uint32_t seed = 40 + order;
        SCOPED_TRACE(SeedTrace(seed) + ", order " + std::to_string(order));
        const auto re = kestaccel_test::RandomReals<E>(n, seed), im = kestaccel_test::RandomReals<E>(n, seed + 500);
        const auto pairs = Pairs(re.data(), im.data(), n);
        StateHolder<typename TestFixture::Interleaved> inter(order);
        StateHolder<typename TestFixture::Deinterleaved> split(order);
        for (bool inverse : {false, true}) {
            SCOPED_TRACE(inverse ? "inverse" : "forward");
            auto expected = pairs;
            Transform(inverse, inter.get(), expected.data(), expected.data());
            ASSERT_TRUE(SameBitsArray(expected, TestFixture::Complex(order, pairs, inverse))) << "out of place";
            std::vector<std::complex<E>> shifted(n + 3);
            std::copy(pairs.begin(), pairs.end(), shifted.begin() + 3);
            Transform(inverse, inter.get(), shifted.data() + 3, shifted.data() + 1);
            ASSERT_TRUE(SameBitsArray(expected.data(), shifted.data() + 1, n)) << "overlapping";

            GuardedBuffer<E> outRe(n), outIm(n);
            Transform(inverse, split.get(), re.data(), im.data(), outRe.data(), outIm.data());
            EXPECT_TRUE(outRe.Intact() && outIm.Intact());
            ASSERT_TRUE(SameBitsArray(expected, Pairs(outRe.data(), outIm.data(), n))) << "split";
            auto inPlaceRe = re, inPlaceIm = im;
            Transform(inverse, split.get(), inPlaceRe.data(), inPlaceIm.data(), inPlaceRe.data(), inPlaceIm.data());
            ASSERT_TRUE(SameBitsArray(expected, Pairs(inPlaceRe.data(), inPlaceIm.data(), n))) << "split in place";
            std::vector<E> storage(3 * n), overRe(n);
            std::copy(re.begin(), re.end(), storage.begin() + n / 2);
            std::copy(im.begin(), im.end(), storage.begin() + 2 * n);
            Transform(inverse, split.get(), storage.data() + n / 2, storage.data() + 2 * n, overRe.data(), storage.data());
            ASSERT_TRUE(SameBitsArray(expected, Pairs(overRe.data(), storage.data(), n))) << "split overlapping";
        }
    }
}

// Only the low five bits of the order count: 32 is one point, copied
// unscaled (the real one with a zero imaginary part); 33 is order 1, a sum
// and a difference in that operand order, the real inverse ignoring the
// imaginary entries.
TYPED_TEST(FFT, OrdersOneThirtyTwoAndThirtyThree)
{
    using E = TypeParam;
    const std::complex<E> one(E(-0.0), E(3.5));
    EXPECT_TRUE(SameBits(one, TestFixture::Complex(32, {one})[0]));
    EXPECT_TRUE(SameBits(one, TestFixture::Complex(32, {one}, true)[0]));
    StateHolder<typename TestFixture::Deinterleaved> state(32);
    E outRe = E(9), outIm = E(9);
    const E* parts = reinterpret_cast<const E*>(&one);
    Transform(true, state.get(), parts, parts + 1, &outRe, &outIm);
    EXPECT_TRUE(SameBits(one, std::complex<E>(outRe, outIm)));
    const auto real = TestFixture::RealRun(32, {E(-0.0)});
    EXPECT_TRUE(SameBits(E(-0.0), real[0]) && SameBits(E(0), real[1]));
    EXPECT_TRUE(SameBits(E(-2.5), TestFixture::RealRun(32, {E(-2.5), E(7), E(9)}, true)[0]));

    const E a = E(0.1), b = E(0.7), nan = std::numeric_limits<E>::quiet_NaN();
    const std::vector<std::complex<E>> two = {{E(1.25), E(-2)}, {E(0.5), E(7)}};
    for (unsigned int order : {1u, 33u}) {
        SCOPED_TRACE("order " + std::to_string(order));
        EXPECT_TRUE(SameBitsArray({{E(1.25) + E(0.5), E(-2) + E(7)}, {E(1.25) - E(0.5), E(-2) - E(7)}},
                                  TestFixture::Complex(order, two)));
        EXPECT_TRUE(SameBitsArray(TestFixture::Complex(1, two, true), TestFixture::Complex(order, two, true)));
        EXPECT_TRUE(SameBitsArray({E(b + a), E(0), E(a - b), E(0)}, TestFixture::RealRun(order, {a, b})));
        EXPECT_TRUE(SameBitsArray({E((b + a) * E(0.5)), E((a - b) * E(0.5))},
                                  TestFixture::RealRun(order, {a, nan, b, nan}, true)));
    }
}


// N = 1024 and 4096 on data in [-1, 1): RMS and worst error relative to the
// oracle's RMS, printed; the bounds sit a few times above what the method
// reaches (the twiddle drift dominates in double), far below a wrong factor.
TYPED_TEST(FFT, AccuracyAgainstDirectDFT)
{
    using E = TypeParam;
    const double rmsBound = sizeof(E) == 4 ? 4e-7 : 5e-13, maxBound = sizeof(E) == 4 ? 1.5e-6 : 2e-12;
    for (bool real : {false, true}) {
        for (unsigned int order : {10u, 12u}) {
            const unsigned int n = 1u << order, bins = real ? n / 2 + 1 : n;
            const std::uint32_t seed = (real ? 2000 : 1000) + order;
            SCOPED_TRACE(kestaccel_test::SeedTrace(seed) + ", N " + std::to_string(n) + (real ? ", real" : ", complex"));
            std::vector<std::complex<E>> x(n), spectrum(bins);
            if (real) {
                const auto samples = kestaccel_test::RandomReals<E>(n, seed);
                std::copy(samples.begin(), samples.end(), x.begin());
                StateHolder<typename TestFixture::Real> state(order);
                Transform(false, state.get(), samples.data(), reinterpret_cast<E*>(spectrum.data()));
            } else {
                x = kestaccel_test::RandomComplex<E>(n, seed);
                StateHolder<typename TestFixture::Interleaved> state(order);
                Transform(false, state.get(), x.data(), spectrum.data());
            }
            const auto oracle = fft_test::DirectDFT(std::vector<std::complex<long double>>(x.begin(), x.end()));
            long double errSquares = 0, refSquares = 0, worst = 0;
            for (unsigned int k = 0; k < bins; ++k) {
                const long double err = std::abs(std::complex<long double>(spectrum[k]) - oracle[k]);
                errSquares += err * err;
                refSquares += std::norm(oracle[k]);
                worst = std::fmax(worst, err);
            }
            const long double refRms = std::sqrt(refSquares / bins);
            const double rms = static_cast<double>(std::sqrt(errSquares / bins) / refRms);
            const double max = static_cast<double>(worst / refRms);
            std::printf("%s %s N=%u: rms %.3g, max %.3g\n", real ? "real" : "complex", sizeof(E) == 4 ? "float" : "double", n, rms, max);
            EXPECT_LT(rms, rmsBound);
            EXPECT_LT(max, maxBound);
        }
    }
}

// The plan holds every table and scratch buffer: no transform allocates.
TYPED_TEST(FFT, TransformsAllocateNothing)
{
    KESTACCEL_REQUIRE_ALLOCATION_COUNTING();
    using E = TypeParam;
    for (unsigned int order : {1u, 2u, 3u, 10u}) {
        const unsigned int n = 1u << order;
        StateHolder<typename TestFixture::Real> real(order);
        StateHolder<typename TestFixture::Interleaved> inter(order);
        StateHolder<typename TestFixture::Deinterleaved> split(order);
        std::vector<E> a(2 * n + 2, E(0.5)), b(2 * n + 2);
        std::vector<std::complex<E>> c(n, E(0.25)), d(n);
        kestaccel_test::ResetAllocationTally();
        for (bool inverse : {false, true}) {
            Transform(inverse, real.get(), a.data(), b.data());
            Transform(inverse, inter.get(), c.data(), d.data());
            Transform(inverse, inter.get(), c.data(), c.data());
            Transform(inverse, split.get(), a.data(), a.data() + n, b.data(), b.data() + n);
            Transform(inverse, split.get(), a.data(), a.data() + n, a.data(), a.data() + n);
        }
        EXPECT_EQ(0u, kestaccel_test::CurrentAllocationTally().news) << "order " << order;
    }
}

}  // namespace
