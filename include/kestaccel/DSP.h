#pragma once

#include <complex>

#include "kestaccel/Common.h"

namespace kestaccel {
namespace utility {

// ---------------------------------------------------------------------------
// Dot product.
// ---------------------------------------------------------------------------
// @@section dot-product

// ---------------------------------------------------------------------------
// Convolution and rate change.
// ---------------------------------------------------------------------------
// @@section convolution

}  // namespace utility
}  // namespace kestaccel
