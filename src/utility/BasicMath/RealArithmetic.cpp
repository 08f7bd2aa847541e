#include "kestaccel/BasicMath.h"

#include "utility/BasicMath/RealArithmeticKernels.h"

namespace kestaccel {
namespace utility {

void Add(unsigned int count, const float* a, const float* b, float* dst) { cpp::Add(count, a, b, dst); }
void Add(unsigned int count, const double* a, const double* b, double* dst) { cpp::Add(count, a, b, dst); }
void Add_InPlace(unsigned int count, const float* src, float* srcDst) { cpp::Add_InPlace(count, src, srcDst); }
void Add_InPlace(unsigned int count, const double* src, double* srcDst) { cpp::Add_InPlace(count, src, srcDst); }
void Sub(unsigned int count, const float* a, const float* b, float* dst) { cpp::Sub(count, a, b, dst); }
void Sub(unsigned int count, const double* a, const double* b, double* dst) { cpp::Sub(count, a, b, dst); }
void Sub_InPlace(unsigned int count, const float* src, float* srcDst) { cpp::Sub_InPlace(count, src, srcDst); }
void Sub_InPlace(unsigned int count, const double* src, double* srcDst) { cpp::Sub_InPlace(count, src, srcDst); }
void Mul(unsigned int count, const float* a, const float* b, float* dst) { cpp::Mul(count, a, b, dst); }
void Mul(unsigned int count, const double* a, const double* b, double* dst) { cpp::Mul(count, a, b, dst); }
void Mul_InPlace(unsigned int count, const float* src, float* srcDst) { cpp::Mul_InPlace(count, src, srcDst); }
void Mul_InPlace(unsigned int count, const double* src, double* srcDst) { cpp::Mul_InPlace(count, src, srcDst); }
void Div(unsigned int count, const float* a, const float* b, float* dst) { cpp::Div(count, a, b, dst); }
void Div(unsigned int count, const double* a, const double* b, double* dst) { cpp::Div(count, a, b, dst); }
void Div_InPlace(unsigned int count, const float* src, float* srcDst) { cpp::Div_InPlace(count, src, srcDst); }
void Div_InPlace(unsigned int count, const double* src, double* srcDst) { cpp::Div_InPlace(count, src, srcDst); }
void AddConstant(unsigned int count, const float* src, float constant, float* dst) { cpp::AddConstant(count, src, constant, dst); }
void AddConstant(unsigned int count, const double* src, double constant, double* dst) { cpp::AddConstant(count, src, constant, dst); }
void AddConstant_InPlace(unsigned int count, float* srcDst, float constant) { cpp::AddConstant_InPlace(count, srcDst, constant); }
void AddConstant_InPlace(unsigned int count, double* srcDst, double constant) { cpp::AddConstant_InPlace(count, srcDst, constant); }
void SubConstant(unsigned int count, const float* src, float constant, float* dst) { cpp::SubConstant(count, src, constant, dst); }
void SubConstant(unsigned int count, const double* src, double constant, double* dst) { cpp::SubConstant(count, src, constant, dst); }
void SubConstant_InPlace(unsigned int count, float* srcDst, float constant) { cpp::SubConstant_InPlace(count, srcDst, constant); }
void SubConstant_InPlace(unsigned int count, double* srcDst, double constant) { cpp::SubConstant_InPlace(count, srcDst, constant); }
void SubConstantRev(unsigned int count, const float* src, float constant, float* dst) { cpp::SubConstantRev(count, src, constant, dst); }
void SubConstantRev(unsigned int count, const double* src, double constant, double* dst) { cpp::SubConstantRev(count, src, constant, dst); }
void SubConstantRev_InPlace(unsigned int count, float* srcDst, float constant) { cpp::SubConstantRev_InPlace(count, srcDst, constant); }
void SubConstantRev_InPlace(unsigned int count, double* srcDst, double constant) { cpp::SubConstantRev_InPlace(count, srcDst, constant); }
void MulConstant(unsigned int count, const float* src, float* dst, float constant) { cpp::MulConstant(count, src, dst, constant); }
void MulConstant(unsigned int count, const double* src, double* dst, double constant) { cpp::MulConstant(count, src, dst, constant); }
void MulConstant_InPlace(unsigned int count, float* srcDst, float constant) { cpp::MulConstant_InPlace(count, srcDst, constant); }
void MulConstant_InPlace(unsigned int count, double* srcDst, double constant) { cpp::MulConstant_InPlace(count, srcDst, constant); }
void DivConstant(unsigned int count, const float* src, float* dst, float constant) { cpp::DivConstant(count, src, dst, constant); }
void DivConstant(unsigned int count, const double* src, double* dst, double constant) { cpp::DivConstant(count, src, dst, constant); }
void DivConstant_InPlace(unsigned int count, float* srcDst, float constant) { cpp::DivConstant_InPlace(count, srcDst, constant); }
void DivConstant_InPlace(unsigned int count, double* srcDst, double constant) { cpp::DivConstant_InPlace(count, srcDst, constant); }
void DivConstantRev(unsigned int count, float constant, const float* src, float* dst) { cpp::DivConstantRev(count, constant, src, dst); }
void AddProduct(unsigned int count, const float* a, const float* b, float* srcDst) { cpp::AddProduct(count, a, b, srcDst); }
void AddProduct(unsigned int count, const double* a, const double* b, double* srcDst) { cpp::AddProduct(count, a, b, srcDst); }
void AddConstantProduct(unsigned int count, const float* src, float* srcDst, float constant) { cpp::AddConstantProduct(count, src, srcDst, constant); }
void AddConstantProduct(unsigned int count, const double* src, double* srcDst, double constant) { cpp::AddConstantProduct(count, src, srcDst, constant); }
void MulConstant_InPlace(unsigned int count, short* srcDst, short constant, int scale) { cpp::MulConstant_InPlace(count, srcDst, constant, scale); }

}  // namespace utility
}  // namespace kestaccel
