#pragma once

#include <complex>

#include "kestaccel/Common.h"
#include "kestcore/utility/noncopyable.h"

namespace kestaccel {
namespace transform {

// Power-of-two Fourier transforms over opaque states. The forward transform
// is unscaled, X[k] = sum x[n] exp(-2 pi i k n / N); the inverse carries the
// whole 1/N. The size of a state is told by its order (log2 of the length).
// Each twiddle table grows by a recurrence from one cos and one sin of the
// runtime, so the transforms give the same bits wherever the runtimes agree
// on those; FFTImpl also takes log2 from the runtime for its rounded order.

// Creates a state of 1 << (order % 32) points and stores it in *state. A
// null state pointer or order 0 does nothing: *state keeps what it held.
// Order 32 gives a one-point state, 33 a two-point state; order 31 gives no
// usable transform. The deinterleaved and interleaved complex states of one
// precision are built alike.
KESTACCEL_API void FFTInit(FFTState_Float** state, unsigned int order);
KESTACCEL_API void FFTInit(FFTState_Double** state, unsigned int order);
KESTACCEL_API void FFTInit(FFTState_Complex_Float_Interleaved** state, unsigned int order);
KESTACCEL_API void FFTInit(FFTState_Complex_Double_Interleaved** state, unsigned int order);
KESTACCEL_API void FFTInit(FFTState_Complex_Float_Deinterleaved** state, unsigned int order);
KESTACCEL_API void FFTInit(FFTState_Complex_Double_Deinterleaved** state, unsigned int order);

// Releases a state and its tables; null is accepted.
KESTACCEL_API void FFTFree(FFTState_Float* state);
KESTACCEL_API void FFTFree(FFTState_Double* state);
KESTACCEL_API void FFTFree(FFTState_Complex_Float_Interleaved* state);
KESTACCEL_API void FFTFree(FFTState_Complex_Double_Interleaved* state);
KESTACCEL_API void FFTFree(FFTState_Complex_Float_Deinterleaved* state);
KESTACCEL_API void FFTFree(FFTState_Complex_Double_Deinterleaved* state);

// Writes 0 to *bufSize: no transform needs a work buffer. The state is not
// looked at and may be null.
KESTACCEL_API void FFTGetBufSize(const FFTState_Float* state, unsigned int* bufSize);
KESTACCEL_API void FFTGetBufSize(const FFTState_Double* state, unsigned int* bufSize);
KESTACCEL_API void FFTGetBufSize(const FFTState_Complex_Float_Interleaved* state, unsigned int* bufSize);
KESTACCEL_API void FFTGetBufSize(const FFTState_Complex_Double_Interleaved* state, unsigned int* bufSize);
KESTACCEL_API void FFTGetBufSize(const FFTState_Complex_Float_Deinterleaved* state, unsigned int* bufSize);
KESTACCEL_API void FFTGetBufSize(const FFTState_Complex_Double_Deinterleaved* state, unsigned int* bufSize);

// Forward transforms. workBuffer is ignored by every form and may be null.
// Real: N samples in, the packed half spectrum out: N + 2 elements, the
//   (re, im) pairs of bins 0 .. N/2, with exact zeros as the imaginary parts
//   of DC and Nyquist. src may equal dst when it holds N + 2 elements. The
//   state's scratch is written: one thread per state.
// Interleaved complex: N pairs, src may equal dst; the state is only read,
//   so threads may share it.
// Deinterleaved complex: split arrays of N elements each. The destinations
//   stage the input, so srcReal may equal dstReal and srcImag dstImag, but
//   dstReal and dstImag must be distinct. The state's scratch is written.
KESTACCEL_API void FFTFwd(const float* src, float* dst, FFTState_Float* state, unsigned char* workBuffer);
KESTACCEL_API void FFTFwd(const double* src, double* dst, FFTState_Double* state, unsigned char* workBuffer);
KESTACCEL_API void FFTFwd(const std::complex<float>* src, std::complex<float>* dst,
                          FFTState_Complex_Float_Interleaved* state, unsigned char* workBuffer);
KESTACCEL_API void FFTFwd(const std::complex<double>* src, std::complex<double>* dst,
                          FFTState_Complex_Double_Interleaved* state, unsigned char* workBuffer);
KESTACCEL_API void FFTFwd(const float* srcReal, const float* srcImag, float* dstReal, float* dstImag,
                          FFTState_Complex_Float_Deinterleaved* state, unsigned char* workBuffer);
KESTACCEL_API void FFTFwd(const double* srcReal, const double* srcImag, double* dstReal, double* dstImag,
                          FFTState_Complex_Double_Deinterleaved* state, unsigned char* workBuffer);

// Inverse transforms, scaled by 1/N. Real: the packed spectrum of N + 2
// elements in (all of them are read: the imaginary parts at DC and Nyquist
// count from N = 4 up, and are ignored at N = 2), N samples out; src and dst
// must not overlap. The complex forms alias as their forward forms do.
KESTACCEL_API void FFTInv(const float* src, float* dst, FFTState_Float* state, unsigned char* workBuffer);
KESTACCEL_API void FFTInv(const double* src, double* dst, FFTState_Double* state, unsigned char* workBuffer);
KESTACCEL_API void FFTInv(const std::complex<float>* src, std::complex<float>* dst,
                          FFTState_Complex_Float_Interleaved* state, unsigned char* workBuffer);
KESTACCEL_API void FFTInv(const std::complex<double>* src, std::complex<double>* dst,
                          FFTState_Complex_Double_Interleaved* state, unsigned char* workBuffer);
KESTACCEL_API void FFTInv(const float* srcReal, const float* srcImag, float* dstReal, float* dstImag,
                          FFTState_Complex_Float_Deinterleaved* state, unsigned char* workBuffer);
KESTACCEL_API void FFTInv(const double* srcReal, const double* srcImag, double* dstReal, double* dstImag,
                          FFTState_Complex_Double_Deinterleaved* state, unsigned char* workBuffer);

// Owner of one deinterleaved complex state, sized by a length instead of an
// order. The length is rounded to the nearest power of two on a log scale
// (truncation of log2(length) + 0.5: 724 gives 512, 725 gives 1024), and the
// transform runs on GetBlockSize() points, which may be more or fewer than
// the length asked for: the four arrays of ProcessFwd and ProcessInv must
// each hold GetBlockSize() elements. Lengths 0 and 1 leave no state; a
// transform without a state is undefined. Exported for exactly two pairs:
// (FFTState_Complex_Float_Deinterleaved, std::complex<float>) and
// (FFTState_Complex_Double_Deinterleaved, std::complex<double>).
template <class State, class Complex>
class FFTImpl : public kestcore::utility::noncopyable {
public:
    using T = typename Complex::value_type;

