// The FIR filter at 16, 64 and 256 taps on blocks of 1024 (separate buffers
// and in place), and a cascade of four biquads on 1024, against liquid-dsp's
// firfilt_rrrf and iirfilt_rrrf when it is installed. Items are samples.

#include <kestaccel/FIR.h>
#include <kestaccel/IIR.h>

#include <cmath>
#include <string>

#include "BenchSupport.h"

#ifdef KESTACCEL_BENCH_HAVE_LIQUID
#include <liquid/liquid.h>
#endif

namespace {

using namespace kestaccel_bench;
namespace kf = kestaccel::filter;

const long kBlock = 1024;
const unsigned int kTapCounts[] = {16, 64, 256};
const unsigned int kSections = 4;

std::string FIRKernelName(unsigned int taps, bool inPlace)
{
    return "FIR_f32_" + std::to_string(taps) + "taps" + (inPlace ? "_inplace" : "");
}

void FIROurs(benchmark::State& state, unsigned int tapCount, bool inPlace)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto taps = RandomData<float>(tapCount, 11);
    auto src = RandomData<float>(n, 12);
    std::vector<float> dst(n);
    float* out = inPlace ? src.data() : dst.data();
    kestaccel::FIRState_Float* filter = nullptr;
    kf::FIRInit(&filter, taps.data(), tapCount, nullptr);
    for (auto _ : state) {
        kf::FIR(filter, n, src.data(), out);
        benchmark::ClobberMemory();
    }
    kf::FIRFree(filter);
    state.SetItemsProcessed(state.iterations() * n);
}

// Four lowpass sections with their a0 at 1, so the first one's reciprocal
// leaves every section as designed.
std::vector<float> BiquadTaps()
{
    std::vector<float> taps;
    for (unsigned int s = 0; s < kSections; ++s) {
        const double w0 = 0.05 + 0.1 * s, alpha = std::sin(w0) / 1.4, c = std::cos(w0), a0 = 1.0 + alpha;
        const double section[6] = {(1 - c) / 2 / a0, (1 - c) / a0, (1 - c) / 2 / a0, 1.0, -2 * c / a0,
                                   (1 - alpha) / a0};
        taps.insert(taps.end(), section, section + 6);
    }
    return taps;
}

void BiquadOurs(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto taps = BiquadTaps();
    auto src = RandomData<float>(n, 13);
    std::vector<float> dst(n);
    kestaccel::IIRState_Float* filter = nullptr;
    kf::IIRInit_BiQuad(&filter, taps.data(), kSections, nullptr);
    for (auto _ : state) {
        kf::IIR(n, src.data(), dst.data(), filter);
        benchmark::ClobberMemory();
    }
    kf::IIRFree(filter);
    state.SetItemsProcessed(state.iterations() * n);
}

#ifdef KESTACCEL_BENCH_HAVE_LIQUID
void FIRLiquid(benchmark::State& state, unsigned int tapCount, bool inPlace)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    auto taps = RandomData<float>(tapCount, 11);
    auto src = RandomData<float>(n, 12);
    std::vector<float> dst(n);
    float* out = inPlace ? src.data() : dst.data();
    firfilt_rrrf filter = firfilt_rrrf_create(taps.data(), tapCount);
    for (auto _ : state) {
        firfilt_rrrf_execute_block(filter, src.data(), n, out);
        benchmark::ClobberMemory();
    }
    firfilt_rrrf_destroy(filter);
    state.SetItemsProcessed(state.iterations() * n);
}

void BiquadLiquid(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto taps = BiquadTaps();
    std::vector<float> b, a;
    for (unsigned int s = 0; s < kSections; ++s) {
        b.insert(b.end(), taps.begin() + 6 * s, taps.begin() + 6 * s + 3);
        a.insert(a.end(), taps.begin() + 6 * s + 3, taps.begin() + 6 * s + 6);
    }
    auto src = RandomData<float>(n, 13);
    std::vector<float> dst(n);
    iirfilt_rrrf filter = iirfilt_rrrf_create_sos(b.data(), a.data(), kSections);
    for (auto _ : state) {
        iirfilt_rrrf_execute_block(filter, src.data(), n, dst.data());
        benchmark::ClobberMemory();
    }
    iirfilt_rrrf_destroy(filter);
    state.SetItemsProcessed(state.iterations() * n);
}
#endif

const bool registered = [] {
    for (unsigned int taps : kTapCounts) {
        for (bool inPlace : {false, true}) {
            const std::string kernel = FIRKernelName(taps, inPlace);
            benchmark::RegisterBenchmark(Name(kernel, "kestaccel").c_str(), FIROurs, taps, inPlace)->Arg(kBlock);
#ifdef KESTACCEL_BENCH_HAVE_LIQUID
            benchmark::RegisterBenchmark(Name(kernel, "liquid").c_str(), FIRLiquid, taps, inPlace)->Arg(kBlock);
#endif
        }
    }
    const std::string biquad = "IIR_f32_" + std::to_string(kSections) + "biquads";
    benchmark::RegisterBenchmark(Name(biquad, "kestaccel").c_str(), BiquadOurs)->Arg(kBlock);
#ifdef KESTACCEL_BENCH_HAVE_LIQUID
    benchmark::RegisterBenchmark(Name(biquad, "liquid").c_str(), BiquadLiquid)->Arg(kBlock);
#endif
    return true;
}();

}  // namespace
