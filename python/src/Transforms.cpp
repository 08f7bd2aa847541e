// The Fourier transform states and FFTImpl.

#include <cmath>
#include <memory>

#include "Bind.h"

namespace kpy {

namespace kt = kestaccel::transform;

namespace {

enum Layout { Real, Interleaved, Deinterleaved };

// Per state type: the element of its arrays, its layout, and the largest
// order whose byte counts stay within the 32 bits of Move and Copy.
template <class S>
struct FFTKind;
#define KPY_FFT(S, E, L, MAX)                              \
    template <>                                            \
    struct FFTKind<kestaccel::S> {                         \
        using T = E;                                       \
        static constexpr Layout layout = L;                \
        static constexpr unsigned maxOrder = MAX;          \
        static constexpr const char* name = #S;            \
    };
KPY_FFT(FFTState_Float, float, Real, 29)
KPY_FFT(FFTState_Double, double, Real, 28)
KPY_FFT(FFTState_Complex_Float_Interleaved, cf, Interleaved, 28)
KPY_FFT(FFTState_Complex_Double_Interleaved, cd, Interleaved, 27)
KPY_FFT(FFTState_Complex_Float_Deinterleaved, float, Deinterleaved, 29)
KPY_FFT(FFTState_Complex_Double_Deinterleaved, double, Deinterleaved, 28)
#undef KPY_FFT

void CheckOrder(unsigned order, unsigned maxOrder, const char* name)
{
    if (order == 0) Fail(std::string(name) + ": order 0 creates no state (the order is log2 of the length)");
    if (order % 32 > maxOrder) {
        Fail(std::string(name) + ": order " + std::to_string(order) +
             " gives no usable transform (the length is 1 << (order % 32), at most 1 << " + std::to_string(maxOrder) +
             ")");
    }
}

template <class S>
struct FFTState : Owner<S> {
    unsigned order;
    std::size_t size;
    explicit FFTState(unsigned o) : order(o), size(std::size_t(1) << (o % 32))
    {
        CheckOrder(o, FFTKind<S>::maxOrder, FFTKind<S>::name);
        this->name = FFTKind<S>::name;
        this->free = static_cast<void (*)(S*)>(kt::FFTFree);
        kt::FFTInit(&this->state, o);
    }
};

template <class T>
void Size(const Arr<T>& a, std::size_t n, const char* what)
{
    if (a.size() != n) {
        Fail(std::string(what) + " must have " + std::to_string(n) + " elements for this state, not " +
             std::to_string(a.size()));
    }
}

template <class S>
void BindFFT(py::module_& m)
{
    using K = FFTKind<S>;
    using T = typename K::T;
    using St = FFTState<S>;
    static const std::string doc =
        std::string(K::name) + "(order): a Fourier transform state of 1 << (order % 32) points, made by FFTInit " +
        "and freed by FFTFree (or close(), or the end of a `with` block). Order 0 and orders that give no usable "
        "transform raise ValueError." +
        (K::layout == Real            ? " Real transforms write the state's scratch: one call at a time."
         : K::layout == Interleaved   ? " Interleaved complex transforms only read the state."
                                      : " Deinterleaved transforms write the state's scratch.");
    OwnerClass<St>(m, K::name, doc.c_str())
        .def(py::init<unsigned>(), "FFTInit: a state of 1 << (order % 32) points.", py::arg("order"))
        .def_readonly("order", &St::order)
        .def_readonly("size", &St::size);
    m.def(
        "FFTFree", [](St& s) { s.Close(); }, Once("FFTFree", "FFTFree(state): frees the state (state.close())."),
        py::arg("state"));
    m.def(
        "FFTGetBufSize", [](St&) { return 0u; },
        Once("FFTGetBufSize", "FFTGetBufSize(state): 0, no transform needs a work buffer."), py::arg("state"));

    const char* fwdDoc =
        "FFTFwd(src, state, dst=None) -> dst; FFTFwd(srcReal, srcImag, state, dstReal=None, dstImag=None) -> "
        "(dstReal, dstImag) for the deinterleaved states. Unscaled: X[k] = sum x[n] exp(-2 pi i k n / N).\n"
        "Real states: N samples in, the packed half spectrum out, N + 2 values: the (re, im) pairs of bins 0 "
        "to N/2, with exact zeros as the imaginary parts of DC and Nyquist (view it as complex with "
        ".view(complex64)). src may be dst when it holds N + 2 elements.\n"
        "Interleaved complex states: N complex values; src may be dst.\n"
        "Deinterleaved states: split arrays of N elements; srcReal may be dstReal and srcImag dstImag, but "
        "dstReal and dstImag must be distinct.";
    const char* invDoc =
        "FFTInv(src, state, dst=None) -> dst; FFTInv(srcReal, srcImag, state, dstReal=None, dstImag=None) -> "
        "(dstReal, dstImag). The inverse carries the whole 1/N.\n"
        "Real states: the packed spectrum of N + 2 values in (all of them are read: the imaginary parts at DC "
        "and Nyquist count from N = 4 up), N samples out; src and dst must not overlap.";
    if constexpr (K::layout != Deinterleaved) {
        // Real: N in, N + 2 out forward (or N + 2 in place); the reverse
        // backward. Complex: N and N.
        const std::size_t extra = K::layout == Real ? 2 : 0;
        m.def(
            "FFTFwd",
            [extra](In<T> src, St& st, Out<T> dst) {
                const std::size_t n = st.size;
                py::array d = Output(dst, {py::ssize_t(n + extra)}, true);
                Size(src, Ptr<T>(d) == src.data() ? n + extra : n, "src");
                typename St::Use use(st);
                Released r(n);
                kt::FFTFwd(src.data(), Ptr<T>(d), use.state, nullptr);
                return d;
            },
            Once("FFTFwd", fwdDoc), py::arg("src"), py::arg("state"), py::arg("dst") = py::none());
        m.def(
            "FFTInv",
            [extra](In<T> src, St& st, Out<T> dst) {
                const std::size_t n = st.size;
                Size(src, n + extra, "src");
                py::array d = Output(dst, {py::ssize_t(n)});
                if (K::layout == Real) {
                    Apart(src.data(), src.size() * sizeof(T), Ptr<T>(d), n * sizeof(T),
                          "the real inverse transform needs src and dst apart");
                }
                typename St::Use use(st);
                Released r(n);
                kt::FFTInv(src.data(), Ptr<T>(d), use.state, nullptr);
                return d;
            },
            Once("FFTInv", invDoc), py::arg("src"), py::arg("state"), py::arg("dst") = py::none());
    } else {
        using Fn = void (*)(const T*, const T*, T*, T*, S*, unsigned char*);
        auto split = [](Fn fn) {
            return [fn](In<T> sr, In<T> si, St& st, Out<T> dr, Out<T> di) {
                const std::size_t n = st.size;
                Size(sr, n, "srcReal");
                Size(si, n, "srcImag");
                py::array r = Output(dr, {py::ssize_t(n)}), i = Output(di, {py::ssize_t(n)});
                Apart(Ptr<T>(r), n * sizeof(T), Ptr<T>(i), n * sizeof(T), "dstReal and dstImag must be distinct");
                typename St::Use use(st);
                Released rel(n);
                fn(sr.data(), si.data(), Ptr<T>(r), Ptr<T>(i), use.state, nullptr);
                return py::make_tuple(r, i);
            };
        };
        m.def("FFTFwd", split(kt::FFTFwd), Once("FFTFwd", fwdDoc), py::arg("srcReal"), py::arg("srcImag"),
              py::arg("state"), py::arg("dstReal") = py::none(), py::arg("dstImag") = py::none());
        m.def("FFTInv", split(kt::FFTInv), Once("FFTInv", invDoc), py::arg("srcReal"), py::arg("srcImag"),
              py::arg("state"), py::arg("dstReal") = py::none(), py::arg("dstImag") = py::none());
    }
}

// FFTImpl owns a deinterleaved complex state sized by a length.
template <class S, class C>
struct Impl {
    using T = typename C::value_type;
    using K = FFTKind<S>;
    std::unique_ptr<kt::FFTImpl<S, C>> impl;
    bool busy = false;

