// The simulated device's sound manager: everything in memory.

#include <sound/CallbackThread.h>

#include <Host/Calls.h>
#include <Simulated/Device.h>
#include <sound_manager.h>

#include <map>
#include <new>
#include <system_error>

namespace {

using Host::CallbackThread;
using Host::Kind;
using Host::Report;
using Simulated::CallSessionFault;

struct Volume {
  int max;
  int level;
};

constexpr std::array<Volume, 6> kFirstVolumes = {
    {{11, 3}, {12, 4}, {13, 5}, {14, 6}, {15, 7}, {10, 8}}};
constexpr int kSessionTypes = 4;
constexpr int kVoipCall = 1;
constexpr int kCallSessionModes = 3;

constexpr int kRefused = SOUND_MANAGER_ERROR_INVALID_PARAMETER;

/// What `Reset` puts back.
struct Settings {
  std::array<Volume, 6> volumes = kFirstVolumes;
  bool muteAll = false;
  int sessionType = 0;
  int sessionOptions[2] = {0, 0};
  bool withUserData = true;
  CallSessionFault callSessionFault = CallSessionFault::kNone;
};

struct Device {
  std::mutex mutex;
  Settings settings;
  std::map<int, int> callSessions;  // modes by number
  int lastCallSession = 0;
  CallbackThread callbacks{mutex};

  Device() {
    Host::SetDeviceWait([] { Get().callbacks.WaitUntilReported(); });
  }

  /// Never destroyed: callers may come until the process is gone.
  static Device& Get() {
    alignas(Device) static unsigned char memory[sizeof(Device)];
    static Device& device = *new (memory) Device;
    return device;
  }

  Volume* FindVolume(int type) {
    const bool known = type >= 0 && type < static_cast<int>(settings.volumes.size());
    return known ? &settings.volumes[static_cast<std::size_t>(type)] : nullptr;
  }

  void Post(Kind kind, int first, int second = 0) {
    callbacks.Post({kind, first, second, settings.withUserData});
  }

  // Reported first, because that can fail.
  void ChangeVolume(int type, Volume& volume, int level) {
    Post(Kind::kVolume, type, level);
    volume.level = level;
  }

  void ChangeMuteAll(bool muteAll) {
    Post(Kind::kMuteAll, muteAll);
    settings.muteAll = muteAll;
  }

  int OpenCallSession() {
    callSessions[lastCallSession + 1] = 0;
    return ++lastCallSession;
  }
};

/// Runs \p operation on the device under its lock, unless the call is to fail. No exception comes
/// out.
template <typename Operation>
int OnDevice(std::optional<int> failure, Operation operation) noexcept {
  if (failure) return *failure;
  try {
    Device& device = Device::Get();
    std::lock_guard lock(device.mutex);
    return operation(device);
  } catch (const std::bad_alloc&) {
    return SOUND_MANAGER_ERROR_OUT_OF_MEMORY;
  }
}

/// Hands \p value out.
template <typename Value>
int Give(Value value, Value* out) {
  if (out == nullptr) return kRefused;
  *out = value;
  return SOUND_MANAGER_ERROR_NONE;
}

template <typename Function>
int SetCallback(const char* name, Kind kind, Function callback,
                CallbackThread::Callback call) noexcept {
  if (auto failure = Host::OnCall(name, "%s", "")) return *failure;
  if (callback == nullptr) return kRefused;
  try {
    Device::Get().callbacks.Set(kind, std::move(call));
    return SOUND_MANAGER_ERROR_NONE;
  } catch (const std::bad_alloc&) {
    return SOUND_MANAGER_ERROR_OUT_OF_MEMORY;
  } catch (const std::system_error&) {
    return SOUND_MANAGER_ERROR_OUT_OF_MEMORY;  // the system has no thread to give
  }
}

int UnsetCallback(const char* name, Kind kind) noexcept {
  if (auto failure = Host::OnCall(name, "%s", "")) return *failure;
  Device::Get().callbacks.Unset(kind);
  return SOUND_MANAGER_ERROR_NONE;
}

/// A session's handle is its number, so that one that was destroyed is never known again.
int NumberOf(sound_call_session_h session) {
  return static_cast<int>(reinterpret_cast<std::intptr_t>(session));
}

sound_call_session_h HandleOf(int number) {
  return reinterpret_cast<sound_call_session_h>(static_cast<std::intptr_t>(number));
}

/// Runs \p operation on a call session's mode.
template <typename Operation>
int OnCallSession(std::optional<int> failure, sound_call_session_h session, Operation operation) {
  return OnDevice(failure, [=](Device& device) {
    const auto found = device.callSessions.find(NumberOf(session));
    return found == device.callSessions.end() ? kRefused : operation(found->second);
  });
}

}  // namespace

