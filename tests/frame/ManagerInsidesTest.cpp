// What nothing outside of the library can reach. Its sources are part of this program.

#include "frame/ManagerLife.h"
#include "session/AudioSessionEvent.h"
#include "session/AudioSessionEventArg.h"
#include "session/AudioSessionManagerImpl.h"
#include "support/LibraryTest.h"
#include "support/Managers.h"
#include "voip/VoipAudioSessionManagerImpl.h"
#include "volume/AudioVolumeEvent.h"
#include "volume/AudioVolumeEventArg.h"
#include "volume/AudioVolumeManagerImpl.h"

#include <Zelkora/Media/IAudioSessionEventListener.h>
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
result _ManagerLife::Construct(Unconstructed<AudioSessionManager>& unconstructed, int) {
  return unconstructed.Own(new AudioSessionManager);
}
template <>
result _ManagerLife::Construct(Unconstructed<VoipAudioSessionManager>& unconstructed, int) {
  return unconstructed.Own(new VoipAudioSessionManager);
}
template <>
result _ManagerLife::Construct(Unconstructed<AudioVolumeManager>& unconstructed, int) {
  return unconstructed.Own(new AudioVolumeManager);
}

namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using Tizen::Base::Runtime::IEventArg;
using Tizen::Base::Runtime::IEventListener;

template <typename Manager>
class Insides : public LibraryTest {};
TYPED_TEST_SUITE(Insides, Managers, ManagerNames);

TYPED_TEST(Insides, UnconstructedManagerAssertsBeforeTheGateAndDoesNothing) {
  Unconstructed<TypeParam> unconstructed;
  ASSERT_EQ(_ManagerLife::Construct(unconstructed), E_SUCCESS);
  Host::SetPrivilege(Facts<TypeParam>::kPrivilege, E_PRIVILEGE_DENIED);
  Host::RecordCalls(true);
  for (const auto& operation : Facts<TypeParam>::Operations()) {
    SCOPED_TRACE(operation.name);
    EXPECT_EQ(operation.call(*unconstructed.manager), operation.Refused(E_INVALID_STATE));
    EXPECT_EQ(GetLastResult(), E_SUCCESS);
    EXPECT_THAT(this->log.Take(),
                ElementsAre(Assertion("", "__pImpl != null",
                                      "Not yet constructed. Construct() should be called before "
                                      "use.")));
  }
  EXPECT_THAT(Host::TakeCalls(), IsEmpty());
}

TYPED_TEST(Insides, SecondConstructAssertsAndLeavesTheManagerAsItIs) {
  TypeParam* manager = TypeParam::GetInstance();
  ASSERT_NE(manager, nullptr);
  Host::RecordCalls(true);
  EXPECT_EQ(_ManagerLife::Construct(*manager), E_INVALID_STATE);
  EXPECT_EQ(GetLastResult(), E_SUCCESS);
  EXPECT_THAT(this->log.Take(),
              ElementsAre(Assertion("", "__pImpl == null",
                                    "Already constructed. Calling Construct() twice or more on a "
                                    "same instance is not allowed for this class.")));
  EXPECT_THAT(Host::TakeCalls(), IsEmpty());
  EXPECT_EQ(Facts<TypeParam>::Operations()[0].call(*manager), E_SUCCESS);
}

class ImplementationInsides : public LibraryTest {};

TEST_F(ImplementationInsides, WithoutItsEventTakesNoListener) {
  IAudioVolumeEventListener listener;
  const std::string noEvent =
      " A error has been occurred. The value of __pAudioSessionEvent is null.";
  Host::RecordCalls(true);
  {
    _AudioVolumeManagerImpl volume;
    EXPECT_EQ(volume.AddAudioVolumeEventListener(listener), E_INVALID_ARG);
    EXPECT_EQ(volume.RemoveAudioVolumeEventListener(listener), E_INVALID_ARG);
    EXPECT_THAT(log.Take(),
                ElementsAre(SysNamed(E_INVALID_ARG, noEvent), SysNamed(E_INVALID_ARG, noEvent)));
    EXPECT_EQ(GetLastResult(), E_INVALID_ARG);
    _AudioSessionManagerImpl session;
    EXPECT_EQ(session.SetAudioSessionEventListener(nullptr), E_INVALID_OPERATION);
    EXPECT_THAT(log.Take(), ElementsAre(SysNamed(E_INVALID_OPERATION, noEvent)));
  }
  EXPECT_THAT(Host::TakeCalls(), ElementsAre("sound_manager_unset_session_interrupted_cb()",
                                             "sound_manager_unset_volume_changed_cb()",
                                             "sound_manager_unset_muteall_changed_cb()"));
}

