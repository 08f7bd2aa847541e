// Real and complex element-wise arithmetic.

#include "Bind.h"

namespace kpy {

namespace ku = kestaccel::utility;

namespace {

const char* const kFamily =
    "\n\nElement-wise over float32, float64, complex64 and complex128 arrays (all four arrays of one type), "
    "the plain scalar loop in ascending index order, also when buffers overlap; each product and sum is "
    "rounded on its own (no fused multiply-add). Complex products are the plain formula on the components "
    "(xr*yr - xi*yi, xr*yi + xi*yr); complex quotients are Smith's scaled division, and a zero or NaN "
    "denominator gives (NaN, NaN), never an infinity.";

std::string Doc(const char* line) { return line + std::string(kFamily); }

}  // namespace

void BindArithmetic(py::module_& m)
{
    // Kept alive for the module's lifetime: pybind11 keeps the pointers.
    static const std::string add = Doc("Add(a, b, dst=None): dst[i] = a[i] + b[i].");
    static const std::string sub =
        Doc("Sub(a, b, dst=None): dst[i] = b[i] - a[i]. Mind the order: the SECOND minus the first.");
    static const std::string mul = Doc("Mul(a, b, dst=None): dst[i] = a[i] * b[i].");
    static const std::string div =
        Doc("Div(a, b, dst=None): dst[i] = b[i] / a[i]. Mind the order: the SECOND over the first. A true "
            "division per element; a zero element of a divides by zero (IEEE) for its own index only.");
    static const std::string addIn = Doc("Add_InPlace(src, srcDst): srcDst[i] = src[i] + srcDst[i].");
    static const std::string subIn = Doc("Sub_InPlace(src, srcDst): srcDst[i] = srcDst[i] - src[i].");
    static const std::string mulIn = Doc("Mul_InPlace(src, srcDst): srcDst[i] = src[i] * srcDst[i].");
    static const std::string divIn = Doc("Div_InPlace(src, srcDst): srcDst[i] = srcDst[i] / src[i].");
    static const std::string addC = Doc("AddConstant(src, constant, dst=None): dst[i] = constant + src[i].");
    static const std::string subC = Doc("SubConstant(src, constant, dst=None): dst[i] = src[i] - constant.");
    static const std::string subCR = Doc("SubConstantRev(src, constant, dst=None): dst[i] = constant - src[i].");
    static const std::string mulC = Doc("MulConstant(src, constant, dst=None): dst[i] = src[i] * constant.");
    static const std::string divC =
        Doc("DivConstant(src, constant, dst=None): dst[i] = src[i] / constant. A constant equal to zero "
            "(both parts, for complex) makes the call write nothing at all: a new dst stays zero.");
    static const std::string addCIn = Doc("AddConstant_InPlace(srcDst, constant): srcDst[i] += constant.");
    static const std::string subCIn = Doc("SubConstant_InPlace(srcDst, constant): srcDst[i] -= constant.");
    static const std::string subCRIn =
        Doc("SubConstantRev_InPlace(srcDst, constant): srcDst[i] = constant - srcDst[i].");
    static const std::string mulCIn =
        Doc("MulConstant_InPlace(srcDst, constant): srcDst[i] = srcDst[i] * constant.\n"
            "MulConstant_InPlace(srcDst, constant, scale) on int16: the 32-bit product is wrapped to 16 "
            "bits, scaled by 2**-scale in double, narrowed to float and rounded (ties to even for positive "
            "values, toward zero for negative ones); the low 16 bits are stored, nothing saturates.");
    static const std::string divCIn =
        Doc("DivConstant_InPlace(srcDst, constant): srcDst[i] /= constant; a zero constant changes nothing.");
    static const std::string addP =
        Doc("AddProduct(a, b, srcDst): srcDst[i] = (a[i] * b[i]) + srcDst[i], the product rounded, then the sum.");

    Each<float, double, cf, cd>([&](auto t) {
        using T = decltype(t);
        Binary<T, T, T>(m, "Add", ku::Add, add.c_str());
        Binary<T, T, T>(m, "Sub", ku::Sub, sub.c_str());
        Binary<T, T, T>(m, "Mul", ku::Mul, mul.c_str());
        Binary<T, T, T>(m, "Div", ku::Div, div.c_str());
        Update<T>(m, "Add_InPlace", ku::Add_InPlace, addIn.c_str());
        Update<T>(m, "Sub_InPlace", ku::Sub_InPlace, subIn.c_str());
        Update<T>(m, "Mul_InPlace", ku::Mul_InPlace, mulIn.c_str());
        Update<T>(m, "Div_InPlace", ku::Div_InPlace, divIn.c_str());
        const std::vector<const char*> c{"constant"};
        Scalars<T, T>(m, "AddConstant", +[](unsigned n, const T* s, T* d, T k) { ku::AddConstant(n, s, k, d); },
                      addC.c_str(), c);
        Scalars<T, T>(m, "SubConstant", +[](unsigned n, const T* s, T* d, T k) { ku::SubConstant(n, s, k, d); },
                      subC.c_str(), c);
        Scalars<T, T>(m, "SubConstantRev",
                      +[](unsigned n, const T* s, T* d, T k) { ku::SubConstantRev(n, s, k, d); }, subCR.c_str(), c);
        Scalars<T, T>(m, "MulConstant", ku::MulConstant, mulC.c_str(), c);
        Scalars<T, T>(m, "DivConstant", ku::DivConstant, divC.c_str(), c, true);
        ScalarsInPlace<T, T>(m, "AddConstant_InPlace", ku::AddConstant_InPlace, addCIn.c_str(), c);
        ScalarsInPlace<T, T>(m, "SubConstant_InPlace", ku::SubConstant_InPlace, subCIn.c_str(), c);
        ScalarsInPlace<T, T>(m, "SubConstantRev_InPlace", ku::SubConstantRev_InPlace, subCRIn.c_str(), c);
        ScalarsInPlace<T, T>(m, "MulConstant_InPlace", ku::MulConstant_InPlace, mulCIn.c_str(), c);
        ScalarsInPlace<T, T>(m, "DivConstant_InPlace", ku::DivConstant_InPlace, divCIn.c_str(), c);
        m.def(
            "AddProduct",
            [](In<T> a, In<T> b, InOut<T> sd) {
                Require(a.size() == b.size() && b.size() == sd.size(),
                        "a, b and srcDst must have the same number of elements");
                const unsigned n = Count(sd.size());
                Released r(n);
                ku::AddProduct(n, a.data(), b.data(), sd.data());
                return sd.a;
            },
            Once("AddProduct", addP.c_str()), py::arg("a"), py::arg("b"), py::arg("srcDst"));
    });

    // The real-only members. There is no complex AddConstantProduct, no
    // complex or float64 DivConstantRev.
    Each<float, double>([&](auto t) {
        using T = decltype(t);
        m.def(
            "AddConstantProduct",
            [](In<T> src, InOut<T> sd, T c) {
                Require(src.size() == sd.size(), "src and srcDst must have the same number of elements");
                const unsigned n = Count(sd.size());
                Released r(n);
                ku::AddConstantProduct(n, src.data(), sd.data(), c);
                return sd.a;
            },
            Once("AddConstantProduct",
                 "AddConstantProduct(src, srcDst, constant): srcDst[i] = (src[i] * constant) + srcDst[i], "
                 "the product rounded, then the sum. float32 and float64 only."),
            py::arg("src"), py::arg("srcDst"), py::arg("constant"));
    });
    m.def(
        "DivConstantRev",
        [](float c, In<float> src, Out<float> dst) {
            const unsigned n = Count(src.size());
            py::array d = Output(dst, ShapeOf(src.a), true);
            Released r(n);
            ku::DivConstantRev(n, c, src.data(), Ptr<float>(d));
            return d;
        },
        "DivConstantRev(constant, src, dst=None): dst[i] = constant / src[i], float32 only (the C++ order: "
        "the constant first). A constant equal to zero makes the call write nothing: a new dst stays zero.",
        py::arg("constant"), py::arg("src"), py::arg("dst") = py::none());
    m.def(
        "MulConstant_InPlace",
        [](InOut<short> sd, short c, int scale) {
            const unsigned n = Count(sd.size());
            Released r(n);
            ku::MulConstant_InPlace(n, sd.data(), c, scale);
            return sd.a;
        },
        "", py::arg("srcDst"), py::arg("constant"), py::arg("scale"));
}

}  // namespace kpy
