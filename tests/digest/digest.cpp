// The outputs of every public operation on fixed inputs, for the digest check
// (Digests.cmake): each case writes the raw bytes of its outputs to a file
// named after it in the current folder and lists itself in cases.txt.
//
// The hashing is left to CMake's file(SHA256) on the build machine: the MinGW
// build runs here under Wine and the AArch64 build under qemu-user, Debian has
// no hashing library for those targets, and hashing on the host keeps a
// hand-written hash out of the project.
//
// Sections: "exact" cases give the same bits on every build; "runtime" cases
// return, by contract, results of the platform's maths runtime (expf, cos,
// log2, ...); "multiply" is Eigen's product, summed in an order that follows
// the vector width. A NaN that the interface does not fix is written as the
// one quiet NaN: IEEE 754 leaves a computed NaN's sign and payload open.

#include <kestaccel/kestaccel.h>

#include <algorithm>
#include <cctype>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <functional>
#include <limits>
#include <random>
#include <set>
#include <string>
#include <tuple>
#include <type_traits>
#include <vector>

namespace {

using namespace kestaccel;
using namespace kestaccel::utility;
using namespace kestaccel::filter;
using namespace kestaccel::transform;
using kestcore::utility::int24_t;
using CF = std::complex<float>;
using CD = std::complex<double>;

constexpr unsigned kN = 203;  // odd and above 3 x 64: every vector body, unrolled or not, and a scalar tail

constexpr unsigned kRuntime = 1, kMultiply = 2, kBits = 4, kPlain = 8;  // kBits: NaNs kept; kPlain: no specials

template <class T> struct IsComplex : std::false_type {};
template <class T> struct IsComplex<std::complex<T>> : std::true_type {};

template <class T>
std::string TypeName()
{
    using U = std::remove_cv_t<T>;
    if constexpr (IsComplex<U>::value) return std::is_same<U, CF>::value ? "c32" : "c64";
    else if constexpr (std::is_same<U, int24_t>::value) return "i24";
    else if constexpr (std::is_floating_point<U>::value) return "f" + std::to_string(8 * sizeof(U));
    else return (std::is_signed<U>::value ? (sizeof(U) == 1 ? "s" : "i") : "u") + std::to_string(8 * sizeof(U));
}

template <class T, class Bits>
T FromBits(Bits bits)
{
    static_assert(sizeof(T) == sizeof(Bits), "same width");
    T value;
    std::memcpy(&value, &bits, sizeof value);
    return value;
}

// Specials of a floating type: signed zeros, infinities, subnormals, extremes,
// halfway cases of Round and of Convert at scales -7, -15, -23 and -31, the
// two classic traps of rounding by adding one half (the largest value below
// 0.5, and 2^p + 1 where p is the fraction width), and NaNs with payloads
// (quiet of either sign, signalling).
template <class T>
T Special(std::size_t k)
{
    using L = std::numeric_limits<T>;
    using Bits = std::conditional_t<sizeof(T) == 4, std::uint32_t, std::uint64_t>;
    constexpr int kFraction = L::digits - 1, kWidth = 8 * sizeof(T);
    const Bits exponent = ((Bits(1) << (kWidth - 1 - kFraction)) - 1) << kFraction, quiet = Bits(1) << (kFraction - 1);
    const Bits nans[] = {exponent | quiet | 0x1234, (Bits(1) << (kWidth - 1)) | exponent | quiet | 0x5, exponent | 0x321};
    const T values[] = {T(0), -T(0), L::infinity(), -L::infinity(), L::denorm_min(), L::denorm_min() - L::min(),
                        L::min(), L::max(), -L::max(), T(0.5), T(1.5), T(2.5), T(-2.5), T(-0.5), T(1), T(-1),
                        T(3e19), T(1) / T(256), T(3) / T(65536), T(-5) / T(65536), T(3) / T(16777216),
                        T(-1) / T(4294967296.0), T(0.5) - L::epsilon() / 4, T(1) / L::epsilon() + 1,
                        -(T(1) / L::epsilon() + 1)};
    constexpr std::size_t kValues = sizeof values / sizeof values[0];
    if (k == ~std::size_t(0)) return FromBits<T>(exponent | quiet);  // the canonical NaN
    if (k % (kValues + 3) < kValues) return values[k % (kValues + 3)];
    return FromBits<T>(nans[k % (kValues + 3) - kValues]);
}

// Input data from the raw words of std::mt19937, whose sequence the standard
// fixes; its distributions are not fixed and differ between standard
// libraries. Floating values carry 24 or 53 random bits in [-16, 16); with
// specials, about a quarter of the elements are specials. Integers take the
// low bytes of the words, with 0, all ones and the extremes mixed in.
template <class T>
T Element(std::mt19937& engine, bool special, std::size_t k)
{
    if constexpr (std::is_floating_point<T>::value) {
        if (special) return Special<T>(k);
        if constexpr (sizeof(T) == 4) {
            const std::uint32_t w = engine();
            return T(std::int32_t(w >> 8) - (1 << 23)) / T(1 << (27 - (w & 0xFF) % 9));
        } else {
            const std::uint64_t hi = engine(), lo = engine(), w = hi << 32 | lo;
            return T(std::int64_t(w >> 11) - (std::int64_t(1) << 52)) / T(std::uint64_t(1) << (56 - (lo & 0x7FF) % 9));
        }
    } else {
        const std::uint64_t top = std::uint64_t(1) << (8 * sizeof(T) - 1), picks[] = {0, ~std::uint64_t(0), top, top - 1};
        std::uint64_t w = std::uint64_t(engine()) << 32;
        w |= engine();
        T value;
        std::memcpy(&value, special ? &picks[k % 4] : &w, sizeof value);  // the low bytes: all targets are little-endian
        return value;
    }
}

template <class T>
std::vector<T> Values(unsigned seed, std::size_t n, bool specials)
{
    std::vector<T> v(n);
    if constexpr (IsComplex<T>::value) {
        const auto parts = Values<typename T::value_type>(seed, 2 * n, specials);
        for (std::size_t i = 0; i < n; ++i) v[i] = T(parts[2 * i], parts[2 * i + 1]);
    } else {
        std::mt19937 engine(seed);
        for (std::size_t i = 0; i < n; ++i) v[i] = Element<T>(engine, specials && (i * 7 + seed) % 11 < 3, i + 5 * seed);
    }
    return v;
}

// The bytes of a case's outputs.
class Out {
public:
    explicit Out(bool keepNaN) : keepNaN_(keepNaN) {}
    template <class T>
    void operator()(const T* p, std::size_t n = 1)
    {
        for (std::size_t i = 0; i < n; ++i) {
            if constexpr (IsComplex<T>::value) {
                (*this)(reinterpret_cast<const typename T::value_type*>(p + i), 2);
            } else {
                T v = p[i];
                if constexpr (std::is_floating_point<T>::value)
                    if (v != v && !keepNaN_) v = Special<T>(~std::size_t(0));
                const auto* bytes = reinterpret_cast<const unsigned char*>(&v);
                bytes_.insert(bytes_.end(), bytes, bytes + sizeof v);
            }
        }
    }
    template <class T>
    void operator()(const std::vector<T>& v) { (*this)(v.data(), v.size()); }
    template <class T>
    void Value(T v) { (*this)(&v); }
    const std::vector<unsigned char>& bytes() const { return bytes_; }

private:
    bool keepNaN_;
    std::vector<unsigned char> bytes_;
};

struct Ctx {
    bool specials;
    Out out;
    template <class T>
    std::vector<T> In(unsigned seed, std::size_t n) const { return Values<T>(seed, n, specials); }
};

struct Case {
    std::string name;
    unsigned flags;
    std::function<void(Ctx&)> run;
};
std::vector<Case> cases;

void Reg(std::string name, unsigned flags, std::function<void(Ctx&)> run) { cases.push_back({name, flags, run}); }

// A scalar argument of any element type; complex constants use both parts.
struct Scalar {
    Scalar(double r, double i = 0) : re(r), im(i) {}
    template <class T>
    T As() const
    {
        if constexpr (IsComplex<T>::value) return T(typename T::value_type(re), typename T::value_type(im));
        else return static_cast<T>(re);
    }
    double re, im;
};

// One argument of a count-first member. A pointer gets 2 kN elements of data
// (a destination too, which makes srcDst arguments inputs), and a reference
// one element; both are written out after the call unless const. A value
// takes the next of the case's scalars.
template <class A>
struct Slot {
    using Target = std::remove_pointer_t<std::remove_reference_t<A>>;
    using E = std::remove_const_t<Target>;
    static constexpr bool kPointer = std::is_pointer<A>::value, kReference = std::is_reference<A>::value;
    std::vector<E> data;
    E value{};

