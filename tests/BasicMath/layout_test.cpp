// Interleave and Deinterleave: hand-worked layouts, equality of the two-channel
// and N-channel forms, bit-for-bit agreement with plain loops on random data
// (NaN payloads and -0 included), overlapping buffers and empty calls.

#include <kestaccel/BasicMath.h>

#include <cmath>
#include <limits>
#include <vector>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace ku = kestaccel::utility;

template <class T>
class LayoutTest : public ::testing::Test {};
using LayoutTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(LayoutTest, LayoutTypes);

// Random values with a few patterns that a value-changing move would lose.
template <class T>
std::vector<T> Samples(std::size_t count, std::uint32_t seed)
{
    auto values = RandomReals<T>(count, seed, T(-4), T(4));
    const T special[] = {T(-0.0), FromBits<T>(Bits(std::numeric_limits<T>::quiet_NaN()) | 5u),
                         std::numeric_limits<T>::infinity(), std::numeric_limits<T>::denorm_min()};
    for (std::size_t i = 0; i < count; i += 7) values[i] = special[(i / 7) % 4];
    return values;
}

TYPED_TEST(LayoutTest, TwoChannelsHandWorked)
{
    using T = TypeParam;
    const T a[] = {1, 2}, b[] = {3, 4};
    GuardedBuffer<T> interleaved(4);
    ku::Interleave(2, a, b, interleaved.data());
    EXPECT_EQ((std::vector<T>{1, 3, 2, 4}), interleaved.values());
    EXPECT_TRUE(interleaved.Intact());

    GuardedBuffer<T> left(2), right(2);
    ku::Deinterleave(2, interleaved.data(), left.data(), right.data());
    EXPECT_EQ((std::vector<T>{1, 2}), left.values());
    EXPECT_EQ((std::vector<T>{3, 4}), right.values());
    EXPECT_TRUE(left.Intact());
    EXPECT_TRUE(right.Intact());
}

TYPED_TEST(LayoutTest, ThreeChannelsHandWorked)
{
    using T = TypeParam;
    const T src[] = {1, 2, 3, 4, 5, 6};
    GuardedBuffer<T> c0(2), c1(2), c2(2);
    T* const destinations[] = {c0.data(), c1.data(), c2.data()};
    ku::Deinterleave(3, 2, src, destinations);
    EXPECT_EQ((std::vector<T>{1, 4}), c0.values());
    EXPECT_EQ((std::vector<T>{2, 5}), c1.values());
    EXPECT_EQ((std::vector<T>{3, 6}), c2.values());
    EXPECT_TRUE(c0.Intact() && c1.Intact() && c2.Intact());

    const T* const sources[] = {c0.data(), c1.data(), c2.data()};
    GuardedBuffer<T> back(6);
    ku::Interleave(3, 2, sources, back.data());
    EXPECT_EQ((std::vector<T>(src, src + 6)), back.values());
    EXPECT_TRUE(back.Intact());
}

TYPED_TEST(LayoutTest, OneChannelCopies)
{
    using T = TypeParam;
    const auto src = Samples<T>(33, 11);
    GuardedBuffer<T> dst(33);
    const T* const sources[] = {src.data()};
    ku::Interleave(1, 33, sources, dst.data());
    EXPECT_TRUE(SameBitsArray(src, dst.values()));
    EXPECT_TRUE(dst.Intact());

    GuardedBuffer<T> back(33);
    T* const destinations[] = {back.data()};
    ku::Deinterleave(1, 33, src.data(), destinations);
    EXPECT_TRUE(SameBitsArray(src, back.values()));
    EXPECT_TRUE(back.Intact());
}

// Both forms against plain loops written here, at sizes that reach the
// vector body and every tail.
TYPED_TEST(LayoutTest, TwoChannelFormsMatchPlainLoops)
{
    using T = TypeParam;
    for (unsigned int n : InterestingSizes()) {
        const std::uint32_t seed = 100 + n;
        SCOPED_TRACE(SeedTrace(seed));
        const auto a = Samples<T>(n, seed), b = Samples<T>(n, seed + 1), src = Samples<T>(2 * n, seed + 2);

        std::vector<T> expectedInterleaved(2 * n), expectedA(n), expectedB(n);
        for (std::size_t i = 0; i < n; ++i) {
            expectedInterleaved[2 * i] = a[i];
            expectedInterleaved[2 * i + 1] = b[i];
            expectedA[i] = src[2 * i];
            expectedB[i] = src[2 * i + 1];
        }

        GuardedBuffer<T> interleaved(2 * n), viaN(2 * n);
        ku::Interleave(n, a.data(), b.data(), interleaved.data());
        const T* const sources[] = {a.data(), b.data()};
        ku::Interleave(2, n, sources, viaN.data());
        EXPECT_TRUE(SameBitsArray(expectedInterleaved, interleaved.values()));
        EXPECT_TRUE(SameBitsArray(expectedInterleaved, viaN.values()));
        EXPECT_TRUE(interleaved.Intact() && viaN.Intact());

        GuardedBuffer<T> left(n), right(n), leftN(n), rightN(n);
        ku::Deinterleave(n, src.data(), left.data(), right.data());
        T* const destinations[] = {leftN.data(), rightN.data()};
        ku::Deinterleave(2, n, src.data(), destinations);
        EXPECT_TRUE(SameBitsArray(expectedA, left.values()));
        EXPECT_TRUE(SameBitsArray(expectedB, right.values()));
        EXPECT_TRUE(SameBitsArray(expectedA, leftN.values()));
        EXPECT_TRUE(SameBitsArray(expectedB, rightN.values()));
        EXPECT_TRUE(left.Intact() && right.Intact() && leftN.Intact() && rightN.Intact());
    }
}

