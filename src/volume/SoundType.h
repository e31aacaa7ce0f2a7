/// \file
#pragma once

namespace Zelkora::Media {

/// The platform's numbers of the six sound categories.
enum _SoundType : int {
  SOUND_TYPE_SYSTEM = 0,
  SOUND_TYPE_NOTIFICATION = 1,
  SOUND_TYPE_ALARM = 2,
  SOUND_TYPE_RINGTONE = 3,
  SOUND_TYPE_MEDIA = 4,
  SOUND_TYPE_CALL = 5,
};

inline constexpr int kSoundTypeCount = 6;

}  // namespace Zelkora::Media
