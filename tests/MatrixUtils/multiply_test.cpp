// Multiply against a naive triple loop written here. Eigen's product may
// round differently (blocking, and fused multiply-adds where its packager
// enabled them), so results are compared within 32 machine epsilons,
// absolutely or relative to the larger magnitude, never bit for bit; the
// layout, aliasing and edge cases are exact.

#include <kestaccel/MatrixUtils.h>

#include <algorithm>
#include <cmath>
#include <complex>
#include <cstdint>
#include <limits>
#include <new>
#include <vector>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
using kestaccel::MatrixDataOrder;
using kestaccel::utility::Multiply;

template <class T>
struct Scalar {
    using type = T;
};
template <class T>
struct Scalar<std::complex<T>> {
    using type = T;
};

template <class T>
std::vector<T> Random(std::size_t count, std::uint32_t seed)
{
    return RandomReals<T>(count, seed);
}
template <>
std::vector<std::complex<float>> Random(std::size_t count, std::uint32_t seed)
{
    return RandomComplex<float>(count, seed);
}
template <>
std::vector<std::complex<double>> Random(std::size_t count, std::uint32_t seed)
{
    return RandomComplex<double>(count, seed);
}

std::size_t At(MatrixDataOrder order, int r, int c, int rowCount, int colCount)
{
    return order == kestaccel::RowMajor ? static_cast<std::size_t>(r) * colCount + c
                                        : static_cast<std::size_t>(c) * rowCount + r;
}

template <class T>
std::vector<T> Naive(MatrixDataOrder order, int rows, int cols, int inner, const std::vector<T>& a,
                     const std::vector<T>& b)
{
    std::vector<T> c(static_cast<std::size_t>(rows) * cols);
    for (int r = 0; r < rows; ++r) {
        for (int col = 0; col < cols; ++col) {
            T acc = T(0);
            for (int k = 0; k < inner; ++k)
                acc += a[At(order, r, k, rows, inner)] * b[At(order, k, col, inner, cols)];
            c[At(order, r, col, rows, cols)] = acc;
        }
    }
    return c;
}

template <class R>
bool Close(R expected, R actual)
{
    const R tolerance = 32 * std::numeric_limits<R>::epsilon();
    const R diff = std::fabs(expected - actual);
    return diff <= tolerance || diff <= tolerance * std::max(std::fabs(expected), std::fabs(actual));
}

template <class R>
bool Close(std::complex<R> expected, std::complex<R> actual)
{
    return Close(expected.real(), actual.real()) && Close(expected.imag(), actual.imag());
}

template <class T>
::testing::AssertionResult AllClose(const std::vector<T>& expected, const T* actual)
{
    for (std::size_t i = 0; i < expected.size(); ++i) {
        if (!Close(expected[i], actual[i]))
            return ::testing::AssertionFailure() << "at " << i << ": expected " << expected[i] << ", got " << actual[i];
    }
    return ::testing::AssertionSuccess();
}

struct Shape {
    int rows, cols, inner;
};

const MatrixDataOrder kOrders[] = {kestaccel::RowMajor, kestaccel::ColMajor};

template <class T>
class MultiplyTyped : public ::testing::Test {};
using ElementTypes = ::testing::Types<float, double, std::complex<float>, std::complex<double>>;
TYPED_TEST_SUITE(MultiplyTyped, ElementTypes);

TYPED_TEST(MultiplyTyped, AgreesWithNaiveSumWithin32Epsilons)
{
    using T = TypeParam;
    const Shape shapes[] = {{1, 1, 1}, {2, 2, 2},   {2, 3, 4},    {7, 3, 5},   {60, 40, 50},
                            {40, 60, 50}, {64, 64, 64}, {17, 33, 129}, {1, 50, 70}, {50, 1, 70}};
    std::uint32_t seed = 8000;
    for (const auto order : kOrders) {
        for (const auto& s : shapes) {
            ++seed;
            SCOPED_TRACE(SeedTrace(seed));
            SCOPED_TRACE("order " + std::to_string(order) + " rows " + std::to_string(s.rows) + " cols " +
                         std::to_string(s.cols) + " inner " + std::to_string(s.inner));
            const auto a = Random<T>(static_cast<std::size_t>(s.rows) * s.inner, seed);
            const auto b = Random<T>(static_cast<std::size_t>(s.inner) * s.cols, seed + 50000);
            GuardedBuffer<T> c(static_cast<std::size_t>(s.rows) * s.cols);
            Multiply(order, s.rows, s.cols, s.inner, a.data(), b.data(), c.data());
            EXPECT_TRUE(AllClose(Naive(order, s.rows, s.cols, s.inner, a, b), c.data()));
            EXPECT_TRUE(c.Intact());
        }
    }
}

// A column-major product is the row-major product of the swapped operands
// with the outer dimensions exchanged.
TYPED_TEST(MultiplyTyped, ColumnMajorIsRowMajorOfTheTransposes)
{
    using T = TypeParam;
    const int m = 60, n = 40, k = 50;
    const auto a = Random<T>(m * k, 8101), b = Random<T>(k * n, 8102);
    std::vector<T> col(m * n), row(m * n);
    Multiply(kestaccel::ColMajor, m, n, k, a.data(), b.data(), col.data());
    Multiply(kestaccel::RowMajor, n, m, k, b.data(), a.data(), row.data());
    EXPECT_TRUE(AllClose(col, row.data()));
}

