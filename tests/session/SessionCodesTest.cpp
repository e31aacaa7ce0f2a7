// Interruptions by each code, which only the simulated device can be made to report.

#include "Listeners.h"

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
      received.push_back("80 info: This instance received message code : " + std::to_string(code));
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

TEST_F(SessionCodes, UnknownCodesAndEventsThatAreLostLeaveTheMarkOfACode2) {
  for (const int code : {7, -1, INT_MAX, INT_MIN}) ExpectHeard({2, code, 0}, "disrupted ");
  ExpectHeard({2}, "disrupted ");
  Simulated::ReportWithoutUserData(true);
  ExpectHeard({0}, "");
  Simulated::ReportWithoutUserData(false);
  ExpectHeard({0, 0}, "finished ");
  Host::FailCall("_Event::FireAsync", E_SYSTEM, 1);
  ExpectHeard({2, 0, 0}, "finished ");
}

TEST_F(SessionCodes, AnotherListenerTakesThePlaceOfTheOneBeforeUnlessThatCantBeRemoved) {
  SessionListener other;
  const struct {
    IAudioSessionEventListener* next;
    const char* refuses;
    Lines calls;
    std::string heard, otherHeard;
  } rows[] = {
      {&other, "", {kRemove, kAdd}, "", "started "},
      {&other, "", {kRemove, kAdd}, "", "started "},
      {nullptr, "", {kRemove}, "", ""},
      {nullptr, "", {}, "", ""},
      {&listener, "", {kAdd}, "started ", ""},
      {&other, "_Event::RemoveListener", {kRemove}, "started ", ""},
      {&other, "_Event::AddListener", {kRemove, kAdd}, "", ""},
      {&listener, "", {kAdd}, "started ", ""},
  };
  for (const auto& row : rows) {
    const std::string refuses = row.refuses;
    if (!refuses.empty()) Host::FailCall(row.refuses, E_INVALID_STATE, 1);
    Forget();
    EXPECT_EQ(manager.SetAudioSessionEventListener(row.next),
              refuses.empty() ? E_SUCCESS : E_INVALID_STATE);
    Lines calls = row.calls;
    calls.insert(calls.begin(), PrivilegeQuery<Session>());
    EXPECT_EQ(Host::TakeCalls(), calls);
    ExpectHeard({5}, row.heard);
    EXPECT_EQ(other.TakeHeard(), row.otherHeard);
  }
}

}  // namespace
}  // namespace Zelkora::Media
