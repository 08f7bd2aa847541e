// Sample conversion and stereo layout at 4096 frames, against a memcpy of the
// bytes each kernel writes and, where VOLK has a kernel of the same shape,
// against VOLK. VOLK's float-to-short kernel scales by a float and rounds
// with saturation, a different meaning: it stands as the speed reference.

#include <kestaccel/BasicMath.h>
#include <kestaccel/VectorUtils.h>

#include <algorithm>
#include <complex>
#include <new>

#include "BenchSupport.h"

#ifdef KESTACCEL_BENCH_HAVE_VOLK
#include <volk/volk.h>
#endif

namespace {

using namespace kestaccel_bench;
using kestcore::utility::int24_t;
namespace ku = kestaccel::utility;

const long kFrames = 4096;

std::vector<short> RandomShorts(std::size_t count, std::uint32_t seed)
{
    std::mt19937 engine(seed);
    std::vector<short> values(count);
    for (auto& v : values) v = static_cast<short>(engine() >> 16);
    return values;
}

template <class Body>
void Loop(benchmark::State& state, Body body)
{
    for (auto _ : state) {
        body();
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

void ShortToFloatOurs(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto src = RandomShorts(n, 1);
    std::vector<float> dst(n);
    Loop(state, [&] { ku::Convert(n, src.data(), dst.data(), 15); });
}

// Sources slightly beyond full scale, so that the limit is taken now and then.
template <bool kRound>
void FloatToShortOurs(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto src = RandomData<float>(n, 2, -1.05f, 1.05f);
    std::vector<short> dst(n);
    Loop(state, [&] { ku::Convert(n, src.data(), dst.data(), -15, kRound); });
}

void PackedToFloatOurs(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto wide = RandomShorts(n, 3);
    std::vector<int24_t> src(n);
    for (unsigned int i = 0; i < n; ++i) src[i] = int24_t(wide[i] * 256 + (static_cast<int>(i) & 255));
    std::vector<float> dst(n);
    Loop(state, [&] { ku::Convert(n, src.data(), dst.data(), 23); });
}

void FloatToPackedOurs(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto src = RandomData<float>(n, 4, -1.05f, 1.05f);
    std::vector<int24_t> dst(n);
    Loop(state, [&] { ku::Convert(n, src.data(), dst.data(), -23, true); });
}

void InterleaveOurs(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto left = RandomData<float>(n, 5), right = RandomData<float>(n, 6);
    std::vector<float> dst(2 * n);
    Loop(state, [&] { ku::Interleave(n, left.data(), right.data(), dst.data()); });
}

void DeinterleaveOurs(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto src = RandomData<float>(2 * n, 7);
    std::vector<float> left(n), right(n);
    Loop(state, [&] { ku::Deinterleave(n, src.data(), left.data(), right.data()); });
}

#ifdef KESTACCEL_BENCH_HAVE_VOLK
void ShortToFloatVolk(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto src = RandomShorts(n, 1);
    std::vector<float> dst(n);
    Loop(state, [&] { volk_16i_s32f_convert_32f(dst.data(), src.data(), 32768.0f, n); });
}

void FloatToShortVolk(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto src = RandomData<float>(n, 2, -1.05f, 1.05f);
    std::vector<short> dst(n);
    Loop(state, [&] { volk_32f_s32f_convert_16i(dst.data(), src.data(), 32768.0f, n); });
}

// VOLK's SSE2 kernel: the same instruction set as our baseline build, where
// the dispatched kernel above may use AVX2.
void FloatToShortVolkSse2(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto src = RandomData<float>(n, 2, -1.05f, 1.05f);
    std::vector<short> dst(n);
    Loop(state, [&] { volk_32f_s32f_convert_16i_manual(dst.data(), src.data(), 32768.0f, n, "u_sse2"); });
}

// The two conversions compared with VOLK once more, on buffers placed by
// hand: the source on a 64-byte boundary and the destination range(0) bytes
// past one, at a fixed distance in one block, the same for both. VOLK picks
// its aligned or unaligned kernel by the addresses, so its time moves with
// the placement; a placement-blind kernel's should not.
class PlacedBuffers {
public:
    explicit PlacedBuffers(std::size_t destinationOffset)
        : block_(static_cast<unsigned char*>(::operator new(kBytes, std::align_val_t(64)))),
          destination_(block_ + kDestinationStart + destinationOffset)
    {
    }
    ~PlacedBuffers() { ::operator delete(block_, std::align_val_t(64)); }
    PlacedBuffers(const PlacedBuffers&) = delete;
    PlacedBuffers& operator=(const PlacedBuffers&) = delete;

    template <class T>
    T* Source() const { return reinterpret_cast<T*>(block_); }
    template <class T>
    T* Destination() const { return reinterpret_cast<T*>(destination_); }

private:
    // Past the largest source, and half a page off a multiple of 4 KiB, so
    // that loads do not wait on stores to unrelated addresses.
    static constexpr std::size_t kDestinationStart = 26 * 1024;
    static constexpr std::size_t kBytes = kDestinationStart + 64 + 16 * 1024;
    unsigned char* block_;
    unsigned char* destination_;
};

template <class Body>
void PlacedLoop(benchmark::State& state, Body body)
{
    for (auto _ : state) {
        body();
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * kFrames);
}

template <bool kVolk>
void ShortToFloatPlaced(benchmark::State& state)
{
    const PlacedBuffers buffers(static_cast<std::size_t>(state.range(0)));
    short* src = buffers.Source<short>();
    float* dst = buffers.Destination<float>();
    const auto values = RandomShorts(kFrames, 1);
    std::copy(values.begin(), values.end(), src);
    PlacedLoop(state, [&] {
        if constexpr (kVolk) volk_16i_s32f_convert_32f(dst, src, 32768.0f, kFrames);
        else ku::Convert(kFrames, src, dst, 15);
    });
}

template <bool kVolk>
void FloatToShortRoundPlaced(benchmark::State& state)
{
    const PlacedBuffers buffers(static_cast<std::size_t>(state.range(0)));
    float* src = buffers.Source<float>();
    short* dst = buffers.Destination<short>();
    const auto values = RandomData<float>(kFrames, 2, -1.05f, 1.05f);
    std::copy(values.begin(), values.end(), src);
    PlacedLoop(state, [&] {
        if constexpr (kVolk) volk_32f_s32f_convert_16i(dst, src, 32768.0f, kFrames);
        else ku::Convert(kFrames, src, dst, -15, true);
    });
}

void InterleaveVolk(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto left = RandomData<float>(n, 5), right = RandomData<float>(n, 6);
    std::vector<lv_32fc_t> dst(n);
    Loop(state, [&] { volk_32f_x2_interleave_32fc(dst.data(), left.data(), right.data(), n); });
}

void DeinterleaveVolk(benchmark::State& state)
{
    const auto n = static_cast<unsigned int>(state.range(0));
    const auto parts = RandomData<float>(2 * n, 7);
    std::vector<lv_32fc_t> src(n);
    for (unsigned int i = 0; i < n; ++i) src[i] = lv_32fc_t(parts[2 * i], parts[2 * i + 1]);
    std::vector<float> left(n), right(n);
    Loop(state, [&] { volk_32fc_deinterleave_32f_x2(left.data(), right.data(), src.data(), n); });
}
#endif

// Each reference copies as many bytes as the kernel writes.
template <std::size_t kBytesPerFrame>
void CopyOf(benchmark::State& state)
{
    CopyReference(state, kBytesPerFrame * static_cast<std::size_t>(state.range(0)));
}

const bool registered = [] {
    struct Entry {
        const char* kernel;
        void (*ours)(benchmark::State&);
        void (*copy)(benchmark::State&);
    };
    const Entry entries[] = {
        {"Convert_s16_f32_scale15", ShortToFloatOurs, CopyOf<sizeof(float)>},
        {"Convert_f32_s16_trunc", FloatToShortOurs<false>, CopyOf<sizeof(short)>},
        {"Convert_f32_s16_round", FloatToShortOurs<true>, CopyOf<sizeof(short)>},
        {"Convert_s24_f32_scale23", PackedToFloatOurs, CopyOf<sizeof(float)>},
        {"Convert_f32_s24_round", FloatToPackedOurs, CopyOf<sizeof(int24_t)>},
        {"Interleave_f32_stereo", InterleaveOurs, CopyOf<2 * sizeof(float)>},
        {"Deinterleave_f32_stereo", DeinterleaveOurs, CopyOf<2 * sizeof(float)>},
    };
    for (const auto& e : entries) {
        benchmark::RegisterBenchmark(Name(e.kernel, "kestaccel").c_str(), e.ours)->Arg(kFrames);
        benchmark::RegisterBenchmark(Name(e.kernel, "memcpy").c_str(), e.copy)->Arg(kFrames);
    }
#ifdef KESTACCEL_BENCH_HAVE_VOLK
    benchmark::RegisterBenchmark(Name("Convert_s16_f32_scale15", "volk").c_str(), ShortToFloatVolk)->Arg(kFrames);
    benchmark::RegisterBenchmark(Name("Convert_f32_s16_trunc", "volk").c_str(), FloatToShortVolk)->Arg(kFrames);
    benchmark::RegisterBenchmark(Name("Convert_f32_s16_round", "volk").c_str(), FloatToShortVolk)->Arg(kFrames);
    for (const char* kernel : {"Convert_f32_s16_trunc", "Convert_f32_s16_round"})
        benchmark::RegisterBenchmark(Name(kernel, "volk_sse2").c_str(), FloatToShortVolkSse2)->Arg(kFrames);
    benchmark::RegisterBenchmark(Name("Interleave_f32_stereo", "volk").c_str(), InterleaveVolk)->Arg(kFrames);
    benchmark::RegisterBenchmark(Name("Deinterleave_f32_stereo", "volk").c_str(), DeinterleaveVolk)->Arg(kFrames);
    // Reported per destination offset in bytes, not per size.
    for (long offset : {0L, 16L, 32L, 48L}) {
        benchmark::RegisterBenchmark(Name("Convert_s16_f32_scale15_dst_offset", "kestaccel").c_str(),
                                     ShortToFloatPlaced<false>)->Arg(offset);
        benchmark::RegisterBenchmark(Name("Convert_s16_f32_scale15_dst_offset", "volk").c_str(),
                                     ShortToFloatPlaced<true>)->Arg(offset);
        benchmark::RegisterBenchmark(Name("Convert_f32_s16_round_dst_offset", "kestaccel").c_str(),
                                     FloatToShortRoundPlaced<false>)->Arg(offset);
        benchmark::RegisterBenchmark(Name("Convert_f32_s16_round_dst_offset", "volk").c_str(),
                                     FloatToShortRoundPlaced<true>)->Arg(offset);
    }
#endif
    return true;
}();

}  // namespace
