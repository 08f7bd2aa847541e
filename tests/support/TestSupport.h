#pragma once

// Helpers shared by the test suites: bit-pattern comparison, output buffers
// guarded by a sentinel past their end, and reproducible random data.

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <complex>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <sstream>
#include <string>
#include <type_traits>
#include <vector>

namespace kestaccel_test {

// The element types of the typed suites that cover both precisions.
using FloatingTypes = ::testing::Types<float, double>;

// The unsigned integer type of the same width as T.
template <class T>
using BitsType = std::conditional_t<sizeof(T) == 4, std::uint32_t, std::uint64_t>;

template <class T>
BitsType<T> Bits(T value)
{
    BitsType<T> bits;
    std::memcpy(&bits, &value, sizeof bits);
    return bits;
}

template <class T>
T FromBits(BitsType<T> bits)
{
    T value;
    std::memcpy(&value, &bits, sizeof value);
    return value;
}

// The quiet NaN of T with `payload` in its low fraction bits and a clear sign.
template <class T>
T QuietNaN(std::uint64_t payload = 0)
{
    return FromBits<T>(Bits(std::numeric_limits<T>::quiet_NaN()) | static_cast<BitsType<T>>(payload));
}

// KESTACCEL_PROBE(Name, call written with T): Name<T>::value tells whether the
// call compiles, so that overloads left out on purpose stay out. Arg<U>() is a
// value of type U for such unevaluated calls.
template <class U>
U Arg();
#define KESTACCEL_PROBE(Name, ...)                                           \
    template <class T, class = void>                                          \
    struct Name : std::false_type {};                                         \
    template <class T>                                                        \
    struct Name<T, std::void_t<decltype(__VA_ARGS__)>> : std::true_type {};

// A deliberate gap: the probe sees the overload for Has and none for Lacks.
template <template <class...> class Probe, class Has, class Lacks>
constexpr bool kGap = Probe<Has>::value && !Probe<Lacks>::value;

// Equality of bit patterns, printed in hex, so that -0 against +0 and one NaN
// payload against another both fail.
template <class T>
std::string HexBits(T value)
{
    std::ostringstream text;
    text << value << " (0x" << std::hex << Bits(value) << ")";
    return text.str();
}

template <class T>
::testing::AssertionResult SameBits(T expected, T actual)
{
    if (Bits(expected) == Bits(actual)) return ::testing::AssertionSuccess();
    // Formatted first: a stream manipulator does not carry from one streamed
    // value to the next inside an assertion message.
    return ::testing::AssertionFailure() << "expected " << HexBits(expected) << ", got " << HexBits(actual);
}

template <class T>
::testing::AssertionResult SameBits(std::complex<T> expected, std::complex<T> actual)
{
    auto re = SameBits(expected.real(), actual.real());
    if (!re) return re << " in the real part";
    auto im = SameBits(expected.imag(), actual.imag());
    if (!im) return im << " in the imaginary part";
    return ::testing::AssertionSuccess();
}

// Bitwise equality of two whole arrays; reports the first differing index.
template <class T>
::testing::AssertionResult SameBitsArray(const T* expected, const T* actual, std::size_t count)
{
    for (std::size_t i = 0; i < count; ++i) {
        auto r = SameBits(expected[i], actual[i]);
        if (!r) return r << " at index " << i << " of " << count;
    }
    return ::testing::AssertionSuccess();
}

template <class T>
::testing::AssertionResult SameBitsArray(const std::vector<T>& expected, const std::vector<T>& actual)
{
    if (expected.size() != actual.size())
        return ::testing::AssertionFailure() << "sizes differ: " << expected.size() << " vs " << actual.size();
    return SameBitsArray(expected.data(), actual.data(), expected.size());
}

// A buffer of `count` elements followed by sentinel elements whose bytes are
// a fixed pattern. A function that must write exactly `count` elements leaves
// the sentinel intact; Intact() reports an overrun.
template <class T>
class GuardedBuffer {
public:
    static constexpr std::size_t kGuard = 4;
    static constexpr unsigned char kPattern = 0xA5;

    explicit GuardedBuffer(std::size_t count, T fill = T()) : count_(count), storage_(count + kGuard, fill)
    {
        std::memset(static_cast<void*>(storage_.data() + count_), kPattern, kGuard * sizeof(T));
    }

    T* data() { return storage_.data(); }
    const T* data() const { return storage_.data(); }
    std::size_t size() const { return count_; }
    T& operator[](std::size_t i) { return storage_[i]; }
    const T& operator[](std::size_t i) const { return storage_[i]; }
    std::vector<T> values() const { return std::vector<T>(storage_.begin(), storage_.begin() + count_); }

