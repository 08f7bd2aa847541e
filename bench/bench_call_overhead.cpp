// The C++ side of scripts/python-overhead.py: the calls that it times from
// Python (Add of float32, the real float32 FFT, Sum), at the same sizes,
// so that the difference is the cost of a call through the bindings.

#include <kestaccel/BasicMath.h>
#include <kestaccel/FFT.h>

#include <cmath>
#include <vector>

#include "BenchSupport.h"

namespace {

using namespace kestaccel_bench;

const std::vector<long> kSizes = {64, 1024, 65536};

void Add(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto a = RandomData<float>(n, 1), b = RandomData<float>(n, 2);
    std::vector<float> dst(n);
    for (auto _ : state) {
        kestaccel::utility::Add(n, a.data(), b.data(), dst.data());
        benchmark::ClobberMemory();
    }
}

void Sum(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto a = RandomData<float>(n, 3);
    for (auto _ : state) benchmark::DoNotOptimize(kestaccel::utility::Sum(n, a.data()));
}

void RealFFT(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    kestaccel::FFTState_Float* fft = nullptr;
    kestaccel::transform::FFTInit(&fft, static_cast<unsigned int>(std::log2(double(n))));
    const auto src = RandomData<float>(n, 4);
    std::vector<float> dst(n + 2);
    for (auto _ : state) {
        kestaccel::transform::FFTFwd(src.data(), dst.data(), fft, nullptr);
        benchmark::ClobberMemory();
    }
    kestaccel::transform::FFTFree(fft);
}

const bool registered = [] {
    for (long n : kSizes) {
        benchmark::RegisterBenchmark(Name("CallOverhead_Add_f32", "kestaccel").c_str(), Add)->Arg(n);
        benchmark::RegisterBenchmark(Name("CallOverhead_Sum_f32", "kestaccel").c_str(), Sum)->Arg(n);
        benchmark::RegisterBenchmark(Name("CallOverhead_FFTFwd_r32", "kestaccel").c_str(), RealFFT)->Arg(n);
    }
    return true;
}();

}  // namespace
