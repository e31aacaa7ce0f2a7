/// \file
/// The calls that are made of the platform: recorded, and made to fail.
///
/// Functions go by their name, without parameters: "player_seek", "_PlayerImpl::SeekTo",
/// "SystemInfo::GetValue". May be called on any thread. Costs a load while nothing is recorded and
/// nothing fails.
#pragma once

#include <Tizen/Base/Types.h>

#include <atomic>
#include <optional>
#include <string>
#include <vector>

namespace Host {

/// Begins or ends the recording of calls; beginning forgets the calls recorded before.
void RecordCalls(bool on);

/// \return the calls recorded since the last `TakeCalls`, in order, with their arguments:
/// "player_seek(4200, false)". Forgets them.
std::vector<std::string> TakeCalls();

/// Makes calls of a platform function fail.
/// \param function its name, with its class where it has one: "player_seek", "SystemInfo::GetValue"
/// \param code what it returns, doing nothing else
/// \param nth which call from now on, the next being 1; 0 for every call
void FailCall(const char* function, int code, unsigned nth = 0);
inline void FailCall(const char* function, result code, unsigned nth = 0) {
  FailCall(function, static_cast<int>(code), nth);
}

/// Ends all failures.
void ClearFailures();

namespace Internal {

extern std::atomic<bool> watched;

std::optional<int> OnWatchedCall(const char* function, const char* format, ...) noexcept
    __attribute__((format(printf, 2, 3)));

}  // namespace Internal

/// For the platform's functions: records a call and tells the code that it is to fail with, if any.
template <typename... Arguments>
std::optional<int> OnCall(const char* function, const char* format, Arguments... arguments) {
  if (!Internal::watched.load(std::memory_order_relaxed)) return std::nullopt;
  return Internal::OnWatchedCall(function, format, arguments...);
}

/// Of a call without arguments.
inline std::optional<int> OnCall(const char* function) { return OnCall(function, "%s", ""); }

}  // namespace Host
