#pragma once

#include <cstdint>
#include <vector>

#include <kestcore/allocator/STLAllocator.h>

#include "kestaccel/Common.h"

namespace kestaccel {
namespace filter {
namespace cpp {

template <class T>
using PoolVector = std::vector<T, kestcore::allocator::STLAllocator<T>>;

// The fields of a multi-rate filter, the same for both element types.
// Together phase and inputIndex are one position on the high-rate axis,
// inputIndex * upFactor + phase, where the next output lies.
template <class T>
struct MultiRateRecord {
    using Element = T;

    std::uint32_t upFactor = 0;
    std::uint32_t downFactor = 0;
    // One branch per phase, each of L taps stored newest-last: branch p holds
    // taps[p + (L - 1 - j) * upFactor] at j, so a forward walk over the branch
    // meets the samples from the oldest to the newest.
    PoolVector<PoolVector<T>> phaseFilters;
    // The latest inputs, newest first: history[0] precedes the next block.
    PoolVector<T> history;
    std::int32_t phase = 0;
    // Index, relative to the next block, of the newest sample the next output
    // uses; negative values reach into history.
    std::int32_t inputIndex = 0;
    // Outputs of a call whose source is its destination. Grows, never shrinks.
    PoolVector<T> scratch;
};

}  // namespace cpp
}  // namespace filter

struct MRFState_Float : filter::cpp::MultiRateRecord<float> {};
struct MRFState_Double : filter::cpp::MultiRateRecord<double> {};

}  // namespace kestaccel
