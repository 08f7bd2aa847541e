#include "kestaccel/VectorUtils.h"

#include "utility/VectorUtils/ByteOrderKernels.h"

namespace kestaccel {
namespace utility {

using kestcore::utility::int24_t;

void SwapBytes(unsigned int count, unsigned short* data) { cpp::SwapBytes(count, data); }
void SwapBytes(unsigned int count, unsigned int* data) { cpp::SwapBytes(count, data); }
void SwapBytes(unsigned int count, int24_t* data) { cpp::SwapBytes(count, data); }
void SwapBytes(unsigned int count, unsigned long long* data) { cpp::SwapBytes(count, data); }
void SwapBytes(unsigned int count, const unsigned short* src, unsigned short* dst) { cpp::SwapBytes(count, src, dst); }
void SwapBytes(unsigned int count, const unsigned int* src, unsigned int* dst) { cpp::SwapBytes(count, src, dst); }
void SwapBytes(unsigned int count, const int24_t* src, int24_t* dst) { cpp::SwapBytes(count, src, dst); }
void SwapBytes(unsigned int count, const unsigned long long* src, unsigned long long* dst) { cpp::SwapBytes(count, src, dst); }

}  // namespace utility
}  // namespace kestaccel