extern "C" {

int sound_manager_get_max_volume(int type, int* max) {
  return OnDevice(Host::OnCall(__func__, "%d", type), [=](Device& device) {
    const Volume* volume = device.FindVolume(type);
    return volume == nullptr ? kRefused : Give(volume->max, max);
  });
}

int sound_manager_set_volume(int type, int level) {
  return OnDevice(Host::OnCall(__func__, "%d, %d", type, level), [=](Device& device) {
    Volume* volume = device.FindVolume(type);
    if (volume == nullptr || level < 0 || level > volume->max) return kRefused;
    if (level != volume->level) device.ChangeVolume(type, *volume, level);
    return int{SOUND_MANAGER_ERROR_NONE};
  });
}

int sound_manager_get_volume(int type, int* level) {
  return OnDevice(Host::OnCall(__func__, "%d", type), [=](Device& device) {
    const Volume* volume = device.FindVolume(type);
    return volume == nullptr ? kRefused : Give(volume->level, level);
  });
}

int sound_manager_set_muteall(bool muteall) {
  return OnDevice(Host::OnCall(__func__, "%s", muteall ? "true" : "false"), [=](Device& device) {
    if (muteall != device.settings.muteAll) device.ChangeMuteAll(muteall);
    return SOUND_MANAGER_ERROR_NONE;
  });
}

int sound_manager_get_muteall(bool* muteall) {
  return OnDevice(Host::OnCall(__func__, "%s", ""),
                  [=](Device& device) { return Give(device.settings.muteAll, muteall); });
}

int sound_manager_set_volume_changed_cb(sound_manager_volume_changed_cb callback, void* user_data) {
  return SetCallback(__func__, Kind::kVolume, callback, [=](const Report& report) {
    callback(report.first, report.second, report.withUserData ? user_data : nullptr);
  });
}

int sound_manager_unset_volume_changed_cb(void) { return UnsetCallback(__func__, Kind::kVolume); }

int sound_manager_set_muteall_changed_cb(sound_manager_muteall_changed_cb callback,
                                         void* user_data) {
  return SetCallback(__func__, Kind::kMuteAll, callback, [=](const Report& report) {
    callback(report.first != 0, report.withUserData ? user_data : nullptr);
  });
}

int sound_manager_unset_muteall_changed_cb(void) { return UnsetCallback(__func__, Kind::kMuteAll); }

int sound_manager_set_session_type(int type) {
  return OnDevice(Host::OnCall(__func__, "%d", type), [=](Device& device) {
    if (type < 0 || type >= kSessionTypes) return kRefused;
    device.settings.sessionType = type;
    return int{SOUND_MANAGER_ERROR_NONE};
  });
}

int sound_manager_get_session_type(int* type) {
  return OnDevice(Host::OnCall(__func__, "%s", ""),
                  [=](Device& device) { return Give(device.settings.sessionType, type); });
}

int sound_manager_set_media_session_option(int first, int second) {
  return OnDevice(Host::OnCall(__func__, "%d, %d", first, second), [=](Device& device) {
    device.settings.sessionOptions[0] = first;
    device.settings.sessionOptions[1] = second;
    return SOUND_MANAGER_ERROR_NONE;
  });
}

int sound_manager_get_media_session_option(int* first, int* second) {
  return OnDevice(Host::OnCall(__func__, "%s", ""), [=](Device& device) {
    if (first == nullptr || second == nullptr) return kRefused;
    *first = device.settings.sessionOptions[0];
    *second = device.settings.sessionOptions[1];
    return int{SOUND_MANAGER_ERROR_NONE};
  });
}

int sound_manager_set_session_interrupted_cb(sound_manager_session_interrupted_cb callback,
                                             void* user_data) {
  return SetCallback(__func__, Kind::kInterruption, callback, [=](const Report& report) {
    callback(report.first, report.withUserData ? user_data : nullptr);
  });
}

int sound_manager_unset_session_interrupted_cb(void) {
  return UnsetCallback(__func__, Kind::kInterruption);
}

int sound_manager_call_session_create(int type, sound_call_session_h* session) {
  return OnDevice(Host::OnCall(__func__, "%d", type), [=](Device& device) {
    if (type != kVoipCall || session == nullptr) return kRefused;
    const CallSessionFault fault = device.settings.callSessionFault;
    *session = HandleOf(fault == CallSessionFault::kNoSession ? 0 : device.OpenCallSession());
    return int{fault == CallSessionFault::kSessionRemains ? SOUND_MANAGER_ERROR_INVALID_OPERATION
                                                          : SOUND_MANAGER_ERROR_NONE};
  });
}

int sound_manager_call_session_destroy(sound_call_session_h session) {
  return OnDevice(Host::OnCall(__func__, "%d", NumberOf(session)), [=](Device& device) {
    return device.callSessions.erase(NumberOf(session)) == 1 ? int{SOUND_MANAGER_ERROR_NONE}
                                                             : kRefused;
  });
}

int sound_manager_call_session_set_mode(sound_call_session_h session, int mode) {
  return OnCallSession(Host::OnCall(__func__, "%d, %d", NumberOf(session), mode), session,
                       [=](int& current) {
                         if (mode < 0 || mode >= kCallSessionModes) return kRefused;
                         return Give(mode, &current);
                       });
}

int sound_manager_call_session_get_mode(sound_call_session_h session, int* mode) {
  return OnCallSession(Host::OnCall(__func__, "%d", NumberOf(session)), session,
                       [=](int current) { return Give(current, mode); });
}

}  // extern "C"

