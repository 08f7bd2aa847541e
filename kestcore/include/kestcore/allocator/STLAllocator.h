#pragma once

#include <cstddef>
#include <type_traits>

#include "kestcore/allocator/MemoryRecycler.h"

namespace kestcore {
namespace allocator {

// Stateless standard allocator over MemoryRecycler: every instance can free
// what any other allocated, so containers may swap and move storage freely.
template <class T>
class STLAllocator {
public:
    using value_type = T;
    using is_always_equal = std::true_type;

    STLAllocator() noexcept = default;
    template <class U>
    STLAllocator(const STLAllocator<U>&) noexcept {}

    T* allocate(std::size_t n)
    {
        std::size_t reportedBytes = 0;
        return static_cast<T*>(MemoryRecycler::Allocate(n * sizeof(T), reportedBytes));
    }

    void deallocate(T* p, std::size_t n) noexcept { MemoryRecycler::Recycle(p, n * sizeof(T)); }
};

template <class T, class U>
bool operator==(const STLAllocator<T>&, const STLAllocator<U>&) noexcept { return true; }

template <class T, class U>
bool operator!=(const STLAllocator<T>&, const STLAllocator<U>&) noexcept { return false; }

}  // namespace allocator
}  // namespace kestcore
