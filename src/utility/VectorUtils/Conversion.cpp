#include "kestaccel/VectorUtils.h"

#include "utility/VectorUtils/ConversionKernels.h"

namespace kestaccel {
namespace utility {

using kestcore::utility::int24_t;

void Convert(unsigned int count, const unsigned char* src, float* dst) { cpp::Convert(count, src, dst); }
void Convert(unsigned int count, const short* src, float* dst, int scale) { cpp::Convert(count, src, dst, scale); }
void Convert(unsigned int count, const short* src, double* dst, int scale) { cpp::Convert(count, src, dst, scale); }
void Convert(unsigned int count, const int* src, float* dst, int scale) { cpp::Convert(count, src, dst, scale); }
void Convert(unsigned int count, const int* src, double* dst, int scale) { cpp::Convert(count, src, dst, scale); }
void Convert(unsigned int count, const int* src, int24_t* dst, int scale) { cpp::Convert(count, src, dst, scale); }
void Convert(unsigned int count, const float* src, unsigned char* dst, int scale, bool round) { cpp::Convert(count, src, dst, scale, round); }
void Convert(unsigned int count, const float* src, short* dst, int scale, bool round) { cpp::Convert(count, src, dst, scale, round); }
void Convert(unsigned int count, const float* src, int* dst, int scale, bool round) { cpp::Convert(count, src, dst, scale, round); }
void Convert(unsigned int count, const float* src, double* dst) { cpp::Convert(count, src, dst); }
void Convert(unsigned int count, const float* src, int24_t* dst, int scale, bool round) { cpp::Convert(count, src, dst, scale, round); }
void Convert(unsigned int count, const double* src, int* dst, int scale, bool round) { cpp::Convert(count, src, dst, scale, round); }
void Convert(unsigned int count, const double* src, float* dst) { cpp::Convert(count, src, dst); }
void Convert(unsigned int count, const int24_t* src, int* dst) { cpp::Convert(count, src, dst); }
void Convert(unsigned int count, const int24_t* src, float* dst, int scale) { cpp::Convert(count, src, dst, scale); }

}  // namespace utility
}  // namespace kestaccel
