#pragma once

#include <cstddef>

#include "kestcore/Export.h"

namespace kestcore {
namespace allocator {
namespace MemoryRecycler {

// Returns a block of at least byteCount bytes, never null; throws
// std::bad_alloc when the heap is exhausted. reportedBytes is left as the
// caller set it: this stand-in has no size classes to report.
KESTCORE_API void* Allocate(std::size_t byteCount, std::size_t& reportedBytes);

// Gives back a block from Allocate; byteCount is the count asked of Allocate.
KESTCORE_API void Recycle(void* block, std::size_t byteCount);

}  // namespace MemoryRecycler
}  // namespace allocator
}  // namespace kestcore
