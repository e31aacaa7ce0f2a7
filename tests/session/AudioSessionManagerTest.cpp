#include "support/Allocations.h"
#include "support/LibraryTest.h"
#include "support/Managers.h"

#include <Zelkora/Media/IAudioSessionEventListener.h>
#include <sound_manager.h>

#include <algorithm>
#include <climits>

namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using namespace Zelkora::Media;
using Lines = std::vector<std::string>;

constexpr char kQueryType[] = "sound_manager_get_session_type()";
constexpr char kQueryOption[] = "sound_manager_get_media_session_option()";
constexpr char kSetMix[] = "sound_manager_set_media_session_option(1, 0)";

std::string SetType(int type) {
  return "sound_manager_set_session_type(" + std::to_string(type) + ")";
}

class Session : public LibraryTest {
 protected:
  /// \return the calls behind the gate since recording began
  Lines CallsBehindTheGate() {
    Lines calls = Host::TakeCalls();
    EXPECT_EQ(std::count(calls.begin(), calls.end(), PrivilegeQuery<AudioSessionManager>()), 1);
    calls.erase(calls.begin());
    return calls;
  }

  AudioSessionManager& manager = *AudioSessionManager::GetInstance();
};

using SessionMode = Session;

TEST_F(SessionMode, SettingSendsTheSessionTypeAndForMixTheOptionPair) {
  const struct {
    int mode;
    Lines calls;
  } rows[] = {
      {0, {SetType(0)}},       {1, {SetType(0), kSetMix}}, {2, {SetType(3)}},   {3, {SetType(2)}},
      {4, {SetType(1)}},       {5, {SetType(0)}},          {100, {SetType(0)}}, {-1, {SetType(0)}},
      {INT_MIN, {SetType(0)}}, {INT_MAX, {SetType(0)}},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.mode);
    Host::RecordCalls(true);
    EXPECT_EQ(manager.SetMode(static_cast<AudioSessionMode>(row.mode)), E_SUCCESS);
    EXPECT_EQ(CallsBehindTheGate(), row.calls);
  }
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
    Host::RecordCalls(true);
    EXPECT_EQ(manager.GetMode(), row.mode);
    EXPECT_EQ(CallsBehindTheGate(),
              row.type == 0 ? (Lines{kQueryType, kQueryOption}) : Lines{kQueryType});
  }
}

TEST_F(SessionMode, MediaAfterMixIsReadAsMixForAsLongAsTheDeviceKeepsThePair) {
  EXPECT_EQ(manager.SetMode(AUDIO_SESSION_MODE_MEDIA_MIX), E_SUCCESS);
  EXPECT_EQ(manager.SetMode(AUDIO_SESSION_MODE_MEDIA), E_SUCCESS);
  EXPECT_EQ(manager.GetMode(), AUDIO_SESSION_MODE_MEDIA_MIX);
  sound_manager_set_media_session_option(0, 0);
  EXPECT_EQ(manager.GetMode(), AUDIO_SESSION_MODE_MEDIA);
}

TEST_F(SessionMode, RefusedSettingIsLoggedWithTheRawCodeAndTheOptionFollowsOnlyASetType) {
  for (const std::string function :
       {"sound_manager_set_session_type", "sound_manager_set_media_session_option"}) {
    const bool typeFails = function == "sound_manager_set_session_type";
    for (const auto& [code, hex, r] : kPlatformFailures) {
      SCOPED_TRACE(function + " " + std::to_string(code));
      sound_manager_set_session_type(2);
      Host::FailCall(function.c_str(), code, 1);
      Host::RecordCalls(true);
      EXPECT_EQ(manager.SetMode(AUDIO_SESSION_MODE_MEDIA_MIX), r);
      EXPECT_EQ(CallsBehindTheGate(), typeFails ? Lines{SetType(0)} : (Lines{SetType(0), kSetMix}));
      EXPECT_THAT(log.Take(), ElementsAre(Sys(r, "Failed to perform " + function +
                                                     " operation with error code : " + hex)));
      EXPECT_EQ(manager.GetMode(),
                typeFails ? AUDIO_SESSION_MODE_NOTIFICATION : AUDIO_SESSION_MODE_MEDIA);
    }
  }
}

