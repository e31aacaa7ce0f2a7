#include "Listeners.h"

#include <climits>

namespace Zelkora::Media {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

using VolumeLevels = ManagerTest<Volume>;
using VolumeEvents = ManagerTest<Volume>;

/// \return what the manager says of all categories
std::vector<int> Levels(const Volume& manager) {
  std::vector<int> levels;
  for (const SoundCategory& category : kSoundCategories) {
    levels.push_back(std::invoke(category.getLevel, manager));
  }
  return levels;
}

TEST_F(VolumeLevels, EachCategoryHasARangeAndALevelOfItsOwnWhichTheDeviceJudges) {
  std::vector<int> expected = Levels(manager);
  for (const SoundCategory& category : kSoundCategories) {
    SCOPED_TRACE(category.name);
    int& own = expected[static_cast<std::size_t>(category.soundType)];
    int min = 7, max = -1;
    Host::FailCall("sound_manager_get_max_volume", -22, 1);
    EXPECT_EQ(std::invoke(category.getRange, manager, min, max), E_INVALID_ARG);
    EXPECT_EQ(std::pair(min, max), std::pair(0, -1)) << "the minimum is given all the same";
    EXPECT_EQ(std::invoke(category.getRange, manager, min = 7, max), E_SUCCESS);
    EXPECT_EQ(min, 0);
    EXPECT_GE(max, 10);
    for (own = max; own > 0; --own) {
      EXPECT_EQ(std::invoke(category.setLevel, manager, own), E_SUCCESS);
      EXPECT_EQ(Levels(manager), expected);
    }
    World::ChangeLevel(category.soundType, own = 3);  // nothing is remembered
    for (const int level : {-1, max + 1, INT_MAX, INT_MIN}) {
      EXPECT_EQ(std::invoke(category.setLevel, manager, level), E_INVALID_ARG);
    }
    EXPECT_EQ(Levels(manager), expected);
  }
}

TEST_F(VolumeLevels, MutingIsTheDevicesStateAndLeavesTheLevels) {
  EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_UNMUTED);
  World::ChangeMuteAll(true);
  for (int i = 0; i < 2; ++i) {
    EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_MUTED);
    EXPECT_EQ(manager.GetCurrentMediaVolumeLevel(), 7);
    EXPECT_EQ(manager.MuteAll(), E_SUCCESS);
  }
  for (const char* query : {"sound_manager_get_muteall", "sound_manager_get_volume"}) {
    Host::FailCall(query, 0, 1);  // succeeds without an answer
  }
  EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_UNMUTED);
  EXPECT_EQ(manager.GetCurrentMediaVolumeLevel(), 0);
}

TEST_F(VolumeEvents, EachChangeReachesEachListenerOnceThroughItsOwnOperation) {
  Added<VolumeListener> first, second;
  for (const SoundCategory& category : kSoundCategories) {
    World::ChangeLevel(category.soundType, 1 + category.soundType);
  }
  World::ChangeMuteAll(true);
  EXPECT_EQ(manager.UnmuteAll(), E_SUCCESS);
  EXPECT_EQ(manager.UnmuteAll(), E_SUCCESS);
  EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_UNMUTED);
  for (const int level : {0, 0, 9}) EXPECT_EQ(manager.SetAlarmVolumeLevel(level), E_SUCCESS);
  const auto all = ElementsAre("System 1", "Notification 2", "Alarm 3", "Ringtone 4", "Media 5",
                               "Call 6", "MuteAllStatus 1", "MuteStatus 1", "MuteAllStatus 2",
                               "MuteStatus 2", "Alarm 0", "Alarm 9");
  EXPECT_THAT(first.Take(), all);
  EXPECT_THAT(second.Take(), all);

  EXPECT_EQ(manager.RemoveAudioVolumeEventListener(first), E_SUCCESS);
  EXPECT_EQ(manager.SetMediaVolumeLevel(9), E_SUCCESS);
  EXPECT_THAT(second.Take(), ElementsAre("Media 9"));
  EXPECT_THAT(first.Take(), IsEmpty());
  EXPECT_EQ(manager.AddAudioVolumeEventListener(first), E_SUCCESS);
}

}  // namespace
}  // namespace Zelkora::Media
