// The life of the managers, from the first GetInstance to the end of the process. Each test has a
// process of its own, made by one that never has a manager.

#include "support/Allocations.h"
#include "support/Gate.h"
#include "support/Managers.h"
#include "support/OwnProcess.h"

#include <array>
#include <atomic>
#include <optional>
#include <thread>

namespace Zelkora::Media {
namespace {

Lines operator+(Lines head, const Lines& tail) {
  head.insert(head.end(), tail.begin(), tail.end());
  return head;
}

std::string Propagating(result r) { return SysNamed(r, " Propagating."); }

std::string NoMemory(const char* tail) {
  return SysNamed(E_OUT_OF_MEMORY, std::string(" Memory allocation failed.") + tail);
}

/// The calls that end a manager's callbacks, in their order.
template <typename Manager>
Lines Unset() {
  Lines calls;
  for (const std::string& callback : Facts<Manager>::Callbacks()) {
    calls.push_back("sound_manager_unset_" + callback + "_cb()");
  }
  return calls;
}

/// One way for a manager's creation to fail, and what it leaves in the log.
struct Failure {
  std::optional<int> spared;  ///< how many of the library's allocations succeed
  std::string function;       ///< or else which function of the platform fails
  int code;
  result expected;
  std::string cause;
  std::size_t propagations;  ///< how many layers pass it on
  Lines calls;               ///< behind the gates
};

template <typename Manager>
std::vector<Failure> Failures() {
  std::vector<Failure> rows = {
      {0, "", 0, E_OUT_OF_MEMORY, NoMemory(Facts<Manager>::kManagerNotCreated), 1, {}},
      {1, "", 0, E_OUT_OF_MEMORY, NoMemory("  The object is not created."), 2, {}},
  };
  if (Facts<Manager>::Callbacks().empty()) return rows;
  const Lines unset = Unset<Manager>();
  rows.push_back({2, "", 0, E_OUT_OF_MEMORY, NoMemory(""), 3, unset});
  Lines calls = {"_Event::Initialize()"};
  for (const result r : {E_OUT_OF_MEMORY, E_SYSTEM, kForeign}) {
    rows.push_back(
        {{}, "_Event::Initialize", static_cast<int>(r), r, Propagating(r), 4, calls + unset});
  }
  for (const std::string& callback : Facts<Manager>::Callbacks()) {
    const std::string function = "sound_manager_set_" + callback + "_cb";
    calls.push_back(function + "()");
    for (const auto& failure : kPlatformFailures) {
      const std::string cause =
          SysNamed(E_SYSTEM, " A system error has been occurred. Failed to perform " + function +
                                 " operation with error code : " + std::to_string(failure.code));
      rows.push_back({{}, function, failure.code, E_SYSTEM, cause, 3, calls + unset});
    }
  }
  return rows;
}

template <typename Manager>
class ManagerLife : public LibraryTest {
 protected:
  const Lines gates = {PrivilegeQuery<Manager>(), kFeatureQuery};

  /// After a failed creation there is never a manager, and no second attempt.
  void ExpectNoneForEver() {
    Forget();
    EXPECT_EQ(Manager::GetInstance(), nullptr);
    ExpectLeft(E_SUCCESS, {Propagating(E_SUCCESS)}, gates);
  }

