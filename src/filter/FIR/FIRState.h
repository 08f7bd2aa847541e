#pragma once

#include <cstdint>
#include <stdexcept>

#include "kestaccel/Common.h"
#include "utility/VectorUtils/BufferKernels.h"

namespace kestaccel {
namespace filter {
namespace cpp {

// Length of the temporary output used when source and destination overlap.
constexpr unsigned int FIRChunkSize = 512;

// A zero-filled float array from Malloc_Float, held as a begin, end and
// capacity triple and released through Free. The requested length arrives as
// a signed 32-bit value: a negative length (a tap count of 0 gives a delay
// line of -1, a tap count of 2^31 or more wraps below zero) is refused before
// anything is allocated.
class FIRArray {
public:
    explicit FIRArray(std::int32_t length)
    {
        if (length < 0) {
            throw std::length_error("vector too long");
        }
        const auto count = static_cast<unsigned int>(length);
        begin_ = utility::cpp::Malloc_Float(count);
        end_ = begin_ + count;
        capacity_ = end_;
        utility::cpp::Zero(count, begin_);
    }

    ~FIRArray()
    {
        utility::cpp::Free(begin_);
        begin_ = end_ = capacity_ = nullptr;
    }

    FIRArray(const FIRArray&) = delete;
    FIRArray& operator=(const FIRArray&) = delete;

    float* data() const { return begin_; }
    unsigned int size() const { return static_cast<unsigned int>(end_ - begin_); }

private:
    float* begin_ = nullptr;
    float* end_ = nullptr;
    float* capacity_ = nullptr;
};

}  // namespace cpp
}  // namespace filter

// The arrays are built in declaration order and so released in the reverse:
// scratch, delay line, taps. A length error on a later array releases the
// earlier ones before it leaves the constructor.
struct FIRState_Float {
    explicit FIRState_Float(unsigned int count)
        : tapCount(count),
          taps(static_cast<std::int32_t>(count)),
          delayLine(static_cast<std::int32_t>(count - 1u)),
          scratch(static_cast<std::int32_t>(filter::cpp::FIRChunkSize))
    {
    }

    std::uint32_t tapCount;
    filter::cpp::FIRArray taps;       // taps[0] weighs the newest sample
    filter::cpp::FIRArray delayLine;  // last tapCount - 1 inputs, oldest first
    filter::cpp::FIRArray scratch;    // output of one chunk on the overlapping path
};

}  // namespace kestaccel
