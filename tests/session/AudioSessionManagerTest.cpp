#include "support/Allocations.h"
#include "support/Managers.h"

#include <sound_manager.h>

#include <climits>

namespace Zelkora::Media {
namespace {

constexpr char kQueryType[] = "sound_manager_get_session_type()";
constexpr char kQueryOption[] = "sound_manager_get_media_session_option()";
constexpr char kSetMix[] = "sound_manager_set_media_session_option(1, 0)";
constexpr char kAdd[] = "_Event::AddListener()";
constexpr char kRemove[] = "_Event::RemoveListener()";

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

TEST_F(SessionMode, DevicesRefusalIsReportedAndTheOptionFollowsOnlyAType) {
  const auto expectRefusal = [this](const char* function, const auto& failure, const Lines& set,
                                    AudioSessionMode after) {
    Host::FailCall(function, failure.code, 1);
    EXPECT_EQ(manager.SetMode(AUDIO_SESSION_MODE_MEDIA_MIX), failure.r);
    ExpectLeftBehindGate(failure.r,
                         {Sys(failure.r, std::string("Failed to perform ") + function +
                                             " operation with error code : " + failure.hex)},
                         set);
    EXPECT_EQ(manager.GetMode(), after);
    Forget();
  };
  const auto expectMedia = [this](const char* function, const auto& failure, const Lines& asked) {
    Host::FailCall(function, failure.code, 1);
    EXPECT_EQ(manager.GetMode(), AUDIO_SESSION_MODE_MEDIA);
    ExpectLeftBehindGate(failure.r, {SysNamed(failure.r, " Propagating.")}, asked);
  };
  for (const auto& failure : kPlatformFailures) {
    SCOPED_TRACE(failure.code);
    sound_manager_set_media_session_option(0, 0);
    sound_manager_set_session_type(2);
    Forget();
    expectRefusal("sound_manager_set_session_type", failure, {SetType(0)},
                  AUDIO_SESSION_MODE_NOTIFICATION);
    expectRefusal("sound_manager_set_media_session_option", failure, {SetType(0), kSetMix},
                  AUDIO_SESSION_MODE_MEDIA);
    sound_manager_set_media_session_option(1, 0);
    Forget();
    expectMedia("sound_manager_get_session_type", failure, {kQueryType});
    expectMedia("sound_manager_get_media_session_option", failure, {kQueryType, kQueryOption});
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

class Interruptions : public ManagerTest<Session> {
 protected:
  Interruptions() {
    Simulated::Interrupt(0);  // ends what another test has left behind
    Simulated::WaitUntilDelivered();
    EXPECT_EQ(manager.SetAudioSessionEventListener(&listener), E_SUCCESS);
    Forget();
  }
  ~Interruptions() override { manager.SetAudioSessionEventListener(nullptr); }

  /// Interrupts with \p codes and expects what is heard of it.
  /// \return the lines that are always logged
  Lines ExpectHeard(const std::vector<int>& codes, const std::string& heard) {
    Lines received;
    for (const int code : codes) {
      Simulated::Interrupt(code);
      received.push_back(SysPlain("This instance received message code : " + std::to_string(code)));
    }
    EXPECT_EQ(listener.TakeHeard(), heard) << testing::PrintToString(codes);
    return received;
  }

  Listener listener;
};

TEST_F(Interruptions, CodesBecomeEventsAndTheEndOfACode2IsSwallowedOnce) {
  const std::pair<std::vector<int>, std::string> rows[] = {
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
  for (const auto& [codes, heard] : rows) {
    const Lines received = ExpectHeard(codes, heard);
    ExpectLeft(kUntouched, received, {});
  }
}

TEST_F(Interruptions, UnknownCodesAndCallbacksWithoutUserDataAreLoggedAndChangeNothing) {
  for (const int code : {7, -1, INT_MAX, INT_MIN}) {
    Lines lines = ExpectHeard({2, code, 0}, "disrupted ");
    lines.insert(
        lines.begin() + 2,
        Sys(E_SYSTEM, "A system error occurred. Invalid notify signal is " + std::to_string(code)));
    ExpectLeft(kUntouched, lines, {});
  }
  Simulated::ReportWithoutUserData(true);
  const Lines received = ExpectHeard({2, 9}, "");
  const std::string null = SysNamed(E_OBJ_NOT_FOUND, " _AudioSessionManagerImpl is null.");
  ExpectLeft(kUntouched, {received[0], null, received[1], null}, {});
  Simulated::ReportWithoutUserData(false);
  ExpectHeard({0}, "finished ");
}

TEST_F(Interruptions, EventThatFindsNoMemoryOrNoQueueIsLostAndItsMarkStays) {
  const std::pair<int, const char*> rows[] = {
      {5, "[E_SYSTEM] Failed to perform FireAsync operation."},
      {0, "[E_SYSTEM] Failed to perform FireAsync operation."},
      {2, "[E_SYSTEM]Failed to perform FireAsync operation."}};
  for (const auto& [code, message] : rows) {
    Host::FailCall("_Event::FireAsync", E_SYSTEM, 1);
    Lines lines = ExpectHeard({code}, "");
    lines.push_back(SysPlain(message));
    ExpectLeft(kUntouched, lines, {});
    FailingLibraryAllocation failing;
    lines = ExpectHeard({code}, "");
    lines.push_back(SysNamed(E_OUT_OF_MEMORY, " Memory allocation failed."));
    ExpectLeft(kUntouched, lines, {});
  }
  ExpectHeard({0, 0}, "finished ");
}

TEST_F(Interruptions, ListenerWithoutADisruptionOfItsOwnIgnoresItAndWithoutOneTheMarkIsKept) {
  PlainListener plain;
  EXPECT_EQ(manager.SetAudioSessionEventListener(&plain), E_SUCCESS);
  ExpectHeard({1, 3, 4, 5}, "");
  EXPECT_EQ(plain.TakeHeard(), "started ");
  EXPECT_EQ(manager.SetAudioSessionEventListener(nullptr), E_SUCCESS);
  ExpectHeard({2}, "");
  EXPECT_EQ(manager.SetAudioSessionEventListener(&listener), E_SUCCESS);
  ExpectHeard({0, 0}, "finished ");
}

TEST_F(Interruptions, AnotherListenerTakesThePlaceOfTheOneBefore) {
  Listener other;
  const struct {
    IAudioSessionEventListener* next;
    Lines calls;
    std::string heard, otherHeard;
  } rows[] = {
      {&other, {kRemove, kAdd}, "", "started "},
      {&other, {kRemove, kAdd}, "", "started "},
      {nullptr, {kRemove}, "", ""},
      {nullptr, {}, "", ""},
      {&listener, {kAdd}, "started ", ""},
  };
  for (const auto& row : rows) {
    EXPECT_EQ(manager.SetAudioSessionEventListener(row.next), E_SUCCESS);
    ExpectLeftBehindGate(kUntouched, {}, row.calls);
    ExpectHeard({5}, row.heard);
    EXPECT_EQ(other.TakeHeard(), row.otherHeard);
    Forget();
  }
}

TEST_F(Interruptions, ListenerThatCantBeRemovedStaysAndOneThatCantBeAddedLeavesNone) {
  Listener other;
  Host::FailCall("_Event::RemoveListener", E_INVALID_STATE, 1);
  EXPECT_EQ(manager.SetAudioSessionEventListener(&other), E_INVALID_STATE);
  ExpectLeftBehindGate(E_INVALID_STATE, {SysNamed(E_INVALID_STATE, " RemoveListener() failed")},
                       {kRemove});
  ExpectHeard({5}, "started ");
  EXPECT_EQ(other.TakeHeard(), "");

  Forget();
  Host::FailCall("_Event::AddListener", E_OUT_OF_MEMORY, 1);
  EXPECT_EQ(manager.SetAudioSessionEventListener(&other), E_OUT_OF_MEMORY);
  ExpectLeftBehindGate(E_OUT_OF_MEMORY, {SysNamed(E_OUT_OF_MEMORY, " AddListener() failed")},
                       {kRemove, kAdd});
  ExpectHeard({5}, "");
  Forget();
  EXPECT_EQ(manager.SetAudioSessionEventListener(&listener), E_SUCCESS);
  ExpectLeftBehindGate(kUntouched, {}, {kAdd});
}

}  // namespace
}  // namespace Zelkora::Media
