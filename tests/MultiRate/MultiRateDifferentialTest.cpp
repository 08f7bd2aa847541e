// The polyphase kernel computes several outputs at once (eight cycles side by
// side, or four consecutive outputs), each with its own sum. These cases run
// every path, at factor pairs, tap counts and start positions that put the
// first outputs into history, against the zero-stuffing model, bit for bit.

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <ostream>
#include <utility>
#include <vector>

#include "MultiRate/MultiRateTestSupport.h"
#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;

struct RateCase {
    unsigned int up;
    unsigned int down;
    unsigned int tapCount;
    int firstPosition;
    unsigned int cycles;
};

std::ostream& operator<<(std::ostream& os, const RateCase& c)
{
    return os << "U=" << c.up << " D=" << c.down << " T=" << c.tapCount << " m0=" << c.firstPosition
              << " cycles=" << c.cycles;
}

const std::vector<RateCase>& RateCases()
{
    static const std::vector<RateCase> cases = {
        {1, 1, 20, 0, 40},        // plain FIR: eight lanes read src directly
        {1, 1, 33, -2, 9},
        {5, 1, 60, 3, 30},        // interpolator, lanes straight from src
        {2, 3, 20, 0, 5},
        {2, 3, 21, -4, 37},       // dropped tail tap, start in history
        {3, 2, 10, 1, 41},
        {147, 160, 147 * 8, 0, 19},  // 48000 to 44100: gathered tile
        {160, 147, 160 * 6, 5, 17},  // and back
        {147, 160, 147 * 32, -200, 9},
        {7, 3, 7 * 40, -14, 25},  // long branches: many outputs reach history
        {4, 4, 4 * 9, 2, 33},
        {1, 4, 16, 0, 50},        // decimator: scalar groups of four
        {3, 700, 3 * 8, 0, 20},   // D beyond the tile
        {6, 5, 5, 0, 20},         // no tap survives
        {1, 1, 2100, -1, 2200},   // history run too long to stage
    };
    return cases;
}

template <class T>
class MultiRateDifferential : public ::testing::Test {};
using ElementTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(MultiRateDifferential, ElementTypes);

// Positions are given to MRFInit as a start above a reference of 1000.
unsigned int StartFor(int firstPosition) { return static_cast<unsigned int>(1000 + firstPosition); }

TYPED_TEST(MultiRateDifferential, OneCallMatchesZeroStuffingModel)
{
    using T = TypeParam;
    std::uint32_t seed = 700;
    for (const RateCase& c : RateCases()) {
        SCOPED_TRACE(::testing::PrintToString(c));
        SCOPED_TRACE(SeedTrace(seed));
        const auto taps = RandomReals<T>(c.tapCount, seed++);
        // A first position past the first sample reads that far past the
        // cycles' samples; the model sees the same samples.
        const auto x = RandomReals<T>(std::size_t(c.down) * c.cycles + 2, seed++);
        MultiRateFilter<T> filter(c.up, c.down, taps, 1000, StartFor(c.firstPosition));
        GuardedBuffer<T> out(std::size_t(c.up) * c.cycles);
        filter.Process(x.data(), out.data(), c.cycles);
        const auto expected = ZeroStuffedOutputs(x, taps, c.up, c.down, c.firstPosition, out.size());
        EXPECT_TRUE(SameBitsArray(expected.data(), out.data(), out.size()));
        EXPECT_TRUE(out.Intact());
    }
}

// At D = 1 consecutive calls continue each other exactly: the history carries
// the samples the next block's first outputs need, also when a block is
// shorter than the history.
TYPED_TEST(MultiRateDifferential, StreamingAtUnitDownFactorMatchesOneJointCall)
{
    using T = TypeParam;
    const std::vector<unsigned int> blocks = {3, 1, 0, 7, 2, 16, 5, 9, 1, 24};
    unsigned int total = 0;
    for (unsigned int b : blocks) total += b;
    std::uint32_t seed = 760;
    // The last pair has windows too long to stage beside the block.
    const std::vector<std::pair<unsigned int, unsigned int>> shapes = {
        {1, 1}, {1, 5}, {1, 24}, {3, 1}, {3, 5}, {3, 24}, {8, 1}, {8, 5}, {8, 24}, {1, 4200}};
    for (const auto& shape : shapes) {
        const unsigned int up = shape.first, tapsPerBranch = shape.second;
        SCOPED_TRACE(::testing::Message() << "U=" << up << " L=" << tapsPerBranch);
        SCOPED_TRACE(SeedTrace(seed));
        const auto taps = RandomReals<T>(std::size_t(up) * tapsPerBranch + 1, seed++);
        // The first output lies 2 positions on, so the last ones read up to
        // two samples past the blocks.
        const auto x = RandomReals<T>(total + 2, seed++);
        MultiRateFilter<T> joint(up, 1, taps, 0, 2);
        MultiRateFilter<T> streamed(up, 1, taps, 0, 2);
        std::vector<T> expected(std::size_t(up) * total);
        joint.Process(x.data(), expected.data(), total);
        EXPECT_TRUE(SameBitsArray(ZeroStuffedOutputs(x, taps, up, 1, 2, expected.size()), expected));
        GuardedBuffer<T> out(std::size_t(up) * total);
        std::size_t in = 0;
        for (unsigned int b : blocks) {
            streamed.Process(x.data() + in, out.data() + in * up, b);
            in += b;
        }
        EXPECT_TRUE(SameBitsArray(expected.data(), out.data(), expected.size()));
        EXPECT_TRUE(out.Intact());
    }
}

