#include "Listeners.h"

#include <sound_manager.h>

#include <climits>

namespace Zelkora::Media {
namespace {

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
  const struct {
    int type, first, second;
    std::string unanswered;  // the query that succeeds without an answer
    int mode;
  } rows[] = {{0, 0, 0, none, 0}, {0, 1, 0, none, 1},  {0, 1, 5, none, 1}, {0, 2, 1, none, 0},
              {3, 1, 0, none, 2}, {2, 1, 0, none, 3},  {1, 1, 0, none, 4}, {1, 0, 0, none, 4},
              {3, 1, 0, type, 1}, {0, 1, 0, option, 0}};
  for (const auto& row : rows) {
    SCOPED_TRACE(testing::Message() << row.type << ' ' << row.first << ' ' << row.unanswered);
    sound_manager_set_session_type(row.type);
    sound_manager_set_media_session_option(row.first, row.second);
    if (row.unanswered != none) Host::FailCall(row.unanswered.c_str(), 0, 1);
    Forget();
    EXPECT_EQ(manager.GetMode(), row.mode);
    Lines calls = {PrivilegeQuery<Session>(), type + "()"};
    if (row.mode <= 1) calls.push_back(option + "()");
    ExpectLeft(kUntouched, {}, calls);
  }
}

using Interruptions = ManagerTest<Session>;

TEST_F(Interruptions, CallsAndAlarmsOfOthersStartAndFinishThemAndLosingTheOutputDisrupts) {
  SessionListener listener;
  EXPECT_EQ(manager.SetAudioSessionEventListener(&listener), E_SUCCESS);
  World::BeginCall();
  World::EndCallOrAlarm();
  EXPECT_EQ(listener.TakeHeard(), "started finished ");
  EXPECT_EQ(manager.SetMode(AUDIO_SESSION_MODE_ALARM), E_SUCCESS);
  World::BeginAlarm();
  World::EndCallOrAlarm();
  World::TakeOutput();
  EXPECT_EQ(listener.TakeHeard(), "started finished disrupted ");
  EXPECT_EQ(manager.SetAudioSessionEventListener(nullptr), E_SUCCESS);
  World::BeginCall();
  EXPECT_EQ(listener.TakeHeard(), "");
}

}  // namespace
}  // namespace Zelkora::Media
