#pragma once

#include <vector>

#include <kestcore/allocator/STLAllocator.h>

#include "kestaccel/Common.h"

namespace kestaccel {
namespace filter {

// ---------------------------------------------------------------------------
// Polyphase multi-rate filter.
// ---------------------------------------------------------------------------
// A rational rate changer: the input is raised by upFactor (U) by inserting
// zeros, filtered by one FIR filter at the high rate, and lowered by
// downFactor (D) by keeping every D-th sample. Only the taps that meet a
// non-zero sample are multiplied: each output sums one branch of
// L = tapCount / U taps, in the element type, from +0 and from the oldest
// sample to the newest. The sum is not scaled by U: any gain is in the taps.
// The state's vectors go through kestcore's STLAllocator; a vector too long
// for its element type throws std::length_error("vector too long").

// Creates a filter and stores it in *state before building the rest (an
// exception while building leaves the half-built record there for MRFFree).
// taps[0..tapCount) is the high-rate filter, not kept; only the first
// L * U taps are used, so a tap count below U gives outputs of +0 only.
// The first output lies at the high-rate position
// int32(startPosition - referencePosition): 0 is the first input sample.
// A position further back than 2 * U reads outside the history.
// reservedVector is never read. An upFactor of 0 divides by zero.
KESTACCEL_API void MRFInit(MRFState_Float** state, unsigned int upFactor, unsigned int downFactor,
                           const float* taps, unsigned int tapCount,
                           const std::vector<float, kestcore::allocator::STLAllocator<float>>& reservedVector,
                           unsigned int referencePosition, unsigned int startPosition);
KESTACCEL_API void MRFInit(MRFState_Double** state, unsigned int upFactor, unsigned int downFactor,
                           const double* taps, unsigned int tapCount,
                           const std::vector<double, kestcore::allocator::STLAllocator<double>>& reservedVector,
                           unsigned int referencePosition, unsigned int startPosition);

// Runs cycleCount rate-change cycles: reads cycleCount * D samples of src and
// writes cycleCount * U samples to dst (from 2^31 outputs up, none are
// computed). After the call the position stands cycleCount * (D - 1) input
// samples further on than a seamless stream would put it: consecutive calls
// join seamlessly only at D of 1, and at D above 1 a later call reads src
// beyond its own cycleCount * D samples by that much.
// With src == dst the outputs are computed into an internal scratch array
// and then overwritten: the buffer keeps its input, only the filter's
// history and position advance, and the buffer must hold at least
// cycleCount * U elements. This is the one call that may allocate. Other
// overlaps of src and dst are not recognised.
KESTACCEL_API void MRFProcess(const float* src, float* dst, unsigned int cycleCount, MRFState_Float* state);
KESTACCEL_API void MRFProcess(const double* src, double* dst, unsigned int cycleCount, MRFState_Double* state);

// Destroys a filter; a null pointer is ignored.
KESTACCEL_API void MRFFree(MRFState_Float* state);
KESTACCEL_API void MRFFree(MRFState_Double* state);

}  // namespace filter
}  // namespace kestaccel
