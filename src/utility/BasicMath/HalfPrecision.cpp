#include "kestaccel/BasicMath.h"

#include "utility/BasicMath/HalfPrecisionKernels.h"

namespace kestaccel {
namespace utility {

void ConvertFloat2Half(float* src, unsigned short* dst, unsigned int count) { cpp::ConvertFloat2Half(src, dst, count); }
void ConvertHalf2Float(unsigned short* src, float* dst, unsigned int count) { cpp::ConvertHalf2Float(src, dst, count); }

}  // namespace utility
}  // namespace kestaccel
