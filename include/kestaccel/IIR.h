#pragma once

#include "kestaccel/Common.h"

namespace kestaccel {
namespace filter {

// @@module IIR

}  // namespace filter
}  // namespace kestaccel
