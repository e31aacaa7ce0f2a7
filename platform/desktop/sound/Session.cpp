// The audio session's settings. They are the process's own: no server is asked.

#include "Session.h"

#include <Host/Calls.h>
#include <sound_manager.h>

#include <chrono>
#include <mutex>
#include <new>

namespace Desktop {
namespace {

constexpr int kMediaType = 0;

/// The media role of player streams for each session type. What must be heard, an emergency, is an
/// alarm to the other programs.
constexpr const char* kRoleOfType[] = {"music", "alarm", "notification", "alarm"};
constexpr int kTypes = 4;

/// Media that mixes: calls don't cork it.
constexpr int kMix = 1;
constexpr char kMixRole[] = "game";

using Clock = std::chrono::steady_clock;

/// Longer than the server takes to tell that a stream has ended.
constexpr std::chrono::seconds kReplacement{1};

struct Session {
  std::mutex mutex;
  int type = kMediaType;
  int first = 0;
  int second = 0;
  Clock::time_point replaced;  // a player's stream

  const char* GetRole() const {
    return type == kMediaType && first == kMix ? kMixRole : kRoleOfType[type];
  }

  /// Never destroyed: callers come until the process is gone.
  static Session& Get() {
    alignas(Session) static unsigned char memory[sizeof(Session)];
    static Session& session = *new (memory) Session;
    return session;
  }
};

}  // namespace

const char* GetPlayerRole() {
  Session& session = Session::Get();
  std::lock_guard lock(session.mutex);
  return session.GetRole();
}

void NoteStreamReplaced() {
  Session& session = Session::Get();
  std::lock_guard lock(session.mutex);
  session.replaced = Clock::now();
}

bool WasStreamJustReplaced() {
  Session& session = Session::Get();
  std::lock_guard lock(session.mutex);
  return Clock::now() - session.replaced < kReplacement;
}

}  // namespace Desktop

using Desktop::Session;

extern "C" {

int sound_manager_set_session_type(int type) {
  if (auto failure = Host::OnCall(__func__, "%d", type)) return *failure;
  if (type < 0 || type >= Desktop::kTypes) return SOUND_MANAGER_ERROR_INVALID_PARAMETER;
  Session& session = Session::Get();
  std::lock_guard lock(session.mutex);
  session.type = type;
  return SOUND_MANAGER_ERROR_NONE;
}

int sound_manager_get_session_type(int* type) {
  if (auto failure = Host::OnCall(__func__, "%s", "")) return *failure;
  if (type == nullptr) return SOUND_MANAGER_ERROR_INVALID_PARAMETER;
  Session& session = Session::Get();
  std::lock_guard lock(session.mutex);
  *type = session.type;
  return SOUND_MANAGER_ERROR_NONE;
}

int sound_manager_set_media_session_option(int first, int second) {
  if (auto failure = Host::OnCall(__func__, "%d, %d", first, second)) return *failure;
  Session& session = Session::Get();
  std::lock_guard lock(session.mutex);
  session.first = first;
  session.second = second;
  return SOUND_MANAGER_ERROR_NONE;
}

int sound_manager_get_media_session_option(int* first, int* second) {
  if (auto failure = Host::OnCall(__func__, "%s", "")) return *failure;
  if (first == nullptr || second == nullptr) return SOUND_MANAGER_ERROR_INVALID_PARAMETER;
  Session& session = Session::Get();
  std::lock_guard lock(session.mutex);
  *first = session.first;
  *second = session.second;
  return SOUND_MANAGER_ERROR_NONE;
}

}  // extern "C"
