#include "support/Managers.h"

#include <climits>

namespace Zelkora::Media {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

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
    const struct {
      int mode, platformMode, readBack;
    } rows[] = {{0, 0, 1}, {3, 2, 3}, {1, 0, 1}, {2, 1, 2}};
    for (const auto& row : rows) {
      SCOPED_TRACE(row.mode);
      EXPECT_EQ(manager.SetCallSessionMode(Mode(row.mode)), E_SUCCESS);
      EXPECT_THAT(World::GetCallModes(), ElementsAre(row.platformMode));
      EXPECT_EQ(manager.GetCallSessionMode(), row.readBack);
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

}  // namespace
}  // namespace Zelkora::Media