// c may be a or b: the product is complete before c is written.
TYPED_TEST(MultiplyTyped, OutputMayAliasAnOperand)
{
    using T = TypeParam;
    for (const auto order : kOrders) {
        for (int n : {2, 3, 64}) {
            const std::uint32_t seed = 8200 + n;
            SCOPED_TRACE(SeedTrace(seed));
            const auto a = Random<T>(n * n, seed), b = Random<T>(n * n, seed + 1);
            const auto expected = Naive(order, n, n, n, a, b);
            auto left = a;
            Multiply(order, n, n, n, left.data(), b.data(), left.data());
            EXPECT_TRUE(AllClose(expected, left.data())) << "c == a, n " << n;
            auto right = b;
            Multiply(order, n, n, n, a.data(), right.data(), right.data());
            EXPECT_TRUE(AllClose(expected, right.data())) << "c == b, n " << n;
            auto both = a;
            Multiply(order, n, n, n, both.data(), both.data(), both.data());
            EXPECT_TRUE(AllClose(Naive(order, n, n, n, a, a), both.data())) << "c == a == b, n " << n;
        }
    }
}

TYPED_TEST(MultiplyTyped, UnknownOrderLeavesOutputUntouched)
{
    using T = TypeParam;
    const auto a = Random<T>(12, 8301), b = Random<T>(12, 8302);
    for (int order : {2, 3, -1, 256}) {
        const auto before = Random<T>(9, 8303);
        auto c = before;
        Multiply(static_cast<MatrixDataOrder>(order), 3, 3, 4, a.data(), b.data(), c.data());
        EXPECT_TRUE(SameBitsArray(before, c)) << "order " << order;
    }
}

TYPED_TEST(MultiplyTyped, EmptyResultWritesNothing)
{
    using T = TypeParam;
    const auto a = Random<T>(20, 8401), b = Random<T>(20, 8402);
    for (const auto order : kOrders) {
        GuardedBuffer<T> c(0);
        Multiply(order, 0, 5, 4, a.data(), b.data(), c.data());
        Multiply(order, 5, 0, 4, a.data(), b.data(), c.data());
        EXPECT_TRUE(c.Intact());
    }
}

TYPED_TEST(MultiplyTyped, NoInnerDimensionFillsZeros)
{
    using T = TypeParam;
    using R = typename Scalar<T>::type;
    for (const auto order : kOrders) {
        GuardedBuffer<T> c(12, T(std::numeric_limits<R>::quiet_NaN()));
        Multiply(order, 3, 4, 0, static_cast<const T*>(nullptr), static_cast<const T*>(nullptr), c.data());
        for (std::size_t i = 0; i < 12; ++i) EXPECT_TRUE(SameBits(T(0), c[i])) << "at " << i;
        EXPECT_TRUE(c.Intact());
    }
}

TYPED_TEST(MultiplyTyped, WorkedRowMajorExample)
{
    using T = TypeParam;
    const T a[] = {T(1), T(2), T(3), T(4), T(5), T(6)};
    const T b[] = {T(1), T(0), T(0), T(1), T(1), T(1)};
    const T expected[] = {T(4), T(5), T(10), T(11)};
    GuardedBuffer<T> c(4);
    Multiply(kestaccel::RowMajor, 2, 2, 3, a, b, c.data());
    EXPECT_TRUE(SameBitsArray(expected, c.data(), 4));
    EXPECT_TRUE(c.Intact());
    // The same buffers read column-major: a is 2 x 3 with columns (1,2), (3,4),
    // (5,6), b is 3 x 2 with columns (1,0,0), (1,1,1).
    const T expectedCol[] = {T(1), T(2), T(9), T(12)};
    Multiply(kestaccel::ColMajor, 2, 2, 3, a, b, c.data());
    EXPECT_TRUE(SameBitsArray(expectedCol, c.data(), 4));
}

// A temporary of 2^60 complex doubles is more bytes than a size_t can
// count, so it cannot be had: the call throws before c is touched and
// before either operand is read past its first element. (The size is
// refused before any allocation is attempted, so no memory is reserved.)
TEST(Multiply, FailedTemporaryThrowsBadAllocAndLeavesOutput)
{
    using C = std::complex<double>;
    const C a[1] = {C(1, 0)}, b[1] = {C(2, 0)};
    GuardedBuffer<C> c(1, C(7, -7));
    EXPECT_THROW(Multiply(kestaccel::RowMajor, 1 << 30, 1 << 30, 1, a, b, c.data()), std::bad_alloc);
    EXPECT_TRUE(SameBits(C(7, -7), c[0]));
    EXPECT_TRUE(c.Intact());
}

// Complex operands are neither conjugated nor transposed.
TEST(Multiply, ComplexIsThePlainProduct)
{
    using C = std::complex<double>;
    const C a[] = {C(0, 1), C(2, 0)};   // 1 x 2
    const C b[] = {C(0, 1), C(1, -1)};  // 2 x 1
    C c[1];
    Multiply(kestaccel::RowMajor, 1, 1, 2, a, b, c);
    // i * i + 2 * (1 - i) = -1 + 2 - 2i
    EXPECT_TRUE(SameBits(C(1, -2), c[0]));
}

}  // namespace