    // No state, order 0, length 0.
    FFTImpl();
    // A nonzero fftSize wins: its rounded order replaces `order`. With
    // fftSize 0 the state is built from `order` (FFTImpl(5, 0) runs 32
    // points and reports GetFFTSize() 0).
    FFTImpl(unsigned int order, unsigned int fftSize);
    virtual ~FFTImpl();

    // Rebuilds the state for a new length; the same length as before costs
    // one comparison. Every call with a new length also allocates an empty
    // work buffer, and one left over from a length of 0 or 1 is not freed.
    void SetFFTSize(unsigned int fftSize);

    unsigned int GetOrder() const;
    unsigned int GetFFTSize() const;    // the length as asked, unrounded
    unsigned int GetBlockSize() const;  // 1 << (order % 32), the length transformed

    // FFTFwd / FFTInv on split arrays with the owned state.
    void ProcessFwd(const T* srcReal, const T* srcImag, T* dstReal, T* dstImag);
    void ProcessInv(const T* srcReal, const T* srcImag, T* dstReal, T* dstImag);

private:
    unsigned int order;
    unsigned int fftSize;
    State* state;
    unsigned char* workBuffer;
};

extern template class KESTACCEL_API FFTImpl<FFTState_Complex_Float_Deinterleaved, std::complex<float>>;
extern template class KESTACCEL_API FFTImpl<FFTState_Complex_Double_Deinterleaved, std::complex<double>>;

}  // namespace transform
}  // namespace kestaccel
