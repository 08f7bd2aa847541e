#include "kestaccel/BasicMath.h"

#include "utility/BasicMath/ReductionKernels.h"

namespace kestaccel {
namespace utility {

float Sum(unsigned int count, const float* src) { return cpp::Sum(count, src); }
double Sum(unsigned int count, const double* src) { return cpp::Sum(count, src); }
float Mean(unsigned int count, const float* src) { return cpp::Mean(count, src); }
double Mean(unsigned int count, const double* src) { return cpp::Mean(count, src); }
float NormL1(unsigned int count, const float* src) { return cpp::NormL1(count, src); }
double NormL1(unsigned int count, const double* src) { return cpp::NormL1(count, src); }
float NormL2(unsigned int count, const float* src) { return cpp::NormL2(count, src); }
double NormL2(unsigned int count, const double* src) { return cpp::NormL2(count, src); }
void StandardDeviation(unsigned int count, const float* src, float& result) { cpp::StandardDeviation(count, src, result); }
void StandardDeviation(unsigned int count, const double* src, double& result) { cpp::StandardDeviation(count, src, result); }

}  // namespace utility
}  // namespace kestaccel
