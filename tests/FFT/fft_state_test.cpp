// Creation and release of states, and the vestigial work-buffer query.

#include <cstdint>

#include "FFTTestSupport.h"

namespace {

using namespace kestaccel;
using namespace kestaccel::transform;

template <class State>
void ExpectInitRefusal()
{
    State* const marker = reinterpret_cast<State*>(std::uintptr_t(0x1234560));
    State* state = marker;
    FFTInit(&state, 0);
    EXPECT_EQ(state, marker) << "order 0 must leave the caller's variable alone";
    FFTInit(static_cast<State**>(nullptr), 5);  // must simply return
    state = nullptr;
    FFTInit(&state, 1);
    EXPECT_NE(state, nullptr);
    FFTFree(state);
    FFTFree(static_cast<State*>(nullptr));

    unsigned int size = 123;
    FFTGetBufSize(static_cast<const State*>(nullptr), &size);
    EXPECT_EQ(size, 0u);
    size = 123;
    State* made = nullptr;
    FFTInit(&made, 10);
    FFTGetBufSize(made, &size);
    EXPECT_EQ(size, 0u);
    FFTFree(made);
}

TEST(FFTState, InitRefusesOrderZeroAndNullForEveryType)
{
    ExpectInitRefusal<FFTState_Float>();
    ExpectInitRefusal<FFTState_Double>();
    ExpectInitRefusal<FFTState_Complex_Float_Interleaved>();
    ExpectInitRefusal<FFTState_Complex_Double_Interleaved>();
    ExpectInitRefusal<FFTState_Complex_Float_Deinterleaved>();
    ExpectInitRefusal<FFTState_Complex_Double_Deinterleaved>();
}

}  // namespace
