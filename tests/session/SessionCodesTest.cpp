// Interruptions by each code, which only the simulated device can be made to report.

#include "Listeners.h"
#include "support/Allocations.h"

#include <climits>

namespace Zelkora::Media {
namespace {

constexpr char kAdd[] = "_Event::AddListener()";
constexpr char kRemove[] = "_Event::RemoveListener()";

class SessionCodes : public ManagerTest<Session> {
 protected:
  SessionCodes() {
    Simulated::Interrupt(0);  // ends what another test has left behind
    Host::WaitUntilDelivered();
    EXPECT_EQ(manager.SetAudioSessionEventListener(&listener), E_SUCCESS);
    Forget();
  }
  ~SessionCodes() override { manager.SetAudioSessionEventListener(nullptr); }

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

  SessionListener listener;
};

TEST_F(SessionCodes, CodesBecomeEventsAndTheEndOfACode2IsSwallowedOnce) {
  const std::pair<std::vector<int>, std::string> rows[] = {
      {{5, 0, 6, 0}, "started finished started finished "},
      {{0, 1, 3, 4, 0}, "finished disrupted disrupted disrupted finished "},
      {{2, 0, 0}, "disrupted finished "},
      {{2, 5, 0}, "disrupted started "},
      {{2, 1, 3, 4, 6, 0, 0}, "disrupted disrupted disrupted disrupted started finished "},
      {{2, 2, 0, 0}, "disrupted disrupted finished "},
  };
  for (const auto& [codes, heard] : rows) {
    const Lines received = ExpectHeard(codes, heard);
    ExpectLeft(kUntouched, received, {});
  }
  EXPECT_EQ(manager.SetAudioSessionEventListener(nullptr), E_SUCCESS);
  ExpectHeard({2}, "");
  EXPECT_EQ(manager.SetAudioSessionEventListener(&listener), E_SUCCESS);
  ExpectHeard({0, 0}, "finished ");
}

TEST_F(SessionCodes, UnknownCodesAndCallbacksWithoutUserDataAreLoggedAndChangeNothing) {
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

TEST_F(SessionCodes, EventThatFindsNoMemoryOrNoQueueIsLostAndItsMarkStays) {
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

TEST_F(SessionCodes, AnotherListenerTakesThePlaceOfTheOneBefore) {
  SessionListener other;
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

TEST_F(SessionCodes, ListenerThatCantBeRemovedStaysAndOneThatCantBeAddedLeavesNone) {
  SessionListener other;
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
