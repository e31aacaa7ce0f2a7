/// \file
/// What hears the managers in tests.
#pragma once

#include "support/Managers.h"

namespace Zelkora::Media {

/// Writes down what it hears.
class SessionListener : public IAudioSessionEventListener {
 public:
  void OnAudioSessionInterruptStarted() override { heard_ += "started "; }
  void OnAudioSessionInterruptFinished() override { heard_ += "finished "; }
  void OnAudioSessionDisrupted() override { heard_ += "disrupted "; }

  std::string TakeHeard() {
    Host::WaitUntilDelivered();
    return std::exchange(heard_, "");
  }

 private:
  std::string heard_;
};

/// Writes down everything that it hears.
class VolumeListener : public IAudioVolumeEventListener {
 public:
  void OnSystemVolumeChanged(int level) override { Write("System", level); }
  void OnNotificationVolumeChanged(int level) override { Write("Notification", level); }
  void OnAlarmVolumeChanged(int level) override { Write("Alarm", level); }
  void OnRingtoneVolumeChanged(int level) override { Write("Ringtone", level); }
  void OnMediaVolumeChanged(int level) override { Write("Media", level); }
  void OnCallVolumeChanged(int level) override { Write("Call", level); }
  void OnMuteStatusChanged(AudioMuteStatus status) override { Write("MuteStatus", status); }
  void OnMuteAllStatusChanged(AudioMuteStatus status) override { Write("MuteAllStatus", status); }

  Lines Take() {
    Host::WaitUntilDelivered();
    return std::exchange(heard_, {});
  }

 private:
  void Write(const std::string& what, int value) {
    heard_.push_back(what + " " + std::to_string(value));
  }

  Lines heard_;
};

/// Listens while it lives.
template <typename Base>
class Added : public Base {
 public:
  Added() { EXPECT_EQ(Volume::GetInstance()->AddAudioVolumeEventListener(*this), E_SUCCESS); }
  ~Added() override {
    EXPECT_EQ(Volume::GetInstance()->RemoveAudioVolumeEventListener(*this), E_SUCCESS);
  }
};

}  // namespace Zelkora::Media
