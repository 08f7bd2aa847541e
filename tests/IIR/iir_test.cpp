// IIR filter: every form against a plain transposed-form loop, the init
// calls' normalisation, setters and null cases, allocation, a lowpass on a tone.

#include <kestaccel/IIR.h>

#include "support/AllocationCount.h"
#include "support/TestSupport.h"

namespace {

using namespace kestaccel_test;
namespace kf = kestaccel::filter;

template <class T>
using StateOf =
    std::conditional_t<std::is_same<T, float>::value, kestaccel::IIRState_Float, kestaccel::IIRState_Double>;

// On taps already divided by a0, each operation rounded in this order.
template <class T>
struct PlainCascade {
    unsigned int order;
    std::vector<T> taps;   // sections of 2 * order + 2, a0 included but unread
    std::vector<T> state;  // order per section

    T Step(T x)
    {
        for (std::size_t s = 0; s < state.size() / order; ++s) {
            const T *b = &taps[s * (2 * order + 2)], *a = b + order + 1;
            T* d = &state[s * order];
            const T y = b[0] * x + d[0];
            for (std::size_t i = 0; i + 1 < order; ++i) d[i] = (b[i + 1] * x + d[i + 1]) - a[i + 1] * y;
            d[order - 1] = b[order] * x - a[order] * y;
            x = y;
        }
        return x;
    }
};

// a0 = `leading` in every section; small feedback taps keep the output bounded.
template <class T>
std::vector<T> RandomSections(unsigned int order, unsigned int sections, T leading, std::uint32_t seed)
{
    auto taps = RandomReals<T>(2 * (order + 1) * sections, seed, T(-0.3), T(0.3));
    for (unsigned int s = 0; s < sections; ++s) taps[s * (2 * order + 2) + order + 1] = leading;
    return taps;
}

// Order 2 through the biquad init, any other order through the general one.
template <class T>
StateOf<T>* Create(unsigned int order, unsigned int sections, const std::vector<T>& taps, const T* initial)
{
    StateOf<T>* state = nullptr;
    if (order == 2)
        kf::IIRInit_BiQuad(&state, taps.data(), sections, initial);
    else
        kf::IIRInit(&state, taps.data(), order, initial);
    EXPECT_NE(nullptr, state);
    return state;
}

template <class T>
std::vector<T> DelayLine(const StateOf<T>* state, std::size_t count)
{
    GuardedBuffer<T> out(count);
    kf::IIRGetDlyLine(state, out.data());
    EXPECT_TRUE(out.Intact());
    return out.values();
}

template <class T>
class IIRFilter : public ::testing::Test {};
TYPED_TEST_SUITE(IIRFilter, FloatingTypes);

// 0.6 from rest through order 10, and through two biquads scaled by the first
// a0 (0.111), not the second's (0.08): 0.6 * 0.0031 / 0.111 * 0.074 / 0.111.
TYPED_TEST(IIRFilter, KnownFirstOutputs)
{
    using T = TypeParam;
    const std::vector<T> taps = {T(0.0031), T(0.014),   T(0.0069), T(0.111),  T(0.2119), T(0.0091), T(0.074),  T(0.1),
                                 T(1.0),    T(0.0),     T(0.0),    T(0.08),   T(1.0),    T(0.005),  T(0.0005), T(0.33),
                                 T(0.044),  T(0.00035), T(0.0),    T(0.7779), T(0.113),  T(0.006)};
    std::vector<T> biquads(taps.begin(), taps.begin() + 9);
    biquads.insert(biquads.end(), {T(0.08), T(1.0), T(0.005)});
    StateOf<T>* order10 = Create<T>(10, 1, taps, nullptr);
    StateOf<T>* cascade = Create<T>(2, 2, biquads, nullptr);
    T block[1] = {T(0.6)};
    kf::IIR(1, block, block, cascade);
    const double eps = std::numeric_limits<T>::epsilon();  // relative, one rounding
    EXPECT_NEAR(0.02325, kf::IIR(T(0.6), order10), 0.02325 * eps);
    EXPECT_NEAR(0.01117117117117117, block[0], 0.01117117117117117 * eps);
    kf::IIRFree(order10);
    kf::IIRFree(cascade);
}

// Single-sample, block and in-place forms and the states they leave, bit for
// bit; every biquad section is scaled by the first one's 1 / a0.
TYPED_TEST(IIRFilter, AllFormsMatchThePlainRecursion)
{
    using T = TypeParam;
    const struct {
        unsigned int order, sections;
    } shapes[] = {{1, 1}, {2, 1}, {2, 2}, {2, 3}, {2, 5}, {3, 1}, {4, 1}, {6, 1}, {10, 1}};
    for (const auto& shape : shapes) {
        for (unsigned int count : {0u, 1u, 2u, 5u, 64u, 333u}) {
            const std::uint32_t seed = shape.order * 1000 + shape.sections * 100 + count;
            SCOPED_TRACE(SeedTrace(seed));
            const std::size_t states = shape.order * shape.sections;
            auto taps = RandomSections<T>(shape.order, shape.sections, T(1.37), seed);
            for (unsigned int s = 1; s < shape.sections; ++s) taps[6 * s + 3] = T(0.5) + T(s);
            const auto initial = RandomReals<T>(states, seed + 1, T(-0.5), T(0.5));
            const auto input = RandomReals<T>(count, seed + 2);
            StateOf<T>* states3[3];
            for (auto& state : states3) state = Create<T>(shape.order, shape.sections, taps, initial.data());
            std::vector<T> scaled(taps.size()), expected(count), singles(count);
            const T r = T(1) / taps[shape.order + 1];
            for (std::size_t i = 0; i < taps.size(); ++i) scaled[i] = r * taps[i];
            PlainCascade<T> plain{shape.order, scaled, initial};
            for (unsigned int i = 0; i < count; ++i) expected[i] = plain.Step(input[i]);
            for (unsigned int i = 0; i < count; ++i) singles[i] = kf::IIR(input[i], states3[0]);
            GuardedBuffer<T> out(count), buffer(count);
            std::copy(input.begin(), input.end(), buffer.data());
            kf::IIR(count, input.data(), out.data(), states3[1]);
            kf::IIR_InPlace(count, buffer.data(), states3[2]);
            EXPECT_TRUE(SameBitsArray(expected, singles));
            EXPECT_TRUE(SameBitsArray(expected, out.values()) && out.Intact());
            EXPECT_TRUE(SameBitsArray(expected, buffer.values()) && buffer.Intact());
            for (StateOf<T>* state : states3) {
                EXPECT_TRUE(SameBitsArray(plain.state, DelayLine<T>(state, states)));
                kf::IIRFree(state);
            }
        }
    }
}

// Null arguments change nothing; SetDlyLine(null) clears only the first
// section; SetTaps stores what it is given (an a0 of 2 is not read).
TYPED_TEST(IIRFilter, SettersAndNullCases)
{
    using T = TypeParam;
    using State = StateOf<T>;
    const auto taps = RandomSections<T>(2, 3, T(1), 81);
    const auto initial = RandomReals<T>(6, 82), other = RandomReals<T>(6, 83);
    State* const marker = reinterpret_cast<State*>(static_cast<std::uintptr_t>(0x4321));
    State* state = marker;
    kf::IIRInit(&state, static_cast<const T*>(nullptr), 2, nullptr);
    kf::IIRInit(&state, taps.data(), 0, nullptr);
    kf::IIRInit_BiQuad(&state, static_cast<const T*>(nullptr), 1, nullptr);
    kf::IIRInit_BiQuad(&state, taps.data(), 0, nullptr);
    EXPECT_EQ(marker, state);
    kf::IIRInit(static_cast<State**>(nullptr), taps.data(), 2, nullptr);
    kf::IIRInit_BiQuad(static_cast<State**>(nullptr), taps.data(), 1, nullptr);

    state = Create<T>(2, 3, taps, initial.data());
    kf::IIRSetTaps(state, static_cast<const T*>(nullptr));
    kf::IIRSetTaps(static_cast<State*>(nullptr), taps.data());
    kf::IIRSetDlyLine(static_cast<State*>(nullptr), other.data());
    kf::IIRGetDlyLine(state, static_cast<T*>(nullptr));
    GuardedBuffer<T> untouched(0);
    kf::IIRGetDlyLine(static_cast<const State*>(nullptr), untouched.data());
    EXPECT_TRUE(untouched.Intact());
    kf::IIRFree(static_cast<State*>(nullptr));
    EXPECT_TRUE(SameBitsArray(initial, DelayLine<T>(state, 6)));
    PlainCascade<T> plain{2, taps, initial};
    for (T x : RandomReals<T>(20, 84)) ASSERT_TRUE(SameBits(plain.Step(x), kf::IIR(x, state)));

    kf::IIRSetDlyLine(state, other.data());
    EXPECT_TRUE(SameBitsArray(other, DelayLine<T>(state, 6)));
    kf::IIRSetDlyLine(state, static_cast<const T*>(nullptr));
    EXPECT_TRUE(SameBitsArray({T(0), T(0), other[2], other[3], other[4], other[5]}, DelayLine<T>(state, 6)));

    plain = PlainCascade<T>{2, RandomSections<T>(2, 3, T(2), 85), DelayLine<T>(state, 6)};
    kf::IIRSetTaps(state, plain.taps.data());
    for (T x : RandomReals<T>(100, 86)) ASSERT_TRUE(SameBits(plain.Step(x), kf::IIR(x, state)));
    kf::IIRFree(state);
}

// After init the filter allocates nothing, and Free gives back every block.
TYPED_TEST(IIRFilter, FilteringAllocatesNothingAndFreeReleasesAll)
{
    KESTACCEL_REQUIRE_ALLOCATION_COUNTING();
    using T = TypeParam;
    for (unsigned int order : {2u, 4u}) {
        const auto taps = RandomSections<T>(order, 6 / order, T(1.1), 77);
        const auto input = RandomReals<T>(700, 78);
        std::vector<T> out(input.size()), buffer(input);
        ResetAllocationTally();
        StateOf<T>* state = Create<T>(order, 6 / order, taps, nullptr);
        const std::size_t afterInit = CurrentAllocationTally().news;
        EXPECT_GT(afterInit, 0u);
        kf::IIR(700u, input.data(), out.data(), state);
        kf::IIR_InPlace(700u, buffer.data(), state);
        kf::IIR(input[0], state);
        EXPECT_EQ(afterInit, CurrentAllocationTally().news) << "a filtering call allocated";
        kf::IIRFree(state);
        EXPECT_EQ(CurrentAllocationTally().news, CurrentAllocationTally().deletes);
    }
}

// A 1 kHz biquad lowpass at 48 kHz, alone and doubled, attenuates an 8 kHz
// tone by what its response predicts (two poles: about 12 dB per octave).
TYPED_TEST(IIRFilter, BiquadLowpassAttenuatesAToneAboveTheCutoff)
{
    using T = TypeParam;
    const double w0 = 2.0 * kPi * 1000.0 / 48000.0, alpha = std::sin(w0) / std::sqrt(2.0), c = std::cos(w0);
    const std::vector<T> section = {T((1 - c) / 2), T(1 - c), T((1 - c) / 2), T(1 + alpha), T(-2 * c), T(1 - alpha)};
    const double f = 8000.0 / 48000.0;
    const T r = T(1) / section[3];
    const std::complex<double> z1 = std::polar(1.0, -2.0 * kPi * f), z2 = z1 * z1;
    const auto num = double(r * section[0]) + double(r * section[1]) * z1 + double(r * section[2]) * z2;
    const auto den = 1.0 + double(r * section[4]) * z1 + double(r * section[5]) * z2;
    const double perSection = 20.0 * std::log10(std::abs(num / den));
    EXPECT_LT(perSection, -33.0);
    EXPECT_GT(perSection, -39.0);
    for (unsigned int sections : {1u, 2u}) {
        SCOPED_TRACE(sections);
        std::vector<T> taps(section);
        if (sections == 2) taps.insert(taps.end(), section.begin(), section.end());
        StateOf<T>* state = Create<T>(2, sections, taps, nullptr);
        std::vector<T> signal(9600);  // settle for 4800 samples, measure the next 4800
        for (std::size_t n = 0; n < signal.size(); ++n) signal[n] = T(std::sin(2.0 * kPi * f * double(n)));
        kf::IIR_InPlace(9600u, signal.data(), state);
        kf::IIRFree(state);
        const double measured = 20.0 * std::log10(2.0 * DtftMagnitude(signal.data() + 4800, 4800, f) / 4800.0);
        EXPECT_NEAR(sections * perSection, measured, 0.05);
    }
}

}  // namespace
