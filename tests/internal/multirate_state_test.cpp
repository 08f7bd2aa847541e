// The multi-rate filter's record after MRFInit and MRFProcess: branch layout,
// history length, position, and the rebasing of inputIndex by cycleCount.

#include <gtest/gtest.h>

#include <vector>

#include "filter/MultiRate/MultiRateKernels.h"

namespace {

namespace cpp = kestaccel::filter::cpp;
using kestaccel::MRFState_Float;

struct Record {
    MRFState_Float* state = nullptr;
    Record(unsigned int up, unsigned int down, const std::vector<float>& taps, unsigned int reference, unsigned int start)
    {
        cpp::MRFInit(&state, up, down, taps.data(), static_cast<unsigned int>(taps.size()), cpp::PoolVector<float>(),
                     reference, start);
    }
    ~Record() { cpp::MRFFree(state); }
};

std::vector<float> Numbered(std::size_t count)
{
    std::vector<float> taps(count);
    for (std::size_t k = 0; k < count; ++k) taps[k] = float(k);
    return taps;
}

TEST(MultiRateState, BranchesHoldTheirTapsFromTheHighestIndexDown)
{
    Record r(2, 3, Numbered(5), 0, 0);
    ASSERT_EQ(2u, r.state->phaseFilters.size());
    EXPECT_EQ((cpp::PoolVector<float>{2.0f, 0.0f}), r.state->phaseFilters[0]);
    EXPECT_EQ((cpp::PoolVector<float>{3.0f, 1.0f}), r.state->phaseFilters[1]);
    EXPECT_EQ(4u, r.state->history.size());  // (5 + 1 + 2) / 2
}

TEST(MultiRateState, TapsPastTheLastWholeGroupAreLeftOut)
{
    Record r(3, 1, Numbered(10), 0, 0);
    ASSERT_EQ(3u, r.state->phaseFilters.size());
    EXPECT_EQ((cpp::PoolVector<float>{6.0f, 3.0f, 0.0f}), r.state->phaseFilters[0]);
    EXPECT_EQ((cpp::PoolVector<float>{7.0f, 4.0f, 1.0f}), r.state->phaseFilters[1]);
    EXPECT_EQ((cpp::PoolVector<float>{8.0f, 5.0f, 2.0f}), r.state->phaseFilters[2]);
    EXPECT_EQ(4u, r.state->history.size());  // (10 + 1 + 3) / 3
}

TEST(MultiRateState, HistoryLengthAndBranchLengthForTheWorkedCases)
{
    Record unit(1, 1, Numbered(20), 0, 0);
    EXPECT_EQ(22u, unit.state->history.size());
    ASSERT_EQ(1u, unit.state->phaseFilters.size());
    EXPECT_EQ(20u, unit.state->phaseFilters[0].size());
    EXPECT_EQ(19.0f, unit.state->phaseFilters[0][0]);

    Record twoThree(2, 3, Numbered(20), 1, 1);
    EXPECT_EQ(11u, twoThree.state->history.size());
    EXPECT_EQ(10u, twoThree.state->phaseFilters[0].size());
    EXPECT_EQ(10u, twoThree.state->phaseFilters[1].size());
    EXPECT_EQ(0, twoThree.state->phase);
    EXPECT_EQ(0, twoThree.state->inputIndex);
    EXPECT_EQ(3u, twoThree.state->downFactor);
}

TEST(MultiRateState, StartPositionSplitsWithANonNegativePhase)
{
    Record above(3, 1, Numbered(9), 10, 17);
    EXPECT_EQ(1, above.state->phase);
    EXPECT_EQ(2, above.state->inputIndex);
    Record below(3, 1, Numbered(9), 17, 10);
    EXPECT_EQ(2, below.state->phase);
    EXPECT_EQ(-3, below.state->inputIndex);
    Record exact(3, 1, Numbered(9), 5, 11);
    EXPECT_EQ(0, exact.state->phase);
    EXPECT_EQ(2, exact.state->inputIndex);
}

// U = 2, D = 3: one cycle walks phase/inputIndex 0/0 -> 1/1 -> 0/3, and the
// call then subtracts its cycleCount, not the 3 samples it consumed.
TEST(MultiRateState, InputIndexIsRebasedByTheCycleCount)
{
    Record r(2, 3, Numbered(20), 0, 0);
    std::vector<float> src(30, 0.5f), dst(20);
    cpp::MRFProcess(src.data(), dst.data(), 1, r.state);
    EXPECT_EQ(0, r.state->phase);
    EXPECT_EQ(2, r.state->inputIndex);
    cpp::MRFProcess(src.data(), dst.data(), 4, r.state);
    EXPECT_EQ(0, r.state->phase);
    EXPECT_EQ(2 + 4 * (3 - 1), r.state->inputIndex);
}

TEST(MultiRateState, HistoryKeepsTheNewestSamplesFirst)
{
    Record r(1, 1, Numbered(4), 0, 0);  // history of (4 + 1 + 1) / 1 = 6
    ASSERT_EQ(6u, r.state->history.size());
    std::vector<float> dst(8);
    const std::vector<float> first = {1, 2, 3, 4};
    cpp::MRFProcess(first.data(), dst.data(), 4, r.state);
    EXPECT_EQ((cpp::PoolVector<float>{4, 3, 2, 1, 0, 0}), r.state->history);
    const std::vector<float> second = {5, 6, 7};
    cpp::MRFProcess(second.data(), dst.data(), 3, r.state);
    EXPECT_EQ((cpp::PoolVector<float>{7, 6, 5, 4, 3, 2}), r.state->history);
}

TEST(MultiRateState, ScratchGrowsOnlyForSameSourceAndDestination)
{
    Record r(3, 1, Numbered(12), 0, 0);
    std::vector<float> buffer(60, 1.0f), dst(60);
    cpp::MRFProcess(buffer.data(), dst.data(), 5, r.state);
    EXPECT_EQ(0u, r.state->scratch.capacity());
    cpp::MRFProcess(buffer.data(), buffer.data(), 0, r.state);
    EXPECT_EQ(0u, r.state->scratch.size());
    cpp::MRFProcess(buffer.data(), buffer.data(), 4, r.state);
    EXPECT_EQ(12u, r.state->scratch.size());
    cpp::MRFProcess(buffer.data(), buffer.data(), 2, r.state);
    EXPECT_EQ(12u, r.state->scratch.size());
    cpp::MRFProcess(buffer.data(), buffer.data(), 5, r.state);
    EXPECT_EQ(18u, r.state->scratch.capacity());  // 1.5 * 12 beats 15
    // The scratch ends with the buffer's own contents copied over the results.
    for (std::size_t i = 0; i < 15; ++i) EXPECT_EQ(1.0f, r.state->scratch[i]);
}

}  // namespace
