#pragma once

// KESTACCEL_API marks the public interface. Everything else in the library,
// the cpp kernels included, has hidden visibility and stays out of the
// dynamic symbol table (and out of the DLL's export table).
#if defined(_WIN32)
#  if defined(KESTACCEL_BUILDING)
#    define KESTACCEL_API __declspec(dllexport)
#  elif defined(KESTACCEL_STATIC)
#    define KESTACCEL_API
#  else
#    define KESTACCEL_API __declspec(dllimport)
#  endif
#else
#  define KESTACCEL_API __attribute__((visibility("default")))
#endif
