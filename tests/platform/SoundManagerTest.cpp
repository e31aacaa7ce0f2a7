// What the library relies on in the sound manager, shown by the simulated device, and its steering.

#include <Simulated/Device.h>
#include <sound_manager.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <pthread.h>
#include <unistd.h>

#include <cstdlib>
#include <functional>
#include <future>
#include <limits>
#include <map>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace {

using testing::ElementsAre;
using testing::IsEmpty;

constexpr int kRefused = SOUND_MANAGER_ERROR_INVALID_PARAMETER;

/// What the three callbacks are told while it lives.
class Program {
 public:
  Program() {
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
  std::function<void()> onReport;

 private:
  static void Hear(void* program, std::string report) {
    auto& self = *static_cast<Program*>(program);
    self.heard.push_back(std::move(report));
    self.threads.push_back(std::this_thread::get_id());
    if (self.onReport) self.onReport();
  }
};

class SoundManagerTest : public testing::Test {
 protected:
  SoundManagerTest() { Simulated::Reset(); }
  ~SoundManagerTest() override { Simulated::Reset(); }
};

using Volumes = SoundManagerTest;
using Session = SoundManagerTest;
using CallSessions = SoundManagerTest;
using SoundManagerFunctions = SoundManagerTest;
using Reports = SoundManagerTest;
using UnsettingACallback = SoundManagerTest;

int MaxOf(int type) {
  int max = -1;
  EXPECT_EQ(sound_manager_get_max_volume(type, &max), 0);
  return max;
}

int LevelOf(int type) {
  int level = -1;
  EXPECT_EQ(sound_manager_get_volume(type, &level), 0);
  return level;
}

TEST_F(Volumes, AreEachTypesOwnAndAnyLevelUpToTheMaximumIsKept) {
  std::map<int, int> levels;
  for (int type = 0; type <= 5; ++type) {
    EXPECT_GT(LevelOf(type), 0);
    EXPECT_LT(LevelOf(type), MaxOf(type));
    levels[type] = type % 2 == 0 ? 0 : MaxOf(type);
    EXPECT_EQ(sound_manager_set_volume(type, levels[type]), 0);
  }
  for (const auto& [type, level] : levels) EXPECT_EQ(LevelOf(type), level);
}

TEST_F(Volumes, OutsideTheRangeOrOfAnUnknownTypeAreRefusedAndChangeNothing) {
  Program program;
  int value = 77;
  for (const int type : {-1, 6}) {
    EXPECT_EQ(sound_manager_get_max_volume(type, &value), kRefused);
    EXPECT_EQ(sound_manager_get_volume(type, &value), kRefused);
    EXPECT_EQ(sound_manager_set_volume(type, 1), kRefused);
  }
  EXPECT_EQ(value, 77);
  const int before = LevelOf(4);
  for (const int level : {-1, MaxOf(4) + 1}) {
    EXPECT_EQ(sound_manager_set_volume(4, level), kRefused);
  }
  EXPECT_EQ(LevelOf(4), before);
  Simulated::WaitUntilDelivered();
  EXPECT_THAT(program.heard, IsEmpty());
}

TEST_F(Volumes, FollowAMaximumThatIsLowered) {
  Program program;
  EXPECT_TRUE(Simulated::SetMaxVolume(4, 2));
  EXPECT_TRUE(Simulated::SetMaxVolume(5, 30));
  EXPECT_FALSE(Simulated::SetMaxVolume(6, 30));
  EXPECT_FALSE(Simulated::SetMaxVolume(5, -1));
  EXPECT_EQ(LevelOf(4), 2);
  EXPECT_EQ(sound_manager_set_volume(4, 3), kRefused);
  EXPECT_EQ(sound_manager_set_volume(5, 30), 0);
  Simulated::WaitUntilDelivered();
  EXPECT_THAT(program.heard, ElementsAre("4=2", "5=30"));
}

TEST_F(Session, KeepsTypesAndOptionsAndRefusesUnknownTypes) {
  int type = -1, first = -1, second = -1;
  EXPECT_EQ(sound_manager_get_session_type(&type), 0);
  EXPECT_EQ(sound_manager_get_media_session_option(&first, &second), 0);
  EXPECT_THAT((std::vector{type, first, second}), ElementsAre(0, 0, 0));
  for (const int known : {1, 2, 3, 0, 3}) {
    EXPECT_EQ(sound_manager_set_session_type(known), 0);
    EXPECT_EQ(sound_manager_get_session_type(&type), 0);
    EXPECT_EQ(type, known);
  }
  for (const int unknown : {-1, 4}) {
    EXPECT_EQ(sound_manager_set_session_type(unknown), kRefused);
  }
  EXPECT_EQ(sound_manager_set_media_session_option(1, 7), 0);
  sound_manager_get_session_type(&type);
  sound_manager_get_media_session_option(&first, &second);
  EXPECT_THAT((std::vector{type, first, second}), ElementsAre(3, 1, 7));
}

TEST_F(CallSessions, AreKnownByTheirHandlesUntilTheyAreDestroyed) {
  sound_call_session_h a = nullptr, b = nullptr;
  EXPECT_EQ(sound_manager_call_session_create(0, &a), kRefused);
  EXPECT_EQ(sound_manager_call_session_create(2, &a), kRefused);
  EXPECT_EQ(a, nullptr);
  EXPECT_EQ(sound_manager_call_session_create(1, &a), 0);
  EXPECT_EQ(sound_manager_call_session_create(1, &b), 0);
  EXPECT_EQ(sound_manager_call_session_set_mode(b, 2), 0);
  for (const int mode : {-1, 3}) EXPECT_EQ(sound_manager_call_session_set_mode(b, mode), kRefused);
  int mode = -1;
  EXPECT_EQ(sound_manager_call_session_get_mode(b, &mode), 0);
  EXPECT_EQ(mode, 2);
  EXPECT_THAT(Simulated::GetCallSessionModes(), ElementsAre(0, 2));

  EXPECT_EQ(sound_manager_call_session_destroy(a), 0);
  for (const sound_call_session_h unknown : {a, sound_call_session_h{}}) {
    EXPECT_EQ(sound_manager_call_session_destroy(unknown), kRefused);
    EXPECT_EQ(sound_manager_call_session_set_mode(unknown, 1), kRefused);
    EXPECT_EQ(sound_manager_call_session_get_mode(unknown, &mode), kRefused);
  }
  EXPECT_EQ(sound_manager_call_session_destroy(b), 0);
  EXPECT_THAT(Simulated::GetCallSessionModes(), IsEmpty());
}

TEST_F(CallSessions, GoWrongAsAskedFor) {
  sound_call_session_h session = nullptr;
  Simulated::SetCallSessionFault(Simulated::CallSessionFault::kNoSession);
  EXPECT_EQ(sound_manager_call_session_create(1, &session), 0);
  EXPECT_EQ(session, nullptr);
  Simulated::SetCallSessionFault(Simulated::CallSessionFault::kSessionRemains);
  EXPECT_EQ(sound_manager_call_session_create(1, &session), SOUND_MANAGER_ERROR_INVALID_OPERATION);
  EXPECT_THAT(Simulated::GetCallSessionModes(), ElementsAre(0));
  EXPECT_EQ(sound_manager_call_session_destroy(session), 0);
}

TEST_F(SoundManagerFunctions, RefuseToWriteToNullAndToCallNull) {
  int value = 0;
  sound_call_session_h session = nullptr;
  sound_manager_call_session_create(1, &session);
  EXPECT_EQ(sound_manager_get_max_volume(0, nullptr), kRefused);
  EXPECT_EQ(sound_manager_get_volume(0, nullptr), kRefused);
  EXPECT_EQ(sound_manager_get_muteall(nullptr), kRefused);
  EXPECT_EQ(sound_manager_get_session_type(nullptr), kRefused);
  EXPECT_EQ(sound_manager_get_media_session_option(nullptr, &value), kRefused);
  EXPECT_EQ(sound_manager_get_media_session_option(&value, nullptr), kRefused);
  EXPECT_EQ(sound_manager_call_session_create(1, nullptr), kRefused);
  EXPECT_EQ(sound_manager_call_session_get_mode(session, nullptr), kRefused);
  EXPECT_EQ(sound_manager_set_volume_changed_cb(nullptr, &value), kRefused);
  EXPECT_EQ(sound_manager_set_muteall_changed_cb(nullptr, &value), kRefused);
  EXPECT_EQ(sound_manager_set_session_interrupted_cb(nullptr, &value), kRefused);
  EXPECT_THAT(Simulated::GetCallSessionModes(), ElementsAre(0));
  sound_manager_call_session_destroy(session);
}

TEST_F(SoundManagerFunctions, AreRecordedWithTheirValuesAndFailWhenMadeToDoingNothing) {
  static int number;
  static bool flag;
  static sound_call_session_h session;
  struct Case {
    std::string call;
    std::function<int()> run;
  };
  const std::vector<Case> cases = {
      {"get_max_volume(4)", [] { return sound_manager_get_max_volume(4, &number); }},
      {"set_volume(4, 9)", [] { return sound_manager_set_volume(4, 9); }},
      {"get_volume(4)", [] { return sound_manager_get_volume(4, &number); }},
      {"set_muteall(true)", [] { return sound_manager_set_muteall(true); }},
      {"get_muteall()", [] { return sound_manager_get_muteall(&flag); }},
      {"set_volume_changed_cb()",
       [] { return sound_manager_set_volume_changed_cb([](int, int, void*) {}, nullptr); }},
      {"unset_volume_changed_cb()", sound_manager_unset_volume_changed_cb},
      {"set_muteall_changed_cb()",
       [] { return sound_manager_set_muteall_changed_cb([](bool, void*) {}, nullptr); }},
      {"unset_muteall_changed_cb()", sound_manager_unset_muteall_changed_cb},
      {"set_session_type(2)", [] { return sound_manager_set_session_type(2); }},
      {"get_session_type()", [] { return sound_manager_get_session_type(&number); }},
      {"set_media_session_option(1, 0)",
       [] { return sound_manager_set_media_session_option(1, 0); }},
      {"get_media_session_option()",
       [] { return sound_manager_get_media_session_option(&number, &number); }},
      {"set_session_interrupted_cb()",
       [] { return sound_manager_set_session_interrupted_cb([](int, void*) {}, nullptr); }},
      {"unset_session_interrupted_cb()", sound_manager_unset_session_interrupted_cb},
      {"call_session_create(1)", [] { return sound_manager_call_session_create(1, &session); }},
      {"call_session_set_mode(1, 2)",
       [] { return sound_manager_call_session_set_mode(session, 2); }},
      {"call_session_get_mode(1)",
       [] { return sound_manager_call_session_get_mode(session, &number); }},
      {"call_session_destroy(1)", [] { return sound_manager_call_session_destroy(session); }},
  };
  Program program;
  Host::RecordCalls(true);
  for (const Case& test : cases) {
    SCOPED_TRACE(test.call);
    const std::string call = "sound_manager_" + test.call;
    number = 77;
    Host::FailCall(call.substr(0, call.find('(')).c_str(), -5, 1);
    EXPECT_EQ(test.run(), -5);
    EXPECT_EQ(number, 77);
    Simulated::WaitUntilDelivered();
    EXPECT_THAT(program.heard, IsEmpty());
    EXPECT_EQ(test.run(), 0);
    EXPECT_THAT(Host::TakeCalls(), ElementsAre(call, call));
    Simulated::WaitUntilDelivered();
    program.heard.clear();
  }
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
  Simulated::ReportVolume(-1, 1);
  Simulated::ReportMuteAll(false);
  Simulated::Interrupt(5);
  Simulated::Interrupt(-7);
  Simulated::WaitUntilDelivered();
  EXPECT_THAT(program.heard,
              ElementsAre("4=9", "muted", "5=2", "6=1", "-1=1", "unmuted", "code 5", "code -7"));
  EXPECT_THAT(program.threads, testing::Each(program.threads[0]));
  EXPECT_NE(program.threads[0], std::this_thread::get_id());
  bool muteall = true;
  EXPECT_EQ(sound_manager_get_muteall(&muteall), 0);
  EXPECT_FALSE(muteall);
  EXPECT_EQ(LevelOf(5), 2);
}

TEST_F(Reports, FromSeveralSourcesComeOneAfterTheOtherAndAllOfThem) {
  constexpr int kReports = 2000;
  Program program;
  int running = 0;  // plain, so that a race shows
  program.onReport = [&] {
    EXPECT_EQ(++running, 1);
    --running;
  };
  std::vector<std::thread> sources;
  for (int i = 0; i < 2; ++i) {
    sources.emplace_back([] {
      for (int n = 0; n < kReports; ++n) Simulated::ReportVolume(4, n % 10);
    });
  }
  for (std::thread& source : sources) source.join();
  Simulated::WaitUntilDelivered();
  EXPECT_EQ(program.heard.size(), std::size_t{2 * kReports});
}

TEST_F(Reports, CarryNullForTheUserDataWhenAskedFor) {
  static std::vector<void*> users;
  users.clear();
  int user = 0;
  sound_manager_set_volume_changed_cb([](int, int, void* data) { users.push_back(data); }, &user);
  sound_manager_set_muteall_changed_cb([](bool, void* data) { users.push_back(data); }, &user);
  sound_manager_set_session_interrupted_cb([](int, void* data) { users.push_back(data); }, &user);
  for (const bool without : {true, false}) {
    Simulated::ReportWithoutUserData(without);
    Simulated::ReportVolume(1, 1);
    Simulated::ReportMuteAll(true);
    Simulated::Interrupt(1);
  }
  Simulated::WaitUntilDelivered();
  EXPECT_THAT(users, ElementsAre(nullptr, nullptr, nullptr, &user, &user, &user));
  sound_manager_unset_volume_changed_cb();
  sound_manager_unset_muteall_changed_cb();
  sound_manager_unset_session_interrupted_cb();
}

/// Keeps a callback that passes waiting until it is opened.
class Gate {
 public:
  void Pass() {
    come_.set_value();
    open_.get_future().wait();
  }
  void AwaitVisitor() { come_.get_future().wait(); }
  void Open() { open_.set_value(); }

