// Complex transforms through the public interface: known spectra at size 8,
// zeros, round trips, the layouts against each other, and the odd orders.

#include <algorithm>
#include <cmath>
#include <complex>
#include <cstdint>
#include <vector>

#include "FFTTestSupport.h"

namespace {

using namespace kestaccel::transform;
using fft_test::Agrees;
using fft_test::StateHolder;
using kestaccel_test::GuardedBuffer;
using kestaccel_test::RandomReals;
using kestaccel_test::SameBitsArray;
using kestaccel_test::SeedTrace;

template <class E>
class FFTComplex : public ::testing::Test {
protected:
    using Interleaved = typename fft_test::States<E>::Interleaved;
    using Deinterleaved = typename fft_test::States<E>::Deinterleaved;

    static std::vector<std::complex<E>> Forward(unsigned int order, const std::vector<std::complex<E>>& x)
    {
        StateHolder<Interleaved> state(order);
        GuardedBuffer<std::complex<E>> out(x.size());
        FFTFwd(x.data(), out.data(), state.get(), nullptr);
        EXPECT_TRUE(out.Intact());
        return out.values();
    }
    static std::vector<std::complex<E>> Inverse(unsigned int order, const std::vector<std::complex<E>>& x)
    {
        StateHolder<Interleaved> state(order);
        GuardedBuffer<std::complex<E>> out(x.size());
        FFTInv(x.data(), out.data(), state.get(), nullptr);
        EXPECT_TRUE(out.Intact());
        return out.values();
    }
};
using Elements = ::testing::Types<float, double>;
TYPED_TEST_SUITE(FFTComplex, Elements);

TYPED_TEST(FFTComplex, ImpulsesOfSizeEight)
{
    using E = TypeParam;
    for (unsigned int m = 0; m < 8; ++m) {
        SCOPED_TRACE("impulse at " + std::to_string(m));
        std::vector<std::complex<E>> x(8);
        x[m] = E(1);
        const auto spectrum = TestFixture::Forward(3, x);
        for (unsigned int k = 0; k < 8; ++k) {
            const auto root = fft_test::EighthRoot(k * m);
            EXPECT_TRUE(Agrees<E>(root.real(), spectrum[k].real(), 1)) << "bin " << k;
            EXPECT_TRUE(Agrees<E>(root.imag(), spectrum[k].imag(), 1)) << "bin " << k;
        }
    }
}

TYPED_TEST(FFTComplex, StepOfSizeEight)
{
    using E = TypeParam;
    std::vector<std::complex<E>> x = {0, 0, 0, 0, 1, 1, 1, 1};
    const auto spectrum = TestFixture::Forward(3, x);
    const long double re[8] = {4, -1, 0, -1, 0, -1, 0, -1};
    const long double im[8] = {0, 2.414213562373095, 0, 0.41421356237309515, 0, -0.41421356237309515, 0,
                               -2.414213562373095};
    for (unsigned int k = 0; k < 8; ++k) {
        EXPECT_TRUE(Agrees<E>(re[k], spectrum[k].real(), 2)) << "bin " << k;
        EXPECT_TRUE(Agrees<E>(im[k], spectrum[k].imag(), 2)) << "bin " << k;
    }
}

TYPED_TEST(FFTComplex, ZerosStayZero)
{
    using E = TypeParam;
    for (unsigned int order : {1u, 2u, 3u, 8u}) {
        const std::vector<std::complex<E>> x(1u << order);
        for (const auto& v : TestFixture::Forward(order, x)) {
            EXPECT_EQ(v.real(), E(0));
            EXPECT_EQ(v.imag(), E(0));
        }
        for (const auto& v : TestFixture::Inverse(order, x)) {
            EXPECT_EQ(v.real(), E(0));
            EXPECT_EQ(v.imag(), E(0));
        }
    }
}

// On data in [0, 1): the relative form of the rule is meaningful there.
TYPED_TEST(FFTComplex, ForwardThenInverseAtOrderEight)
{
    using E = TypeParam;
    const std::uint32_t seed = 31;
    SCOPED_TRACE(SeedTrace(seed));
    const auto x = kestaccel_test::RandomComplex<E>(256, seed, E(0), E(1));
    const auto back = TestFixture::Inverse(8, TestFixture::Forward(8, x));
    for (unsigned int i = 0; i < 256; ++i) {
        EXPECT_TRUE(Agrees<E>(x[i].real(), back[i].real(), 100)) << i;
        EXPECT_TRUE(Agrees<E>(x[i].imag(), back[i].imag(), 100)) << i;
    }

    StateHolder<typename TestFixture::Deinterleaved> state(8);
    std::vector<E> re(256), im(256), outRe(256), outIm(256);
    for (unsigned int i = 0; i < 256; ++i) {
        re[i] = x[i].real();
        im[i] = x[i].imag();
    }
    FFTFwd(re.data(), im.data(), outRe.data(), outIm.data(), state.get(), nullptr);
    FFTInv(outRe.data(), outIm.data(), outRe.data(), outIm.data(), state.get(), nullptr);
    for (unsigned int i = 0; i < 256; ++i) {
        EXPECT_TRUE(Agrees<E>(re[i], outRe[i], 100)) << i;
        EXPECT_TRUE(Agrees<E>(im[i], outIm[i], 100)) << i;
    }
}

// Both layouts run one kernel on the same pairs, so their results agree bit
// for bit, also when the source is the destination.
TYPED_TEST(FFTComplex, LayoutsAgreeBitForBit)
{
    using E = TypeParam;
    for (unsigned int order = 1; order <= 12; ++order) {
        const unsigned int n = 1u << order;
        const std::uint32_t seed = 40 + order;
        SCOPED_TRACE(SeedTrace(seed) + ", order " + std::to_string(order));
        const auto re = RandomReals<E>(n, seed), im = RandomReals<E>(n, seed + 500);
        std::vector<std::complex<E>> pairs(n);
        for (unsigned int i = 0; i < n; ++i) pairs[i] = {re[i], im[i]};
        StateHolder<typename TestFixture::Interleaved> inter(order);
        StateHolder<typename TestFixture::Deinterleaved> deinter(order);
        for (bool inverse : {false, true}) {
            SCOPED_TRACE(inverse ? "inverse" : "forward");
            std::vector<std::complex<E>> out = pairs;  // in place
            GuardedBuffer<E> outRe(n), outIm(n);
            if (inverse) {
                FFTInv(out.data(), out.data(), inter.get(), nullptr);
                FFTInv(re.data(), im.data(), outRe.data(), outIm.data(), deinter.get(), nullptr);
            } else {
                FFTFwd(out.data(), out.data(), inter.get(), nullptr);
                FFTFwd(re.data(), im.data(), outRe.data(), outIm.data(), deinter.get(), nullptr);
            }
            EXPECT_TRUE(outRe.Intact());
            EXPECT_TRUE(outIm.Intact());
            std::vector<E> expectRe(n), expectIm(n);
            for (unsigned int i = 0; i < n; ++i) {
                expectRe[i] = out[i].real();
                expectIm[i] = out[i].imag();
            }
            ASSERT_TRUE(SameBitsArray(expectRe, outRe.values()));
            ASSERT_TRUE(SameBitsArray(expectIm, outIm.values()));

            // Split arrays transformed in place give the same bits again.
            std::vector<E> inPlaceRe = re, inPlaceIm = im;
            if (inverse) {
                FFTInv(inPlaceRe.data(), inPlaceIm.data(), inPlaceRe.data(), inPlaceIm.data(), deinter.get(), nullptr);
            } else {
                FFTFwd(inPlaceRe.data(), inPlaceIm.data(), inPlaceRe.data(), inPlaceIm.data(), deinter.get(), nullptr);
            }
            ASSERT_TRUE(SameBitsArray(expectRe, inPlaceRe));
            ASSERT_TRUE(SameBitsArray(expectIm, inPlaceIm));
        }
    }
}

// A destination that overlaps the source without coinciding: the data is
// moved first, so the result is the transform of the source as it was.
TYPED_TEST(FFTComplex, OverlappingSourceAndDestination)
{
    using E = TypeParam;
    const unsigned int order = 7, n = 128;
    const std::uint32_t seed = 88;
    SCOPED_TRACE(SeedTrace(seed));
    const auto x = kestaccel_test::RandomComplex<E>(n, seed);
    const auto expectForward = TestFixture::Forward(order, x), expectInverse = TestFixture::Inverse(order, x);
    StateHolder<typename TestFixture::Interleaved> state(order);
    for (bool inverse : {false, true}) {
        std::vector<std::complex<E>> buffer(n + 3);
        std::copy(x.begin(), x.end(), buffer.begin() + 3);
        if (inverse) {
            FFTInv(buffer.data() + 3, buffer.data() + 1, state.get(), nullptr);
        } else {
            FFTFwd(buffer.data() + 3, buffer.data() + 1, state.get(), nullptr);
        }
        const auto& expected = inverse ? expectInverse : expectForward;
        for (unsigned int k = 0; k < n; ++k) ASSERT_TRUE(kestaccel_test::SameBits(expected[k], buffer[k + 1])) << k;
    }

    // Split arrays: the imaginary destination overlaps the real source.
    StateHolder<typename TestFixture::Deinterleaved> split(order);
    std::vector<E> storage(3 * n), outRe(n);
    for (unsigned int i = 0; i < n; ++i) {
        storage[n / 2 + i] = x[i].real();
        storage[2 * n + i] = x[i].imag();
    }
    FFTFwd(storage.data() + n / 2, storage.data() + 2 * n, outRe.data(), storage.data(), split.get(), nullptr);
    for (unsigned int k = 0; k < n; ++k) {
        ASSERT_TRUE(kestaccel_test::SameBits(expectForward[k].real(), outRe[k])) << k;
        ASSERT_TRUE(kestaccel_test::SameBits(expectForward[k].imag(), storage[k])) << k;
    }
}

// The inverse is the forward transform of the conjugate, conjugated and
// scaled by 1/N with one multiplication per component.
TYPED_TEST(FFTComplex, InverseIsScaledConjugateOfForward)
{
    using E = TypeParam;
    const unsigned int order = 6, n = 64;
    const std::uint32_t seed = 77;
    SCOPED_TRACE(SeedTrace(seed));
    const auto x = kestaccel_test::RandomComplex<E>(n, seed);
    std::vector<std::complex<E>> conj(n);
    for (unsigned int i = 0; i < n; ++i) conj[i] = {x[i].real(), -x[i].imag()};
    const auto forward = TestFixture::Forward(order, conj);
    const auto inverse = TestFixture::Inverse(order, x);
    const E scale = E(1) / E(n);
    for (unsigned int i = 0; i < n; ++i) {
        EXPECT_TRUE(kestaccel_test::SameBits(forward[i].real() * scale, inverse[i].real())) << i;
        EXPECT_TRUE(kestaccel_test::SameBits(forward[i].imag() * -scale, inverse[i].imag())) << i;
    }
}

// Order 32 means one point: copied, neither conjugated nor scaled. Order 33
// means two points, the same transform as order 1.
TYPED_TEST(FFTComplex, OrdersActThroughLowFiveBits)
{
    using E = TypeParam;
    const std::vector<std::complex<E>> one = {{E(-0.0), E(3.5)}};
    EXPECT_TRUE(kestaccel_test::SameBits(one[0], TestFixture::Forward(32, one)[0]));
    EXPECT_TRUE(kestaccel_test::SameBits(one[0], TestFixture::Inverse(32, one)[0]));

    const std::vector<std::complex<E>> two = {{E(1.25), E(-2)}, {E(0.5), E(7)}};
    const auto f1 = TestFixture::Forward(1, two), f33 = TestFixture::Forward(33, two);
    const auto i1 = TestFixture::Inverse(1, two), i33 = TestFixture::Inverse(33, two);
    for (unsigned int k = 0; k < 2; ++k) {
        EXPECT_TRUE(kestaccel_test::SameBits(f1[k], f33[k]));
        EXPECT_TRUE(kestaccel_test::SameBits(i1[k], i33[k]));
    }
    // Order 1: a sum and a difference, in that operand order.
    EXPECT_TRUE(kestaccel_test::SameBits(std::complex<E>(E(1.25) + E(0.5), E(-2) + E(7)), f1[0]));
    EXPECT_TRUE(kestaccel_test::SameBits(std::complex<E>(E(1.25) - E(0.5), E(-2) - E(7)), f1[1]));

    StateHolder<typename TestFixture::Deinterleaved> state(32);
    E re = E(-0.0), im = E(3.5), outRe = E(9), outIm = E(9);
    FFTInv(&re, &im, &outRe, &outIm, state.get(), nullptr);
    EXPECT_TRUE(kestaccel_test::SameBits(E(-0.0), outRe));
    EXPECT_TRUE(kestaccel_test::SameBits(E(3.5), outIm));
}

}  // namespace
