// How creating a call goes wrong that only the simulated device can be made to do.

#include "support/Managers.h"

namespace Zelkora::Media {
namespace {

using CallCreation = ManagerTest<Call>;
using Simulated::CallSessionFault;

TEST_F(CallCreation, PlatformThatGivesNoSessionOrFailsWithOneLeavesNone) {
  const struct {
    CallSessionFault fault;
    result r;
    std::string message;
    Lines calls;
  } rows[] = {
      {CallSessionFault::kNoSession,
       E_SYSTEM,
       " A system error has been occurred. The value of __soundCallSessionHandle is null.",
       {"sound_manager_call_session_create(1)"}},
      {CallSessionFault::kSessionRemains,
       E_INVALID_OPERATION,
       " Failed to perform sound_manager_call_session_create operation with error code : "
       "0xffffffda",
       {"sound_manager_call_session_create(1)", "sound_manager_call_session_destroy(1)"}},
  };
  for (const auto& row : rows) {
    Simulated::SetCallSessionFault(row.fault);
    EXPECT_EQ(manager.EnterCallSession(), row.r);
    ExpectLeftBehindGate(row.r, {SysNamed(row.r, row.message)}, row.calls);
    EXPECT_THAT(Simulated::GetCallSessionModes(), testing::IsEmpty());
    EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_NONE);
    Forget();
  }
}

}  // namespace
}  // namespace Zelkora::Media
