#pragma once

#include <cstdint>
#include <vector>

#include "kestaccel/Common.h"

namespace kestaccel {
namespace filter {
namespace cpp {

// The fields shared by both precisions. Lengths are formed in unsigned 32-bit
// arithmetic. Each section's taps are b0 .. b[order], then a0 .. a[order];
// section s owns delayLine[s * order] to delayLine[s * order + order - 1].
// The delay line is declared after the taps, so it is released first.
template <class T>
struct IIRRecord {
    using Value = T;

    IIRRecord(std::uint32_t sectionOrder, std::uint32_t sections)
        : order(sectionOrder),
          sectionCount(sections),
          taps(2u * (sectionOrder + 1u) * sections),
          delayLine(sectionOrder * sections)
    {
    }

    std::uint32_t order;
    std::uint32_t sectionCount;
    std::vector<T> taps;
    std::vector<T> delayLine;
};

}  // namespace cpp
}  // namespace filter

struct IIRState_Float : filter::cpp::IIRRecord<float> {
    using IIRRecord::IIRRecord;
};

struct IIRState_Double : filter::cpp::IIRRecord<double> {
    using IIRRecord::IIRRecord;
};

}  // namespace kestaccel
