// What the library relies on in the sound manager, shown by the simulated device, and its steering.

#include "support/Gate.h"
#include "support/OwnProcess.h"

#include <Simulated/Device.h>
#include <sound_manager.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <functional>
#include <string>
#include <thread>
#include <vector>

namespace {

using testing::ElementsAre;
using testing::IsEmpty;

/// What the three callbacks are told while it lives.
class Program {
 public:
  explicit Program(std::function<void()> onReport = [] {}) : onReport_(std::move(onReport)) {
    sound_manager_set_volume_changed_cb(
        [](int type, int level, void* program) {
          Hear(program, std::to_string(type) + "=" + std::to_string(level));
        },
        this);
    sound_manager_set_muteall_changed_cb(
        [](bool muteall, void* program) { Hear(program, muteall ? "muted" : "unmuted"); }, this);
    sound_manager_set_session_interrupted_cb(
        [](int code, void* program) { Hear(program, "code " + std::to_string(code)); }, this);
  }

  ~Program() {
    sound_manager_unset_volume_changed_cb();
    sound_manager_unset_muteall_changed_cb();
    sound_manager_unset_session_interrupted_cb();
  }

  std::vector<std::string> heard;
  std::vector<std::thread::id> threads;

 private:
  static void Hear(void* program, std::string report) {
    auto& self = *static_cast<Program*>(program);
    self.heard.push_back(std::move(report));
    self.threads.push_back(std::this_thread::get_id());
    self.onReport_();
  }

