#pragma once

#if defined(_WIN32)
#  if defined(KESTCORE_BUILDING)
#    define KESTCORE_API __declspec(dllexport)
#  else
#    define KESTCORE_API __declspec(dllimport)
#  endif
#else
#  define KESTCORE_API __attribute__((visibility("default")))
#endif
