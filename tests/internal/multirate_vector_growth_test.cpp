// Growth of the multi-rate filter's vectors: the capacity taken when one runs
// out, what goes back to the allocator, and "vector too long" for a size the
// element type cannot address, all observed through a recording allocator so
// that nothing large is ever allocated.

#include <gtest/gtest.h>

#include <cstddef>
#include <cstring>
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
    std::vector<std::size_t> allocated;
    std::vector<std::size_t> released;
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

    T* allocate(std::size_t n)
    {
        log->allocated.push_back(n);
        return static_cast<T*>(::operator new(n * sizeof(T)));
    }
    void deallocate(T* p, std::size_t n)
    {
        log->released.push_back(n);
        ::operator delete(p);
    }
    std::size_t max_size() const { return limit; }
};
template <class T, class U>
bool operator==(const RecordingAllocator<T>& a, const RecordingAllocator<U>& b) { return a.log == b.log; }
template <class T, class U>
bool operator!=(const RecordingAllocator<T>& a, const RecordingAllocator<U>& b) { return a.log != b.log; }

template <class T>
using RecordedVector = std::vector<T, RecordingAllocator<T>>;

template <class Vector>
void ExpectVectorTooLong(Vector& vector, std::size_t size)
{
    try {
        PoolVectorGrowTo(vector, size);
        ADD_FAILURE() << "no exception for " << size << " elements";
    } catch (const std::length_error& e) {
        EXPECT_EQ(std::string("vector too long"), e.what());
    }
}

TEST(MultiRateVectorGrowth, TakesTheLargerOfNewSizeAndOneAndAHalfCapacities)
{
    AllocatorLog log;
    RecordedVector<float> v(RecordingAllocator<float>(&log, 1000));
    PoolVectorGrowTo(v, 10);   // from nothing: exactly the size
    PoolVectorGrowTo(v, 12);   // 1.5 * 10 = 15 beats 12
    PoolVectorGrowTo(v, 30);   // 30 beats 1.5 * 15 = 22
    PoolVectorGrowTo(v, 20);   // never shrinks
    EXPECT_EQ((std::vector<std::size_t>{10, 15, 30}), log.allocated);
    EXPECT_EQ((std::vector<std::size_t>{10, 15}), log.released);
    EXPECT_EQ(30u, v.size());
    EXPECT_EQ(30u, v.capacity());
}

TEST(MultiRateVectorGrowth, AppendsGrowByHalfTheCapacityNotByDoubling)
{
    AllocatorLog log;
    RecordedVector<double> v(RecordingAllocator<double>(&log, 1000));
    for (int i = 0; i < 20; ++i) PoolVectorAppend(v, double(i));
    EXPECT_EQ((std::vector<std::size_t>{1, 2, 3, 4, 6, 9, 13, 19, 28}), log.allocated);
    EXPECT_EQ((std::vector<std::size_t>{1, 2, 3, 4, 6, 9, 13, 19}), log.released);
    for (int i = 0; i < 20; ++i) EXPECT_EQ(double(i), v[std::size_t(i)]);
}

TEST(MultiRateVectorGrowth, KeepsOldElementsAndZeroesNewOnes)
{
    AllocatorLog log;
    RecordedVector<float> v(RecordingAllocator<float>(&log, 1000));
    PoolVectorGrowTo(v, 4);
    for (float& e : v) e = -1.5f;
    PoolVectorGrowTo(v, 9);
    for (std::size_t i = 0; i < 4; ++i) EXPECT_EQ(-1.5f, v[i]);
    for (std::size_t i = 4; i < 9; ++i) {
        const float zero = 0.0f;
        EXPECT_EQ(0, std::memcmp(&zero, &v[i], sizeof zero)) << "at " << i;
    }
}

TEST(MultiRateVectorGrowth, GeometricStepStopsAtTheLimit)
{
    AllocatorLog log;
    RecordedVector<float> v(RecordingAllocator<float>(&log, 100));
    PoolVectorGrowTo(v, 80);
    PoolVectorGrowTo(v, 81);  // 1.5 * 80 = 120 is past the limit of 100
    EXPECT_EQ((std::vector<std::size_t>{80, 100}), log.allocated);
    PoolVectorGrowTo(v, 100);
    ExpectVectorTooLong(v, 101);
    EXPECT_EQ(2u, log.allocated.size());
    EXPECT_EQ(100u, v.size());
}

TEST(MultiRateVectorGrowth, TooLongForTheElementTypeThrowsBeforeAllocating)
{
    AllocatorLog log;
    RecordedVector<double> recorded(RecordingAllocator<double>(&log, std::numeric_limits<std::size_t>::max()));
    ExpectVectorTooLong(recorded, recorded.max_size() + 1);
    EXPECT_TRUE(log.allocated.empty());

    kestaccel::filter::cpp::PoolVector<float> samples;
    ExpectVectorTooLong(samples, samples.max_size() + 1);
    ExpectVectorTooLong(samples, std::numeric_limits<std::size_t>::max());
    kestaccel::filter::cpp::PoolVector<kestaccel::filter::cpp::PoolVector<double>> branches;
    ExpectVectorTooLong(branches, branches.max_size() + 1);
    EXPECT_EQ(0u, samples.capacity());
    EXPECT_EQ(0u, branches.capacity());
}

}  // namespace
