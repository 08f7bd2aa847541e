#include "kestaccel/BasicMath.h"

#include "utility/BasicMath/ThresholdKernels.h"

namespace kestaccel {
namespace utility {

void Threshold_LT_InPlace(unsigned int count, float* srcDst, float level) { cpp::Threshold_LT_InPlace(count, srcDst, level); }
void Threshold_LT_InPlace(unsigned int count, double* srcDst, double level) { cpp::Threshold_LT_InPlace(count, srcDst, level); }
void Threshold_GT_InPlace(unsigned int count, float* srcDst, float level) { cpp::Threshold_GT_InPlace(count, srcDst, level); }
void Threshold_GT_InPlace(unsigned int count, double* srcDst, double level) { cpp::Threshold_GT_InPlace(count, srcDst, level); }
void Threshold_LTVal(unsigned int count, const float* src, float* dst, float level, float value) { cpp::Threshold_LTVal(count, src, dst, level, value); }
void Threshold_LTVal(unsigned int count, const double* src, double* dst, double level, double value) { cpp::Threshold_LTVal(count, src, dst, level, value); }
void Threshold_LTVal_InPlace(unsigned int count, float* srcDst, float level, float value) { cpp::Threshold_LTVal_InPlace(count, srcDst, level, value); }
void Threshold_LTVal_InPlace(unsigned int count, double* srcDst, double level, double value) { cpp::Threshold_LTVal_InPlace(count, srcDst, level, value); }
void Threshold_GTVal(unsigned int count, const float* src, float* dst, float level, float value) { cpp::Threshold_GTVal(count, src, dst, level, value); }
void Threshold_GTVal(unsigned int count, const double* src, double* dst, double level, double value) { cpp::Threshold_GTVal(count, src, dst, level, value); }
void Threshold_GTVal_InPlace(unsigned int count, float* srcDst, float level, float value) { cpp::Threshold_GTVal_InPlace(count, srcDst, level, value); }
void Threshold_GTVal_InPlace(unsigned int count, double* srcDst, double level, double value) { cpp::Threshold_GTVal_InPlace(count, srcDst, level, value); }
void Trim(unsigned int count, float* srcDst, float low, float high) { cpp::Trim(count, srcDst, low, high); }
void VectorSlope(unsigned int count, float* dst, float offset, float slope) { cpp::VectorSlope(count, dst, offset, slope); }
void VectorSlope(unsigned int count, double* dst, double offset, double slope) { cpp::VectorSlope(count, dst, offset, slope); }

}  // namespace utility
}  // namespace kestaccel
