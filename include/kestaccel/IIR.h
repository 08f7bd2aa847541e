#pragma once

#include "kestaccel/Common.h"

namespace kestaccel {
namespace filter {

// Recursive filters in transposed direct form II, in float and double: one
// section of any order, or a cascade of second-order sections. Each section
// has 2 * order + 2 taps, b0 .. b[order] then a0 .. a[order]; a0 is taken as
// 1 by the recursion and its stored value is never read. Per sample and
// section, each product and sum rounded to the element type (float stays
// float throughout):
//   y = b0 * x + d[0]
//   d[i] = (b[i+1] * x + d[i+1]) - a[i+1] * y   for i = 0 .. order - 2
//   d[order-1] = b[order] * x - a[order] * y
// Sections run in ascending order, the output of one the input of the next.
// The state comes last in the argument lists, unlike the FIR filter's.

// Creates a one-section filter from 2 * order + 2 taps, each multiplied by
// the reciprocal of a0 = taps[order + 1] (a0 becomes r * a0, not read
// later). delayLine (order values, taken unscaled) may be null: zeros. A null
// state or taps, or an order of 0, creates nothing and leaves *state as it
// was. A zero a0 is not tested: the taps become infinities or NaNs.
KESTACCEL_API void IIRInit(IIRState_Float** state, const float* taps, unsigned int order, const float* delayLine);
KESTACCEL_API void IIRInit(IIRState_Double** state, const double* taps, unsigned int order, const double* delayLine);

// Creates a cascade of sectionCount second-order sections from 6 *
// sectionCount taps. Every section is multiplied by the reciprocal of the
// FIRST section's a0 (taps[3]); a section's own a0 is not consulted.
// delayLine (2 * sectionCount values) may be null. Null state or taps, or no
// sections, create nothing and leave *state as it was.
KESTACCEL_API void IIRInit_BiQuad(IIRState_Float** state, const float* taps, unsigned int sectionCount, const float* delayLine);
KESTACCEL_API void IIRInit_BiQuad(IIRState_Double** state, const double* taps, unsigned int sectionCount, const double* delayLine);

// Filters one sample and updates the states.
KESTACCEL_API float IIR(float sample, IIRState_Float* state);
KESTACCEL_API double IIR(double sample, IIRState_Double* state);

// Filters a block: the same bits as the single-sample form on each element
// in turn. src may equal dst. Nothing is tested, null included.
KESTACCEL_API void IIR(unsigned int count, const float* src, float* dst, IIRState_Float* state);
KESTACCEL_API void IIR(unsigned int count, const double* src, double* dst, IIRState_Double* state);
KESTACCEL_API void IIR_InPlace(unsigned int count, float* srcDst, IIRState_Float* state);
KESTACCEL_API void IIR_InPlace(unsigned int count, double* srcDst, IIRState_Double* state);

// Overwrites all 2 * (order + 1) * sectionCount taps with the values given,
// without normalising: pass taps whose a0 is already divided out. Nothing
// happens for a null state or taps.
KESTACCEL_API void IIRSetTaps(IIRState_Float* state, const float* taps);
KESTACCEL_API void IIRSetTaps(IIRState_Double* state, const double* taps);

// Copies order * sectionCount states in. A null delayLine clears only the
// first order states (the first section's); later sections keep theirs.
// Nothing happens for a null state.
KESTACCEL_API void IIRSetDlyLine(IIRState_Float* state, const float* delayLine);
KESTACCEL_API void IIRSetDlyLine(IIRState_Double* state, const double* delayLine);

// Copies order * sectionCount states out; nothing for a null state or delayLine.
KESTACCEL_API void IIRGetDlyLine(const IIRState_Float* state, float* delayLine);
KESTACCEL_API void IIRGetDlyLine(const IIRState_Double* state, double* delayLine);

// Destroys the filter; null is ignored.
KESTACCEL_API void IIRFree(IIRState_Float* state);
KESTACCEL_API void IIRFree(IIRState_Double* state);

}  // namespace filter
}  // namespace kestaccel