    // The order the C++ class will round a length to: truncation of
    // log2(length) + 0.5, checked before the state is built.
    static unsigned Rounded(unsigned fftSize)
    {
        return fftSize == 0 ? 0 : unsigned(std::int64_t(std::log2(double(fftSize)) + 0.5));
    }
    static void Check(unsigned order)
    {
        if (order != 0) CheckOrder(order, K::maxOrder, "FFTImpl");
    }
    kt::FFTImpl<S, C>& Get() const
    {
        Require(impl != nullptr, "the FFTImpl is closed");
        return *impl;
    }
    void Close()
    {
        Require(!busy, "the FFTImpl is in use by another thread");
        impl.reset();
    }
};

template <class S, class C>
void BindImpl(py::module_& m, const char* name)
{
    using I = Impl<S, C>;
    using T = typename I::T;
    auto process = [](bool forward) {
        return [forward](I& self, In<T> sr, In<T> si, Out<T> dr, Out<T> di) {
            auto& impl = self.Get();
            Require(impl.GetOrder() != 0, "this FFTImpl has no state: its length is 0 or 1");
            Require(!self.busy, "the FFTImpl is in use by another thread");
            const std::size_t n = impl.GetBlockSize();
            Size(sr, n, "srcReal");
            Size(si, n, "srcImag");
            py::array r = Output(dr, {py::ssize_t(n)}), i = Output(di, {py::ssize_t(n)});
            Apart(Ptr<T>(r), n * sizeof(T), Ptr<T>(i), n * sizeof(T), "dstReal and dstImag must be distinct");
            self.busy = true;
            {
                Released rel(n);
                if (forward) {
                    impl.ProcessFwd(sr.data(), si.data(), Ptr<T>(r), Ptr<T>(i));
                } else {
                    impl.ProcessInv(sr.data(), si.data(), Ptr<T>(r), Ptr<T>(i));
                }
            }
            self.busy = false;
            return py::make_tuple(r, i);
        };
    };
    py::class_<I>(m, name,
                  "FFTImpl_Float / FFTImpl_Double(order=0, fftSize=0): the C++ FFTImpl of a deinterleaved complex "
                  "state (float32 or float64), sized by a length rather than an order. A nonzero fftSize wins and "
                  "is rounded to the nearest power of two on a log scale (truncation of log2(fftSize) + 0.5: 724 "
                  "gives 512, 725 gives 1024); the transform runs on GetBlockSize() points, which may be more or "
                  "fewer than the length asked for, and the four arrays of ProcessFwd and ProcessInv hold "
                  "GetBlockSize() elements each. Lengths 0 and 1 leave no state: a transform then raises "
                  "ValueError. FFTImpl(5, 0) runs 32 points and reports GetFFTSize() 0.")
        .def(py::init([](unsigned order, unsigned fftSize) {
                 I::Check(fftSize != 0 ? I::Rounded(fftSize) : order);
                 auto self = std::make_unique<I>();
                 self->impl = std::make_unique<kt::FFTImpl<S, C>>(order, fftSize);
                 return self;
             }),
             "FFTImpl(order, fftSize): a nonzero fftSize wins, rounded to a power of two; FFTImpl() has no state.",
             py::arg("order") = 0, py::arg("fftSize") = 0)
        .def(
            "SetFFTSize",
            [](I& self, unsigned fftSize) {
                auto& impl = self.Get();
                Require(!self.busy, "the FFTImpl is in use by another thread");
                if (fftSize != impl.GetFFTSize()) I::Check(I::Rounded(fftSize));
                impl.SetFFTSize(fftSize);
            },
            "SetFFTSize(fftSize): rebuilds the state for a new length; the same length as before costs one "
            "comparison.",
            py::arg("fftSize"))
        .def("GetOrder", [](const I& self) { return self.Get().GetOrder(); },
             "The order of the transform in use; 0 when there is no state.")
        .def("GetFFTSize", [](const I& self) { return self.Get().GetFFTSize(); }, "The length as asked, unrounded.")
        .def("GetBlockSize", [](const I& self) { return self.Get().GetBlockSize(); },
             "1 << (order % 32), the length transformed.")
        .def("ProcessFwd", process(true),
             "ProcessFwd(srcReal, srcImag, dstReal=None, dstImag=None) -> (dstReal, dstImag): FFTFwd with the "
             "owned state.",
             py::arg("srcReal"), py::arg("srcImag"), py::arg("dstReal") = py::none(), py::arg("dstImag") = py::none())
        .def("ProcessInv", process(false),
             "ProcessInv(srcReal, srcImag, dstReal=None, dstImag=None) -> (dstReal, dstImag): FFTInv, scaled by 1/N.",
             py::arg("srcReal"), py::arg("srcImag"), py::arg("dstReal") = py::none(), py::arg("dstImag") = py::none())
        .def("close", &I::Close, "Destroys the C++ object now; later calls raise ValueError.")
        .def("__enter__", [](py::object self) { return self; }, "Returns the object itself.")
        .def("__exit__", [](I& self, py::args) { self.Close(); }, "Destroys the C++ object.");
}

}  // namespace

void BindTransforms(py::module_& m)
{
    BindFFT<kestaccel::FFTState_Float>(m);
    BindFFT<kestaccel::FFTState_Double>(m);
    BindFFT<kestaccel::FFTState_Complex_Float_Interleaved>(m);
    BindFFT<kestaccel::FFTState_Complex_Double_Interleaved>(m);
    BindFFT<kestaccel::FFTState_Complex_Float_Deinterleaved>(m);
    BindFFT<kestaccel::FFTState_Complex_Double_Deinterleaved>(m);
    BindImpl<kestaccel::FFTState_Complex_Float_Deinterleaved, cf>(m, "FFTImpl_Float");
    BindImpl<kestaccel::FFTState_Complex_Double_Deinterleaved, cd>(m, "FFTImpl_Double");
}

}  // namespace kpy
