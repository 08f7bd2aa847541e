#include "kestcore/allocator/MemoryRecycler.h"

#include <new>

namespace kestcore {
namespace allocator {
namespace MemoryRecycler {

// The stand-in pools nothing: the global heap is already safe to call from
// several threads, which is all the filters need of it.
void* Allocate(std::size_t byteCount, std::size_t& /*reportedBytes*/)
{
    return ::operator new(byteCount == 0 ? 1 : byteCount);
}

void Recycle(void* block, std::size_t /*byteCount*/)
{
    ::operator delete(block);
}

}  // namespace MemoryRecycler
}  // namespace allocator
}  // namespace kestcore
