// Interleave and Deinterleave: hand-worked layouts, both forms against plain
// loops on random data (NaN payloads and -0 included) for one to eight
// channels, overlapping buffers, which only the frame-outer ascending order
// gets right, and empty calls.

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

TYPED_TEST(LayoutTest, HandWorked)
{
    using T = TypeParam;
    const T a[] = {1, 2}, b[] = {3, 4}, six[] = {1, 2, 3, 4, 5, 6};
    std::vector<T> pair(4), left(2), right(2), c0(2), c1(2), c2(2), back(6);
    ku::Interleave(2, a, b, pair.data());
    ku::Deinterleave(2, pair.data(), left.data(), right.data());
    EXPECT_EQ((std::vector<T>{1, 3, 2, 4}), pair);
    EXPECT_EQ((std::vector<T>{1, 2}), left);
    EXPECT_EQ((std::vector<T>{3, 4}), right);

    T* const planes[] = {c0.data(), c1.data(), c2.data()};
    const T* const sources[] = {c0.data(), c1.data(), c2.data()};
    ku::Deinterleave(3, 2, six, planes);
    ku::Interleave(3, 2, sources, back.data());
    EXPECT_EQ((std::vector<T>{1, 4}), c0);
    EXPECT_EQ((std::vector<T>{2, 5}), c1);
    EXPECT_EQ((std::vector<T>{3, 6}), c2);
    EXPECT_EQ((std::vector<T>(six, six + 6)), back);
}

// Both forms at frame counts that reach the vector body and every tail, 0
// included: random planes interleave as the plain loop does, and that buffer
// deinterleaves into the planes again. One channel copies; two channels
// through the N-channel form give the two-buffer form's result.
TYPED_TEST(LayoutTest, MatchPlainLoops)
{
    using T = TypeParam;
    std::vector<unsigned int> frameCounts = InterestingSizes();
    frameCounts.push_back(0);
    for (unsigned int channels : {1u, 2u, 3u, 5u, 8u}) {
        for (unsigned int frames : frameCounts) {
            const std::uint32_t seed = 100 * channels + frames;
            SCOPED_TRACE(::testing::Message() << SeedTrace(seed) << " channels " << channels << " frames " << frames);
            std::vector<std::vector<T>> planes(channels);
            std::vector<T> interleaved(channels * frames);
            std::vector<GuardedBuffer<T>> outPlanes(channels, GuardedBuffer<T>(frames));
            std::vector<const T*> sources(channels);
            std::vector<T*> destinations(channels);
            for (unsigned int c = 0; c < channels; ++c) {
                planes[c] = Samples<T>(frames, seed + c);
                sources[c] = planes[c].data();
                destinations[c] = outPlanes[c].data();
                for (unsigned int f = 0; f < frames; ++f) interleaved[f * channels + c] = planes[c][f];
            }
            GuardedBuffer<T> out(channels * frames);
            ku::Interleave(channels, frames, sources.data(), out.data());
            ku::Deinterleave(channels, frames, interleaved.data(), destinations.data());
            EXPECT_TRUE(SameBitsArray(interleaved, out.values()));
            EXPECT_TRUE(out.Intact());
            for (unsigned int c = 0; c < channels; ++c) {
                EXPECT_TRUE(SameBitsArray(planes[c], outPlanes[c].values())) << "channel " << c;
                EXPECT_TRUE(outPlanes[c].Intact()) << "channel " << c;
            }
            if (channels != 2) continue;
            GuardedBuffer<T> pair(2 * frames), a(frames), b(frames);
            ku::Interleave(frames, planes[0].data(), planes[1].data(), pair.data());
            ku::Deinterleave(frames, interleaved.data(), a.data(), b.data());
            EXPECT_TRUE(SameBitsArray(interleaved, pair.values()));
            EXPECT_TRUE(SameBitsArray(planes[0], a.values()));
            EXPECT_TRUE(SameBitsArray(planes[1], b.values()));
            EXPECT_TRUE(pair.Intact() && a.Intact() && b.Intact());
        }
    }
}

// A destination on a source, so that elements read values written earlier:
// the interleaved buffer starting on the first channel, and the first channel
// written over the interleaved source, in both forms. Only the frame-outer, ascending order
// gives the plain loop's result.
TYPED_TEST(LayoutTest, OverlapFollowsAscendingOrder)
{
    using T = TypeParam;
    for (unsigned int n : {5u, 19u, 64u, 1023u}) {
        SCOPED_TRACE(::testing::Message() << "count " << n);
        auto three = Samples<T>(3 * n, 300 + n), pair = Samples<T>(2 * n, 310 + n), split = Samples<T>(2 * n, 320 + n);
        auto splitThree = Samples<T>(3 * n, 350 + n);
        const auto second = Samples<T>(n, 330 + n), third = Samples<T>(n, 340 + n);
        auto expectedThree = three, expectedPair = pair, expectedSplit = split, expectedSplitThree = splitThree;
        std::vector<T> right(n), expectedRight(n), mid(n), last(n), expectedMid(n), expectedLast(n);
        for (std::size_t i = 0; i < n; ++i) {
            const T* planes[] = {expectedThree.data(), second.data(), third.data()};
            for (std::size_t c = 0; c < 3; ++c) expectedThree[3 * i + c] = planes[c][i];
            const T ai = expectedPair[i];
            expectedPair[2 * i] = ai;
            expectedPair[2 * i + 1] = second[i];
            const T even = expectedSplit[2 * i], odd = expectedSplit[2 * i + 1];
            expectedSplit[i] = even;
            expectedRight[i] = odd;
            const T x0 = expectedSplitThree[3 * i], x1 = expectedSplitThree[3 * i + 1], x2 = expectedSplitThree[3 * i + 2];
            expectedSplitThree[i] = x0;
            expectedMid[i] = x1;
            expectedLast[i] = x2;
        }
        const T* const sources[] = {three.data(), second.data(), third.data()};
        T* const destinations[] = {splitThree.data(), mid.data(), last.data()};
        ku::Interleave(3, n, sources, three.data());
        ku::Deinterleave(3, n, splitThree.data(), destinations);
        ku::Interleave(n, pair.data(), second.data(), pair.data());
        ku::Deinterleave(n, split.data(), split.data(), right.data());
        EXPECT_TRUE(SameBitsArray(expectedThree, three));
        EXPECT_TRUE(SameBitsArray(expectedPair, pair));
        EXPECT_TRUE(SameBitsArray(expectedSplit, split));
        EXPECT_TRUE(SameBitsArray(expectedRight, right));
        EXPECT_TRUE(SameBitsArray(expectedSplitThree, splitThree));
        EXPECT_TRUE(SameBitsArray(expectedMid, mid) && SameBitsArray(expectedLast, last));
    }
}

// No frames: the pointer array is not read. No channels: nothing is written.
TYPED_TEST(LayoutTest, EmptyCallsTouchNothing)
{
    using T = TypeParam;
    GuardedBuffer<T> untouched(0);
    ku::Interleave(4u, 0u, static_cast<const T* const*>(nullptr), untouched.data());
    ku::Deinterleave(4u, 0u, untouched.data(), static_cast<T* const*>(nullptr));
    ku::Interleave(0u, 16u, static_cast<const T* const*>(nullptr), untouched.data());
    ku::Deinterleave(0u, 16u, untouched.data(), static_cast<T* const*>(nullptr));
    EXPECT_TRUE(untouched.Intact());
}

}  // namespace
