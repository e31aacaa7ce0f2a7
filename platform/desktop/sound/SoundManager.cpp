// The native interface of the desktop's sound manager. Session.cpp has the session's settings.

#include "Device.h"

#include <Host/Calls.h>
#include <sound_manager.h>

#include <cstdint>
#include <new>
#include <system_error>

namespace {

using Desktop::Device;
using Desktop::IsCategory;
using Desktop::IsLevel;
using Host::Kind;
using Host::Report;

constexpr int kRefused = SOUND_MANAGER_ERROR_INVALID_PARAMETER;
constexpr int kVoipCall = 1;

/// Runs \p operation, which may throw when memory or threads are short.
template <typename Operation>
int Guarded(Operation operation) noexcept try {
  return operation();
} catch (const std::bad_alloc&) {
  return SOUND_MANAGER_ERROR_OUT_OF_MEMORY;
} catch (const std::system_error&) {
  return SOUND_MANAGER_ERROR_OUT_OF_MEMORY;  // the system has no thread to give
}

template <typename Function>
int SetCallback(std::optional<int> failure, Kind kind, Function callback,
                Desktop::Reports::Callback call) noexcept {
  if (failure) return *failure;
  if (callback == nullptr) return kRefused;
  return Guarded([&] {
    Device::Get().SetCallback(kind, std::move(call));
    return SOUND_MANAGER_ERROR_NONE;
  });
}

int UnsetCallback(std::optional<int> failure, Kind kind) noexcept {
  if (failure) return *failure;
  return Guarded([=] {
    Device::Get().UnsetCallback(kind);
    return SOUND_MANAGER_ERROR_NONE;
  });
}

/// A session's handle is its number, so that one that was destroyed is never known again.
int NumberOf(sound_call_session_h session) {
  return static_cast<int>(reinterpret_cast<std::intptr_t>(session));
}

sound_call_session_h HandleOf(int number) {
  return reinterpret_cast<sound_call_session_h>(static_cast<std::intptr_t>(number));
}

}  // namespace

extern "C" {

int sound_manager_get_max_volume(int type, int* max) {
  if (auto failure = Host::OnCall(__func__, "%d", type)) return *failure;
  if (!IsCategory(type) || max == nullptr) return kRefused;
  *max = Desktop::kMaxLevel;
  return SOUND_MANAGER_ERROR_NONE;
}

int sound_manager_set_volume(int type, int volume) {
  if (auto failure = Host::OnCall(__func__, "%d, %d", type, volume)) return *failure;
  if (!IsCategory(type) || !IsLevel(volume)) return kRefused;
  return Guarded([=] { return Device::Get().SetLevel(type, volume); });
}

int sound_manager_get_volume(int type, int* volume) {
  if (auto failure = Host::OnCall(__func__, "%d", type)) return *failure;
  if (!IsCategory(type) || volume == nullptr) return kRefused;
  return Guarded([=] { return Device::Get().GetLevel(type, *volume); });
}

int sound_manager_set_muteall(bool muteall) {
  if (auto failure = Host::OnCall(__func__, "%s", muteall ? "true" : "false")) return *failure;
  return Guarded([=] { return Device::Get().SetMuteAll(muteall); });
}

int sound_manager_get_muteall(bool* muteall) {
  if (auto failure = Host::OnCall(__func__, "%s", "")) return *failure;
  if (muteall == nullptr) return kRefused;
  return Guarded([=] { return Device::Get().GetMuteAll(*muteall); });
}

int sound_manager_set_volume_changed_cb(sound_manager_volume_changed_cb callback, void* user_data) {
  return SetCallback(
      Host::OnCall(__func__, "%s", ""), Kind::kVolume, callback,
      [=](const Report& report) { callback(report.first, report.second, user_data); });
}

int sound_manager_unset_volume_changed_cb(void) {
  return UnsetCallback(Host::OnCall(__func__, "%s", ""), Kind::kVolume);
}

int sound_manager_set_muteall_changed_cb(sound_manager_muteall_changed_cb callback,
                                         void* user_data) {
  return SetCallback(Host::OnCall(__func__, "%s", ""), Kind::kMuteAll, callback,
                     [=](const Report& report) { callback(report.first != 0, user_data); });
}

int sound_manager_unset_muteall_changed_cb(void) {
  return UnsetCallback(Host::OnCall(__func__, "%s", ""), Kind::kMuteAll);
}

int sound_manager_set_session_interrupted_cb(sound_manager_session_interrupted_cb callback,
                                             void* user_data) {
  return SetCallback(Host::OnCall(__func__, "%s", ""), Kind::kInterruption, callback,
                     [=](const Report& report) { callback(report.first, user_data); });
}

int sound_manager_unset_session_interrupted_cb(void) {
  return UnsetCallback(Host::OnCall(__func__, "%s", ""), Kind::kInterruption);
}

int sound_manager_call_session_create(int type, sound_call_session_h* session) {
  if (auto failure = Host::OnCall(__func__, "%d", type)) return *failure;
  if (type != kVoipCall || session == nullptr) return kRefused;
  return Guarded([=] {
    int number = 0;
    const int error = Device::Get().OpenCall(number);
    if (error == SOUND_MANAGER_ERROR_NONE) *session = HandleOf(number);
    return error;
  });
}

int sound_manager_call_session_destroy(sound_call_session_h session) {
  const int number = NumberOf(session);
  if (auto failure = Host::OnCall(__func__, "%d", number)) return *failure;
  return Guarded([=] { return Device::Get().CloseCall(number); });
}

int sound_manager_call_session_set_mode(sound_call_session_h session, int mode) {
  const int number = NumberOf(session);
  if (auto failure = Host::OnCall(__func__, "%d, %d", number, mode)) return *failure;
  if (mode < 0 || mode >= Desktop::CallSession::kModes) return kRefused;
  return Guarded([=] { return Device::Get().SetCallMode(number, mode); });
}

int sound_manager_call_session_get_mode(sound_call_session_h session, int* mode) {
  const int number = NumberOf(session);
  if (auto failure = Host::OnCall(__func__, "%d", number)) return *failure;
  if (mode == nullptr) return kRefused;
  return Guarded([=] { return Device::Get().GetCallMode(number, *mode); });
}

}  // extern "C"
