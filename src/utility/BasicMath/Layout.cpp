#include "kestaccel/BasicMath.h"

#include "utility/BasicMath/LayoutKernels.h"

namespace kestaccel {
namespace utility {

void Interleave(unsigned int count, const float* a, const float* b, float* dst) { cpp::Interleave(count, a, b, dst); }
void Interleave(unsigned int count, const double* a, const double* b, double* dst) { cpp::Interleave(count, a, b, dst); }
void Interleave(unsigned int channels, unsigned int frames, const float* const* sources, float* dst) { cpp::Interleave(channels, frames, sources, dst); }
void Interleave(unsigned int channels, unsigned int frames, const double* const* sources, double* dst) { cpp::Interleave(channels, frames, sources, dst); }
void Deinterleave(unsigned int count, const float* src, float* a, float* b) { cpp::Deinterleave(count, src, a, b); }
void Deinterleave(unsigned int count, const double* src, double* a, double* b) { cpp::Deinterleave(count, src, a, b); }
void Deinterleave(unsigned int channels, unsigned int frames, const float* src, float* const* destinations) { cpp::Deinterleave(channels, frames, src, destinations); }
void Deinterleave(unsigned int channels, unsigned int frames, const double* src, double* const* destinations) { cpp::Deinterleave(channels, frames, src, destinations); }

}  // namespace utility
}  // namespace kestaccel
