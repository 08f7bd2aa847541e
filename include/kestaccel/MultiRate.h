#pragma once

#include "kestaccel/Common.h"

namespace kestaccel {
namespace filter {

// @@module MultiRate

}  // namespace filter
}  // namespace kestaccel
