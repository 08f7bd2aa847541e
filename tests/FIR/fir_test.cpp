// FIR filter: the outputs and the delay line against a plain loop written
// here, the block and chunk paths, the single-sample form, the setters, and
// the refusal of impossible tap counts.

#include <kestaccel/FIR.h>

#include <algorithm>
#include <cstdint>
#include <stdexcept>
#include <string>
#include <vector>

#include "support/AllocationCount.h"
#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace kf = kestaccel::filter;
using Floats = std::vector<float>;

// The filter as written down: one float sum per output from +0, taps[k] times
// x[i - k] for k from the oldest sample (k = m) to the newest (k = 0).
struct PlainFIR {
    Floats taps, history;  // history: the last m inputs, oldest first

    Floats Run(const Floats& input)
    {
        const std::size_t m = taps.size() - 1;
        Floats x(history), out(input.size());
        x.insert(x.end(), input.begin(), input.end());
        for (std::size_t i = 0; i < input.size(); ++i) {
            float sum = 0.0f;
            for (std::size_t k = m + 1; k-- > 0;) {
                const float product = taps[k] * x[m + i - k];
                sum = sum + product;
            }
            out[i] = sum;
        }
        history.assign(x.end() - static_cast<std::ptrdiff_t>(m), x.end());
        return out;
    }
};

// A filter record released at the end of the scope.
struct Filter {
    kestaccel::FIRState_Float* state = nullptr;
    Filter(const Floats& taps, const float* delayLine, bool nullTaps = false)
    {
        kf::FIRInit(&state, nullTaps ? nullptr : taps.data(), static_cast<unsigned int>(taps.size()), delayLine);
    }
    ~Filter() { kf::FIRFree(state); }
    Floats DelayLine(std::size_t m) const
    {
        GuardedBuffer<float> line(m);
        kf::FIRGetDlyLine(state, line.data());
        EXPECT_TRUE(line.Intact());
        return line.values();
    }
    Floats Run(const Floats& input)
    {
        GuardedBuffer<float> out(input.size());
        kf::FIR(state, static_cast<unsigned int>(input.size()), input.data(), out.data());
        EXPECT_TRUE(out.Intact());
        return out.values();
    }
};

Floats Slice(const Floats& v, std::size_t at, std::size_t length)
{
    return Floats(v.begin() + static_cast<std::ptrdiff_t>(at), v.begin() + static_cast<std::ptrdiff_t>(at + length));
}

// The block form against the plain loop, bit for bit, over tap counts and
// block lengths that reach the eight-output body, its remainder, blocks
// shorter than the delay line and blocks that straddle its end. The
// single-sample form gives the same bits and stores nothing: asked twice, it
// sees the same history, and so does the block after it.
TEST(FIR, BothFormsMatchThePlainLoop)
{
    for (unsigned int taps : {1u, 2u, 3u, 8u, 9u, 17u, 64u, 256u}) {
        for (unsigned int count : {1u, 7u, 8u, 9u, 16u, 17u, 63u, 255u, 257u, 1031u}) {
            const std::uint32_t seed = 1000 + taps * 7 + count;
            SCOPED_TRACE(SeedTrace(seed));
            PlainFIR plain{RandomReals<float>(taps, seed), RandomReals<float>(taps - 1, seed + 1)};
            Filter filter(plain.taps, plain.history.data());
            const auto input = RandomReals<float>(count, seed + 2, -4.0f, 4.0f);
            const float first = PlainFIR(plain).Run({input[0]})[0];
            EXPECT_TRUE(SameBits(first, kf::FIR(filter.state, input[0])));
            EXPECT_TRUE(SameBits(first, kf::FIR(filter.state, input[0])));
            EXPECT_TRUE(SameBitsArray(plain.Run(input), filter.Run(input)));
            EXPECT_TRUE(SameBitsArray(plain.history, filter.DelayLine(taps - 1)));
        }
    }
}

// A stream cut into calls of any lengths (one 512 or two 256, uneven pieces,
// empty ones) gives the bits of one plain pass: the delay line carries
// exactly the history each call needs.
TEST(FIR, BlockSplitsMatchOnePass)
{
    const std::vector<unsigned int> splits[] = {{512}, {256, 256}, {1, 3, 35, 36, 37, 8, 0, 600, 2, 1000, 1272}};
    for (const auto& split : splits) {
        const std::uint32_t seed = split.size() > 2 ? 78 : 77;  // 512 and 256 + 256 on the same data
        SCOPED_TRACE(SeedTrace(seed));
        PlainFIR plain{RandomReals<float>(37, seed), RandomReals<float>(36, seed + 1)};
        Filter filter(plain.taps, plain.history.data());
        std::size_t at = 0, total = 0;
        for (unsigned int length : split) total += length;
        const auto input = RandomReals<float>(total, seed + 2);
        Floats actual;
        for (unsigned int length : split) {
            const auto out = filter.Run(Slice(input, at, length));
            actual.insert(actual.end(), out.begin(), out.end());
            at += length;
        }
        EXPECT_TRUE(SameBitsArray(plain.Run(input), actual));
        EXPECT_TRUE(SameBitsArray(plain.history, filter.DelayLine(36)));
    }
}