    Slot(const Ctx& x, unsigned seed, const Scalar* scalar)
    {
        if constexpr (kPointer) data = x.In<E>(seed, 2 * kN);
        else if constexpr (!kReference) value = scalar->As<E>();
    }
    A Arg()
    {
        if constexpr (kPointer) return data.data();
        else return value;
    }
    void Emit(Out& out) const
    {
        if constexpr (!std::is_const<Target>::value && kPointer) out(data);
        if constexpr (!std::is_const<Target>::value && kReference) out.Value(value);
    }
};

template <class Sig> struct Member;
template <class R, class... A>
struct Member<R(unsigned, A...)> {
    // The element types of the buffers in order, each once, else the result's.
    static std::string Suffix()
    {
        std::string s;
        const auto add = [&s](std::string n) { s += (s + ".").find("." + n + ".") == std::string::npos ? "." + n : ""; };
        ((std::is_pointer<A>::value || std::is_reference<A>::value ? add(TypeName<typename Slot<A>::E>()) : void()), ...);
        if constexpr (!std::is_void<R>::value)
            if (s.empty()) add(TypeName<R>());
        return s;
    }
    static std::size_t ScalarsBefore(std::size_t i)
    {
        const bool isScalar[] = {false, !(std::is_pointer<A>::value || std::is_reference<A>::value)...};
        std::size_t k = 0;
        for (std::size_t j = 1; j <= i; ++j) k += isScalar[j];
        return k;
    }
    static void Run(Ctx& x, R (*f)(unsigned, A...), const std::vector<Scalar>& scalars)
    {
        Run(x, f, scalars, std::index_sequence_for<A...>());
    }
    // Argument i gets the data of seed i + 1, or the scalar after those that
    // the arguments before it took.
    template <std::size_t... I>
    static void Run(Ctx& x, R (*f)(unsigned, A...), const std::vector<Scalar>& scalars, std::index_sequence<I...>)
    {
        std::tuple<Slot<A>...> slots{Slot<A>(x, I + 1, scalars.data() + ScalarsBefore(I))...};
        std::apply(
            [&](auto&... s) {
                if constexpr (std::is_void<R>::value) f(kN, s.Arg()...);
                else x.out.Value(f(kN, s.Arg()...));
                (s.Emit(x.out), ...);
            },
            slots);
    }
};

// Registers a count-first member; Sig picks the overload.
template <class Sig>
void Op(const std::string& name, unsigned flags, Sig* f, std::vector<Scalar> scalars = {})
{
    Reg(name + Member<Sig>::Suffix(), flags, [f, scalars](Ctx& x) { Member<Sig>::Run(x, f, scalars); });
}

template <class T, class D = T> using Un = void(unsigned, const T*, D*);
template <class T> using Bin = void(unsigned, const T*, const T*, T*);
template <class T> using InP = void(unsigned, const T*, T*);
template <class T> using Self = void(unsigned, T*);
template <class T> using Split = void(unsigned, const T*, T*, T*);
template <class T, class C = T> using SrcCDst = void(unsigned, const T*, C, T*);
template <class T, class C = T> using SrcDstC = void(unsigned, const T*, T*, C);
template <class T, class C = T> using SelfC = void(unsigned, T*, C);
template <class T> using SrcDstCC = void(unsigned, const T*, T*, T, T);
template <class T> using SelfCC = void(unsigned, T*, T, T);
template <class T, class R = T> using Red = R(unsigned, const T*);
template <class S, class D> using Scaled = void(unsigned, const S*, D*, int);
template <class S, class D> using Rounded = void(unsigned, const S*, D*, int, bool);

template <class... T, class F>
void ForTypes(F f) { (f(T()), ...); }

void RegisterArithmetic()
{
    ForTypes<float, double, CF, CD>([](auto t) {
        using T = decltype(t);
        const Scalar c = IsComplex<T>::value ? Scalar(0.3, -1.7) : Scalar(0.3);
        Op<Bin<T>>("Add", 0, Add), Op<Bin<T>>("Sub", 0, Sub), Op<Bin<T>>("Mul", 0, Mul), Op<Bin<T>>("Div", 0, Div);
        Op<Bin<T>>("AddProduct", 0, AddProduct);
        Op<InP<T>>("Add_InPlace", 0, Add_InPlace), Op<InP<T>>("Sub_InPlace", 0, Sub_InPlace);
        Op<InP<T>>("Mul_InPlace", 0, Mul_InPlace), Op<InP<T>>("Div_InPlace", 0, Div_InPlace);
        Op<SrcCDst<T>>("AddConstant", 0, AddConstant, {c}), Op<SrcCDst<T>>("SubConstant", 0, SubConstant, {c});
        Op<SrcCDst<T>>("SubConstantRev", 0, SubConstantRev, {c});
        Op<SrcDstC<T>>("MulConstant", 0, MulConstant, {c}), Op<SrcDstC<T>>("DivConstant", 0, DivConstant, {c});
        Op<SelfC<T>>("AddConstant_InPlace", 0, AddConstant_InPlace, {c});
        Op<SelfC<T>>("SubConstant_InPlace", 0, SubConstant_InPlace, {c});
        Op<SelfC<T>>("SubConstantRev_InPlace", 0, SubConstantRev_InPlace, {c});
        Op<SelfC<T>>("MulConstant_InPlace", 0, MulConstant_InPlace, {c});
        Op<SelfC<T>>("DivConstant_InPlace", 0, DivConstant_InPlace, {c});
    });
    Op<SrcDstC<float>>("AddConstantProduct", 0, AddConstantProduct, {0.3});
    Op<SrcDstC<double>>("AddConstantProduct", 0, AddConstantProduct, {0.3});
    Op<void(unsigned, float, const float*, float*)>("DivConstantRev", 0, DivConstantRev, {0.3});
    Op<void(unsigned, short*, short, int)>("MulConstant_InPlace", 0, MulConstant_InPlace, {-3, 1});

    // The quotient's own NaN, (0x7FC00000, 0x7FC00000) or its double, has
    // fixed bits: finite numerators over denominators with zeros and NaNs.
    ForTypes<CF, CD>([](auto t) {
        using T = decltype(t);
        Reg("Div.fixed." + TypeName<T>(), kBits, [](Ctx& x) {
            const auto a = x.In<T>(1, kN), b = Values<T>(2, kN, false);
            std::vector<T> dst(kN);
            Div(kN, a.data(), b.data(), dst.data());
            x.out(dst);
        });
    });
}

void RegisterElementwise()
{
    ForTypes<float, double>([](auto t) {
        using T = decltype(t);
        using C = std::complex<T>;
        Op<Un<T>>("Sqr", 0, Sqr), Op<Un<T>>("Sqrt", 0, Sqrt), Op<Un<T>>("Inverse", 0, Inverse);
        Op<Un<T>>("Abs", kBits, Abs), Op<Un<T>>("Flip", kBits, Flip);
        Op<Un<T>>("Exp", kRuntime, Exp), Op<Un<T>>("Ln", kRuntime, Ln), Op<Un<T>>("Round", kRuntime, Round);
        Op<Self<T>>("Sqr_InPlace", 0, Sqr_InPlace), Op<Self<T>>("Sqrt_InPlace", 0, Sqrt_InPlace);
        Op<Self<T>>("Abs_InPlace", kBits, Abs_InPlace), Op<Self<T>>("Flip_InPlace", kBits, Flip_InPlace);
        Op<Self<T>>("Exp_InPlace", kRuntime, Exp_InPlace);
        Op<Bin<T>>("Pow", kRuntime, Pow), Op<Bin<T>>("Magnitude", kRuntime, Magnitude);
        Op<Un<C, T>>("Magnitude", kRuntime, Magnitude), Op<Un<C, T>>("PowerSpectr", 0, PowerSpectr);
        Op<SrcDstCC<T>>("Normalize", 0, Normalize, {0.25, 0.3});
        Op<SelfC<T>>("Invert_Threshold_InPlace", 0, Invert_Threshold_InPlace, {0.125});
        Op<SelfC<C, T>>("Invert_Threshold_InPlace", 0, Invert_Threshold_InPlace, {0.125});
    });
    Op<Self<float>>("Ln_InPlace", kRuntime, Ln_InPlace);
    Op<Un<float>>("Ln_Prec11", kRuntime, Ln_Prec11), Op<Un<float>>("Ln_Prec21", kRuntime, Ln_Prec21);
    Op<Un<float>>("Ln_Prec24", kRuntime, Ln_Prec24);
    Op<Bin<double>>("Pow_Prec26", kRuntime, Pow_Prec26), Op<Un<double>>("Inverse_Prec26", 0, Inverse_Prec26);
    Op<Split<float>>("CartToPolar", kRuntime, CartToPolar), Op<Bin<float>>("PolarToCart", kRuntime, PolarToCart);
}

void RegisterReductions()
{
    // Sums on plain data (specials only make them NaN); scans on both.
    ForTypes<float, double>([](auto t) {
        using T = decltype(t);
        Op<Red<T>>("Sum", kPlain, Sum), Op<Red<T>>("Mean", kPlain, Mean);
        Op<Red<T>>("NormL1", kPlain, NormL1), Op<Red<T>>("NormL2", kPlain, NormL2);
        Op<void(unsigned, const T*, T&)>("StandardDeviation", kPlain, StandardDeviation);
        Op<T(unsigned, const T*, const T*)>("DotProduct", kPlain, DotProduct);
        for (const unsigned data : {kPlain, 0u}) {
            const std::string p = data ? ".plain" : "";
            Op<Red<T>>("Max" + p, kBits | data, Max), Op<Red<T>>("Min" + p, kBits | data, Min);
        }
    });
    for (const unsigned data : {kPlain, 0u}) {
        const std::string p = data ? ".plain" : "";
        using Index = unsigned(unsigned, const float*, float*);
        Op<Index>("MaxIndex" + p, kBits | data, MaxIndex), Op<Index>("MinIndex" + p, kBits | data, MinIndex);
        Op<void(unsigned, const float*, float&, float&)>("MinMax" + p, kBits | data, MinMax);
        Op<void(unsigned, const float*, float&, float&, unsigned&, unsigned&)>("MinMaxIndex" + p, kBits | data,
                                                                              MinMaxIndex);
        Op<Red<float>>("MinMax.peak" + p, kBits | data, [](unsigned n, const float* src) { return MinMax(src, n); });
    }
    Op<Bin<float>>("MaxEvery", kBits, MaxEvery), Op<Bin<float>>("MinEvery", kBits, MinEvery);
    Op<InP<float>>("MaxEvery_InPlace", kBits, MaxEvery_InPlace);
    Op<InP<float>>("MinEvery_InPlace", kBits, MinEvery_InPlace);
}

void RegisterThresholds()
{
    ForTypes<float, double>([](auto t) {
        using T = decltype(t);
        Op<SelfC<T>>("Threshold_LT_InPlace", kBits, Threshold_LT_InPlace, {0.25});
        Op<SelfC<T>>("Threshold_GT_InPlace", kBits, Threshold_GT_InPlace, {0.25});
        Op<SrcDstCC<T>>("Threshold_LTVal", kBits, Threshold_LTVal, {0.25, -3.5});
        Op<SrcDstCC<T>>("Threshold_GTVal", kBits, Threshold_GTVal, {0.25, -3.5});
        Op<SelfCC<T>>("Threshold_LTVal_InPlace", kBits, Threshold_LTVal_InPlace, {0.25, -3.5});
        Op<SelfCC<T>>("Threshold_GTVal_InPlace", kBits, Threshold_GTVal_InPlace, {0.25, -3.5});
        Op<SelfCC<T>>("VectorSlope", 0, VectorSlope, {-1.25, 0.3});
    });
    Op<SelfCC<float>>("Trim", kBits, Trim, {-0.5, 0.75});
}

// Buffers, conversion, byte order, layout and half precision: values that are
// copied, moved, set, swapped, interleaved or repacked keep their bits.
void RegisterBuffersAndFormats()
{
    ForTypes<unsigned char, signed char, short, int, unsigned, float, double>([](auto t) {
        using T = decltype(t);
        Op<Un<T>>("Copy", kBits, Copy);
        if constexpr (!std::is_same<T, signed char>::value) {
            Op<Self<T>>("Zero", kBits, Zero);
            Op<SelfC<T>>("Set", kBits, Set, {97}), Op<SelfC<T>>("Set.zero", kBits, Set, {-0.0});
        }
        if constexpr (!std::is_same<T, signed char>::value && !std::is_same<T, int>::value)
            Op<Un<T>>("Move", kBits, Move);
    });
    Op<bool(unsigned, const unsigned char*, const unsigned char*)>("Equal", 0, Equal);
    Reg("Malloc", 0, [](Ctx& x) {
        CF* cf = Malloc_Complex_Float(kN);
        CD* cd = Malloc_Complex_Double(kN);
        x.out(cf, kN), x.out(cd, kN);  // the complex blocks alone start at (0, 0)
        // Free takes a block of any element type.
        Free(reinterpret_cast<short*>(Malloc_Byte(kN))), Free(reinterpret_cast<float*>(Malloc_Int16(kN)));
        Free(reinterpret_cast<double*>(Malloc_Float(kN))), Free(reinterpret_cast<CF*>(Malloc_Double(kN)));
        Free(reinterpret_cast<CD*>(cf)), Free(reinterpret_cast<unsigned char*>(cd));
    });
    Reg("ModeControls", 0, [](Ctx& x) {
        SetDenormalsAreZero(true), SetFlushDenormalsToZero(true), SetDenormalExceptionsEnabled(true);
        x.out.Value(GetDenormalsAreZero()), x.out.Value(GetFlushDenormalsToZero());
        x.out.Value(GetDenormalExceptionsEnabled());
        SetDenormalsAreZero(false), SetFlushDenormalsToZero(false), SetDenormalExceptionsEnabled(false);
    });

    Op<Un<unsigned char, float>>("Convert", 0, Convert), Op<Un<float, double>>("Convert", 0, Convert);
    Op<Un<double, float>>("Convert", 0, Convert), Op<Un<int24_t, int>>("Convert", 0, Convert);
    Op<Scaled<short, float>>("Convert", 0, Convert, {15}), Op<Scaled<short, double>>("Convert", 0, Convert, {15});
    Op<Scaled<int, float>>("Convert", 0, Convert, {31}), Op<Scaled<int, double>>("Convert", 0, Convert, {31});
    Op<Scaled<int, int24_t>>("Convert", 0, Convert, {8}), Op<Scaled<int24_t, float>>("Convert", 0, Convert, {23});
    for (const bool round : {false, true}) {
        const std::string r = round ? ".round" : ".trunc";
        Op<Rounded<float, unsigned char>>("Convert" + r, 0, Convert, {-7, double(round)});
        Op<Rounded<float, short>>("Convert" + r, 0, Convert, {-15, double(round)});
        Op<Rounded<float, int>>("Convert" + r, 0, Convert, {-31, double(round)});
        Op<Rounded<float, int24_t>>("Convert" + r, 0, Convert, {-23, double(round)});
        Op<Rounded<double, int>>("Convert" + r, 0, Convert, {-31, double(round)});
    }
    ForTypes<unsigned short, unsigned, int24_t, unsigned long long>([](auto t) {
        using T = decltype(t);
        Op<Self<T>>("SwapBytes_InPlace", 0, SwapBytes), Op<Un<T>>("SwapBytes", 0, SwapBytes);
    });
    Op<Un<float, unsigned short>>("ConvertFloat2Half", 0, [](unsigned n, const float* src, unsigned short* dst) {
        ConvertFloat2Half(const_cast<float*>(src), dst, n);
    });
    Op<Un<unsigned short, float>>("ConvertHalf2Float", 0, [](unsigned n, const unsigned short* src, float* dst) {
        ConvertHalf2Float(const_cast<unsigned short*>(src), dst, n);
    });
    ForTypes<float, double>([](auto t) {
        using T = decltype(t);
        Op<Bin<T>>("Interleave", kBits, Interleave), Op<Split<T>>("Deinterleave", kBits, Deinterleave);
        // Three channels of n / 3 frames, from and to one buffer.
        Op<Un<T>>("Interleave.channels", kBits, [](unsigned n, const T* src, T* dst) {
            const T* sources[] = {src, src + n / 3, src + 2 * (n / 3)};
            Interleave(3, n / 3, sources, dst);
        });
        Op<Un<T>>("Deinterleave.channels", kBits, [](unsigned n, const T* src, T* dst) {
            T* destinations[] = {dst, dst + n / 3, dst + 2 * (n / 3)};
            Deinterleave(3, n / 3, src, destinations);
        });
    });
}

void RegisterDSP()
{
    ForTypes<float, double>([](auto t) {
        using T = decltype(t);
        // 37 by n elements, both forms, each order of the arrays.
        Op<Bin<T>>("Convolve", kPlain, [](unsigned n, const T* a, const T* b, T* dst) { Convolve(37, a, n, b, dst); });
        Op<Bin<T>>("Convolve.work", kPlain, [](unsigned n, const T* a, const T* b, T* dst) {
            Convolve(n, b, 37, a, dst, nullptr);
        });
        Op<Un<T>>("UpSample", kBits, [](unsigned n, const T* src, T* dst) {
            unsigned phase = 1;
            UpSample(n / 3, src, dst, 3, &phase);
        });
        // A stream of two blocks: the phase carries over; it ends at dst[n].
        Op<Un<T>>("DownSample", kBits, [](unsigned n, const T* src, T* dst) {
            unsigned phase = 2;
            DownSample(100, src, dst, 3, &phase);
            DownSample(n - 100, src + 100, dst + 33, 3, &phase);
            dst[n] = T(phase);
        });
        Op<Un<T>>("WindowBartlett", 0, WindowBartlett), Op<Un<T>>("WindowHann", kRuntime, WindowHann);
        Op<Un<T>>("WindowHamming", kRuntime, WindowHamming);
        Op<SrcDstC<T>>("WindowBlackman", kRuntime, WindowBlackman, {-0.16});
        Op<SrcDstC<T>>("WindowKaiser", 0, WindowKaiser, {0.1});
    });
    Op<unsigned long long(unsigned)>("ConvolutionWorkBufferSize", 0, [](unsigned n) {
        return ConvolutionWorkBufferSize(37, n);
    });
    // Large enough for Eigen's blocked product (rows + cols + inner > 20).
    ForTypes<float, double, CF, CD>([](auto t) {
        using T = decltype(t);
        Op<Bin<T>>("Multiply.RowMajor", kMultiply | kPlain, [](unsigned, const T* a, const T* b, T* c) {
            Multiply(RowMajor, 13, 11, 29, a, b, c);
        });
        Op<Bin<T>>("Multiply.ColMajor", kMultiply | kPlain, [](unsigned, const T* a, const T* b, T* c) {
            Multiply(ColMajor, 13, 11, 29, a, b, c);
        });
    });
    // Bartlett, none (1), Hamming, Hann; odd and even counts, both scalings.
    for (const int w : {0, 1, 2, 3}) {
        Reg("GenerateLowpassFIRCoefficients.window" + std::to_string(w), kRuntime, [w](Ctx& x) {
            for (const unsigned count : {7u, 31u, 32u}) {
                for (const double cutoff : {0.1, 0.25, 0.3125, 0.45}) {
                    for (const bool normalize : {false, true}) {
                        std::vector<double> taps(count);
                        GenerateLowpassFIRCoefficients(cutoff, count, taps.data(), DSPWindowType(w), normalize, nullptr);
                        x.out(taps);
                    }
                }
            }
        });
    }
}

// Orders 1 to 12: every first pass and pairing of stages.
template <class State, class T, int kLayout>  // kLayout: 0 real, 1 interleaved, 2 split arrays
void RegisterFFT(const std::string& layout)
{
    for (const bool inverse : {false, true}) {
        Reg((inverse ? "FFTInv." : "FFTFwd.") + layout + "." + TypeName<T>(), kRuntime | kPlain, [inverse](Ctx& x) {
            for (unsigned order = 1; order <= 12; ++order) {
                const std::size_t n = std::size_t(1) << order;
                State* state = nullptr;
                FFTInit(&state, order);
                unsigned bufSize = 1;
                FFTGetBufSize(state, &bufSize);
                x.out.Value(bufSize);
                if constexpr (kLayout == 0) {
                    const auto src = x.In<T>(order, n + 2);
                    std::vector<T> dst(n + 2);
                    inverse ? FFTInv(src.data(), dst.data(), state, nullptr)
                            : FFTFwd(src.data(), dst.data(), state, nullptr);
                    x.out(dst.data(), inverse ? n : n + 2);
                } else if constexpr (kLayout == 1) {
                    const auto src = x.In<std::complex<T>>(order, n);
                    std::vector<std::complex<T>> dst(n);
                    inverse ? FFTInv(src.data(), dst.data(), state, nullptr)
                            : FFTFwd(src.data(), dst.data(), state, nullptr);
                    x.out(dst);
                } else {
                    const auto re = x.In<T>(order, n), im = x.In<T>(order + 20, n);
                    std::vector<T> dr(n), di(n);
                    inverse ? FFTInv(re.data(), im.data(), dr.data(), di.data(), state, nullptr)
                            : FFTFwd(re.data(), im.data(), dr.data(), di.data(), state, nullptr);
                    x.out(dr), x.out(di);
                }
                FFTFree(state);
            }
        });
    }
}

// Lengths that round up (725), down (724, 1000) and to a small order (3).
template <class State, class T>
void RegisterFFTImpl()
{
    Reg("FFTImpl." + TypeName<T>(), kRuntime | kPlain, [](Ctx& x) {
        FFTImpl<State, std::complex<T>> none, impl(5, 0);
        x.out.Value(none.GetOrder()), x.out.Value(none.GetFFTSize()), x.out.Value(none.GetBlockSize());
        for (const unsigned length : {0u, 725u, 3u, 724u, 1000u}) {
            if (length) impl.SetFFTSize(length);
            const unsigned n = impl.GetBlockSize();
            x.out.Value(impl.GetOrder()), x.out.Value(impl.GetFFTSize()), x.out.Value(n);
            const auto re = x.In<T>(length + 1, n), im = x.In<T>(length + 2, n);
            std::vector<T> fr(n), fi(n), ir(n), ii(n);
            impl.ProcessFwd(re.data(), im.data(), fr.data(), fi.data());
            impl.ProcessInv(re.data(), im.data(), ir.data(), ii.data());
            x.out(fr), x.out(fi), x.out(ir), x.out(ii);
        }
    });
}

// Streaming splits of each filter, the single-sample forms and the state
// records' outputs (delay lines, taps set later).
void RegisterFilters()
{
    Reg("FIR.f32", kPlain, [](Ctx& x) {
        const auto taps = x.In<float>(1, 37), src = x.In<float>(2, 512), delay = x.In<float>(3, 36);
        const std::vector<std::vector<unsigned>> splitsList = {{512}, {256, 256}, {100, 313, 99}};
        for (const auto& splits : splitsList) {
            FIRState_Float* fir = nullptr;
            FIRInit(&fir, taps.data(), 37, delay.data());
            std::vector<float> dst(512), line(36);
            for (unsigned at = 0, k = 0; k < splits.size(); at += splits[k++])
                FIR(fir, splits[k], src.data() + at, dst.data() + at);
            FIRGetDlyLine(fir, line.data());
            x.out(dst), x.out(line);
            FIRFree(fir);
        }
        FIRState_Float* fir = nullptr;
        FIRInit(&fir, nullptr, 37, nullptr);
        FIRSetTaps(fir, taps.data());
        FIRSetDlyLine(fir, delay.data());
        for (unsigned i = 0; i < 8; ++i) x.out.Value(FIR(fir, src[i]));
        std::vector<float> dst(64);
        FIR(fir, 64, src.data(), dst.data());
        FIRSetDlyLine(fir, nullptr);
        FIR(fir, 32, src.data(), dst.data() + 32);
        x.out(dst), x.out.Value(FIRGetWorkBufferSize(37));
        FIRFree(fir);
    });
    ForTypes<float, double>([](auto t) {
        using T = decltype(t);
        using State = std::conditional_t<std::is_same<T, float>::value, IIRState_Float, IIRState_Double>;
        for (const bool biquad : {false, true}) {
            Reg(std::string(biquad ? "IIRInit_BiQuad." : "IIRInit.") + TypeName<T>(), kPlain, [biquad](Ctx& x) {
                // Stable by construction: feedback taps below 1/4 in size, a0 of 1.25 divided out.
                auto taps = x.In<T>(1, 18);
                for (std::size_t i = 0; i < taps.size(); ++i) taps[i] /= (biquad ? i % 6 >= 3 : i >= 4) ? T(64) : T(4);
                const unsigned a0 = biquad ? 3 : 4, states = biquad ? 6 : 3;
                taps[a0] = T(1.25);
                const auto src = x.In<T>(2, 512), delay = x.In<T>(3, states);
                State* iir = nullptr;
                biquad ? IIRInit_BiQuad(&iir, taps.data(), 3, delay.data()) : IIRInit(&iir, taps.data(), 3, delay.data());
                std::vector<T> dst(src), line(states);
                IIR(200, src.data(), dst.data(), iir);
                IIR_InPlace(300, dst.data() + 200, iir);
                for (std::size_t i = 500; i < 512; ++i) dst[i] = IIR(src[i], iir);
                IIRGetDlyLine(iir, line.data());
                x.out(dst), x.out(line);
                IIRSetTaps(iir, taps.data());
                IIRSetDlyLine(iir, nullptr);
                IIR(64, src.data(), dst.data(), iir);
                IIRSetDlyLine(iir, delay.data());
                IIR(64, src.data(), dst.data() + 64, iir);
                x.out(dst.data(), 128);
                IIRFree(iir);
            });
        }
        // U/D of 3/2 in one call, 2/1 in two calls and one in place (only the
        // history moves on), then a last call.
        Reg("MRFProcess." + TypeName<T>(), kPlain, [](Ctx& x) {
            const auto taps = x.In<T>(1, 31), src = x.In<T>(2, 2 * kN);
            const std::vector<T, kestcore::allocator::STLAllocator<T>> reserved;
            std::conditional_t<std::is_same<T, float>::value, MRFState_Float, MRFState_Double>* mrf = nullptr;
            MRFInit(&mrf, 3, 2, taps.data(), 31, reserved, 0, 0);
            std::vector<T> dst(3 * kN);
            MRFProcess(src.data(), dst.data(), 60, mrf);
            x.out(dst.data(), 180);
            MRFFree(mrf);
            MRFInit(&mrf, 2, 1, taps.data(), 30, reserved, 2, 7);
            MRFProcess(src.data(), dst.data(), 60, mrf);
            MRFProcess(src.data() + 60, dst.data() + 120, 43, mrf);
            std::vector<T> same(src.begin(), src.begin() + 40);
            MRFProcess(same.data(), same.data(), 20, mrf);
            MRFProcess(src.data() + 103, dst.data() + 206, 50, mrf);
            x.out(dst.data(), 306), x.out(same);
            MRFFree(mrf);
        });
    });
    RegisterFFT<FFTState_Float, float, 0>("real");
    RegisterFFT<FFTState_Double, double, 0>("real");
    RegisterFFT<FFTState_Complex_Float_Interleaved, float, 1>("interleaved");
    RegisterFFT<FFTState_Complex_Double_Interleaved, double, 1>("interleaved");
    RegisterFFT<FFTState_Complex_Float_Deinterleaved, float, 2>("split");
    RegisterFFT<FFTState_Complex_Double_Deinterleaved, double, 2>("split");
    RegisterFFTImpl<FFTState_Complex_Float_Deinterleaved, float>();
    RegisterFFTImpl<FFTState_Complex_Double_Deinterleaved, double>();
}

}  // namespace

