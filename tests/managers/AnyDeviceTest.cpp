// What the managers, and the sound manager beneath them, do on any device.

#include "Listeners.h"

#include <sound_manager.h>

#include <climits>
#include <tuple>

namespace {

using namespace testing;
using namespace Zelkora::Media;

using SessionMode = ManagerTest<Session>;

TEST_F(SessionMode, IsSentAsASessionTypeAndForMixAnOptionPair) {
  constexpr int kRows[][2] = {{0, 0}, {1, 0},  {2, 3},       {3, 2},      {4, 1},
                              {5, 0}, {-1, 0}, {INT_MIN, 0}, {INT_MAX, 0}};
  for (const auto& [mode, type] : kRows) {
    SCOPED_TRACE(mode);
    EXPECT_EQ(manager.SetMode(static_cast<AudioSessionMode>(mode)), E_SUCCESS);
    Lines calls = {PrivilegeQuery<Session>(),
                   "sound_manager_set_session_type(" + std::to_string(type) + ")"};
    if (mode == 1) calls.push_back("sound_manager_set_media_session_option(1, 0)");
    ExpectLeft(kUntouched, {}, calls);
  }
  EXPECT_EQ(manager.GetMode(), AUDIO_SESSION_MODE_MEDIA_MIX);  // the device has kept the pair
}

TEST_F(SessionMode, IsReadFromTheSessionTypeAndOnlyThenFromTheFirstOption) {
  const std::string none, type = "sound_manager_get_session_type",
                          option = "sound_manager_get_media_session_option";
  const std::tuple<int, int, int, std::string, int> rows[] = {
      {0, 0, 0, none, 0}, {0, 1, 0, none, 1},  {0, 1, 5, none, 1}, {0, 2, 1, none, 0},
      {3, 1, 0, none, 2}, {2, 1, 0, none, 3},  {1, 1, 0, none, 4}, {1, 0, 0, none, 4},
      {3, 1, 0, type, 1}, {0, 1, 0, option, 0}};
  for (const auto& [set, first, second, unanswered, mode] : rows) {
    SCOPED_TRACE(Message() << set << ' ' << first << ' ' << unanswered);
    sound_manager_set_session_type(set);
    sound_manager_set_media_session_option(first, second);
    // One query succeeds without an answer.
    if (unanswered != none) Host::FailCall(unanswered.c_str(), 0, 1);
    Forget();
    EXPECT_EQ(manager.GetMode(), mode);
    Lines calls = {PrivilegeQuery<Session>(), type + "()"};
    if (mode <= 1) calls.push_back(option + "()");
    ExpectLeft(kUntouched, {}, calls);
  }
}

using Volumes = ManagerTest<Volume>;

/// \return what the manager says of all categories
std::vector<int> Levels(const Volume& manager) {
  std::vector<int> levels;
  for (const Category& category : kCategories) {
    levels.push_back(std::invoke(category.level, manager));
  }
  return levels;
}

TEST_F(Volumes, EachCategoryHasARangeAndALevelOfItsOwnWhichTheDeviceJudges) {
  std::vector<int> expected = Levels(manager);
  for (const Category& category : kCategories) {
    SCOPED_TRACE(category.name);
    int& own = expected[static_cast<std::size_t>(&category - kCategories)];
    int min = 7, max = -1;
    Host::FailCall("sound_manager_get_max_volume", -22, 1);
    EXPECT_EQ(std::invoke(category.range, manager, min, max), E_INVALID_ARG);
    EXPECT_EQ(std::pair(min, max), std::pair(0, -1)) << "the minimum is given all the same";
    EXPECT_EQ(std::invoke(category.range, manager, min = 7, max), E_SUCCESS);
    EXPECT_EQ(min, 0);
    EXPECT_GE(max, 10);
    for (own = max; own > 0; --own) {
      EXPECT_EQ(std::invoke(category.setLevel, manager, own), E_SUCCESS);
      EXPECT_EQ(Levels(manager), expected);
    }
    EXPECT_EQ(std::invoke(category.setLevel, manager, own = 3), E_SUCCESS);
    for (const int level : {-1, max + 1, INT_MAX, INT_MIN}) {
      EXPECT_EQ(std::invoke(category.setLevel, manager, level), E_INVALID_ARG);
    }
    EXPECT_EQ(Levels(manager), expected);
  }
}

TEST_F(Volumes, MutingIsTheDevicesStateAndLeavesTheLevels) {
  EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_UNMUTED);
  EXPECT_EQ(manager.MuteAll(), E_SUCCESS);
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

TEST_F(Volumes, EachChangeReachesEachListenerOnceThroughItsOwnOperation) {
  Added<VolumeListener> first, second;
  int next = 1;
  for (const Category& category : kCategories) {
    EXPECT_EQ(std::invoke(category.setLevel, manager, next++), E_SUCCESS);
  }
  for (int i = 0; i < 2; ++i) EXPECT_EQ(manager.MuteAll(), E_SUCCESS);
  for (int i = 0; i < 2; ++i) EXPECT_EQ(manager.UnmuteAll(), E_SUCCESS);
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

VoipAudioSessionMode Mode(int value) { return static_cast<VoipAudioSessionMode>(value); }

using Calls = ManagerTest<Call>;

TEST_F(Calls, OneIsOpenUntilItIsExitedAndHasAModeOfItsOwn) {
  for (int i = 0; i < 2; ++i) {
    for (const int mode : {0, 3, 5, -1}) {  // the state is judged before the argument
      EXPECT_EQ(manager.SetCallSessionMode(Mode(mode)), E_INVALID_STATE);
    }
    EXPECT_EQ(manager.EnterCallSession(), E_SUCCESS);
    EXPECT_EQ(manager.EnterCallSession(), E_INVALID_OPERATION);
    EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_VOICE);
    for (const auto& [mode, platformMode, readBack] :
         {std::tuple{0, 0, 1}, {3, 2, 3}, {1, 0, 1}, {2, 1, 2}}) {
      SCOPED_TRACE(mode);
      EXPECT_EQ(manager.SetCallSessionMode(Mode(mode)), E_SUCCESS);
      EXPECT_THAT(World::GetCallModes(), ElementsAre(platformMode));
      EXPECT_EQ(manager.GetCallSessionMode(), readBack);
    }
    for (const int mode : {-1, 4, 5, INT_MAX, INT_MIN}) {
      EXPECT_EQ(manager.SetCallSessionMode(Mode(mode)), E_INVALID_ARG);
    }
    Host::FailCall("sound_manager_call_session_set_mode", -1, 1);
    EXPECT_EQ(manager.SetCallSessionMode(Mode(3)), E_SYSTEM);
    Host::FailCall("sound_manager_call_session_destroy", -38, 1);
    EXPECT_EQ(manager.ExitCallSession(), E_INVALID_OPERATION);
    EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_RINGTONE);
    Host::FailCall("sound_manager_call_session_get_mode", 0, 1);  // succeeds without an answer
    EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_VOICE);
    EXPECT_EQ(manager.ExitCallSession(), E_SUCCESS);
    EXPECT_THAT(World::GetCallModes(), IsEmpty());
  }
}

