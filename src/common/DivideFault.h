#pragma once

#ifdef _WIN32
#ifndef WIN32_LEAN_AND_MEAN
#define WIN32_LEAN_AND_MEAN
#endif
#ifndef NOMINMAX
#define NOMINMAX
#endif
#include <windows.h>
#else
#include <csignal>
#endif

namespace kestaccel {
namespace detail {

// Where an integer division by zero ends a call with the processor's divide
// fault, the fault is raised explicitly: the division itself is undefined in
// C++ (g++ puts a trap instruction in its place, which dies of SIGILL), and
// AArch64's divide instruction answers 0 without faulting. SIGFPE on POSIX
// systems, the integer-divide exception on Windows. Should a handler return,
// the caller returns too.
inline void RaiseIntegerDivideFault()
{
#ifdef _WIN32
    RaiseException(EXCEPTION_INT_DIVIDE_BY_ZERO, 0, 0, nullptr);
#else
    std::raise(SIGFPE);
#endif
}

}  // namespace detail
}  // namespace kestaccel
