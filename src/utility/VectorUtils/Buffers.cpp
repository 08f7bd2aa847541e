#include "kestaccel/VectorUtils.h"

#include "utility/VectorUtils/BufferKernels.h"

namespace kestaccel {
namespace utility {

unsigned char* Malloc_Byte(unsigned int count) { return cpp::Malloc_Byte(count); }
short* Malloc_Int16(unsigned int count) { return cpp::Malloc_Int16(count); }
float* Malloc_Float(unsigned int count) { return cpp::Malloc_Float(count); }
double* Malloc_Double(unsigned int count) { return cpp::Malloc_Double(count); }
std::complex<float>* Malloc_Complex_Float(unsigned int count) { return cpp::Malloc_Complex_Float(count); }
std::complex<double>* Malloc_Complex_Double(unsigned int count) { return cpp::Malloc_Complex_Double(count); }

void Free(unsigned char* buffer) { cpp::Free(buffer); }
void Free(short* buffer) { cpp::Free(buffer); }
void Free(float* buffer) { cpp::Free(buffer); }
void Free(double* buffer) { cpp::Free(buffer); }
void Free(std::complex<float>* buffer) { cpp::Free(buffer); }
void Free(std::complex<double>* buffer) { cpp::Free(buffer); }

void Copy(unsigned int count, const unsigned char* src, unsigned char* dst) { cpp::Copy(count, src, dst); }
void Copy(unsigned int count, const signed char* src, signed char* dst) { cpp::Copy(count, src, dst); }
void Copy(unsigned int count, const short* src, short* dst) { cpp::Copy(count, src, dst); }
void Copy(unsigned int count, const int* src, int* dst) { cpp::Copy(count, src, dst); }
void Copy(unsigned int count, const unsigned int* src, unsigned int* dst) { cpp::Copy(count, src, dst); }
void Copy(unsigned int count, const float* src, float* dst) { cpp::Copy(count, src, dst); }
void Copy(unsigned int count, const double* src, double* dst) { cpp::Copy(count, src, dst); }

void Move(unsigned int count, const unsigned char* src, unsigned char* dst) { cpp::Move(count, src, dst); }
void Move(unsigned int count, const short* src, short* dst) { cpp::Move(count, src, dst); }
void Move(unsigned int count, const unsigned int* src, unsigned int* dst) { cpp::Move(count, src, dst); }
void Move(unsigned int count, const float* src, float* dst) { cpp::Move(count, src, dst); }
void Move(unsigned int count, const double* src, double* dst) { cpp::Move(count, src, dst); }

void Zero(unsigned int count, unsigned char* dst) { cpp::Zero(count, dst); }
void Zero(unsigned int count, short* dst) { cpp::Zero(count, dst); }
void Zero(unsigned int count, int* dst) { cpp::Zero(count, dst); }
void Zero(unsigned int count, unsigned int* dst) { cpp::Zero(count, dst); }
void Zero(unsigned int count, float* dst) { cpp::Zero(count, dst); }
void Zero(unsigned int count, double* dst) { cpp::Zero(count, dst); }

void Set(unsigned int count, unsigned char* dst, unsigned char value) { cpp::Set(count, dst, value); }
void Set(unsigned int count, short* dst, short value) { cpp::Set(count, dst, value); }
void Set(unsigned int count, int* dst, int value) { cpp::Set(count, dst, value); }
void Set(unsigned int count, unsigned int* dst, unsigned int value) { cpp::Set(count, dst, value); }
void Set(unsigned int count, float* dst, float value) { cpp::Set(count, dst, value); }
void Set(unsigned int count, double* dst, double value) { cpp::Set(count, dst, value); }

bool Equal(unsigned int count, const unsigned char* a, const unsigned char* b) { return cpp::Equal(count, a, b); }

}  // namespace utility
}  // namespace kestaccel
