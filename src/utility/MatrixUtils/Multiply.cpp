#include "kestaccel/MatrixUtils.h"

#include "utility/MatrixUtils/MatrixKernels.h"

namespace kestaccel {
namespace utility {

void Multiply(MatrixDataOrder order, int rows, int cols, int inner, const float* a, const float* b, float* c)
{
    cpp::Multiply(order, rows, cols, inner, a, b, c);
}
void Multiply(MatrixDataOrder order, int rows, int cols, int inner, const double* a, const double* b, double* c)
{
    cpp::Multiply(order, rows, cols, inner, a, b, c);
}
void Multiply(MatrixDataOrder order, int rows, int cols, int inner, const std::complex<float>* a,
              const std::complex<float>* b, std::complex<float>* c)
{
    cpp::Multiply(order, rows, cols, inner, a, b, c);
}
void Multiply(MatrixDataOrder order, int rows, int cols, int inner, const std::complex<double>* a,
              const std::complex<double>* b, std::complex<double>* c)
{
    cpp::Multiply(order, rows, cols, inner, a, b, c);
}

}  // namespace utility
}  // namespace kestaccel