TEST_F(SessionMode, RefusedQueryGivesMediaWithTheCauseInTheLastResult) {
  sound_manager_set_media_session_option(1, 0);
  for (const char* function :
       {"sound_manager_get_session_type", "sound_manager_get_media_session_option"}) {
    for (const auto& failure : kPlatformFailures) {
      SCOPED_TRACE(function + std::to_string(failure.code));
      ClearLastResult();
      Host::FailCall(function, failure.code, 1);
      EXPECT_EQ(manager.GetMode(), AUDIO_SESSION_MODE_MEDIA);
      EXPECT_EQ(GetLastResult(), failure.r);
      EXPECT_THAT(log.Take(), ElementsAre(SysNamed(failure.r, " Propagating.")));
    }
  }
}

/// Writes down what it hears; not `OnAudioSessionDisrupted`, which has a default.
class PlainListener : public IAudioSessionEventListener {
 public:
  void OnAudioSessionInterruptStarted() override { heard += "started "; }
  void OnAudioSessionInterruptFinished() override { heard += "finished "; }

  std::string TakeHeard() {
    Simulated::WaitUntilDelivered();
    return std::exchange(heard, "");
  }

 protected:
  std::string heard;
};

class Listener : public PlainListener {
 public:
  void OnAudioSessionDisrupted() override { heard += "disrupted "; }
};

class Interruptions : public Session {
 protected:
  Interruptions() {
    Interrupt({0});  // ends what another test has left behind
    log.Take();
    EXPECT_EQ(manager.SetAudioSessionEventListener(&listener), E_SUCCESS);
  }
  ~Interruptions() override { manager.SetAudioSessionEventListener(nullptr); }

  void Interrupt(const std::vector<int>& codes) {
    for (const int code : codes) Simulated::Interrupt(code);
    Simulated::WaitUntilDelivered();
  }

  Listener listener;
};

std::string Received(int code) {
  return SysPlain("This instance received message code : " + std::to_string(code));
}

TEST_F(Interruptions, CodesBecomeEventsAndTheEndOfACode2IsSwallowedOnce) {
  const struct {
    std::vector<int> codes;
    std::string heard;
  } rows[] = {
      {{5, 0}, "started finished "},
      {{6, 0}, "started finished "},
      {{0}, "finished "},
      {{1, 0}, "disrupted finished "},
      {{3, 0}, "disrupted finished "},
      {{4, 0}, "disrupted finished "},
      {{2, 0}, "disrupted "},
      {{2, 0, 0}, "disrupted finished "},
      {{2, 5, 0}, "disrupted started "},
      {{2, 1, 3, 4, 6, 0, 0}, "disrupted disrupted disrupted disrupted started finished "},
      {{2, 2, 0, 0}, "disrupted disrupted finished "},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(testing::PrintToString(row.codes));
    Lines lines;
    for (const int code : row.codes) lines.push_back(Received(code));
    Interrupt(row.codes);
    EXPECT_EQ(listener.TakeHeard(), row.heard);
    EXPECT_EQ(log.Take(), lines);
  }
}

TEST_F(Interruptions, UnknownCodesAreLoggedAndChangeNothing) {
  for (const int code : {7, -1, INT_MAX, INT_MIN}) {
    Interrupt({2, code, 0});
    EXPECT_EQ(listener.TakeHeard(), "disrupted ");
    EXPECT_THAT(log.Take(),
                ElementsAre(Received(2), Received(code),
                            Sys(E_SYSTEM, "A system error occurred. Invalid notify signal is " +
                                              std::to_string(code)),
                            Received(0)));
  }
}

TEST_F(Interruptions, CallbackWithoutUserDataIsLoggedAndChangesNothing) {
  Simulated::ReportWithoutUserData(true);
  Interrupt({2, 9});
  Simulated::ReportWithoutUserData(false);
  Interrupt({0});
  EXPECT_EQ(listener.TakeHeard(), "finished ");
  const std::string null =
      Sys(E_OBJ_NOT_FOUND, "[E_OBJ_NOT_FOUND] _AudioSessionManagerImpl is null.");
  EXPECT_THAT(log.Take(), ElementsAre(Received(2), null, Received(9), null, Received(0)));
}