TYPED_TEST(LayoutTest, ManyChannelsMatchPlainLoops)
{
    using T = TypeParam;
    for (unsigned int channels : {3u, 5u, 8u}) {
        const unsigned int frames = 37;
        const std::uint32_t seed = 200 + channels;
        SCOPED_TRACE(SeedTrace(seed));
        const auto interleaved = Samples<T>(channels * frames, seed);
        std::vector<std::vector<T>> planes(channels);
        std::vector<T*> destinations(channels);
        for (unsigned int c = 0; c < channels; ++c) {
            planes[c].assign(frames + 1, T(7));
            destinations[c] = planes[c].data();
        }
        ku::Deinterleave(channels, frames, interleaved.data(), destinations.data());
        for (unsigned int c = 0; c < channels; ++c) {
            for (unsigned int f = 0; f < frames; ++f)
                ASSERT_TRUE(SameBits(interleaved[f * channels + c], planes[c][f])) << "channel " << c << " frame " << f;
            EXPECT_EQ(T(7), planes[c][frames]) << "channel " << c << " written past its end";
        }

        std::vector<const T*> sources(planes.size());
        for (unsigned int c = 0; c < channels; ++c) sources[c] = planes[c].data();
        GuardedBuffer<T> back(channels * frames);
        ku::Interleave(channels, frames, sources.data(), back.data());
        EXPECT_TRUE(SameBitsArray(interleaved, back.values()));
        EXPECT_TRUE(back.Intact());
    }
}

// The interleaved destination starts on the first channel's buffer, so each
// frame reads values written by earlier frames: only the frame-outer,
// ascending order gives the plain loop's result.
TYPED_TEST(LayoutTest, InterleaveOverlappingFollowsAscendingOrder)
{
    using T = TypeParam;
    const unsigned int channels = 3, frames = 19;
    auto buffer = Samples<T>(channels * frames, 301);
    const auto second = Samples<T>(frames, 302), third = Samples<T>(frames, 303);

    auto expected = buffer;
    for (std::size_t f = 0; f < frames; ++f) {
        const T* planes[] = {expected.data(), second.data(), third.data()};
        for (std::size_t c = 0; c < channels; ++c) expected[f * channels + c] = planes[c][f];
    }

    const T* const sources[] = {buffer.data(), second.data(), third.data()};
    ku::Interleave(channels, frames, sources, buffer.data());
    EXPECT_TRUE(SameBitsArray(expected, buffer));

    // Two-channel form with dst on a: b's value lands where a is read next.
    for (unsigned int n : {5u, 64u, 1023u}) {
        auto storage = Samples<T>(2 * n, 310 + n);
        const auto b = Samples<T>(n, 320 + n);
        auto reference = storage;
        for (std::size_t i = 0; i < n; ++i) {
            const T ai = reference[i];
            reference[2 * i] = ai;
            reference[2 * i + 1] = b[i];
        }
        ku::Interleave(n, storage.data(), b.data(), storage.data());
        EXPECT_TRUE(SameBitsArray(reference, storage)) << "count " << n;
    }
}

// Deinterleave with the first channel written over its own source: the loop
// reads src[2i], src[2i + 1] before a[i] overwrites them.
TYPED_TEST(LayoutTest, DeinterleaveInPlaceFollowsAscendingOrder)
{
    using T = TypeParam;
    for (unsigned int n : {5u, 64u, 1023u}) {
        auto storage = Samples<T>(2 * n, 330 + n);
        std::vector<T> right(n), expectedRight(n);
        auto reference = storage;
        for (std::size_t i = 0; i < n; ++i) {
            const T even = reference[2 * i], odd = reference[2 * i + 1];
            reference[i] = even;
            expectedRight[i] = odd;
        }
        ku::Deinterleave(n, storage.data(), storage.data(), right.data());
        EXPECT_TRUE(SameBitsArray(reference, storage)) << "count " << n;
        EXPECT_TRUE(SameBitsArray(expectedRight, right)) << "count " << n;
    }
}

TYPED_TEST(LayoutTest, EmptyCallsTouchNothing)
{
    using T = TypeParam;
    ku::Interleave(0u, static_cast<const T*>(nullptr), nullptr, static_cast<T*>(nullptr));
    ku::Deinterleave(0u, static_cast<const T*>(nullptr), static_cast<T*>(nullptr), nullptr);
    // No frames: the pointer array is not read. No channels: nothing is written.
    ku::Interleave(4u, 0u, static_cast<const T* const*>(nullptr), static_cast<T*>(nullptr));
    ku::Deinterleave(4u, 0u, static_cast<const T*>(nullptr), static_cast<T* const*>(nullptr));
    ku::Interleave(0u, 16u, static_cast<const T* const*>(nullptr), static_cast<T*>(nullptr));
    ku::Deinterleave(0u, 16u, static_cast<const T*>(nullptr), static_cast<T* const*>(nullptr));
    GuardedBuffer<T> untouched(0);
    ku::Interleave(0u, untouched.data(), untouched.data(), untouched.data());
    EXPECT_TRUE(untouched.Intact());
}

}  // namespace
