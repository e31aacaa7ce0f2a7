#include "Listeners.h"

namespace Zelkora::Media {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

using VolumeEvents = ManagerTest<Volume>;

TEST_F(VolumeEvents, OneChangeTravelsFromTheCallToTheListener) {
  Volume* volume = Volume::GetInstance();
  ASSERT_NE(volume, nullptr);
  VolumeListener listener;
  ASSERT_EQ(volume->AddAudioVolumeEventListener(listener), E_SUCCESS);
  ASSERT_EQ(volume->SetMediaVolumeLevel(9), E_SUCCESS);
  EXPECT_THAT(listener.Take(), ElementsAre("Media 9"));
  EXPECT_EQ(volume->GetCurrentMediaVolumeLevel(), 9);
  ASSERT_EQ(volume->RemoveAudioVolumeEventListener(listener), E_SUCCESS);

  const std::string privilege = PrivilegeQuery<Volume>();
  EXPECT_THAT(Host::TakeCalls(), ElementsAre(privilege, kFeatureQuery,                     //
                                             privilege, "_Event::AddListener()",           //
                                             privilege, "sound_manager_set_volume(4, 9)",  //
                                             "_Event::FireAsync()",                        //
                                             privilege, "sound_manager_get_volume(4)",     //
                                             privilege, "_Event::RemoveListener()"));
  EXPECT_THAT(log.Take(), IsEmpty());
}

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
}

TEST_F(VolumeEvents, PlatformsAnswerToAListenerIsPassedOnUnloggedAndNotTheLastResult) {
  VolumeListener listener;
  const auto add = [&] { return manager.AddAudioVolumeEventListener(listener); };
  const auto remove = [&] { return manager.RemoveAudioVolumeEventListener(listener); };
  EXPECT_EQ(remove(), E_OBJ_NOT_FOUND);
  EXPECT_EQ(add(), E_SUCCESS);
  EXPECT_EQ(add(), E_INVALID_OPERATION);
  Host::FailCall("_Event::RemoveListener", E_SYSTEM, 1);
  EXPECT_EQ(remove(), E_SYSTEM);
  EXPECT_EQ(remove(), E_SUCCESS);
  Host::FailCall("_Event::AddListener", kForeign, 1);
  EXPECT_EQ(add(), kForeign);
  EXPECT_EQ(GetLastResult(), kUntouched);
  EXPECT_THAT(log.Take(), IsEmpty());
  World::ChangeLevel(4, 9);
  EXPECT_THAT(listener.Take(), IsEmpty());
}

}  // namespace
}  // namespace Zelkora::Media