TEST_F(ImplementationInsides, CallModeThatIsNotKnownIsReadAsNone) {
  const struct {
    int reported, mode;
  } rows[] = {{0, 1}, {1, 2}, {2, 3}, {3, 0}, {-1, 0}, {INT_MAX, 0}, {INT_MIN, 0}};
  _VoipAudioSessionManagerImpl call;
  ASSERT_EQ(call.EnterCallSession(), E_SUCCESS);
  SetLastResult(E_SYSTEM);
  for (const auto& row : rows) {
    reportedCallMode = row.reported;
    EXPECT_EQ(call.GetCallSessionMode(), row.mode) << row.reported;
  }
  EXPECT_EQ(GetLastResult(), E_SYSTEM);
  EXPECT_THAT(log.Take(), IsEmpty());
}

TEST_F(ImplementationInsides, OpenCallIsClosedWithItsOwnerAndARefusalOnlyLogged) {
  for (const int code : {0, -38}) {
    if (code != 0) Host::FailCall("sound_manager_call_session_destroy", code, 1);
    Host::RecordCalls(true);
    {
      _VoipAudioSessionManagerImpl call;
      ASSERT_EQ(call.EnterCallSession(), E_SUCCESS);
    }
    EXPECT_THAT(Host::TakeCalls(),
                ElementsAre(testing::_, testing::StartsWith("sound_manager_call_session_destroy")));
    EXPECT_EQ(GetLastResult(), E_SUCCESS);
  }
  EXPECT_THAT(log.Take(), ElementsAre(SysPlain("[E_INVALID_OPERATION] Failed to perform "
                                               "sound_manager_call_session_destroy operation.")));
}

/// The event's dispatch, which only the platform calls.
template <typename Event>
struct Dispatch : Event {
  using Event::FireToListener;
};

struct Foreign : IEventListener {};

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

TEST_F(ImplementationInsides, ListenerOfAnotherInterfaceIsSkippedAtDispatch) {
  Foreign foreign;
  SessionListener session;
  VolumeListener volume;
  _AudioSessionEventArg sessionArg;
  sessionArg.SetEventType(SESSION_EVENT_DISRUPTED);
  _AudioVolumeEventArg volumeArg;
  volumeArg.SetEventType(VOLUME_EVENT_CALL);
  volumeArg.SetVolumeLevel(3);
  for (IEventListener* listener : std::initializer_list<IEventListener*>{&foreign, &volume}) {
    Dispatch<_AudioSessionEvent>().FireToListener(*listener, sessionArg);
    EXPECT_THAT(log.Take(), ElementsAre(SysNamed(E_SYSTEM,
                                                 " A system error has been occureed. The value of "
                                                 "listener is null.")));
  }
  for (IEventListener* listener : std::initializer_list<IEventListener*>{&foreign, &session}) {
    Dispatch<_AudioVolumeEvent>().FireToListener(*listener, volumeArg);
    EXPECT_THAT(log.Take(), ElementsAre(SysNamed(E_SYSTEM,
                                                 " A system error has occurred. The value of "
                                                 "listener is null.")));
  }
  EXPECT_EQ(GetLastResult(), E_SYSTEM);
  EXPECT_EQ(session.calls + volume.calls, 0);
}

TEST_F(ImplementationInsides, EventTypesOutsideTheTableAreLoggedAtDispatch) {
  SessionListener session;
  VolumeListener volume;
  const auto wrong = ElementsAre(SysPlain("The event type is wrong."));
  EXPECT_EQ(_AudioSessionEventArg().GetEventType(), 0);
  EXPECT_EQ(_AudioVolumeEventArg().GetEventType(), 0);
  for (const int type : {0, 4, -1, INT_MAX, INT_MIN}) {
    _AudioSessionEventArg arg;
    arg.SetEventType(type);
    Dispatch<_AudioSessionEvent>().FireToListener(session, arg);
    EXPECT_THAT(log.Take(), wrong) << type;
  }
  for (const int type : {0, 8, -1, INT_MAX, INT_MIN}) {
    _AudioVolumeEventArg arg;
    arg.SetEventType(type);
    Dispatch<_AudioVolumeEvent>().FireToListener(volume, arg);
    EXPECT_THAT(log.Take(), wrong) << type;
  }
  EXPECT_EQ(session.calls + volume.calls, 0);
}

}  // namespace
}  // namespace Zelkora::Media
