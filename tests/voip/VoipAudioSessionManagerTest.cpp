#include "support/LibraryTest.h"
#include "support/Managers.h"

#include <climits>

namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using namespace Zelkora::Media;

constexpr char kNotEntered[] = "[E_INVALID_STATE] EnterCallSession() should be called before use";
constexpr char kHandle[] =
    "[E_INVALID_OPERATION] A error has been occurred. The value of __soundCallSessionHandle is ";

VoipAudioSessionMode Mode(int value) { return static_cast<VoipAudioSessionMode>(value); }

class NoCall : public LibraryTest {
 protected:
  ~NoCall() override {
    Host::ClearFailures();
    if (!Simulated::GetCallSessionModes().empty()) manager.ExitCallSession();
  }

  void ExpectFailure(result r, const std::string& line) {
    EXPECT_EQ(GetLastResult(), r);
    EXPECT_THAT(log.Take(), ElementsAre(Sys(r, line)));
    ClearLastResult();
  }

  /// Checks that nothing but the gate was asked since recording began.
  void ExpectNoPlatformCall() {
    EXPECT_THAT(Host::TakeCalls(), ElementsAre(PrivilegeQuery<VoipAudioSessionManager>()));
  }

  VoipAudioSessionManager& manager = *VoipAudioSessionManager::GetInstance();
};

TEST_F(NoCall, LeavesNothingToExitAndNoModeToSetOrGet) {
  Host::RecordCalls(true);
  EXPECT_EQ(manager.ExitCallSession(), E_INVALID_OPERATION);
  ExpectFailure(E_INVALID_OPERATION, kHandle + std::string("null."));
  ExpectNoPlatformCall();
  for (const int mode : {0, 1, 2, 3, 5, -1}) {  // the state is judged before the argument
    EXPECT_EQ(manager.SetCallSessionMode(Mode(mode)), E_INVALID_STATE);
    ExpectFailure(E_INVALID_STATE, kNotEntered);
    ExpectNoPlatformCall();
  }
  EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_NONE);
  ExpectFailure(E_INVALID_STATE, kNotEntered);
  ExpectNoPlatformCall();
}

TEST_F(NoCall, RefusedCreationStaysWithoutACall) {
  for (const auto& failure : kPlatformFailures) {
    SCOPED_TRACE(failure.code);
    Host::FailCall("sound_manager_call_session_create", failure.code, 1);
    EXPECT_EQ(manager.EnterCallSession(), failure.r);
    EXPECT_EQ(GetLastResult(), failure.r);
    const auto lines = log.Take();  // its wording is free, but for these
    ASSERT_EQ(lines.size(), 1u);
    EXPECT_THAT(lines[0], testing::StartsWith(SysNamed(failure.r, " ")));
    EXPECT_THAT(lines[0], testing::EndsWith(failure.hex));
    EXPECT_EQ(manager.ExitCallSession(), E_INVALID_OPERATION);
    log.Take();
  }
  EXPECT_EQ(manager.EnterCallSession(), E_SUCCESS);
}

TEST_F(NoCall, CreationWithoutASessionIsASystemError) {
  Simulated::SetCallSessionFault(Simulated::CallSessionFault::kNoSession);
  Host::RecordCalls(true);
  EXPECT_EQ(manager.EnterCallSession(), E_SYSTEM);
  ExpectFailure(E_SYSTEM,
                "[E_SYSTEM] A system error has been occurred. The value of "
                "__soundCallSessionHandle is null.");
  EXPECT_THAT(Host::TakeCalls(), ElementsAre(PrivilegeQuery<VoipAudioSessionManager>(),
                                             "sound_manager_call_session_create(1)"));
  EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_NONE);
}

