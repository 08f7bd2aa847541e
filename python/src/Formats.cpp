// Buffers, sample conversion, channel layout, byte order, half precision.

#include "Bind.h"

namespace kpy {

namespace ku = kestaccel::utility;

namespace {

// A block from Malloc_*, seen as a numpy array that gives it back through
// Free when the array goes away (the Python side has no Free of its own).
template <class T>
void BindMalloc(py::module_& m, const char* name, T* (*fn)(unsigned))
{
    m.def(
        name,
        [fn](unsigned count) {
            T* block = fn(count);
            py::capsule owner(block, [](void* p) { ku::Free(static_cast<T*>(p)); });
            return py::array(DTypeOf<T>(), std::vector<py::ssize_t>{py::ssize_t(count)}, {}, block, owner);
        },
        Once(name, "Malloc_Byte, Malloc_Int16, Malloc_Float, Malloc_Double, Malloc_Complex_Float, "
                   "Malloc_Complex_Double (count): a library heap block of count elements as a numpy array. "
                   "Only the complex forms initialise their elements, to (0, 0); the others hold whatever the "
                   "heap gave. The block goes back through Free when the array is released."),
        py::arg("count"));
}

// One overload of Convert: the element types, whether it takes scale and
// round, and the call on untyped pointers.
struct Conversion {
    const char* from;
    const char* to;
    int args;  // 0: none, 1: scale, 2: scale and round
    void (*run)(unsigned, const void*, void*, int, bool);
    py::dtype (*fromType)();
    bool (*matches)(const py::array&);
};

template <class S, class D>
Conversion Conv(void (*)(unsigned, const S*, D*))
{
    return {DT<S>::name, DT<D>::name, 0,
            [](unsigned n, const void* s, void* d, int, bool) {
                ku::Convert(n, static_cast<const S*>(s), static_cast<D*>(d));
            },
            DTypeOf<D>, Matches<S>};
}
template <class S, class D>
Conversion Conv(void (*)(unsigned, const S*, D*, int))
{
    return {DT<S>::name, DT<D>::name, 1,
            [](unsigned n, const void* s, void* d, int scale, bool) {
                ku::Convert(n, static_cast<const S*>(s), static_cast<D*>(d), scale);
            },
            DTypeOf<D>, Matches<S>};
}
template <class S, class D>
Conversion Conv(void (*)(unsigned, const S*, D*, int, bool))
{
    return {DT<S>::name, DT<D>::name, 2,
            [](unsigned n, const void* s, void* d, int scale, bool round) {
                ku::Convert(n, static_cast<const S*>(s), static_cast<D*>(d), scale, round);
            },
            DTypeOf<D>, Matches<S>};
}
template <class S, class D, class... A>
Conversion Of()
{
    return Conv<S, D>(static_cast<void (*)(unsigned, const S*, D*, A...)>(ku::Convert));
}

const std::vector<Conversion>& Conversions()
{
    static const std::vector<Conversion> all = {
        Of<unsigned char, float>(),          Of<short, float, int>(),
        Of<short, double, int>(),            Of<int, float, int>(),
        Of<int, double, int>(),              Of<int, int24, int>(),
        Of<float, unsigned char, int, bool>(), Of<float, short, int, bool>(),
        Of<float, int, int, bool>(),         Of<float, double>(),
        Of<float, int24, int, bool>(),       Of<double, int, int, bool>(),
        Of<double, float>(),                 Of<int24, int>(),
        Of<int24, float, int>(),
    };
    return all;
}

std::string Overloads()
{
    static const char* const tail[] = {"", " (scale)", " (scale, round)"};
    std::string s;
    for (const Conversion& c : Conversions()) s += std::string("\n  ") + c.from + " -> " + c.to + tail[c.args];
    return s;
}

py::object Convert(py::object srcObj, py::object dstObj, std::optional<int> scale, std::optional<bool> round)
{
    py::array src = py::array::ensure(srcObj);
    Require(bool(src) && src.ndim() > 0, "Convert: src must be an array");
    const bool given = py::isinstance<py::array>(dstObj);
    const py::dtype to = given ? py::reinterpret_borrow<py::array>(dstObj).dtype() : py::dtype::from_args(dstObj);
    const bool to24 = to.kind() == 'V' && to.itemsize() == 3;
    for (const Conversion& c : Conversions()) {
        const py::dtype cto = c.fromType();
        if (!c.matches(src) || !(to24 ? cto.kind() == 'V' : to.is(cto) || to.equal(cto))) continue;
        const std::string sig = std::string("Convert ") + c.from + " -> " + c.to;
        if ((c.args >= 1) != scale.has_value() || (c.args == 2) != round.has_value()) {
            static const char* const need[] = {" takes neither scale nor round", " takes scale and no round",
                                               " takes scale and round"};
            throw py::type_error(sig + need[c.args]);
        }
        if (!(src.flags() & py::array::c_style)) src = py::array::ensure(src, py::array::c_style);
        std::optional<py::array> dst;
        if (given) {
            dst = py::reinterpret_borrow<py::array>(dstObj);
            Require((dst->flags() & py::array::c_style) && dst->writeable(), "dst must be C-contiguous and writable");
        }
        py::array out = MakeOutput(dst, cto, ShapeOf(src), false);
        const unsigned n = Count(std::size_t(src.size()));
        Released r(n);
        c.run(n, src.data(), out.mutable_data(), scale.value_or(0), round.value_or(false));
        return std::move(out);
    }
    throw py::type_error("Convert has no overload from " + src.dtype().attr("name").cast<std::string>() + " to " +
                         to.attr("name").cast<std::string>() + "; the overloads are:" + Overloads());
}

// Two channels, or any number of them given as a sequence of arrays.
template <class T>
void BindLayout(py::module_& m)
{
    // The sequence form first: a 2-D array or a list of channels goes there.
    m.def(
        "Interleave",
        [](std::vector<In<T>> sources, Out<T> dst) {
            const std::size_t channels = sources.size();
            const std::size_t frames = channels ? sources[0].size() : 0;
            std::vector<const T*> p;
            for (const In<T>& s : sources) {
                Require(s.size() == frames, "every channel must have the same number of frames");
                p.push_back(s.data());
            }
            py::array d = Output(dst, {py::ssize_t(channels * frames)});
            Count(channels * frames);
            Released r(channels * frames);
            ku::Interleave(unsigned(channels), unsigned(frames), p.data(), Ptr<T>(d));
            return d;
        },
        Once("Interleave", "Interleave(a, b, dst=None): dst[2i] = a[i], dst[2i + 1] = b[i].\n"
             "Interleave(sources, dst=None): sources is a sequence of equally long arrays (or a 2-D "
             "array of channels); element c of frame f lands at f * channels + c.\n"
             "Values move unchanged, bits and all; float32 and float64."),
        py::arg("sources"), py::arg("dst") = py::none());
    Binary<T, T, T>(m, "Interleave", ku::Interleave, "", "a", "b", 2);
    m.def(
        "Deinterleave",
        [](In<T> src, Out<T> a, Out<T> b) {
            Require(src.size() % 2 == 0, "two interleaved channels need an even number of elements");
            const unsigned n = Count(src.size() / 2);
            py::array da = Output(a, {py::ssize_t(n)}), db = Output(b, {py::ssize_t(n)});
            Released r(n);
            ku::Deinterleave(n, src.data(), Ptr<T>(da), Ptr<T>(db));
            return py::make_tuple(da, db);
        },
        Once("Deinterleave",
             "Deinterleave(src, a=None, b=None) -> (a, b): a[i] = src[2i], b[i] = src[2i + 1].\n"
             "Deinterleave(src, channels) -> array of shape (channels, frames): the C++ N-channel form, each "
             "row one destination. float32 and float64."),
        py::arg("src"), py::arg("a") = py::none(), py::arg("b") = py::none());
    m.def(
        "Deinterleave",
        [](In<T> src, unsigned channels) {
            Require(channels > 0 && src.size() % channels == 0,
                    "the length of src must be a multiple of a non-zero number of channels");
            const std::size_t frames = src.size() / channels;
            Count(src.size());
            py::array d(DTypeOf<T>(), {py::ssize_t(channels), py::ssize_t(frames)});
            std::vector<T*> p;
            for (std::size_t c = 0; c < channels; ++c) p.push_back(Ptr<T>(d) + c * frames);
            Released r(src.size());
            ku::Deinterleave(channels, unsigned(frames), src.data(), p.data());
            return d;
        },
        "", py::arg("src"), py::arg("channels"));
}

}  // namespace

void BindFormats(py::module_& m)
{
    BindMalloc<unsigned char>(m, "Malloc_Byte", ku::Malloc_Byte);
    BindMalloc<short>(m, "Malloc_Int16", ku::Malloc_Int16);
    BindMalloc<float>(m, "Malloc_Float", ku::Malloc_Float);
    BindMalloc<double>(m, "Malloc_Double", ku::Malloc_Double);
    BindMalloc<cf>(m, "Malloc_Complex_Float", ku::Malloc_Complex_Float);
    BindMalloc<cd>(m, "Malloc_Complex_Double", ku::Malloc_Complex_Double);

    static const std::string copy =
        "Copy(src, dst=None), Move(src, dst=None): block copy, block move (overlap allowed). The byte count "
        "count * itemsize is formed in 32 bits and wraps at 4 GiB, as in C++: Copy of 1073741824 float32 "
        "copies nothing (a new dst stays zero). Copy: uint8, int8, int16, int32, uint32, float32, float64; "
        "Move: uint8, int16, uint32, float32, float64 (there is no Move of int32 or int8).";
    static const std::string zero = "Zero(dst): all-zero bytes, with the 32-bit byte count of Copy. uint8, int16, "
                                    "int32, uint32, float32, float64.";
    static const std::string set =
        "Set(dst, value): every element becomes value. A value equal to zero (-0.0 included) clears the "
        "bytes as Zero does, so -0.0 stores +0.0. uint8, int16, int32, uint32, float32, float64.";
    Each<unsigned char, signed char, short, int, unsigned int, float, double>([&](auto t) {
        using T = decltype(t);
        Unary<T, T>(m, "Copy", ku::Copy, copy.c_str(), true);
    });
    Each<unsigned char, short, unsigned int, float, double>([&](auto t) {
        using T = decltype(t);
        Unary<T, T>(m, "Move", ku::Move, copy.c_str(), true);
    });
    Each<unsigned char, short, int, unsigned int, float, double>([&](auto t) {
        using T = decltype(t);
        InPlace<T>(m, "Zero", ku::Zero, zero.c_str(), "dst");
        ScalarsInPlace<T, T>(m, "Set", ku::Set, set.c_str(), {"value"}, "dst");
    });
    m.def(
        "Equal",
        [](In<unsigned char> a, In<unsigned char> b) {
            Require(a.size() == b.size(), "the two arrays must have the same number of elements");
            return ku::Equal(Count(a.size()), a.data(), b.data());
        },
        "Equal(a, b): True when the bytes of two uint8 arrays are the same (True when empty).", py::arg("a"),
        py::arg("b"));

    static const std::string convert =
        "Convert(src, dst, scale=None, round=None): sample conversion. dst is a numpy dtype (a new array is "
        "returned) or an array to write. The (src, dst) types choose one of the fifteen C++ overloads, "
        "listed below, and whether scale and round are required; any other pair raises TypeError.\n"
        "The multiplier is 2**-scale in both directions: 15, 23 and 31 bring int16, 24-bit and int32 samples "
        "to +-1, and -15, -23, -31 take floating samples back; 0 means no multiplier (and, from floating "
        "data, no limit). uint8 samples are unsigned, taken by value, without scale.\n"
        "Floating to integer: the multiplier m is powf(2, -scale) in float; each x becomes m if x >= 1, -m if "
        "x <= -1, else x * m, then round=True rounds halves away from zero, round=False truncates. NaN and "
        "results outside int32 give -2147483648. The 32-bit result is wrapped to 8 or 16 bits with no "
        "limit (scale -15 turns +1.0 into 32768, stored as -32768) and saturated only for 24 bits.\n"
        "int32 -> int24: an arithmetic right shift by the low five bits of scale, then saturation. "
        "int24 -> int32: sign extension, no shift. float32 <-> float64: plain IEEE conversions.\n"
        "24-bit samples are arrays of kestaccel.int24 (numpy.dtype('V3')) or any 3-byte void or structured "
        "dtype: a packed uint8 array of 3n bytes is bytes.view(kestaccel.int24), and .view(numpy.uint8) gives "
        "the bytes back.\nOverloads:" +
        Overloads();
    m.def("Convert", &Convert, convert.c_str(), py::arg("src"), py::arg("dst"), py::arg("scale") = py::none(),
          py::arg("round") = py::none());

    static const std::string swap =
        "SwapBytes(data): reverses the bytes of each word in place (the C++ two-argument form).\n"
        "SwapBytes(src, dst): the same into dst; src stays untouched.\n"
        "uint16 and uint32 and uint64 words are reversed in full; a packed 24-bit word (kestaccel.int24) "
        "exchanges bytes 0 and 2. There is no SwapBytes of signed or floating types: view them as unsigned.";
    Each<unsigned short, unsigned int, int24, unsigned long long>([&](auto t) {
        using T = decltype(t);
        InPlace<T>(m, "SwapBytes", ku::SwapBytes, swap.c_str(), "data");
    });
    Each<unsigned short, unsigned int, int24, unsigned long long>([&](auto t) {
        using T = decltype(t);
        m.def(
            "SwapBytes",
            [](In<T> src, InOut<T> dst) {
                Require(src.size() == dst.size(), "src and dst must have the same number of elements");
                const unsigned n = Count(src.size());
                Released r(n);
                ku::SwapBytes(n, src.data(), dst.data());
                return dst.a;
            },
            "", py::arg("src"), py::arg("dst"));
    });

    BindLayout<float>(m);
    BindLayout<double>(m);

    Unary<float, unsigned short>(
        m, "ConvertFloat2Half",
        +[](unsigned n, const float* s, unsigned short* d) { ku::ConvertFloat2Half(const_cast<float*>(s), d, n); },
        "ConvertFloat2Half(src, dst=None): float32 -> uint16 half words by moving fields, not an IEEE "
        "conversion: the sign to bit 15, the exponent e to (e - 112) mod 32, the top ten fraction bits kept "
        "(truncated). Only +0.0 gives 0; 65536.0 gives 0x7C00, +inf 0x3C00, the quiet NaN 0x3E00, -0.0 "
        "0xC000. (The C++ order is source, destination, count.)");
    Unary<unsigned short, float>(
        m, "ConvertHalf2Float",
        +[](unsigned n, const unsigned short* s, float* d) {
            ku::ConvertHalf2Float(const_cast<unsigned short*>(s), d, n);
        },
        "ConvertHalf2Float(src, dst=None): uint16 half words -> float32: exponent + 112, fraction shifted up; "
        "no infinity, NaN or subnormal. Only the word 0 gives +0.0 (0x8000 gives -2**-15, 0x7C00 65536.0).");
}

}  // namespace kpy
