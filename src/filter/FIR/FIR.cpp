#include "kestaccel/FIR.h"

#include "filter/FIR/FIRKernels.h"

namespace kestaccel {
namespace filter {

void FIRInit(FIRState_Float** state, const float* taps, unsigned int tapCount, const float* delayLine) { cpp::FIRInit(state, taps, tapCount, delayLine); }
float FIR(FIRState_Float* state, float sample) { return cpp::FIR(state, sample); }
void FIR(FIRState_Float* state, unsigned int count, const float* src, float* dst) { cpp::FIR(state, count, src, dst); }
void FIRSetTaps(FIRState_Float* state, const float* taps) { cpp::FIRSetTaps(state, taps); }
void FIRSetDlyLine(FIRState_Float* state, const float* delayLine) { cpp::FIRSetDlyLine(state, delayLine); }
void FIRGetDlyLine(const FIRState_Float* state, float* delayLine) { cpp::FIRGetDlyLine(state, delayLine); }
unsigned int FIRGetWorkBufferSize(unsigned int tapCount) { return cpp::FIRGetWorkBufferSize(tapCount); }
void FIRFree(FIRState_Float* state) { cpp::FIRFree(state); }

}  // namespace filter
}  // namespace kestaccel
