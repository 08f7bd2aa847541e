// Measures the quality and speed of the tool's resampler presets beside
// libsamplerate and soxr, and the accuracy of the library's FFT beside FFTW
// and kissfft, on the same signals in the same process, and writes the
// tables and plots of docs/quality.md.
//
//   kestaccel_quality OUTDIR [--machine TEXT] [--about TEXT]... [--quick]

#include <algorithm>
#include <chrono>
#include <cmath>
#include <complex>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <functional>
#include <map>
#include <random>
#include <sstream>
#include <string>
#include <vector>

#include <stdlib.h>
#include <unistd.h>

#include <kestaccel/FFT.h>

#include "audio/Resampler.h"
#include "audio/Spectrum.h"
#include "audio/Svg.h"

#ifdef KESTACCEL_HAVE_SAMPLERATE
#include <samplerate.h>
#endif
#ifdef KESTACCEL_HAVE_SOXR
#include <soxr.h>
#endif
#if defined(KESTACCEL_HAVE_FFTW3) && defined(KESTACCEL_HAVE_FFTW3F)
#define KESTACCEL_HAVE_FFTW
#include <fftw3.h>
#endif
#ifdef KESTACCEL_HAVE_KISSFFT_FLOAT
#include <kiss_fft.h>
#include <kissfft.hh>
#endif

using namespace kestaudio;

