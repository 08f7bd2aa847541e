// FFTImpl as a consumer of the shared library uses it: construction, the
// length rounding, rebuilding, and its transforms against the free functions.

#include <cstdint>
#include <vector>

#include "FFTTestSupport.h"

namespace {

using namespace kestaccel;
using namespace kestaccel::transform;
using kestaccel_test::RandomReals;
using kestaccel_test::SameBitsArray;
using kestaccel_test::SeedTrace;

template <class E>
struct ImplOf;
template <>
struct ImplOf<float> {
    using Type = FFTImpl<FFTState_Complex_Float_Deinterleaved, std::complex<float>>;
};
template <>
struct ImplOf<double> {
    using Type = FFTImpl<FFTState_Complex_Double_Deinterleaved, std::complex<double>>;
};

template <class E>
class FFTImplTyped : public ::testing::Test {
protected:
    using Impl = typename ImplOf<E>::Type;
};
using Elements = ::testing::Types<float, double>;
TYPED_TEST_SUITE(FFTImplTyped, Elements);

TYPED_TEST(FFTImplTyped, DefaultHasNothing)
{
    typename TestFixture::Impl impl;
    EXPECT_EQ(impl.GetOrder(), 0u);
    EXPECT_EQ(impl.GetFFTSize(), 0u);
    EXPECT_EQ(impl.GetBlockSize(), 1u);
}

TYPED_TEST(FFTImplTyped, LengthRoundsToNearestPowerOnLogScale)
{
    const struct {
        unsigned int length, order, block;
    } table[] = {{1, 0, 1}, {2, 1, 2}, {3, 2, 4}, {724, 9, 512}, {725, 10, 1024}, {1000, 10, 1024}, {1024, 10, 1024}, {0, 0, 1}};
    typename TestFixture::Impl impl;
    for (const auto& row : table) {
        SCOPED_TRACE("length " + std::to_string(row.length));
        impl.SetFFTSize(row.length);
        EXPECT_EQ(impl.GetOrder(), row.order);
        EXPECT_EQ(impl.GetBlockSize(), row.block);
        EXPECT_EQ(impl.GetFFTSize(), row.length);
        typename TestFixture::Impl constructed(7, row.length);
        EXPECT_EQ(constructed.GetOrder(), row.length == 0 ? 7u : row.order);
        EXPECT_EQ(constructed.GetFFTSize(), row.length);
    }
}

TYPED_TEST(FFTImplTyped, ConstructorArgumentsAreAlternatives)
{
    typename TestFixture::Impl byOrder(5, 0);
    EXPECT_EQ(byOrder.GetOrder(), 5u);
    EXPECT_EQ(byOrder.GetBlockSize(), 32u);
    EXPECT_EQ(byOrder.GetFFTSize(), 0u);
    typename TestFixture::Impl byLength(3, 1024);
    EXPECT_EQ(byLength.GetOrder(), 10u);
    EXPECT_EQ(byLength.GetBlockSize(), 1024u);
}

// ProcessFwd and ProcessInv run FFTFwd and FFTInv on the owned state: the
// same bits as a deinterleaved state of the same order, also after the
// length changes (and when it is set again unchanged).
TYPED_TEST(FFTImplTyped, TransformsMatchFreeFunctions)
{
    using E = TypeParam;
    using State = typename fft_test::States<E>::Deinterleaved;
    typename TestFixture::Impl impl(4, 0);
    for (unsigned int length : {100u, 100u, 1024u, 16u}) {
        impl.SetFFTSize(length);
        const unsigned int n = impl.GetBlockSize();
        const std::uint32_t seed = 90 + length;
        SCOPED_TRACE(SeedTrace(seed) + ", length " + std::to_string(length));
        const auto re = RandomReals<E>(n, seed), im = RandomReals<E>(n, seed + 1);
        fft_test::StateHolder<State> state(impl.GetOrder());
        std::vector<E> outRe(n), outIm(n), expectRe(n), expectIm(n);
        impl.ProcessFwd(re.data(), im.data(), outRe.data(), outIm.data());
        FFTFwd(re.data(), im.data(), expectRe.data(), expectIm.data(), state.get(), nullptr);
        EXPECT_TRUE(SameBitsArray(expectRe, outRe));
        EXPECT_TRUE(SameBitsArray(expectIm, outIm));
        impl.ProcessInv(re.data(), im.data(), outRe.data(), outIm.data());
        FFTInv(re.data(), im.data(), expectRe.data(), expectIm.data(), state.get(), nullptr);
        EXPECT_TRUE(SameBitsArray(expectRe, outRe));
        EXPECT_TRUE(SameBitsArray(expectIm, outIm));
    }
}

// A length of 0 or 1 after a real one drops the state; a later length builds
// again.
TYPED_TEST(FFTImplTyped, SmallLengthsDropTheState)
{
    using E = TypeParam;
    typename TestFixture::Impl impl(0, 8);
    impl.SetFFTSize(1);
    EXPECT_EQ(impl.GetOrder(), 0u);
    impl.SetFFTSize(0);
    EXPECT_EQ(impl.GetOrder(), 0u);
    impl.SetFFTSize(4);
    ASSERT_EQ(impl.GetBlockSize(), 4u);
    std::vector<E> re = {1, 0, 0, 0}, im(4), outRe(4), outIm(4);
    impl.ProcessFwd(re.data(), im.data(), outRe.data(), outIm.data());
    for (unsigned int k = 0; k < 4; ++k) {
        EXPECT_EQ(outRe[k], E(1));
        EXPECT_EQ(outIm[k], E(0));
    }
}

}  // namespace
