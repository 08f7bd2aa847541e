#pragma once

// A filter holder for the multi-rate tests, and the reference model written
// from the definition: insert U - 1 zeros after every input sample, run one
// FIR filter over the whole high-rate stream, keep every D-th output.

#include <kestaccel/MultiRate.h>

#include <cstdint>
#include <vector>

namespace kestaccel_test {

template <class T>
struct MultiRateTypes;
template <>
struct MultiRateTypes<float> {
    using State = kestaccel::MRFState_Float;
};
template <>
struct MultiRateTypes<double> {
    using State = kestaccel::MRFState_Double;
};

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
    MultiRateFilter& operator=(const MultiRateFilter&) = delete;

    void Process(const T* src, T* dst, unsigned int cycles) { kestaccel::filter::MRFProcess(src, dst, cycles, state_); }
    typename MultiRateTypes<T>::State* state() const { return state_; }

private:
    typename MultiRateTypes<T>::State* state_ = nullptr;
};

inline std::int64_t FloorDiv(std::int64_t a, std::int64_t b)
{
    const std::int64_t q = a / b;
    return (a % b != 0 && (a < 0) != (b < 0)) ? q - 1 : q;
}

// Output at high-rate position `position` of the stream x, where x[u] is the
// stream's u-th sample and everything before x[0] is zero. Only the first
// (tapCount / up) * up taps take part. The sum runs over the zero-stuffed
// stream from the oldest sample to the newest, zeros included: adding a zero
// product never changes a sum that started at +0, so the polyphase filter,
// which skips them, must give these very bits.
template <class T>
T ZeroStuffedOutput(const std::vector<T>& x, const std::vector<T>& taps, unsigned int up, std::int64_t position)
{
    const std::int64_t used = std::int64_t(taps.size() / up) * up;
    T sum = T(0);
    for (std::int64_t k = used - 1; k >= 0; --k) {
        const std::int64_t highRate = position - k;
        T sample = T(0);
        if (highRate >= 0 && highRate % up == 0) {
            const std::int64_t u = highRate / up;
            if (u < std::int64_t(x.size())) sample = x[std::size_t(u)];
        }
        sum += sample * taps[std::size_t(k)];
    }
    return sum;
}

// `count` outputs at positions first, first + down, ...
template <class T>
std::vector<T> ZeroStuffedOutputs(const std::vector<T>& x, const std::vector<T>& taps, unsigned int up,
                                  unsigned int down, std::int64_t first, std::size_t count)
{
    std::vector<T> y(count);
    for (std::size_t n = 0; n < count; ++n) y[n] = ZeroStuffedOutput(x, taps, up, first + std::int64_t(n) * down);
    return y;
}

}  // namespace kestaccel_test