namespace {

using Clock = std::chrono::steady_clock;

// ---------------------------------------------------------------------------
// Resamplers: interleaved float in, interleaved float out, whole signal.
// ---------------------------------------------------------------------------
// The output vector is the caller's and is reused from run to run, so that
// the timings compare the resamplers rather than first touches of memory.
using ResampleFn = std::function<void(const std::vector<float>&, unsigned, unsigned, unsigned, std::vector<float>&)>;

struct Resampler {
    std::string name;
    bool ours;
    ResampleFn run;
};

std::vector<Resampler> Resamplers()
{
    std::vector<Resampler> list;
    for (const ResamplePreset& p : ResamplePresets()) {
        const Quality q = p.quality;
        list.push_back({std::string("kestaccel ") + p.name, true,
                        [q](const std::vector<float>& in, unsigned ch, unsigned fin, unsigned fout, std::vector<float>& out) {
                            // As the tool streams: blocks of 16384 frames.
                            StreamingResampler r(PlanResampling(fin, fout, PresetFor(q)), ch);
                            out.clear();
                            const std::size_t frames = in.size() / ch;
                            for (std::size_t pos = 0; pos < frames; pos += 16384) {
                                r.Process(in.data() + pos * ch, std::min<std::size_t>(16384, frames - pos), out);
                            }
                            r.Finish(out);
                        }});
    }
#ifdef KESTACCEL_HAVE_SAMPLERATE
    const std::pair<int, const char*> lsr[] = {{SRC_SINC_FASTEST, "libsamplerate SINC_FASTEST"},
                                               {SRC_SINC_MEDIUM_QUALITY, "libsamplerate SINC_MEDIUM"},
                                               {SRC_SINC_BEST_QUALITY, "libsamplerate SINC_BEST"}};
    for (const auto& t : lsr) {
        const int type = t.first;
        list.push_back({t.second, false, [type](const std::vector<float>& in, unsigned ch, unsigned fin, unsigned fout, std::vector<float>& out) {
                            const std::size_t frames = in.size() / ch;
                            out.resize((std::size_t(double(frames) * fout / fin) + 256) * ch);
                            SRC_DATA d{};
                            d.data_in = in.data();
                            d.data_out = out.data();
                            d.input_frames = long(frames);
                            d.output_frames = long(out.size() / ch);
                            d.src_ratio = double(fout) / fin;
                            if (src_simple(&d, type, int(ch)) != 0) out.clear();
                            out.resize(std::size_t(d.output_frames_gen) * ch);
                        }});
    }
#endif
#ifdef KESTACCEL_HAVE_SOXR
    const std::pair<unsigned long, const char*> sox[] = {{SOXR_HQ, "soxr HQ"}, {SOXR_VHQ, "soxr VHQ"}};
    for (const auto& t : sox) {
        const unsigned long recipe = t.first;
        list.push_back({t.second, false, [recipe](const std::vector<float>& in, unsigned ch, unsigned fin, unsigned fout, std::vector<float>& out) {
                            const std::size_t frames = in.size() / ch;
                            out.resize((std::size_t(double(frames) * fout / fin) + 256) * ch);
                            const soxr_io_spec_t io = soxr_io_spec(SOXR_FLOAT32_I, SOXR_FLOAT32_I);
                            const soxr_quality_spec_t q = soxr_quality_spec(recipe, 0);
                            const soxr_runtime_spec_t rt = soxr_runtime_spec(1);
                            std::size_t done = 0;
                            soxr_oneshot(fin, fout, ch, in.data(), frames, nullptr, out.data(), out.size() / ch, &done,
                                         &io, &q, &rt);
                            out.resize(done * ch);
                        }});
    }
#endif
    return list;
}

// ---------------------------------------------------------------------------
// Resampler figures from sines.
// ---------------------------------------------------------------------------
struct PairFigures {
    double rippleDb = 0, bandwidth = 0, stopbandDb = 1e9, snrDb = 1e9, speed = 0;
    std::vector<double> freq, levelDb;  // output level of each input sine, dB re its input level
};

const std::size_t kSpan = 16384;   // output samples measured per sine
const std::size_t kSkip = 8192;    // output samples skipped at each end

std::vector<double> ToneFrequencies(unsigned fin, unsigned fout, bool quick)
{
    const double low = std::min(fin, fout) / 2.0, nin = fin / 2.0, nout = fout / 2.0;
    std::vector<double> f;
    const int logCount = quick ? 12 : 40, edgeCount = quick ? 10 : 40, stopCount = quick ? 12 : 48;
    for (int i = 0; i < logCount; ++i) f.push_back(20 * std::pow(0.8 * low / 20, double(i) / (logCount - 1)));
    for (int i = 1; i <= edgeCount; ++i) f.push_back(low * (0.8 + 0.1975 * i / edgeCount));
    if (fout < fin) {
        for (int i = 0; i < stopCount; ++i) f.push_back(nout * 1.0025 + (0.995 * nin - nout * 1.0025) * i / (stopCount - 1));
    }
    std::sort(f.begin(), f.end());
    return f;
}

PairFigures Measure(const Resampler& r, unsigned fin, unsigned fout, bool quick)
{
    PairFigures p;
    const double low = std::min(fin, fout) / 2.0, nin = fin / 2.0, nout = fout / 2.0;
    const double amplitude = 0.5, pi = 3.14159265358979323846;
    const std::size_t inFrames = std::size_t(double(kSpan + 2 * kSkip) * fin / fout) + 64;
    std::vector<float> in(inFrames);
    std::vector<double> x(kSpan);
    std::vector<float> y;
    double lo = 1e9, hi = -1e9;
    double prevF = 0, prevGain = 0;
    bool bandFound = false;
    for (double f : ToneFrequencies(fin, fout, quick)) {
        for (std::size_t n = 0; n < inFrames; ++n) in[n] = float(amplitude * std::sin(2 * pi * f * double(n) / fin));
        r.run(in, 1, fin, fout, y);
        if (y.size() < kSkip + kSpan) {
            std::fprintf(stderr, "%s gave %zu samples at %u -> %u\n", r.name.c_str(), y.size(), fin, fout);
            return p;
        }
        for (std::size_t i = 0; i < kSpan; ++i) x[i] = y[kSkip + i];
        const ToneFigures t = MeasureTone(x.data(), kSpan, fout, f, amplitude, nin);
        p.freq.push_back(f);
        if (f < nout) {
            p.levelDb.push_back(t.gainDb);
            if (f <= 0.8 * low * 1.0001) {
                lo = std::min(lo, t.gainDb);
                hi = std::max(hi, t.gainDb);
                p.snrDb = std::min(p.snrDb, t.snrDb);
            }
            if (!bandFound && t.gainDb < -3) {
                // Linear in dB between the last sine above -3 dB and this one.
                p.bandwidth = (prevF + (f - prevF) * (prevGain + 3) / (prevGain - t.gainDb)) / low * 100;
                bandFound = true;
            }
            prevF = f;
            prevGain = t.gainDb;
            if (fout > fin) p.stopbandDb = std::min(p.stopbandDb, t.aboveDb);  // images above the input's Nyquist
        } else {
            p.levelDb.push_back(-t.totalDb);
            p.stopbandDb = std::min(p.stopbandDb, t.totalDb);  // aliases of sines above the output's Nyquist
        }
    }
    if (!bandFound) p.bandwidth = prevF / low * 100;
    p.rippleDb = hi - lo;
    return p;
}

double Median(std::vector<double> v)
{
    std::sort(v.begin(), v.end());
    return v.empty() ? 0 : v[v.size() / 2];
}

// Seconds of stereo noise resampled per second, the median of `reps` runs,
// the resamplers taking turns so that a busy spell of the machine is shared.
std::vector<double> Speeds(const std::vector<Resampler>& list, unsigned fin, unsigned fout, int reps, double seconds)
{
    std::mt19937 rng(42);
    std::uniform_real_distribution<float> noise(-0.5f, 0.5f);
    std::vector<float> in(std::size_t(seconds * fin) * 2);
    for (float& v : in) v = noise(rng);
    std::vector<std::vector<double>> times(list.size());
    std::vector<std::vector<float>> outs(list.size());
    for (int rep = 0; rep < reps + 1; ++rep) {
        for (std::size_t i = 0; i < list.size(); ++i) {
            std::vector<float>& out = outs[i];
            const auto t0 = Clock::now();
            list[i].run(in, 2, fin, fout, out);
            times[i].push_back(std::chrono::duration<double>(Clock::now() - t0).count());
            if (out.size() < 2 * std::size_t(seconds * fout * 0.99)) times[i].back() = 1e9;
            if (rep == 0) times[i].clear();  // the first round only warms the buffers
        }
    }
    std::vector<double> speeds;
    for (const auto& t : times) speeds.push_back(seconds / Median(t));
    return speeds;
}

// ---------------------------------------------------------------------------
// FFT accuracy against a long-double transform.
// ---------------------------------------------------------------------------
using LD = long double;

std::vector<std::complex<LD>> ReferenceFft(std::vector<std::complex<LD>> a)
{
    const std::size_t n = a.size();
    for (std::size_t i = 1, j = 0; i < n; ++i) {
        std::size_t bit = n >> 1;
        for (; j & bit; bit >>= 1) j ^= bit;
        j ^= bit;
        if (i < j) std::swap(a[i], a[j]);
    }
    // Every twiddle from its own sine and cosine in long double.
    const LD twoPi = 6.283185307179586476925286766559005768L;
    std::vector<std::complex<LD>> w(n / 2);
    for (std::size_t k = 0; k < n / 2; ++k) w[k] = {cosl(twoPi * LD(k) / LD(n)), -sinl(twoPi * LD(k) / LD(n))};
    for (std::size_t len = 2; len <= n; len <<= 1) {
        const std::size_t stride = n / len;
        for (std::size_t i = 0; i < n; i += len) {
            for (std::size_t k = 0; k < len / 2; ++k) {
                const std::complex<LD> u = a[i + k], v = a[i + k + len / 2] * w[k * stride];
                a[i + k] = u + v;
                a[i + k + len / 2] = u - v;
            }
        }
    }
    return a;
}

struct FftError {
    double rms = 0, max = 0;
};

template <class T>
using FftFn = std::function<void(const std::vector<std::complex<T>>&, std::vector<std::complex<T>>&)>;

template <class T>
FftError FftAccuracy(const FftFn<T>& fft, std::size_t n, int trials)
{
    FftError e;
    std::mt19937 rng{unsigned(n)};
    std::uniform_real_distribution<double> u(-1, 1);
    double rmsSum = 0;
    for (int t = 0; t < trials; ++t) {
        std::vector<std::complex<T>> in(n), out(n);
        std::vector<std::complex<LD>> ref(n);
        for (std::size_t i = 0; i < n; ++i) {
            in[i] = {T(u(rng)), T(u(rng))};
            ref[i] = {LD(in[i].real()), LD(in[i].imag())};
        }
        ref = ReferenceFft(ref);
        fft(in, out);
        LD num = 0, den = 0, maxErr = 0, maxRef = 0;
        for (std::size_t i = 0; i < n; ++i) {
            const std::complex<LD> d = std::complex<LD>(out[i].real(), out[i].imag()) - ref[i];
            num += std::norm(d);
            den += std::norm(ref[i]);
            maxErr = std::max(maxErr, std::abs(d));
            maxRef = std::max(maxRef, std::abs(ref[i]));
        }
        rmsSum += double(num / den);
        e.max = std::max(e.max, double(maxErr / maxRef));
    }
    e.rms = std::sqrt(rmsSum / trials);
    return e;
}

template <class T>
struct FftImpl {
    std::string name;
    FftFn<T> run;
};

template <class State>
struct KestState;

template <class T>
std::vector<FftImpl<T>> FftImpls()
{
    using State = std::conditional_t<std::is_same<T, float>::value, kestaccel::FFTState_Complex_Float_Interleaved,
                                     kestaccel::FFTState_Complex_Double_Interleaved>;
    std::vector<FftImpl<T>> list;
    list.push_back({"kestaccel", [](const std::vector<std::complex<T>>& in, std::vector<std::complex<T>>& out) {
                        unsigned order = 0;
                        while ((std::size_t(1) << order) < in.size()) ++order;
                        State* s = nullptr;
                        kestaccel::transform::FFTInit(&s, order);
                        kestaccel::transform::FFTFwd(in.data(), out.data(), s, nullptr);
                        kestaccel::transform::FFTFree(s);
                    }});
#ifdef KESTACCEL_HAVE_FFTW
    list.push_back({"FFTW", [](const std::vector<std::complex<T>>& in, std::vector<std::complex<T>>& out) {
                        std::vector<std::complex<T>> copy(in);
                        if constexpr (std::is_same<T, float>::value) {
                            fftwf_plan p = fftwf_plan_dft_1d(int(in.size()), reinterpret_cast<fftwf_complex*>(copy.data()),
                                                             reinterpret_cast<fftwf_complex*>(out.data()), FFTW_FORWARD,
                                                             FFTW_ESTIMATE);
                            fftwf_execute(p);
                            fftwf_destroy_plan(p);
                        } else {
                            fftw_plan p = fftw_plan_dft_1d(int(in.size()), reinterpret_cast<fftw_complex*>(copy.data()),
                                                           reinterpret_cast<fftw_complex*>(out.data()), FFTW_FORWARD,
                                                           FFTW_ESTIMATE);
                            fftw_execute(p);
                            fftw_destroy_plan(p);
                        }
                    }});
#endif
#ifdef KESTACCEL_HAVE_KISSFFT_FLOAT
    list.push_back({"kissfft", [](const std::vector<std::complex<T>>& in, std::vector<std::complex<T>>& out) {
                        if constexpr (std::is_same<T, float>::value) {
                            // The C library, built for float.
                            kiss_fft_cfg cfg = kiss_fft_alloc(int(in.size()), 0, nullptr, nullptr);
                            kiss_fft(cfg, reinterpret_cast<const kiss_fft_cpx*>(in.data()),
                                     reinterpret_cast<kiss_fft_cpx*>(out.data()));
                            kiss_fft_free(cfg);
                        } else {
                            // Its C++ template, in double.
                            kissfft<double> fft(in.size(), false);
                            fft.transform(in.data(), out.data());
                        }
                    }});
#endif
    return list;
}

// ---------------------------------------------------------------------------
// The report.
// ---------------------------------------------------------------------------
std::string Fmt(const char* format, double v)
{
    char buf[64];
    std::snprintf(buf, sizeof buf, format, v);
    return buf;
}

std::string RateName(unsigned r) { return r % 1000 == 0 ? std::to_string(r / 1000) + " kHz" : Fmt("%.1f kHz", r / 1000.0); }

}  // namespace

