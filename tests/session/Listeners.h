/// \file
/// What hears the session manager in tests.
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

}  // namespace Zelkora::Media