namespace Simulated {

void ReportVolume(int type, int level) {
  Device& device = Device::Get();
  std::lock_guard lock(device.mutex);
  if (Volume* volume = device.FindVolume(type)) {
    device.ChangeVolume(type, *volume, level);
  } else {
    device.Post(Kind::kVolume, type, level);
  }
}

void ReportMuteAll(bool muteall) {
  Device& device = Device::Get();
  std::lock_guard lock(device.mutex);
  device.ChangeMuteAll(muteall);
}

void Interrupt(int code) {
  Device& device = Device::Get();
  std::lock_guard lock(device.mutex);
  device.Post(Kind::kInterruption, code);
}

void ReportWithoutUserData(bool on) {
  Device& device = Device::Get();
  std::lock_guard lock(device.mutex);
  device.settings.withUserData = !on;
}

bool SetMaxVolume(int type, int max) {
  Device& device = Device::Get();
  std::lock_guard lock(device.mutex);
  Volume* volume = device.FindVolume(type);
  if (volume == nullptr || max < 0) return false;
  if (volume->level > max) device.ChangeVolume(type, *volume, max);
  volume->max = max;
  return true;
}

void SetCallSessionFault(CallSessionFault fault) {
  Device& device = Device::Get();
  std::lock_guard lock(device.mutex);
  device.settings.callSessionFault = fault;
}

std::vector<int> GetCallSessionModes() {
  Device& device = Device::Get();
  std::lock_guard lock(device.mutex);
  std::vector<int> modes;
  for (const auto& [number, mode] : device.callSessions) modes.push_back(mode);
  return modes;
}

void ResetSoundManager() {
  Device& device = Device::Get();
  device.callbacks.DropReports();
  std::lock_guard lock(device.mutex);
  device.settings = Settings();
  device.lastCallSession = device.callSessions.empty() ? 0 : device.callSessions.rbegin()->first;
}

}  // namespace Simulated
