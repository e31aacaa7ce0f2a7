/// \file
#pragma once

#include <Tizen/Base/Runtime/IEventListener.h>
#include <Zelkora/Media/Export.h>

namespace Zelkora::Media {

/// Hears about interruptions of the application's audio session.
///
/// Calls
/// - come on a thread of the platform's, one after the other, in the order of what happened;
/// - may use the manager, also to set another listener or none;
/// - must not wait for another event: on the host platform one thread tells all events of the
///   process, so a call that takes long delays the others;
/// - must not let an exception out: the host platform logs it and goes on, a device may not.
///
/// The application owns its listener and keeps it alive until the `AudioSessionManager` has taken
/// another, or null, in its place.
class ZELKORA_MEDIA_API IAudioSessionEventListener
    : virtual public Tizen::Base::Runtime::IEventListener {
 public:
  ~IAudioSessionEventListener() override = default;

  /// Another sound takes over for a while, such as a call: pause.
  virtual void OnAudioSessionInterruptStarted() = 0;

  /// The interruption is over: resume what was playing before.
  virtual void OnAudioSessionInterruptFinished() = 0;

  /// The session was taken away: stop.
  ///
  /// `OnAudioSessionInterruptFinished` follows when the device reports the end, unless the
  /// disruption had the device's code 2: the next end is swallowed then.
  virtual void OnAudioSessionDisrupted() {}
};

}  // namespace Zelkora::Media
