#pragma once

#include <Zelkora/Media/AudioVolumeManager.h>

namespace CommandLine {

/// A kind of sound with a volume of its own; the row's number is the platform's sound type.
struct Category {
  using Manager = Zelkora::Media::AudioVolumeManager;

  const char* name;
  result (Manager::*range)(int&, int&) const;
  int (Manager::*level)() const;
  result (Manager::*setLevel)(int);
};

inline constexpr Category kCategories[] = {
    {"system", &Category::Manager::GetSystemVolumeRange,
     &Category::Manager::GetCurrentSystemVolumeLevel, &Category::Manager::SetSystemVolumeLevel},
    {"notification", &Category::Manager::GetNotificationVolumeRange,
     &Category::Manager::GetCurrentNotificationVolumeLevel,
     &Category::Manager::SetNotificationVolumeLevel},
    {"alarm", &Category::Manager::GetAlarmVolumeRange,
     &Category::Manager::GetCurrentAlarmVolumeLevel, &Category::Manager::SetAlarmVolumeLevel},
    {"ringtone", &Category::Manager::GetRingtoneVolumeRange,
     &Category::Manager::GetCurrentRingtoneVolumeLevel, &Category::Manager::SetRingtoneVolumeLevel},
    {"media", &Category::Manager::GetMediaVolumeRange,
     &Category::Manager::GetCurrentMediaVolumeLevel, &Category::Manager::SetMediaVolumeLevel},
    {"call", &Category::Manager::GetCallVolumeRange, &Category::Manager::GetCurrentCallVolumeLevel,
     &Category::Manager::SetCallVolumeLevel},
};

}  // namespace CommandLine
