#pragma once

#include <complex>

#include "kestaccel/Common.h"

namespace kestaccel {
namespace utility {

// @@module DSP

}  // namespace utility
}  // namespace kestaccel