// Above D = 1 a call leaves the position cycleCount * (D - 1) input samples
// further on than a seamless stream would: the next call's first output lies
// that much later, and it reads its block beyond cycleCount * D samples.
TYPED_TEST(MultiRateDifferential, StreamingAboveUnitDownFactorDriftsByCycleCountTimesDMinusOne)
{
    using T = TypeParam;
    std::uint32_t seed = 780;
    const RateCase cases[] = {{2, 3, 20, 0, 5}, {147, 160, 147 * 8, 3, 9}, {3, 5, 3 * 12, -3, 4}};
    for (const RateCase& c : cases) {
        SCOPED_TRACE(::testing::PrintToString(c));
        SCOPED_TRACE(SeedTrace(seed));
        const auto taps = RandomReals<T>(c.tapCount, seed++);
        const std::size_t consumed = std::size_t(c.down) * c.cycles;
        const std::size_t drift = std::size_t(c.cycles) * (c.down - 1);
        // Block 1, then block 2 with room for the samples read past its end.
        const auto stream = RandomReals<T>(consumed + consumed + drift + 2, seed++);
        MultiRateFilter<T> filter(c.up, c.down, taps, 0, static_cast<unsigned int>(c.firstPosition));
        std::vector<T> first(std::size_t(c.up) * c.cycles), second(first.size());
        filter.Process(stream.data(), first.data(), c.cycles);
        filter.Process(stream.data() + consumed, second.data(), c.cycles);
        const std::int64_t secondStart = c.firstPosition + std::int64_t(consumed + drift) * c.up;
        EXPECT_TRUE(SameBitsArray(ZeroStuffedOutputs(stream, taps, c.up, c.down, c.firstPosition, first.size()), first));
        EXPECT_TRUE(SameBitsArray(ZeroStuffedOutputs(stream, taps, c.up, c.down, secondStart, second.size()), second));
    }
}

TYPED_TEST(MultiRateDifferential, ZeroCyclesWriteNothingAndChangeNothing)
{
    using T = TypeParam;
    const std::uint32_t seed = 790;
    SCOPED_TRACE(SeedTrace(seed));
    const auto taps = RandomReals<T>(30, seed);
    const auto x = RandomReals<T>(60, seed + 1);
    MultiRateFilter<T> touched(3, 2, taps, 0, 0);
    MultiRateFilter<T> untouched(3, 2, taps, 0, 0);
    std::vector<T> a(60), b(60);
    touched.Process(x.data(), a.data(), 4);
    untouched.Process(x.data(), b.data(), 4);
    GuardedBuffer<T> none(0);
    touched.Process(x.data() + 8, none.data(), 0);
    EXPECT_TRUE(none.Intact());
    std::vector<T> same(x.begin(), x.begin() + 4);
    touched.Process(same.data(), same.data(), 0);
    EXPECT_TRUE(SameBitsArray(std::vector<T>(x.begin(), x.begin() + 4), same));
    touched.Process(x.data() + 8, a.data() + 12, 16);
    untouched.Process(x.data() + 8, b.data() + 12, 16);
    EXPECT_TRUE(SameBitsArray(b, a));
}

// Source equal to destination: the results go to scratch and are then
// overwritten by the buffer itself, so the buffer keeps its input; the
// history and position still move on as for separate buffers.
TYPED_TEST(MultiRateDifferential, SameSourceAndDestinationLeavesTheBufferAsItWas)
{
    using T = TypeParam;
    const std::uint32_t seed = 795;
    SCOPED_TRACE(SeedTrace(seed));
    const unsigned int up = 3, down = 1;
    const auto taps = RandomReals<T>(3 * 10, seed);
    const auto x = RandomReals<T>(200, seed + 1);
    MultiRateFilter<T> inPlace(up, down, taps, 0, 0);
    MultiRateFilter<T> separate(up, down, taps, 0, 0);
    std::vector<T> discard(600), expected(600), out(600);

    std::size_t in = 0;
    for (unsigned int cycles : {4u, 2u, 9u, 1u}) {
        // The buffer must hold the cycles * U outputs that are computed in
        // scratch and the cycles * D samples that are read.
        std::vector<T> buffer(std::size_t(up) * cycles);
        std::copy(x.begin() + std::ptrdiff_t(in), x.begin() + std::ptrdiff_t(in + cycles), buffer.begin());
        const std::vector<T> before = buffer;
        inPlace.Process(buffer.data(), buffer.data(), cycles);
        EXPECT_TRUE(SameBitsArray(before, buffer));
        separate.Process(x.data() + in, discard.data(), cycles);
        in += cycles;
    }
    inPlace.Process(x.data() + in, out.data(), 50);
    separate.Process(x.data() + in, expected.data(), 50);
    EXPECT_TRUE(SameBitsArray(expected, out));
}

}  // namespace
