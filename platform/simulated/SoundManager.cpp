// The simulated device's sound manager: everything in memory.

#include "appfw/Global.h"
#include "native/Callbacks.h"
#include "native/SoundDevice.h"

#include <Simulated/Device.h>
#include <sound_manager.h>

#include <map>

namespace {

using Simulated::CallSessionFault;

struct Volume {
  int max;
  int level;
};

constexpr std::array<Volume, 6> kFirstVolumes = {
    {{11, 3}, {12, 4}, {13, 5}, {14, 6}, {15, 7}, {10, 8}}};

/// What `Reset` puts back.
struct Settings {
  std::array<Volume, 6> volumes = kFirstVolumes;
  bool isMuted = false;
  CallSessionFault callSessionFault = CallSessionFault::kNone;
};

struct State {
  Settings settings;
  std::map<int, int> calls;  // modes by number
  int lastCall = 0;

  Volume& VolumeOf(int type) { return settings.volumes[static_cast<std::size_t>(type)]; }

  // Reported first, because that can fail.
  void ChangeLevel(int type, int level) {
    Native::ReportLevel(type, level);
    VolumeOf(type).level = level;
  }

  void ChangeMuteAll(bool isMuted) {
    Native::ReportMuteAll(isMuted);
    settings.isMuted = isMuted;
  }
};

using Device = Host::Global<State>;

/// Runs \p operation on a call's mode.
template <typename Operation>
int WithCall(int number, Operation operation) {
  return Device::Use([&](State& state) {
    const auto found = state.calls.find(number);
    if (found == state.calls.end()) return int{SOUND_MANAGER_ERROR_INVALID_PARAMETER};
    operation(found->second);
    return int{SOUND_MANAGER_ERROR_NONE};
  });
}

}  // namespace

namespace SoundDevice {

constexpr int kOk = SOUND_MANAGER_ERROR_NONE;

int GetMaxLevel(int type, int& max) {
  return Device::Use([&](State& state) { return max = state.VolumeOf(type).max, kOk; });
}

int SetLevel(int type, int level) {
  return Device::Use([=](State& state) {
    if (level != state.VolumeOf(type).level) state.ChangeLevel(type, level);
    return kOk;
  });
}

int GetLevel(int type, int& level) {
  return Device::Use([&](State& state) { return level = state.VolumeOf(type).level, kOk; });
}

int SetMuteAll(bool isMuted) {
  return Device::Use([=](State& state) {
    if (isMuted != state.settings.isMuted) state.ChangeMuteAll(isMuted);
    return kOk;
  });
}

int GetMuteAll(bool& isMuted) {
  return Device::Use([&](State& state) { return isMuted = state.settings.isMuted, kOk; });
}

void OnSessionChanged() {}

void OnListening(Native::Kind kind) { Native::BeginReports(kind); }

void AwaitReports() {}

int OpenCall(int& number) {
  return Device::Use([&](State& state) {
    const CallSessionFault fault = state.settings.callSessionFault;
    if (fault == CallSessionFault::kNoSession) return kOk;
    state.calls[state.lastCall + 1] = 0;
    number = ++state.lastCall;
    if (fault == CallSessionFault::kSessionRemains)
      return int{SOUND_MANAGER_ERROR_INVALID_OPERATION};
    return kOk;
  });
}

int CloseCall(int number) {
  return Device::Use([=](State& state) {
    return state.calls.erase(number) == 1 ? kOk : int{SOUND_MANAGER_ERROR_INVALID_PARAMETER};
  });
}

int SetCallMode(int number, int mode) {
  return WithCall(number, [=](int& current) { current = mode; });
}

int GetCallMode(int number, int& mode) {
  return WithCall(number, [&](int current) { mode = current; });
}

}  // namespace SoundDevice

namespace Simulated {

void ReportVolume(int type, int level) {
  Device::Use([=](State& state) {
    const bool isKnown = type >= 0 && type < static_cast<int>(state.settings.volumes.size());
    isKnown ? state.ChangeLevel(type, level) : Native::ReportLevel(type, level);
  });
}

void ReportMuteAll(bool muteall) {
  Device::Use([=](State& state) { state.ChangeMuteAll(muteall); });
}

void Interrupt(int code) { Native::ReportInterruption(code); }

void ReportWithoutUserData(bool on) { Native::ReportWithoutUserData(on); }

bool SetMaxVolume(int type, int max) {
  return Device::Use([=](State& state) {
    if (type < 0 || type >= static_cast<int>(state.settings.volumes.size()) || max < 0)
      return false;
    Volume& volume = state.VolumeOf(type);
    if (volume.level > max) state.ChangeLevel(type, max);
    volume.max = max;
    return true;
  });
}

void SetCallSessionFault(CallSessionFault fault) {
  Device::Use([=](State& state) { state.settings.callSessionFault = fault; });
}

std::vector<int> GetCallSessionModes() {
  return Device::Use([](State& state) {
    std::vector<int> modes;
    for (const auto& [number, mode] : state.calls) modes.push_back(mode);
    return modes;
  });
}

void ResetSoundManager() {
  Native::DropReports();
  Native::ReportWithoutUserData(false);
  Native::SetSession({});
  Device::Use([](State& state) {
    state.settings = Settings();
    state.lastCall = state.calls.empty() ? 0 : state.calls.rbegin()->first;
  });
}

}  // namespace Simulated
