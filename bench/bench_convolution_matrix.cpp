// Convolve in multiply-adds per second, against VOLK's dot product applied
// once per output (a SIMD peer free to reorder each sum); Multiply against
// Eigen's product of the same mapped buffers with noalias(), which skips the
// temporary that Multiply's plain assignment needs for aliasing.

#include <kestaccel/DSP.h>
#include <kestaccel/MatrixUtils.h>

#include <Eigen/Dense>

#include <algorithm>

#include "BenchSupport.h"

#ifdef KESTACCEL_BENCH_HAVE_VOLK
#include <volk/volk.h>
#endif

namespace {

using namespace kestaccel_bench;

void SetMultiplyAdds(benchmark::State& state, double perIteration)
{
    state.counters["MAC/s"] =
        benchmark::Counter(perIteration * static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
}

void ConvolveOurs(benchmark::State& state)
{
    const auto countA = static_cast<unsigned int>(state.range(0));
    const auto countB = static_cast<unsigned int>(state.range(1));
    const auto a = RandomData<float>(countA, 11), b = RandomData<float>(countB, 12);
    std::vector<float> dst(countA + countB - 1);
    for (auto _ : state) {
        kestaccel::utility::Convolve(countA, a.data(), countB, b.data(), dst.data());
        benchmark::ClobberMemory();
    }
    SetMultiplyAdds(state, static_cast<double>(countA) * countB);
}

#ifdef KESTACCEL_BENCH_HAVE_VOLK
// Output k is the dot product of a[lo .. hi] with b reversed, so b is
// reversed once outside the timed loop.
void ConvolveVolk(benchmark::State& state)
{
    const auto countA = static_cast<unsigned int>(state.range(0));
    const auto countB = static_cast<unsigned int>(state.range(1));
    const auto a = RandomData<float>(countA, 11), b = RandomData<float>(countB, 12);
    std::vector<float> reversed(b.rbegin(), b.rend());
    const unsigned int total = countA + countB - 1;
    std::vector<float> dst(total);
    for (auto _ : state) {
        for (unsigned int k = 0; k < total; ++k) {
            const unsigned int lo = k >= countB - 1 ? k - countB + 1 : 0;
            const unsigned int hi = std::min(k, countA - 1);
            // reversed[i] = b[countB - 1 - i]; b[k - lo] is reversed[countB - 1 - k + lo].
            volk_32f_x2_dot_prod_32f(&dst[k], a.data() + lo, reversed.data() + (countB - 1 - k + lo), hi - lo + 1);
        }
        benchmark::ClobberMemory();
    }
    SetMultiplyAdds(state, static_cast<double>(countA) * countB);
}
#endif

template <class T>
void MultiplyOurs(benchmark::State& state)
{
    const int n = static_cast<int>(state.range(0));
    const auto a = RandomData<T>(static_cast<std::size_t>(n) * n, 21), b = RandomData<T>(static_cast<std::size_t>(n) * n, 22);
    std::vector<T> c(static_cast<std::size_t>(n) * n);
    for (auto _ : state) {
        kestaccel::utility::Multiply(kestaccel::RowMajor, n, n, n, a.data(), b.data(), c.data());
        benchmark::ClobberMemory();
    }
    SetMultiplyAdds(state, static_cast<double>(n) * n * n);
}

template <class T>
void MultiplyEigen(benchmark::State& state)
{
    using Matrix = Eigen::Matrix<T, Eigen::Dynamic, Eigen::Dynamic, Eigen::RowMajor>;
    const int n = static_cast<int>(state.range(0));
    const auto a = RandomData<T>(static_cast<std::size_t>(n) * n, 21), b = RandomData<T>(static_cast<std::size_t>(n) * n, 22);
    std::vector<T> c(static_cast<std::size_t>(n) * n);
    const Eigen::Map<const Matrix> lhs(a.data(), n, n), rhs(b.data(), n, n);
    Eigen::Map<Matrix> result(c.data(), n, n);
    for (auto _ : state) {
        result.noalias() = lhs * rhs;
        benchmark::ClobberMemory();
    }
    SetMultiplyAdds(state, static_cast<double>(n) * n * n);
}

const bool registered = [] {
    for (auto shape : {std::vector<long>{1024, 64}, std::vector<long>{4096, 256}}) {
        benchmark::RegisterBenchmark(Name("Convolve_f32", "kestaccel").c_str(), ConvolveOurs)->Args(shape);
#ifdef KESTACCEL_BENCH_HAVE_VOLK
        benchmark::RegisterBenchmark(Name("Convolve_f32", "volk").c_str(), ConvolveVolk)->Args(shape);
#endif
    }
    for (long n : {64, 256}) {
        benchmark::RegisterBenchmark(Name("Multiply_f32", "kestaccel").c_str(), MultiplyOurs<float>)->Arg(n);
        benchmark::RegisterBenchmark(Name("Multiply_f32", "eigen").c_str(), MultiplyEigen<float>)->Arg(n);
        benchmark::RegisterBenchmark(Name("Multiply_f64", "kestaccel").c_str(), MultiplyOurs<double>)->Arg(n);
        benchmark::RegisterBenchmark(Name("Multiply_f64", "eigen").c_str(), MultiplyEigen<double>)->Arg(n);
    }
    return true;
}();

}  // namespace
