/// \file
/// Error codes of the native player interface, as results and in the log. For both devices.
#pragma once

#include <Tizen/Base/Result.h>
#include <player.h>

namespace Host {

/// The player's module number in the log.
inline constexpr int kPlayerModule = 60;

inline result ConvertPlayerErrorToResult(int error) {
  switch (error) {
    case PLAYER_ERROR_NONE: return E_SUCCESS;
    case PLAYER_ERROR_NO_SUCH_FILE: return E_OBJ_NOT_FOUND;
    case PLAYER_ERROR_OUT_OF_MEMORY: return E_OUT_OF_MEMORY;
    case PLAYER_ERROR_INVALID_PARAMETER: return E_INVALID_ARG;
    case PLAYER_ERROR_INVALID_OPERATION: return E_INVALID_OPERATION;
    case PLAYER_ERROR_INVALID_STATE: return E_INVALID_STATE;
    default: return E_SYSTEM;
  }
}

/// While it lives, what fails on this thread is logged as a reason only, because whoever called
/// logs the failure.
class ReasonsOnly {
 public:
  ReasonsOnly();
  ~ReasonsOnly();

  ReasonsOnly(const ReasonsOnly&) = delete;
  ReasonsOnly& operator=(const ReasonsOnly&) = delete;

 private:
  const bool before_;
};

/// Thrown where a player's function fails; its code is what the function returns.
struct PlayerError {
  int code;
};

/// Logs why a player's function fails and gives back what to throw, so that a failure is one
/// statement. The last result belongs to those that call the native functions; it isn't touched.
/// The message is put behind the code's name: "[E_INVALID_STATE] no file is open".
PlayerError PlayerFailure(int error, int line, const char* format, ...) noexcept
    __attribute__((format(printf, 3, 4)));

}  // namespace Host
