// Growth of the multi-rate filter's vectors: the capacity taken when one runs
// out, what goes back to the allocator, and "vector too long" for a size the
// element type cannot address, all observed through a recording allocator so
// that nothing large is ever allocated.

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <limits>
#include <stdexcept>
#include <string>
#include <vector>

#include "filter/MultiRate/PoolVectorGrowth.h"
#include "filter/MultiRate/MultiRateState.h"

namespace {

using kestaccel::filter::cpp::PoolVectorAppend;
using kestaccel::filter::cpp::PoolVectorGrowTo;

struct AllocatorLog {
    std::vector<std::size_t> allocated, released;
};

// Records each allocate/deallocate count; max_size can be made small so that
// the length limit is reached without memory behind it.
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

// What growing to `size` throws.
template <class Vector>
std::string GrowthError(Vector& vector, std::size_t size)
{
    try {
        PoolVectorGrowTo(vector, size);
    } catch (const std::length_error& e) {
        return e.what();
    }
    return "no exception";
}

TEST(MultiRateVectorGrowth, TakesTheLargerOfNewSizeAndOneAndAHalfCapacities)
{
    AllocatorLog log;
    RecordedVector<float> v(RecordingAllocator<float>(&log, 100));
    PoolVectorGrowTo(v, 10);  // from nothing: exactly the size
    std::fill(v.begin(), v.end(), -1.5f);
    PoolVectorGrowTo(v, 12);  // 1.5 * 10 = 15 beats 12
    std::vector<float> kept(12, 0.0f);
    std::fill_n(kept.begin(), 10, -1.5f);
    EXPECT_EQ(kept, std::vector<float>(v.begin(), v.end()));
    EXPECT_FALSE(std::signbit(v[11]));  // new elements are +0
    PoolVectorGrowTo(v, 30);  // 30 beats 1.5 * 15 = 22
    PoolVectorGrowTo(v, 20);  // never shrinks
    PoolVectorGrowTo(v, 80);  // 1.5 * 30 = 45 loses to 80
    PoolVectorGrowTo(v, 81);  // 1.5 * 80 = 120 is past the limit of 100
    EXPECT_EQ((std::vector<std::size_t>{10, 15, 30, 80, 100}), log.allocated);
    EXPECT_EQ((std::vector<std::size_t>{10, 15, 30, 80}), log.released);
    PoolVectorGrowTo(v, 100);
    EXPECT_EQ("vector too long", GrowthError(v, 101));
    EXPECT_EQ(5u, log.allocated.size());
    EXPECT_EQ(100u, v.size());
}

TEST(MultiRateVectorGrowth, AppendsGrowByHalfTheCapacityNotByDoubling)
{
    AllocatorLog log;
    RecordedVector<double> v(RecordingAllocator<double>(&log, 1000));
    for (int i = 0; i < 20; ++i) PoolVectorAppend(v, double(i));
    EXPECT_EQ((std::vector<std::size_t>{1, 2, 3, 4, 6, 9, 13, 19, 28}), log.allocated);
    for (int i = 0; i < 20; ++i) EXPECT_EQ(double(i), v[std::size_t(i)]);
}

TEST(MultiRateVectorGrowth, TooLongForTheElementTypeThrowsBeforeAllocating)
{
    kestaccel::filter::cpp::PoolVector<float> samples;
    EXPECT_EQ("vector too long", GrowthError(samples, samples.max_size() + 1));
    EXPECT_EQ("vector too long", GrowthError(samples, std::numeric_limits<std::size_t>::max()));
    kestaccel::filter::cpp::PoolVector<kestaccel::filter::cpp::PoolVector<double>> branches;
    EXPECT_EQ("vector too long", GrowthError(branches, branches.max_size() + 1));
    EXPECT_EQ(0u, samples.capacity());
    EXPECT_EQ(0u, branches.capacity());
}

}  // namespace
