#pragma once

// Shared pieces of the Python bindings.
//
// The C++ interface checks almost nothing by contract, so everything Python
// passes is checked here before a call: array arguments must already have
// the element type of a C++ overload (never converted: a float64 array does
// not silently become float32), counts must fit the 32-bit counts, lengths
// must agree. A failed check raises TypeError or ValueError.
//
// Python signatures keep the C++ order of the inputs and drop the counts,
// which come from the arrays; a destination moves to a trailing optional
// `dst` argument (a new array when omitted) and is returned.

#include <pybind11/complex.h>
#include <pybind11/numpy.h>
#include <pybind11/pybind11.h>
#include <pybind11/stl.h>

#include <complex>
#include <cstdint>
#include <optional>
#include <string>
#include <type_traits>
#include <vector>

#include <kestaccel/kestaccel.h>

namespace kpy {

namespace py = pybind11;
using cf = std::complex<float>;
using cd = std::complex<double>;
using int24 = kestcore::utility::int24_t;

// numpy's name for each element type of the interface.
template <class T>
struct DT;
#define KPY_DTYPE(T, N)                                                  \
    template <>                                                          \
    struct DT<T> {                                                       \
        static constexpr auto descr = py::detail::const_name("ndarray[" N "]"); \
        static constexpr const char* name = N;                           \
    };
KPY_DTYPE(float, "float32")
KPY_DTYPE(double, "float64")
KPY_DTYPE(cf, "complex64")
KPY_DTYPE(cd, "complex128")
KPY_DTYPE(unsigned char, "uint8")
KPY_DTYPE(signed char, "int8")
KPY_DTYPE(short, "int16")
KPY_DTYPE(unsigned short, "uint16")
KPY_DTYPE(int, "int32")
KPY_DTYPE(unsigned int, "uint32")
KPY_DTYPE(unsigned long long, "uint64")
KPY_DTYPE(int24, "int24")
#undef KPY_DTYPE

// Packed 24-bit samples are any 3-byte void dtype: kestaccel.int24, a
// structured dtype of three bytes, or raw bytes viewed as either.
inline py::dtype Int24DType() { return py::dtype("V3"); }

template <class T>
py::dtype DTypeOf()
{
    if constexpr (std::is_same_v<T, int24>) {
        return Int24DType();
    } else {
        return py::dtype::of<T>();
    }
}

template <class T>
bool Matches(const py::array& a)
{
    if constexpr (std::is_same_v<T, int24>) {
        return a.dtype().kind() == 'V' && a.itemsize() == 3;
    } else {
        return py::isinstance<py::array_t<T>>(a);
    }
}

// Loads an array argument whose dtype passes `matches`. Other objects
// (lists) are converted in pybind11's second pass, by numpy's own rules,
// and must then match too. Read-only arguments that are not C-contiguous
// are copied; arguments written in place must be C-contiguous and writable.
bool LoadArray(py::handle src, bool convert, bool writable, bool (*matches)(const py::array&), py::array& out);

template <class T>
struct Arr {
    py::array a;
    T* data() const { return reinterpret_cast<T*>(py::detail::array_proxy(a.ptr())->data); }
    std::size_t size() const { return std::size_t(a.size()); }
};
template <class T>
struct In : Arr<T> {};     // read only
template <class T>
struct InOut : Arr<T> {};  // written in place
template <class T>
struct Out {               // an optional destination
    std::optional<InOut<T>> given;
};

// The C++ counts are unsigned 32-bit numbers.
unsigned Count(std::size_t n, const char* what = "an array");
// ValueError. Messages with computed parts are built only on failure.
[[noreturn]] void Fail(const std::string& message);
inline void Require(bool condition, const char* message)
{
    if (!condition) Fail(message);
}
// ValueError unless the byte ranges of two buffers are apart.
void Apart(const void* a, std::size_t aBytes, const void* b, std::size_t bBytes, const char* message);

// The destination: the caller's array (of exactly `size` elements) or a new
// one of `shape`. A new array is zero-filled where the call may leave
// elements unwritten, so that Python never sees uninitialised memory.
py::array MakeOutput(std::optional<py::array>& given, const py::dtype& dtype, std::vector<py::ssize_t> shape,
                     bool zero);
template <class T>
py::array Output(Out<T>& dst, std::vector<py::ssize_t> shape, bool zero = false)
{
    std::optional<py::array> a;
    if (dst.given) a = dst.given->a;
    return MakeOutput(a, DTypeOf<T>(), std::move(shape), zero);
}
std::vector<py::ssize_t> ShapeOf(const py::array& a);
// A new 1-D array of n elements.
inline py::array Vector(const py::dtype& dtype, std::size_t n)
{
    return py::array(dtype, std::vector<py::ssize_t>{py::ssize_t(n)});
}

template <class T>
T* Ptr(const py::array& a)
{
    return reinterpret_cast<T*>(py::detail::array_proxy(a.ptr())->data);
}

// Long calls let other Python threads run.
struct Released {
    std::optional<py::gil_scoped_release> release;
    explicit Released(std::size_t work)
    {
        if (work >= 4096) release.emplace();
    }
};

// Overloads share one docstring: the first registration of a name takes
// it, the later ones pass "" so that pybind11 does not repeat it.
const char* Once(const char* name, const char* doc);

template <class... Ts, class F>
void Each(F&& f)
{
    (f(Ts{}), ...);
}

// ---------------------------------------------------------------------------
// Shapes shared by many functions. `fn` has the canonical argument order of
// its shape; a C++ function with another order is passed as a captureless
// lambda that reorders.
// ---------------------------------------------------------------------------

// f(src) -> dst, elementwise.
template <class S, class D>
void Unary(py::module_& m, const char* name, void (*fn)(unsigned, const S*, D*), const char* doc, bool zero = false)
{
    m.def(
        name,
        [fn, zero](In<S> src, Out<D> dst) {
            const unsigned n = Count(src.size());
            py::array d = Output(dst, ShapeOf(src.a), zero);
            Released r(n);
            fn(n, src.data(), Ptr<D>(d));
            return d;
        },
        Once(name, doc), py::arg("src"), py::arg("dst") = py::none());
}

// f(srcDst), in place.
template <class T>
void InPlace(py::module_& m, const char* name, void (*fn)(unsigned, T*), const char* doc, const char* arg = "srcDst")
{
    m.def(
        name,
        [fn](InOut<T> sd) {
            const unsigned n = Count(sd.size());
            Released r(n);
            fn(n, sd.data());
            return sd.a;
        },
        Once(name, doc), py::arg(arg));
}

// f(a, b) -> dst, with `widen` destination elements per element of a.
template <class A, class B, class D>
void Binary(py::module_& m, const char* name, void (*fn)(unsigned, const A*, const B*, D*), const char* doc,
            const char* an = "a", const char* bn = "b", int widen = 1)
{
    m.def(
        name,
        [fn, widen](In<A> a, In<B> b, Out<D> dst) {
            Require(a.size() == b.size(), "the two arrays must have the same number of elements");
            const unsigned n = Count(std::size_t(widen) * a.size()) / widen;
            py::array d = Output(dst, widen == 1 ? ShapeOf(a.a) : std::vector<py::ssize_t>{py::ssize_t(widen) * n});
            Released r(n);
            fn(n, a.data(), b.data(), Ptr<D>(d));
            return d;
        },
        Once(name, doc), py::arg(an), py::arg(bn), py::arg("dst") = py::none());
}

// f(src, srcDst): srcDst updated in place from a second array.
template <class T>
void Update(py::module_& m, const char* name, void (*fn)(unsigned, const T*, T*), const char* doc)
{
    m.def(
        name,
        [fn](In<T> src, InOut<T> sd) {
            Require(src.size() == sd.size(), "src and srcDst must have the same number of elements");
            const unsigned n = Count(sd.size());
            Released r(n);
            fn(n, src.data(), sd.data());
            return sd.a;
        },
        Once(name, doc), py::arg("src"), py::arg("srcDst"));
}

// f(src, c...) -> dst, with one or two scalars.
template <class T, class C, class... Cs>
void Scalars(py::module_& m, const char* name, void (*fn)(unsigned, const T*, T*, C, Cs...), const char* doc,
             std::vector<const char*> names, bool zero = false)
{
    auto f = [fn, zero](In<T> src, C c, Cs... cs, Out<T> dst) {
        const unsigned n = Count(src.size());
        py::array d = Output(dst, ShapeOf(src.a), zero);
        Released r(n);
        fn(n, src.data(), Ptr<T>(d), c, cs...);
        return d;
    };
    if constexpr (sizeof...(Cs) == 0) {
        m.def(name, f, Once(name, doc), py::arg("src"), py::arg(names[0]), py::arg("dst") = py::none());
    } else {
        m.def(name, f, Once(name, doc), py::arg("src"), py::arg(names[0]), py::arg(names[1]),
              py::arg("dst") = py::none());
    }
}

// f(srcDst, c...), in place, with one or two scalars.
template <class T, class C, class... Cs>
void ScalarsInPlace(py::module_& m, const char* name, void (*fn)(unsigned, T*, C, Cs...), const char* doc,
                    std::vector<const char*> names, const char* arg = "srcDst")
{
    auto f = [fn](InOut<T> sd, C c, Cs... cs) {
        const unsigned n = Count(sd.size());
        Released r(n);
        fn(n, sd.data(), c, cs...);
        return sd.a;
    };
    if constexpr (sizeof...(Cs) == 0) {
        m.def(name, f, Once(name, doc), py::arg(arg), py::arg(names[0]));
    } else {
        m.def(name, f, Once(name, doc), py::arg(arg), py::arg(names[0]), py::arg(names[1]));
    }
}

// f(src) -> scalar. `first` marks the functions that read src[0] even for
// an empty array: they need one element.
template <class T, class R>
void Reduce(py::module_& m, const char* name, R (*fn)(unsigned, const T*), const char* doc, bool first = false)
{
    m.def(
        name,
        [fn, first](In<T> src) {
            Require(!first || src.size() > 0, "the array is empty, and the C++ call reads its first element");
            const unsigned n = Count(src.size());
            Released r(n);
            return fn(n, src.data());
        },
        Once(name, doc), py::arg("src"));
}

// ---------------------------------------------------------------------------
// Owners of the C++ state records. A Python object owns one record and
// frees it with the record's Free call when it is closed, leaves a `with`
// block or is collected. A closed state raises ValueError instead of
// reaching freed memory, and a state serves one call at a time: a call
// from another thread while one runs without the GIL raises ValueError
// rather than racing on the record.
// ---------------------------------------------------------------------------
template <class S>
struct Owner {
    S* state = nullptr;
    const char* name = "";
    void (*free)(S*) = nullptr;
    bool busy = false;

