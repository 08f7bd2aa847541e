#include "kestaccel/FFT.h"

#include <cmath>
#include <cstdint>

#include "transform/FFT/FFTInterfaceKernels.h"
#include "utility/VectorUtils/BufferKernels.h"

namespace kestaccel {
namespace transform {

namespace {

// Truncation to 64 bits with the x86 result where C++ leaves it undefined:
// out of range and NaN give INT64_MIN (log2(0) + 0.5 is -inf).
std::int64_t TruncateToInt64(double value)
{
    const bool inRange = value >= -9223372036854775808.0 && value < 9223372036854775808.0;
    return inRange ? static_cast<std::int64_t>(value) : INT64_MIN;
}

// The nearest power of two on a log scale; only the low 32 bits of the
// truncated value are kept.
unsigned int RoundedOrder(unsigned int fftSize)
{
    const std::int64_t truncated = TruncateToInt64(std::log2(static_cast<double>(fftSize)) + 0.5);
    return static_cast<unsigned int>(static_cast<std::uint64_t>(truncated) & 0xFFFFFFFFu);
}

}  // namespace

template <class State, class Complex>
FFTImpl<State, Complex>::FFTImpl() : order(0), fftSize(0), state(nullptr), workBuffer(nullptr)
{
}

// The length, when given, wins over the order. No work buffer is made here.
template <class State, class Complex>
FFTImpl<State, Complex>::FFTImpl(unsigned int aOrder, unsigned int aFftSize)
    : order(aOrder), fftSize(aFftSize), state(nullptr), workBuffer(nullptr)
{
    if (fftSize != 0) order = RoundedOrder(fftSize);
    if (order != 0) cpp::InitState(&state, order, cpp::kComplexPlan);
}

template <class State, class Complex>
FFTImpl<State, Complex>::~FFTImpl()
{
    if (state != nullptr) cpp::FreeState(state);
    if (workBuffer != nullptr) utility::cpp::Free(workBuffer);
}

// The old work buffer is released only together with a state: one left by
// a length of 0 or 1 is overwritten, a small leak that is kept as it is.
template <class State, class Complex>
void FFTImpl<State, Complex>::SetFFTSize(unsigned int aFftSize)
{
    if (aFftSize == fftSize) return;
    fftSize = aFftSize;
    if (state != nullptr) {
        utility::cpp::Free(workBuffer);
        cpp::FreeState(state);
        workBuffer = nullptr;
        state = nullptr;
    }
    order = RoundedOrder(fftSize);
    if (order != 0) cpp::InitState(&state, order, cpp::kComplexPlan);
    unsigned int bufSize = 0;
    cpp::FFTGetBufSize(state, &bufSize);
    workBuffer = utility::cpp::Malloc_Byte(bufSize);
}

template <class State, class Complex>
unsigned int FFTImpl<State, Complex>::GetOrder() const
{
    return order;
}

template <class State, class Complex>
unsigned int FFTImpl<State, Complex>::GetFFTSize() const
{
    return fftSize;
}

template <class State, class Complex>
unsigned int FFTImpl<State, Complex>::GetBlockSize() const
{
    return 1u << (order & 31u);
}

template <class State, class Complex>
void FFTImpl<State, Complex>::ProcessFwd(const T* srcReal, const T* srcImag, T* dstReal, T* dstImag)
{
    cpp::FFTFwd(srcReal, srcImag, dstReal, dstImag, state, workBuffer);
}

template <class State, class Complex>
void FFTImpl<State, Complex>::ProcessInv(const T* srcReal, const T* srcImag, T* dstReal, T* dstImag)
{
    cpp::FFTInv(srcReal, srcImag, dstReal, dstImag, state, workBuffer);
}

// The export attribute comes from the extern declarations in the header;
// g++ ignores (and warns about) a second one here.
template class FFTImpl<FFTState_Complex_Float_Deinterleaved, std::complex<float>>;
template class FFTImpl<FFTState_Complex_Double_Deinterleaved, std::complex<double>>;

}  // namespace transform
}  // namespace kestaccel