TEST(SoundManager, RefusesWrongArgumentsChangingNothing) {
  static int value;
  static sound_call_session_h session, destroyed;
  const std::pair<const char*, int (*)()> rows[] = {
      {"maximum of no type", [] { return sound_manager_get_max_volume(-1, &value); }},
      {"no session type", [] { return sound_manager_set_session_type(4); }},
      {"no call", [] { return sound_manager_call_session_create(0, &session); }},
      {"no call mode", [] { return sound_manager_call_session_set_mode(session, 3); }},
      {"mode after the end", [] { return sound_manager_call_session_set_mode(destroyed, 1); }},
      {"read after the end", [] { return sound_manager_call_session_get_mode(destroyed, &value); }},
      {"maximum to null", [] { return sound_manager_get_max_volume(0, nullptr); }},
      {"level to null", [] { return sound_manager_get_volume(0, nullptr); }},
      {"mute-all to null", [] { return sound_manager_get_muteall(nullptr); }},
      {"option to null", [] { return sound_manager_get_media_session_option(&value, nullptr); }},
      {"call to null", [] { return sound_manager_call_session_create(1, nullptr); }},
      {"mode to null", [] { return sound_manager_call_session_get_mode(session, nullptr); }},
      {"no callback", [] { return sound_manager_set_volume_changed_cb(nullptr, &value); }},
  };
  World::Reset();
  EXPECT_EQ(sound_manager_call_session_create(1, &destroyed), 0);
  EXPECT_EQ(sound_manager_call_session_create(1, &session), 0);
  EXPECT_EQ(sound_manager_call_session_destroy(destroyed), 0);
  for (const auto& [name, call] : rows) {
    value = 77;
    EXPECT_EQ(call(), SOUND_MANAGER_ERROR_INVALID_PARAMETER) << name;
    EXPECT_EQ(value, 77) << name;
  }
  EXPECT_THAT(World::GetCallModes(), ElementsAre(0));
  EXPECT_EQ(sound_manager_call_session_destroy(session), 0);
}

}  // namespace
