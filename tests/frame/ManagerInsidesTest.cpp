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

template <typename Manager>
struct Unconstructed {
  result Own(Manager* made) {
    owner.reset(manager = made);
    return E_SUCCESS;
  }

  std::unique_ptr<Tizen::Base::Object> owner;
  Manager* manager = nullptr;
};

int reportedCallMode = 0;

}  // namespace

/// A device whose call sessions report any mode.
int sound_manager_call_session_get_mode(sound_call_session_h, int* mode) {
  *mode = reportedCallMode;
  return 0;
}

namespace Zelkora::Media {

// The managers' friend makes managers, here without constructing them.
template <>
result _ManagerLife::Construct(Unconstructed<Session>& unconstructed, int) {
  return unconstructed.Own(new Session);
}
template <>
result _ManagerLife::Construct(Unconstructed<Call>& unconstructed, int) {
  return unconstructed.Own(new Call);
}
template <>
result _ManagerLife::Construct(Unconstructed<Volume>& unconstructed, int) {
  return unconstructed.Own(new Volume);
}

namespace {

using Tizen::Base::Runtime::IEventListener;

template <typename Manager>
class Insides : public LibraryTest {};
TYPED_TEST_SUITE(Insides, Managers, ManagerNames);

TYPED_TEST(Insides, UnconstructedManagerAssertsBeforeTheGateAndDoesNothing) {
  Unconstructed<TypeParam> unconstructed;
  ASSERT_EQ(_ManagerLife::Construct(unconstructed), E_SUCCESS);
  Host::SetPrivilege(Facts<TypeParam>::kPrivilege, E_PRIVILEGE_DENIED);
  const std::string notYet = Assertion(
      "", "__pImpl != null", "Not yet constructed. Construct() should be called before use.");
  for (const auto& operation : Facts<TypeParam>::Operations()) {
    SCOPED_TRACE(operation.name);
    EXPECT_EQ(operation.call(*unconstructed.manager), operation.Refused(E_INVALID_STATE));
    this->ExpectLeft(kUntouched, {notYet}, {});
  }
}

TYPED_TEST(Insides, SecondConstructAssertsAndLeavesTheManagerAsItIs) {
  TypeParam* manager = TypeParam::GetInstance();
  ASSERT_NE(manager, nullptr);
  this->Forget();
  EXPECT_EQ(_ManagerLife::Construct(*manager), E_INVALID_STATE);
  const std::string already =
      Assertion("", "__pImpl == null",
                "Already constructed. Calling Construct() twice or more on a same instance is not "
                "allowed for this class.");
  this->ExpectLeft(kUntouched, {already}, {});
  EXPECT_EQ(Facts<TypeParam>::Operations()[0].call(*manager), E_SUCCESS);
}

class ImplementationInsides : public LibraryTest {};

TEST_F(ImplementationInsides, WithoutItsEventTakesNoListener) {
  IAudioVolumeEventListener listener;
  const auto noEvent = [](result r) {
    return SysNamed(r, " A error has been occurred. The value of __pAudioSessionEvent is null.");
  };
  {
    _AudioVolumeManagerImpl volume;
    EXPECT_EQ(volume.AddAudioVolumeEventListener(listener), E_INVALID_ARG);
    ExpectLeft(E_INVALID_ARG, {noEvent(E_INVALID_ARG)}, {});
    EXPECT_EQ(volume.RemoveAudioVolumeEventListener(listener), E_INVALID_ARG);
    ExpectLeft(E_INVALID_ARG, {noEvent(E_INVALID_ARG)}, {});
    _AudioSessionManagerImpl session;
    EXPECT_EQ(session.SetAudioSessionEventListener(nullptr), E_INVALID_OPERATION);
    ExpectLeft(E_INVALID_OPERATION, {noEvent(E_INVALID_OPERATION)}, {});
  }
  ExpectLeft(
      kUntouched, {},
      {"sound_manager_unset_session_interrupted_cb()", "sound_manager_unset_volume_changed_cb()",
       "sound_manager_unset_muteall_changed_cb()"});
}

TEST_F(ImplementationInsides, CallModeThatIsNotKnownIsReadAsNone) {
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

TEST_F(ImplementationInsides, OpenCallIsClosedWithItsOwnerAndARefusalOnlyLogged) {
  for (const int code : {0, -38}) {
    if (code != 0) Host::FailCall("sound_manager_call_session_destroy", code, 1);
    {
      _VoipAudioSessionManagerImpl call;
      ASSERT_EQ(call.EnterCallSession(), E_SUCCESS);
      Forget();
    }
    const std::string line = Named(
        E_INVALID_OPERATION, " Failed to perform sound_manager_call_session_destroy operation.");
    EXPECT_EQ(log.Take(), code == 0 ? Lines{} : Lines{SysPlain(line)});
    EXPECT_THAT(Host::TakeCalls(),
                testing::ElementsAre(testing::StartsWith("sound_manager_call_session_destroy")));
    EXPECT_EQ(GetLastResult(), kUntouched);
  }
}

/// The event's dispatch, which only the platform calls.
template <typename Event>
struct Dispatch : Event {
  using Event::FireToListener;
};

struct SessionListener : IAudioSessionEventListener {
  void OnAudioSessionInterruptStarted() override { ++calls; }
  void OnAudioSessionInterruptFinished() override { ++calls; }
  void OnAudioSessionDisrupted() override { ++calls; }
  int calls = 0;
};

struct VolumeListener : IAudioVolumeEventListener {
  void OnSystemVolumeChanged(int) override { ++calls; }
  void OnCallVolumeChanged(int) override { ++calls; }
  void OnMuteStatusChanged(AudioMuteStatus) override { ++calls; }
  int calls = 0;
};

TEST_F(ImplementationInsides, ForeignListenersAndUnknownEventTypesAreLoggedAtDispatchAndSkipped) {
  struct : IEventListener {
  } foreign;
  SessionListener session;
  VolumeListener volume;
  _AudioSessionEventArg sessionArg;
  _AudioVolumeEventArg volumeArg;
  EXPECT_EQ(sessionArg.GetEventType(), 0);
  EXPECT_EQ(volumeArg.GetEventType(), 0);
  for (const int type : {0, 8, -1, INT_MAX, INT_MIN}) {
    sessionArg.SetEventType(type == 8 ? 4 : type);
    Dispatch<_AudioSessionEvent>().FireToListener(session, sessionArg);
    volumeArg.SetEventType(type);
    Dispatch<_AudioVolumeEvent>().FireToListener(volume, volumeArg);
    ExpectLeft(kUntouched, Lines(2, SysPlain("The event type is wrong.")), {});
  }
  sessionArg.SetEventType(SESSION_EVENT_DISRUPTED);
  volumeArg.SetEventType(VOLUME_EVENT_CALL);
  const std::string null = " The value of listener is null.";
  for (IEventListener* listener : std::initializer_list<IEventListener*>{&foreign, &volume}) {
    Dispatch<_AudioSessionEvent>().FireToListener(*listener, sessionArg);
    ExpectLeft(E_SYSTEM, {SysNamed(E_SYSTEM, " A system error has been occureed." + null)}, {});
  }
  for (IEventListener* listener : std::initializer_list<IEventListener*>{&foreign, &session}) {
    Dispatch<_AudioVolumeEvent>().FireToListener(*listener, volumeArg);
    ExpectLeft(E_SYSTEM, {SysNamed(E_SYSTEM, " A system error has occurred." + null)}, {});
  }
  EXPECT_EQ(session.calls + volume.calls, 0);
}

}  // namespace
}  // namespace Zelkora::Media