int main(int argc, char** argv)
{
    if (argc < 2) {
        std::fputs("usage: kestaccel_quality OUTDIR [--machine TEXT] [--about TEXT]... [--quick]\n", stderr);
        return 2;
    }
    const std::string outDir = argv[1];
    std::string machine = "(not given)";
    std::vector<std::string> about;
    bool quick = false;
    for (int i = 2; i < argc; ++i) {
        const std::string a = argv[i];
        if (a == "--machine" && i + 1 < argc) machine = argv[++i];
        else if (a == "--about" && i + 1 < argc) about.push_back(argv[++i]);
        else if (a == "--quick") quick = true;
    }
    const int reps = quick ? 3 : 7;
    const std::vector<Resampler> resamplers = Resamplers();
    const unsigned pairs[][2] = {{44100, 48000}, {48000, 44100}, {48000, 16000}, {96000, 44100}};

    std::ostringstream md;
    md << "# Quality and speed\n\n"
       << "Written by `scripts/quality.sh` (the program `tool/quality/quality.cpp`) from one run; every figure\n"
       << "below comes from that run, on the same signals, in the same process.\n\n"
       << "- Machine: " << machine << "; timing pinned to one core (`taskset -c 1`), each figure the median of "
       << reps << " runs taken in turns.\n"
       << "- Compiler: GCC " << __VERSION__ << ", `-O2` for the tool and `-O3 -ffp-contract=off -mno-fma` for the library.\n";
#ifdef KESTACCEL_HAVE_SAMPLERATE
    md << "- libsamplerate: " << src_get_version() << "\n";
#endif
#ifdef KESTACCEL_HAVE_SOXR
    md << "- soxr: " << soxr_version() << " (single thread)\n";
#endif
#ifdef KESTACCEL_HAVE_FFTW
    md << "- FFTW: " << fftw_version << " (`FFTW_ESTIMATE` plans)\n";
#endif
    for (const std::string& a : about) md << "- " << a << "\n";
    // The machine is shared: its load says how far to trust the timings.
    double load[3] = {0, 0, 0};
    getloadavg(load, 3);
    md << "- Load average when the run started: " << Fmt("%.1f", load[0]) << " (1 min), " << Fmt("%.1f", load[1])
       << " (5 min) on " << sysconf(_SC_NPROCESSORS_ONLN) << " cores: the machine is shared, so speeds are\n"
       << "  best compared within one table, as ratios, rather than as absolute figures.\n";

    md << "\n## Resampling\n\n"
       << "Each resampler converts sines of amplitude 0.5 (mono) and is measured on 16384 output samples from the\n"
       << "middle of its output, through a Kaiser window (beta 28, sidelobes below -220 dB) and an FFT in double:\n\n"
       << "- **ripple**: the peak-to-peak gain from 20 Hz to 80 % of the lower Nyquist frequency (40 sines on a\n"
       << "  logarithmic scale and those of the edge grid below);\n"
       << "- **-3 dB bandwidth**: where the gain first falls 3 dB, as a percentage of the lower Nyquist frequency\n"
       << "  (sines every 0.5 % from 80 % on, interpolated in dB);\n"
       << "- **stopband**: the worst attenuation of what the resampler must remove: on downsampling, the whole\n"
       << "  output for 48 sines between the output's and the input's Nyquist frequencies (aliases); on upsampling,\n"
       << "  everything above the input's Nyquist frequency (images) for every sine; in dB below the input sine;\n"
       << "- **SNR**: the worst, over the sines up to 80 % of the lower Nyquist frequency, of the sine's power over\n"
       << "  everything else in the output (aliases, images, rounding);\n"
       << "- **speed**: seconds of stereo noise resampled per second of one core (float samples, whole signal;\n"
       << "  ours streams it through the tool's resampler in blocks of 16384 frames).\n\n"
       << "The signals are float, as the resamplers' interfaces are: the input sine's own rounding lies about\n"
       << "150 dB below it, which floors the SNR and the downsampling stopband figures near there.\n\n"
       << "The presets (`tool/audio/Resampler.h`) are Kaiser-windowed designs whose stopband starts at the lower\n"
       << "Nyquist frequency: fast is flat to 80 % of it with an 80 dB target, default to 85 % with 100 dB, both\n"
       << "filtering in float; best to 95 % with 175 dB, filtering in double.\n\n";

    std::map<std::string, std::map<std::string, PairFigures>> all;
    std::vector<Plot> plots;
    for (const auto& pair : pairs) {
        const unsigned fin = pair[0], fout = pair[1];
        std::fprintf(stderr, "resampling %u -> %u\n", fin, fout);
        const std::vector<double> speeds = Speeds(resamplers, fin, fout, reps, quick ? 2 : 5);
        const std::string key = std::to_string(fin) + " -> " + std::to_string(fout);
        md << "### " << RateName(fin) << " to " << RateName(fout) << "\n\n"
           << "| resampler | ripple (dB) | -3 dB bandwidth (%) | stopband (dB) | SNR (dB) | speed (x real time) |\n"
           << "|---|---:|---:|---:|---:|---:|\n";
        Plot plot;
        plot.title = "Response, " + key + " (output level of each input sine)";
        plot.xLabel = "input frequency (Hz)";
        plot.yLabel = "dB";
        plot.xMin = 0;
        plot.xMax = fin / 2.0;
        plot.yMin = -200;
        plot.yMax = 10;
        for (std::size_t i = 0; i < resamplers.size(); ++i) {
            PairFigures f = Measure(resamplers[i], fin, fout, quick);
            f.speed = speeds[i];
            all[key][resamplers[i].name] = f;
            md << "| " << (resamplers[i].ours ? "**" + resamplers[i].name + "**" : resamplers[i].name) << " | "
               << Fmt("%.2g", f.rippleDb) << " | " << Fmt("%.1f", f.bandwidth) << " | " << Fmt("%.1f", f.stopbandDb)
               << " | " << Fmt("%.1f", f.snrDb) << " | " << Fmt("%.0f", f.speed) << " |\n";
            plot.series.push_back({resamplers[i].name, f.freq, f.levelDb});
        }
        md << "\n";
        if (fout < fin) plots.push_back(plot);
    }
    // The passband edge at 48 kHz to 44.1 kHz, magnified.
    {
        Plot edge;
        edge.title = "Passband edge, 48000 -> 44100";
        edge.xLabel = "input frequency (Hz)";
        edge.yLabel = "gain (dB)";
        edge.xMin = 16000;
        edge.xMax = 22050;
        edge.yMin = -6;
        edge.yMax = 1;
        for (const Resampler& r : resamplers) {
            const PairFigures& f = all["48000 -> 44100"][r.name];
            edge.series.push_back({r.name, f.freq, f.levelDb});
        }
        plots.insert(plots.begin(), edge);
    }
    std::ofstream(outDir + "/quality-resampling.svg") << RenderSvg(plots);
    md << "![Measured responses](quality-resampling.svg)\n\n";

    // The targets, as measured above.
    md << "### Targets\n\n";
    auto has = [&](const std::string& pair, const std::string& name) { return all[pair].count(name) != 0; };
    for (const auto& pair : pairs) {
        const std::string key = std::to_string(pair[0]) + " -> " + std::to_string(pair[1]);
        if (!has(key, "libsamplerate SINC_BEST")) break;
        const PairFigures& b = all[key]["kestaccel best"];
        const PairFigures& l = all[key]["libsamplerate SINC_BEST"];
        md << "- " << key << ", best against SINC_BEST: SNR " << Fmt("%.1f", b.snrDb) << " vs " << Fmt("%.1f", l.snrDb)
           << " dB (" << (b.snrDb >= l.snrDb ? "met" : "NOT met") << "), stopband " << Fmt("%.1f", b.stopbandDb) << " vs "
           << Fmt("%.1f", l.stopbandDb) << " dB (" << (b.stopbandDb >= l.stopbandDb ? "met" : "NOT met") << "), speed "
           << Fmt("%.0f", b.speed) << "x vs " << Fmt("%.0f", l.speed) << "x (" << (b.speed > l.speed ? "met" : "NOT met")
           << ")\n";
    }
    if (has("48000 -> 44100", "soxr HQ")) {
        const PairFigures& d = all["48000 -> 44100"]["kestaccel default"];
        const PairFigures& s = all["48000 -> 44100"]["soxr HQ"];
        md << "- 48000 -> 44100 stereo, default against soxr HQ: speed " << Fmt("%.0f", d.speed) << "x vs "
           << Fmt("%.0f", s.speed) << "x (" << (d.speed >= s.speed ? "met" : "NOT met") << "); SNR "
           << Fmt("%.1f", d.snrDb) << " vs " << Fmt("%.1f", s.snrDb) << " dB\n";
    }

    // FFT accuracy.
    std::fprintf(stderr, "FFT accuracy\n");
    md << "\n## FFT accuracy\n\n"
       << "Forward complex transforms of uniform random data in [-1, 1) against a radix-2 transform in long double\n"
       << "whose every twiddle factor is its own `sinl`/`cosl`: the RMS error over the RMS of the reference\n"
       << "spectrum, and the largest error over the largest reference magnitude, the worst of "
       << (quick ? 2 : 4) << " inputs. kissfft runs as Debian's float library and as its C++ template in double.\n\n"
       << "In float the three agree. In double the library's error grows with the size, to about 2e-12 at 65536\n"
       << "points against 3e-16 for FFTW: its twiddle factors are defined as the values of a rotation recurrence\n"
       << "in double, part of what makes its results the same bits everywhere, and the recurrence's rounding\n"
       << "accumulates along the table. The float transform rounds the same values to float, far below its own\n"
       << "rounding, so its error matches the peers'.\n\n";
    Plot fftPlot;
    fftPlot.title = "FFT: RMS error relative to a long-double reference";
    fftPlot.xLabel = "size (points)";
    fftPlot.yLabel = "relative RMS error";
    fftPlot.logX = fftPlot.logY = true;
    fftPlot.xMin = 64;
    fftPlot.xMax = 65536;
    fftPlot.yMin = 1e-17;
    fftPlot.yMax = 1e-6;
    auto table = [&](auto tag, const char* type) {
        using T = decltype(tag);
        const auto impls = FftImpls<T>();
        md << "### " << type << "\n\n| size |";
        for (const auto& i : impls) md << ' ' << i.name << " RMS | " << i.name << " max |";
        md << "\n|---:|";
        for (std::size_t i = 0; i < impls.size(); ++i) md << "---:|---:|";
        md << "\n";
        std::vector<Series> series(impls.size());
        for (std::size_t i = 0; i < impls.size(); ++i) series[i].label = impls[i].name + " " + type;
        for (std::size_t n = 64; n <= 65536; n *= 2) {
            md << "| " << n << " |";
            for (std::size_t i = 0; i < impls.size(); ++i) {
                const FftError e = FftAccuracy<T>(impls[i].run, n, quick ? 2 : 4);
                md << ' ' << Fmt("%.2e", e.rms) << " | " << Fmt("%.2e", e.max) << " |";
                series[i].x.push_back(double(n));
                series[i].y.push_back(e.rms);
            }
            md << "\n";
        }
        md << "\n";
        for (auto& s : series) fftPlot.series.push_back(std::move(s));
    };
    table(float(), "float");
    table(double(), "double");
    std::ofstream(outDir + "/quality-fft.svg") << RenderSvg({fftPlot});
    md << "![FFT error against size](quality-fft.svg)\n";
    std::ofstream(outDir + "/quality.md") << md.str();
    std::fprintf(stderr, "wrote %s/quality.md\n", outDir.c_str());
    return 0;
}
