// What nothing outside of the library can reach. Its sources are part of this program.

#include "frame/ManagerLife.h"
#include "session/AudioSessionEvent.h"
#include "session/AudioSessionEventArg.h"
#include "session/AudioSessionManagerImpl.h"
#include "support/Managers.h"
#include "voip/VoipAudioSessionManagerImpl.h"
#include "volume/AudioVolumeEvent.h"
#include "volume/AudioVolumeEventArg.h"
#include "volume/AudioVolumeManagerImpl.h"

#include <sound_manager.h>

#include <climits>
#include <memory>

namespace {

int reportedCallMode = 0;

}  // namespace

/// A device whose call sessions report any mode.
int sound_manager_call_session_get_mode(sound_call_session_h, int* mode) {
  *mode = reportedCallMode;
  return 0;
}

namespace Zelkora::Media {

/// The managers' friend makes managers, here without constructing one.
template <>
result _ManagerLife::Construct(Volume*& unconstructed, int) {
  unconstructed = new Volume;
  return E_SUCCESS;
}

namespace {

class Insides : public LibraryTest {};

TEST_F(Insides, ManagerIsConstructedOnceBeforeUseElseItAssertsBeforeTheGateAndDoesNothing) {
  Volume* manager = nullptr;
  _ManagerLife::Construct(manager);
  const std::unique_ptr<Tizen::Base::Object> owner(manager);
  Host::SetPrivilege(Facts<Volume>::kPrivilege, E_PRIVILEGE_DENIED);
  const std::string notYet = Assertion(
      "", "__pImpl != null", "Not yet constructed. Construct() should be called before use.");
  for (const auto& operation : Facts<Volume>::Operations()) {
    SCOPED_TRACE(operation.name);
    EXPECT_EQ(operation.call(*manager), operation.Refused(E_INVALID_STATE));
    ExpectLeft(kUntouched, {notYet}, {});
  }
  Host::ResetCapabilities();
  EXPECT_EQ(_ManagerLife::Construct(*manager), E_SUCCESS);
  Forget();
  EXPECT_EQ(_ManagerLife::Construct(*manager), E_INVALID_STATE);
  const std::string already =
      Assertion("", "__pImpl == null",
                "Already constructed. Calling Construct() twice or more on a same instance is not "
                "allowed for this class.");
  ExpectLeft(kUntouched, {already}, {});
  EXPECT_EQ(manager->MuteAll(), E_SUCCESS);
}

TEST_F(Insides, ImplementationWithoutItsEventTakesNoListener) {
  IAudioVolumeEventListener listener;
  const auto expectRefusal = [this](result r, result expected) {
    EXPECT_EQ(r, expected);
    const char* text = " A error has been occurred. The value of __pAudioSessionEvent is null.";
    ExpectLeft(expected, {SysNamed(expected, text)}, {});
  };
  _AudioVolumeManagerImpl volume;
  expectRefusal(volume.AddAudioVolumeEventListener(listener), E_INVALID_ARG);
  expectRefusal(volume.RemoveAudioVolumeEventListener(listener), E_INVALID_ARG);
  _AudioSessionManagerImpl session;
  expectRefusal(session.SetAudioSessionEventListener(nullptr), E_INVALID_OPERATION);
}

TEST_F(Insides, CallModeThatIsNotKnownIsReadAsNone) {
  const std::pair<int, int> rows[] = {{0, 1},  {1, 2},       {2, 3},      {3, 0},
                                      {-1, 0}, {INT_MAX, 0}, {INT_MIN, 0}};
  _VoipAudioSessionManagerImpl call;
  ASSERT_EQ(call.EnterCallSession(), E_SUCCESS);
  Forget();
  for (const auto& [reported, mode] : rows) {
    reportedCallMode = reported;
    EXPECT_EQ(call.GetCallSessionMode(), mode) << reported;
    ExpectLeft(kUntouched, {}, {});
  }
}

TEST_F(Insides, RefusalToCloseACallThatIsLeftOpenIsOnlyLogged) {
  Host::FailCall("sound_manager_call_session_destroy", -38, 1);
  {
    _VoipAudioSessionManagerImpl call;
    ASSERT_EQ(call.EnterCallSession(), E_SUCCESS);
    Forget();
  }
  EXPECT_THAT(log.Take(),
              testing::ElementsAre(SysPlain(
                  "[E_INVALID_OPERATION] Failed to perform sound_manager_call_session_destroy "
                  "operation.")));
  EXPECT_EQ(GetLastResult(), kUntouched);
}

/// The event's dispatch, which only the platform calls.
template <typename Event>
struct Dispatch : Event {
  using Event::FireToListener;
};

struct SessionListener : IAudioSessionEventListener {
  void OnAudioSessionInterruptStarted() override {}
  void OnAudioSessionInterruptFinished() override {}
};

TEST_F(Insides, ForeignListenersAndUnknownEventTypesAreLoggedAtDispatchAndSkipped) {
  SessionListener session;
  IAudioVolumeEventListener volume;
  _AudioSessionEventArg sessionArg;
  _AudioVolumeEventArg volumeArg;
  for (const int type : {0, 8, -1, INT_MAX, INT_MIN}) {
    sessionArg.SetEventType(type == 8 ? 4 : type);
    Dispatch<_AudioSessionEvent>().FireToListener(session, sessionArg);
    volumeArg.SetEventType(type);
    Dispatch<_AudioVolumeEvent>().FireToListener(volume, volumeArg);
    ExpectLeft(kUntouched, Lines(2, SysPlain("The event type is wrong.")), {});
  }
  const std::string null = " The value of listener is null.";
  sessionArg.SetEventType(SESSION_EVENT_DISRUPTED);
  Dispatch<_AudioSessionEvent>().FireToListener(volume, sessionArg);
  ExpectLeft(E_SYSTEM, {SysNamed(E_SYSTEM, " A system error has been occureed." + null)}, {});
  volumeArg.SetEventType(VOLUME_EVENT_CALL);
  Dispatch<_AudioVolumeEvent>().FireToListener(session, volumeArg);
  ExpectLeft(E_SYSTEM, {SysNamed(E_SYSTEM, " A system error has occurred." + null)}, {});
}

}  // namespace
}  // namespace Zelkora::Media