TEST_F(Interruptions, EventThatFindsNoMemoryOrNoQueueIsLostAndItsMarkStays) {
  const std::string noMemory = Sys(E_OUT_OF_MEMORY, "[E_OUT_OF_MEMORY] Memory allocation failed.");
  const struct {
    int code;
    const char* message;
  } rows[] = {{5, "[E_SYSTEM] Failed to perform FireAsync operation."},
              {0, "[E_SYSTEM] Failed to perform FireAsync operation."},
              {2, "[E_SYSTEM]Failed to perform FireAsync operation."}};
  for (const auto& row : rows) {
    SCOPED_TRACE(row.code);
    {
      FailingLibraryAllocation failing;
      Interrupt({row.code});
    }
    EXPECT_THAT(log.Take(), ElementsAre(Received(row.code), noMemory));
    Host::FailCall("_Event::FireAsync", E_SYSTEM, 1);
    Interrupt({row.code});
    EXPECT_THAT(log.Take(), ElementsAre(Received(row.code), SysPlain(row.message)));
    EXPECT_EQ(listener.TakeHeard(), "");
  }
  Interrupt({0, 0});
  EXPECT_EQ(listener.TakeHeard(), "finished ");
}

TEST_F(Interruptions, ListenerWithoutADisruptionOfItsOwnIgnoresIt) {
  PlainListener plain;
  EXPECT_EQ(manager.SetAudioSessionEventListener(&plain), E_SUCCESS);
  Interrupt({1, 2, 3, 4, 5});
  EXPECT_EQ(plain.TakeHeard(), "started ");
  EXPECT_EQ(manager.SetAudioSessionEventListener(nullptr), E_SUCCESS);
}

TEST_F(Interruptions, WithNobodyListeningTheMarkIsStillKept) {
  EXPECT_EQ(manager.SetAudioSessionEventListener(nullptr), E_SUCCESS);
  Interrupt({2});
  EXPECT_EQ(manager.SetAudioSessionEventListener(&listener), E_SUCCESS);
  Interrupt({0, 0});
  EXPECT_EQ(listener.TakeHeard(), "finished ");
}

TEST_F(Interruptions, AnotherListenerTakesThePlaceOfTheOneBefore) {
  Listener other;
  const struct {
    IAudioSessionEventListener* next;
    Lines calls;
    std::string heard, otherHeard;
  } rows[] = {
      {&other, {"_Event::RemoveListener()", "_Event::AddListener()"}, "", "started "},
      {&other, {"_Event::RemoveListener()", "_Event::AddListener()"}, "", "started "},
      {nullptr, {"_Event::RemoveListener()"}, "", ""},
      {nullptr, {}, "", ""},
      {&listener, {"_Event::AddListener()"}, "started ", ""},
  };
  for (const auto& row : rows) {
    SetLastResult(E_SYSTEM);
    Host::RecordCalls(true);
    EXPECT_EQ(manager.SetAudioSessionEventListener(row.next), E_SUCCESS);
    EXPECT_EQ(CallsBehindTheGate(), row.calls);
    EXPECT_EQ(GetLastResult(), E_SYSTEM);
    Interrupt({5});
    EXPECT_EQ(listener.TakeHeard(), row.heard);
    EXPECT_EQ(other.TakeHeard(), row.otherHeard);
  }
}

TEST_F(Interruptions, ListenerThatCantBeRemovedStaysAndTheNewOneIsNotAdded) {
  Listener other;
  Host::FailCall("_Event::RemoveListener", E_INVALID_STATE, 1);
  Host::RecordCalls(true);
  EXPECT_EQ(manager.SetAudioSessionEventListener(&other), E_INVALID_STATE);
  EXPECT_EQ(GetLastResult(), E_INVALID_STATE);
  EXPECT_THAT(CallsBehindTheGate(), ElementsAre("_Event::RemoveListener()"));
  EXPECT_THAT(log.Take(), ElementsAre(SysNamed(E_INVALID_STATE, " RemoveListener() failed")));
  Interrupt({5});
  EXPECT_EQ(listener.TakeHeard(), "started ");
  EXPECT_EQ(other.TakeHeard(), "");
}

TEST_F(Interruptions, ListenerThatCantBeAddedLeavesNone) {
  Host::FailCall("_Event::AddListener", E_OUT_OF_MEMORY, 1);
  EXPECT_EQ(manager.SetAudioSessionEventListener(&listener), E_OUT_OF_MEMORY);
  EXPECT_EQ(GetLastResult(), E_OUT_OF_MEMORY);
  EXPECT_THAT(log.Take(), ElementsAre(SysNamed(E_OUT_OF_MEMORY, " AddListener() failed")));
  Interrupt({5});
  EXPECT_EQ(listener.TakeHeard(), "");
  Host::RecordCalls(true);
  EXPECT_EQ(manager.SetAudioSessionEventListener(&listener), E_SUCCESS);
  EXPECT_THAT(CallsBehindTheGate(), ElementsAre("_Event::AddListener()"));
}

}  // namespace
