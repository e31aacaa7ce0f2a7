// What only the simulated device can be made to do.

#include "Listeners.h"
#include "support/Allocations.h"

#include <sound_manager.h>

#include <climits>
#include <deque>
#include <tuple>

static int reportedMode = 0;

/// A device whose call sessions report any mode: the library finds this one first.
int sound_manager_call_session_get_mode(sound_call_session_h, int* mode) {
  *mode = reportedMode;
  return 0;
}

namespace {

using namespace Zelkora::Media;

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
  const std::tuple<SessionListener*, std::string, std::string, std::string> rows[] = {
      {&other, "", "", "started "},
      {&other, "", "", "started "},
      {nullptr, "", "", ""},
      {nullptr, "", "", ""},
      {&listener, "", "started ", ""},
      {&other, "_Event::RemoveListener", "started ", ""},
      {&other, "_Event::AddListener", "", ""},
      {&listener, "", "started ", ""}};
  for (const auto& [next, refusing, heard, otherHeard] : rows) {
    if (!refusing.empty()) Host::FailCall(refusing.c_str(), E_INVALID_STATE, 1);
    EXPECT_EQ(manager.SetAudioSessionEventListener(next),
              refusing.empty() ? E_SUCCESS : E_INVALID_STATE);
    ExpectHeard({5}, heard);
    EXPECT_EQ(other.TakeHeard(), otherHeard);
  }
}

using CallDevice = ManagerTest<Call>;

TEST_F(CallDevice, ModeThatIsNotKnownIsReadAsNone) {
  ASSERT_EQ(manager.EnterCallSession(), E_SUCCESS);
  for (const int unknown : {3, -1, INT_MAX, INT_MIN}) {
    reportedMode = unknown;
    SetLastResult(kUntouched);
    EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_NONE) << unknown;
    EXPECT_EQ(GetLastResult(), kUntouched);
  }
  EXPECT_EQ(manager.ExitCallSession(), E_SUCCESS);
}

TEST_F(CallDevice, SessionThatAFailureLeavesBehindIsClosed) {
  Simulated::SetCallSessionFault(Simulated::CallSessionFault::kSessionRemains);
  EXPECT_EQ(manager.EnterCallSession(), E_INVALID_OPERATION);
  EXPECT_THAT(Simulated::GetCallSessionModes(), testing::IsEmpty());
  EXPECT_EQ(manager.GetCallSessionMode(), VOIP_AUDIO_SESSION_MODE_NONE);
}

using VolumeDevice = ManagerTest<Volume>;

TEST_F(VolumeDevice, GuardedOperationsAllocateNothing) {
  Host::RecordCalls(false);
  int min = 0, max = 0;
  const FailingAllocation first(0, FailingAllocation::kAnyones, 1);
  EXPECT_EQ(manager.SetMediaVolumeLevel(7), E_SUCCESS);
  EXPECT_EQ(manager.GetCurrentMediaVolumeLevel(), 7);
  EXPECT_EQ(manager.GetMediaVolumeRange(min, max), E_SUCCESS);
  EXPECT_EQ(manager.UnmuteAll(), E_SUCCESS);
  EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_UNMUTED);
  EXPECT_FALSE(first.HasFailed());
}

/// Counts calls; whether they come in order and one at a time shows in a plain integer.
struct Counter : IAudioVolumeEventListener {
  void OnMediaVolumeChanged(int level) override {
    inOrder &= level == count;
    ++count;
  }

  int count = 0;
  bool inOrder = true;
};

/// \return how many changes are reported to that many listeners: `ZELKORA_TEST_SCALE` per cent of a
/// million. Unless the environment says it, 1 and 10 listeners get the whole million and 1,000 a
/// tenth of it, which is 100 million calls; in emulation and under sanitizers, which take some
/// fifty times as long, it is one per cent for all.
int Changes(int listeners) {
  const char* scale = std::getenv("ZELKORA_TEST_SCALE");
  const int usual = listeners < 1000 ? ZELKORA_TEST_SCALE : (ZELKORA_TEST_SCALE + 9) / 10;
  return std::max(10000 * (scale == nullptr ? usual : std::atoi(scale)), 2000);
}

class ManyChanges : public VolumeDevice, public testing::WithParamInterface<int> {};

TEST_P(ManyChanges, AreAllDeliveredInOrderInTheMemoryOfAFewAndUnknownTypesAreLogged) {
  constexpr int kBatch = 1000;
  constexpr std::ptrdiff_t kKeptByTheDevice = 8;  // such as room in its queues
  Host::RecordCalls(false);                       // the record would grow
  const int changes = Changes(GetParam());
  std::deque<Added<Counter>> listeners(static_cast<std::size_t>(GetParam()));
  std::ptrdiff_t live = 0;
  for (int level = 0; level < changes; ++level) {
    Simulated::ReportVolume(4, level);
    if ((level + 1) % kBatch != 0) continue;
    Lines lines;
    for (const int type : {6, -1, INT_MAX, INT_MIN}) {
      Simulated::ReportVolume(type, level);
      lines.push_back("80 info: sound type returned is wrong - " + std::to_string(type));
    }
    Host::WaitUntilDelivered();
    ASSERT_EQ(log.Take(), lines);
    if (level + 1 == kBatch) live = CountLiveAllocations();
    ASSERT_LT(CountLiveAllocations(), live + kKeptByTheDevice);
  }
  EXPECT_EQ(manager.GetCurrentMediaVolumeLevel(), changes - 1);
  for (const Counter& listener : listeners) {
    ASSERT_EQ(listener.count, changes);
    ASSERT_TRUE(listener.inOrder);
  }
}

INSTANTIATE_TEST_SUITE_P(ToListeners, ManyChanges, testing::Values(1, 10, 1000),
                         testing::PrintToStringParamName());

}  // namespace
