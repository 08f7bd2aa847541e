#pragma once

#include <complex>

#include "kestaccel/Common.h"

namespace kestaccel {
namespace transform {

// @@module FFT

}  // namespace transform
}  // namespace kestaccel
