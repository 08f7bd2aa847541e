#pragma once

// The six opaque FFT state records. They share one layout: the order given
// to FFTInit, the size it stands for, and the embedded plan (real for the
// real states, complex for the others).

#include <cstdint>

#include "kestaccel/Common.h"
#include "transform/FFT/FFTPlan.h"

namespace kestaccel {
namespace transform {
namespace cpp {

template <class E>
struct FFTStateRecord {
    using Element = E;
    std::uint32_t order;
    std::uint32_t size;  // 1 << (order % 32)
    FFTPlan<E> plan;
};

}  // namespace cpp
}  // namespace transform

struct FFTState_Float : transform::cpp::FFTStateRecord<float> {};
struct FFTState_Double : transform::cpp::FFTStateRecord<double> {};
struct FFTState_Complex_Float_Interleaved : transform::cpp::FFTStateRecord<float> {};
struct FFTState_Complex_Double_Interleaved : transform::cpp::FFTStateRecord<double> {};
struct FFTState_Complex_Float_Deinterleaved : transform::cpp::FFTStateRecord<float> {};
struct FFTState_Complex_Double_Deinterleaved : transform::cpp::FFTStateRecord<double> {};

}  // namespace kestaccel
