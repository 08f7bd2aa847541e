// Interleave and Deinterleave against the plain frame-outer loops, values
// moved bits and all, also on overlapping buffers.

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
TYPED_TEST_SUITE(LayoutTest, FloatingTypes);

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

// The plain loops, frames outer and ascending: on overlapping buffers they
// read values written by earlier elements.
template <class T>
void PlainInterleave(unsigned int channels, unsigned int frames, const T* const* sources, T* dst)
{
    for (unsigned int f = 0; f < frames; ++f)
        for (unsigned int c = 0; c < channels; ++c) dst[f * channels + c] = sources[c][f];
}

template <class T>
void PlainDeinterleave(unsigned int channels, unsigned int frames, const T* src, T* const* destinations)
{
    for (unsigned int f = 0; f < frames; ++f)
        for (unsigned int c = 0; c < channels; ++c) destinations[c][f] = src[f * channels + c];
}

// Both ways on every size; two channels also through the two-buffer forms.
TYPED_TEST(LayoutTest, MatchPlainLoops)
{
    using T = TypeParam;
    for (unsigned int channels : {1u, 2u, 3u, 5u, 8u}) {
        for (unsigned int frames : SizesWithZero()) {
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
            }
            PlainInterleave(channels, frames, sources.data(), interleaved.data());
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

// The interleaved buffer over the first channel and the reverse, two channels
// in the two-buffer forms, three in the N-channel forms.
TYPED_TEST(LayoutTest, OverlapFollowsAscendingOrder)
{
    using T = TypeParam;
    for (unsigned int n : {5u, 19u, 64u, 1023u}) {
        const auto second = Samples<T>(n, 330 + n), third = Samples<T>(n, 340 + n);
        for (unsigned int channels : {2u, 3u}) {
            SCOPED_TRACE(::testing::Message() << "count " << n << " channels " << channels);
            auto got = Samples<T>(channels * n, 300 + n + channels), want = got;
            const T* const gotSources[] = {got.data(), second.data(), third.data()};
            const T* const wantSources[] = {want.data(), second.data(), third.data()};
            if (channels == 2) ku::Interleave(n, got.data(), second.data(), got.data());
            else ku::Interleave(channels, n, gotSources, got.data());
            PlainInterleave(channels, n, wantSources, want.data());
            EXPECT_TRUE(SameBitsArray(want, got)) << "interleave";

            auto gotSplit = Samples<T>(channels * n, 320 + n + channels), wantSplit = gotSplit;
            std::vector<T> gotB(n), gotC(n), wantB(n), wantC(n);
            T* const gotPlanes[] = {gotSplit.data(), gotB.data(), gotC.data()};
            T* const wantPlanes[] = {wantSplit.data(), wantB.data(), wantC.data()};
            if (channels == 2) ku::Deinterleave(n, gotSplit.data(), gotSplit.data(), gotB.data());
            else ku::Deinterleave(channels, n, gotSplit.data(), gotPlanes);
            PlainDeinterleave(channels, n, wantSplit.data(), wantPlanes);
            EXPECT_TRUE(SameBitsArray(wantSplit, gotSplit)) << "deinterleave";
            EXPECT_TRUE(SameBitsArray(wantB, gotB) && SameBitsArray(wantC, gotC)) << "deinterleave";
        }
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
