// The module kestaccel._kestaccel: the checks shared by every binding, the
// constants of the interface, and the registration of each family.

#include <cstring>
#include <set>

#include "Bind.h"

namespace kpy {

bool LoadArray(py::handle src, bool convert, bool writable, bool (*matches)(const py::array&), py::array& out)
{
    py::array a;
    if (py::isinstance<py::array>(src)) {
        a = py::reinterpret_borrow<py::array>(src);
    } else if (convert && !writable && !src.is_none()) {
        a = py::array::ensure(src);
        if (!a) return false;
    } else {
        return false;
    }
    if (!matches(a) || a.ndim() == 0) return false;
    const bool contiguous = (a.flags() & py::array::c_style) != 0;
    if (writable) {
        // The type matched: say what else is wrong rather than fall through
        // to pybind11's "incompatible function arguments".
        if (!contiguous || !a.writeable()) {
            Fail("an array written in place must be C-contiguous and writable; this " +
                 a.dtype().attr("name").cast<std::string>() + " array is " +
                 (contiguous ? "read-only" : "not contiguous"));
        }
    } else if (!contiguous) {
        a = py::array::ensure(a, py::array::c_style);  // a contiguous copy
    }
    out = a;
    return true;
}

unsigned Count(std::size_t n, const char* what)
{
    if (n > 0xFFFFFFFFu) {
        Fail(std::string(what) + " of " + std::to_string(n) +
             " elements is too long: the C++ counts are 32-bit (at most 4294967295)");
    }
    return unsigned(n);
}

void Fail(const std::string& message) { throw py::value_error(message); }

void Apart(const void* a, std::size_t aBytes, const void* b, std::size_t bBytes, const char* message)
{
    const auto pa = reinterpret_cast<std::uintptr_t>(a), pb = reinterpret_cast<std::uintptr_t>(b);
    Require(aBytes == 0 || bBytes == 0 || pa + aBytes <= pb || pb + bBytes <= pa, message);
}

std::vector<py::ssize_t> ShapeOf(const py::array& a) { return {a.shape(), a.shape() + a.ndim()}; }

py::array MakeOutput(std::optional<py::array>& given, const py::dtype& dtype, std::vector<py::ssize_t> shape,
                     bool zero)
{
    py::ssize_t size = 1;
    for (py::ssize_t s : shape) size *= s;
    if (given) {
        if (given->size() != size) {
            Fail("dst has " + std::to_string(given->size()) + " elements, " + std::to_string(size) + " are needed");
        }
        return *given;
    }
    py::array a(dtype, shape);
    if (zero) std::memset(a.mutable_data(), 0, std::size_t(size) * std::size_t(dtype.itemsize()));
    return a;
}

const char* Once(const char* name, const char* doc)
{
    static std::set<std::string> seen;
    return seen.insert(name).second ? doc : "";
}

}  // namespace kpy

namespace ku = kestaccel::utility;

PYBIND11_MODULE(_kestaccel, m)
{
    using namespace kpy;
    m.doc() = "The kestaccel library, bound for numpy arrays.";

    m.attr("int24") = Int24DType();
    m.attr("RowMajor") = int(kestaccel::RowMajor);
    m.attr("ColMajor") = int(kestaccel::ColMajor);
    m.attr("kDSPWindowBartlett") = int(ku::kDSPWindowBartlett);
    m.attr("kDSPWindowHamming") = int(ku::kDSPWindowHamming);
    m.attr("kDSPWindowHann") = int(ku::kDSPWindowHann);

    // Placeholders: every Get answers False and every Set does nothing.
    const char* modeDoc =
        "Floating-point mode control, a placeholder: every Get answers False and every Set does nothing. "
        "The library never reads or changes the processor's floating-point state.";
    m.def("GetDenormalsAreZero", &ku::GetDenormalsAreZero, modeDoc);
    m.def("SetDenormalsAreZero", &ku::SetDenormalsAreZero, modeDoc, py::arg("enable"));
    m.def("GetFlushDenormalsToZero", &ku::GetFlushDenormalsToZero, modeDoc);
    m.def("SetFlushDenormalsToZero", &ku::SetFlushDenormalsToZero, modeDoc, py::arg("enable"));
    m.def("GetDenormalExceptionsEnabled", &ku::GetDenormalExceptionsEnabled, modeDoc);
    m.def("SetDenormalExceptionsEnabled", &ku::SetDenormalExceptionsEnabled, modeDoc, py::arg("enable"));

    BindArithmetic(m);
    BindFunctions(m);
    BindFormats(m);
    BindSignal(m);
    BindTransforms(m);
    BindFilters(m);
}
