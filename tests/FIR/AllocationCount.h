#pragma once

// Counts the calls of the global operator new and delete made by this test
// program and by the shared library it loads, so that tests can see whether
// a call allocates, and how large its largest request was. Where the
// platform keeps the library's allocations apart (a Windows DLL), the counts
// stay at zero and the tests that read them check nothing beyond that.

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

}  // namespace kestaccel_test
