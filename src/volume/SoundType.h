/// \file
#pragma once

namespace Zelkora::Media {

/// The platform's numbers of the sound categories, without a gap.
enum _SoundType : int {
  SOUND_TYPE_SYSTEM = 0,
  SOUND_TYPE_NOTIFICATION = 1,
  SOUND_TYPE_ALARM = 2,
  SOUND_TYPE_RINGTONE = 3,
  SOUND_TYPE_MEDIA = 4,
  SOUND_TYPE_CALL = 5,
  SOUND_TYPE_END
};

inline constexpr int kSoundTypeCount = SOUND_TYPE_END;

}  // namespace Zelkora::Media
