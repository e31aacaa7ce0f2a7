// Interruptions by each code, which only the simulated device can be made to report.

#include "Listeners.h"

#include <climits>

namespace Zelkora::Media {
namespace {

class SessionCodes : public ManagerTest<Session> {
 protected:
  SessionCodes() {
    Simulated::Interrupt(0);  // ends what another test has left behind
    Host::WaitUntilDelivered();
    EXPECT_EQ(manager.SetAudioSessionEventListener(&listener), E_SUCCESS);
  }
  ~SessionCodes() override { manager.SetAudioSessionEventListener(nullptr); }

  void ExpectHeard(const std::vector<int>& codes, const std::string& heard) {
    for (const int code : codes) Simulated::Interrupt(code);
    EXPECT_EQ(listener.TakeHeard(), heard) << testing::PrintToString(codes);
  }

  SessionListener listener;
};

TEST_F(SessionCodes, CodesBecomeEventsAndTheEndOfACode2IsSwallowedOnce) {
  ExpectHeard({5, 0, 6, 0}, "started finished started finished ");
  ExpectHeard({0, 1, 3, 4, 0}, "finished disrupted disrupted disrupted finished ");
  ExpectHeard({2, 0, 0}, "disrupted finished ");
  ExpectHeard({2, 5, 0}, "disrupted started ");
  ExpectHeard({2, 1, 3, 4, 6, 0, 0}, "disrupted disrupted disrupted disrupted started finished ");
  ExpectHeard({2, 2, 0, 0}, "disrupted disrupted finished ");
  for (const int code : {7, -1, INT_MAX, INT_MIN}) ExpectHeard({2, code, 0}, "disrupted ");
  EXPECT_EQ(GetLastResult(), kUntouched);
}

TEST_F(SessionCodes, SwallowingIsLeftAsItIsByWhatNobodyHears) {
  EXPECT_EQ(manager.SetAudioSessionEventListener(nullptr), E_SUCCESS);
  ExpectHeard({2}, "");
  EXPECT_EQ(manager.SetAudioSessionEventListener(&listener), E_SUCCESS);
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
    std::string refuses, heard, otherHeard;
  } rows[] = {{&other, "", "", "started "},
              {&other, "", "", "started "},
              {nullptr, "", "", ""},
              {nullptr, "", "", ""},
              {&listener, "", "started ", ""},
              {&other, "_Event::RemoveListener", "started ", ""},
              {&other, "_Event::AddListener", "", ""},
              {&listener, "", "started ", ""}};
  for (const auto& row : rows) {
    if (!row.refuses.empty()) Host::FailCall(row.refuses.c_str(), E_INVALID_STATE, 1);
    EXPECT_EQ(manager.SetAudioSessionEventListener(row.next),
              row.refuses.empty() ? E_SUCCESS : E_INVALID_STATE);
    ExpectHeard({5}, row.heard);
    EXPECT_EQ(other.TakeHeard(), row.otherHeard);
  }
}

}  // namespace
}  // namespace Zelkora::Media
