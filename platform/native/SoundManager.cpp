// The native sound manager: what doesn't depend on the device.

#include "Callbacks.h"
#include "Contain.h"
#include "SoundDevice.h"
#include "appfw/Global.h"

#include <Host/Calls.h>
#include <Host/Events.h>
#include <sound_manager.h>

#include <cstdint>
#include <optional>

using Native::Contain;
using Native::Kind;

namespace {

constexpr int kOk = SOUND_MANAGER_ERROR_NONE;

constexpr int kSoundTypes = 6;
constexpr int kSessionTypes = 4;
constexpr int kVoipCall = 1;
constexpr int kCallModes = 3;

bool IsIn(int count, int value) { return value >= 0 && value < count; }

template <typename Function>
int SetCallback(std::optional<int> failure, Kind kind, Function callback, void* userData) {
  return Contain(failure, callback != nullptr, [&] {
    Host::SetDeviceWait([] {
      SoundDevice::AwaitReports();
      Native::WaitUntilReported();
    });
    if (!Native::SetCallback(kind, reinterpret_cast<Native::Callback>(callback), userData)) {
      return int{SOUND_MANAGER_ERROR_NO_CONNECTION};
    }
    SoundDevice::OnListening(kind);
    return kOk;
  });
}

int UnsetCallback(std::optional<int> failure, Kind kind) {
  return Contain(failure, true, [&] {
    Native::UnsetCallback(kind);
    return kOk;
  });
}

/// Changes the session by \p change.
template <typename Change>
int ChangeSession(std::optional<int> failure, bool isValid, Change change) {
  return Contain(failure, isValid, [&] {
    Host::Global<Native::Session>::Use(change);
    SoundDevice::OnSessionChanged();
    return kOk;
  });
}

/// A call's handle is its number, so that one that was destroyed is never known again.
int NumberOf(sound_call_session_h call) {
  return static_cast<int>(reinterpret_cast<std::intptr_t>(call));
}

sound_call_session_h HandleOf(int number) {
  return reinterpret_cast<sound_call_session_h>(static_cast<std::intptr_t>(number));
}

int OpenCall(sound_call_session_h& call) {
  int number = 0;
  const int error = SoundDevice::OpenCall(number);
  if (error == kOk || number != 0) call = HandleOf(number);
  return error;
}

}  // namespace

namespace Native {

Session GetSession() {
  return Host::Global<Session>::Use([](const Session& session) { return session; });
}

void SetSession(const Session& changed) {
  Host::Global<Session>::Use([&](Session& session) { session = changed; });
}

}  // namespace Native

extern "C" {

int sound_manager_get_max_volume(int type, int* max) {
  return Contain(Host::OnCall(__func__, "%d", type), IsIn(kSoundTypes, type) && max != nullptr,
                 [=] { return SoundDevice::GetMaxLevel(type, *max); });
}

int sound_manager_set_volume(int type, int volume) {
  return Contain(Host::OnCall(__func__, "%d, %d", type, volume),
                 IsIn(kSoundTypes, type) && volume >= 0, [=] {
                   int max = 0;
                   if (const int error = SoundDevice::GetMaxLevel(type, max)) return error;
                   return volume <= max ? SoundDevice::SetLevel(type, volume) : Native::kRefused;
                 });
}

int sound_manager_get_volume(int type, int* volume) {
  return Contain(Host::OnCall(__func__, "%d", type), IsIn(kSoundTypes, type) && volume != nullptr,
                 [=] { return SoundDevice::GetLevel(type, *volume); });
}

int sound_manager_set_muteall(bool muteall) {
  return Contain(Host::OnCall(__func__, "%s", muteall ? "true" : "false"), true,
                 [=] { return SoundDevice::SetMuteAll(muteall); });
}

int sound_manager_get_muteall(bool* muteall) {
  return Contain(Host::OnCall(__func__), muteall != nullptr,
                 [=] { return SoundDevice::GetMuteAll(*muteall); });
}

int sound_manager_set_volume_changed_cb(sound_manager_volume_changed_cb callback, void* user_data) {
  return SetCallback(Host::OnCall(__func__), Kind::kVolume, callback, user_data);
}

int sound_manager_unset_volume_changed_cb(void) {
  return UnsetCallback(Host::OnCall(__func__), Kind::kVolume);
}

int sound_manager_set_muteall_changed_cb(sound_manager_muteall_changed_cb callback,
                                         void* user_data) {
  return SetCallback(Host::OnCall(__func__), Kind::kMuteAll, callback, user_data);
}

int sound_manager_unset_muteall_changed_cb(void) {
  return UnsetCallback(Host::OnCall(__func__), Kind::kMuteAll);
}

int sound_manager_set_session_type(int type) {
  return ChangeSession(Host::OnCall(__func__, "%d", type), IsIn(kSessionTypes, type),
                       [=](Native::Session& changed) { changed.type = type; });
}

int sound_manager_get_session_type(int* type) {
  return Contain(Host::OnCall(__func__), type != nullptr,
                 [=] { return *type = Native::GetSession().type, kOk; });
}

int sound_manager_set_media_session_option(int first, int second) {
  return ChangeSession(Host::OnCall(__func__, "%d, %d", first, second), true,
                       [=](Native::Session& changed) {
                         changed.options[0] = first;
                         changed.options[1] = second;
                       });
}

int sound_manager_get_media_session_option(int* first, int* second) {
  return Contain(Host::OnCall(__func__), first != nullptr && second != nullptr, [=] {
    const Native::Session now = Native::GetSession();
    *first = now.options[0];
    *second = now.options[1];
    return kOk;
  });
}

int sound_manager_set_session_interrupted_cb(sound_manager_session_interrupted_cb callback,
                                             void* user_data) {
  return SetCallback(Host::OnCall(__func__), Kind::kInterruption, callback, user_data);
}

int sound_manager_unset_session_interrupted_cb(void) {
  return UnsetCallback(Host::OnCall(__func__), Kind::kInterruption);
}

int sound_manager_call_session_create(int type, sound_call_session_h* session) {
  return Contain(Host::OnCall(__func__, "%d", type), type == kVoipCall && session != nullptr,
                 [=] { return OpenCall(*session); });
}

int sound_manager_call_session_destroy(sound_call_session_h session) {
  const int number = NumberOf(session);
  return Contain(Host::OnCall(__func__, "%d", number), true,
                 [=] { return SoundDevice::CloseCall(number); });
}

int sound_manager_call_session_set_mode(sound_call_session_h session, int mode) {
  const int number = NumberOf(session);
  return Contain(Host::OnCall(__func__, "%d, %d", number, mode), IsIn(kCallModes, mode),
                 [=] { return SoundDevice::SetCallMode(number, mode); });
}

int sound_manager_call_session_get_mode(sound_call_session_h session, int* mode) {
  const int number = NumberOf(session);
  return Contain(Host::OnCall(__func__, "%d", number), mode != nullptr,
                 [=] { return SoundDevice::GetCallMode(number, *mode); });
}

}  // extern "C"
