#include "kestaccel/BasicMath.h"

#include "utility/BasicMath/ElementwiseKernels.h"
#include "utility/BasicMath/InvertThresholdKernels.h"
#include "utility/BasicMath/PolarKernels.h"

namespace kestaccel {
namespace utility {

void Sqr(unsigned int count, const float* src, float* dst) { cpp::Sqr(count, src, dst); }
void Sqr(unsigned int count, const double* src, double* dst) { cpp::Sqr(count, src, dst); }
void Sqr_InPlace(unsigned int count, float* srcDst) { cpp::Sqr_InPlace(count, srcDst); }
void Sqr_InPlace(unsigned int count, double* srcDst) { cpp::Sqr_InPlace(count, srcDst); }
void Sqrt(unsigned int count, const float* src, float* dst) { cpp::Sqrt(count, src, dst); }
void Sqrt(unsigned int count, const double* src, double* dst) { cpp::Sqrt(count, src, dst); }
void Sqrt_InPlace(unsigned int count, float* srcDst) { cpp::Sqrt_InPlace(count, srcDst); }
void Sqrt_InPlace(unsigned int count, double* srcDst) { cpp::Sqrt_InPlace(count, srcDst); }
void Exp(unsigned int count, const float* src, float* dst) { cpp::Exp(count, src, dst); }
void Exp(unsigned int count, const double* src, double* dst) { cpp::Exp(count, src, dst); }
void Exp_InPlace(unsigned int count, float* srcDst) { cpp::Exp_InPlace(count, srcDst); }
void Exp_InPlace(unsigned int count, double* srcDst) { cpp::Exp_InPlace(count, srcDst); }
void Ln(unsigned int count, const float* src, float* dst) { cpp::Ln(count, src, dst); }
void Ln(unsigned int count, const double* src, double* dst) { cpp::Ln(count, src, dst); }
void Ln_InPlace(unsigned int count, float* srcDst) { cpp::Ln_InPlace(count, srcDst); }
void Ln_Prec11(unsigned int count, const float* src, float* dst) { cpp::Ln_Prec11(count, src, dst); }
void Ln_Prec21(unsigned int count, const float* src, float* dst) { cpp::Ln_Prec21(count, src, dst); }
void Ln_Prec24(unsigned int count, const float* src, float* dst) { cpp::Ln_Prec24(count, src, dst); }
void Pow(unsigned int count, const float* a, const float* b, float* dst) { cpp::Pow(count, a, b, dst); }
void Pow(unsigned int count, const double* a, const double* b, double* dst) { cpp::Pow(count, a, b, dst); }
void Pow_Prec26(unsigned int count, const double* a, const double* b, double* dst) { cpp::Pow_Prec26(count, a, b, dst); }
void Inverse(unsigned int count, const float* src, float* dst) { cpp::Inverse(count, src, dst); }
void Inverse(unsigned int count, const double* src, double* dst) { cpp::Inverse(count, src, dst); }
void Inverse_Prec26(unsigned int count, const double* src, double* dst) { cpp::Inverse_Prec26(count, src, dst); }
void Abs(unsigned int count, const float* src, float* dst) { cpp::Abs(count, src, dst); }
void Abs(unsigned int count, const double* src, double* dst) { cpp::Abs(count, src, dst); }
void Abs_InPlace(unsigned int count, float* srcDst) { cpp::Abs_InPlace(count, srcDst); }
void Abs_InPlace(unsigned int count, double* srcDst) { cpp::Abs_InPlace(count, srcDst); }
void Round(unsigned int count, const float* src, float* dst) { cpp::Round(count, src, dst); }
void Round(unsigned int count, const double* src, double* dst) { cpp::Round(count, src, dst); }
void Flip(unsigned int count, const float* src, float* dst) { cpp::Flip(count, src, dst); }
void Flip(unsigned int count, const double* src, double* dst) { cpp::Flip(count, src, dst); }
void Flip_InPlace(unsigned int count, float* srcDst) { cpp::Flip_InPlace(count, srcDst); }
void Flip_InPlace(unsigned int count, double* srcDst) { cpp::Flip_InPlace(count, srcDst); }
void Magnitude(unsigned int count, const float* re, const float* im, float* dst) { cpp::Magnitude(count, re, im, dst); }
void Magnitude(unsigned int count, const double* re, const double* im, double* dst) { cpp::Magnitude(count, re, im, dst); }
void Magnitude(unsigned int count, const std::complex<float>* src, float* dst) { cpp::Magnitude(count, src, dst); }
void Magnitude(unsigned int count, const std::complex<double>* src, double* dst) { cpp::Magnitude(count, src, dst); }
void PowerSpectr(unsigned int count, const std::complex<float>* src, float* dst) { cpp::PowerSpectr(count, src, dst); }
void PowerSpectr(unsigned int count, const std::complex<double>* src, double* dst) { cpp::PowerSpectr(count, src, dst); }
void CartToPolar(unsigned int count, const float* src, float* magnitude, float* phase) { cpp::CartToPolar(count, src, magnitude, phase); }
void PolarToCart(unsigned int count, const float* magnitude, const float* phase, float* dst) { cpp::PolarToCart(count, magnitude, phase, dst); }
void Normalize(unsigned int count, const float* src, float* dst, float offset, float divisor) { cpp::Normalize(count, src, dst, offset, divisor); }
void Normalize(unsigned int count, const double* src, double* dst, double offset, double divisor) { cpp::Normalize(count, src, dst, offset, divisor); }
void Invert_Threshold_InPlace(unsigned int count, float* srcDst, float threshold) { cpp::Invert_Threshold_InPlace(count, srcDst, threshold); }
void Invert_Threshold_InPlace(unsigned int count, double* srcDst, double threshold) { cpp::Invert_Threshold_InPlace(count, srcDst, threshold); }
void Invert_Threshold_InPlace(unsigned int count, std::complex<float>* srcDst, float threshold) { cpp::Invert_Threshold_InPlace(count, srcDst, threshold); }
void Invert_Threshold_InPlace(unsigned int count, std::complex<double>* srcDst, double threshold) { cpp::Invert_Threshold_InPlace(count, srcDst, threshold); }

}  // namespace utility
}  // namespace kestaccel
