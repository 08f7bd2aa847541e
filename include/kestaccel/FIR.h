#pragma once

#include "kestaccel/Common.h"

namespace kestaccel {
namespace filter {

// ---------------------------------------------------------------------------
// FIR filter.
// ---------------------------------------------------------------------------
// @@section fir-filter

// ---------------------------------------------------------------------------
// Lowpass FIR design.
// ---------------------------------------------------------------------------
// @@section lowpass-design

}  // namespace filter
}  // namespace kestaccel
