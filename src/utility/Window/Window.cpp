#include "kestaccel/Window.h"

#include "utility/Window/WindowKernels.h"

namespace kestaccel {
namespace utility {

void WindowBartlett(unsigned int n, const float* src, float* dst) { cpp::WindowBartlett(n, src, dst); }
void WindowBartlett(unsigned int n, const double* src, double* dst) { cpp::WindowBartlett(n, src, dst); }
void WindowHann(unsigned int n, const float* src, float* dst) { cpp::WindowHann(n, src, dst); }
void WindowHann(unsigned int n, const double* src, double* dst) { cpp::WindowHann(n, src, dst); }
void WindowHamming(unsigned int n, const float* src, float* dst) { cpp::WindowHamming(n, src, dst); }
void WindowHamming(unsigned int n, const double* src, double* dst) { cpp::WindowHamming(n, src, dst); }
void WindowBlackman(unsigned int n, const float* src, float* dst, float alpha) { cpp::WindowBlackman(n, src, dst, alpha); }
void WindowBlackman(unsigned int n, const double* src, double* dst, double alpha) { cpp::WindowBlackman(n, src, dst, alpha); }
void WindowKaiser(unsigned int n, const float* src, float* dst, float alpha) { cpp::WindowKaiser(n, src, dst, alpha); }
void WindowKaiser(unsigned int n, const double* src, double* dst, double alpha) { cpp::WindowKaiser(n, src, dst, alpha); }

}  // namespace utility
}  // namespace kestaccel
