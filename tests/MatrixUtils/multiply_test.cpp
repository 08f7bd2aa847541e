// Multiply against a naive triple loop within 32 epsilons, as Eigen may block
// or fuse; layout, aliasing and edge cases are exact.

#include <kestaccel/MatrixUtils.h>

#include <new>

#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
using namespace kestaccel;
using kestaccel::utility::Multiply;

template <class T>
std::vector<T> Random(std::size_t count, std::uint32_t seed)
{
    if constexpr (std::is_floating_point<T>::value) return RandomReals<T>(count, seed);
    else return RandomComplex<typename T::value_type>(count, seed);
}

// Column-major is the row-major product of the swapped operands, transposed.
template <class T>
std::vector<T> Naive(MatrixDataOrder order, int rows, int cols, int inner, const std::vector<T>& a,
                     const std::vector<T>& b)
{
    if (order == ColMajor) return Naive(RowMajor, cols, rows, inner, b, a);
    std::vector<T> c(static_cast<std::size_t>(rows) * cols);
    for (int r = 0; r < rows; ++r) {
        for (int col = 0; col < cols; ++col) {
            T acc = T(0);
            for (int k = 0; k < inner; ++k) acc += a[r * inner + k] * b[k * cols + col];
            c[r * cols + col] = acc;
        }
    }
    return c;
}

// Each component within 32 epsilons, absolutely or relative to the larger magnitude.
template <class T>
::testing::AssertionResult AllClose(const std::vector<T>& expected, const T* actual)
{
    using R = decltype(std::abs(T()));
    const R tolerance = 32 * std::numeric_limits<R>::epsilon();
    const auto close = [tolerance](R e, R a) {
        return std::fabs(e - a) <= tolerance * std::max({R(1), std::fabs(e), std::fabs(a)});
    };
    for (std::size_t i = 0; i < expected.size(); ++i) {
        const std::complex<R> e(expected[i]), a(actual[i]);
        if (!close(e.real(), a.real()) || !close(e.imag(), a.imag()))
            return ::testing::AssertionFailure() << "at " << i << ": expected " << expected[i] << ", got " << actual[i];
    }
    return ::testing::AssertionSuccess();
}

template <class T>
class MultiplyTyped : public ::testing::Test {};
using ElementTypes = ::testing::Types<float, double, std::complex<float>, std::complex<double>>;
TYPED_TEST_SUITE(MultiplyTyped, ElementTypes);

// Both orders; for square shapes c may also be a, b or both.
TYPED_TEST(MultiplyTyped, AgreesWithNaiveSumWithin32Epsilons)
{
    using T = TypeParam;
    struct Shape { int rows, cols, inner; };
    const Shape shapes[] = {{1, 1, 1},    {2, 2, 2},    {3, 3, 3},     {2, 3, 4},  {7, 3, 5},  {60, 40, 50},
                            {40, 60, 50}, {64, 64, 64}, {17, 33, 129}, {1, 50, 70}, {50, 1, 70}};
    std::uint32_t seed = 8000;
    for (const auto order : {RowMajor, ColMajor}) {
        for (const auto& s : shapes) {
            ++seed;
            SCOPED_TRACE(SeedTrace(seed) + " order " + std::to_string(order) + " rows " + std::to_string(s.rows) +
                         " cols " + std::to_string(s.cols) + " inner " + std::to_string(s.inner));
            const auto a = Random<T>(static_cast<std::size_t>(s.rows) * s.inner, seed);
            const auto b = Random<T>(static_cast<std::size_t>(s.inner) * s.cols, seed + 50000);
            const auto expected = Naive(order, s.rows, s.cols, s.inner, a, b);
            GuardedBuffer<T> c(expected.size());
            Multiply(order, s.rows, s.cols, s.inner, a.data(), b.data(), c.data());
            EXPECT_TRUE(AllClose(expected, c.data()) && c.Intact());
            if (s.rows != s.cols || s.cols != s.inner) continue;
            const int n = s.rows;
            auto left = a, right = b, both = a;
            Multiply(order, n, n, n, left.data(), b.data(), left.data());
            Multiply(order, n, n, n, a.data(), right.data(), right.data());
            Multiply(order, n, n, n, both.data(), both.data(), both.data());
            EXPECT_TRUE(AllClose(expected, left.data())) << "c == a";
            EXPECT_TRUE(AllClose(expected, right.data())) << "c == b";
            EXPECT_TRUE(AllClose(Naive(order, n, n, n, a, a), both.data())) << "c == a == b";
        }
    }
}

// An order other than 0 and 1 leaves c untouched; rows or cols of 0 write
// nothing; inner of 0 gives zeros. One worked example read both ways.
TYPED_TEST(MultiplyTyped, ExactCases)
{
    using T = TypeParam;
    const auto a = Random<T>(20, 8301), b = Random<T>(20, 8302), before = Random<T>(9, 8303);
    for (int order : {2, 3, -1, 256}) {
        auto c = before;
        Multiply(static_cast<MatrixDataOrder>(order), 3, 3, 4, a.data(), b.data(), c.data());
        EXPECT_TRUE(SameBitsArray(before, c)) << "order " << order;
    }
    for (const auto order : {RowMajor, ColMajor}) {
        GuardedBuffer<T> none(0);
        Multiply(order, 0, 5, 4, a.data(), b.data(), none.data());
        Multiply(order, 5, 0, 4, a.data(), b.data(), none.data());
        EXPECT_TRUE(none.Intact());
        GuardedBuffer<T> c(12, T(std::numeric_limits<double>::quiet_NaN()));
        Multiply(order, 3, 4, 0, static_cast<const T*>(nullptr), static_cast<const T*>(nullptr), c.data());
        EXPECT_TRUE(SameBitsArray(std::vector<T>(12, T(0)), c.values()) && c.Intact());
    }
    const T x[] = {T(1), T(2), T(3), T(4), T(5), T(6)}, y[] = {T(1), T(0), T(0), T(1), T(1), T(1)};
    GuardedBuffer<T> c(4);
    Multiply(RowMajor, 2, 2, 3, x, y, c.data());
    EXPECT_TRUE(SameBitsArray({T(4), T(5), T(10), T(11)}, c.values()) && c.Intact());
    Multiply(ColMajor, 2, 2, 3, x, y, c.data());
    EXPECT_TRUE(SameBitsArray({T(1), T(2), T(9), T(12)}, c.values()));
}

// 2^60 complex doubles cannot be counted in a size_t: bad_alloc before c is
// touched, and before any memory is reserved.
TEST(Multiply, FailedTemporaryThrowsBadAllocAndLeavesOutput)
{
    using C = std::complex<double>;
    const C a[1] = {C(1, 0)}, b[1] = {C(2, 0)};
    GuardedBuffer<C> c(1, C(7, -7));
    EXPECT_THROW(Multiply(RowMajor, 1 << 30, 1 << 30, 1, a, b, c.data()), std::bad_alloc);
    EXPECT_TRUE(SameBits(C(7, -7), c[0]) && c.Intact());
}

}  // namespace
