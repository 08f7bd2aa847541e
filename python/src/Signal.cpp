// Windows, lowpass design, convolution and rate change, matrix product.

#include <climits>

#include "Bind.h"

namespace kpy {

namespace ku = kestaccel::utility;
namespace kf = kestaccel::filter;

namespace {

template <class T>
void BindMultiply(py::module_& m)
{
    m.def(
        "Multiply",
        [](int order, In<T> a, In<T> b, Out<T> c) {
            Require(order == kestaccel::RowMajor || order == kestaccel::ColMajor,
                    "order must be RowMajor (0) or ColMajor (1)");
            Require(a.a.ndim() == 2 && b.a.ndim() == 2 && a.a.shape(1) == b.a.shape(0),
                    "a (rows x inner) and b (inner x cols) must be 2-D arrays with matching inner dimensions");
            const py::ssize_t rows = a.a.shape(0), inner = a.a.shape(1), cols = b.a.shape(1);
            Require(rows <= INT_MAX && inner <= INT_MAX && cols <= INT_MAX, "the dimensions must fit int");
            // In<T> made a and b C-contiguous; column-major storage is the
            // Fortran layout of the same 2-D arrays.
            const int layout = order == kestaccel::ColMajor ? py::array::f_style : py::array::c_style;
            py::array pa = py::array::ensure(a.a, layout), pb = py::array::ensure(b.a, layout);
            py::array pc;
            if (c.given) {
                pc = c.given->a;
                Require(pc.ndim() == 2 && pc.shape(0) == rows && pc.shape(1) == cols, "c must be rows x cols");
            } else {
                std::vector<py::ssize_t> strides{py::ssize_t(sizeof(T)) * cols, py::ssize_t(sizeof(T))};
                if (order == kestaccel::ColMajor) strides = {py::ssize_t(sizeof(T)), py::ssize_t(sizeof(T)) * rows};
                pc = py::array(DTypeOf<T>(), {rows, cols}, strides);
            }
            Require((pc.flags() & layout) != 0, "c must be stored in the order given");
            Released r(std::size_t(rows * cols * inner));
            ku::Multiply(kestaccel::MatrixDataOrder(order), int(rows), int(cols), int(inner), Ptr<T>(pa), Ptr<T>(pb),
                         Ptr<T>(pc));
            return pc;
        },
        Once("Multiply",
             "Multiply(order, a, b, c=None): c = a @ b, with a of rows x inner and b of inner x cols (2-D "
             "arrays of float32, float64, complex64 or complex128), stored in the one order given: RowMajor "
             "(C order) or ColMajor (Fortran order); arrays in the other layout are copied, and c is returned "
             "in the order given. The product is Eigen's: each element is within 32 machine epsilons of the "
             "naive sum for operands in [-1, 1], and its bits may depend on how Eigen was built. c may be a "
             "or b: it is written once the product is complete."),
        py::arg("order"), py::arg("a"), py::arg("b"), py::arg("c") = py::none());
}

}  // namespace

void BindSignal(py::module_& m)
{
    static const std::string window =
        "WindowBartlett(src, dst=None), WindowHann, WindowHamming, WindowBlackman(src, alpha, dst=None), "
        "WindowKaiser(src, alpha, dst=None): multiply src by a symmetric window of n samples (denominator "
        "n - 1, not the periodic form); pass ones to get the window itself. float32 and float64.\n"
        "  Bartlett 2i / (n - 1); Hann 0.5 - cos(x) * 0.5; Hamming 0.54 - cos(x) * 0.46;\n"
        "  Blackman (alpha + 1) * 0.5 - cos(x) * 0.5 - cos(x + x) * (alpha * 0.5), classic at alpha = -0.16;\n"
        "  Kaiser I0(alpha * sqrt(m**2 - (i - m)**2)) / I0(alpha * m), m = (n - 1) / 2,\n"
        "with x = i * 2pi / (n - 1) in the element type. Only the first half is evaluated and mirrored, so "
        "both halves agree bit for bit. The float64 Blackman takes its cosines in single precision. Kaiser's "
        "alpha multiplies the distance from the centre (the usual shape parameter is alpha * (n - 1) / 2); "
        "its I0 approximation holds up to an argument of about 15. n = 1: the cosine windows give NaN.";
    Each<float, double>([&](auto t) {
        using T = decltype(t);
        Unary<T, T>(m, "WindowBartlett", ku::WindowBartlett, window.c_str());
        Unary<T, T>(m, "WindowHann", ku::WindowHann, window.c_str());
        Unary<T, T>(m, "WindowHamming", ku::WindowHamming, window.c_str());
        Scalars<T, T>(m, "WindowBlackman", ku::WindowBlackman, window.c_str(), {"alpha"});
        Scalars<T, T>(m, "WindowKaiser", ku::WindowKaiser, window.c_str(), {"alpha"});
    });

    m.def(
        "GenerateLowpassFIRCoefficients",
        [](double cutoff, unsigned tapCount, int windowType, bool normalize) {
            py::array taps = Vector(py::dtype::of<double>(), tapCount);
            Released r(tapCount);
            kf::GenerateLowpassFIRCoefficients(cutoff, tapCount, Ptr<double>(taps), ku::DSPWindowType(windowType),
                                               normalize, nullptr);
            return taps;
        },
        "GenerateLowpassFIRCoefficients(cutoff, tapCount, windowType, normalize) -> float64 taps: a linear-phase "
        "lowpass by the window method, in double. cutoff is a fraction of the sampling frequency (0.5 is "
        "Nyquist), not range-checked. The ideal response sin(x c) / x with c = 2 cutoff is sampled around the "
        "centre (on the middle tap for odd counts, between the two middle taps for even ones), then multiplied "
        "by the window: kDSPWindowBartlett (0), kDSPWindowHamming (2) or kDSPWindowHann (3); any other value, "
        "1 included, applies none. normalize multiplies every tap by 1 / (2 |S| + centre), S the sum of the "
        "left half without the centre: a positive S scales the sum to 1, a negative one keeps its sign, a "
        "cutoff of 0 gives NaN taps.",
        py::arg("cutoff"), py::arg("tapCount"), py::arg("windowType"), py::arg("normalize"));

    Each<float, double>([&](auto t) {
        using T = decltype(t);
        m.def(
            "Convolve",
            [](In<T> a, In<T> b, Out<T> dst) {
                Require(a.size() > 0 && b.size() > 0, "Convolve needs two non-empty arrays");
                const unsigned total = Count(a.size() + b.size() - 1, "the result");
                py::array d = Output(dst, {py::ssize_t(total)});
                Apart(Ptr<T>(d), total * sizeof(T), a.data(), a.size() * sizeof(T), "dst must not overlap a");
                Apart(Ptr<T>(d), total * sizeof(T), b.data(), b.size() * sizeof(T), "dst must not overlap b");
                Released r(a.size() * b.size());
                ku::Convolve(unsigned(a.size()), a.data(), unsigned(b.size()), b.data(), Ptr<T>(d));
                return d;
            },
            Once("Convolve",
                 "Convolve(a, b, dst=None): the full linear convolution, len(a) + len(b) - 1 elements, by direct "
                 "summation: dst[k] = sum over j of a[j] * b[k - j], from +0 in the element type (float32 sums in "
                 "float32) in ascending order of j, the index into the FIRST array, whatever the sizes: "
                 "swapping a and b gives the same values up to rounding only. float32 and float64."),
            py::arg("a"), py::arg("b"), py::arg("dst") = py::none());
        m.def(
            "UpSample",
            [](In<T> src, unsigned factor, unsigned phase, Out<T> dst) {
                const unsigned total = Count(src.size() * std::uint64_t(factor), "the result");
                py::array d = Output(dst, {py::ssize_t(total)});
                if (factor > 1) {
                    Apart(Ptr<T>(d), total * sizeof(T), src.data(), src.size() * sizeof(T),
                          "UpSample cannot run in place when factor is above 1");
                }
                Released r(total);
                ku::UpSample(unsigned(src.size()), src.data(), Ptr<T>(d), factor, &phase);
                return d;
            },
            Once("UpSample",
                 "UpSample(src, factor, phase, dst=None): len(src) * factor outputs; src[i] goes to "
                 "dst[i * factor + phase] and every other output is 0. The phase is read, not changed (the "
                 "same for every block); a phase at or above factor gives only zeros. float32 and float64."),
            py::arg("src"), py::arg("factor"), py::arg("phase"), py::arg("dst") = py::none());
        m.def(
            "DownSample",
            [](In<T> src, unsigned factor, unsigned phase, Out<T> dst) {
                Require(factor > 0, "factor must be at least 1 (the C++ call divides by it)");
                const unsigned n = Count(src.size());
                Require(std::uint64_t(phase) <= std::uint64_t(n) + factor - 1,
                        "phase is beyond the block and the next factor - 1 samples; start a stream with a phase "
                        "below factor");
                const unsigned count = unsigned((std::uint64_t(n) - phase + factor - 1) / factor);
                py::array d = Output(dst, {py::ssize_t(count)});
                Released r(n);
                ku::DownSample(n, src.data(), Ptr<T>(d), factor, &phase);
                return py::make_tuple(d, phase);
            },
            Once("DownSample",
                 "DownSample(src, factor, phase, dst=None) -> (dst, phase): keeps src[P], src[P + factor], ... "
                 "of this block (P = phase), (n - P + factor - 1) // factor samples, and returns the phase of "
                 "the next block, (P - n % factor + factor) % factor: blocks of any length then form one "
                 "continuous decimation. Start a stream with a phase below factor. In place is safe. float32 and "
                 "float64."),
            py::arg("src"), py::arg("factor"), py::arg("phase"), py::arg("dst") = py::none());
    });
    m.def(
        "ConvolutionWorkBufferSize", [](unsigned a, unsigned b) { return ku::ConvolutionWorkBufferSize(a, b); },
        "ConvolutionWorkBufferSize(countA, countB): 0 for any counts; Convolve needs no work buffer.",
        py::arg("countA"), py::arg("countB"));

    BindMultiply<float>(m);
    BindMultiply<double>(m);
    BindMultiply<cf>(m);
    BindMultiply<cd>(m);
}

}  // namespace kpy
