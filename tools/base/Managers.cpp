#include "Managers.h"

#include "Failure.h"

#include <fmt/format.h>

namespace CommandLine {
namespace {

using namespace Zelkora::Media;

template <typename Manager>
Manager& Get(const char* attempt) {
  Manager* manager = Manager::GetInstance();
  if (manager != nullptr) return *manager;
  Check(GetLastResult(), attempt);
  // A manager is made once in a process's life or never, and only the first attempt has a result.
  throw Failure(fmt::format("cannot {}: an earlier attempt failed", attempt));
}

}  // namespace

AudioVolumeManager& VolumeManager() { return Get<AudioVolumeManager>("use the volumes"); }

AudioSessionManager& SessionManager() { return Get<AudioSessionManager>("use the session"); }

VoipAudioSessionManager& CallManager() { return Get<VoipAudioSessionManager>("use calls"); }

void SetSessionMode(const std::string& name) {
  Check(SessionManager().SetMode(Find(kSessionModes, name)->value),
        fmt::format("set the session's mode to {}", name));
}

}  // namespace CommandLine
