#pragma once

// Types shared by every module: the opaque state records that callers hold
// through pointers, and the two enumerations of the interface.

#include <complex>

#include "kestaccel/Export.h"

namespace kestaccel {

// Opaque state records. Each is created by its module's Init call, owned by
// the caller until the matching Free call, and used by one thread at a time.
struct FIRState_Float;
struct IIRState_Float;
struct IIRState_Double;
struct MRFState_Float;
struct MRFState_Double;
struct FFTState_Float;
struct FFTState_Double;
struct FFTState_Complex_Float_Interleaved;
struct FFTState_Complex_Double_Interleaved;
struct FFTState_Complex_Float_Deinterleaved;
struct FFTState_Complex_Double_Deinterleaved;

// Storage order of the matrices of Multiply. The underlying type is fixed at
// 32 bits so that a value no enumerator names can still be passed.
enum MatrixDataOrder : int {
    RowMajor = 0,  // element (r, c) of an n-column matrix at r * n + c
    ColMajor = 1,  // element (r, c) of an m-row matrix at c * m + r
};

namespace utility {

// Window applied by GenerateLowpassFIRCoefficients. Any value not named here
// (1 included) applies no window. 32-bit underlying type, as above.
enum DSPWindowType : int {
    kDSPWindowBartlett = 0,
    kDSPWindowHamming = 2,
    kDSPWindowHann = 3,
};

}  // namespace utility
}  // namespace kestaccel
