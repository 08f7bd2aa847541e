// The multi-rate filter's record after MRFInit and MRFProcess, and the growth
// of its vectors through a recording allocator whose small limit needs no memory.

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

// Branches hold taps from the highest index down, without the T % U past the
// last whole group; history holds (T + 1 + U) / U samples, newest first.
TEST(MultiRateState, BranchLayoutAndHistory)
{
    Record twoThree(2, 3, 5);
    EXPECT_EQ((cpp::PoolVector<Taps>{{2, 0}, {3, 1}}), twoThree.state->phaseFilters);
    EXPECT_EQ(4u, twoThree.state->history.size());
    Record threeOne(3, 1, 10);
    EXPECT_EQ((cpp::PoolVector<Taps>{{6, 3, 0}, {7, 4, 1}, {8, 5, 2}}), threeOne.state->phaseFilters);
    EXPECT_EQ(4u, threeOne.state->history.size());
    EXPECT_EQ(11u, Record(2, 3, 20).state->history.size());
    Record r(1, 1, 4);
    std::vector<float> dst(8);
    const std::vector<float> first = {1, 2, 3, 4}, second = {5, 6, 7};
    cpp::MRFProcess(first.data(), dst.data(), 4, r.state);
    EXPECT_EQ((Taps{4, 3, 2, 1, 0, 0}), r.state->history);
    cpp::MRFProcess(second.data(), dst.data(), 3, r.state);
    EXPECT_EQ((Taps{7, 6, 5, 4, 3, 2}), r.state->history);
}

struct AllocatorLog {
    std::vector<std::size_t> allocated, released;
};

template <class T>
struct RecordingAllocator {
    using value_type = T;
    AllocatorLog* log;
    std::size_t limit;

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
// the limit, past which it throws; elements are kept, new ones are +0.
TEST(MultiRateVectorGrowth, OneAndAHalfCapacitiesUpToTheLimit)
{
    AllocatorLog log;
    RecordedVector<float> v(RecordingAllocator<float>{&log, 100});
    cpp::PoolVectorGrowTo(v, 10);
    std::fill(v.begin(), v.end(), -1.5f);
    cpp::PoolVectorGrowTo(v, 12);
    std::vector<float> kept(10, -1.5f);
    kept.resize(12);
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
    RecordedVector<double> w(RecordingAllocator<double>{&appends, 1000});
    for (int i = 0; i < 20; ++i) cpp::PoolVectorAppend(w, double(i));
    EXPECT_EQ((std::vector<std::size_t>{1, 2, 3, 4, 6, 9, 13, 19, 28}), appends.allocated);
    for (int i = 0; i < 20; ++i) EXPECT_EQ(double(i), w[std::size_t(i)]);

    // A size the element type cannot address throws before allocating.
    cpp::PoolVector<float> samples;
    EXPECT_EQ("vector too long", GrowthError(samples, samples.max_size() + 1));
    EXPECT_EQ("vector too long", GrowthError(samples, std::numeric_limits<std::size_t>::max()));
    cpp::PoolVector<cpp::PoolVector<double>> branches;
    EXPECT_EQ("vector too long", GrowthError(branches, branches.max_size() + 1));
    EXPECT_EQ(0u, samples.capacity());
    EXPECT_EQ(0u, branches.capacity());
}

}  // namespace
