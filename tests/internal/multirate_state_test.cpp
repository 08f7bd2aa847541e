// The multi-rate filter's record after MRFInit and MRFProcess, and the growth
// of its vectors, observed through a recording allocator so that the length
// limit is reached without memory behind it.

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <stdexcept>
#include <string>
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

// Branches hold their taps from the highest index down, without the T % U
// past the last whole group; history holds (T + 1 + U) / U samples.
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

// U = 2, D = 3: one cycle walks phase/inputIndex 0/0 -> 1/1 -> 0/3, and the
// call subtracts its cycleCount, not the 3 samples it consumed.
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
    Record r(1, 1, 4);
    std::vector<float> dst(8);
    const std::vector<float> first = {1, 2, 3, 4}, second = {5, 6, 7};
    cpp::MRFProcess(first.data(), dst.data(), 4, r.state);
    EXPECT_EQ((Taps{4, 3, 2, 1, 0, 0}), r.state->history);
    cpp::MRFProcess(second.data(), dst.data(), 3, r.state);
    EXPECT_EQ((Taps{7, 6, 5, 4, 3, 2}), r.state->history);
}

// Scratch exists only for the same source and destination, and ends with
// the buffer's own contents copied over the results.
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
    EXPECT_EQ(Taps(15, 1.0f), Taps(r.state->scratch.begin(), r.state->scratch.begin() + 15));
}

struct AllocatorLog {
    std::vector<std::size_t> allocated, released;
};

// Logs each allocation and release; max_size is the given limit.
template <class T>
struct RecordingAllocator {
    using value_type = T;
    AllocatorLog* log;
    std::size_t limit;
    RecordingAllocator(AllocatorLog* l, std::size_t maxSize) : log(l), limit(maxSize) {}
    template <class U>
    RecordingAllocator(const RecordingAllocator<U>& other) : log(other.log), limit(other.limit) {}

    T* allocate(std::size_t n) { log->allocated.push_back(n); return static_cast<T*>(::operator new(n * sizeof(T))); }
    void deallocate(T* p, std::size_t n) { log->released.push_back(n); ::operator delete(p); }
    std::size_t max_size() const { return limit; }
    friend bool operator==(const RecordingAllocator& a, const RecordingAllocator& b) { return a.log == b.log; }
    friend bool operator!=(const RecordingAllocator& a, const RecordingAllocator& b) { return a.log != b.log; }
};

template <class T>
using RecordedVector = std::vector<T, RecordingAllocator<T>>;

template <class Vector>
std::string GrowthError(Vector& vector, std::size_t size)
{
    try {
        cpp::PoolVectorGrowTo(vector, size);
    } catch (const std::length_error& e) {
        return e.what();
    }
    return "no exception";
}

// Growing takes the larger of the new size and 1.5 times the capacity, up to
// the limit; elements are kept and new ones are +0; it never shrinks.
TEST(MultiRateVectorGrowth, TakesTheLargerOfNewSizeAndOneAndAHalfCapacities)
{
    AllocatorLog log;
    RecordedVector<float> v(RecordingAllocator<float>(&log, 100));
    cpp::PoolVectorGrowTo(v, 10);
    std::fill(v.begin(), v.end(), -1.5f);
    cpp::PoolVectorGrowTo(v, 12);
    std::vector<float> kept(12, 0.0f);
    std::fill_n(kept.begin(), 10, -1.5f);
    EXPECT_EQ(kept, std::vector<float>(v.begin(), v.end()));
    EXPECT_FALSE(std::signbit(v[11]));
    for (std::size_t size : {30, 20, 80, 81}) cpp::PoolVectorGrowTo(v, size);
    EXPECT_EQ((std::vector<std::size_t>{10, 15, 30, 80, 100}), log.allocated);
    EXPECT_EQ((std::vector<std::size_t>{10, 15, 30, 80}), log.released);
    cpp::PoolVectorGrowTo(v, 100);
    EXPECT_EQ("vector too long", GrowthError(v, 101));
    EXPECT_EQ(5u, log.allocated.size());
    EXPECT_EQ(100u, v.size());

    AllocatorLog appends;
    RecordedVector<double> w(RecordingAllocator<double>(&appends, 1000));
    for (int i = 0; i < 20; ++i) cpp::PoolVectorAppend(w, double(i));
    EXPECT_EQ((std::vector<std::size_t>{1, 2, 3, 4, 6, 9, 13, 19, 28}), appends.allocated);
    for (int i = 0; i < 20; ++i) EXPECT_EQ(double(i), w[std::size_t(i)]);
}

TEST(MultiRateVectorGrowth, TooLongForTheElementTypeThrowsBeforeAllocating)
{
    cpp::PoolVector<float> samples;
    EXPECT_EQ("vector too long", GrowthError(samples, samples.max_size() + 1));
    EXPECT_EQ("vector too long", GrowthError(samples, std::numeric_limits<std::size_t>::max()));
    cpp::PoolVector<cpp::PoolVector<double>> branches;
    EXPECT_EQ("vector too long", GrowthError(branches, branches.max_size() + 1));
    EXPECT_EQ(0u, samples.capacity());
    EXPECT_EQ(0u, branches.capacity());
}

}  // namespace
