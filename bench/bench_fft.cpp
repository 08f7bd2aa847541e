// Complex (interleaved and split) and real transforms, float and double,
// against FFTW (FFTW_MEASURE plans) and kissfft (float only). Besides the
// time, each reports MFLOPS by FFTW's convention: 5 N log2 N for a complex
// transform, 2.5 N log2 N for a real one.

#include <kestaccel/FFT.h>

#include <cmath>
#include <complex>
#include <vector>

#include "BenchSupport.h"

#ifdef KESTACCEL_BENCH_HAVE_FFTW
#include <fftw3.h>
#endif
#ifdef KESTACCEL_BENCH_HAVE_KISSFFT
#include <kissfft/kiss_fft.h>
#include <kissfft/kiss_fftr.h>
#endif

namespace {

using namespace kestaccel_bench;
using namespace kestaccel::transform;

const std::vector<long> kSizes = {256, 1024, 4096, 65536};

void Flops(benchmark::State& state, double perTransform)
{
    state.counters["MFLOPS"] = benchmark::Counter(perTransform / 1e6, benchmark::Counter::kIsIterationInvariantRate);
}

double ComplexFlops(long n) { return 5.0 * n * std::log2(double(n)); }
double RealFlops(long n) { return 2.5 * n * std::log2(double(n)); }

template <class State, class E>
void ComplexOurs(benchmark::State& bstate)
{
    const unsigned int n = static_cast<unsigned int>(bstate.range(0));
    const unsigned int order = static_cast<unsigned int>(std::log2(double(n)));
    State* state = nullptr;
    FFTInit(&state, order);
    auto data = RandomData<E>(2 * n, 1);
    std::vector<std::complex<E>> src(n), dst(n);
    for (unsigned int i = 0; i < n; ++i) src[i] = {data[2 * i], data[2 * i + 1]};
    for (auto _ : bstate) {
        FFTFwd(src.data(), dst.data(), state, nullptr);
        benchmark::ClobberMemory();
    }
    Flops(bstate, ComplexFlops(n));
    FFTFree(state);
}

template <class Complex>
void SplitOurs(benchmark::State& bstate)
{
    using E = typename Complex::value_type;
    using State = std::conditional_t<sizeof(E) == 4, kestaccel::FFTState_Complex_Float_Deinterleaved,
                                     kestaccel::FFTState_Complex_Double_Deinterleaved>;
    const unsigned int n = static_cast<unsigned int>(bstate.range(0));
    FFTImpl<State, Complex> impl(0, n);
    auto re = RandomData<E>(n, 2), im = RandomData<E>(n, 3);
    std::vector<E> outRe(n), outIm(n);
    for (auto _ : bstate) {
        impl.ProcessFwd(re.data(), im.data(), outRe.data(), outIm.data());
        benchmark::ClobberMemory();
    }
    Flops(bstate, ComplexFlops(n));
}

template <class State, class E>
void RealOurs(benchmark::State& bstate)
{
    const unsigned int n = static_cast<unsigned int>(bstate.range(0));
    const unsigned int order = static_cast<unsigned int>(std::log2(double(n)));
    State* state = nullptr;
    FFTInit(&state, order);
    auto src = RandomData<E>(n, 4);
    std::vector<E> dst(n + 2);
    for (auto _ : bstate) {
        FFTFwd(src.data(), dst.data(), state, nullptr);
        benchmark::ClobberMemory();
    }
    Flops(bstate, RealFlops(n));
    FFTFree(state);
}

#ifdef KESTACCEL_BENCH_HAVE_FFTW
// One template body for both precisions through small overload shims.
struct FftwFloat {
    using E = float;
    using Plan = fftwf_plan;
    static E* Alloc(std::size_t count) { return static_cast<E*>(fftwf_malloc(sizeof(E) * count)); }
    static void Release(void* p) { fftwf_free(p); }
    static Plan Complex(int n, E* in, E* out)
    {
        return fftwf_plan_dft_1d(n, reinterpret_cast<fftwf_complex*>(in), reinterpret_cast<fftwf_complex*>(out),
                                 FFTW_FORWARD, FFTW_MEASURE);
    }
    static Plan Real(int n, E* in, E* out)
    {
        return fftwf_plan_dft_r2c_1d(n, in, reinterpret_cast<fftwf_complex*>(out), FFTW_MEASURE);
    }
    static Plan Split(int n, E* ri, E* ii, E* ro, E* io)
    {
        fftwf_iodim dim{n, 1, 1};
        return fftwf_plan_guru_split_dft(1, &dim, 0, nullptr, ri, ii, ro, io, FFTW_MEASURE);
    }
    static void Run(Plan p) { fftwf_execute(p); }
    static void Destroy(Plan p) { fftwf_destroy_plan(p); }
};
struct FftwDouble {
    using E = double;
    using Plan = fftw_plan;
    static E* Alloc(std::size_t count) { return static_cast<E*>(fftw_malloc(sizeof(E) * count)); }
    static void Release(void* p) { fftw_free(p); }
    static Plan Complex(int n, E* in, E* out)
    {
        return fftw_plan_dft_1d(n, reinterpret_cast<fftw_complex*>(in), reinterpret_cast<fftw_complex*>(out),
                                FFTW_FORWARD, FFTW_MEASURE);
    }
    static Plan Real(int n, E* in, E* out)
    {
        return fftw_plan_dft_r2c_1d(n, in, reinterpret_cast<fftw_complex*>(out), FFTW_MEASURE);
    }
    static Plan Split(int n, E* ri, E* ii, E* ro, E* io)
    {
        fftw_iodim dim{n, 1, 1};
        return fftw_plan_guru_split_dft(1, &dim, 0, nullptr, ri, ii, ro, io, FFTW_MEASURE);
    }
    static void Run(Plan p) { fftw_execute(p); }
    static void Destroy(Plan p) { fftw_destroy_plan(p); }
};

// kind 0: interleaved complex, 1: split complex, 2: real.
template <class F, int kind>
void Fftw(benchmark::State& bstate)
{
    using E = typename F::E;
    const int n = static_cast<int>(bstate.range(0));
    E* in = F::Alloc(2 * n + 2);
    E* out = F::Alloc(2 * n + 2);
    typename F::Plan plan = kind == 0 ? F::Complex(n, in, out)
                          : kind == 1 ? F::Split(n, in, in + n, out, out + n)
                                      : F::Real(n, in, out);
    const auto data = RandomData<E>(2 * n, 5);  // after planning: MEASURE overwrites
    for (int i = 0; i < 2 * n; ++i) in[i] = data[i];
    for (auto _ : bstate) {
        F::Run(plan);
        benchmark::ClobberMemory();
    }
    Flops(bstate, kind == 2 ? RealFlops(n) : ComplexFlops(n));
    F::Destroy(plan);
    F::Release(in);
    F::Release(out);
}
#endif

#ifdef KESTACCEL_BENCH_HAVE_KISSFFT
void KissComplex(benchmark::State& bstate)
{
    const int n = static_cast<int>(bstate.range(0));
    kiss_fft_cfg cfg = kiss_fft_alloc(n, 0, nullptr, nullptr);
    const auto data = RandomData<float>(2 * n, 6);
    std::vector<kiss_fft_cpx> in(n), out(n);
    for (int i = 0; i < n; ++i) in[i] = {data[2 * i], data[2 * i + 1]};
    for (auto _ : bstate) {
        kiss_fft(cfg, in.data(), out.data());
        benchmark::ClobberMemory();
    }
    Flops(bstate, ComplexFlops(n));
    kiss_fft_free(cfg);
}

void KissReal(benchmark::State& bstate)
{
    const int n = static_cast<int>(bstate.range(0));
    kiss_fftr_cfg cfg = kiss_fftr_alloc(n, 0, nullptr, nullptr);
    const auto in = RandomData<float>(n, 7);
    std::vector<kiss_fft_cpx> out(n / 2 + 1);
    for (auto _ : bstate) {
        kiss_fftr(cfg, in.data(), out.data());
        benchmark::ClobberMemory();
    }
    Flops(bstate, RealFlops(n));
    kiss_fft_free(cfg);
}
#endif

void Register(const char* kernel, const char* impl, void (*fn)(benchmark::State&))
{
    for (long n : kSizes) {
        benchmark::RegisterBenchmark(Name(kernel, impl).c_str(), fn)->Arg(n);
    }
}

const bool registered = [] {
    Register("FFTFwd_c32", "kestaccel", ComplexOurs<kestaccel::FFTState_Complex_Float_Interleaved, float>);
    Register("FFTFwd_c64", "kestaccel", ComplexOurs<kestaccel::FFTState_Complex_Double_Interleaved, double>);
    Register("FFTFwd_split32", "kestaccel", SplitOurs<std::complex<float>>);
    Register("FFTFwd_split64", "kestaccel", SplitOurs<std::complex<double>>);
    Register("FFTFwd_r32", "kestaccel", RealOurs<kestaccel::FFTState_Float, float>);
    Register("FFTFwd_r64", "kestaccel", RealOurs<kestaccel::FFTState_Double, double>);
#ifdef KESTACCEL_BENCH_HAVE_FFTW
    Register("FFTFwd_c32", "fftw", Fftw<FftwFloat, 0>);
    Register("FFTFwd_c64", "fftw", Fftw<FftwDouble, 0>);
    Register("FFTFwd_split32", "fftw", Fftw<FftwFloat, 1>);
    Register("FFTFwd_split64", "fftw", Fftw<FftwDouble, 1>);
    Register("FFTFwd_r32", "fftw", Fftw<FftwFloat, 2>);
    Register("FFTFwd_r64", "fftw", Fftw<FftwDouble, 2>);
#endif
#ifdef KESTACCEL_BENCH_HAVE_KISSFFT
    Register("FFTFwd_c32", "kissfft", KissComplex);
    Register("FFTFwd_r32", "kissfft", KissReal);
#endif
    return true;
}();

}  // namespace
