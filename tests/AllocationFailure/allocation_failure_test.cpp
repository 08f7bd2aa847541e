// Every creating call under allocation failure: the k-th allocation fails,
// for k = 1, 2, ... until the call completes. std::bad_alloc reaches the
// caller unchanged, the caller's pointer keeps its value (the multi-rate
// filter alone stores its record first), and once the caller has released
// what it holds, nothing is left allocated.

#include <kestaccel/kestaccel.h>

#include <functional>
#include <new>

#include "support/AllocationCount.h"

namespace {

using namespace kestaccel;
using namespace kestaccel::filter;
using namespace kestaccel::transform;
using namespace kestaccel::utility;
using kestaccel_test::CurrentAllocationTally;
using kestaccel_test::FailAllocationNumber;
using kestaccel_test::ResetAllocationTally;

// The multi-rate filter alone stores its record before building the rest.
enum class PointerRule { Unchanged, StoredFirst };

// `create` makes something into *held, which starts as `start()` (made with
// no failure armed) or as a value no call may write; `release` gives back
// whatever *held points to.
template <class P>
void FailEachAllocation(const char* name, PointerRule rule, const std::function<void(P*)>& create,
                        const std::function<void(P)>& release, const std::function<P()>& start = nullptr)
{
    for (std::size_t k = 1;; ++k) {
        SCOPED_TRACE(std::string(name) + ", allocation " + std::to_string(k) + " fails");
        ASSERT_LT(k, 64u) << "the call never completed";
        ResetAllocationTally();
        P const initial = start ? start() : reinterpret_cast<P>(std::uintptr_t(0x5a5a5a50));
        P held = initial;
        FailAllocationNumber(k);
        bool threw = false;
        try {
            create(&held);
        } catch (const std::bad_alloc&) {
            threw = true;
        }
        FailAllocationNumber(0);
        // A record stored first is there unless its own allocation failed.
        if (threw) {
            EXPECT_EQ(rule == PointerRule::Unchanged || k == 1, held == initial);
        }
        if (start || held != initial) release(held);
        const auto tally = CurrentAllocationTally();
        EXPECT_EQ(tally.news, tally.deletes) << "blocks left allocated";
        if (!threw) {
            EXPECT_GT(k, 1u) << "the call allocates nothing";
            return;
        }
    }
}

template <class State>
void FailEachFFTInit(const char* name, unsigned int order)
{
    FailEachAllocation<State*>(
        name, PointerRule::Unchanged, [order](State** s) { FFTInit(s, order); }, [](State* s) { FFTFree(s); });
}

template <class Impl>
void FailEachFFTImpl(const char* name)
{
    FailEachAllocation<Impl*>(
        name, PointerRule::Unchanged, [](Impl** p) { *p = new Impl(0, 1000); }, [](Impl* p) { delete p; });
    // SetFFTSize releases the old state first; a failure leaves the object
    // without a state, and its destructor releases the rest.
    FailEachAllocation<Impl*>(
        name, PointerRule::Unchanged, [](Impl** p) { (*p)->SetFFTSize(1024); }, [](Impl* p) { delete p; },
        [] { return new Impl(9, 0); });
}

template <class T, class State>
void FailEachMRFInit(const char* name)
{
    const T taps[12] = {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12};
    FailEachAllocation<State*>(
        name, PointerRule::StoredFirst,
        [&taps](State** s) { MRFInit(s, 3, 2, taps, 12, {}, 0, 0); }, [](State* s) { MRFFree(s); });
}

template <class T, class State>
void FailEachIIRInit(const char* name)
{
    const T taps[12] = {1, 0.5, 0.25, 1, -0.5, 0.25, 1, 0.5, 0.25, 1, -0.5, 0.25};
    FailEachAllocation<State*>(
        name, PointerRule::Unchanged, [&taps](State** s) { IIRInit(s, taps, 2, nullptr); },
        [](State* s) { IIRFree(s); });
    FailEachAllocation<State*>(
        name, PointerRule::Unchanged, [&taps](State** s) { IIRInit_BiQuad(s, taps, 2, nullptr); },
        [](State* s) { IIRFree(s); });
}

TEST(AllocationFailure, EveryCreatingCallReleasesWhatItBuiltAndRethrows)
{
    KESTACCEL_REQUIRE_ALLOCATION_COUNTING();
    FailEachFFTInit<FFTState_Float>("real float FFT", 6);
    FailEachFFTInit<FFTState_Double>("real double FFT", 6);
    FailEachFFTInit<FFTState_Complex_Float_Interleaved>("interleaved float FFT", 6);
    FailEachFFTInit<FFTState_Complex_Double_Interleaved>("interleaved double FFT", 6);
    FailEachFFTInit<FFTState_Complex_Float_Deinterleaved>("deinterleaved float FFT", 6);
    FailEachFFTInit<FFTState_Complex_Double_Deinterleaved>("deinterleaved double FFT", 6);
    FailEachFFTImpl<FFTImpl<FFTState_Complex_Float_Deinterleaved, std::complex<float>>>("float FFTImpl");
    FailEachFFTImpl<FFTImpl<FFTState_Complex_Double_Deinterleaved, std::complex<double>>>("double FFTImpl");
    FailEachMRFInit<float, MRFState_Float>("float multi-rate filter");
    FailEachMRFInit<double, MRFState_Double>("double multi-rate filter");
    FailEachIIRInit<float, IIRState_Float>("float IIR filter");
    FailEachIIRInit<double, IIRState_Double>("double IIR filter");
    const float firTaps[5] = {1, 2, 3, 2, 1};
    FailEachAllocation<FIRState_Float*>(
        "FIR filter", PointerRule::Unchanged, [&firTaps](FIRState_Float** s) { FIRInit(s, firTaps, 5, nullptr); },
        [](FIRState_Float* s) { FIRFree(s); });
    FailEachAllocation<float*>(
        "Malloc_Float", PointerRule::Unchanged, [](float** p) { *p = Malloc_Float(16); }, [](float* p) { Free(p); });
    FailEachAllocation<std::complex<double>*>(
        "Malloc_Complex_Double", PointerRule::Unchanged,
        [](std::complex<double>** p) { *p = Malloc_Complex_Double(16); }, [](std::complex<double>* p) { Free(p); });
}

}  // namespace