    Owner() = default;
    Owner(const Owner&) = delete;
    Owner& operator=(const Owner&) = delete;
    ~Owner() { Release(); }

    void Release()
    {
        if (state) free(state);
        state = nullptr;
    }
    void Close()
    {
        if (busy) Fail(std::string(name) + " is in use by another thread");
        Release();
    }
    // Marks the state busy for the duration of one call.
    struct Use {
        Owner* owner;
        S* state;
        explicit Use(Owner& o) : owner(&o), state(o.state)
        {
            if (!o.state) Fail(std::string(o.name) + " is closed: its Free was called");
            if (o.busy) Fail(std::string(o.name) + " is in use by another thread");
            o.busy = true;
        }
        ~Use() { owner->busy = false; }
        Use(const Use&) = delete;
        Use& operator=(const Use&) = delete;
    };
};

// The Python class of an owner: close(), `closed`, and the context manager.
template <class O>
py::class_<O> OwnerClass(py::module_& m, const char* name, const char* doc)
{
    return py::class_<O>(m, name, doc)
        .def(
            "close", [](O& o) { o.Close(); },
            "Frees the C++ state now, as the C++ Free call does; a closed state raises ValueError when used. "
            "Closing twice is harmless.")
        .def_property_readonly("closed", [](const O& o) { return o.state == nullptr; })
        .def("__enter__", [](py::object self) { return self; }, "Returns the state itself.")
        .def("__exit__", [](O& o, py::args) { o.Close(); }, "Closes the state: its Free call.");
}

// Registration of each module of the bindings.
void BindArithmetic(py::module_& m);
void BindFunctions(py::module_& m);
void BindFormats(py::module_& m);
void BindSignal(py::module_& m);
void BindTransforms(py::module_& m);
void BindFilters(py::module_& m);

}  // namespace kpy

namespace pybind11 {
namespace detail {

template <class T>
struct type_caster<kpy::In<T>> {
    PYBIND11_TYPE_CASTER(kpy::In<T>, kpy::DT<T>::descr);
    bool load(handle src, bool convert) { return kpy::LoadArray(src, convert, false, kpy::Matches<T>, value.a); }
};

template <class T>
struct type_caster<kpy::InOut<T>> {
    PYBIND11_TYPE_CASTER(kpy::InOut<T>, kpy::DT<T>::descr);
    bool load(handle src, bool) { return kpy::LoadArray(src, false, true, kpy::Matches<T>, value.a); }
};

template <class T>
struct type_caster<kpy::Out<T>> {
    PYBIND11_TYPE_CASTER(kpy::Out<T>, const_name("Optional[") + kpy::DT<T>::descr + const_name("]"));
    bool load(handle src, bool)
    {
        if (src.is_none()) return true;
        kpy::InOut<T> a;
        if (!kpy::LoadArray(src, false, true, kpy::Matches<T>, a.a)) return false;
        value.given = a;
        return true;
    }
};

}  // namespace detail
}  // namespace pybind11