// Overlapping source and destination run in chunks of at most 512 samples,
// each read whole from the buffer as it stands, then written at the
// destination. Equal pointers so match separate buffers; a destination above
// the source feeds outputs back as inputs once the block exceeds one chunk.
TEST(FIR, OverlapFollowsTheChunks)
{
    struct Case {
        unsigned int taps;
        std::size_t srcAt, dstAt, count;
    };
    const Case cases[] = {{5, 0, 0, 800},  {5, 0, 0, 513},   {300, 0, 0, 1600},  {11, 7, 0, 1500},
                          {11, 0, 7, 400}, {11, 0, 7, 1300}, {11, 0, 600, 1200}, {11, 3, 3, 0}};
    for (const Case& c : cases) {
        const std::uint32_t seed = static_cast<std::uint32_t>(c.taps * 7 + c.srcAt * 100000 + c.dstAt * 1000 + c.count);
        SCOPED_TRACE(SeedTrace(seed));
        PlainFIR plain{RandomReals<float>(c.taps, seed), RandomReals<float>(c.taps - 1, seed + 1)};
        Filter filter(plain.taps, plain.history.data());
        auto expected = RandomReals<float>(std::max(c.srcAt, c.dstAt) + c.count, seed + 2);
        GuardedBuffer<float> buffer(expected.size());
        std::copy(expected.begin(), expected.end(), buffer.data());
        for (std::size_t done = 0; done < c.count; done += 512) {
            const auto out = plain.Run(Slice(expected, c.srcAt + done, std::min<std::size_t>(512, c.count - done)));
            std::copy(out.begin(), out.end(), expected.begin() + static_cast<std::ptrdiff_t>(c.dstAt + done));
        }
        kf::FIR(filter.state, static_cast<unsigned int>(c.count), buffer.data() + c.srcAt, buffer.data() + c.dstAt);
        EXPECT_TRUE(buffer.Intact());
        EXPECT_TRUE(SameBitsArray(expected, buffer.values()));
        EXPECT_TRUE(SameBitsArray(plain.history, filter.DelayLine(c.taps - 1)));
    }
}

// Every sum starts at +0: negative taps on zero input give products of -0,
// and every output, in the eight-output body as in the remainder, is +0.
TEST(FIR, NegativeZeroProductsSumToPositiveZero)
{
    for (unsigned int tapCount : {1u, 5u, 12u}) {
        SCOPED_TRACE(tapCount);
        Filter filter(Floats(tapCount, -0.75f), nullptr);
        EXPECT_TRUE(SameBitsArray(Floats(21, 0.0f), filter.Run(Floats(21, 0.0f))));
        EXPECT_TRUE(SameBits(0.0f, kf::FIR(filter.state, 0.0f)));
    }
}

// Null taps at creation leave every tap at zero until FIRSetTaps, which keeps
// the delay line; a null delay line clears it. No work buffer exists.
TEST(FIR, SettersAndNullArguments)
{
    const std::uint32_t seed = 43;
    SCOPED_TRACE(SeedTrace(seed));
    const auto history = RandomReals<float>(9, seed), input = RandomReals<float>(20, seed + 1);
    const auto taps = RandomReals<float>(10, seed + 2);
    Filter filter(Floats(10), history.data(), true);
    EXPECT_TRUE(SameBitsArray(Floats(20, 0.0f), filter.Run(input)));
    kf::FIRSetDlyLine(filter.state, history.data());
    kf::FIRSetTaps(filter.state, taps.data());
    EXPECT_TRUE(SameBitsArray(history, filter.DelayLine(9)));
    EXPECT_TRUE(SameBitsArray(PlainFIR{taps, history}.Run(input), filter.Run(input)));
    kf::FIRSetDlyLine(filter.state, nullptr);
    EXPECT_TRUE(SameBitsArray(Floats(9, 0.0f), filter.DelayLine(9)));
    for (unsigned int tapCount : {0u, 1u, 64u, 0xFFFFFFFFu}) EXPECT_EQ(0u, kf::FIRGetWorkBufferSize(tapCount));
}

TEST(FIR, ImpossibleTapCountsThrowWithoutAllocatingMuch)
{
    for (unsigned int tapCount : {0u, 0x80000000u, 0x80000001u, 0xFFFFFFFFu}) {
        SCOPED_TRACE(tapCount);
        const float taps[1] = {1.0f};
        auto* const sentinel = reinterpret_cast<kestaccel::FIRState_Float*>(static_cast<std::uintptr_t>(0x1234));
        kestaccel::FIRState_Float* state = sentinel;
        std::string what;
        ResetAllocationTally();
        try {
            kf::FIRInit(&state, tapCount == 0 ? taps : nullptr, tapCount, nullptr);
        } catch (const std::length_error& e) {
            what = e.what();
        }
        const AllocationTally tally = CurrentAllocationTally();
        EXPECT_EQ("vector too long", what);
        EXPECT_EQ(sentinel, state);
        if (LibraryAllocationsAreCounted()) {
            EXPECT_EQ(tally.news, tally.deletes) << "the half-built record was not released";
            EXPECT_LT(tally.largest, std::size_t(1) << 20);
        }
    }
}

// Filtering allocates nothing; Free gives back every block Init took, and
// ignores null.
TEST(FIR, AllocationOnlyAtInit)
{
    KESTACCEL_REQUIRE_ALLOCATION_COUNTING();
    const auto taps = RandomReals<float>(24, 8), input = RandomReals<float>(1500, 9);
    Floats out(input.size()), buffer(input);
    ResetAllocationTally();
    kestaccel::FIRState_Float* state = nullptr;
    kf::FIRInit(&state, taps.data(), 24, nullptr);
    const std::size_t afterInit = CurrentAllocationTally().news;
    kf::FIR(state, 1500, input.data(), out.data());
    kf::FIR(state, 1500, buffer.data(), buffer.data());
    kf::FIR(state, 0.5f);
    EXPECT_EQ(afterInit, CurrentAllocationTally().news);
    kf::FIRFree(state);
    kf::FIRFree(nullptr);
    EXPECT_EQ(CurrentAllocationTally().news, CurrentAllocationTally().deletes);
}

}  // namespace
