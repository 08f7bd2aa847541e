#pragma once

#include "kestaccel/Common.h"

namespace kestaccel {
namespace filter {

// @@module FIR

}  // namespace filter
}  // namespace kestaccel
