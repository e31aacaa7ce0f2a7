// What calls come to on devices that do what those of this tree don't.

#include "support/Managers.h"

#include <sound_manager.h>

#include <climits>

namespace {

int reportedMode = 0;

}  // namespace

/// A device whose call sessions report any mode: the library finds this one first.
int sound_manager_call_session_get_mode(sound_call_session_h, int* mode) {
  *mode = reportedMode;
  return 0;
}

namespace Zelkora::Media {
namespace {

using CallDevice = ManagerTest<Call>;

TEST_F(CallDevice, ModeThatIsNotKnownIsReadAsNone) {
  ASSERT_EQ(manager.EnterCallSession(), E_SUCCESS);
  for (const int unknown : {3, -1, INT_MAX, INT_MIN}) {
    reportedMode = unknown;
    SetLastResult(kUntouched);
    EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_NONE) << unknown;
    EXPECT_EQ(GetLastResult(), kUntouched);
  }
  EXPECT_EQ(manager.ExitCallSession(), E_SUCCESS);
}

TEST_F(CallDevice, SessionThatAFailureLeavesBehindIsClosed) {
  Simulated::SetCallSessionFault(Simulated::CallSessionFault::kSessionRemains);
  EXPECT_EQ(manager.EnterCallSession(), E_INVALID_OPERATION);
  EXPECT_THAT(Simulated::GetCallSessionModes(), testing::IsEmpty());
  EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_NONE);
}

}  // namespace
}  // namespace Zelkora::Media
