#pragma once

#include <complex>

#include "kestaccel/Common.h"

namespace kestaccel {
namespace utility {

// @@module Window

}  // namespace utility
}  // namespace kestaccel
