#pragma once

// Counts the calls of the global operator new and delete made by a test
// program and by the shared library it loads, so that tests can see whether
// a call allocates, and how large its largest request was. Every test
// program carries the counting operators.
//
// Where the platform keeps the library's allocations apart (a Windows DLL
// links its own runtime), nothing of the library is counted; tests that read
// the tally start with KESTACCEL_REQUIRE_ALLOCATION_COUNTING() and are
// reported as skipped there instead of passing without evidence.

#include <gtest/gtest.h>

#include <cstddef>

namespace kestaccel_test {

struct AllocationTally {
    std::size_t news = 0;
    std::size_t deletes = 0;
    std::size_t largest = 0;
};

// The tally since the last ResetAllocationTally().
AllocationTally CurrentAllocationTally();
void ResetAllocationTally();

// Makes the k-th allocation from now on throw std::bad_alloc, counted
// neither as a new nor as the largest; 0 disarms.
void FailAllocationNumber(std::size_t k);

// True when an allocation made inside the library reaches the tally.
bool LibraryAllocationsAreCounted();

}  // namespace kestaccel_test

#define KESTACCEL_REQUIRE_ALLOCATION_COUNTING()                                          \
    do {                                                                                 \
        if (!::kestaccel_test::LibraryAllocationsAreCounted())                           \
            GTEST_SKIP() << "the library's allocations are not visible to this program"; \
    } while (false)
