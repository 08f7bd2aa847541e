// FFTImpl as a consumer uses it: the length rounding, rebuilding, its
// transforms against the free functions; and the states' creation and release.

#include <cstdint>
#include <type_traits>
#include <vector>

#include "FFTTestSupport.h"
#include "support/AllocationCount.h"

namespace {

using namespace kestaccel::transform;
using kestaccel_test::SameBitsArray;

template <class E>
class FFTImplTyped : public ::testing::Test {
protected:
    using State = typename fft_test::States<E>::Deinterleaved;
    using Impl = FFTImpl<State, std::complex<E>>;
};
using Elements = ::testing::Types<float, double>;
TYPED_TEST_SUITE(FFTImplTyped, Elements);

// The order rounds the length on a log scale (724 -> 512, 725 -> 1024); a
// nonzero length given to the constructor wins over its order.
TYPED_TEST(FFTImplTyped, LengthTable)
{
    typename TestFixture::Impl impl;
    EXPECT_EQ(impl.GetOrder(), 0u);
    EXPECT_EQ(impl.GetFFTSize(), 0u);
    EXPECT_EQ(impl.GetBlockSize(), 1u);
    const struct {
        unsigned int length, order, block;
    } table[] = {{2, 1, 2},       {3, 2, 4},         {724, 9, 512}, {725, 10, 1024}, {1, 0, 1},
                 {1000, 10, 1024}, {1024, 10, 1024}, {0, 0, 1},     {1, 0, 1}};
    for (const auto& row : table) {
        SCOPED_TRACE("length " + std::to_string(row.length));
        impl.SetFFTSize(row.length);
        EXPECT_EQ(impl.GetOrder(), row.order);
        EXPECT_EQ(impl.GetBlockSize(), row.block);
        EXPECT_EQ(impl.GetFFTSize(), row.length);
        typename TestFixture::Impl constructed(7, row.length);
        EXPECT_EQ(constructed.GetOrder(), row.length == 0 ? 7u : row.order);
        EXPECT_EQ(constructed.GetBlockSize(), row.length == 0 ? 128u : row.block);
        EXPECT_EQ(constructed.GetFFTSize(), row.length);
    }
}

// The bits of a deinterleaved state of the same order, also after the state
// was dropped, resized, or set again unchanged.
TYPED_TEST(FFTImplTyped, TransformsMatchFreeFunctions)
{
    using E = TypeParam;
    typename TestFixture::Impl impl(0, 8);
    impl.SetFFTSize(1);
    for (unsigned int length : {100u, 100u, 1024u, 16u}) {
        impl.SetFFTSize(length);
        const unsigned int n = impl.GetBlockSize();
        const std::uint32_t seed = 90 + length;
        SCOPED_TRACE(kestaccel_test::SeedTrace(seed) + ", length " + std::to_string(length));
        const auto re = kestaccel_test::RandomReals<E>(n, seed), im = kestaccel_test::RandomReals<E>(n, seed + 1);
        fft_test::StateHolder<typename TestFixture::State> state(impl.GetOrder());
        for (bool inverse : {false, true}) {
            std::vector<E> outRe(n), outIm(n), expectRe(n), expectIm(n);
            if (inverse) {
                impl.ProcessInv(re.data(), im.data(), outRe.data(), outIm.data());
            } else {
                impl.ProcessFwd(re.data(), im.data(), outRe.data(), outIm.data());
            }
            fft_test::Transform(inverse, state.get(), re.data(), im.data(), expectRe.data(), expectIm.data());
            EXPECT_TRUE(SameBitsArray(expectRe, outRe) && SameBitsArray(expectIm, outIm)) << inverse;
        }
    }
}

// Pointers: the state types are incomplete to a consumer.
template <class StatePointer>
class FFTState : public ::testing::Test {};
using States = ::testing::Types<kestaccel::FFTState_Float*, kestaccel::FFTState_Double*,
                                kestaccel::FFTState_Complex_Float_Interleaved*,
                                kestaccel::FFTState_Complex_Double_Interleaved*,
                                kestaccel::FFTState_Complex_Float_Deinterleaved*,
                                kestaccel::FFTState_Complex_Double_Deinterleaved*>;
TYPED_TEST_SUITE(FFTState, States);

// Order 0 and null are refused; the work-buffer query always says 0; Free
// gives back every block Init took.
TYPED_TEST(FFTState, InitRefusesOrderZeroAndNull)
{
    using State = std::remove_pointer_t<TypeParam>;
    State* const marker = reinterpret_cast<State*>(std::uintptr_t(0x1234560));
    State* state = marker;
    FFTInit(&state, 0);
    EXPECT_EQ(state, marker);
    FFTInit(static_cast<State**>(nullptr), 5);
    state = nullptr;
    kestaccel_test::ResetAllocationTally();
    FFTInit(&state, 10);
    ASSERT_NE(state, nullptr);
    unsigned int size = 123;
    FFTGetBufSize(state, &size);
    EXPECT_EQ(size, 0u);
    size = 123;
    FFTGetBufSize(static_cast<const State*>(nullptr), &size);
    EXPECT_EQ(size, 0u);
    FFTFree(state);
    FFTFree(static_cast<State*>(nullptr));
    const auto tally = kestaccel_test::CurrentAllocationTally();
    if (kestaccel_test::LibraryAllocationsAreCounted()) {
        EXPECT_EQ(tally.news, tally.deletes);
    }
}

}  // namespace
