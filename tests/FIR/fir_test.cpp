// FIR filter: every form against a plain loop, the chunked overlap path,
// setters, impossible tap counts, allocation, and a lowpass on tones.

#include <kestaccel/FIR.h>

#include <stdexcept>

#include "support/AllocationCount.h"
#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace kf = kestaccel::filter;
using Floats = std::vector<float>;

// One float sum per output from +0, taps[k] times x[i - k] from the oldest
// sample (k = m) to the newest (k = 0).
struct PlainFIR {
    Floats taps, history;  // history: the last m inputs, oldest first

    Floats Run(const Floats& input)
    {
        const std::size_t m = taps.size() - 1;
        Floats x(history), out(input.size());
        x.insert(x.end(), input.begin(), input.end());
        for (std::size_t i = 0; i < input.size(); ++i) {
            float sum = 0.0f;
            for (std::size_t k = m + 1; k-- > 0;) sum = sum + taps[k] * x[m + i - k];
            out[i] = sum;
        }
        history.assign(x.end() - static_cast<std::ptrdiff_t>(m), x.end());
        return out;
    }
};

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

// One call, two calls (512 as 256 + 256) and the single-sample form, which
// stores nothing, over the eight-output body, its remainder and short blocks.
TEST(FIR, AllFormsMatchThePlainLoop)
{
    for (unsigned int taps : {1u, 2u, 3u, 8u, 9u, 17u, 37u, 64u, 256u}) {
        for (unsigned int count : {1u, 7u, 8u, 9u, 16u, 17u, 63u, 255u, 257u, 512u, 1031u}) {
            const std::uint32_t seed = 1000 + taps * 7 + count;
            SCOPED_TRACE(SeedTrace(seed));
            PlainFIR plain{RandomReals<float>(taps, seed), RandomReals<float>(taps - 1, seed + 1)};
            Filter one(plain.taps, plain.history.data()), two(plain.taps, plain.history.data());
            const auto input = RandomReals<float>(count, seed + 2, -4.0f, 4.0f);
            const float first = PlainFIR(plain).Run({input[0]})[0];
            EXPECT_TRUE(SameBits(first, kf::FIR(one.state, input[0])));
            EXPECT_TRUE(SameBits(first, kf::FIR(one.state, input[0])));
            const auto expected = plain.Run(input);
            EXPECT_TRUE(SameBitsArray(expected, one.Run(input)));
            auto halves = two.Run(Floats(input.begin(), input.begin() + count / 2));
            const auto rest = two.Run(Floats(input.begin() + count / 2, input.end()));
            halves.insert(halves.end(), rest.begin(), rest.end());
            EXPECT_TRUE(SameBitsArray(expected, halves));
            EXPECT_TRUE(SameBitsArray(plain.history, one.DelayLine(taps - 1)));
            EXPECT_TRUE(SameBitsArray(plain.history, two.DelayLine(taps - 1)));
        }
    }
}

// Overlapping buffers run in chunks of 512, each read whole before it is
// written: equal pointers match separate buffers; a higher dst feeds back.
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
            const auto from = expected.begin() + c.srcAt + done;
            const auto out = plain.Run(Floats(from, from + std::min<std::size_t>(512, c.count - done)));
            std::copy(out.begin(), out.end(), expected.begin() + static_cast<std::ptrdiff_t>(c.dstAt + done));
        }
        kf::FIR(filter.state, static_cast<unsigned int>(c.count), buffer.data() + c.srcAt, buffer.data() + c.dstAt);
        EXPECT_TRUE(buffer.Intact());
        EXPECT_TRUE(SameBitsArray(expected, buffer.values()));
        EXPECT_TRUE(SameBitsArray(plain.history, filter.DelayLine(c.taps - 1)));
    }
}

// Null taps leave zeros until FIRSetTaps, which keeps the delay line; a null
// delay line clears it. Sums start at +0, so -0 products give +0.
TEST(FIR, SettersNullArgumentsAndSignedZeros)
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
    kf::FIRSetTaps(filter.state, Floats(10, -0.75f).data());
    EXPECT_TRUE(SameBitsArray(Floats(21, 0.0f), filter.Run(Floats(21, 0.0f))));
    EXPECT_TRUE(SameBits(0.0f, kf::FIR(filter.state, 0.0f)));
}

// Impossible tap counts throw before any large or lasting allocation; after
// Init nothing allocates until Free gives every block back.
TEST(FIR, AllocationAndImpossibleTapCounts)
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
        EXPECT_TRUE(!LibraryAllocationsAreCounted() || (tally.news == tally.deletes && tally.largest < (1u << 20)));
    }
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

// A Hamming lowpass at 0.1 passes a low tone and attenuates higher ones by
// what its taps' response predicts.
TEST(FIR, LowpassPassesLowToneAndAttenuatesHighTone)
{
    const unsigned int tapCount = 101;
    std::vector<double> design(tapCount);
    kf::GenerateLowpassFIRCoefficients(0.1, tapCount, design.data(), kestaccel::utility::kDSPWindowHamming, true,
                                       nullptr);
    const Floats taps(design.begin(), design.end());
    Filter filter(taps, nullptr);
    const std::size_t settle = tapCount, span = 3000;
    for (double f : {0.02, 0.25, 0.3}) {
        SCOPED_TRACE(f);
        Floats signal(settle + span);
        for (std::size_t n = 0; n < signal.size(); ++n) signal[n] = float(std::sin(2.0 * kPi * f * double(n)));
        kf::FIRSetDlyLine(filter.state, nullptr);
        const auto out = filter.Run(signal);
        const double measured = 20.0 * std::log10(2.0 * DtftMagnitude(out.data() + settle, span, f) / double(span));
        const double predicted = 20.0 * std::log10(DtftMagnitude(taps.data(), tapCount, f));
        if (f < 0.1) {
            EXPECT_NEAR(0.0, predicted, 0.01);
            EXPECT_NEAR(predicted, measured, 0.001);
        } else {
            EXPECT_LT(predicted, -60.0);  // well inside the Hamming stopband
            EXPECT_NEAR(predicted, measured, 0.5);
        }
    }
}

}  // namespace
