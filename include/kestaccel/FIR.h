#pragma once

#include "kestaccel/Common.h"

namespace kestaccel {
namespace filter {

// ---------------------------------------------------------------------------
// FIR filter.
// ---------------------------------------------------------------------------
// A single-precision real FIR filter evaluated directly in the time domain.
// With m = tapCount - 1 and x the input stream (the delay line, then the
// block), output i is the float sum, from +0, of taps[k] * x[i - k] for k
// from m down to 0: oldest sample first, taps[0] times the newest sample
// added last, each product and sum rounded to float, no fused multiply-add.
// Both forms of FIR therefore give the same bits for the same history.
// The delay line holds the last m inputs, oldest first.

// Creates a filter in *state (written last: a failed call leaves it as it
// was). taps (tapCount floats) may be null: all taps are then 0 until
// FIRSetTaps. delayLine (tapCount - 1 floats) may be null: it starts at 0.
// A tapCount of 0, or of 2147483648 or more, throws std::length_error
// ("vector too long") and releases what was built. state is not tested.
KESTACCEL_API void FIRInit(FIRState_Float** state, const float* taps, unsigned int tapCount, const float* delayLine);

// The output for one more sample, without storing anything: the delay line
// stays as it was, so a second call still sees the old history. To stream
// sample by sample, use the block form with a count of 1.
KESTACCEL_API float FIR(FIRState_Float* state, float sample);

// Filters count samples and moves the delay line on to the last m inputs.
// Writes exactly dst[0] to dst[count - 1]. Overlapping src and dst (equal
// pointers included) run in chunks of FIRChunkSize (512) through the
// state's scratch: a destination at or below the source is safe at any
// length, one above it only up to 512 samples, since later chunks then read
// outputs already written.
KESTACCEL_API void FIR(FIRState_Float* state, unsigned int count, const float* src, float* dst);

// Copies tapCount floats into the taps; the delay line keeps its contents.
KESTACCEL_API void FIRSetTaps(FIRState_Float* state, const float* taps);

// Copies tapCount - 1 floats into the delay line, oldest first; null clears it.
KESTACCEL_API void FIRSetDlyLine(FIRState_Float* state, const float* delayLine);

// Copies the tapCount - 1 delay-line floats out, oldest first.
KESTACCEL_API void FIRGetDlyLine(const FIRState_Float* state, float* delayLine);

// No work buffer exists: 0 for every tap count.
KESTACCEL_API unsigned int FIRGetWorkBufferSize(unsigned int tapCount);

// Destroys the filter; null is ignored.
KESTACCEL_API void FIRFree(FIRState_Float* state);

// ---------------------------------------------------------------------------
// Lowpass FIR design.
// ---------------------------------------------------------------------------
// Fills taps[0 .. tapCount - 1] with a linear-phase lowpass filter by the
// window method, in double. cutoff is a fraction of the sampling frequency
// (0.5 is Nyquist), not range-checked. The ideal response sin(x c) / x with
// c = 2 cutoff is sampled around the array's centre (on the middle tap for
// odd counts, between the two middle taps for even ones, x advancing by pi
// per tap), then multiplied in place by the window windowType selects:
// kDSPWindowBartlett, kDSPWindowHamming or kDSPWindowHann; any other value,
// 1 included, applies none. With normalize, every tap is multiplied by
// 1 / (2 |S| + centre), where S is the sum of the left half without the
// centre (the right half is taken to equal it) and centre is the middle tap
// of an odd count, 0 for an even one: a positive S scales the sum to 1, a
// negative one keeps its sign, and a zero one (cutoff 0) gives NaN taps.
// The sines (and the cosines of the Hamming and Hann windows) are the
// runtime's: the taps are the same bits wherever the runtimes agree.
// workBuffer is never read or written and may be null.
KESTACCEL_API void GenerateLowpassFIRCoefficients(double cutoff, unsigned int tapCount, double* taps,
                                                  utility::DSPWindowType windowType, bool normalize,
                                                  unsigned char* workBuffer);

}  // namespace filter
}  // namespace kestaccel