int main()
{
    RegisterArithmetic(), RegisterElementwise(), RegisterReductions(), RegisterThresholds();
    RegisterBuffersAndFormats(), RegisterDSP(), RegisterFilters();
    std::set<std::string> seen;  // names differ also without case: Windows folders ignore it
    std::FILE* list = std::fopen("cases.txt", "wb");
    for (const Case& c : cases) {
        std::string lower = c.name;
        std::transform(lower.begin(), lower.end(), lower.begin(), [](unsigned char ch) { return std::tolower(ch); });
        if (!seen.insert(lower).second) {
            std::fprintf(stderr, "two cases named %s\n", c.name.c_str());
            return 1;
        }
        Ctx x{(c.flags & kPlain) == 0, Out((c.flags & kBits) != 0)};
        c.run(x);
        std::FILE* file = std::fopen(c.name.c_str(), "wb");
        if (!list || !file || std::fwrite(x.out.bytes().data(), 1, x.out.bytes().size(), file) != x.out.bytes().size()) {
            std::fprintf(stderr, "cannot write %s\n", c.name.c_str());
            return 1;
        }
        std::fclose(file);
        const char* section = c.flags & kRuntime ? "runtime" : c.flags & kMultiply ? "multiply" : "exact";
        std::fprintf(list, "%s %s\n", section, c.name.c_str());
    }
    return std::fclose(list) == 0 ? 0 : 1;
}
