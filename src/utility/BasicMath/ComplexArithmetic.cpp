#include "kestaccel/BasicMath.h"

#include "utility/BasicMath/ComplexArithmeticKernels.h"

namespace kestaccel {
namespace utility {

using ComplexF = std::complex<float>;
using ComplexD = std::complex<double>;

void Add(unsigned int count, const ComplexF* a, const ComplexF* b, ComplexF* dst) { cpp::Add(count, a, b, dst); }
void Add(unsigned int count, const ComplexD* a, const ComplexD* b, ComplexD* dst) { cpp::Add(count, a, b, dst); }
void Add_InPlace(unsigned int count, const ComplexF* src, ComplexF* srcDst) { cpp::Add_InPlace(count, src, srcDst); }
void Add_InPlace(unsigned int count, const ComplexD* src, ComplexD* srcDst) { cpp::Add_InPlace(count, src, srcDst); }
void Sub(unsigned int count, const ComplexF* a, const ComplexF* b, ComplexF* dst) { cpp::Sub(count, a, b, dst); }
void Sub(unsigned int count, const ComplexD* a, const ComplexD* b, ComplexD* dst) { cpp::Sub(count, a, b, dst); }
void Sub_InPlace(unsigned int count, const ComplexF* src, ComplexF* srcDst) { cpp::Sub_InPlace(count, src, srcDst); }
void Sub_InPlace(unsigned int count, const ComplexD* src, ComplexD* srcDst) { cpp::Sub_InPlace(count, src, srcDst); }
void AddConstant(unsigned int count, const ComplexF* src, ComplexF constant, ComplexF* dst) { cpp::AddConstant(count, src, constant, dst); }
void AddConstant(unsigned int count, const ComplexD* src, ComplexD constant, ComplexD* dst) { cpp::AddConstant(count, src, constant, dst); }
void AddConstant_InPlace(unsigned int count, ComplexF* srcDst, ComplexF constant) { cpp::AddConstant_InPlace(count, srcDst, constant); }
void AddConstant_InPlace(unsigned int count, ComplexD* srcDst, ComplexD constant) { cpp::AddConstant_InPlace(count, srcDst, constant); }
void SubConstant(unsigned int count, const ComplexF* src, ComplexF constant, ComplexF* dst) { cpp::SubConstant(count, src, constant, dst); }
void SubConstant(unsigned int count, const ComplexD* src, ComplexD constant, ComplexD* dst) { cpp::SubConstant(count, src, constant, dst); }
void SubConstant_InPlace(unsigned int count, ComplexF* srcDst, ComplexF constant) { cpp::SubConstant_InPlace(count, srcDst, constant); }
void SubConstant_InPlace(unsigned int count, ComplexD* srcDst, ComplexD constant) { cpp::SubConstant_InPlace(count, srcDst, constant); }
void SubConstantRev(unsigned int count, const ComplexF* src, ComplexF constant, ComplexF* dst) { cpp::SubConstantRev(count, src, constant, dst); }
void SubConstantRev(unsigned int count, const ComplexD* src, ComplexD constant, ComplexD* dst) { cpp::SubConstantRev(count, src, constant, dst); }
void SubConstantRev_InPlace(unsigned int count, ComplexF* srcDst, ComplexF constant) { cpp::SubConstantRev_InPlace(count, srcDst, constant); }
void SubConstantRev_InPlace(unsigned int count, ComplexD* srcDst, ComplexD constant) { cpp::SubConstantRev_InPlace(count, srcDst, constant); }
void Mul(unsigned int count, const ComplexF* a, const ComplexF* b, ComplexF* dst) { cpp::Mul(count, a, b, dst); }
void Mul(unsigned int count, const ComplexD* a, const ComplexD* b, ComplexD* dst) { cpp::Mul(count, a, b, dst); }
void Mul_InPlace(unsigned int count, const ComplexF* src, ComplexF* srcDst) { cpp::Mul_InPlace(count, src, srcDst); }
void Mul_InPlace(unsigned int count, const ComplexD* src, ComplexD* srcDst) { cpp::Mul_InPlace(count, src, srcDst); }
void MulConstant(unsigned int count, const ComplexF* src, ComplexF* dst, ComplexF constant) { cpp::MulConstant(count, src, dst, constant); }
void MulConstant(unsigned int count, const ComplexD* src, ComplexD* dst, ComplexD constant) { cpp::MulConstant(count, src, dst, constant); }
void MulConstant_InPlace(unsigned int count, ComplexF* srcDst, ComplexF constant) { cpp::MulConstant_InPlace(count, srcDst, constant); }
void MulConstant_InPlace(unsigned int count, ComplexD* srcDst, ComplexD constant) { cpp::MulConstant_InPlace(count, srcDst, constant); }
void AddProduct(unsigned int count, const ComplexF* a, const ComplexF* b, ComplexF* srcDst) { cpp::AddProduct(count, a, b, srcDst); }
void AddProduct(unsigned int count, const ComplexD* a, const ComplexD* b, ComplexD* srcDst) { cpp::AddProduct(count, a, b, srcDst); }
void Div(unsigned int count, const ComplexF* a, const ComplexF* b, ComplexF* dst) { cpp::Div(count, a, b, dst); }
void Div(unsigned int count, const ComplexD* a, const ComplexD* b, ComplexD* dst) { cpp::Div(count, a, b, dst); }
void Div_InPlace(unsigned int count, const ComplexF* src, ComplexF* srcDst) { cpp::Div_InPlace(count, src, srcDst); }
void Div_InPlace(unsigned int count, const ComplexD* src, ComplexD* srcDst) { cpp::Div_InPlace(count, src, srcDst); }
void DivConstant(unsigned int count, const ComplexF* src, ComplexF* dst, ComplexF constant) { cpp::DivConstant(count, src, dst, constant); }
void DivConstant(unsigned int count, const ComplexD* src, ComplexD* dst, ComplexD constant) { cpp::DivConstant(count, src, dst, constant); }
void DivConstant_InPlace(unsigned int count, ComplexF* srcDst, ComplexF constant) { cpp::DivConstant_InPlace(count, srcDst, constant); }
void DivConstant_InPlace(unsigned int count, ComplexD* srcDst, ComplexD constant) { cpp::DivConstant_InPlace(count, srcDst, constant); }

}  // namespace utility
}  // namespace kestaccel
