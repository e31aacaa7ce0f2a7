#include "support/Managers.h"

#include <climits>

namespace Zelkora::Media {
namespace {

using VolumeLevels = ManagerTest<Volume>;

/// \return what the manager says of all categories
std::vector<int> Levels(const Volume& manager) {
  std::vector<int> levels;
  for (const SoundCategory& category : kSoundCategories) {
    levels.push_back(std::invoke(category.getLevel, manager));
  }
  return levels;
}

TEST_F(VolumeLevels, EachCategoryHasARangeAndALevelOfItsOwn) {
  std::vector<int> expected = Levels(manager);
  for (const SoundCategory& category : kSoundCategories) {
    SCOPED_TRACE(category.name);
    int& own = expected[static_cast<std::size_t>(category.soundType)];
    int min = 7, max = -1;
    EXPECT_EQ(std::invoke(category.getRange, manager, min, max), E_SUCCESS);
    EXPECT_EQ(min, 0);
    EXPECT_GE(max, 10);
    for (own = max; own > 0; --own) {
      EXPECT_EQ(std::invoke(category.setLevel, manager, own), E_SUCCESS);
      EXPECT_EQ(Levels(manager), expected);
    }
    World::ChangeLevel(category.soundType, own = 3);  // nothing is remembered
    EXPECT_EQ(Levels(manager), expected);
    Forget();
    for (const int level : {-1, max + 1, INT_MAX, INT_MIN}) {  // the device judges them
      EXPECT_EQ(std::invoke(category.setLevel, manager, level), E_INVALID_ARG);
      ExpectLeftBehindGate(E_INVALID_ARG,
                           {"80: [E_INVALID_ARG] sound_manager_set_volume failed with -22"},
                           {"sound_manager_set_volume(" + std::to_string(category.soundType) +
                            ", " + std::to_string(level) + ")"});
    }
    EXPECT_EQ(Levels(manager), expected);
  }
}

TEST_F(VolumeLevels, RefusedRangeQueryStillGivesTheMinimumAndADeniedOneTouchesNothing) {
  for (const SoundCategory& category : kSoundCategories) {
    SCOPED_TRACE(category.name);
    int min = 7, max = 8;
    Host::SetPrivilege("audiomanager.volume", E_PRIVILEGE_DENIED);
    EXPECT_EQ(std::invoke(category.getRange, manager, min, max), E_PRIVILEGE_DENIED);
    EXPECT_EQ(std::pair(min, max), std::pair(7, 8));
    Host::ResetCapabilities();
    Host::FailCall("sound_manager_get_max_volume", -22, 1);
    EXPECT_EQ(std::invoke(category.getRange, manager, min, max), E_INVALID_ARG);
    EXPECT_EQ(std::pair(min, max), std::pair(0, 8));
  }
}

TEST_F(VolumeLevels, MutingIsTheDevicesStateAndLeavesTheLevels) {
  EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_UNMUTED);
  for (int i = 0; i < 2; ++i) {
    Forget();
    EXPECT_EQ(manager.MuteAll(), E_SUCCESS);
    ExpectLeftBehindGate(kUntouched, {}, {"sound_manager_set_muteall(true)"});
    EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_MUTED);
    EXPECT_EQ(manager.GetCurrentMediaVolumeLevel(), 7);
  }
  for (const char* query : {"sound_manager_get_muteall", "sound_manager_get_volume"}) {
    Host::FailCall(query, 0, 1);  // succeeds without an answer
  }
  EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_UNMUTED);
  EXPECT_EQ(manager.GetCurrentMediaVolumeLevel(), 0);
  EXPECT_EQ(manager.UnmuteAll(), E_SUCCESS);
  EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_UNMUTED);
  World::ChangeMuteAll(true);
  EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_MUTED);
}

}  // namespace
}  // namespace Zelkora::Media
