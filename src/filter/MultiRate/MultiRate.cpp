#include "kestaccel/MultiRate.h"

#include "filter/MultiRate/MultiRateKernels.h"

namespace kestaccel {
namespace filter {

void MRFInit(MRFState_Float** state, unsigned int upFactor, unsigned int downFactor, const float* taps,
             unsigned int tapCount, const std::vector<float, kestcore::allocator::STLAllocator<float>>& reservedVector,
             unsigned int referencePosition, unsigned int startPosition)
{
    cpp::MRFInit(state, upFactor, downFactor, taps, tapCount, reservedVector, referencePosition, startPosition);
}
void MRFInit(MRFState_Double** state, unsigned int upFactor, unsigned int downFactor, const double* taps,
             unsigned int tapCount, const std::vector<double, kestcore::allocator::STLAllocator<double>>& reservedVector,
             unsigned int referencePosition, unsigned int startPosition)
{
    cpp::MRFInit(state, upFactor, downFactor, taps, tapCount, reservedVector, referencePosition, startPosition);
}

void MRFProcess(const float* src, float* dst, unsigned int cycleCount, MRFState_Float* state) { cpp::MRFProcess(src, dst, cycleCount, state); }
void MRFProcess(const double* src, double* dst, unsigned int cycleCount, MRFState_Double* state) { cpp::MRFProcess(src, dst, cycleCount, state); }

void MRFFree(MRFState_Float* state) { cpp::MRFFree(state); }
void MRFFree(MRFState_Double* state) { cpp::MRFFree(state); }

}  // namespace filter
}  // namespace kestaccel
