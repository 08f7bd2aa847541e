#pragma once

// FFT test helpers: the tolerance rule, a long-double direct DFT as the
// oracle, and the state types of each precision.

#include <kestaccel/FFT.h>

#include <cmath>
#include <complex>
#include <vector>

#include "support/TestSupport.h"

namespace fft_test {

template <class E>
constexpr E Eps()
{
    return sizeof(E) == 4 ? E(1.0 / 8388608.0) : E(1.0 / 4503599627370496.0);
}

// Within t eps, absolutely or relative to the larger magnitude.
template <class E>
::testing::AssertionResult Agrees(long double expected, E actual, double t)
{
    const long double diff = std::fabs(static_cast<long double>(actual) - expected);
    const long double bound = t * static_cast<long double>(Eps<E>());
    const long double larger = std::fmax(std::fabs(expected), std::fabs(static_cast<long double>(actual)));
    if (diff <= bound || diff <= bound * larger) return ::testing::AssertionSuccess();
    return ::testing::AssertionFailure() << "expected " << static_cast<double>(expected) << ", got " << actual
                                         << " (off by " << static_cast<double>(diff / Eps<E>()) << " eps)";
}

// X[k] = sum x[n] exp(-2 pi i k n / N) in long double, ascending n.
inline std::vector<std::complex<long double>> DirectDFT(const std::vector<std::complex<long double>>& x)
{
    const std::size_t n = x.size();
    const long double pi = 3.141592653589793238462643383279502884L;
    std::vector<std::complex<long double>> factor(n), result(n);
    for (std::size_t m = 0; m < n; ++m) {
        const long double angle = -2.0L * pi * static_cast<long double>(m) / static_cast<long double>(n);
        factor[m] = {std::cos(angle), std::sin(angle)};
    }
    for (std::size_t k = 0; k < n; ++k) {
        long double re = 0, im = 0;
        for (std::size_t i = 0; i < n; ++i) {
            const auto& w = factor[(k * i) % n];
            re += x[i].real() * w.real() - x[i].imag() * w.imag();
            im += x[i].real() * w.imag() + x[i].imag() * w.real();
        }
        result[k] = {re, im};
    }
    return result;
}

// exp(-2 pi i j / 8); the quarter turns are exact.
inline std::complex<long double> EighthRoot(unsigned int j)
{
    const long double h = 0.7071067811865476;  // the double nearest to sqrt(1/2)
    const std::complex<long double> roots[8] = {{1, 0}, {h, -h}, {0, -1}, {-h, -h}, {-1, 0}, {-h, h}, {0, 1}, {h, h}};
    return roots[j % 8];
}

template <class E>
struct States;
template <>
struct States<float> {
    using Real = kestaccel::FFTState_Float;
    using Interleaved = kestaccel::FFTState_Complex_Float_Interleaved;
    using Deinterleaved = kestaccel::FFTState_Complex_Float_Deinterleaved;
};
template <>
struct States<double> {
    using Real = kestaccel::FFTState_Double;
    using Interleaved = kestaccel::FFTState_Complex_Double_Interleaved;
    using Deinterleaved = kestaccel::FFTState_Complex_Double_Deinterleaved;
};

template <class State>
class StateHolder {
public:
    explicit StateHolder(unsigned int order) { kestaccel::transform::FFTInit(&state_, order); }
    ~StateHolder() { kestaccel::transform::FFTFree(state_); }
    StateHolder(const StateHolder&) = delete;
    StateHolder& operator=(const StateHolder&) = delete;
    State* get() const { return state_; }

private:
    State* state_ = nullptr;
};

// FFTFwd or FFTInv on any layout.
template <class State, class... Arrays>
void Transform(bool inverse, State* state, Arrays... arrays)
{
    if (inverse) {
        kestaccel::transform::FFTInv(arrays..., state, nullptr);
    } else {
        kestaccel::transform::FFTFwd(arrays..., state, nullptr);
    }
}

}  // namespace fft_test
