#include "support/Allocations.h"
#include "support/Gate.h"
#include "support/Managers.h"

#include <climits>
#include <deque>
#include <optional>
#include <thread>

namespace Zelkora::Media {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

/// Writes down everything that it hears.
class Listener : public IAudioVolumeEventListener {
 public:
  void OnSystemVolumeChanged(int level) override { Write("System", level); }
  void OnNotificationVolumeChanged(int level) override { Write("Notification", level); }
  void OnAlarmVolumeChanged(int level) override { Write("Alarm", level); }
  void OnRingtoneVolumeChanged(int level) override { Write("Ringtone", level); }
  void OnMediaVolumeChanged(int level) override { Write("Media", level); }
  void OnCallVolumeChanged(int level) override { Write("Call", level); }
  void OnMuteStatusChanged(AudioMuteStatus status) override { Write("MuteStatus", status); }
  void OnMuteAllStatusChanged(AudioMuteStatus status) override { Write("MuteAllStatus", status); }

  Lines Take() {
    Simulated::WaitUntilDelivered();
    return std::exchange(heard_, {});
  }

 private:
  void Write(const std::string& what, int value) {
    heard_.push_back(what + " " + std::to_string(value));
  }

  Lines heard_;
};

/// Listens while it lives.
template <typename Base>
class Added : public Base {
 public:
  Added() { EXPECT_EQ(Volume::GetInstance()->AddAudioVolumeEventListener(*this), E_SUCCESS); }
  ~Added() override {
    EXPECT_EQ(Volume::GetInstance()->RemoveAudioVolumeEventListener(*this), E_SUCCESS);
  }
};

using VolumeEvents = ManagerTest<Volume>;

TEST_F(VolumeEvents, OneChangeTravelsFromTheCallToTheListener) {
  Volume* volume = Volume::GetInstance();
  ASSERT_NE(volume, nullptr);
  Listener listener;
  ASSERT_EQ(volume->AddAudioVolumeEventListener(listener), E_SUCCESS);
  ASSERT_EQ(volume->SetMediaVolumeLevel(9), E_SUCCESS);
  EXPECT_THAT(listener.Take(), ElementsAre("Media 9"));
  EXPECT_EQ(volume->GetCurrentMediaVolumeLevel(), 9);
  ASSERT_EQ(volume->RemoveAudioVolumeEventListener(listener), E_SUCCESS);

  const std::string privilege = PrivilegeQuery<Volume>();
  EXPECT_THAT(Host::TakeCalls(), ElementsAre(privilege, kFeatureQuery,                     //
                                             privilege, "_Event::AddListener()",           //
                                             privilege, "sound_manager_set_volume(4, 9)",  //
                                             "_Event::FireAsync()",                        //
                                             privilege, "sound_manager_get_volume(4)",     //
                                             privilege, "_Event::RemoveListener()"));
  EXPECT_THAT(log.Take(), IsEmpty());
}

TEST_F(VolumeEvents, EachChangeReachesEachListenerThroughItsOwnOperation) {
  Added<Listener> first, second;
  for (const SoundCategory& category : kSoundCategories) {
    Simulated::ReportVolume(category.soundType, 20 + category.soundType);
  }
  Simulated::ReportMuteAll(true);
  Simulated::ReportMuteAll(false);
  const auto all =
      ElementsAre("System 20", "Notification 21", "Alarm 22", "Ringtone 23", "Media 24", "Call 25",
                  "MuteAllStatus 1", "MuteStatus 1", "MuteAllStatus 2", "MuteStatus 2");
  EXPECT_THAT(first.Take(), all);
  EXPECT_THAT(second.Take(), all);
}

/// What the device may keep of its own, such as room in its queues.
constexpr std::ptrdiff_t kKeptByTheDevice = 8;

TEST_F(VolumeEvents, UnknownSoundTypesAreLoggedAndFreed) {
  Added<Listener> listener;
  Host::RecordCalls(false);  // the record would allocate
  const std::ptrdiff_t before = CountLiveAllocations();
  for (const int type : {6, -1, INT_MAX, INT_MIN}) {
    for (int i = 0; i < kKeptByTheDevice; ++i) Simulated::ReportVolume(type, 3);
    EXPECT_THAT(listener.Take(), IsEmpty());
    const std::string line = SysPlain("sound type returned is wrong - " + std::to_string(type));
    EXPECT_EQ(log.Take(), Lines(kKeptByTheDevice, line));
  }
  EXPECT_LT(CountLiveAllocations(), before + kKeptByTheDevice);
}

TEST_F(VolumeEvents, NotificationThatGoesWrongIsLostAlone) {
  Added<Listener> listener;
  std::optional<FailingLibraryAllocation> failing;
  const std::pair<std::function<void()>, std::string> rows[] = {
      {[] { Simulated::ReportWithoutUserData(true); },
       SysNamed(E_OBJ_NOT_FOUND, " _AudioVolumeManagerImpl is null.")},
      {[] { Host::FailCall("_Event::FireAsync", E_OUT_OF_MEMORY); },
       SysPlain("[E_OUT_OF_MEMORY]Failed to perform FireAsync operation.")},
      {[&] { failing.emplace(); }, SysNamed(E_OUT_OF_MEMORY, " Memory allocation failed.")},
  };
  for (const auto& [arrange, line] : rows) {
    SCOPED_TRACE(line);
    Forget();
    arrange();
    Simulated::ReportVolume(4, 9);
    Simulated::ReportMuteAll(true);
    EXPECT_THAT(listener.Take(), IsEmpty());
    ExpectLeft(kUntouched, {line, line}, {});
    Simulated::Reset();
    failing.reset();
  }
  Simulated::ReportVolume(4, 9);
  EXPECT_THAT(listener.Take(), ElementsAre("Media 9"));
}

TEST_F(VolumeEvents, PlatformsAnswerToAListenerIsPassedOnUnloggedAndNotTheLastResult) {
  Listener listener;
  const auto add = [&] { return manager.AddAudioVolumeEventListener(listener); };
  const auto remove = [&] { return manager.RemoveAudioVolumeEventListener(listener); };
  EXPECT_EQ(remove(), E_OBJ_NOT_FOUND);
  EXPECT_EQ(add(), E_SUCCESS);
  EXPECT_EQ(add(), E_INVALID_OPERATION);
  Host::FailCall("_Event::RemoveListener", E_SYSTEM, 1);
  EXPECT_EQ(remove(), E_SYSTEM);
  EXPECT_EQ(remove(), E_SUCCESS);
  Host::FailCall("_Event::AddListener", kForeign, 1);
  EXPECT_EQ(add(), kForeign);
  Host::RecordCalls(false);  // the record would allocate
  FailingAllocation failing(1);
  EXPECT_EQ(add(), E_OUT_OF_MEMORY);
  EXPECT_EQ(GetLastResult(), kUntouched);
  EXPECT_THAT(log.Take(), IsEmpty());
  Simulated::ReportVolume(4, 9);
  EXPECT_THAT(listener.Take(), IsEmpty());
}

/// Stays in its call until the gate opens.
struct ParkedListener : IAudioVolumeEventListener {
  void OnMediaVolumeChanged(int) override {
    ++calls;
    gate.Pass();
    left = true;
  }