  const std::function<void()> onReport_;
};

class SoundManagerTest : public testing::Test {
 protected:
  SoundManagerTest() { Simulated::Reset(); }
  ~SoundManagerTest() override { Simulated::Reset(); }
};

using SoundManager = SoundManagerTest;
using Reports = SoundManagerTest;
using UnsettingACallback = SoundManagerTest;

int LevelOf(int type) {
  int level = -1;
  EXPECT_EQ(sound_manager_get_volume(type, &level), 0);
  return level;
}

TEST_F(SoundManager, RefusesWrongArgumentsChangingNothing) {
  static int value;
  static sound_call_session_h session, destroyed;
  const std::pair<const char*, int (*)()> rows[] = {
      {"maximum of no type", [] { return sound_manager_get_max_volume(-1, &value); }},
      {"below the range", [] { return sound_manager_set_volume(4, -1); }},
      {"above the range", [] { return sound_manager_set_volume(4, 16); }},
      {"no session type", [] { return sound_manager_set_session_type(4); }},
      {"no call", [] { return sound_manager_call_session_create(0, &session); }},
      {"no call mode", [] { return sound_manager_call_session_set_mode(session, 3); }},
      {"mode after the end", [] { return sound_manager_call_session_set_mode(destroyed, 1); }},
      {"read after the end", [] { return sound_manager_call_session_get_mode(destroyed, &value); }},
      {"maximum to null", [] { return sound_manager_get_max_volume(0, nullptr); }},
      {"level to null", [] { return sound_manager_get_volume(0, nullptr); }},
      {"mute-all to null", [] { return sound_manager_get_muteall(nullptr); }},
      {"option to null", [] { return sound_manager_get_media_session_option(&value, nullptr); }},
      {"call to null", [] { return sound_manager_call_session_create(1, nullptr); }},
      {"mode to null", [] { return sound_manager_call_session_get_mode(session, nullptr); }},
      {"no callback", [] { return sound_manager_set_volume_changed_cb(nullptr, &value); }},
  };
  Program program;
  EXPECT_EQ(sound_manager_call_session_create(1, &destroyed), 0);
  EXPECT_EQ(sound_manager_call_session_create(1, &session), 0);
  EXPECT_EQ(sound_manager_call_session_destroy(destroyed), 0);
  for (const auto& [name, call] : rows) {
    value = 77;
    EXPECT_EQ(call(), SOUND_MANAGER_ERROR_INVALID_PARAMETER) << name;
    EXPECT_EQ(value, 77) << name;
  }
  EXPECT_EQ(LevelOf(4), 7);
  EXPECT_THAT(Simulated::GetCallSessionModes(), ElementsAre(0));
  EXPECT_EQ(sound_manager_call_session_destroy(session), 0);
  Simulated::WaitUntilDelivered();
  EXPECT_THAT(program.heard, IsEmpty());
}

TEST_F(Reports, TellEveryChangeOnceInOrderOnOneThreadOfTheDevicesOwn) {
  Program program;
  sound_manager_set_volume(4, 9);
  sound_manager_set_volume(4, 9);
  sound_manager_set_volume(0, LevelOf(0));
  sound_manager_set_muteall(false);
  sound_manager_set_muteall(true);
  sound_manager_set_muteall(true);
  Simulated::ReportVolume(5, 2);
  Simulated::ReportVolume(6, 1);
  Simulated::ReportMuteAll(false);
  Simulated::Interrupt(-7);
  EXPECT_TRUE(Simulated::SetMaxVolume(4, 8));
  EXPECT_TRUE(Simulated::SetMaxVolume(5, 30));
  EXPECT_EQ(sound_manager_set_volume(5, 30), 0);
  Simulated::WaitUntilDelivered();
  EXPECT_THAT(program.heard,
              ElementsAre("4=9", "muted", "5=2", "6=1", "unmuted", "code -7", "4=8", "5=30"));
  EXPECT_THAT(program.threads, testing::Each(program.threads[0]));
  EXPECT_NE(program.threads[0], std::this_thread::get_id());
}

TEST_F(Reports, FromSeveralSourcesComeOneAfterTheOtherAndAllOfThem) {
  constexpr int kReports = 2000;
  int running = 0;  // plain, so that a race shows
  Program program([&] {
    EXPECT_EQ(++running, 1);
    --running;
  });
  const auto report = [] {
    for (int n = 0; n < kReports; ++n) Simulated::ReportVolume(4, n % 10);
  };
  std::thread source(report);
  report();
  source.join();
  Simulated::WaitUntilDelivered();
  EXPECT_EQ(program.heard.size(), std::size_t{2 * kReports});
}

TEST_F(UnsettingACallback, WaitsForItsCallAndDropsWhatIsOnTheWayForItAlone) {
  Gate gate;
  bool finished = false;
  Program program([&] {
    if (finished) return;
    gate.Pass();
    for (int i = 0; i < 1000; ++i) std::this_thread::yield();  // time for who doesn't wait
    finished = true;
  });
  Simulated::ReportVolume(4, 1);
  gate.AwaitVisitor();
  Simulated::ReportVolume(4, 2);
  Simulated::ReportMuteAll(true);
  sound_manager_unset_session_interrupted_cb();  // has no call to wait for
  std::thread opener([&] { gate.Open(); });
  EXPECT_EQ(sound_manager_unset_volume_changed_cb(), 0);
  EXPECT_TRUE(finished);
  opener.join();
  EXPECT_EQ(sound_manager_unset_volume_changed_cb(), 0);
  Simulated::Interrupt(1);
  Simulated::ReportVolume(4, 3);
  Simulated::WaitUntilDelivered();
  EXPECT_THAT(program.heard, ElementsAre("4=1", "muted"));
}

TEST_F(UnsettingACallback, InsideItDoesNotWaitAndNothingMoreComes) {
  Gate gate;
  Program program([&] {
    gate.Pass();
    Simulated::WaitUntilDelivered();  // not for this call
    sound_manager_unset_volume_changed_cb();
  });
  Simulated::ReportVolume(4, 1);
  Simulated::ReportVolume(4, 2);
  gate.Open();
  Simulated::WaitUntilDelivered();
  EXPECT_THAT(program.heard, ElementsAre("4=1"));
}

TEST_F(UnsettingACallback, WhileReportsPourInEndsItsCalls) {
  std::atomic<bool> over{false};
  std::thread source([&] {
    while (!over) Simulated::ReportVolume(4, 1);
  });
  for (int i = 0; i < 300; ++i) Program program;
  over = true;
  source.join();
}

// What follows is the end of a process, in one of its own each.

void ReportMany() {
  for (int i = 0; i < 1000; ++i) Simulated::ReportVolume(4, i);
}

void SetCallback(sound_manager_volume_changed_cb callback) {
  EXPECT_EQ(sound_manager_set_volume_changed_cb(callback, nullptr), 0);
  std::atexit([] { sound_manager_unset_volume_changed_cb(); });
}

void ExitWithACallbackThatStaysSet() {
  std::atexit(Simulated::WaitUntilDelivered);
  sound_manager_set_volume_changed_cb([](int, int, void*) {}, nullptr);
  ReportMany();
}

void ExitInsideACallback() {
  SetCallback([](int, int, void*) { std::exit(0); });
  ReportMany();
  for (;;) pause();
}

void ExitWhileAnotherThreadReports() {
  SetCallback([](int, int, void*) {});
  static auto& gate = *new Gate;  // outlives the thread that opens it
  std::thread([] {
    Simulated::ReportVolume(4, 0);
    gate.Open();
    for (;;) Simulated::ReportVolume(4, 1);
  }).detach();
  gate.Pass();
}

TEST(ProcessDeathTest, EndsCleanlyWhateverTheSoundManagerIsDoing) {
  const std::pair<const char*, void (*)()> kEnds[] = {
      {"reports on the way",
       [] {
         SetCallback([](int, int, void*) {});
         ReportMany();
       }},
      {"a callback that stays set", ExitWithACallbackThatStaysSet},
      {"inside a callback", ExitInsideACallback},
      {"while another thread reports", ExitWhileAnotherThreadReports},
      {"without threads at first",
       [] {
         const auto set = [] {
           return sound_manager_set_volume_changed_cb([](int, int, void*) {}, nullptr);
         };
         EXPECT_EQ(WithoutThreads(set), SOUND_MANAGER_ERROR_OUT_OF_MEMORY);
         EXPECT_EQ(set(), 0);
       }},
  };
  for (const auto& [name, run] : kEnds) {
    SCOPED_TRACE(name);
    InOwnProcess(run);
  }
}

}  // namespace
