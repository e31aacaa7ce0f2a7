/// \file
/// Sound categories, their media roles on the server, their levels and volumes.
#pragma once

#include <pulse/volume.h>

#include <array>
#include <cstddef>
#include <cstring>

namespace Desktop {

/// A sound type of the native interface.
using Category = int;

inline constexpr Category kNoCategory = -1;
inline constexpr Category kSystem = 0;
inline constexpr Category kNotification = 1;
inline constexpr Category kAlarm = 2;
inline constexpr Category kRingtone = 3;
inline constexpr Category kMedia = 4;
inline constexpr Category kCall = 5;
inline constexpr std::size_t kCategories = 6;

/// What stands before a role in the name of its stored volume.
inline constexpr char kEntryPrefix[] = "sink-input-by-media-role:";

struct RoleRow {
  const char* role;
  Category category;
};

/// Where a category has several roles, the first that has a stored volume tells its level at start.
inline constexpr std::array<RoleRow, 8> kRoles = {{{"event", kSystem},
                                                   {"notification", kNotification},
                                                   {"alarm", kAlarm},
                                                   {"ringtone", kRingtone},
                                                   {"music", kMedia},
                                                   {"video", kMedia},
                                                   {"game", kMedia},
                                                   {"phone", kCall}}};

inline constexpr std::size_t kNoRole = kRoles.size();

/// \return the role's place in the table, or `kNoRole`
inline std::size_t FindRole(const char* role) {
  std::size_t i = 0;
  while (i < kRoles.size() && std::strcmp(kRoles[i].role, role) != 0) ++i;
  return i;
}

/// \param role null for a stream without one
inline Category FindCategory(const char* role) {
  if (role == nullptr) return kMedia;
  const std::size_t row = FindRole(role);
  return row == kNoRole ? kNoCategory : kRoles[row].category;
}

/// Every category's highest level; it stands for a volume of 100 %.
inline constexpr int kMaxLevel = 15;

constexpr pa_volume_t ToVolume(int level) {
  return (static_cast<pa_volume_t>(level) * PA_VOLUME_NORM + kMaxLevel / 2) / kMaxLevel;
}

/// \return the nearest level; a volume above 100 % is the highest
constexpr int ToLevel(pa_volume_t volume) {
  const pa_volume_t limited = volume < PA_VOLUME_NORM ? volume : PA_VOLUME_NORM;
  return static_cast<int>((limited * kMaxLevel + PA_VOLUME_NORM / 2) / PA_VOLUME_NORM);
}

constexpr bool DoLevelsComeBack() {
  for (int level = 0; level <= kMaxLevel; ++level) {
    if (ToLevel(ToVolume(level)) != level) return false;
  }
  return true;
}
static_assert(DoLevelsComeBack(), "a level that is set must be read as the same");

/// A volume as it was told last, and its balance, which level 0 would lose.
class Volume {
 public:
  void Put(const pa_cvolume& volume) {
    volume_ = volume;
    const bool hasBalance = pa_cvolume_max(&volume) > PA_VOLUME_MUTED;
    if (hasBalance || balance_.channels != volume.channels) balance_ = volume;
  }

  /// \return whether there is one; the server may keep none
  bool Exists() const { return volume_.channels > 0; }

  /// \return the level of the loudest channel
  int GetLevel() const { return ToLevel(pa_cvolume_max(&volume_)); }

  /// \return the volume with another level, in the same balance
  pa_cvolume At(int level) const {
    pa_cvolume scaled = balance_;
    return *pa_cvolume_scale(&scaled, ToVolume(level));
  }

 private:
  pa_cvolume volume_ = {};
  pa_cvolume balance_ = {};
};

}  // namespace Desktop
