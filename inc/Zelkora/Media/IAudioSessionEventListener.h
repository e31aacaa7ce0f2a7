/// \file
#pragma once

#include <Tizen/Base/Runtime/IEventListener.h>
#include <Zelkora/Media/Export.h>

namespace Zelkora::Media {

/// Hears about interruptions of the application's audio session.
///
/// The application owns its listener and keeps it alive while it is set at the
/// `AudioSessionManager`. All calls come on a thread of the platform's, one after the other, in the
/// order of what happened; on the host platform that is one thread for all events of the process,
/// so a call that takes long delays the others. A call may use the manager, also to set another
/// listener.
class ZELKORA_MEDIA_API IAudioSessionEventListener
    : virtual public Tizen::Base::Runtime::IEventListener {
 public:
  ~IAudioSessionEventListener() override = default;

  /// Another sound takes over for a while, such as a call: pause.
  virtual void OnAudioSessionInterruptStarted() = 0;

  /// The interruption is over: resume what was playing before.
  virtual void OnAudioSessionInterruptFinished() = 0;

  /// The session was taken away: stop. As a rule no call of `OnAudioSessionInterruptFinished`
  /// belongs to it.
  virtual void OnAudioSessionDisrupted() {}
};

}  // namespace Zelkora::Media