  Gate gate;
  int calls = 0;
  bool left = false;
};

TEST_F(VolumeEvents, RemovalWaitsForTheListenersCallAndAfterwardsItHearsNothing) {
  Added<ParkedListener> parked;
  Simulated::ReportVolume(4, 9);
  parked.gate.AwaitVisitor();
  Forget();
  std::thread remover([&] {
    EXPECT_EQ(manager.RemoveAudioVolumeEventListener(parked), E_SUCCESS);
    EXPECT_TRUE(parked.left);
  });
  Lines calls;
  while (std::count(calls.begin(), calls.end(), "_Event::RemoveListener()") == 0) {
    for (auto& call : Host::TakeCalls()) calls.push_back(call);
    std::this_thread::yield();
  }
  parked.gate.Open();
  remover.join();
  Simulated::ReportVolume(4, 8);
  Simulated::WaitUntilDelivered();
  EXPECT_EQ(parked.calls, 1);
  EXPECT_EQ(manager.AddAudioVolumeEventListener(parked), E_SUCCESS);
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

TEST_F(VolumeEvents, ListenersComeAndGoWhileTwoSourcesReport) {
  struct Restless : Counter {
    void OnAlarmVolumeChanged(int level) override {
      Volume& volume = *Volume::GetInstance();
      EXPECT_EQ(volume.RemoveAudioVolumeEventListener(*this), E_SUCCESS);
      EXPECT_EQ(volume.SetRingtoneVolumeLevel(level % 10), E_SUCCESS);
      EXPECT_EQ(volume.AddAudioVolumeEventListener(*this), E_SUCCESS);
    }
  };
  constexpr int kChanges = 2000;
  Host::RecordCalls(false);
  Added<Counter> steady;
  Added<Restless> restless;
  std::atomic<int> sources{2};
  const auto report = [&](int type) {
    for (int level = 0; level < kChanges; ++level) Simulated::ReportVolume(type, level);
    --sources;
  };
  std::thread media(report, 4), alarm(report, 2);
  const auto comeAndGo = [&] {
    while (sources > 0) Added<Listener> shortLived;
  };
  std::thread visitor(comeAndGo);
  comeAndGo();
  for (std::thread* thread : {&media, &alarm, &visitor}) thread->join();
  Simulated::WaitUntilDelivered();
  EXPECT_EQ(steady.count, kChanges);
  EXPECT_TRUE(steady.inOrder);
}

TEST_F(VolumeEvents, ListenersThatHaveGoneLeaveNothingBehind) {
  Host::RecordCalls(false);  // the record would grow
  const std::ptrdiff_t live = CountLiveAllocations();
  for (int i = 0; i < 100; ++i) Added<Listener> passing;
  EXPECT_LT(CountLiveAllocations(), live + kKeptByTheDevice);
}

/// \return how many changes are reported to that many listeners: `ZELKORA_TEST_SCALE` per cent of a
/// million. Unless the environment says it, 1 and 10 listeners get the whole million and 1,000 a
/// tenth of it, which is 100 million calls; in emulation and under sanitizers, which take some fifty
/// times as long, it is one per cent for all.
int Changes(int listeners) {
  const char* scale = std::getenv("ZELKORA_TEST_SCALE");
  const int usual = listeners < 1000 ? ZELKORA_TEST_SCALE : (ZELKORA_TEST_SCALE + 9) / 10;
  return std::max(10000 * (scale == nullptr ? usual : std::atoi(scale)), 2000);
}

class ManyChanges : public VolumeEvents, public testing::WithParamInterface<int> {};

TEST_P(ManyChanges, AreAllDeliveredInOrderInTheMemoryOfAFew) {
  constexpr int kBatch = 1000;
  Host::RecordCalls(false);  // the record would grow
  const int changes = Changes(GetParam());
  std::deque<Added<Counter>> listeners(static_cast<std::size_t>(GetParam()));
  std::ptrdiff_t live = 0;
  for (int level = 0; level < changes; ++level) {
    Simulated::ReportVolume(4, level);
    if ((level + 1) % kBatch != 0) continue;
    Simulated::WaitUntilDelivered();
    if (level + 1 == kBatch) live = CountLiveAllocations();
    ASSERT_LT(CountLiveAllocations(), live + kKeptByTheDevice);
  }
  for (const Counter& listener : listeners) {
    ASSERT_EQ(listener.count, changes);
    ASSERT_TRUE(listener.inOrder);
  }
}

INSTANTIATE_TEST_SUITE_P(ToListeners, ManyChanges, testing::Values(1, 10, 1000),
                         testing::PrintToStringParamName());

}  // namespace
}  // namespace Zelkora::Media
