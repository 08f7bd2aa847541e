#include "kestaccel/IIR.h"

#include "filter/IIR/IIRKernels.h"

namespace kestaccel {
namespace filter {

void IIRInit(IIRState_Float** state, const float* taps, unsigned int order, const float* delayLine) { cpp::IIRInit(state, taps, order, delayLine); }
void IIRInit(IIRState_Double** state, const double* taps, unsigned int order, const double* delayLine) { cpp::IIRInit(state, taps, order, delayLine); }
void IIRInit_BiQuad(IIRState_Float** state, const float* taps, unsigned int sectionCount, const float* delayLine) { cpp::IIRInit_BiQuad(state, taps, sectionCount, delayLine); }
void IIRInit_BiQuad(IIRState_Double** state, const double* taps, unsigned int sectionCount, const double* delayLine) { cpp::IIRInit_BiQuad(state, taps, sectionCount, delayLine); }
float IIR(float sample, IIRState_Float* state) { return cpp::IIR(sample, state); }
double IIR(double sample, IIRState_Double* state) { return cpp::IIR(sample, state); }
void IIR(unsigned int count, const float* src, float* dst, IIRState_Float* state) { cpp::IIR(count, src, dst, state); }
void IIR(unsigned int count, const double* src, double* dst, IIRState_Double* state) { cpp::IIR(count, src, dst, state); }
void IIR_InPlace(unsigned int count, float* srcDst, IIRState_Float* state) { cpp::IIR_InPlace(count, srcDst, state); }
void IIR_InPlace(unsigned int count, double* srcDst, IIRState_Double* state) { cpp::IIR_InPlace(count, srcDst, state); }
void IIRSetTaps(IIRState_Float* state, const float* taps) { cpp::IIRSetTaps(state, taps); }
void IIRSetTaps(IIRState_Double* state, const double* taps) { cpp::IIRSetTaps(state, taps); }
void IIRSetDlyLine(IIRState_Float* state, const float* delayLine) { cpp::IIRSetDlyLine(state, delayLine); }
void IIRSetDlyLine(IIRState_Double* state, const double* delayLine) { cpp::IIRSetDlyLine(state, delayLine); }
void IIRGetDlyLine(const IIRState_Float* state, float* delayLine) { cpp::IIRGetDlyLine(state, delayLine); }
void IIRGetDlyLine(const IIRState_Double* state, double* delayLine) { cpp::IIRGetDlyLine(state, delayLine); }
void IIRFree(IIRState_Float* state) { cpp::IIRFree(state); }
void IIRFree(IIRState_Double* state) { cpp::IIRFree(state); }

}  // namespace filter
}  // namespace kestaccel
