#include "support/AllocationCount.h"

#include <kestaccel/VectorUtils.h>

#include <atomic>
#include <cstdlib>
#include <new>

namespace {

std::atomic<std::size_t> g_news{0};
std::atomic<std::size_t> g_deletes{0};
std::atomic<std::size_t> g_largest{0};

std::atomic<std::size_t> g_failAt{0};

void* CountedAllocate(std::size_t size)
{
    if (g_news.fetch_add(1) + 1 == g_failAt.load()) {
        g_news.fetch_sub(1);
        g_failAt.store(0);
        throw std::bad_alloc();
    }
    std::size_t seen = g_largest.load();
    while (size > seen && !g_largest.compare_exchange_weak(seen, size)) {
    }
    if (void* p = std::malloc(size == 0 ? 1 : size)) return p;
    throw std::bad_alloc();
}

void CountedRelease(void* p)
{
    if (p == nullptr) return;
    g_deletes.fetch_add(1);
    std::free(p);
}

}  // namespace

// Every form that pairs with the plain delete is replaced, the nothrow ones
// included, so that no block from the runtime's allocator reaches free().
void* operator new(std::size_t size) { return CountedAllocate(size); }
void* operator new[](std::size_t size) { return CountedAllocate(size); }
void* operator new(std::size_t size, const std::nothrow_t&) noexcept
{
    try {
        return CountedAllocate(size);
    } catch (const std::bad_alloc&) {
        return nullptr;
    }
}
void* operator new[](std::size_t size, const std::nothrow_t& tag) noexcept { return operator new(size, tag); }
void operator delete(void* p) noexcept { CountedRelease(p); }
void operator delete[](void* p) noexcept { CountedRelease(p); }
void operator delete(void* p, std::size_t) noexcept { CountedRelease(p); }
void operator delete[](void* p, std::size_t) noexcept { CountedRelease(p); }
void operator delete(void* p, const std::nothrow_t&) noexcept { CountedRelease(p); }
void operator delete[](void* p, const std::nothrow_t&) noexcept { CountedRelease(p); }

namespace kestaccel_test {

AllocationTally CurrentAllocationTally()
{
    return {g_news.load(), g_deletes.load(), g_largest.load()};
}

void ResetAllocationTally()
{
    g_news.store(0);
    g_deletes.store(0);
    g_largest.store(0);
}

void FailAllocationNumber(std::size_t k)
{
    g_failAt.store(k == 0 ? 0 : g_news.load() + k);
}

bool LibraryAllocationsAreCounted()
{
    ResetAllocationTally();
    kestaccel::utility::Free(kestaccel::utility::Malloc_Float(1));
    const bool counted = CurrentAllocationTally().news > 0;
    ResetAllocationTally();
    return counted;
}

}  // namespace kestaccel_test
