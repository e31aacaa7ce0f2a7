#include "Listeners.h"

namespace Zelkora::Media {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

using VolumeEvents = ManagerTest<Volume>;

TEST_F(VolumeEvents, EachChangeReachesEachListenerOnceThroughItsOwnOperation) {
  Added<VolumeListener> first, second;
  for (const SoundCategory& category : kSoundCategories) {
    World::ChangeLevel(category.soundType, 1 + category.soundType);
  }
  World::ChangeMuteAll(true);
  EXPECT_EQ(manager.UnmuteAll(), E_SUCCESS);
  EXPECT_EQ(manager.UnmuteAll(), E_SUCCESS);
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
