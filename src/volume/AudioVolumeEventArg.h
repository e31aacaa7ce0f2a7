/// \file
#pragma once

#include "SoundType.h"

#include <Tizen/Base/Object.h>
#include <Tizen/Base/Runtime/IEventArg.h>
#include <Zelkora/Media/AudioVolumeManager.h>

namespace Zelkora::Media {

/// What changed. A volume's event type is its sound type plus one.
enum _AudioVolumeEventType : int {
  VOLUME_EVENT_SYSTEM = SOUND_TYPE_SYSTEM + 1,
  VOLUME_EVENT_NOTIFICATION = SOUND_TYPE_NOTIFICATION + 1,
  VOLUME_EVENT_ALARM = SOUND_TYPE_ALARM + 1,
  VOLUME_EVENT_RINGTONE = SOUND_TYPE_RINGTONE + 1,
  VOLUME_EVENT_MEDIA = SOUND_TYPE_MEDIA + 1,
  VOLUME_EVENT_CALL = SOUND_TYPE_CALL + 1,
  VOLUME_EVENT_MUTE = 7,
};
static_assert(VOLUME_EVENT_SYSTEM == 1 && VOLUME_EVENT_CALL == kSoundTypeCount);
static_assert(kSoundTypeCount < VOLUME_EVENT_MUTE, "a sound type's event would be the mute event");

class _AudioVolumeEventTypeArg : public Tizen::Base::Runtime::IEventArg,
                                 public Tizen::Base::Object {
 public:
  void SetEventType(int type) { __eventType = type; }
  int GetEventType() const { return __eventType; }

 private:
  int __eventType = 0;
};

/// Carries the one payload that its type uses; the other has no meaning.
class _AudioVolumeEventArg : public _AudioVolumeEventTypeArg {
 public:
  void SetVolumeLevel(int level) { __volumeLevel = level; }
  int GetVolumeLevel() const { return __volumeLevel; }
  void SetMuteStatus(AudioMuteStatus status) { __muteStatus = status; }
  AudioMuteStatus GetMuteStatus() const { return __muteStatus; }

 private:
  int __volumeLevel;
  AudioMuteStatus __muteStatus;
};

}  // namespace Zelkora::Media
