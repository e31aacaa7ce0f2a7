/// \file
/// The sound manager's log: what changes between it and the server, once a change.
#pragma once

#include <Tizen/Base/Log.h>
#include <Tizen/Base/Result.h>

namespace Desktop {

inline constexpr int kSoundManagerModule = 61;

/// \param cause the server's or the system's text for it
inline void LogFailure(const char* what, const char* cause, int line = __builtin_LINE()) {
  SysLogExceptionInternal(kSoundManagerModule, E_SYSTEM, "", line, "[E_SYSTEM] %s: %s", what,
                          cause);
}

inline void LogChange(const char* what, int line = __builtin_LINE()) {
  SysLogInternal(kSoundManagerModule, "", line, "%s", what);
}

}  // namespace Desktop
