// The FIR, IIR and multi-rate filters, and resample_poly on the tool's
// resampler.

#include <algorithm>
#include <memory>

#include <audio/Resampler.h>

#include "Bind.h"

namespace kpy {

namespace kf = kestaccel::filter;

namespace {

// -- FIR -------------------------------------------------------------------

struct FIROwner : Owner<kestaccel::FIRState_Float> {
    unsigned tapCount = 0;
};

void BindFIR(py::module_& m)
{
    using Use = FIROwner::Use;
    OwnerClass<FIROwner>(m, "FIRState_Float",
                         "A single-precision FIR filter made by FIRInit, freed by FIRFree (or close(), or the end "
                         "of a `with` block).")
        .def_readonly("tapCount", &FIROwner::tapCount);
    m.def(
        "FIRInit",
        [](std::optional<In<float>> taps, unsigned tapCount, std::optional<In<float>> delayLine) {
            Require(!taps || taps->size() == tapCount, "taps must have tapCount elements");
            Require(!delayLine || tapCount == 0 || delayLine->size() == tapCount - 1,
                    "delayLine must have tapCount - 1 elements");
            auto f = std::make_unique<FIROwner>();
            f->name = "FIRState_Float";
            f->free = kf::FIRFree;
            f->tapCount = tapCount;
            // A tap count of 0 or of 2**31 and more throws "vector too long" (ValueError).
            kf::FIRInit(&f->state, taps ? taps->data() : nullptr, tapCount, delayLine ? delayLine->data() : nullptr);
            return f;
        },
        "FIRInit(taps, tapCount, delayLine=None) -> FIRState_Float. taps (tapCount float32, or None: all taps 0 "
        "until FIRSetTaps); delayLine (tapCount - 1 float32, oldest first, or None: silence). With m = tapCount "
        "- 1 and x the input stream (the delay line, then the block), output i is the float sum, from +0, of "
        "taps[k] * x[i - k] for k from m down to 0: oldest sample first, taps[0] times the newest added last, "
        "each product and sum rounded to float. So a block split anywhere gives the same bits as one call. A "
        "tapCount of 0 or of 2**31 or more raises ValueError (\"vector too long\").",
        py::arg("taps"), py::arg("tapCount"), py::arg("delayLine") = py::none());
    m.def(
        "FIR",
        [](FIROwner& f, In<float> src, Out<float> dst) {
            const unsigned n = Count(src.size());
            py::array d = Output(dst, {py::ssize_t(n)});
            Use use(f);
            Released r(std::size_t(n) * f.tapCount);
            kf::FIR(use.state, n, src.data(), Ptr<float>(d));
            return d;
        },
        "FIR(state, src, dst=None): filters a block and moves the delay line on to the last tapCount - 1 inputs "
        "(the state comes FIRST, unlike IIR). dst may be src. A destination above the source in the same buffer "
        "is safe only up to 512 samples, as in C++.\n"
        "FIR(state, sample) -> float: the output for one more sample, without storing anything: the delay line "
        "stays as it was. To stream sample by sample, use the block form with one element.",
        py::arg("state"), py::arg("src"), py::arg("dst") = py::none());
    m.def(
        "FIR", [](FIROwner& f, float sample) { return kf::FIR(Use(f).state, sample); }, "", py::arg("state"),
        py::arg("sample"));
    m.def(
        "FIRSetTaps",
        [](FIROwner& f, In<float> taps) {
            Require(taps.size() == f.tapCount, "taps must have tapCount elements");
            kf::FIRSetTaps(Use(f).state, taps.data());
        },
        "FIRSetTaps(state, taps): copies tapCount taps in; the delay line keeps its contents.", py::arg("state"),
        py::arg("taps"));
    m.def(
        "FIRSetDlyLine",
        [](FIROwner& f, std::optional<In<float>> line) {
            Require(!line || line->size() == f.tapCount - 1, "delayLine must have tapCount - 1 elements");
            kf::FIRSetDlyLine(Use(f).state, line ? line->data() : nullptr);
        },
        "FIRSetDlyLine(state, delayLine=None): copies tapCount - 1 values in, oldest first; None clears it.",
        py::arg("state"), py::arg("delayLine") = py::none());
    m.def(
        "FIRGetDlyLine",
        [](FIROwner& f) {
            Use use(f);
            py::array line = Vector(py::dtype::of<float>(), f.tapCount - 1);
            kf::FIRGetDlyLine(use.state, Ptr<float>(line));
            return line;
        },
        "FIRGetDlyLine(state): the tapCount - 1 delay-line values, oldest first.", py::arg("state"));
    m.def("FIRGetWorkBufferSize", &kf::FIRGetWorkBufferSize, "FIRGetWorkBufferSize(tapCount): 0, no work buffer.",
          py::arg("tapCount"));
    m.def("FIRFree", [](FIROwner& f) { f.Close(); }, "FIRFree(state): frees the filter (state.close()).",
          py::arg("state"));
}

// -- IIR -------------------------------------------------------------------

template <class S>
struct IIROwner : Owner<S> {
    unsigned order = 0, sections = 0;
    std::size_t States() const { return std::size_t(order) * sections; }
    std::size_t Taps() const { return 2 * (std::size_t(order) + 1) * sections; }
};

template <class S, class T>
void BindIIR(py::module_& m, const char* name)
{
    using O = IIROwner<S>;
    using Use = typename O::Use;
    OwnerClass<O>(m, name,
                  "An IIR filter (float32 or float64) made by IIRInit or IIRInit_BiQuad, freed by IIRFree (or "
                  "close(), or the end of a `with` block).")
        .def_readonly("order", &O::order)
        .def_readonly("sectionCount", &O::sections);
    // The owner of a new filter, its lengths checked; the caller makes the record.
    auto make = [name](std::size_t order, std::size_t sections, const In<T>& taps, const std::optional<In<T>>& line) {
        Require(order > 0 && sections > 0, "order 0 or no sections create nothing");
        Require(2 * (order + 1) * sections <= 0xFFFFFFFFu, "too many taps for the 32-bit counts");
        auto f = std::make_unique<O>();
        f->name = name;
        f->free = static_cast<void (*)(S*)>(kf::IIRFree);
        f->order = unsigned(order);
        f->sections = unsigned(sections);
        if (taps.size() != f->Taps()) Fail("taps must have " + std::to_string(f->Taps()) + " elements");
        if (line && line->size() != f->States()) {
            Fail("delayLine must have " + std::to_string(f->States()) + " elements");
        }
        return f;
    };
    m.def(
        "IIRInit",
        [make](In<T> taps, unsigned order, std::optional<In<T>> line) {
            auto f = make(order, 1, taps, line);
            kf::IIRInit(&f->state, taps.data(), order, line ? line->data() : nullptr);
            return f;
        },
        Once("IIRInit",
             "IIRInit(taps, order, delayLine=None) -> IIRState_Float or IIRState_Double: one section of any order, "
             "in transposed direct form II, from 2 * order + 2 taps b0 .. b[order], a0 .. a[order], each "
             "multiplied by the reciprocal of a0 (a zero a0 is not tested: the taps become infinities or NaNs). "
             "delayLine: order values, taken unscaled, or None (zeros). Per sample, each product and sum rounded "
             "to the element type: y = b0*x + d[0]; d[i] = (b[i+1]*x + d[i+1]) - a[i+1]*y; d[order-1] = "
             "b[order]*x - a[order]*y. Order 0 raises ValueError (the C++ call creates nothing)."),
        py::arg("taps"), py::arg("order"), py::arg("delayLine") = py::none());
    m.def(
        "IIRInit_BiQuad",
        [make](In<T> taps, unsigned sections, std::optional<In<T>> line) {
            auto f = make(2, sections, taps, line);
            kf::IIRInit_BiQuad(&f->state, taps.data(), sections, line ? line->data() : nullptr);
            return f;
        },
        Once("IIRInit_BiQuad",
             "IIRInit_BiQuad(taps, sectionCount, delayLine=None): a cascade of second-order sections from 6 * "
             "sectionCount taps (b0 b1 b2 a0 a1 a2 per section). Every section is multiplied by the reciprocal of "
             "the FIRST section's a0 (taps[3]); a section's own a0 is not consulted. delayLine: 2 * sectionCount "
             "values or None. Sections run in ascending order, the output of one the input of the next."),
        py::arg("taps"), py::arg("sectionCount"), py::arg("delayLine") = py::none());
    m.def(
        "IIR",
        [](In<T> src, O& f, Out<T> dst) {
            const unsigned n = Count(src.size());
            py::array d = Output(dst, {py::ssize_t(n)});
            Use use(f);
            Released r(n * f.States());
            kf::IIR(n, src.data(), Ptr<T>(d), use.state);
            return d;
        },
        Once("IIR",
             "IIR(src, state, dst=None): filters a block (the state comes LAST, unlike FIR); dst may be src. The "
             "same bits as the one-sample form on each element in turn.\n"
             "IIR(sample, state) -> float: one sample, updating the state."),
        py::arg("src"), py::arg("state"), py::arg("dst") = py::none());
    m.def(
        "IIR", [](T sample, O& f) { return kf::IIR(sample, Use(f).state); }, "", py::arg("sample"), py::arg("state"));
    m.def(
        "IIR_InPlace",
        [](InOut<T> sd, O& f) {
            const unsigned n = Count(sd.size());
            Use use(f);
            Released r(n * f.States());
            kf::IIR_InPlace(n, sd.data(), use.state);
            return sd.a;
        },
        Once("IIR_InPlace", "IIR_InPlace(srcDst, state): filters in place."), py::arg("srcDst"), py::arg("state"));
    m.def(
        "IIRSetTaps",
        [](O& f, In<T> taps) {
            Require(taps.size() == f.Taps(), "taps must have 2 * (order + 1) * sectionCount elements");
            kf::IIRSetTaps(Use(f).state, taps.data());
        },
        Once("IIRSetTaps",
             "IIRSetTaps(state, taps): overwrites all 2 * (order + 1) * sectionCount taps without normalising: "
             "pass taps whose a0 is already divided out."),
        py::arg("state"), py::arg("taps"));
    m.def(
        "IIRSetDlyLine",
        [](O& f, std::optional<In<T>> line) {
            Require(!line || line->size() == f.States(), "delayLine must have order * sectionCount elements");
            kf::IIRSetDlyLine(Use(f).state, line ? line->data() : nullptr);
        },
        Once("IIRSetDlyLine",
             "IIRSetDlyLine(state, delayLine=None): copies order * sectionCount states in. None clears only the "
             "first section's states; later sections keep theirs."),
        py::arg("state"), py::arg("delayLine") = py::none());
    m.def(
        "IIRGetDlyLine",
        [](O& f) {
            Use use(f);
            py::array line = Vector(DTypeOf<T>(), f.States());
            kf::IIRGetDlyLine(use.state, Ptr<T>(line));
            return line;
        },
        Once("IIRGetDlyLine", "IIRGetDlyLine(state): the order * sectionCount states."), py::arg("state"));
    m.def("IIRFree", [](O& f) { f.Close(); }, Once("IIRFree", "IIRFree(state): frees the filter (state.close())."),
          py::arg("state"));
}

// -- Multi-rate filter ---------------------------------------------------------

// The record is opaque, so the owner follows its position (a copy of the
// C++ arithmetic) to bound what each call reads.
template <class S>
struct MRFOwner : Owner<S> {
    std::int64_t up = 1, down = 1, branch = 0, history = 0;
    std::int64_t inputIndex = 0, phase = 0;  // the position of the next output
};

std::int64_t FloorDiv(std::int64_t a, std::int64_t b) { return a >= 0 ? a / b : -((-a + b - 1) / b); }

template <class S, class T>
void BindMRF(py::module_& m, const char* name)
{
    using O = MRFOwner<S>;
    OwnerClass<O>(m, name,
                  "A polyphase multi-rate filter (float32 or float64) made by MRFInit, freed by MRFFree (or "
                  "close(), or the end of a `with` block).")
        .def_readonly("upFactor", &O::up)
        .def_readonly("downFactor", &O::down);
    m.def(
        "MRFInit",
        [name](unsigned up, unsigned down, In<T> taps, unsigned referencePosition, unsigned startPosition) {
            Require(up > 0, "upFactor must be at least 1 (the C++ call divides by it)");
            // The C++ position is a signed 32-bit phase that grows by D per output.
            Require(std::uint64_t(up) + down < 0x80000000u, "upFactor + downFactor must stay below 2**31");
            const std::size_t tapCount = Count(taps.size(), "taps");
            Require(tapCount + 1 + up <= 0xFFFFFFFFu, "too many taps for the 32-bit history length");
            auto f = std::make_unique<O>();
            f->name = name;
            f->free = static_cast<void (*)(S*)>(kf::MRFFree);
            f->up = up;
            f->down = down;
            f->branch = std::int64_t(tapCount / up);
            f->history = std::int64_t((tapCount + 1 + up) / up);
            const std::int64_t first = std::int32_t(startPosition - referencePosition);
            f->inputIndex = FloorDiv(first, up);
            f->phase = first - f->inputIndex * up;
            const std::vector<T, kestcore::allocator::STLAllocator<T>> reserved;
            kf::MRFInit(&f->state, up, down, taps.data(), unsigned(tapCount), reserved, referencePosition,
                        startPosition);
            return f;
        },
        Once("MRFInit",
             "MRFInit(upFactor, downFactor, taps, referencePosition=0, startPosition=0) -> MRFState_Float or "
             "MRFState_Double: a rational rate changer: the input raised by upFactor (U) with zeros, filtered by "
             "the taps at the high rate, lowered by downFactor (D). Each output sums one branch of L = len(taps) "
             "// U taps, in the element type, from +0 and from the oldest sample to the newest; the sum is not "
             "scaled by U. Only the first L * U taps are used. The first output lies at the high-rate position "
             "int32(startPosition - referencePosition): 0 is the first input sample. upFactor 0 raises "
             "ValueError."),
        py::arg("upFactor"), py::arg("downFactor"), py::arg("taps"), py::arg("referencePosition") = 0,
        py::arg("startPosition") = 0);
    m.def(
        "MRFProcess",
        [](In<T> src, unsigned cycleCount, O& f, Out<T> dst) {
            const std::int64_t outputs = std::int64_t(cycleCount) * f.up, inputs = std::int64_t(cycleCount) * f.down;
            Require(outputs < 0x80000000LL && inputs <= 0xFFFFFFFFLL,
                    "cycleCount * upFactor must stay below 2**31 and cycleCount * downFactor below 2**32");
            py::array d = Output(dst, {py::ssize_t(outputs)});
            const bool same = Ptr<T>(d) == src.data();
            // The oldest sample read lies in the history, the newest in src.
            std::int64_t needed = inputs;
            if (outputs > 0 && f.branch > 0) {
                Require(f.inputIndex - f.branch + 1 >= -f.history,
                        "the filter's position lies before its history: the first output was placed further back "
                        "than the history reaches, or downFactor 0 walked it back");
                const std::int64_t last = f.inputIndex * f.up + f.phase + (outputs - 1) * f.down;
                needed = std::max(needed, FloorDiv(last, f.up) + 1);
            }
            if (same) needed = std::max(needed, outputs);
            if (std::int64_t(src.size()) < needed) {
                Fail("this call reads " + std::to_string(needed) + " samples of src, which holds " +
                     std::to_string(src.size()) + " (a call at downFactor above 1 reads cycleCount * (downFactor - 1) "
                     "samples further on than the previous call left off)");
            }
            typename O::Use use(f);
            {
                Released r(std::size_t(outputs) * std::size_t(f.branch + 1));
                kf::MRFProcess(src.data(), Ptr<T>(d), cycleCount, use.state);
            }
            f.inputIndex += inputs - cycleCount;
            return d;
        },
        Once("MRFProcess",
             "MRFProcess(src, cycleCount, state, dst=None): runs cycleCount rate-change cycles (the count is of "
             "CYCLES, not samples): reads cycleCount * D samples of src and writes cycleCount * U outputs. After "
             "the call the position stands cycleCount * (D - 1) input samples further on than a seamless stream "
             "would put it: consecutive calls join seamlessly only at D of 1, and at D above 1 a later call reads "
             "src beyond its own cycleCount * D samples by that much (checked: a src too short raises "
             "ValueError). With dst the same array as src the outputs go to an internal scratch array and are "
             "then overwritten: the buffer keeps its input, only the history and position advance."),
        py::arg("src"), py::arg("cycleCount"), py::arg("state"), py::arg("dst") = py::none());
    m.def("MRFFree", [](O& f) { f.Close(); }, Once("MRFFree", "MRFFree(state): frees the filter (state.close())."),
          py::arg("state"));
}

// -- resample_poly ---------------------------------------------------------

py::array ResamplePoly(In<float> x, std::uint32_t up, std::uint32_t down, const std::string& quality)
{
    Require(x.a.ndim() <= 2, "x must be 1-D (samples) or 2-D (frames x channels)");
    const kestaudio::ResamplePreset* preset = nullptr;
    std::string names;
    for (const auto& p : kestaudio::ResamplePresets()) {
        if (quality == p.name) preset = &p;
        names += std::string(names.empty() ? "" : ", ") + p.name;
    }
    if (!preset) Fail("quality must be one of " + names);
    Require(up > 0 && down > 0, "up and down must be at least 1");
    // The plan takes rates; a ratio of up / down is the rate pair (down, up).
    const kestaudio::RatePlan plan = kestaudio::PlanResampling(down, up, *preset);
    const std::size_t channels = x.a.ndim() == 2 ? std::size_t(x.a.shape(1)) : 1;
    Require(channels > 0, "x has no channels");
    const std::size_t frames = channels ? x.size() / channels : 0;
    std::vector<float> out;
    {
        Released r(0x10000);
        kestaudio::StreamingResampler resampler(plan, unsigned(channels));
        resampler.Process(x.data(), frames, out);
        resampler.Finish(out);
    }
    const std::size_t outFrames = out.size() / channels;
    std::vector<py::ssize_t> shape{py::ssize_t(outFrames)};
    if (x.a.ndim() == 2) shape.push_back(py::ssize_t(channels));
    py::array y(py::dtype::of<float>(), shape);
    std::copy(out.begin(), out.end(), Ptr<float>(y));
    return y;
}

}  // namespace

void BindFilters(py::module_& m)
{
    BindFIR(m);
    BindIIR<kestaccel::IIRState_Float, float>(m, "IIRState_Float");
    BindIIR<kestaccel::IIRState_Double, double>(m, "IIRState_Double");
    BindMRF<kestaccel::MRFState_Float, float>(m, "MRFState_Float");
    BindMRF<kestaccel::MRFState_Double, double>(m, "MRFState_Double");

    m.def("resample_poly", &ResamplePoly,
          "resample_poly(x, up, down, quality='default') -> float32: x (float32, 1-D, or 2-D frames x channels) "
          "resampled by up / down with the presets of the kestaccel command-line tool, the same samples as its "
          "resampler: a Kaiser-windowed lowpass designed for the reduced ratio, run through the library's "
          "polyphase filter (MRFProcess) with its delay compensated, ceil(len(x) * up / down) frames out. The "
          "presets (kestaccel.resample_presets()) are 'fast', 'default' and 'best' ('best' filters in double).",
          py::arg("x"), py::arg("up"), py::arg("down"), py::arg("quality") = "default");
    m.def(
        "resample_presets",
        [] {
            py::list presets;
            for (const auto& p : kestaudio::ResamplePresets()) {
                presets.append(py::dict(py::arg("name") = p.name, py::arg("passbandEnd") = p.passbandEnd,
                                        py::arg("stopbandStart") = p.stopbandStart,
                                        py::arg("attenuationDb") = p.attenuationDb,
                                        py::arg("doublePrecision") = p.doublePrecision));
            }
            return presets;
        },
        "resample_presets(): the tool's resampling presets; frequencies are fractions of the lower Nyquist "
        "frequency.");
}

}  // namespace kpy
