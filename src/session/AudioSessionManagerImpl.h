/// \file
#pragma once

#include "AudioSessionEventArg.h"

#include <Tizen/Base/Object.h>
#include <Zelkora/Media/AudioSessionManager.h>

namespace Zelkora::Media {

class IAudioSessionEventListener;
class _AudioSessionEvent;

/// Asks the sound manager for the mode, and turns its interruption codes into events.
class _AudioSessionManagerImpl : public Tizen::Base::Object {
 public:
  _AudioSessionManagerImpl() = default;
  ~_AudioSessionManagerImpl() override;

  result Construct();

  result SetMode(AudioSessionMode mode);
  AudioSessionMode GetMode() const;

  result SetAudioSessionEventListener(IAudioSessionEventListener* pListener);

 private:
  // Called by the sound manager on a thread of its own; the user data is the implementation object.
  static void SessionInterruptedCallback(int code, void* userData);

  void OnInterrupted(int code);
  void FireSessionEvent(_AudioSessionEventType type);

  _AudioSessionEvent* __pAudioSessionEvent = nullptr;
  IAudioSessionEventListener* __pAudioSessionEventListener = nullptr;  // the application's
  bool __suppressInterruptFinished = false;  // belongs to the sound manager's thread
};

}  // namespace Zelkora::Media
