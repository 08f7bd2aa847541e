#pragma once

// A multi-rate filter holder, and the model from the definition: U - 1 zeros
// after every input sample, one FIR filter over the high-rate stream, every
// D-th output kept.

#include <kestaccel/MultiRate.h>

#include <cstdint>
#include <type_traits>
#include <vector>

#include "support/TestSupport.h"

namespace kestaccel_test {

template <class T>
using PoolVector = std::vector<T, kestcore::allocator::STLAllocator<T>>;

template <class T>
class MultiRateFilter {
public:
    MultiRateFilter(unsigned int up, unsigned int down, const std::vector<T>& taps, unsigned int referencePosition,
                    unsigned int startPosition, const PoolVector<T>& reserved = PoolVector<T>())
    {
        kestaccel::filter::MRFInit(&state_, up, down, taps.empty() ? nullptr : taps.data(),
                                   static_cast<unsigned int>(taps.size()), reserved, referencePosition, startPosition);
    }
    ~MultiRateFilter() { kestaccel::filter::MRFFree(state_); }
    MultiRateFilter(const MultiRateFilter&) = delete;
    void Process(const T* src, T* dst, unsigned int cycles) { kestaccel::filter::MRFProcess(src, dst, cycles, state_); }

private:
    std::conditional_t<std::is_same<T, float>::value, kestaccel::MRFState_Float, kestaccel::MRFState_Double>* state_ =
        nullptr;
};

// One call into a guarded buffer pre-filled with 7, so that an output left
// unwritten or written past the end shows.
template <class T>
std::vector<T> ProcessOnce(MultiRateFilter<T>& filter, unsigned int up, const T* src, unsigned int cycles)
{
    GuardedBuffer<T> out(std::size_t(up) * cycles, T(7));
    filter.Process(src, out.data(), cycles);
    EXPECT_TRUE(out.Intact());
    return out.values();
}

// `count` outputs at high-rate positions first, first + down, ... of x, with
// zeros before x[0]; only the first (tapCount / up) * up taps take part.
// Each sum runs from the oldest sample to the newest, zeros included: a zero
// product never changes a sum begun at +0, so skipping them gives these bits.
template <class T>
std::vector<T> ZeroStuffedOutputs(const std::vector<T>& x, const std::vector<T>& taps, unsigned int up,
                                  unsigned int down, std::int64_t first, std::size_t count)
{
    const std::int64_t used = std::int64_t(taps.size() / up) * up;
    std::vector<T> y(count);
    for (std::size_t n = 0; n < count; ++n) {
        T sum = T(0);
        for (std::int64_t k = used - 1; k >= 0; --k) {
            const std::int64_t highRate = first + std::int64_t(n) * down - k;
            const bool present = highRate >= 0 && highRate % up == 0 && highRate / up < std::int64_t(x.size());
            sum += (present ? x[std::size_t(highRate / up)] : T(0)) * taps[std::size_t(k)];
        }
        y[n] = sum;
    }
    return y;
}

}  // namespace kestaccel_test
