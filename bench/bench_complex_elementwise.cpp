// Complex Mul and Div, Magnitude and PowerSpectr of a complex vector, against
// VOLK's kernels and a memcpy of the bytes each kernel writes.

#include <kestaccel/BasicMath.h>

#include <complex>

#include "BenchSupport.h"

#ifdef KESTACCEL_BENCH_HAVE_VOLK
#include <volk/volk.h>
#endif

namespace {

using namespace kestaccel_bench;
using Complex = std::complex<float>;

const std::vector<long> kSizes = {1024, 65536};

std::vector<Complex> RandomComplexData(std::size_t count, std::uint32_t seed)
{
    const auto parts = RandomData<float>(2 * count, seed);
    std::vector<Complex> values(count);
    for (std::size_t i = 0; i < count; ++i) values[i] = Complex(parts[2 * i], parts[2 * i + 1]);
    return values;
}

// Two complex sources, one complex destination.
template <class Kernel>
void RunBinary(benchmark::State& state, Kernel kernel)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto a = RandomComplexData(n, 11), b = RandomComplexData(n, 12);
    std::vector<Complex> dst(n);
    for (auto _ : state) {
        kernel(n, a.data(), b.data(), dst.data());
        benchmark::DoNotOptimize(dst.data());
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * n);
}

// One complex source, one real destination.
template <class Kernel>
void RunToReal(benchmark::State& state, Kernel kernel)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto src = RandomComplexData(n, 13);
    std::vector<float> dst(n);
    for (auto _ : state) {
        kernel(n, src.data(), dst.data());
        benchmark::DoNotOptimize(dst.data());
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * n);
}

void MulOurs(benchmark::State& state)
{
    RunBinary(state, [](unsigned int n, const Complex* a, const Complex* b, Complex* d) { kestaccel::utility::Mul(n, a, b, d); });
}
void DivOurs(benchmark::State& state)
{
    RunBinary(state, [](unsigned int n, const Complex* a, const Complex* b, Complex* d) { kestaccel::utility::Div(n, a, b, d); });
}
void MagnitudeOurs(benchmark::State& state)
{
    RunToReal(state, [](unsigned int n, const Complex* s, float* d) { kestaccel::utility::Magnitude(n, s, d); });
}
void PowerSpectrOurs(benchmark::State& state)
{
    RunToReal(state, [](unsigned int n, const Complex* s, float* d) { kestaccel::utility::PowerSpectr(n, s, d); });
}

#ifdef KESTACCEL_BENCH_HAVE_VOLK
void MulVolk(benchmark::State& state)
{
    RunBinary(state, [](unsigned int n, const Complex* a, const Complex* b, Complex* d) { volk_32fc_x2_multiply_32fc(d, a, b, n); });
}
// VOLK divides its first source by its second.
void DivVolk(benchmark::State& state)
{
    RunBinary(state, [](unsigned int n, const Complex* a, const Complex* b, Complex* d) { volk_32fc_x2_divide_32fc(d, b, a, n); });
}
void MagnitudeVolk(benchmark::State& state)
{
    RunToReal(state, [](unsigned int n, const Complex* s, float* d) { volk_32fc_magnitude_32f(d, s, n); });
}
void PowerSpectrVolk(benchmark::State& state)
{
    RunToReal(state, [](unsigned int n, const Complex* s, float* d) { volk_32fc_magnitude_squared_32f(d, s, n); });
}
#endif

// Each reference copies as many bytes as its kernel writes.
void ComplexCopy(benchmark::State& state) { CopyReference(state, sizeof(Complex) * state.range(0)); }
void RealCopy(benchmark::State& state) { CopyReference(state, sizeof(float) * state.range(0)); }

const bool registered = [] {
    for (long n : kSizes) {
        benchmark::RegisterBenchmark(Name("Mul_32fc", "kestaccel").c_str(), MulOurs)->Arg(n);
        benchmark::RegisterBenchmark(Name("Mul_32fc", "memcpy").c_str(), ComplexCopy)->Arg(n);
        benchmark::RegisterBenchmark(Name("Div_32fc", "kestaccel").c_str(), DivOurs)->Arg(n);
        benchmark::RegisterBenchmark(Name("Div_32fc", "memcpy").c_str(), ComplexCopy)->Arg(n);
        benchmark::RegisterBenchmark(Name("Magnitude_32fc", "kestaccel").c_str(), MagnitudeOurs)->Arg(n);
        benchmark::RegisterBenchmark(Name("Magnitude_32fc", "memcpy").c_str(), RealCopy)->Arg(n);
        benchmark::RegisterBenchmark(Name("PowerSpectr_32fc", "kestaccel").c_str(), PowerSpectrOurs)->Arg(n);
        benchmark::RegisterBenchmark(Name("PowerSpectr_32fc", "memcpy").c_str(), RealCopy)->Arg(n);
#ifdef KESTACCEL_BENCH_HAVE_VOLK
        benchmark::RegisterBenchmark(Name("Mul_32fc", "volk").c_str(), MulVolk)->Arg(n);
        benchmark::RegisterBenchmark(Name("Div_32fc", "volk").c_str(), DivVolk)->Arg(n);
        benchmark::RegisterBenchmark(Name("Magnitude_32fc", "volk").c_str(), MagnitudeVolk)->Arg(n);
        benchmark::RegisterBenchmark(Name("PowerSpectr_32fc", "volk").c_str(), PowerSpectrVolk)->Arg(n);
#endif
    }
    return true;
}();

}  // namespace
