// Element-wise functions, reductions and statistics, thresholds and ramps.

#include "Bind.h"

namespace kpy {

namespace ku = kestaccel::utility;

void BindFunctions(py::module_& m)
{
    // -- Element-wise functions: float32 and float64 unless said otherwise.
    const char* fp = " float32 and float64; a float32 member calls the single-precision runtime function.";
    static const std::string sqr = std::string("Sqr(src, dst=None): x * x.") + fp;
    static const std::string sqrt =
        std::string("Sqrt(src, dst=None): the correctly rounded root; -0 gives -0, a negative element NaN.") + fp;
    static const std::string exp = std::string("Exp(src, dst=None): expf / exp.") + fp;
    static const std::string ln =
        std::string("Ln(src, dst=None): logf / log. Ln_Prec11, Ln_Prec21 and Ln_Prec24 (float32) are Ln.") + fp;
    static const std::string pow =
        std::string("Pow(a, b, dst=None): powf / pow with a[i] the BASE and b[i] the exponent (unlike Sub and "
                    "Div). Pow_Prec26 (float64) is Pow.") + fp;
    static const std::string inv =
        std::string("Inverse(src, dst=None): 1 / x by true division. Inverse_Prec26 (float64) is Inverse.") + fp;
    static const std::string abs =
        std::string("Abs(src, dst=None): -x where 0 > x, else x unchanged, so -0 and a negative NaN keep their "
                    "sign bit. Abs_InPlace clears the sign bit instead.") + fp;
    static const std::string round = std::string("Round(src, dst=None): nearest, ties away from zero.") + fp;
    static const std::string flip =
        std::string("Flip(src, dst=None): dst[i] = src[n - 1 - i], a forward copy: with dst the same array as "
                    "src it is not a reversal (use Flip_InPlace, which swaps pairs inward).") + fp;
    static const std::string absIn =
        std::string("Abs_InPlace(srcDst): clears the sign bit of every element: -0 gives +0, a negative NaN a "
                    "positive one (unlike Abs).") + fp;
    static const std::string inPlace = std::string("The in-place form of the function of the same stem.") + fp;
    static const std::string invThr =
        "Invert_Threshold_InPlace(srcDst, threshold): each element becomes its inverse, limited in size to "
        "1 / threshold; nothing happens when 0 >= threshold. With eps the machine epsilon: real, threshold "
        "<= eps: x <= eps gives +inf, else 1 / x; real, otherwise: |x| >= threshold gives 1 / x, a smaller "
        "x gives 1 / threshold when x > 0 or |x| <= eps, else -1 / threshold; complex, p = im*im + re*re: "
        "p <= eps gives (1 / threshold, +0), threshold**2 > p gives (re / m, -im / m) with m = sqrt(p) * "
        "threshold, otherwise (re / p, -im / p). float32, float64, complex64, complex128 (a real threshold).";
    Each<float, double>([&](auto t) {
        using T = decltype(t);
        Unary<T, T>(m, "Sqr", ku::Sqr, sqr.c_str());
        Unary<T, T>(m, "Sqrt", ku::Sqrt, sqrt.c_str());
        Unary<T, T>(m, "Exp", ku::Exp, exp.c_str());
        Unary<T, T>(m, "Ln", ku::Ln, ln.c_str());
        Unary<T, T>(m, "Inverse", ku::Inverse, inv.c_str());
        Unary<T, T>(m, "Abs", ku::Abs, abs.c_str());
        Unary<T, T>(m, "Round", ku::Round, round.c_str());
        Unary<T, T>(m, "Flip", ku::Flip, flip.c_str());
        Binary<T, T, T>(m, "Pow", ku::Pow, pow.c_str());
        InPlace<T>(m, "Sqr_InPlace", ku::Sqr_InPlace, inPlace.c_str());
        InPlace<T>(m, "Sqrt_InPlace", ku::Sqrt_InPlace, inPlace.c_str());
        InPlace<T>(m, "Exp_InPlace", ku::Exp_InPlace, inPlace.c_str());
        InPlace<T>(m, "Abs_InPlace", ku::Abs_InPlace, absIn.c_str());
        InPlace<T>(m, "Flip_InPlace", ku::Flip_InPlace, inPlace.c_str());
        Binary<T, T, T>(m, "Magnitude", ku::Magnitude,
                        "Magnitude(re, im, dst=None): hypot of (re[i], im[i]), with no overflow between.\n"
                        "Magnitude(src, dst=None): the same on the parts of complex elements (complex64 -> "
                        "float32, complex128 -> float64).",
                        "re", "im");
        using C = std::complex<T>;
        Unary<C, T>(m, "Magnitude", ku::Magnitude, "");
        Unary<C, T>(m, "PowerSpectr", ku::PowerSpectr,
                    "PowerSpectr(src, dst=None): re * re + im * im in the element's type (complex64 -> float32, "
                    "complex128 -> float64).");
        Scalars<T, T, T>(m, "Normalize", ku::Normalize,
                         "Normalize(src, offset, divisor, dst=None): (src[i] - offset) / divisor; no zero test.",
                         {"offset", "divisor"});
    });
    InPlace<float>(m, "Ln_InPlace", ku::Ln_InPlace, "Ln_InPlace(srcDst): logf in place; float32 only.");
    Unary<float, float>(m, "Ln_Prec11", ku::Ln_Prec11, "Ln_Prec11(src, dst=None): Ln; float32 only.");
    Unary<float, float>(m, "Ln_Prec21", ku::Ln_Prec21, "Ln_Prec21(src, dst=None): Ln; float32 only.");
    Unary<float, float>(m, "Ln_Prec24", ku::Ln_Prec24, "Ln_Prec24(src, dst=None): Ln; float32 only.");
    Binary<double, double, double>(m, "Pow_Prec26", ku::Pow_Prec26, "Pow_Prec26(a, b, dst=None): Pow; float64 only.");
    Unary<double, double>(m, "Inverse_Prec26", ku::Inverse_Prec26,
                          "Inverse_Prec26(src, dst=None): Inverse; float64 only.");
    Each<float, double, cf, cd>([&](auto t) {
        using T = decltype(t);
        if constexpr (std::is_floating_point_v<T>) {
            ScalarsInPlace<T, T>(m, "Invert_Threshold_InPlace", ku::Invert_Threshold_InPlace, invThr.c_str(),
                                 {"threshold"});
        } else {
            ScalarsInPlace<T, typename T::value_type>(m, "Invert_Threshold_InPlace", ku::Invert_Threshold_InPlace,
                                                      invThr.c_str(), {"threshold"});
        }
    });
    m.def(
        "CartToPolar",
        [](In<float> src) {
            Require(src.size() % 2 == 0, "src holds (re, im) pairs: its length must be even");
            const unsigned n = Count(src.size() / 2);
            py::array mag = Vector(py::dtype::of<float>(), n), phase = Vector(py::dtype::of<float>(), n);
            Released r(n);
            ku::CartToPolar(n, src.data(), Ptr<float>(mag), Ptr<float>(phase));
            return py::make_tuple(mag, phase);
        },
        "CartToPolar(src) -> (magnitude, phase): src holds (re, im) pairs of float32; magnitude[i] = "
        "sqrtf(re*re + im*im), which overflows above about 1.8e19, phase[i] = atan2f(im, re).",
        py::arg("src"));
    Binary<float, float, float>(m, "PolarToCart", ku::PolarToCart,
                                "PolarToCart(magnitude, phase, dst=None): dst[2i] = cosf(phase[i]) * magnitude[i], "
                                "dst[2i + 1] = sinf(phase[i]) * magnitude[i]; float32 only.",
                                "magnitude", "phase", 2);

    // -- Reductions and statistics.
    static const std::string sum =
        "Sum(src), Mean(src), NormL1(src), NormL2(src): float32 and float64. Sums run strictly in ascending "
        "index order from +0 in one accumulator of the element's type (no pairing, no compensation), so "
        "Sum([1e8, 1, -1e8]) of float32 is 0. Mean is Sum / n. NormL2 of float32 rounds each square to float "
        "and sums in double, then rounds the root once. An empty array gives 0.";
    static const std::string maxDoc =
        "Max(src), Min(src): the first of equal elements; a NaN at element 0 stays the result. The C++ call "
        "reads src[0] even for an empty array, so an empty array raises ValueError.";
    Each<float, double>([&](auto t) {
        using T = decltype(t);
        Reduce<T, T>(m, "Sum", ku::Sum, sum.c_str());
        Reduce<T, T>(m, "Mean", ku::Mean, sum.c_str());
        Reduce<T, T>(m, "NormL1", ku::NormL1, sum.c_str());
        Reduce<T, T>(m, "NormL2", ku::NormL2, sum.c_str());
        Reduce<T, T>(m, "Max", ku::Max, maxDoc.c_str(), true);
        Reduce<T, T>(m, "Min", ku::Min, maxDoc.c_str(), true);
        m.def(
            "StandardDeviation",
            [](In<T> src) -> py::object {
                const unsigned n = Count(src.size());
                if (n < 2) return py::none();
                T result;
                ku::StandardDeviation(n, src.data(), result);
                return py::cast(result);
            },
            Once("StandardDeviation",
                 "StandardDeviation(src): the sample deviation in two passes (mean, then squared deviations), "
                 "divided by n - 1. None for fewer than two elements, where the C++ call leaves its result "
                 "unwritten."),
            py::arg("src"));
        m.def(
            "DotProduct",
            [](In<T> a, In<T> b) {
                Require(a.size() == b.size(), "the two arrays must have the same number of elements");
                const unsigned n = Count(a.size());
                Released r(n);
                return ku::DotProduct(n, a.data(), b.data());
            },
            Once("DotProduct",
                 "DotProduct(a, b): a[0]*b[0] + a[1]*b[1] + ..., each product rounded to the element type, "
                 "summed from +0 in ascending order in that type (no widening, no fused multiply-add)."),
            py::arg("a"), py::arg("b"));
    });
    // The scans below exist for float32 only.
    const char* indexDoc = "MaxIndex(src) -> (index, value), MinIndex(src) -> (index, value): the first of equal "
                           "elements wins; float32 only. An empty array raises ValueError.";
    auto index = [](unsigned (*fn)(unsigned, const float*, float*)) {
        return [fn](In<float> src) {
            Require(src.size() > 0, "the array is empty, and the C++ call reads its first element");
            float value;
            const unsigned i = fn(Count(src.size()), src.data(), &value);
            return py::make_tuple(i, value);
        };
    };
    m.def("MaxIndex", index(ku::MaxIndex), indexDoc, py::arg("src"));
    m.def("MinIndex", index(ku::MinIndex), indexDoc, py::arg("src"));
    const char* minMaxDoc =
        "MinMax(src) -> (minimum, maximum): one paired scan; the minimum is the first of the smallest "
        "elements, the maximum the LAST of the largest.\n"
        "MinMax(src, count): the C++ MinMax(src, count), pointer first and count second: the peak magnitude "
        "of the first count elements, the larger of -minimum and maximum; 0 for count 0.\n"
        "float32 only. MinMax(src) of an empty array raises ValueError (the C++ call reads src[0]).";
    m.def(
        "MinMax",
        [](In<float> src) {
            Require(src.size() > 0, "the array is empty, and the C++ call reads its first element");
            float lo, hi;
            ku::MinMax(Count(src.size()), src.data(), lo, hi);
            return py::make_tuple(lo, hi);
        },
        minMaxDoc, py::arg("src"));
    m.def(
        "MinMax",
        [](In<float> src, unsigned count) {
            Require(count <= src.size(), "count is larger than the array");
            return ku::MinMax(src.data(), count);
        },
        "", py::arg("src"), py::arg("count"));
    m.def(
        "MinMaxIndex",
        [](In<float> src) {
            Require(src.size() > 0, "the array is empty, and the C++ call reads its first element");
            float lo, hi;
            unsigned loIndex, hiIndex;
            ku::MinMaxIndex(Count(src.size()), src.data(), lo, hi, loIndex, hiIndex);
            return py::make_tuple(lo, hi, loIndex, hiIndex);
        },
        "MinMaxIndex(src) -> (minimum, maximum, minimumIndex, maximumIndex): one paired scan; the minimum is "
        "the first of the smallest, the maximum the LAST of the largest (MaxIndex of [1, 3, 3, 2] is 1, "
        "MinMaxIndex's maximum index is 2). float32 only.",
        py::arg("src"));
    const char* every = "MaxEvery(a, b, dst=None): b[i] if b[i] > a[i], else a[i]; MinEvery: b[i] if a[i] > b[i], "
                        "else a[i]. The selected element is copied bit for bit; on equal values, +0 against -0 "
                        "or a NaN the first array's element is taken. The _InPlace forms take (src, srcDst) "
                        "with srcDst as the second operand. float32 only.";
    Binary<float, float, float>(m, "MaxEvery", ku::MaxEvery, every);
    Binary<float, float, float>(m, "MinEvery", ku::MinEvery, every);
    Update<float>(m, "MaxEvery_InPlace", ku::MaxEvery_InPlace, every);
    Update<float>(m, "MinEvery_InPlace", ku::MinEvery_InPlace, every);

    // -- Thresholds, trimming and ramps.
    static const std::string thr =
        "Each element is tested once, strictly; when the test is false (equal to the level, +0 against -0, a "
        "NaN element or level) the element stands with its own bits. float32 and float64.\n"
        "Threshold_LT_InPlace(srcDst, level): level if level > x, else x.\n"
        "Threshold_GT_InPlace(srcDst, level): level if level < x, else x.\n"
        "Threshold_LTVal(src, level, value, dst=None): value if level > x, else x.\n"
        "Threshold_GTVal(src, level, value, dst=None): value if x > level, else x.\n"
        "Threshold_LTVal_InPlace(srcDst, level, value), Threshold_GTVal_InPlace(srcDst, level, value): in place.";
    Each<float, double>([&](auto t) {
        using T = decltype(t);
        ScalarsInPlace<T, T>(m, "Threshold_LT_InPlace", ku::Threshold_LT_InPlace, thr.c_str(), {"level"});
        ScalarsInPlace<T, T>(m, "Threshold_GT_InPlace", ku::Threshold_GT_InPlace, thr.c_str(), {"level"});
        Scalars<T, T, T>(m, "Threshold_LTVal", ku::Threshold_LTVal, thr.c_str(), {"level", "value"});
        Scalars<T, T, T>(m, "Threshold_GTVal", ku::Threshold_GTVal, thr.c_str(), {"level", "value"});
        ScalarsInPlace<T, T, T>(m, "Threshold_LTVal_InPlace", ku::Threshold_LTVal_InPlace, thr.c_str(),
                                {"level", "value"});
        ScalarsInPlace<T, T, T>(m, "Threshold_GTVal_InPlace", ku::Threshold_GTVal_InPlace, thr.c_str(),
                                {"level", "value"});
        ScalarsInPlace<T, T, T>(m, "VectorSlope", ku::VectorSlope,
                                "VectorSlope(dst, offset, slope): dst[i] = T(i) * slope + offset, from the index at "
                                "each element (no drift); the product and the sum round separately. Fills and "
                                "returns dst.",
                                {"offset", "slope"}, "dst");
    });
    ScalarsInPlace<float, float, float>(
        m, "Trim", ku::Trim,
        "Trim(srcDst, low, high): low if low > x; else high if high < x; else x. The low test comes first and "
        "wins, so with low > high every other element becomes high. A NaN low or high disables that side. "
        "float32 only.",
        {"low", "high"});
}

}  // namespace kpy