 private:
  std::promise<void> come_, open_;
};

TEST_F(UnsettingACallback, WaitsForItsCallAndDropsWhatIsOnTheWayForItAlone) {
  Gate gate;
  bool finished = false;
  Program program;
  program.onReport = [&] {
    if (program.heard.size() > 1) return;
    gate.Pass();
    for (int i = 0; i < 1000; ++i) std::this_thread::yield();
    finished = true;
  };
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
  Program program;
  std::promise<void> reported;
  program.onReport = [&] {
    reported.get_future().wait();
    Simulated::WaitUntilDelivered();
    sound_manager_unset_volume_changed_cb();
  };
  Simulated::ReportVolume(4, 1);
  Simulated::ReportVolume(4, 2);
  reported.set_value();
  Simulated::WaitUntilDelivered();
  EXPECT_THAT(program.heard, ElementsAre("4=1"));
}

TEST_F(UnsettingACallback, WhileReportsPourInEndsItsCalls) {
  std::promise<void> over;
  std::thread source([ended = over.get_future()] {
    while (ended.wait_for(std::chrono::seconds(0)) != std::future_status::ready) {
      Simulated::ReportVolume(4, 1);
    }
  });
  for (int i = 0; i < 300; ++i) Program program;
  over.set_value();
  source.join();
}

TEST(ResetOfTheDevice, PutsBackWhatWasSteeredAndDropsReportsButKeepsCallbacksAndCalls) {
  Simulated::Reset();
  Program program;
  Gate gate;
  program.onReport = [&] {
    if (program.heard.size() > 1) return;
    gate.Pass();
  };
  const int level = LevelOf(4), max = MaxOf(4);
  sound_call_session_h session = nullptr, another = nullptr;
  sound_manager_call_session_create(1, &session);
  Simulated::ReportMuteAll(true);
  gate.AwaitVisitor();
  Simulated::SetMaxVolume(4, 1);
  Simulated::SetCallSessionFault(Simulated::CallSessionFault::kNoSession);
  Simulated::ReportWithoutUserData(true);
  sound_manager_set_session_type(3);
  Simulated::Reset();
  gate.Open();

  bool muteall = true;
  int type = -1;
  sound_manager_get_muteall(&muteall);
  sound_manager_get_session_type(&type);
  EXPECT_FALSE(muteall);
  EXPECT_EQ(type, 0);
  EXPECT_EQ(LevelOf(4), level);
  EXPECT_EQ(MaxOf(4), max);
  Simulated::Interrupt(3);
  Simulated::WaitUntilDelivered();
  EXPECT_THAT(program.heard, ElementsAre("muted", "code 3"));
  EXPECT_EQ(sound_manager_call_session_create(1, &another), 0);
  EXPECT_EQ(sound_manager_call_session_destroy(another), 0);
  EXPECT_EQ(sound_manager_call_session_destroy(session), 0);
}

// How the process ends is what is tested here, in a child each.

void SetCallback(sound_manager_volume_changed_cb callback) {
  sound_manager_set_volume_changed_cb(callback, nullptr);
  std::atexit([] { sound_manager_unset_volume_changed_cb(); });
}

void ExitWithReportsOnTheWay() {
  SetCallback([](int, int, void*) {});
  for (int i = 0; i < 1000; ++i) Simulated::ReportVolume(4, i);
  std::exit(0);
}

void ExitWithACallbackThatStaysSet() {
  std::atexit(Simulated::WaitUntilDelivered);
  sound_manager_set_volume_changed_cb([](int, int, void*) {}, nullptr);
  for (int i = 0; i < 1000; ++i) Simulated::ReportVolume(4, i);
  std::exit(0);
}

void ExitInsideACallback() {
  SetCallback([](int, int, void*) { std::exit(0); });
  for (int i = 0; i < 10; ++i) Simulated::ReportVolume(4, i);
  for (;;) pause();
}

void ExitWhileAnotherThreadReports() {
  SetCallback([](int, int, void*) {});
  static auto& reported = *new std::promise<void>;  // outlives the thread that sets it
  std::thread([] {
    Simulated::ReportVolume(4, 0);
    reported.set_value();
    for (;;) Simulated::ReportVolume(4, 1);
  }).detach();
  reported.get_future().wait();
  std::exit(0);
}

void SetACallbackWithoutAndWithThreads() {
  pthread_attr_t normal, huge;
  pthread_getattr_default_np(&normal);
  pthread_getattr_default_np(&huge);
  pthread_attr_setstacksize(&huge, std::numeric_limits<std::size_t>::max() / 8 * 7);
  pthread_setattr_default_np(&huge);
  const auto set = [] {
    return sound_manager_set_volume_changed_cb([](int, int, void*) {}, nullptr);
  };
  const int withoutThreads = set();
  pthread_setattr_default_np(&normal);
  std::exit(withoutThreads == SOUND_MANAGER_ERROR_OUT_OF_MEMORY && set() == 0 ? 0 : 1);
}

TEST(ProcessDeathTest, EndsCleanlyWhateverTheSoundManagerIsDoing) {
  constexpr struct {
    const char* name;
    void (*run)();
  } kCases[] = {
      {"reports on the way", ExitWithReportsOnTheWay},
      {"a callback that stays set", ExitWithACallbackThatStaysSet},
      {"inside a callback", ExitInsideACallback},
      {"while another thread reports", ExitWhileAnotherThreadReports},
      {"without threads", SetACallbackWithoutAndWithThreads},
  };
  for (const auto& test : kCases) {
    SCOPED_TRACE(test.name);
    const auto run = [&] {
      alarm(120);  // a process that hangs is a failure, not a wait
      test.run();
    };
    EXPECT_EXIT(run(), testing::ExitedWithCode(0), "");
  }
}

}  // namespace
