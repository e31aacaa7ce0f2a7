#include "support/LibraryTest.h"
#include "support/Managers.h"

#include <algorithm>
#include <climits>
#include <functional>

namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using namespace Zelkora::Media;

class VolumeLevels : public LibraryTest {
 protected:
  AudioVolumeManager& manager = *AudioVolumeManager::GetInstance();
};

TEST_F(VolumeLevels, EachCategoryHasALevelAndARangeOfItsOwnOnTheDevice) {
  for (const SoundCategory& category : kSoundCategories) {
    SCOPED_TRACE(category.name);
    Simulated::SetMaxVolume(category.soundType, 20 + category.soundType);
    EXPECT_EQ(std::invoke(category.setLevel, manager, 10 + category.soundType), E_SUCCESS);
  }
  for (const SoundCategory& category : kSoundCategories) {
    SCOPED_TRACE(category.name);
    int min = 7, max = 7;
    EXPECT_EQ(std::invoke(category.getRange, manager, min, max), E_SUCCESS);
    EXPECT_EQ(min, 0);
    EXPECT_EQ(max, 20 + category.soundType);
    EXPECT_EQ(std::invoke(category.getLevel, manager), 10 + category.soundType);
    Simulated::ReportVolume(category.soundType, 1);  // nothing is remembered
    EXPECT_EQ(std::invoke(category.getLevel, manager), 1);
  }
}

TEST_F(VolumeLevels, LevelsOutOfRangeAreHandedToTheDeviceWhichJudgesThem) {
  for (const SoundCategory& category : kSoundCategories) {
    for (const int level : {-1, 16, INT_MAX, INT_MIN}) {
      SCOPED_TRACE(std::string(category.name) + " " + std::to_string(level));
      Host::RecordCalls(true);
      EXPECT_EQ(std::invoke(category.setLevel, manager, level), E_INVALID_ARG);
      EXPECT_THAT(Host::TakeCalls(),
                  Contains("sound_manager_set_volume(" + std::to_string(category.soundType) + ", " +
                           std::to_string(level) + ")"));
      EXPECT_THAT(log.Take(), ElementsAre(SysNamed(E_INVALID_ARG,
                                                   " sound_manager_set_volume failed with -22")));
    }
  }
}

TEST_F(VolumeLevels, DevicesRefusalIsConvertedAndLoggedWithItsCode) {
  for (const auto& operation : Facts<AudioVolumeManager>::Operations()) {
    const std::string function = operation.Function();
    if (function.rfind("_Event", 0) == 0) continue;  // the listeners' results aren't converted
    for (const auto& failure : kPlatformFailures) {
      SCOPED_TRACE(operation.name + " " + std::to_string(failure.code));
      ClearLastResult();
      Host::FailCall(function.c_str(), failure.code, 1);
      Host::RecordCalls(true);
      const std::int64_t expected =
          operation.name == "GetMuteStatus" ? 0 : operation.Refused(failure.r);
      EXPECT_EQ(operation.call(manager), expected);
      EXPECT_EQ(GetLastResult(), failure.r);
      EXPECT_THAT(Host::TakeCalls(),
                  ElementsAre(PrivilegeQuery<AudioVolumeManager>(), operation.platformCall));
      EXPECT_THAT(log.Take(), ElementsAre(SysNamed(failure.r, " " + function + " failed with " +
                                                                  std::to_string(failure.code))));
    }
  }
}

TEST_F(VolumeLevels, RefusedRangeQueryStillGivesTheMinimumAndADeniedOneTouchesNothing) {
  for (const SoundCategory& category : kSoundCategories) {
    SCOPED_TRACE(category.name);
    int min = 7, max = 8;
    Host::SetPrivilege("audiomanager.volume", E_PRIVILEGE_DENIED);
    EXPECT_EQ(std::invoke(category.getRange, manager, min, max), E_PRIVILEGE_DENIED);
    EXPECT_EQ(min, 7);
    EXPECT_EQ(max, 8);
    Host::ResetCapabilities();
    Host::FailCall("sound_manager_get_max_volume", -22, 1);
    EXPECT_EQ(std::invoke(category.getRange, manager, min, max), E_INVALID_ARG);
    EXPECT_EQ(min, 0);
    EXPECT_EQ(max, 8);
  }
}

TEST_F(VolumeLevels, MutingIsTheDevicesStateAndLeavesTheLevels) {
  EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_UNMUTED);
  Host::RecordCalls(true);
  EXPECT_EQ(manager.MuteAll(), E_SUCCESS);
  EXPECT_EQ(manager.MuteAll(), E_SUCCESS);
  const auto calls = Host::TakeCalls();
  EXPECT_EQ(std::count(calls.begin(), calls.end(), "sound_manager_set_muteall(true)"), 2);
  EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_MUTED);
  EXPECT_EQ(manager.GetCurrentMediaVolumeLevel(), 7);
  EXPECT_EQ(manager.UnmuteAll(), E_SUCCESS);
  EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_UNMUTED);
  Simulated::ReportMuteAll(true);
  EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_MUTED);
}

}  // namespace
