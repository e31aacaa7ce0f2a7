/// \file
#pragma once

#include <Tizen/Base/Runtime/IEventListener.h>
#include <Zelkora/Media/AudioVolumeManager.h>
#include <Zelkora/Media/Export.h>

namespace Zelkora::Media {

/// Hears about changes of volumes and of the mute status. Override what you want to hear.
///
/// Calls
/// - come on a thread of the platform's, one after the other, in the order of the changes;
/// - may use the manager, also to add and remove listeners, this one included;
/// - must not wait for another event: on the host platform one thread tells all events of the
///   process, so a call that takes long delays the others;
/// - must not let an exception out: the host platform logs it and goes on, a device may not.
///
/// The application owns its listener and keeps it alive until it is removed from the
/// `AudioVolumeManager`. Levels are those of the manager, at the time of the change.
class ZELKORA_MEDIA_API IAudioVolumeEventListener
    : virtual public Tizen::Base::Runtime::IEventListener {
 public:
  ~IAudioVolumeEventListener() override = default;

  virtual void OnSystemVolumeChanged(int level) { (void)level; }
  virtual void OnNotificationVolumeChanged(int level) { (void)level; }
  virtual void OnAlarmVolumeChanged(int level) { (void)level; }
  virtual void OnRingtoneVolumeChanged(int level) { (void)level; }
  virtual void OnMediaVolumeChanged(int level) { (void)level; }
  virtual void OnCallVolumeChanged(int level) { (void)level; }

  /// All sound was muted or unmuted.
  ///
  /// Called right after `OnMuteAllStatusChanged`, with the same status: override one of the two.
  virtual void OnMuteStatusChanged(AudioMuteStatus status) { (void)status; }

  /// All sound was muted or unmuted.
  virtual void OnMuteAllStatusChanged(AudioMuteStatus status) { (void)status; }
};

}  // namespace Zelkora::Media
