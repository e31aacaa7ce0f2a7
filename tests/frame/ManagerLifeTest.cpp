// The life of the managers, from the first GetInstance to the end of the process. Each test has a
// process of its own, made by one that never has a manager.

#include "support/Allocations.h"
#include "support/Gate.h"
#include "support/Managers.h"
#include "support/OwnProcess.h"

#include <array>
#include <atomic>
#include <future>
#include <set>
#include <thread>

namespace Zelkora::Media {
namespace {

constexpr int kAll = 1000000;

Lines operator+(Lines head, const Lines& tail) {
  head.insert(head.end(), tail.begin(), tail.end());
  return head;
}

std::string Propagating(result r) { return SysNamed(r, " Propagating."); }

std::string NoMemory(const std::string& tail) {
  return SysNamed(E_OUT_OF_MEMORY, " Memory allocation failed." + tail);
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

  /// Expects a creation to fail when \p spared of the library's allocations succeed, or when one of
  /// the platform's functions fails as asked for before.
  /// \param propagations how many layers pass the failure on
  /// \param calls those behind the gates
  void ExpectFailedCreation(int spared, result expected, const std::string& cause,
                            std::size_t propagations, const Lines& calls) {
    SCOPED_TRACE(cause);
    InOwnProcess([&] {
      {
        FailingLibraryAllocation failing(spared);
        EXPECT_EQ(Manager::GetInstance(), nullptr);
      }
      ExpectLeft(expected, Lines{cause} + Lines(propagations, Propagating(expected)),
                 gates + calls);
      ExpectNoneForEver();
      std::thread([this] { ExpectNoneForEver(); }).join();
    });
    Host::ClearFailures();
  }
};
TYPED_TEST_SUITE(ManagerLife, Managers, ManagerNames);

TYPED_TEST(ManagerLife, FailedCreationIsReportedByEachLayerUndoneAndNeverRepeated) {
  using Its = Facts<TypeParam>;
  this->ExpectFailedCreation(0, E_OUT_OF_MEMORY, NoMemory(Its::kManagerNotCreated), 1, {});
  this->ExpectFailedCreation(1, E_OUT_OF_MEMORY, NoMemory("  The object is not created."), 2, {});
  if (Its::Callbacks().empty()) return;
  const Lines unset = Unset<TypeParam>();
  this->ExpectFailedCreation(2, E_OUT_OF_MEMORY, NoMemory(""), 3, unset);
  Lines calls = {"_Event::Initialize()"};
  Host::FailCall("_Event::Initialize", kForeign, 1);
  this->ExpectFailedCreation(kAll, kForeign, Propagating(kForeign), 4, calls + unset);
  for (const std::string& callback : Its::Callbacks()) {
    const std::string function = "sound_manager_set_" + callback + "_cb";
    calls.push_back(function + "()");
    Host::FailCall(function.c_str(), -38, 1);
    const std::string cause = " A system error has been occurred. Failed to perform " + function +
                              " operation with error code : -38";
    this->ExpectFailedCreation(kAll, E_SYSTEM, SysNamed(E_SYSTEM, cause), 3, calls + unset);
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
    Host::SetPrivilege(Facts<TypeParam>::kPrivilege, E_SYSTEM);
    {
      FailingLibraryAllocation failing;  // a creation would fail, for ever
      EXPECT_EQ(TypeParam::GetInstance(), nullptr);
      Host::ResetCapabilities();
      Host::SetFeature("audio_manager", E_OBJ_NOT_FOUND);
      EXPECT_EQ(TypeParam::GetInstance(), nullptr);
    }
    Host::ResetCapabilities();
    EXPECT_NE(TypeParam::GetInstance(), nullptr);
    EXPECT_EQ(GetLastResult(), E_SUCCESS);
  });
}

TYPED_TEST(ManagerLife, FirstCallsOfManyThreadsMakeOneManager) {
  InOwnProcess([] {
    std::atomic<bool> open{false};
    std::array<std::future<TypeParam*>, 8> instances;
    for (auto& instance : instances) {
      instance = std::async(std::launch::async, [&] {
        while (!open) std::this_thread::yield();
        TypeParam* manager = TypeParam::GetInstance();
        EXPECT_EQ(GetLastResult(), E_SUCCESS);
        Facts<TypeParam>::Operations().back().call(*manager);  // whoever has it sees it whole
        return manager;
      });
    }
    open = true;
    std::set<TypeParam*> managers;
    for (auto& instance : instances) managers.insert(instance.get());
    EXPECT_THAT(managers, testing::ElementsAre(testing::NotNull()));
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
      EXPECT_EQ(log.Take(), Lines(3, Propagating(E_SUCCESS)));
    });
    EXPECT_NE(Volume::GetInstance(), nullptr);
    EXPECT_NE(Session::GetInstance(), nullptr);
    EXPECT_EQ(Call::GetInstance()->EnterCallSession(), E_SUCCESS);
    Host::RecordCalls(true);
  });
}

TEST_F(ProcessExit, WaitsForACallbackThatIsRunningAndLetsNoneComeAfterwards) {
  InOwnProcess([] {
    static Gate gate;
    static std::thread device;
    static std::atomic<bool> tooLate{false};
    CheckAtExit([] {
      tooLate = true;
      device.join();
    });
    Volume::GetInstance();
    Session::GetInstance();
    // Holds the device's thread inside the library's callback, from its first log line on.
    Host::SetLogSink(
        [](const Host::LogRecord& record, void*) {
          if (std::string(record.message).rfind("This instance received", 0) == 0) gate.Pass();
        },
        nullptr);
    Simulated::Interrupt(5);
    gate.AwaitVisitor();
    Host::RecordCalls(true);
    device = std::thread([] {
      bool isOpen = false;
      for (int n = 0; !tooLate; ++n) {
        Simulated::ReportVolume(4, n);
        if (isOpen || Host::TakeCalls() != Unset<Session>()) continue;
        gate.Open();  // only once a manager is being destroyed
        isOpen = true;
      }
      EXPECT_TRUE(isOpen);
    });
  });
}

}  // namespace
}  // namespace Zelkora::Media
