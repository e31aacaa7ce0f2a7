#include "Events.h"

#include "Failure.h"
#include "Managers.h"

#include <fmt/format.h>
#include <sys/eventfd.h>
#include <unistd.h>

#include <cerrno>
#include <utility>

namespace CommandLine {

using namespace Zelkora::Media;

Lines::Lines() : descriptor_(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)) {
  if (descriptor_ < 0) FailWithSystemError("wait for events", errno);
}

Lines::~Lines() { close(descriptor_); }

void Lines::Add(std::string line) {
  std::lock_guard lock(mutex_);
  lines_.push_back(std::move(line));
  eventfd_write(descriptor_, 1);
}

std::vector<std::string> Lines::Take() {
  std::lock_guard lock(mutex_);
  eventfd_t ignored;
  eventfd_read(descriptor_, &ignored);
  return std::exchange(lines_, {});
}

Events::~Events() {
  if (volumes_ != nullptr) volumes_->RemoveAudioVolumeEventListener(*this);
  if (session_ != nullptr) session_->SetAudioSessionEventListener(nullptr);
}

void Events::ListenToVolumes() {
  AudioVolumeManager& manager = VolumeManager();
  Check(manager.AddAudioVolumeEventListener(*this), "listen to the volumes");
  volumes_ = &manager;
}

void Events::ListenToSession() {
  AudioSessionManager& manager = SessionManager();
  Check(manager.SetAudioSessionEventListener(this), "listen to the session");
  session_ = &manager;
}

void Events::OnMuteAllStatusChanged(AudioMuteStatus status) {
  Add("mute " + NameOf(kSwitch, status == AUDIO_MUTE_STATUS_MUTED));
}

void Events::AddVolume(const char* category, int level) {
  Add(fmt::format("volume {} {}", category, level));
}

}  // namespace CommandLine
