#pragma once

#include <complex>

#include "kestaccel/Common.h"

namespace kestaccel {
namespace utility {

// @@module MatrixUtils

}  // namespace utility
}  // namespace kestaccel
