// Complex transforms through the public interface: known spectra at size 8,
// zeros, round trips, the layouts and placements against each other, and
// the odd orders.

#include <algorithm>
#include <complex>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "FFTTestSupport.h"

namespace {

using namespace kestaccel::transform;
using fft_test::Agrees;
using fft_test::StateHolder;
using kestaccel_test::GuardedBuffer;
using kestaccel_test::SameBits;
using kestaccel_test::SameBitsArray;
using kestaccel_test::SeedTrace;

// FFTFwd or FFTInv on any layout; the state goes first.
template <class State, class... Arrays>
void Transform(bool inverse, State* state, Arrays... arrays)
{
    if (inverse) {
        FFTInv(arrays..., state, nullptr);
    } else {
        FFTFwd(arrays..., state, nullptr);
    }
}

template <class E>
std::vector<std::complex<E>> Pairs(const E* re, const E* im, std::size_t n)
{
    std::vector<std::complex<E>> pairs(n);
    for (std::size_t i = 0; i < n; ++i) pairs[i] = {re[i], im[i]};
    return pairs;
}

template <class E>
class FFTComplex : public ::testing::Test {
protected:
    using Interleaved = typename fft_test::States<E>::Interleaved;
    using Deinterleaved = typename fft_test::States<E>::Deinterleaved;

    // Out of place into a guarded buffer, on a state of its own.
    static std::vector<std::complex<E>> Run(unsigned int order, const std::vector<std::complex<E>>& x, bool inverse = false)
    {
        StateHolder<Interleaved> state(order);
        GuardedBuffer<std::complex<E>> out(x.size());
        Transform(inverse, state.get(), x.data(), out.data());
        EXPECT_TRUE(out.Intact());
        return out.values();
    }
};
using Elements = ::testing::Types<float, double>;
TYPED_TEST_SUITE(FFTComplex, Elements);

TYPED_TEST(FFTComplex, KnownSpectraOfSizeEight)
{
    using E = TypeParam;
    for (unsigned int m = 0; m < 8; ++m) {
        SCOPED_TRACE("impulse at " + std::to_string(m));
        std::vector<std::complex<E>> x(8);
        x[m] = E(1);
        const auto spectrum = TestFixture::Run(3, x);
        for (unsigned int k = 0; k < 8; ++k) {
            const auto root = fft_test::EighthRoot(k * m);
            EXPECT_TRUE(Agrees<E>(root.real(), spectrum[k].real(), 1)) << "bin " << k;
            EXPECT_TRUE(Agrees<E>(root.imag(), spectrum[k].imag(), 1)) << "bin " << k;
        }
    }
    const auto step = TestFixture::Run(3, {0, 0, 0, 0, 1, 1, 1, 1});
    const long double re[8] = {4, -1, 0, -1, 0, -1, 0, -1};
    const long double im[8] = {0, 2.414213562373095, 0, 0.41421356237309515, 0, -0.41421356237309515, 0,
                               -2.414213562373095};
    for (unsigned int k = 0; k < 8; ++k) {
        EXPECT_TRUE(Agrees<E>(re[k], step[k].real(), 2)) << "step, bin " << k;
        EXPECT_TRUE(Agrees<E>(im[k], step[k].imag(), 2)) << "step, bin " << k;
    }
}

TYPED_TEST(FFTComplex, ZerosStayZero)
{
    using E = TypeParam;
    for (unsigned int order : {1u, 2u, 3u, 8u}) {
        for (bool inverse : {false, true}) {
            for (const auto& v : TestFixture::Run(order, std::vector<std::complex<E>>(1u << order), inverse)) EXPECT_EQ(v, std::complex<E>());
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
    const auto back = TestFixture::Run(8, TestFixture::Run(8, x), true);
    for (unsigned int i = 0; i < 256; ++i) {
        EXPECT_TRUE(Agrees<E>(x[i].real(), back[i].real(), 100)) << i;
        EXPECT_TRUE(Agrees<E>(x[i].imag(), back[i].imag(), 100)) << i;
    }
}

// Both layouts run one kernel on the same pairs, so every placement gives
// the bits of the interleaved transform in place: out of place, overlapping
// without coinciding (the data is moved first), and split arrays distinct,
// in place, or with the imaginary destination over the real source.
TYPED_TEST(FFTComplex, LayoutsAndPlacementsAgreeBitForBit)
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
            ASSERT_TRUE(SameBitsArray(expected, TestFixture::Run(order, pairs, inverse))) << "out of place";
            std::vector<std::complex<E>> shifted(n + 3);
            std::copy(pairs.begin(), pairs.end(), shifted.begin() + 3);
            Transform(inverse, inter.get(), shifted.data() + 3, shifted.data() + 1);
            ASSERT_TRUE(SameBitsArray(expected.data(), shifted.data() + 1, n)) << "overlapping";

            GuardedBuffer<E> outRe(n), outIm(n);
            Transform(inverse, split.get(), re.data(), im.data(), outRe.data(), outIm.data());
            EXPECT_TRUE(outRe.Intact());
            EXPECT_TRUE(outIm.Intact());
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

// Order 32 means one point: copied, neither conjugated nor scaled. Order 33
// means two points, the same transform as order 1: a sum and a difference,
// in that operand order.
TYPED_TEST(FFTComplex, OrdersActThroughLowFiveBits)
{
    using E = TypeParam;
    const std::vector<std::complex<E>> one = {{E(-0.0), E(3.5)}};
    EXPECT_TRUE(SameBits(one[0], TestFixture::Run(32, one)[0]));
    EXPECT_TRUE(SameBits(one[0], TestFixture::Run(32, one, true)[0]));
    StateHolder<typename TestFixture::Deinterleaved> state(32);
    const E re = E(-0.0), im = E(3.5);
    E outRe = E(9), outIm = E(9);
    FFTInv(&re, &im, &outRe, &outIm, state.get(), nullptr);
    EXPECT_TRUE(SameBits(one[0], std::complex<E>(outRe, outIm)));

    const std::vector<std::complex<E>> two = {{E(1.25), E(-2)}, {E(0.5), E(7)}};
    EXPECT_TRUE(SameBits(std::complex<E>(E(1.25) + E(0.5), E(-2) + E(7)), TestFixture::Run(1, two)[0]));
    EXPECT_TRUE(SameBits(std::complex<E>(E(1.25) - E(0.5), E(-2) - E(7)), TestFixture::Run(1, two)[1]));
    for (bool inverse : {false, true}) {
        EXPECT_TRUE(SameBitsArray(TestFixture::Run(1, two, inverse), TestFixture::Run(33, two, inverse)));
    }
}

}  // namespace