  void ExpectFailedCreation(const Failure& row) {
    std::optional<FailingLibraryAllocation> failing;
    if (row.spared) failing.emplace(*row.spared);
    if (!row.function.empty()) Host::FailCall(row.function.c_str(), row.code);
    EXPECT_EQ(Manager::GetInstance(), nullptr);
    ExpectLeft(row.expected, Lines{row.cause} + Lines(row.propagations, Propagating(row.expected)),
               gates + row.calls);
    failing.reset();
    Host::ClearFailures();
    ExpectNoneForEver();
    std::thread([this] { ExpectNoneForEver(); }).join();
  }
};
TYPED_TEST_SUITE(ManagerLife, Managers, ManagerNames);

TYPED_TEST(ManagerLife, FailedCreationIsReportedByEachLayerUndoneAndNeverRepeated) {
  for (const Failure& row : Failures<TypeParam>()) {
    SCOPED_TRACE(row.cause);
    InOwnProcess([&] { this->ExpectFailedCreation(row); });
  }
}

TYPED_TEST(ManagerLife, AnyAllocationOfCreationMayFailAlsoThePlatforms) {
  constexpr int kNoneFailed = 3;
  int status = 0;
  std::size_t sites = 0;
  for (; status == 0; ++sites) {
    status = StatusOfOwnProcess([&] {
      Host::RecordCalls(false);  // the record would allocate
      const std::ptrdiff_t live = CountLiveAllocations();
      FailingAllocation failing(sites + 1);
      const bool made = TypeParam::GetInstance() != nullptr;
      const result r = GetLastResult();
      if (!failing.HasFailed()) std::exit(made ? kNoneFailed : 1);
      EXPECT_FALSE(made);
      EXPECT_TRUE(r == E_OUT_OF_MEMORY || r == E_SYSTEM) << GetErrorMessage(r);
      this->log.Take();
      // What the device keeps once it has started isn't the library's.
      if (sites < 3) {
        EXPECT_LE(CountLiveAllocations(), live);
      }
      this->ExpectNoneForEver();
    });
  }
  EXPECT_EQ(status, kNoneFailed);
  EXPECT_GT(sites, 2u);
}

TYPED_TEST(ManagerLife, RefusedGatesCreateNothingAndLeaveTheFirstCreationOpen) {
  InOwnProcess([] {
    Host::RecordCalls(false);  // it would allocate, and so would the capture
    Host::SetLogSink([](const Host::LogRecord&, void*) {}, nullptr);
    const std::size_t before = CountAllocations();
    Host::SetPrivilege(Facts<TypeParam>::kPrivilege, E_SYSTEM);
    EXPECT_EQ(TypeParam::GetInstance(), nullptr);
    EXPECT_EQ(GetLastResult(), E_PRIVILEGE_DENIED);
    Host::ResetCapabilities();
    for (const auto& [answer, expected] : kFeatureRefusals) {
      Host::SetFeature("audio_manager", answer);
      EXPECT_EQ(TypeParam::GetInstance(), nullptr);
      EXPECT_EQ(GetLastResult(), expected);
    }
    EXPECT_EQ(CountAllocations(), before);
    Host::ResetCapabilities();
    EXPECT_NE(TypeParam::GetInstance(), nullptr);
    EXPECT_EQ(GetLastResult(), E_SUCCESS);
  });
}

TYPED_TEST(ManagerLife, FirstCallsOfManyThreadsMakeOneManager) {
  InOwnProcess([] {
    std::promise<void> gate;
    const auto open = gate.get_future().share();
    std::array<std::future<TypeParam*>, 8> instances;
    for (auto& instance : instances) {
      instance = std::async(std::launch::async, [open] {
        open.wait();
        TypeParam* manager = TypeParam::GetInstance();
        EXPECT_EQ(GetLastResult(), E_SUCCESS);
        Facts<TypeParam>::Operations().back().call(*manager);  // whoever has it sees it whole
        return manager;
      });
    }
    gate.set_value();
    TypeParam* const first = instances[0].get();
    EXPECT_NE(first, nullptr);
    for (std::size_t i = 1; i < instances.size(); ++i) EXPECT_EQ(instances[i].get(), first);
    const Lines calls = Host::TakeCalls();
    EXPECT_EQ(std::count(calls.begin(), calls.end(), "_Event::Initialize()"),
              Facts<TypeParam>::Callbacks().empty() ? 0 : 1);
  });
}

/// Runs its checks at exit, after the managers are gone: made before them.
void CheckAtExit(std::function<void()> checks) {
  static std::function<void()> kept;
  kept = std::move(checks);
  std::atexit([] {
    kept();
    if (testing::Test::HasFailure()) std::_Exit(1);
  });
}

class ProcessExit : public LibraryTest {};

TEST_F(ProcessExit, DeletesTheManagersUnregisteringFirstAndLateCallsFindNone) {
  InOwnProcess([this] {
    CheckAtExit([this] {
      const Lines ends = Lines{"sound_manager_call_session_destroy(1)"} + Unset<Session>();
      EXPECT_EQ(Host::TakeCalls(), ends + Unset<Volume>());
      EXPECT_EQ(Volume::GetInstance(), nullptr);
      EXPECT_EQ(Session::GetInstance(), nullptr);
      EXPECT_EQ(Call::GetInstance(), nullptr);
      EXPECT_EQ(GetLastResult(), E_SUCCESS);
      EXPECT_EQ(log.Take(), Lines(3, Propagating(E_SUCCESS)));
    });
    EXPECT_NE(Volume::GetInstance(), nullptr);
    EXPECT_NE(Session::GetInstance(), nullptr);
    EXPECT_EQ(Call::GetInstance()->EnterCallSession(), E_SUCCESS);
    Host::RecordCalls(true);
  });
}

struct Listener : IAudioVolumeEventListener, IAudioSessionEventListener {
  void OnMediaVolumeChanged(int) override { ++calls; }
  void OnAudioSessionInterruptStarted() override { ++calls; }
  void OnAudioSessionInterruptFinished() override { ++calls; }

  std::atomic<int> calls{0};
};

TEST_F(ProcessExit, ComesWhileTheDeviceStillReportsToListeners) {
  InOwnProcess([] {
    static Listener listener;  // lives longer than the managers
    static std::atomic<bool> stop{false};
    static std::array<std::thread, 2> sources;
    Host::SetLogSink([](const Host::LogRecord&, void*) {}, nullptr);
    Host::RecordCalls(false);
    CheckAtExit([] {
      stop = true;
      for (std::thread& source : sources) source.join();
    });
    Volume::GetInstance()->AddAudioVolumeEventListener(listener);
    Session::GetInstance()->SetAudioSessionEventListener(&listener);
    sources[0] = std::thread([] {
      for (int level = 0; !stop; ++level) Simulated::ReportVolume(4, level);
    });
    sources[1] = std::thread([] {
      for (int i = 0; !stop; ++i) {
        Simulated::Interrupt(i % 7);
        Simulated::ReportMuteAll(i % 2 == 0);
      }
    });
    while (listener.calls < 100) std::this_thread::yield();
  });
}

TEST_F(ProcessExit, WaitsForACallbackThatIsRunning) {
  InOwnProcess([] {
    static Gate gate;
    static Listener listener;
    static std::thread opener;
    static std::atomic<bool> tooLate{false};
    CheckAtExit([] {
      tooLate = true;
      opener.join();
    });
    Session::GetInstance()->SetAudioSessionEventListener(&listener);
    // Holds the device's thread inside the library's callback, from its first log line on.
    Host::SetLogSink(
        [](const Host::LogRecord& record, void*) {
          if (std::string(record.message).rfind("This instance received", 0) == 0) gate.Pass();
        },
        nullptr);
    Simulated::Interrupt(5);
    gate.AwaitVisitor();
    Host::RecordCalls(true);
    opener = std::thread([] {  // opens only once the manager is being destroyed
      while (!tooLate && Host::TakeCalls() != Unset<Session>()) std::this_thread::yield();
      EXPECT_FALSE(tooLate);
      gate.Open();
    });
  });
}

}  // namespace
}  // namespace Zelkora::Media