    ::testing::AssertionResult Intact() const
    {
        const auto* bytes = reinterpret_cast<const unsigned char*>(storage_.data() + count_);
        for (std::size_t i = 0; i < kGuard * sizeof(T); ++i) {
            if (bytes[i] != kPattern)
                return ::testing::AssertionFailure() << "sentinel overwritten " << i << " bytes past the end";
        }
        return ::testing::AssertionSuccess();
    }

private:
    std::size_t count_;
    std::vector<T> storage_;
};

// out[i] against ref(in[i]) (or ref(in[i], i)) bit for bit, with the sentinel
// and count 0; `member` takes (count, src, dst) or, on a copy of the input,
// (count, srcDst). Where it reads and writes one type, dst one element ahead
// of or behind src must give the plain ascending loop's result; there a NaN
// may meet another NaN and keep either payload, so any NaN matches a NaN.
template <class E, class Ref, class Member>
void ExpectMatches(const std::vector<E>& in, Ref ref, Member member)
{
    const auto at = [&ref](E x, std::size_t i) {
        if constexpr (std::is_invocable<Ref, E, std::size_t>::value) return ref(x, i);
        else return ref(x);
    };
    using D = decltype(at(E(), 0));
    constexpr bool inPlace = std::is_invocable<Member, unsigned int, E*>::value;
    const auto n = static_cast<unsigned int>(in.size());
    GuardedBuffer<D> out(n), none(0);
    if constexpr (inPlace) {
        std::copy(in.begin(), in.end(), out.data());
        member(n, out.data());
        member(0u, none.data());
    } else {
        member(n, in.data(), out.data());
        member(0u, static_cast<const E*>(nullptr), none.data());
    }
    for (std::size_t i = 0; i < n; ++i) ASSERT_TRUE(SameBits(at(in[i], i), out[i])) << "at index " << i << " of " << n;
    EXPECT_TRUE(out.Intact() && none.Intact());
    if constexpr (!inPlace && std::is_same<D, E>::value) {
        for (const std::size_t ahead : {1, 0}) {
            std::vector<E> buffer(in);
            buffer.push_back(E(0.75));
            auto chained = buffer;
            for (std::size_t i = 0; i < n; ++i) chained[i + ahead] = at(chained[i + 1 - ahead], i);
            member(n, buffer.data() + 1 - ahead, buffer.data() + ahead);
            for (std::size_t i = 0; i <= n; ++i) {
                if constexpr (std::is_floating_point<E>::value)
                    if (std::isnan(chained[i]) && std::isnan(buffer[i])) continue;
                ASSERT_TRUE(SameBits(chained[i], buffer[i])) << "at index " << i << " with dst one element "
                                                             << (ahead ? "ahead" : "behind");
            }
        }
    }
}

// Reproducible random data. Each test names its seed; a failure message
// carries it through SCOPED_TRACE so that the case can be replayed.
template <class T>
std::vector<T> RandomReals(std::size_t count, std::uint32_t seed, T low = T(-1), T high = T(1))
{
    std::mt19937 engine(seed);
    std::uniform_real_distribution<T> dist(low, high);
    std::vector<T> values(count);
    for (auto& v : values) v = dist(engine);
    return values;
}

template <class T>
std::vector<std::complex<T>> RandomComplex(std::size_t count, std::uint32_t seed, T low = T(-1), T high = T(1))
{
    auto parts = RandomReals<T>(2 * count, seed, low, high);
    std::vector<std::complex<T>> values(count);
    for (std::size_t i = 0; i < count; ++i) values[i] = {parts[2 * i], parts[2 * i + 1]};
    return values;
}

inline std::string SeedTrace(std::uint32_t seed) { return "seed " + std::to_string(seed); }

constexpr double kPi = 3.14159265358979323846;

// |sum of v[n] exp(-2 pi i f n)| over n < count, in double: the gain of a
// filter from its taps, or the amplitude of a tone of frequency f (cycles
// per sample) in a measured span, times count / 2.
template <class T>
double DtftMagnitude(const T* v, std::size_t count, double f)
{
    std::complex<double> acc = 0.0;
    for (std::size_t n = 0; n < count; ++n) acc += double(v[n]) * std::polar(1.0, -2.0 * kPi * f * double(n));
    return std::abs(acc);
}

// Sizes that reach the vector body, the scalar tail and odd remainders.
inline const std::vector<unsigned int>& InterestingSizes()
{
    static const std::vector<unsigned int> sizes = {1, 2, 3, 4, 5, 7, 8, 15, 16, 17, 31, 32, 33, 63, 64, 65, 127, 1023, 4099};
    return sizes;
}

// The same sizes with 0 first, which must write nothing.
inline std::vector<unsigned int> SizesWithZero()
{
    std::vector<unsigned int> sizes = InterestingSizes();
    sizes.insert(sizes.begin(), 0u);
    return sizes;
}

}  // namespace kestaccel_test
