#include "kestaccel/BasicMath.h"

#include "utility/BasicMath/ExtremaKernels.h"

namespace kestaccel {
namespace utility {

float Max(unsigned int count, const float* src) { return cpp::Max(count, src); }
double Max(unsigned int count, const double* src) { return cpp::Max(count, src); }
float Min(unsigned int count, const float* src) { return cpp::Min(count, src); }
double Min(unsigned int count, const double* src) { return cpp::Min(count, src); }
unsigned int MaxIndex(unsigned int count, const float* src, float* value) { return cpp::MaxIndex(count, src, value); }
unsigned int MinIndex(unsigned int count, const float* src, float* value) { return cpp::MinIndex(count, src, value); }
void MinMax(unsigned int count, const float* src, float& minimum, float& maximum) { cpp::MinMax(count, src, minimum, maximum); }
float MinMax(const float* src, unsigned int count) { return cpp::MinMax(src, count); }
void MinMaxIndex(unsigned int count, const float* src, float& minimum, float& maximum, unsigned int& minimumIndex, unsigned int& maximumIndex) { cpp::MinMaxIndex(count, src, minimum, maximum, minimumIndex, maximumIndex); }
void MaxEvery(unsigned int count, const float* a, const float* b, float* dst) { cpp::MaxEvery(count, a, b, dst); }
void MaxEvery_InPlace(unsigned int count, const float* src, float* srcDst) { cpp::MaxEvery_InPlace(count, src, srcDst); }
void MinEvery(unsigned int count, const float* a, const float* b, float* dst) { cpp::MinEvery(count, a, b, dst); }
void MinEvery_InPlace(unsigned int count, const float* src, float* srcDst) { cpp::MinEvery_InPlace(count, src, srcDst); }

}  // namespace utility
}  // namespace kestaccel
