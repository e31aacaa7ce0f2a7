// What the library relies on in the sound manager, shown by the simulated device, and its steering.

#include "support/Gate.h"
#include "support/LibraryTest.h"
#include "support/NativeListener.h"

#include <thread>

namespace {

using testing::ElementsAre;

using SoundManagerTest = LibraryTest;

TEST_F(SoundManagerTest, ReportsTellEveryChangeOnceInOrderOnOneThreadOfTheDevicesOwn) {
  std::vector<std::thread::id> threads;
  NativeListener listener(NativeListener::kAll, [&] {
    threads.push_back(std::this_thread::get_id());
    Host::WaitUntilDelivered();  // not for this call
  });
  sound_manager_set_volume(4, 9);
  sound_manager_set_volume(4, 9);
  sound_manager_set_volume(0, 3);  // as it is
  sound_manager_set_muteall(false);
  sound_manager_set_muteall(true);
  sound_manager_set_muteall(true);
  Simulated::ReportVolume(5, 2);
  Simulated::ReportVolume(6, 1);
  Simulated::ReportMuteAll(false);
  Simulated::Interrupt(-7);
  EXPECT_TRUE(Simulated::SetMaxVolume(4, 8));
  EXPECT_TRUE(Simulated::SetMaxVolume(5, 30));
  EXPECT_EQ(sound_manager_set_volume(5, 30), 0);
  EXPECT_THAT(listener.TakeAll(),
              ElementsAre("4=9", "muted", "5=2", "6=1", "unmuted", "code -7", "4=8", "5=30"));
  EXPECT_THAT(threads, testing::Each(threads[0]));
  EXPECT_NE(threads[0], std::this_thread::get_id());
}

TEST_F(SoundManagerTest, UnsettingACallbackWaitsForItsCallAndDropsWhatIsOnTheWayForItAlone) {
  SlowCall first;
  NativeListener listener(NativeListener::kAll, [&] {
    if (!first.finished) first();
  });
  Simulated::ReportMuteAll(true);
  first.gate.AwaitVisitor();
  Simulated::Interrupt(1);
  Simulated::ResetSoundManager();
  Simulated::Interrupt(2);
  Simulated::ReportVolume(4, 1);
  EXPECT_EQ(sound_manager_unset_volume_changed_cb(), 0);  // has no call to wait for
  EXPECT_EQ(sound_manager_unset_volume_changed_cb(), 0);
  NativeListener next(NativeListener::kLevels);
  Simulated::ReportVolume(4, 2);
  first.ExpectAwaitedBy([] { EXPECT_EQ(sound_manager_unset_muteall_changed_cb(), 0); });
  Simulated::ReportMuteAll(false);
  EXPECT_THAT(listener.TakeAll(), ElementsAre("muted", "code 2"));
  EXPECT_THAT(next.TakeAll(), ElementsAre("4=2"));
}

}  // namespace
