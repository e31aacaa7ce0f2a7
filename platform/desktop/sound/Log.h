/// \file
/// The sound manager's log: what changes between it and the server, once a change.
#pragma once

#include <Host/Log.h>
#include <Tizen/Base/Log.h>
#include <Tizen/Base/Result.h>

namespace Desktop {

inline constexpr int kSoundManagerModule = 61;

/// The last result belongs to whoever calls the native functions; it isn't touched.
/// \param cause the server's or the system's text for it
inline void LogFailure(const char* what, const char* cause, int line = __builtin_LINE()) {
  const result before = GetLastResult();
  SysLogExceptionInternal(kSoundManagerModule, E_SYSTEM, "", line, "[E_SYSTEM] %s: %s", what,
                          cause);
  SetLastResult(before);
}

/// Logs why a call fails that its caller logs.
inline void LogReason(const char* reason, int line = __builtin_LINE()) {
  Host::LogReason(kSoundManagerModule, E_SYSTEM, line, "[E_SYSTEM] %s", reason);
}

inline void LogChange(const char* what, int line = __builtin_LINE()) {
  SysLogInternal(kSoundManagerModule, "", line, "%s", what);
}

}  // namespace Desktop