TEST_F(NoCall, SessionLeftBehindByARefusalIsDestroyed) {
  Simulated::SetCallSessionFault(Simulated::CallSessionFault::kSessionRemains);
  Host::RecordCalls(true);
  EXPECT_EQ(manager.EnterCallSession(), E_INVALID_OPERATION);
  EXPECT_EQ(GetLastResult(), E_INVALID_OPERATION);
  EXPECT_THAT(Host::TakeCalls(), ElementsAre(PrivilegeQuery<VoipAudioSessionManager>(),
                                             "sound_manager_call_session_create(1)",
                                             "sound_manager_call_session_destroy(1)"));
  EXPECT_THAT(Simulated::GetCallSessionModes(), IsEmpty());
  Simulated::SetCallSessionFault(Simulated::CallSessionFault::kNone);
  EXPECT_EQ(manager.EnterCallSession(), E_SUCCESS);
}

class InCall : public NoCall {
 protected:
  InCall() { EXPECT_EQ(manager.EnterCallSession(), E_SUCCESS); }
};

TEST_F(InCall, CantBeEnteredAgainAndGoesOn) {
  Host::RecordCalls(true);
  EXPECT_EQ(manager.EnterCallSession(), E_INVALID_OPERATION);
  ExpectFailure(E_INVALID_OPERATION, kHandle + std::string("not null."));
  ExpectNoPlatformCall();
  EXPECT_EQ(manager.ExitCallSession(), E_SUCCESS);
  EXPECT_EQ(manager.EnterCallSession(), E_SUCCESS);
}

TEST_F(InCall, ModesReachThePlatformAndComeBack) {
  const struct {
    int mode, platformMode, readBack;
  } rows[] = {{0, 0, 1}, {3, 2, 3}, {1, 0, 1}, {2, 1, 2}};
  for (const auto& row : rows) {
    SCOPED_TRACE(row.mode);
    EXPECT_EQ(manager.SetCallSessionMode(Mode(row.mode)), E_SUCCESS);
    EXPECT_THAT(Simulated::GetCallSessionModes(), ElementsAre(row.platformMode));
    EXPECT_EQ(manager.GetCallSessionMode(), row.readBack);
  }
  EXPECT_THAT(log.Take(), IsEmpty());
}

TEST_F(InCall, ModesOutsideTheEnumerationAreRefusedHere) {
  EXPECT_EQ(manager.SetCallSessionMode(VOIP_AUDIO_SESSION_MODE_RINGTONE), E_SUCCESS);
  for (const int mode : {-1, 4, 5, INT_MAX, INT_MIN}) {
    Host::RecordCalls(true);
    EXPECT_EQ(manager.SetCallSessionMode(Mode(mode)), E_INVALID_ARG);
    ExpectFailure(E_INVALID_ARG,
                  " [E_INVALID_ARG] Invalid argument is used. The mode is not correct : " +
                      std::to_string(mode));
    ExpectNoPlatformCall();
  }
  EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_RINGTONE);
}

TEST_F(InCall, DevicesRefusalChangesNothing) {
  EXPECT_EQ(manager.SetCallSessionMode(VOIP_AUDIO_SESSION_MODE_MEDIA), E_SUCCESS);
  for (const auto& [code, hex, r] : kPlatformFailures) {
    SCOPED_TRACE(code);
    Host::FailCall("sound_manager_call_session_set_mode", code, 1);
    EXPECT_EQ(manager.SetCallSessionMode(VOIP_AUDIO_SESSION_MODE_VOICE), r);
    ExpectFailure(r, Named(r, " Failed to perform sound_manager_call_session_set_mode operation."));
    Host::FailCall("sound_manager_call_session_get_mode", code, 1);
    EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_NONE);
    ExpectFailure(r, Named(r,
                           " Failed to perform sound_manager_call_session_get_mode operation "
                           "with error code : " +
                               std::string(hex)));
    Host::FailCall("sound_manager_call_session_destroy", code, 1);
    EXPECT_EQ(manager.ExitCallSession(), r);
    ExpectFailure(r, Named(r, " Failed to perform sound_manager_call_session_destroy operation."));
    EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_MEDIA);
  }
  EXPECT_EQ(manager.ExitCallSession(), E_SUCCESS);
  EXPECT_THAT(Simulated::GetCallSessionModes(), IsEmpty());
}

}  // namespace
