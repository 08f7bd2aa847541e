#include "kestaccel/VectorUtils.h"

// The denormal switches are placeholders: the library has no
// processor-specific code, so a Set is not stored and every Get answers
// false. The floating-point environment is the caller's thread's, untouched.
namespace kestaccel {
namespace utility {
namespace cpp {

inline bool GetDenormalMode() { return false; }
inline void SetDenormalMode(bool /*enable*/) {}

inline bool GetDenormalsAreZero() { return GetDenormalMode(); }
inline void SetDenormalsAreZero(bool enable) { SetDenormalMode(enable); }
inline bool GetFlushDenormalsToZero() { return GetDenormalMode(); }
inline void SetFlushDenormalsToZero(bool enable) { SetDenormalMode(enable); }
inline bool GetDenormalExceptionsEnabled() { return GetDenormalMode(); }
inline void SetDenormalExceptionsEnabled(bool enable) { SetDenormalMode(enable); }

}  // namespace cpp

bool GetDenormalsAreZero() { return cpp::GetDenormalsAreZero(); }
void SetDenormalsAreZero(bool enable) { cpp::SetDenormalsAreZero(enable); }
bool GetFlushDenormalsToZero() { return cpp::GetFlushDenormalsToZero(); }
void SetFlushDenormalsToZero(bool enable) { cpp::SetFlushDenormalsToZero(enable); }
bool GetDenormalExceptionsEnabled() { return cpp::GetDenormalExceptionsEnabled(); }
void SetDenormalExceptionsEnabled(bool enable) { cpp::SetDenormalExceptionsEnabled(enable); }

}  // namespace utility
}  // namespace kestaccel
