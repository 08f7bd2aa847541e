// The multi-rate filter's record after MRFInit and MRFProcess: branch layout,
// history length, position, and the rebasing of inputIndex by cycleCount.

#include <gtest/gtest.h>

#include <vector>

#include "filter/MultiRate/MultiRateKernels.h"

namespace {

namespace cpp = kestaccel::filter::cpp;
using Taps = cpp::PoolVector<float>;

// Taps numbered 0, 1, ... so that a branch shows which taps it holds.
struct Record {
    kestaccel::MRFState_Float* state = nullptr;
    Record(unsigned int up, unsigned int down, unsigned int tapCount)
    {
        std::vector<float> taps(tapCount);
        for (unsigned int k = 0; k < tapCount; ++k) taps[k] = float(k);
        cpp::MRFInit(&state, up, down, taps.data(), tapCount, Taps(), 0, 0);
    }
    ~Record() { cpp::MRFFree(state); }
};

// Branches hold their taps from the highest index down; the T % U taps past
// the last whole group are left out; history holds (T + 1 + U) / U samples.
TEST(MultiRateState, BranchLayoutAndHistoryLength)
{
    Record twoThree(2, 3, 5);
    EXPECT_EQ((cpp::PoolVector<Taps>{{2, 0}, {3, 1}}), twoThree.state->phaseFilters);
    EXPECT_EQ(4u, twoThree.state->history.size());
    Record threeOne(3, 1, 10);
    EXPECT_EQ((cpp::PoolVector<Taps>{{6, 3, 0}, {7, 4, 1}, {8, 5, 2}}), threeOne.state->phaseFilters);
    EXPECT_EQ(4u, threeOne.state->history.size());
    EXPECT_EQ(22u, Record(1, 1, 20).state->history.size());
    EXPECT_EQ(11u, Record(2, 3, 20).state->history.size());
}

// U = 2, D = 3 from 0/0: one cycle walks phase/inputIndex 0/0 -> 1/1 -> 0/3,
// and the call then subtracts its cycleCount, not the 3 samples it consumed.
TEST(MultiRateState, InputIndexIsRebasedByTheCycleCount)
{
    Record r(2, 3, 20);
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
    Record r(1, 1, 4);  // history of (4 + 1 + 1) / 1 = 6
    std::vector<float> dst(8);
    const std::vector<float> first = {1, 2, 3, 4}, second = {5, 6, 7};
    cpp::MRFProcess(first.data(), dst.data(), 4, r.state);
    EXPECT_EQ((Taps{4, 3, 2, 1, 0, 0}), r.state->history);
    cpp::MRFProcess(second.data(), dst.data(), 3, r.state);
    EXPECT_EQ((Taps{7, 6, 5, 4, 3, 2}), r.state->history);
}

TEST(MultiRateState, ScratchGrowsOnlyForSameSourceAndDestination)
{
    Record r(3, 1, 12);
    std::vector<float> buffer(60, 1.0f), dst(60);
    cpp::MRFProcess(buffer.data(), dst.data(), 5, r.state);
    EXPECT_EQ(0u, r.state->scratch.capacity());
    cpp::MRFProcess(buffer.data(), buffer.data(), 4, r.state);
    EXPECT_EQ(12u, r.state->scratch.size());
    cpp::MRFProcess(buffer.data(), buffer.data(), 2, r.state);
    EXPECT_EQ(12u, r.state->scratch.size());
    cpp::MRFProcess(buffer.data(), buffer.data(), 5, r.state);
    EXPECT_EQ(18u, r.state->scratch.capacity());  // 1.5 * 12 beats 15
    // The scratch ends with the buffer's own contents copied over the results.
    EXPECT_EQ(Taps(15, 1.0f), Taps(r.state->scratch.begin(), r.state->scratch.begin() + 15));
}

}  // namespace
