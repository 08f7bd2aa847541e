// Single calls of the multi-rate filter against hand-worked values and
// against the zero-stuffing model of MultiRateTestSupport.h, bit for bit.

#include <gtest/gtest.h>

#include <cstdint>
#include <vector>

#include "MultiRate/MultiRateTestSupport.h"
#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;

template <class T>
class MultiRateExact : public ::testing::Test {};
using ElementTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(MultiRateExact, ElementTypes);

// x[u] = u + 1: every sample names its own index.
template <class T>
std::vector<T> Ramp(std::size_t count)
{
    std::vector<T> x(count);
    for (std::size_t u = 0; u < count; ++u) x[u] = T(u + 1);
    return x;
}

// Taps 1, 1000, 1000000 and zeros: the output at position m is
// x_up[m] + 1000 x_up[m - 1] + 1000000 x_up[m - 2], which says where m lies.
template <class T>
std::vector<T> MarkerTaps(std::size_t count)
{
    std::vector<T> taps(count, T(0));
    taps[0] = T(1);
    taps[1] = T(1000);
    taps[2] = T(1000000);
    return taps;
}

TYPED_TEST(MultiRateExact, UnitFactorsReturnTheTapsForAnImpulse)
{
    using T = TypeParam;
    const std::uint32_t seed = 601;
    SCOPED_TRACE(SeedTrace(seed));
    const auto taps = RandomReals<T>(20, seed);
    MultiRateFilter<T> filter(1, 1, taps, 0, 0);
    std::vector<T> impulse(20, T(0));
    impulse[0] = T(1);
    GuardedBuffer<T> out(20);
    filter.Process(impulse.data(), out.data(), 20);
    // One product is the tap itself and every other is a zero: exact.
    EXPECT_TRUE(SameBitsArray(taps.data(), out.data(), 20));
    EXPECT_TRUE(out.Intact());
}

// U = 2, D = 3, first position 0 (equal reference and start): the outputs lie
// at 0, 3, 6, 9, i.e. phase/inputIndex 0/0, 1/1, 0/3, 1/4.
TYPED_TEST(MultiRateExact, TwoUpThreeDownOutputsLieEveryThirdPosition)
{
    using T = TypeParam;
    const auto x = Ramp<T>(6);
    MultiRateFilter<T> filter(2, 3, MarkerTaps<T>(20), 1, 1);
    GuardedBuffer<T> out(4);
    filter.Process(x.data(), out.data(), 2);
    // m = 0: x[0]; m = 3: 1000 x[1]; m = 6: x[3] + 1000000 x[2];
    // m = 9: 1000 x[4].
    const std::vector<T> expected = {T(1), T(2000), T(3000004), T(5000)};
    EXPECT_TRUE(SameBitsArray(expected.data(), out.data(), 4));
    EXPECT_TRUE(out.Intact());
}

TYPED_TEST(MultiRateExact, FiveCyclesOfTwoUpThreeDownReadFifteenWriteTen)
{
    using T = TypeParam;
    const std::uint32_t seed = 602;
    SCOPED_TRACE(SeedTrace(seed));
    const auto taps = RandomReals<T>(20, seed);
    const auto x = RandomReals<T>(15, seed + 1);
    MultiRateFilter<T> filter(2, 3, taps, 1, 1);
    GuardedBuffer<T> out(10);
    filter.Process(x.data(), out.data(), 5);
    const auto expected = ZeroStuffedOutputs(x, taps, 2, 3, 0, 10);
    EXPECT_TRUE(SameBitsArray(expected.data(), out.data(), 10));
    EXPECT_TRUE(out.Intact());
}

// Start 7 above the reference at U = 3: phase 1, inputIndex 2, position 7.
TYPED_TEST(MultiRateExact, StartAboveReferenceSplitsIntoPhaseAndIndex)
{
    using T = TypeParam;
    const auto x = Ramp<T>(4);
    MultiRateFilter<T> filter(3, 1, MarkerTaps<T>(20), 100, 107);
    GuardedBuffer<T> out(3);
    filter.Process(x.data(), out.data(), 1);
    // m = 7: 1000 x[2]; m = 8: 1000000 x[2]; m = 9: x[3].
    const std::vector<T> expected = {T(3000), T(3000000), T(4)};
    EXPECT_TRUE(SameBitsArray(expected.data(), out.data(), 3));
    EXPECT_TRUE(out.Intact());
}

// Start 7 below the reference (the unsigned difference wraps): phase 2,
// inputIndex -3, position -7; the first input sample is met at output 7.
TYPED_TEST(MultiRateExact, StartBelowReferenceBeginsInThePast)
{
    using T = TypeParam;
    const auto x = Ramp<T>(4);
    MultiRateFilter<T> filter(3, 1, MarkerTaps<T>(20), 7, 0);
    GuardedBuffer<T> out(12);
    filter.Process(x.data(), out.data(), 4);
    const std::vector<T> expected = {T(0), T(0), T(0), T(0), T(0), T(0), T(0), T(1), T(1000), T(1000000), T(2), T(2000)};
    EXPECT_TRUE(SameBitsArray(expected.data(), out.data(), 12));
    EXPECT_TRUE(out.Intact());
}

