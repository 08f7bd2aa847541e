#include "kestaccel/DSP.h"

#include "utility/DSP/ConvolutionKernels.h"

namespace kestaccel {
namespace utility {

void Convolve(unsigned int countA, const float* a, unsigned int countB, const float* b, float* dst, float* workBuffer)
{
    cpp::Convolve(countA, a, countB, b, dst, workBuffer);
}
void Convolve(unsigned int countA, const float* a, unsigned int countB, const float* b, float* dst)
{
    cpp::Convolve(countA, a, countB, b, dst);
}
void Convolve(unsigned int countA, const double* a, unsigned int countB, const double* b, double* dst, double* workBuffer)
{
    cpp::Convolve(countA, a, countB, b, dst, workBuffer);
}
void Convolve(unsigned int countA, const double* a, unsigned int countB, const double* b, double* dst)
{
    cpp::Convolve(countA, a, countB, b, dst);
}
unsigned long long ConvolutionWorkBufferSize(unsigned int countA, unsigned int countB)
{
    return cpp::ConvolutionWorkBufferSize(countA, countB);
}
void UpSample(unsigned int n, const float* src, float* dst, unsigned int factor, unsigned int* phase)
{
    cpp::UpSample(n, src, dst, factor, phase);
}
void UpSample(unsigned int n, const double* src, double* dst, unsigned int factor, unsigned int* phase)
{
    cpp::UpSample(n, src, dst, factor, phase);
}
void DownSample(unsigned int n, const float* src, float* dst, unsigned int factor, unsigned int* phase)
{
    cpp::DownSample(n, src, dst, factor, phase);
}
void DownSample(unsigned int n, const double* src, double* dst, unsigned int factor, unsigned int* phase)
{
    cpp::DownSample(n, src, dst, factor, phase);
}

}  // namespace utility
}  // namespace kestaccel
