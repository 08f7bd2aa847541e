#include "kestaccel/FIR.h"

#include "filter/FIR/LowpassDesignKernels.h"

namespace kestaccel {
namespace filter {

void GenerateLowpassFIRCoefficients(double cutoff, unsigned int tapCount, double* taps,
                                    utility::DSPWindowType windowType, bool normalize, unsigned char* workBuffer)
{
    cpp::GenerateLowpassFIRCoefficients(cutoff, tapCount, taps, windowType, normalize, workBuffer);
}

}  // namespace filter
}  // namespace kestaccel
