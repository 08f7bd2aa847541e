#include "Commands.h"

#include <algorithm>
#include <chrono>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <map>
#include <memory>
#include <stdexcept>

#include <unistd.h>

#include <kestaccel/BasicMath.h>
#include <kestaccel/FIR.h>
#include <kestaccel/IIR.h>
#include <kestaccel/VectorUtils.h>

#include "AudioFile.h"
#include "audio/FilterDesign.h"
#include "audio/Resampler.h"
#include "audio/Spectrum.h"
#include "audio/Svg.h"

namespace kestcli {

namespace ku = kestaccel::utility;
namespace kf = kestaccel::filter;
using namespace kestaudio;

namespace {

const std::size_t kBlockFrames = 16384;

// --name value... options, with the number of values each takes; anything
// else starting with "--" is an error, the rest are positional.
struct Args {
    std::vector<std::string> positional;
    std::map<std::string, std::vector<std::string>> options;

    Args(const std::vector<std::string>& argv, const std::map<std::string, int>& known)
    {
        for (std::size_t i = 0; i < argv.size(); ++i) {
            const std::string& a = argv[i];
            if (a.size() > 2 && a.compare(0, 2, "--") == 0) {
                const auto k = known.find(a.substr(2));
                if (k == known.end()) throw UsageError("unknown option '" + a + "'");
                if (options.count(k->first)) throw UsageError("'" + a + "' given twice");
                std::vector<std::string>& values = options[k->first];
                for (int v = 0; v < k->second; ++v) {
                    if (++i >= argv.size()) throw UsageError("'" + a + "' needs " + std::to_string(k->second) + " value(s)");
                    values.push_back(argv[i]);
                }
            } else {
                positional.push_back(a);
            }
        }
    }
    bool Has(const std::string& name) const { return options.count(name) != 0; }
    const std::string& Value(const std::string& name, std::size_t i = 0) const { return options.at(name).at(i); }
};

bool WantsHelp(const std::vector<std::string>& args, const char* help)
{
    for (const std::string& a : args) {
        if (a == "--help" || a == "-h") {
            std::fputs(help, stdout);
            return true;
        }
    }
    return false;
}

void ExpectPositional(const Args& args, std::size_t count, const char* usage)
{
    if (args.positional.size() != count) throw UsageError(std::string("usage: ") + usage);
}

double ParseNumber(const std::string& text, const std::string& what, double lo, double hi)
{
    char* end = nullptr;
    errno = 0;
    const double v = std::strtod(text.c_str(), &end);
    if (text.empty() || *end != '\0' || errno != 0 || !std::isfinite(v)) {
        throw UsageError(what + " must be a number, not '" + text + "'");
    }
    if (v < lo || v > hi) {
        char buf[160];
        std::snprintf(buf, sizeof buf, " must lie between %.10g and %.10g, not %s", lo, hi, text.c_str());
        throw UsageError(what + buf);
    }
    return v;
}

unsigned long ParseWhole(const std::string& text, const std::string& what, unsigned long lo, unsigned long hi)
{
    const double v = ParseNumber(text, what, double(lo), double(hi));
    if (v != std::floor(v)) throw UsageError(what + " must be a whole number, not '" + text + "'");
    return (unsigned long)v;
}

// A progress bar on stderr, only on a terminal and only once a job has run
// for a second.
class Progress {
public:
    Progress(bool quiet, std::uint64_t total_) : total(total_), enabled(!quiet && isatty(2) && total_ > 0) {}
    ~Progress() { Done(); }
    // Clears the bar before anything else is printed.
    void Done()
    {
        if (drawn) std::fputs("\r\033[K", stderr);
        drawn = false;
    }
    void Update(std::uint64_t done)
    {
        if (!enabled) return;
        const double t = std::chrono::duration<double>(Clock::now() - start).count();
        if (t < 1.0 || t - last < 0.1) return;
        last = t;
        drawn = true;
        const int width = 40, filled = int(width * std::min(1.0, double(done) / double(total)));
        std::fprintf(stderr, "\r[%s%s] %3d%%", std::string(filled, '#').c_str(), std::string(width - filled, ' ').c_str(),
                     int(100 * std::min(1.0, double(done) / double(total))));
        std::fflush(stderr);
    }

private:
    using Clock = std::chrono::steady_clock;
    std::uint64_t total;
    bool enabled, drawn = false;
    Clock::time_point start = Clock::now();
    double last = 0;
};

// A block transformation of interleaved float frames.
struct Processor {
    virtual ~Processor() = default;
    virtual void Process(const float* in, std::size_t frames, std::vector<float>& out) = 0;
    virtual void Finish(std::vector<float>& out) = 0;
};

struct OutputChoice {
    int major;
    SampleKind kind;
};

// The output's container from its extension (or --format), else the
// input's; its samples from --bits, else the input's.
OutputChoice ChooseOutput(const Args& args, const std::string& out, const SF_INFO& in)
{
    int major = 0;
    if (args.Has("format")) {
        major = MajorFormatNamed(args.Value("format"));
        if (major == 0) throw UsageError("unknown --format '" + args.Value("format") + "' (wav, flac, aiff, caf, au, w64, rf64)");
    } else {
        major = MajorFormatNamed(out);
    }
    if (major == 0) major = in.format & SF_FORMAT_TYPEMASK;
    SampleKind kind = args.Has("bits") ? ParseBits(args.Value("bits")) : KindOfFormat(in.format);
    // FLAC has no float samples: the input's float becomes 24 bits there,
    // unless float was asked for.
    if (major == SF_FORMAT_FLAC && kind == SampleKind::Float && !args.Has("bits")) kind = SampleKind::Int24;
    return {major, kind};
}

struct RunResult {
    double seconds = 0;  // time spent in the processor
    std::uint64_t inFrames = 0;
};

// Reads, transforms and writes block by block, then renames the output
// into place and prints the digest of its samples.
RunResult RunPipeline(InputFile& input, const std::string& outPath, const OutputChoice& choice, int outRate,
                      Processor& processor, bool quiet)
{
    const SF_INFO& info = input.Info();
    OutputFile output(outPath, choice.major, choice.kind, outRate, info.channels);
    Progress progress(quiet, std::uint64_t(std::max<sf_count_t>(info.frames, 0)));
    std::vector<float> in(kBlockFrames * info.channels), out;
    RunResult result;
    using Clock = std::chrono::steady_clock;
    while (true) {
        const std::size_t got = input.Read(in.data(), kBlockFrames);
        out.clear();
        const auto t0 = Clock::now();
        if (got == 0) {
            processor.Finish(out);
        } else {
            processor.Process(in.data(), got, out);
        }
        result.seconds += std::chrono::duration<double>(Clock::now() - t0).count();
        output.Write(out.data(), out.size() / info.channels);
        result.inFrames += got;
        progress.Update(result.inFrames);
        if (got == 0) break;
    }
    const std::string digest = output.Commit();
    progress.Done();
    std::printf("samples-sha256 %s  %s\n", digest.c_str(), outPath.c_str());
    return result;
}

struct Identity : Processor {
    void Process(const float* in, std::size_t frames, std::vector<float>& out) override
    {
        out.assign(in, in + frames * channels);
    }
    void Finish(std::vector<float>&) override {}
    explicit Identity(int c) : channels(c) {}
    int channels;
};

struct ResampleProcessor : Processor {
    StreamingResampler resampler;
    ResampleProcessor(const RatePlan& plan, int channels) : resampler(plan, unsigned(channels)) {}
    void Process(const float* in, std::size_t frames, std::vector<float>& out) override
    {
        resampler.Process(in, frames, out);
    }
    void Finish(std::vector<float>& out) override { resampler.Finish(out); }
};

// FIR filtering per channel with the delay of the linear-phase filter taken
// out: the first (N - 1) / 2 outputs are dropped, and as many zeros follow
// the input, so the output lines up with the input and has its length.
struct FirProcessor : Processor {
    std::vector<kestaccel::FIRState_Float*> states;
    std::vector<float> taps, planar, filtered;
    int channels;
    std::size_t skip;
    FirProcessor(const std::vector<double>& design, int channels_)
        : taps(design.begin(), design.end()), channels(channels_), skip((design.size() - 1) / 2)
    {
        states.assign(channels, nullptr);
        for (auto& s : states) kf::FIRInit(&s, taps.data(), unsigned(taps.size()), nullptr);
    }
    ~FirProcessor() override
    {
        for (auto* s : states) kf::FIRFree(s);
    }
    void Run(const float* in, std::size_t frames, std::vector<float>& out)
    {
        planar.resize(frames * channels);
        filtered.resize(frames * channels);
        std::vector<float*> parts(channels);
        std::vector<const float*> results(channels);
        for (int c = 0; c < channels; ++c) parts[c] = planar.data() + c * frames;
        ku::Deinterleave(unsigned(channels), unsigned(frames), in, parts.data());
        for (int c = 0; c < channels; ++c) {
            kf::FIR(states[c], unsigned(frames), parts[c], filtered.data() + c * frames);
        }
        const std::size_t drop = std::min(skip, frames);
        skip -= drop;
        for (int c = 0; c < channels; ++c) results[c] = filtered.data() + c * frames + drop;
        const std::size_t old = out.size();
        out.resize(old + (frames - drop) * channels);
        ku::Interleave(unsigned(channels), unsigned(frames - drop), results.data(), out.data() + old);
    }
    void Process(const float* in, std::size_t frames, std::vector<float>& out) override { Run(in, frames, out); }
    void Finish(std::vector<float>& out) override
    {
        const std::size_t tail = (taps.size() - 1) / 2;
        std::vector<float> zeros(tail * channels, 0.0f);
        Run(zeros.data(), tail, out);
    }
};

// Biquad cascades per channel, in double.
struct IirProcessor : Processor {
    std::vector<kestaccel::IIRState_Double*> states;
    std::vector<float> planar;
    std::vector<double> wide;
    int channels;
    IirProcessor(const std::vector<double>& taps, int channels_) : channels(channels_)
    {
        states.assign(channels, nullptr);
        for (auto& s : states) kf::IIRInit_BiQuad(&s, taps.data(), unsigned(taps.size() / 6), nullptr);
    }
    ~IirProcessor() override
    {
        for (auto* s : states) kf::IIRFree(s);
    }
    void Process(const float* in, std::size_t frames, std::vector<float>& out) override
    {
        planar.resize(frames * channels);
        wide.resize(frames);
        std::vector<float*> parts(channels);
        for (int c = 0; c < channels; ++c) parts[c] = planar.data() + c * frames;
        ku::Deinterleave(unsigned(channels), unsigned(frames), in, parts.data());
        for (int c = 0; c < channels; ++c) {
            ku::Convert(unsigned(frames), parts[c], wide.data());
            kf::IIR_InPlace(unsigned(frames), wide.data(), states[c]);
            ku::Convert(unsigned(frames), wide.data(), parts[c]);
        }
        const std::size_t old = out.size();
        out.resize(old + frames * channels);
        std::vector<const float*> results(parts.begin(), parts.end());
        ku::Interleave(unsigned(channels), unsigned(frames), results.data(), out.data() + old);
    }
    void Finish(std::vector<float>&) override {}
};

const char* const kResampleHelp =
    "usage: kestaccel resample IN OUT --rate R [--quality fast|default|best] [--bits 16|24|32|float]\n"
    "                          [--format F] [--stats] [--quiet]\n"
    "Changes the sample rate to R Hz (1 to 2000000). The ratio of the rates, reduced to U/D,\n"
    "is done by the library's polyphase filter with a Kaiser-windowed lowpass that the preset\n"
    "designs for the two rates:\n"
    "  fast     flat to 80 % of the lower Nyquist frequency,  80 dB stopband, float\n"
    "  default  flat to 85 %, 100 dB stopband, float (the default)\n"
    "  best     flat to 95 %, 175 dB stopband (Kaiser design target), double\n"
    "The output is exactly what one filter call over the whole file gives, in bounded memory.\n"
    "--stats prints the filter's ratio, taps, passband ripple, stopband attenuation and speed.\n"
    "Prints the SHA-256 of the output samples.\n";

const char* const kFilterHelp =
    "usage: kestaccel filter IN OUT (--lowpass F | --highpass F | --bandpass F1 F2)\n"
    "                        [--fir N | --biquads K] [--bits 16|24|32|float] [--format F] [--quiet]\n"
    "Filters every channel. --fir N (the default, N = 255): a linear-phase FIR filter of N taps\n"
    "(odd; 3 to 65535), Kaiser window, its delay taken out so the output lines up with the input.\n"
    "--biquads K: a Butterworth cascade of K biquads (1 to 32; a bandpass splits them between\n"
    "its two edges). Frequencies in Hz, above 0 and below half the sample rate.\n"
    "Prints the SHA-256 of the output samples.\n";

const char* const kConvertHelp =
    "usage: kestaccel convert IN OUT [--format wav|flac|aiff|caf|au|w64|rf64] [--bits 16|24|32|float]\n"
    "                         [--quiet]\n"
    "Rewrites the samples in another container or sample format. The container comes from\n"
    "--format, else OUT's extension, else the input's; integer samples are rounded and limited\n"
    "to full scale. Samples pass through float: 32-bit integers keep 24 significant bits.\n"
    "Prints the SHA-256 of the output samples.\n";

const char* const kSpectrumHelp =
    "usage: kestaccel spectrum IN OUT.svg [--quiet]\n"
    "Draws the averaged magnitude spectrum (8192-point Kaiser-windowed FFTs, half overlapping;\n"
    "dB relative to a full-scale sine over a logarithmic frequency axis, one curve per channel)\n"
    "and a spectrogram of the channels' mean beneath it, as one SVG file.\n";

const char* const kGenerateHelp =
    "usage: kestaccel generate OUT [--rate R] [--seconds S] [--channels C] [--bits 16|24|32|float]\n"
    "                          [--quiet]\n"
    "Writes the test signal of the demonstration (default: 48000 Hz, 10 s, 2 channels, float):\n"
    "a logarithmic sweep from 20 Hz (first 40 %), tones (next 30 %: 1 kHz at -6 dBFS in the\n"
    "first channel, 440 Hz, 3 kHz and 12 kHz in the others), a noise burst (10 %), silence.\n"
    "Prints the SHA-256 of the output samples.\n";

const char* const kToneHelp =
    "usage: kestaccel tone IN --frequency F [--from S] [--to S]\n"
    "Measures a sine of F Hz in each channel between the times S (seconds; the whole file by\n"
    "default): its level in dBFS and the signal-to-noise ratio, everything else counting as noise.\n";

}  // namespace

int Resample(const std::vector<std::string>& argv)
{
    if (WantsHelp(argv, kResampleHelp)) return 0;
    const Args args(argv, {{"rate", 1}, {"quality", 1}, {"bits", 1}, {"format", 1}, {"stats", 0}, {"quiet", 0}});
    ExpectPositional(args, 2, "kestaccel resample IN OUT --rate R [options]; see --help");
    if (!args.Has("rate")) throw UsageError("resample needs --rate");
    const std::uint32_t rate = std::uint32_t(ParseWhole(args.Value("rate"), "--rate", 1, kMaxRate));
    Quality quality = Quality::Default;
    if (args.Has("quality") && !ParseQuality(args.Value("quality"), &quality)) {
        throw UsageError("--quality takes fast, default or best, not '" + args.Value("quality") + "'");
    }
    const std::string& inPath = args.positional[0];
    const std::string& outPath = args.positional[1];
    InputFile input(inPath);
    CheckDistinct(inPath, outPath);
    RatePlan plan;
    try {
        plan = PlanResampling(std::uint32_t(input.Info().samplerate), rate, PresetFor(quality));
    } catch (const std::exception& e) {
        throw UsageError(std::string("cannot resample '") + inPath + "' from " + std::to_string(input.Info().samplerate) +
                         " Hz to " + std::to_string(rate) + " Hz: " + e.what());
    }
    const OutputChoice choice = ChooseOutput(args, outPath, input.Info());
    std::unique_ptr<ResampleProcessor> processor;
    try {
        processor.reset(new ResampleProcessor(plan, input.Info().channels));
    } catch (const std::bad_alloc&) {
        throw UsageError("cannot resample '" + inPath + "': the filter for " + std::to_string(plan.up) + "/" +
                         std::to_string(plan.down) + " does not fit in memory");
    }
    const RunResult run = RunPipeline(input, outPath, choice, int(rate), *processor, args.Has("quiet"));
    if (args.Has("stats")) {
        const ResamplePreset& preset = PresetFor(quality);
        const double lower = std::min(plan.inRate, plan.outRate) / 2.0, high = double(plan.up) * plan.inRate;
        const ResponseFigures r = FirResponseFigures(processor->resampler.Taps(), preset.passbandEnd * lower / high,
                                                     preset.stopbandStart * lower / high);
        std::printf("filter: %s preset, ratio %u/%u, %u taps per output (%u taps at %.0f Hz)\n", preset.name,
                    plan.up, plan.down, plan.tapsPerPhase, plan.tapsPerPhase * plan.up, high);
        std::printf("passband ripple: %.2g dB up to %.0f Hz\n", r.passbandRippleDb, preset.passbandEnd * lower);
        std::printf("stopband attenuation: %.1f dB from %.0f Hz\n", r.stopbandAttenuationDb, preset.stopbandStart * lower);
        if (run.seconds > 0) {
            std::printf("speed: %.0fx real time (%u channels, resampling alone)\n",
                        double(run.inFrames) / plan.inRate / run.seconds, unsigned(input.Info().channels));
        }
    }
    return 0;
}

int Filter(const std::vector<std::string>& argv)
{
    if (WantsHelp(argv, kFilterHelp)) return 0;
    const Args args(argv, {{"lowpass", 1}, {"highpass", 1}, {"bandpass", 2}, {"fir", 1}, {"biquads", 1},
                           {"bits", 1}, {"format", 1}, {"quiet", 0}});
    ExpectPositional(args, 2, "kestaccel filter IN OUT (--lowpass F | --highpass F | --bandpass F1 F2); see --help");
    const int bands = int(args.Has("lowpass")) + int(args.Has("highpass")) + int(args.Has("bandpass"));
    if (bands != 1) throw UsageError("filter needs exactly one of --lowpass, --highpass, --bandpass");
    if (args.Has("fir") && args.Has("biquads")) throw UsageError("--fir and --biquads exclude each other");
    const unsigned taps = args.Has("fir") ? unsigned(ParseWhole(args.Value("fir"), "--fir", 3, 65535)) : 255;
    const unsigned sections = args.Has("biquads") ? unsigned(ParseWhole(args.Value("biquads"), "--biquads", 1, 32)) : 0;
    const std::string& inPath = args.positional[0];
    const std::string& outPath = args.positional[1];
    InputFile input(inPath);
    CheckDistinct(inPath, outPath);
    const double rate = input.Info().samplerate, nyquist = rate / 2;
    Band band = Band::Lowpass;
    double f1, f2 = 0;
    const std::string limit = " (the input's Nyquist frequency is " + std::to_string(int(nyquist)) + " Hz)";
    auto frequency = [&](const std::string& text, const char* what) {
        const double f = ParseNumber(text, what, 0, 1e9);
        if (!(f > 0 && f < nyquist)) throw UsageError(std::string(what) + " must lie between 0 and half the sample rate" + limit);
        return f;
    };
    if (args.Has("lowpass")) {
        f1 = frequency(args.Value("lowpass"), "--lowpass");
    } else if (args.Has("highpass")) {
        band = Band::Highpass;
        f1 = frequency(args.Value("highpass"), "--highpass");
    } else {
        band = Band::Bandpass;
        f1 = frequency(args.Value("bandpass", 0), "--bandpass");
        f2 = frequency(args.Value("bandpass", 1), "--bandpass");
        if (f1 >= f2) throw UsageError("--bandpass needs its lower edge first");
        if (sections == 1) throw UsageError("a bandpass needs at least 2 biquads");
    }
    const OutputChoice choice = ChooseOutput(args, outPath, input.Info());
    std::unique_ptr<Processor> processor;
    if (sections > 0) {
        processor.reset(new IirProcessor(DesignButterworth(band, f1, f2, rate, sections), input.Info().channels));
    } else {
        processor.reset(new FirProcessor(DesignFir(band, f1, f2, rate, taps), input.Info().channels));
    }
    RunPipeline(input, outPath, choice, input.Info().samplerate, *processor, args.Has("quiet"));
    return 0;
}

int Convert(const std::vector<std::string>& argv)
{
    if (WantsHelp(argv, kConvertHelp)) return 0;
    const Args args(argv, {{"bits", 1}, {"format", 1}, {"quiet", 0}});
    ExpectPositional(args, 2, "kestaccel convert IN OUT [--format F] [--bits B]; see --help");
    InputFile input(args.positional[0]);
    CheckDistinct(args.positional[0], args.positional[1]);
    const OutputChoice choice = ChooseOutput(args, args.positional[1], input.Info());
    Identity identity(input.Info().channels);
    RunPipeline(input, args.positional[1], choice, input.Info().samplerate, identity, args.Has("quiet"));
    return 0;
}

int Spectrum(const std::vector<std::string>& argv)
{
    if (WantsHelp(argv, kSpectrumHelp)) return 0;
    const Args args(argv, {{"quiet", 0}});
    ExpectPositional(args, 2, "kestaccel spectrum IN OUT.svg; see --help");
    InputFile input(args.positional[0]);
    CheckDistinct(args.positional[0], args.positional[1]);
    const SF_INFO& info = input.Info();
    const std::uint64_t frames = std::uint64_t(std::max<sf_count_t>(info.frames, 0));
    SpectrumAnalyzer analyzer(unsigned(info.channels), info.samplerate, frames);
    Progress progress(args.Has("quiet"), frames);
    std::vector<float> block(kBlockFrames * info.channels);
    std::uint64_t done = 0;
    while (std::size_t got = input.Read(block.data(), kBlockFrames)) {
        analyzer.Add(block.data(), got);
        progress.Update(done += got);
    }
    const double rate = info.samplerate, low = std::min(20.0, rate / 2 / 10), high = rate / 2;
    const unsigned size = analyzer.Size();
    Plot plot;
    plot.title = "Averaged spectrum of " + args.positional[0];
    plot.xLabel = "frequency (Hz)";
    plot.yLabel = "level (dB relative to a full-scale sine)";
    plot.logX = true;
    plot.xMin = low;
    plot.xMax = high;
    plot.yMin = -160;
    plot.yMax = 10;
    const auto average = analyzer.AverageDb();
    for (std::size_t c = 0; c < average.size(); ++c) {
        Series s;
        s.label = "channel " + std::to_string(c + 1);
        for (unsigned k = 1; k <= size / 2; ++k) {
            s.x.push_back(k * rate / size);
            s.y.push_back(average[c][k]);
        }
        plot.series.push_back(std::move(s));
    }
    std::vector<Heatmap> maps;
    const auto slices = analyzer.SpectrogramDb();
    if (!slices.empty()) {
        // 96 rows on the same logarithmic axis, each the peak of its bins.
        Heatmap h;
        h.title = "Spectrogram (mean of the channels)";
        h.xLabel = "time (s)";
        h.yLabel = "frequency (Hz)";
        h.xMax = double(frames) / rate;
        h.yMin = low;
        h.yMax = high;
        h.vMin = -140;
        h.vMax = 0;
        const int rows = 96;
        for (const auto& slice : slices) {
            std::vector<double> column(rows, -300.0);
            for (unsigned k = 1; k <= size / 2; ++k) {
                const double f = k * rate / size;
                if (f < low) continue;
                const int r = std::min(rows - 1, int(rows * std::log(f / low) / std::log(high / low)));
                column[r] = std::max(column[r], slice[k]);
            }
            for (int r = 1; r < rows; ++r) {
                if (column[r] < -299) column[r] = column[r - 1];
            }
            h.cells.push_back(std::move(column));
        }
        maps.push_back(std::move(h));
    }
    WriteTextFile(args.positional[1], RenderSvg({plot}, maps));
    return 0;
}

int Generate(const std::vector<std::string>& argv)
{
    if (WantsHelp(argv, kGenerateHelp)) return 0;
    const Args args(argv, {{"rate", 1}, {"seconds", 1}, {"channels", 1}, {"bits", 1}, {"format", 1}, {"quiet", 0}});
    ExpectPositional(args, 1, "kestaccel generate OUT [options]; see --help");
    const double rate = args.Has("rate") ? double(ParseWhole(args.Value("rate"), "--rate", 1000, kMaxRate)) : 48000;
    const double seconds = args.Has("seconds") ? ParseNumber(args.Value("seconds"), "--seconds", 0.01, 36000) : 10;
    const int channels = args.Has("channels") ? int(ParseWhole(args.Value("channels"), "--channels", 1, 64)) : 2;
    SF_INFO info{};
    info.format = SF_FORMAT_WAV | SF_FORMAT_FLOAT;
    const OutputChoice choice = ChooseOutput(args, args.positional[0], info);
    OutputFile output(args.positional[0], choice.major, choice.kind, int(rate), channels);
    const std::uint64_t total = std::uint64_t(std::llround(seconds * rate));
    const double pi = 3.14159265358979323846, sweepEnd = 0.4 * total, tonesEnd = 0.7 * total, noiseEnd = 0.8 * total;
    const double f0 = 20, f1 = 0.45 * rate, k = std::log(f1 / f0);
    std::uint32_t seed = 12345;
    std::vector<float> block;
    Progress progress(args.Has("quiet"), total);
    for (std::uint64_t start = 0; start < total; start += kBlockFrames) {
        const std::uint64_t end = std::min<std::uint64_t>(total, start + kBlockFrames);
        block.assign((end - start) * channels, 0.0f);
        for (std::uint64_t n = start; n < end; ++n) {
            const double t = n / rate;
            // Raised-cosine edges of 10 ms on every segment.
            auto edge = [&](double a, double b) {
                const double r = 0.01 * rate, d = std::min(n - a, b - n);
                return d >= r ? 1.0 : 0.5 - 0.5 * std::cos(pi * std::max(0.0, d) / r);
            };
            for (int c = 0; c < channels; ++c) {
                double v = 0;
                if (n < sweepEnd) {
                    const double T = sweepEnd / rate;
                    v = 0.5 * edge(0, sweepEnd) * std::sin(2 * pi * f0 * T / k * (std::exp(k * t / T) - 1));
                } else if (n < tonesEnd) {
                    const double g = edge(sweepEnd, tonesEnd);
                    if (c == 0) {
                        v = 0.5 * g * std::sin(2 * pi * 1000 * t);
                    } else {
                        for (double f : {440.0, 3000.0, 12000.0}) {
                            if (f < 0.45 * rate) v += 0.2 * g * std::sin(2 * pi * f * t);
                        }
                    }
                } else if (n < noiseEnd) {
                    seed = seed * 1664525u + 1013904223u;
                    v = 0.3 * edge(tonesEnd, noiseEnd) * ((seed >> 8) / 8388608.0 - 1);
                }
                block[(n - start) * channels + c] = float(v);
            }
        }
        output.Write(block.data(), end - start);
        progress.Update(end);
    }
    const std::string digest = output.Commit();
    progress.Done();
    std::printf("samples-sha256 %s  %s\n", digest.c_str(), args.positional[0].c_str());
    return 0;
}

int Tone(const std::vector<std::string>& argv)
{
    if (WantsHelp(argv, kToneHelp)) return 0;
    const Args args(argv, {{"frequency", 1}, {"from", 1}, {"to", 1}});
    ExpectPositional(args, 1, "kestaccel tone IN --frequency F [--from S] [--to S]; see --help");
    if (!args.Has("frequency")) throw UsageError("tone needs --frequency");
    InputFile input(args.positional[0]);
    const SF_INFO& info = input.Info();
    const double rate = info.samplerate;
    const double f = ParseNumber(args.Value("frequency"), "--frequency", 0, rate / 2);
    const double from = args.Has("from") ? ParseNumber(args.Value("from"), "--from", 0, 1e7) : 0;
    const double to = args.Has("to") ? ParseNumber(args.Value("to"), "--to", from, 1e7) : double(info.frames) / rate;
    const std::uint64_t first = std::uint64_t(from * rate), last = std::min<std::uint64_t>(std::uint64_t(to * rate), info.frames);
    // The largest power of two that fits, at most 2^20 frames: memory stays bounded.
    std::size_t n = 1;
    while (n * 2 <= std::min<std::uint64_t>(last > first ? last - first : 0, 1u << 20)) n *= 2;
    if (n < 1024) throw UsageError("the measured span must hold at least 1024 frames");
    const int channels = info.channels;
    std::vector<float> block(kBlockFrames * channels);
    std::vector<std::vector<double>> x(channels);
    std::uint64_t position = 0;
    while (std::size_t got = input.Read(block.data(), kBlockFrames)) {
        for (std::size_t i = 0; i < got; ++i, ++position) {
            if (position < first || position >= first + n) continue;
            for (int c = 0; c < channels; ++c) x[c].push_back(block[i * channels + c]);
        }
        if (position >= first + n) break;
    }
    for (int c = 0; c < channels; ++c) {
        const ToneFigures t = MeasureTone(x[c].data(), n, rate, f, 1.0, rate);
        std::printf("channel %d: %g Hz at %.2f dBFS, SNR %.1f dB\n", c + 1, f, t.gainDb, t.snrDb);
    }
    return 0;
}

}  // namespace kestcli
