/// \file
/// What hears the session manager in tests.
#pragma once

#include "support/Managers.h"

namespace Zelkora::Media {

/// Writes down what it hears; not `OnAudioSessionDisrupted`, which has a default.
class PlainSessionListener : public IAudioSessionEventListener {
 public:
  void OnAudioSessionInterruptStarted() override { heard += "started "; }
  void OnAudioSessionInterruptFinished() override { heard += "finished "; }

  std::string TakeHeard() {
    Host::WaitUntilDelivered();
    return std::exchange(heard, "");
  }

 protected:
  std::string heard;
};

class SessionListener : public PlainSessionListener {
 public:
  void OnAudioSessionDisrupted() override { heard += "disrupted "; }
};

}  // namespace Zelkora::Media
