// FIR filter: the outputs and the delay line against a plain loop written
// here, the block and chunk paths, the single-sample form, the setters, and
// the refusal of impossible tap counts.

#include <kestaccel/FIR.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <stdexcept>
#include <vector>

#include "support/AllocationCount.h"
#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
using kestaccel::FIRState_Float;
namespace kf = kestaccel::filter;

// The filter as written down: one float sum per output from +0, taps[k] times
// x[i - k] for k from the oldest sample (k = m) to the newest (k = 0).
struct PlainFIR {
    std::vector<float> taps;
    std::vector<float> history;  // last m inputs, oldest first

    std::vector<float> Run(const std::vector<float>& input)
    {
        const std::size_t m = taps.size() - 1;
        std::vector<float> x(history);
        x.insert(x.end(), input.begin(), input.end());
        std::vector<float> out(input.size());
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
    FIRState_Float* state = nullptr;
    Filter(const std::vector<float>& taps, const float* delayLine)
    {
        kf::FIRInit(&state, taps.data(), static_cast<unsigned int>(taps.size()), delayLine);
    }
    ~Filter() { kf::FIRFree(state); }
    std::vector<float> DelayLine(std::size_t m) const
    {
        std::vector<float> line(m);
        kf::FIRGetDlyLine(state, line.data());
        return line;
    }
};

std::vector<float> Filtered(FIRState_Float* state, const std::vector<float>& input)
{
    GuardedBuffer<float> out(input.size());
    kf::FIR(state, static_cast<unsigned int>(input.size()), input.data(), out.data());
    EXPECT_TRUE(out.Intact());
    return out.values();
}

// ---------------------------------------------------------------------------
// The block form against the plain loop, bit for bit, over tap counts and
// block lengths that reach the eight-output body, its remainder, blocks
// shorter than the delay line and blocks that straddle its end.
// ---------------------------------------------------------------------------
struct Shape {
    unsigned int taps;
    unsigned int count;
};

class FIRAgainstPlainLoop : public ::testing::TestWithParam<Shape> {};

TEST_P(FIRAgainstPlainLoop, SameBitsAndSameDelayLine)
{
    const Shape shape = GetParam();
    const std::uint32_t seed = 1000 + shape.taps * 7 + shape.count;
    SCOPED_TRACE(SeedTrace(seed));
    PlainFIR plain{RandomReals<float>(shape.taps, seed), RandomReals<float>(shape.taps - 1, seed + 1)};
    Filter filter(plain.taps, plain.history.data());
    const auto input = RandomReals<float>(shape.count, seed + 2, -4.0f, 4.0f);

    const auto expected = plain.Run(input);
    const auto actual = Filtered(filter.state, input);
    EXPECT_TRUE(SameBitsArray(expected, actual));
    EXPECT_TRUE(SameBitsArray(plain.history, filter.DelayLine(shape.taps - 1)));
}

std::vector<Shape> Shapes()
{
    std::vector<Shape> shapes;
    for (unsigned int taps : {1u, 2u, 3u, 5u, 8u, 9u, 16u, 17u, 31u, 64u, 100u, 256u}) {
        for (unsigned int count : {1u, 2u, 7u, 8u, 9u, 15u, 16u, 17u, 63u, 99u, 255u, 256u, 257u, 1024u, 1031u}) {
            shapes.push_back({taps, count});
        }
    }
    return shapes;
}

INSTANTIATE_TEST_SUITE_P(TapsAndLengths, FIRAgainstPlainLoop, ::testing::ValuesIn(Shapes()),
                         [](const ::testing::TestParamInfo<Shape>& info) {
                             return "taps" + std::to_string(info.param.taps) + "_count" +
                                    std::to_string(info.param.count);
                         });

// Many calls of uneven lengths give the bits of one plain pass over the
// whole stream: the delay line carries exactly the history each call needs.
TEST(FIRStream, UnevenBlocksMatchOnePass)
{
    const std::uint32_t seed = 77;
    SCOPED_TRACE(SeedTrace(seed));
    const unsigned int tapCount = 37;
    PlainFIR plain{RandomReals<float>(tapCount, seed), std::vector<float>(tapCount - 1, 0.0f)};
    Filter filter(plain.taps, nullptr);
    const auto input = RandomReals<float>(3000, seed + 1);
    const auto expected = plain.Run(input);

    std::vector<float> actual;
    std::size_t at = 0;
    for (unsigned int length : {1u, 3u, 35u, 36u, 37u, 8u, 0u, 600u, 2u, 1000u}) {
        std::vector<float> part(input.begin() + static_cast<std::ptrdiff_t>(at),
                                input.begin() + static_cast<std::ptrdiff_t>(at + length));
        const auto out = Filtered(filter.state, part);
        actual.insert(actual.end(), out.begin(), out.end());
        at += length;
    }
    std::vector<float> rest(input.begin() + static_cast<std::ptrdiff_t>(at), input.end());
    const auto out = Filtered(filter.state, rest);
    actual.insert(actual.end(), out.begin(), out.end());
    EXPECT_TRUE(SameBitsArray(expected, actual));
}

TEST(FIRStream, OneBlockOf512EqualsTwoOf256)
{
    const std::uint32_t seed = 512;
    SCOPED_TRACE(SeedTrace(seed));
    const auto taps = RandomReals<float>(33, seed);
    const auto history = RandomReals<float>(32, seed + 1);
    const auto input = RandomReals<float>(512, seed + 2);
    Filter whole(taps, history.data()), halves(taps, history.data());

    const auto one = Filtered(whole.state, input);
    const auto first = Filtered(halves.state, std::vector<float>(input.begin(), input.begin() + 256));
    const auto second = Filtered(halves.state, std::vector<float>(input.begin() + 256, input.end()));
    std::vector<float> two(first);
    two.insert(two.end(), second.begin(), second.end());
    EXPECT_TRUE(SameBitsArray(one, two));
    EXPECT_TRUE(SameBitsArray(whole.DelayLine(32), halves.DelayLine(32)));
}

// A block shorter than the delay line shifts it and appends; a longer one
// replaces it with its own last samples.
TEST(FIRStream, DelayLineShiftsOrIsReplaced)
{
    const std::vector<float> taps = {0.5f, 0.25f, 0.125f, 0.0625f, 1.0f};
    const std::vector<float> history = {1.0f, 2.0f, 3.0f, 4.0f};
    {
        Filter filter(taps, history.data());
        Filtered(filter.state, {5.0f, 6.0f});
        EXPECT_TRUE(SameBitsArray(std::vector<float>{3.0f, 4.0f, 5.0f, 6.0f}, filter.DelayLine(4)));
    }
    {
        Filter filter(taps, history.data());
        Filtered(filter.state, {5.0f, 6.0f, 7.0f, 8.0f, 9.0f, 10.0f});
        EXPECT_TRUE(SameBitsArray(std::vector<float>{7.0f, 8.0f, 9.0f, 10.0f}, filter.DelayLine(4)));
    }
}

// ---------------------------------------------------------------------------
// Overlapping source and destination: the chunks through scratch.
// ---------------------------------------------------------------------------
TEST(FIROverlap, InPlaceEqualsSeparateBuffers)
{
    for (unsigned int tapCount : {5u, 300u}) {
        for (unsigned int count : {1u, 511u, 512u, 513u, 800u, 1600u}) {
            const std::uint32_t seed = tapCount * 10000 + count;
            SCOPED_TRACE(SeedTrace(seed));
            const auto taps = RandomReals<float>(tapCount, seed);
            const auto history = RandomReals<float>(tapCount - 1, seed + 1);
            const auto input = RandomReals<float>(count, seed + 2);
            Filter separate(taps, history.data()), inPlace(taps, history.data());

            const auto expected = Filtered(separate.state, input);
            GuardedBuffer<float> buffer(count);
            std::memcpy(buffer.data(), input.data(), count * sizeof(float));
            kf::FIR(inPlace.state, count, buffer.data(), buffer.data());
            EXPECT_TRUE(buffer.Intact());
            EXPECT_TRUE(SameBitsArray(expected, buffer.values()));
            EXPECT_TRUE(SameBitsArray(separate.DelayLine(tapCount - 1), inPlace.DelayLine(tapCount - 1)));
        }
    }
}

// The chunked path modelled here: each chunk of at most 512 samples is read
// whole from the buffer as it stands, then its outputs are written at the
// destination. A destination above the source by fewer than 512 samples so
// feeds outputs back as inputs once the block is longer than one chunk.
std::vector<float> ChunkedModel(PlainFIR& plain, std::vector<float> buffer, std::size_t srcAt, std::size_t dstAt,
                                std::size_t count)
{
    for (std::size_t done = 0; done < count;) {
        const std::size_t chunk = std::min<std::size_t>(512, count - done);
        std::vector<float> in(buffer.begin() + static_cast<std::ptrdiff_t>(srcAt + done),
                              buffer.begin() + static_cast<std::ptrdiff_t>(srcAt + done + chunk));
        const auto out = plain.Run(in);
        std::copy(out.begin(), out.end(), buffer.begin() + static_cast<std::ptrdiff_t>(dstAt + done));
        done += chunk;
    }
    return buffer;
}

TEST(FIROverlap, PartialOverlapFollowsTheChunks)
{
    struct Case {
        std::size_t srcAt, dstAt, count;
    };
    const Case cases[] = {{0, 0, 1200}, {7, 0, 1500}, {0, 7, 400}, {0, 7, 512}, {0, 7, 1300}, {0, 600, 1200}};
    for (const Case& c : cases) {
        const std::uint32_t seed = static_cast<std::uint32_t>(c.srcAt * 100000 + c.dstAt * 1000 + c.count);
        SCOPED_TRACE(SeedTrace(seed));
        const auto taps = RandomReals<float>(11, seed);
        const auto history = RandomReals<float>(10, seed + 1);
        const auto original = RandomReals<float>(std::max(c.srcAt, c.dstAt) + c.count, seed + 2);
        PlainFIR plain{taps, history};
        const auto expected = ChunkedModel(plain, original, c.srcAt, c.dstAt, c.count);

        Filter filter(taps, history.data());
        GuardedBuffer<float> buffer(original.size());
        std::memcpy(buffer.data(), original.data(), original.size() * sizeof(float));
        kf::FIR(filter.state, static_cast<unsigned int>(c.count), buffer.data() + c.srcAt, buffer.data() + c.dstAt);
        EXPECT_TRUE(buffer.Intact());
        EXPECT_TRUE(SameBitsArray(expected, buffer.values()));
        EXPECT_TRUE(SameBitsArray(plain.history, filter.DelayLine(10)));
    }
}

TEST(FIROverlap, CountZeroTouchesNothing)
{
    const auto taps = RandomReals<float>(6, 5);
    const auto history = RandomReals<float>(5, 6);
    Filter filter(taps, history.data());
    GuardedBuffer<float> buffer(0);
    const float source = 1.0f;
    kf::FIR(filter.state, 0, &source, buffer.data());
    kf::FIR(filter.state, 0, buffer.data(), buffer.data());
    EXPECT_TRUE(buffer.Intact());
    EXPECT_TRUE(SameBitsArray(history, filter.DelayLine(5)));
}

// ---------------------------------------------------------------------------
// The single-sample form.
// ---------------------------------------------------------------------------
TEST(FIRSingleSample, MatchesTheBlockFormAndStoresNothing)
{
    for (unsigned int tapCount : {1u, 2u, 8u, 9u, 65u}) {
        const std::uint32_t seed = 300 + tapCount;
        SCOPED_TRACE(SeedTrace(seed));
        const auto taps = RandomReals<float>(tapCount, seed);
        const auto history = RandomReals<float>(tapCount - 1, seed + 1);
        const auto samples = RandomReals<float>(16, seed + 2);
        Filter filter(taps, history.data());
        for (float sample : samples) {
            PlainFIR plain{taps, history};
            const float expected = plain.Run({sample})[0];
            EXPECT_TRUE(SameBits(expected, kf::FIR(filter.state, sample)));
            EXPECT_TRUE(SameBits(expected, kf::FIR(filter.state, sample)));
        }
        EXPECT_TRUE(SameBitsArray(history, filter.DelayLine(tapCount - 1)));
    }
}

// With one tap each output is +0 plus the product: a product of -0 becomes +0.
TEST(FIRSingleSample, OneTapAddsTheProductToPositiveZero)
{
    const std::vector<float> taps = {-1.5f};
    Filter filter(taps, nullptr);
    EXPECT_TRUE(SameBits(0.0f, kf::FIR(filter.state, 0.0f)));
    EXPECT_TRUE(SameBits(-3.0f, kf::FIR(filter.state, 2.0f)));
    const auto out = Filtered(filter.state, {0.0f, 2.0f, -0.0f});
    EXPECT_TRUE(SameBitsArray(std::vector<float>{0.0f, -3.0f, 0.0f}, out));
}

// Every sum starts at +0: negative taps on zero input give products of -0,
// and every output, in the eight-output body as in the remainder, is +0.
TEST(FIRSingleSample, NegativeZeroProductsSumToPositiveZero)
{
    for (unsigned int tapCount : {1u, 5u, 12u}) {
        SCOPED_TRACE(tapCount);
        Filter filter(std::vector<float>(tapCount, -0.75f), nullptr);
        std::vector<float> zeros(21, 0.0f);
        EXPECT_TRUE(SameBitsArray(std::vector<float>(21, 0.0f), Filtered(filter.state, zeros)));
        EXPECT_TRUE(SameBits(0.0f, kf::FIR(filter.state, 0.0f)));
    }
}

// ---------------------------------------------------------------------------
// Setters and getters.
// ---------------------------------------------------------------------------
TEST(FIRState, DelayLineSavedAndRestoredReplaysExactly)
{
    const std::uint32_t seed = 41;
    SCOPED_TRACE(SeedTrace(seed));
    const auto taps = RandomReals<float>(20, seed);
    Filter filter(taps, nullptr);
    Filtered(filter.state, RandomReals<float>(100, seed + 1));
    const auto saved = filter.DelayLine(19);
    const auto next = RandomReals<float>(50, seed + 2);
    const auto first = Filtered(filter.state, next);
    kf::FIRSetDlyLine(filter.state, saved.data());
    const auto again = Filtered(filter.state, next);
    EXPECT_TRUE(SameBitsArray(first, again));
}

TEST(FIRState, NullDelayLineClearsIt)
{
    const std::uint32_t seed = 42;
    SCOPED_TRACE(SeedTrace(seed));
    const auto taps = RandomReals<float>(7, seed);
    const auto history = RandomReals<float>(6, seed + 1);
    Filter filter(taps, history.data());
    kf::FIRSetDlyLine(filter.state, nullptr);
    EXPECT_TRUE(SameBitsArray(std::vector<float>(6, 0.0f), filter.DelayLine(6)));
}

TEST(FIRState, NewTapsKeepTheDelayLine)
{
    const std::uint32_t seed = 43;
    SCOPED_TRACE(SeedTrace(seed));
    const auto history = RandomReals<float>(9, seed);
    // Null taps at creation leave every tap at zero; FIRSetTaps mends that.
    FIRState_Float* blank = nullptr;
    kf::FIRInit(&blank, nullptr, 10, history.data());
    const auto input = RandomReals<float>(20, seed + 1);
    const auto zeros = Filtered(blank, input);
    EXPECT_TRUE(SameBitsArray(std::vector<float>(20, 0.0f), zeros));

    kf::FIRSetDlyLine(blank, history.data());
    const auto taps = RandomReals<float>(10, seed + 2);
    kf::FIRSetTaps(blank, taps.data());
    EXPECT_TRUE(SameBitsArray(history, [&] {
        std::vector<float> line(9);
        kf::FIRGetDlyLine(blank, line.data());
        return line;
    }()));
    PlainFIR plain{taps, history};
    EXPECT_TRUE(SameBitsArray(plain.Run(input), Filtered(blank, input)));
    kf::FIRFree(blank);
}

TEST(FIRState, OneTapHasAnEmptyDelayLine)
{
    Filter filter({2.0f}, nullptr);
    GuardedBuffer<float> out(0);
    kf::FIRGetDlyLine(filter.state, out.data());
    EXPECT_TRUE(out.Intact());
    const float ignored = 5.0f;
    kf::FIRSetDlyLine(filter.state, &ignored);
    EXPECT_TRUE(SameBits(6.0f, kf::FIR(filter.state, 3.0f)));
}

TEST(FIRState, WorkBufferSizeIsAlwaysZero)
{
    for (unsigned int tapCount : {0u, 1u, 64u, 4096u, 0xFFFFFFFFu}) {
        EXPECT_EQ(0u, kf::FIRGetWorkBufferSize(tapCount)) << tapCount;
    }
}

// Free gives back every block that Init took, and ignores null.
TEST(FIRState, FreeReleasesEverythingAndAcceptsNull)
{
    KESTACCEL_REQUIRE_ALLOCATION_COUNTING();
    const auto taps = RandomReals<float>(12, 44);
    ResetAllocationTally();
    FIRState_Float* state = nullptr;
    kf::FIRInit(&state, taps.data(), 12, nullptr);
    kf::FIRFree(state);
    kf::FIRFree(nullptr);
    const AllocationTally tally = CurrentAllocationTally();
    EXPECT_EQ(tally.news, tally.deletes);
}

// ---------------------------------------------------------------------------
// Impossible tap counts, and allocation.
// ---------------------------------------------------------------------------
TEST(FIRInitFailure, VectorTooLongWithoutAllocatingMuch)
{
    for (unsigned int tapCount : {0u, 0x80000000u, 0x80000001u, 0xFFFFFFFFu}) {
        SCOPED_TRACE(tapCount);
        const float taps[1] = {1.0f};
        auto* const sentinel = reinterpret_cast<FIRState_Float*>(static_cast<std::uintptr_t>(0x1234));
        FIRState_Float* state = sentinel;
        bool threwLengthError = false;
        bool rightText = false;
        ResetAllocationTally();
        try {
            kf::FIRInit(&state, tapCount == 0 ? taps : nullptr, tapCount, nullptr);
        } catch (const std::length_error& e) {
            threwLengthError = true;
            rightText = std::strcmp(e.what(), "vector too long") == 0;
        }
        const AllocationTally tally = CurrentAllocationTally();
        EXPECT_TRUE(threwLengthError);
        EXPECT_TRUE(rightText);
        EXPECT_EQ(sentinel, state);
        if (LibraryAllocationsAreCounted()) {
            EXPECT_EQ(tally.news, tally.deletes) << "the half-built record was not released";
            EXPECT_LT(tally.largest, std::size_t(1) << 20);
        }
    }
}

TEST(FIRAllocation, FilteringAllocatesNothing)
{
    KESTACCEL_REQUIRE_ALLOCATION_COUNTING();
    const auto taps = RandomReals<float>(24, 8);
    const auto input = RandomReals<float>(1500, 9);
    Filter filter(taps, nullptr);
    std::vector<float> out(input.size());
    std::vector<float> buffer(input);
    ResetAllocationTally();
    kf::FIR(filter.state, 1500, input.data(), out.data());
    kf::FIR(filter.state, 1500, buffer.data(), buffer.data());
    kf::FIR(filter.state, 0.5f);
    const AllocationTally tally = CurrentAllocationTally();
    EXPECT_EQ(0u, tally.news);
}

}  // namespace