// The T % U taps past the last whole group of U take no part.
TYPED_TEST(MultiRateExact, TailTapsBeyondTheLastWholeGroupAreDropped)
{
    using T = TypeParam;
    const std::uint32_t seed = 603;
    SCOPED_TRACE(SeedTrace(seed));
    auto taps = RandomReals<T>(10, seed);
    const auto x = RandomReals<T>(40, seed + 1);
    std::vector<T> withoutTail(taps.begin(), taps.begin() + 9);
    taps[9] = T(1e30);
    MultiRateFilter<T> full(3, 2, taps, 0, 0);
    MultiRateFilter<T> trimmed(3, 2, withoutTail, 0, 0);
    std::vector<T> a(60), b(60);
    full.Process(x.data(), a.data(), 20);
    trimmed.Process(x.data(), b.data(), 20);
    EXPECT_TRUE(SameBitsArray(b, a));
    const auto expected = ZeroStuffedOutputs(x, withoutTail, 3, 2, 0, 60);
    EXPECT_TRUE(SameBitsArray(expected, a));
}

TYPED_TEST(MultiRateExact, FewerTapsThanBranchesGivePositiveZeros)
{
    using T = TypeParam;
    const auto x = RandomReals<T>(30, 604, T(-2), T(-1));
    for (unsigned int tapCount : {0u, 1u, 3u}) {
        SCOPED_TRACE(tapCount);
        const std::vector<T> taps(tapCount, T(-0.5));
        // Starting 8 positions back, the first outputs reach into history;
        // 40 outputs then run through every later path as well.
        MultiRateFilter<T> filter(4, 3, taps, 8, 0);
        GuardedBuffer<T> out(40, T(7));
        filter.Process(x.data(), out.data(), 10);
        for (std::size_t n = 0; n < 40; ++n) EXPECT_TRUE(SameBits(T(0), out[n])) << "at " << n;
        EXPECT_TRUE(out.Intact());
    }
}

// One tap at U = 1: each output is +0 plus the product, so a product of -0
// comes out as +0. Thirteen samples: eight side by side, four, then one, with
// zeros of both signs in each group.
TYPED_TEST(MultiRateExact, OneTapAddsTheProductToPositiveZero)
{
    using T = TypeParam;
    const std::vector<T> taps = {T(-1.5)};
    const std::vector<T> x = {T(0), -T(0), T(2), T(-3), T(1e-30), T(0), T(5), -T(0),
                              -T(0), T(0), T(0.25), T(-1), T(0)};
    MultiRateFilter<T> filter(1, 1, taps, 0, 0);
    GuardedBuffer<T> out(x.size());
    filter.Process(x.data(), out.data(), static_cast<unsigned int>(x.size()));
    for (std::size_t n = 0; n < x.size(); ++n) {
        const T expected = T(0) + x[n] * taps[0];
        EXPECT_TRUE(SameBits(expected, out[n])) << "at " << n;
    }
    for (std::size_t n : {0, 1, 8, 9, 12}) EXPECT_TRUE(SameBits(T(0), out[n])) << "at " << n;
    EXPECT_TRUE(out.Intact());
}

TYPED_TEST(MultiRateExact, ReservedVectorIsNeverRead)
{
    using T = TypeParam;
    const std::uint32_t seed = 605;
    SCOPED_TRACE(SeedTrace(seed));
    const auto taps = RandomReals<T>(24, seed);
    const auto x = RandomReals<T>(30, seed + 1);
    const PoolVector<T> garbage(24, T(123.25));
    MultiRateFilter<T> plain(3, 2, taps, 0, 0);
    MultiRateFilter<T> withReserved(3, 2, taps, 0, 0, garbage);
    std::vector<T> a(45), b(45);
    plain.Process(x.data(), a.data(), 15);
    withReserved.Process(x.data(), b.data(), 15);
    EXPECT_TRUE(SameBitsArray(a, b));
}

// With D = 0 the position stands still: every output is the first one.
TYPED_TEST(MultiRateExact, ZeroDownFactorRepeatsOnePosition)
{
    using T = TypeParam;
    const std::uint32_t seed = 606;
    SCOPED_TRACE(SeedTrace(seed));
    const auto taps = RandomReals<T>(12, seed);
    const auto x = RandomReals<T>(8, seed + 1);
    MultiRateFilter<T> filter(2, 0, taps, 0, 11);
    GuardedBuffer<T> out(6);
    filter.Process(x.data(), out.data(), 3);
    const T expected = ZeroStuffedOutput(x, taps, 2, 11);
    for (std::size_t n = 0; n < 6; ++n) EXPECT_TRUE(SameBits(expected, out[n])) << "at " << n;
    EXPECT_TRUE(out.Intact());
}

}  // namespace
