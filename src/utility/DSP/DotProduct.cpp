#include "kestaccel/DSP.h"

#include "utility/DSP/DotProductKernels.h"

namespace kestaccel {
namespace utility {

float DotProduct(unsigned int count, const float* a, const float* b) { return cpp::DotProduct(count, a, b); }
double DotProduct(unsigned int count, const double* a, const double* b) { return cpp::DotProduct(count, a, b); }

}  // namespace utility
}  // namespace kestaccel
