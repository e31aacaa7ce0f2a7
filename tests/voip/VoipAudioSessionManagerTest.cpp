#include "support/Managers.h"

#include <climits>

namespace Zelkora::Media {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

constexpr char kCreate[] = "sound_manager_call_session_create(1)";

const std::string kNotEntered =
    Sys(E_INVALID_STATE, "[E_INVALID_STATE] EnterCallSession() should be called before use");

std::string Handle(result r, const std::string& what, const std::string& state) {
  return SysNamed(
      r,
      " A " + what + " has been occurred. The value of __soundCallSessionHandle is " + state + ".");
}

std::string Refused(result r, const std::string& function, const std::string& tail) {
  return SysNamed(
      r, " Failed to perform sound_manager_call_session_" + function + " operation" + tail);
}

std::string Code(const char* hex) { return std::string(" with error code : ") + hex; }

VoipAudioSessionMode Mode(int value) { return static_cast<VoipAudioSessionMode>(value); }

class NoCall : public ManagerTest<Call> {
 protected:
  ~NoCall() override {
    Host::ClearFailures();
    if (!World::GetCallModes().empty()) manager.ExitCallSession();
  }
};

TEST_F(NoCall, LeavesNothingToExitAndNoModeToSetOrGet) {
  EXPECT_EQ(manager.ExitCallSession(), E_INVALID_OPERATION);
  ExpectLeftBehindGate(E_INVALID_OPERATION, {Handle(E_INVALID_OPERATION, "error", "null")});
  for (const int mode : {0, 1, 2, 3, 5, -1}) {  // the state is judged before the argument
    EXPECT_EQ(manager.SetCallSessionMode(Mode(mode)), E_INVALID_STATE);
    ExpectLeftBehindGate(E_INVALID_STATE, {kNotEntered});
  }
  EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_NONE);
  ExpectLeftBehindGate(E_INVALID_STATE, {kNotEntered});
}

TEST_F(NoCall, CreationThatFailsLeavesNeitherACallNorASession) {
  for (const auto& failure : kPlatformFailures) {
    Host::FailCall("sound_manager_call_session_create", failure.code, 1);
    EXPECT_EQ(manager.EnterCallSession(), failure.r);
    ExpectLeftBehindGate(failure.r, {Refused(failure.r, "create", Code(failure.hex))}, {kCreate});
    EXPECT_THAT(World::GetCallModes(), IsEmpty());
  }
  EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_NONE);
  EXPECT_EQ(manager.EnterCallSession(), E_SUCCESS);
}

class InCall : public NoCall {
 protected:
  InCall() {
    EXPECT_EQ(manager.EnterCallSession(), E_SUCCESS);
    Forget();
    manager.GetCallSessionMode();
    const std::string query = Host::TakeCalls().back();
    number_ = query.substr(query.find('(') + 1, query.find(')') - query.find('(') - 1);
  }

  /// \return the record of a call of the platform about the session
  std::string Record(const std::string& function, const std::string& rest = "") const {
    return "sound_manager_call_session_" + function + "(" + number_ + rest + ")";
  }

 private:
  std::string number_;  // the platform's
};

TEST_F(InCall, CantBeEnteredAgainAndGoesOnUntilItIsExited) {
  EXPECT_EQ(manager.EnterCallSession(), E_INVALID_OPERATION);
  ExpectLeftBehindGate(E_INVALID_OPERATION, {Handle(E_INVALID_OPERATION, "error", "not null")});
  EXPECT_EQ(manager.ExitCallSession(), E_SUCCESS);
  EXPECT_THAT(World::GetCallModes(), IsEmpty());
  EXPECT_EQ(manager.EnterCallSession(), E_SUCCESS);
}

TEST_F(InCall, ModesReachThePlatformAndComeBackAndOthersAreRefusedHere) {
  const struct {
    int mode, platformMode, readBack;
  } rows[] = {{0, 0, 1}, {3, 2, 3}, {1, 0, 1}, {2, 1, 2}};
  for (const auto& row : rows) {
    SCOPED_TRACE(row.mode);
    EXPECT_EQ(manager.SetCallSessionMode(Mode(row.mode)), E_SUCCESS);
    EXPECT_THAT(World::GetCallModes(), ElementsAre(row.platformMode));
    EXPECT_EQ(manager.GetCallSessionMode(), row.readBack);
  }
  Forget();
  const std::string incorrect =
      " [E_INVALID_ARG] Invalid argument is used. The mode is not correct : ";
  for (const int mode : {-1, 4, 5, INT_MAX, INT_MIN}) {
    EXPECT_EQ(manager.SetCallSessionMode(Mode(mode)), E_INVALID_ARG);
    ExpectLeftBehindGate(E_INVALID_ARG, {Sys(E_INVALID_ARG, incorrect + std::to_string(mode))});
  }
  EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_RINGTONE);
}

TEST_F(InCall, DevicesRefusalChangesNothing) {
  EXPECT_EQ(manager.SetCallSessionMode(VOIP_AUDIO_SESSION_MODE_MEDIA), E_SUCCESS);
  for (const auto& [code, hex, r] : kPlatformFailures) {
    SCOPED_TRACE(code);
    Forget();
    Host::FailCall("sound_manager_call_session_set_mode", code, 1);
    EXPECT_EQ(manager.SetCallSessionMode(VOIP_AUDIO_SESSION_MODE_VOICE), r);
    ExpectLeftBehindGate(r, {Refused(r, "set_mode", ".")}, {Record("set_mode", ", 0")});
    Host::FailCall("sound_manager_call_session_get_mode", code, 1);
    EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_NONE);
    ExpectLeftBehindGate(r, {Refused(r, "get_mode", Code(hex))}, {Record("get_mode")});
    Host::FailCall("sound_manager_call_session_destroy", code, 1);
    EXPECT_EQ(manager.ExitCallSession(), r);
    ExpectLeftBehindGate(r, {Refused(r, "destroy", ".")}, {Record("destroy")});
    EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_MEDIA);
  }
}

}  // namespace
}  // namespace Zelkora::Media
