// The life of the managers, from the first GetInstance to the end of the process. Each test has a
// process of its own, made by one that never has a manager.

#include "support/Allocations.h"
#include "support/Gate.h"
#include "support/Managers.h"
#include "support/OwnProcess.h"

#include <Tizen/Media/Player.h>
#include <Zelkora/Media/AudioEffector.h>
#include <Zelkora/Media/VideoKeyFrameSeeker.h>
#include <player.h>
#include <sound_manager.h>

#include <array>
#include <atomic>
#include <future>
#include <set>
#include <thread>

/// Asks the sanitizer, if there is one, for no leaks: it takes what the parent's threads hold for
/// lost.
static bool hasLostThreads = false;
extern "C" int __lsan_is_turned_off();
extern "C" int __lsan_is_turned_off() { return hasLostThreads; }

namespace {

using namespace Zelkora::Media;

#ifdef __SANITIZE_THREAD__
constexpr int kProcesses = 10;  // each waits a second for threads that still run
#else
constexpr int kProcesses = 60;
#endif

constexpr char kEndOfSession[] = "sound_manager_unset_session_interrupted_cb()";
constexpr char kEndOfLevels[] = "sound_manager_unset_volume_changed_cb()";
constexpr char kEndOfMute[] = "sound_manager_unset_muteall_changed_cb()";

/// Uses of managers that need nothing.
void Use(Session& manager) { manager.GetMode(); }
void Use(Call& manager) { manager.GetCallSessionMode(); }
void Use(Volume& manager) { manager.GetMuteStatus(); }

template <typename Manager>
class ManagerLife : public LibraryTest {};
TYPED_TEST_SUITE(ManagerLife, Managers);

template <typename Manager>
void ExpectFailedCreation(const char* refusing, const Lines& undone) {
  InOwnProcess([=] {
    Host::FailCall(refusing, -38, 1);
    EXPECT_EQ(Manager::GetInstance(), nullptr);
    Lines calls = Host::TakeCalls();
    calls.erase(calls.begin(), calls.end() - std::ptrdiff_t(undone.size()));
    EXPECT_EQ(calls, undone);
    std::thread([] {
      EXPECT_EQ(Manager::GetInstance(), nullptr);
      EXPECT_EQ(GetLastResult(), E_SUCCESS);
    }).join();
    EXPECT_EQ(Host::TakeCalls(), (Lines{PrivilegeQuery<Manager>(), kFeatureQuery}));
  });
}

using FailedCreation = LibraryTest;

TEST_F(FailedCreation, IsUndoneAndNeverRepeated) {
  ExpectFailedCreation<Session>("sound_manager_set_session_interrupted_cb", {kEndOfSession});
  ExpectFailedCreation<Volume>("sound_manager_set_volume_changed_cb", {kEndOfLevels, kEndOfMute});
  ExpectFailedCreation<Volume>("sound_manager_set_muteall_changed_cb", {kEndOfLevels, kEndOfMute});
}

TYPED_TEST(ManagerLife, IsBegunOnceByTheFirstOfManyThreadsThatPassBothGates) {
  InOwnProcess([this] {
    Host::SetPrivilege(Privilege<TypeParam>(), E_SYSTEM);
    {
      const FailingAllocation failing(0);  // a creation would fail, for ever
      EXPECT_EQ(TypeParam::GetInstance(), nullptr);
      Host::ResetCapabilities();
      Host::SetFeature("audio_manager", E_OBJ_NOT_FOUND);
      EXPECT_EQ(TypeParam::GetInstance(), nullptr);
    }
    Host::ResetCapabilities();
    std::atomic<bool> open{false};
    std::array<std::future<TypeParam*>, 8> instances;
    for (auto& instance : instances) {
      instance = std::async(std::launch::async, [&] {
        while (!open) std::this_thread::yield();
        TypeParam* manager = TypeParam::GetInstance();
        EXPECT_EQ(GetLastResult(), E_SUCCESS);
        Use(*manager);  // whoever has it sees it whole
        return manager;
      });
    }
    open = true;
    std::set<TypeParam*> managers;
    for (auto& instance : instances) managers.insert(instance.get());
    Host::FailCall("SystemInfo::GetValue", 0, 1);  // succeeds without an answer
    EXPECT_EQ(TypeParam::GetInstance(), nullptr);
    managers.insert(TypeParam::GetInstance());
    EXPECT_THAT(managers, testing::ElementsAre(testing::NotNull()));
    EXPECT_THAT(this->log.Take(),
                testing::Not(testing::Contains(testing::StartsWith("assertion"))));
  });
}

using ProcessExit = LibraryTest;

TEST_F(ProcessExit, DeletesTheManagersUnregisteringFirstAndLateCallsFindNone) {
  InOwnProcess([this] {
    CheckAtExit([this] {
      EXPECT_EQ(Host::TakeCalls(), (Lines{"sound_manager_call_session_destroy(1)", kEndOfSession,
                                          kEndOfLevels, kEndOfMute}));
      EXPECT_EQ(Volume::GetInstance(), nullptr);
      EXPECT_EQ(Session::GetInstance(), nullptr);
      EXPECT_EQ(Call::GetInstance(), nullptr);
      EXPECT_EQ(log.Take(), Lines(3, "80: [E_SUCCESS] Propagating."));
    });
    EXPECT_NE(Volume::GetInstance(), nullptr);
    EXPECT_NE(Session::GetInstance(), nullptr);
    EXPECT_EQ(Call::GetInstance()->EnterCallSession(), E_SUCCESS);
    Host::RecordCalls(true);
  });
}

TEST_F(ProcessExit, WaitsForACallbackThatIsRunningWithWhatItUsesAlive) {
  InOwnProcess([] {
    static Gate gate;
    static std::thread opener;
    CheckAtExit([] { opener.join(); });
    Session::GetInstance();
    // Holds the device's thread inside the library's callback, from its first log line on.
    Host::SetLogSink([](const Host::LogRecord&, void*) { gate.Pass(); }, nullptr);
    Simulated::Interrupt(5);
    gate.AwaitVisitor();
    Host::RecordCalls(true);
    opener = std::thread([] {
      while (Host::TakeCalls() != Lines{kEndOfSession}) std::this_thread::yield();
      gate.Open();  // only once the manager is being destroyed
    });
  });
}

/// Starts threads that use everything without an end, managers excepted, and returns when each has
/// begun. What they use is never freed.
void KeepBusy() {
  static auto& player = *new Tizen::Media::Player;
  static auto& effector = *new AudioEffector;
  static auto& seeker = *new VideoKeyFrameSeeker;
  player.Construct();
  player.OpenFile("movie");
  EXPECT_EQ(effector.Construct(player), E_SUCCESS);
  EXPECT_EQ(seeker.Construct(player), E_SUCCESS);
  static std::atomic<int> missing;
  const std::pair<const char*, void (*)(int)> work[] = {
      {"effector", [](int n) { effector.SetEffectLevel(AUDIO_EFFECT_BASS, n % 12); }},
      {"lists", [](int) { delete effector.GetSupportedEffectPresetListN(); }},
      {"seeker", [](int n) { seeker.SeekTo(n % 60000); }},
      {"player", [](int) { player.OpenFile("another"); }},
      {"media", [](int) { Simulated::ResetPlayer(); }},
      {"volume", [](int n) { Simulated::ReportVolume(4, n % 16); }},
      {"interruption", [](int n) { Simulated::Interrupt(n % 7); }},
  };
  missing = std::size(work);
  for (const auto& [name, turn] : work) {
    std::thread([turn = turn] {
      turn(0);
      --missing;
      for (int n = 1;; ++n) {
        turn(n);
        usleep(50);  // leaves the processor to the one who ends
      }
    }).detach();
  }
  while (missing > 0) std::this_thread::yield();
}

/// All three managers, with listeners that take a moment.
void UseManagers() {
  struct Slow : IAudioVolumeEventListener, IAudioSessionEventListener {
    void OnMediaVolumeChanged(int) override { usleep(100); }
    void OnAudioSessionInterruptStarted() override { usleep(100); }
    void OnAudioSessionInterruptFinished() override { usleep(100); }
  };
  static auto& listener = *new Slow;
  Volume::GetInstance()->AddAudioVolumeEventListener(listener);
  Session::GetInstance()->SetAudioSessionEventListener(&listener);
  EXPECT_EQ(Call::GetInstance()->EnterCallSession(), E_SUCCESS);
}

TEST_F(ProcessExit, IsCleanWhateverOtherThreadsAreDoing) {
  Host::SetLogSink([](const Host::LogRecord&, void*) {}, nullptr);
  for (int n = 0; n < kProcesses && !HasFailure(); ++n) {
    InOwnProcess([] {
      UseManagers();
      KeepBusy();
    });
  }
}

/// What a forked child can do: anything, with an answer.
void UseNativeFunctions() {
  hasLostThreads = true;
  int value = 0;
  player_h player = nullptr;
  sound_manager_get_volume(4, &value);
  sound_manager_set_volume(4, 3);
  sound_manager_set_volume_changed_cb([](int, int, void*) {}, nullptr);
  sound_manager_unset_session_interrupted_cb();
  sound_manager_set_session_type(1);
  player_create(&player);
  EXPECT_EQ(player_open(player, "movie"), 0);
  EXPECT_EQ(player_audio_effect_get_value(player, 1, &value), 0);
  player_destroy(player);
  Host::WaitUntilDelivered();
}

TEST_F(ProcessExit, OfAForkedChildEndsThoughAListenersCallRanAtTheFork) {
  Host::SetLogSink([](const Host::LogRecord&, void*) {}, nullptr);
  InOwnProcess([] {
    UseManagers();
    KeepBusy();
    for (int n = 0; n < kProcesses; ++n) EXPECT_EQ(StatusOfOwnProcess(UseNativeFunctions), 0);
  });
}

}  // namespace
