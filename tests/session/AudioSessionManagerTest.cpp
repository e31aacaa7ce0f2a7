#include "Listeners.h"

#include <sound_manager.h>

#include <climits>

namespace Zelkora::Media {
namespace {

constexpr char kQueryType[] = "sound_manager_get_session_type()";
constexpr char kQueryOption[] = "sound_manager_get_media_session_option()";
constexpr char kSetMix[] = "sound_manager_set_media_session_option(1, 0)";

std::string SetType(int type) {
  return "sound_manager_set_session_type(" + std::to_string(type) + ")";
}

using SessionMode = ManagerTest<Session>;

TEST_F(SessionMode, SettingSendsTheSessionTypeAndForMixTheOptionPair) {
  const std::pair<int, Lines> rows[] = {
      {0, {SetType(0)}},       {1, {SetType(0), kSetMix}}, {2, {SetType(3)}},   {3, {SetType(2)}},
      {4, {SetType(1)}},       {5, {SetType(0)}},          {100, {SetType(0)}}, {-1, {SetType(0)}},
      {INT_MIN, {SetType(0)}}, {INT_MAX, {SetType(0)}},
  };
  for (const auto& [mode, calls] : rows) {
    SCOPED_TRACE(mode);
    EXPECT_EQ(manager.SetMode(static_cast<AudioSessionMode>(mode)), E_SUCCESS);
    ExpectLeftBehindGate(kUntouched, {}, calls);
  }
  EXPECT_EQ(manager.GetMode(), AUDIO_SESSION_MODE_MEDIA_MIX);  // the device has kept the pair
}

TEST_F(SessionMode, IsReadFromTheSessionTypeAndOnlyThenFromTheFirstOption) {
  const struct {
    int type, first, second, mode;
  } rows[] = {{0, 0, 0, 0}, {0, 1, 0, 1}, {0, 1, 5, 1}, {0, 2, 1, 0},
              {3, 1, 0, 2}, {2, 1, 0, 3}, {1, 1, 0, 4}, {1, 0, 0, 4}};
  for (const auto& row : rows) {
    SCOPED_TRACE(testing::Message() << row.type << ' ' << row.first);
    sound_manager_set_session_type(row.type);
    sound_manager_set_media_session_option(row.first, row.second);
    Forget();
    EXPECT_EQ(manager.GetMode(), row.mode);
    ExpectLeftBehindGate(kUntouched, {},
                         row.type == 0 ? Lines{kQueryType, kQueryOption} : Lines{kQueryType});
  }
}

TEST_F(SessionMode, DeviceThatSucceedsWithoutAnAnswerHasSessionType0AndNoOption) {
  EXPECT_EQ(manager.SetMode(AUDIO_SESSION_MODE_MEDIA_MIX), E_SUCCESS);
  Host::FailCall("sound_manager_get_media_session_option", 0, 1);
  EXPECT_EQ(manager.GetMode(), AUDIO_SESSION_MODE_MEDIA);
  Host::FailCall("sound_manager_get_session_type", 0, 1);
  EXPECT_EQ(manager.GetMode(), AUDIO_SESSION_MODE_MEDIA_MIX);
}

using Interruptions = ManagerTest<Session>;

TEST_F(Interruptions, CallsAndAlarmsOfOthersStartAndFinishThemAndLosingTheOutputDisrupts) {
  SessionListener listener;
  PlainSessionListener plain;
  EXPECT_EQ(manager.SetAudioSessionEventListener(&listener), E_SUCCESS);
  World::BeginCall();
  World::EndCallOrAlarm();
  EXPECT_EQ(listener.TakeHeard(), "started finished ");
  EXPECT_EQ(manager.SetMode(AUDIO_SESSION_MODE_ALARM), E_SUCCESS);
  World::BeginAlarm();
  World::EndCallOrAlarm();
  World::TakeOutput();
  EXPECT_EQ(listener.TakeHeard(), "started finished disrupted ");

  EXPECT_EQ(manager.SetAudioSessionEventListener(&plain), E_SUCCESS);
  World::TakeOutput();
  World::BeginCall();
  EXPECT_EQ(plain.TakeHeard(), "started ");
  EXPECT_EQ(manager.SetAudioSessionEventListener(nullptr), E_SUCCESS);
  World::EndCallOrAlarm();
  EXPECT_EQ(listener.TakeHeard() + plain.TakeHeard(), "");
}

}  // namespace
}  // namespace Zelkora::Media
