#include "kestaccel/FFT.h"

#include "transform/FFT/FFTInterfaceKernels.h"

namespace kestaccel {
namespace transform {

void FFTInit(FFTState_Float** state, unsigned int order) { cpp::FFTInit(state, order); }
void FFTInit(FFTState_Double** state, unsigned int order) { cpp::FFTInit(state, order); }
void FFTInit(FFTState_Complex_Float_Interleaved** state, unsigned int order) { cpp::FFTInit(state, order); }
void FFTInit(FFTState_Complex_Double_Interleaved** state, unsigned int order) { cpp::FFTInit(state, order); }
void FFTInit(FFTState_Complex_Float_Deinterleaved** state, unsigned int order) { cpp::FFTInit(state, order); }
void FFTInit(FFTState_Complex_Double_Deinterleaved** state, unsigned int order) { cpp::FFTInit(state, order); }

void FFTFree(FFTState_Float* state) { cpp::FFTFree(state); }
void FFTFree(FFTState_Double* state) { cpp::FFTFree(state); }
void FFTFree(FFTState_Complex_Float_Interleaved* state) { cpp::FFTFree(state); }
void FFTFree(FFTState_Complex_Double_Interleaved* state) { cpp::FFTFree(state); }
void FFTFree(FFTState_Complex_Float_Deinterleaved* state) { cpp::FFTFree(state); }
void FFTFree(FFTState_Complex_Double_Deinterleaved* state) { cpp::FFTFree(state); }

void FFTGetBufSize(const FFTState_Float* state, unsigned int* bufSize) { cpp::FFTGetBufSize(state, bufSize); }
void FFTGetBufSize(const FFTState_Double* state, unsigned int* bufSize) { cpp::FFTGetBufSize(state, bufSize); }
void FFTGetBufSize(const FFTState_Complex_Float_Interleaved* state, unsigned int* bufSize) { cpp::FFTGetBufSize(state, bufSize); }
void FFTGetBufSize(const FFTState_Complex_Double_Interleaved* state, unsigned int* bufSize) { cpp::FFTGetBufSize(state, bufSize); }
void FFTGetBufSize(const FFTState_Complex_Float_Deinterleaved* state, unsigned int* bufSize) { cpp::FFTGetBufSize(state, bufSize); }
void FFTGetBufSize(const FFTState_Complex_Double_Deinterleaved* state, unsigned int* bufSize) { cpp::FFTGetBufSize(state, bufSize); }

void FFTFwd(const float* src, float* dst, FFTState_Float* state, unsigned char* workBuffer) { cpp::FFTFwd(src, dst, state, workBuffer); }
void FFTFwd(const double* src, double* dst, FFTState_Double* state, unsigned char* workBuffer) { cpp::FFTFwd(src, dst, state, workBuffer); }
void FFTFwd(const std::complex<float>* src, std::complex<float>* dst, FFTState_Complex_Float_Interleaved* state, unsigned char* workBuffer) { cpp::FFTFwd(src, dst, state, workBuffer); }
void FFTFwd(const std::complex<double>* src, std::complex<double>* dst, FFTState_Complex_Double_Interleaved* state, unsigned char* workBuffer) { cpp::FFTFwd(src, dst, state, workBuffer); }
void FFTFwd(const float* srcReal, const float* srcImag, float* dstReal, float* dstImag, FFTState_Complex_Float_Deinterleaved* state, unsigned char* workBuffer) { cpp::FFTFwd(srcReal, srcImag, dstReal, dstImag, state, workBuffer); }
void FFTFwd(const double* srcReal, const double* srcImag, double* dstReal, double* dstImag, FFTState_Complex_Double_Deinterleaved* state, unsigned char* workBuffer) { cpp::FFTFwd(srcReal, srcImag, dstReal, dstImag, state, workBuffer); }

void FFTInv(const float* src, float* dst, FFTState_Float* state, unsigned char* workBuffer) { cpp::FFTInv(src, dst, state, workBuffer); }
void FFTInv(const double* src, double* dst, FFTState_Double* state, unsigned char* workBuffer) { cpp::FFTInv(src, dst, state, workBuffer); }
void FFTInv(const std::complex<float>* src, std::complex<float>* dst, FFTState_Complex_Float_Interleaved* state, unsigned char* workBuffer) { cpp::FFTInv(src, dst, state, workBuffer); }
void FFTInv(const std::complex<double>* src, std::complex<double>* dst, FFTState_Complex_Double_Interleaved* state, unsigned char* workBuffer) { cpp::FFTInv(src, dst, state, workBuffer); }
void FFTInv(const float* srcReal, const float* srcImag, float* dstReal, float* dstImag, FFTState_Complex_Float_Deinterleaved* state, unsigned char* workBuffer) { cpp::FFTInv(srcReal, srcImag, dstReal, dstImag, state, workBuffer); }
void FFTInv(const double* srcReal, const double* srcImag, double* dstReal, double* dstImag, FFTState_Complex_Double_Deinterleaved* state, unsigned char* workBuffer) { cpp::FFTInv(srcReal, srcImag, dstReal, dstImag, state, workBuffer); }

}  // namespace transform
}  // namespace kestaccel
