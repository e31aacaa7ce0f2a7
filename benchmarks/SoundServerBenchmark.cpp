// Compares the library on a sound server with the same libpulse calls made directly, counts who
// wakes up while nothing happens, and fails when a figure is above its limit. Uses a server of its
// own.

#include "desktop/SoundServer.h"

#include <Zelkora/Media/AudioSessionManager.h>
#include <Zelkora/Media/AudioVolumeManager.h>
#include <Zelkora/Media/IAudioSessionEventListener.h>
#include <Zelkora/Media/IAudioVolumeEventListener.h>
#include <Zelkora/Media/VoipAudioSessionManager.h>
#include <pulse/ext-stream-restore.h>
#include <pulse/pulseaudio.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <condition_variable>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <exception>
#include <filesystem>
#include <fstream>
#include <functional>
#include <map>
#include <mutex>
#include <random>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

namespace {

using Zelkora::Media::AudioVolumeManager;
using Clock = std::chrono::steady_clock;

constexpr int kProcesses = 300;  // of each side
constexpr int kRounds = 20;      // in each of them
constexpr int kMax = 15;
constexpr const char* kEntries[] = {"sink-input-by-media-role:music",
                                    "sink-input-by-media-role:video",
                                    "sink-input-by-media-role:game"};

void Require(bool condition, const char* what) {
  if (!condition) throw std::runtime_error(what);
}

pa_volume_t ToVolume(int level) { return static_cast<pa_volume_t>((level * 65536 + 7) / kMax); }

/// A program's own use of libpulse: a threaded main loop, and a wait for each answer. It asks the
/// server what the device asks it.
class Direct {
 public:
  Direct() : loop_(pa_threaded_mainloop_new()) {
    pa_channel_map_init_stereo(&map_);
    context_ = pa_context_new(pa_threaded_mainloop_get_api(loop_), "direct");
    pa_context_set_state_callback(
        context_, [](pa_context*, void* self) { Wake(self); }, this);
    pa_threaded_mainloop_start(loop_);
    Locked([&] {
      pa_context_connect(context_, nullptr, PA_CONTEXT_NOAUTOSPAWN, nullptr);
      while (pa_context_get_state(context_) != PA_CONTEXT_READY) pa_threaded_mainloop_wait(loop_);
    });
  }

  ~Direct() {
    Locked([&] {
      pa_context_set_state_callback(context_, nullptr, nullptr);
      pa_context_disconnect(context_);
      pa_context_unref(context_);
    });
    pa_threaded_mainloop_stop(loop_);
    pa_threaded_mainloop_free(loop_);
  }

  Direct(const Direct&) = delete;
  Direct& operator=(const Direct&) = delete;

  /// As a getter does, whose picture is up to date behind any answer.
  void AskForServer() {
    Locked([&] { Await(pa_context_get_server_info(context_, OnServer, this)); });
  }

  /// Of media, with its one stream.
  void SetLevel(int stream, int level) {
    AskForServer();
    pa_cvolume volume;
    pa_cvolume_set(&volume, 2, ToVolume(level));
    std::vector<pa_ext_stream_restore_info> entries;
    for (const char* name : kEntries) {
      entries.push_back({name, map_, volume, nullptr, 0});
    }
    Locked([&] {
      pa_operation* stored =
          pa_ext_stream_restore_write(context_, PA_UPDATE_REPLACE, entries.data(),
                                      unsigned(entries.size()), false, OnSuccess, this);
      Await(pa_context_set_sink_input_volume(context_, static_cast<std::uint32_t>(stream), &volume,
                                             OnSuccess, this));
      Await(stored);
    });
  }

  void SetStreamLevel(int stream, int level) {
    pa_cvolume volume;
    pa_cvolume_set(&volume, 2, ToVolume(level));
    Locked([&] {
      Await(pa_context_set_sink_input_volume(context_, static_cast<std::uint32_t>(stream), &volume,
                                             OnSuccess, this));
    });
  }

  /// Has \p changed called on the loop's thread for each change of a stream, after reading it.
  void Watch(std::function<void(int)> changed) {
    changed_ = std::move(changed);
    Locked([&] {
      pa_context_set_subscribe_callback(context_, OnEvent, this);
      Await(pa_context_subscribe(context_, PA_SUBSCRIPTION_MASK_SINK_INPUT, OnSuccess, this));
    });
  }

 private:
  template <typename Operation>
  void Locked(Operation operation) {
    pa_threaded_mainloop_lock(loop_);
    operation();
    pa_threaded_mainloop_unlock(loop_);
  }

  static void Wake(void* self) {
    pa_threaded_mainloop_signal(static_cast<Direct*>(self)->loop_, false);
  }
  static void OnSuccess(pa_context*, int, void* self) { Wake(self); }

  void Await(pa_operation* operation) {
    while (pa_operation_get_state(operation) == PA_OPERATION_RUNNING) {
      pa_threaded_mainloop_wait(loop_);
    }
    pa_operation_unref(operation);
  }

  static void OnServer(pa_context*, const pa_server_info*, void* self) { Wake(self); }

  static void OnEvent(pa_context* context, pa_subscription_event_type_t, std::uint32_t index,
                      void* self) {
    pa_operation_unref(pa_context_get_sink_input_info(context, index, OnStream, self));
  }

  static void OnStream(pa_context*, const pa_sink_input_info* info, int, void* self) {
    if (info == nullptr) return;
    static_cast<Direct*>(self)->changed_(
        static_cast<int>((pa_cvolume_max(&info->volume) * kMax + 32768) / 65536));
  }

  pa_threaded_mainloop* loop_;
  pa_context* context_;
  pa_channel_map map_;
  std::function<void(int)> changed_;
};

double Microseconds(Clock::duration time) {
  return std::chrono::duration<double, std::micro>(time).count();
}

template <typename Call>
double Measure(Call call) {
  const auto begin = Clock::now();
  call();
  return Microseconds(Clock::now() - begin);
}

double Median(std::vector<double> values) {
  const auto middle = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2);
  std::nth_element(values.begin(), middle, values.end());
  return *middle;
}

/// One listener's wait for the level of a change that is being made.
class Waiter {
 public:
  void Expect(int level) {
    std::lock_guard lock(mutex_);
    expected_ = level;
    hasArrived_ = false;
  }

  void Arrive(int level) {
    const auto now = Clock::now();
    std::lock_guard lock(mutex_);
    if (level != expected_ || hasArrived_) return;
    arrival_ = now;
    hasArrived_ = true;
    arrived_.notify_one();
  }

  Clock::time_point Await() {
    std::unique_lock lock(mutex_);
    const bool came = arrived_.wait_for(lock, std::chrono::seconds(5), [&] { return hasArrived_; });
    Require(came, "a change isn't reported");
    return arrival_;
  }

 private:
  std::mutex mutex_;
  std::condition_variable arrived_;
  int expected_ = -1;
  bool hasArrived_ = false;
  Clock::time_point arrival_;
};

class LibraryListener : public Zelkora::Media::IAudioVolumeEventListener {
 public:
  explicit LibraryListener(Waiter& waiter) : waiter_(waiter) {}
  void OnMediaVolumeChanged(int level) override { waiter_.Arrive(level); }

 private:
  Waiter& waiter_;
};

// Each of these runs in a process of its own, so that no side makes work for another. It prints
// what was measured and the time.

void Print(const std::string& name, double time) { std::printf("%s %f\n", name.c_str(), time); }

/// Sets and gets in any order, each when what the one before it has left to do is done: a report to
/// the program, and the reading of what has changed, which a call straight afterwards waits for.
template <typename Set, typename Get>
void PrintCalls(const std::string& side, Set set, Get get) {
  std::mt19937 random(std::random_device{}());
  for (int i = 0; i < 2 * kRounds; ++i) {
    std::this_thread::sleep_for(std::chrono::milliseconds(1));
    if (random() % 2 == 0) {
      const int level = static_cast<int>(random() % kMax);
      Print(side + "-set", Measure([&] { set(level); }));
    } else {
      Print(side + "-get", Measure(get));
    }
  }
}

void PrintLibraryCalls(int) {
  AudioVolumeManager* volume = AudioVolumeManager::GetInstance();
  Require(volume != nullptr, "no volume manager");
  PrintCalls(
      "library", [&](int level) { volume->SetMediaVolumeLevel(level); },
      [&] { volume->GetCurrentMediaVolumeLevel(); });
}

void PrintDirectCalls(int stream) {
  Direct direct;
  PrintCalls(
      "direct", [&](int level) { direct.SetLevel(stream, level); }, [&] { direct.AskForServer(); });
}

/// From a change by another client until the listener has the level.
void PrintChanges(const char* name, int stream, Waiter& waiter) {
  Direct other;
  waiter.Expect(kMax);  // which isn't the level yet, whatever was measured before
  other.SetStreamLevel(stream, kMax);
  waiter.Await();
  for (int i = 0; i < kRounds; ++i) {
    const int level = 1 + i % 2;
    waiter.Expect(level);
    const auto begin = Clock::now();
    other.SetStreamLevel(stream, level);
    Print(name, Microseconds(waiter.Await() - begin));
  }
}

void PrintLibraryChanges(int stream) {
  static Waiter waiter;
  static LibraryListener listener(waiter);
  AudioVolumeManager* volume = AudioVolumeManager::GetInstance();
  Require(volume != nullptr, "no volume manager");
  Require(volume->AddAudioVolumeEventListener(listener) == E_SUCCESS, "no listener");
  PrintChanges("library-change", stream, waiter);
}

void PrintRawChanges(int stream) {
  static Waiter waiter;
  static Direct raw;
  raw.Watch([](int level) { waiter.Arrive(level); });
  PrintChanges("raw-change", stream, waiter);
}

double GetProcessorTime() {
  timespec time;
  clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &time);
  return static_cast<double>(time.tv_sec) * 1e6 + static_cast<double>(time.tv_nsec) / 1e3;
}

/// How often the threads of a process have gone to sleep, but for the one that counts.
long CountSleeps(pid_t process) {
  long sum = 0;
  const std::filesystem::path threads = "/proc/" + std::to_string(process) + "/task";
  for (const auto& thread : std::filesystem::directory_iterator(threads)) {
    if (thread.path().filename() == std::to_string(gettid())) continue;
    std::ifstream status(thread.path() / "status");
    for (std::string word; status >> word;) {
      if (word != "voluntary_ctxt_switches:") continue;
      status >> word;
      sum += std::stol(word);
    }
  }
  return sum;
}

/// Says that it is ready, waits for the end of its input, and prints what that took.
void PrintWhatWaitingTakes() {
  std::this_thread::sleep_for(std::chrono::milliseconds(300));
  std::puts("ready");
  std::fflush(stdout);
  const double time = GetProcessorTime();
  const long sleeps = CountSleeps(getpid());
  while (std::getchar() != EOF) {
  }
  Print("processor", GetProcessorTime() - time);
  Print("sleeps", static_cast<double>(CountSleeps(getpid()) - sleeps));
}

/// All three managers, as a program has them that listens.
void WaitWithTheLibrary(int) {
  static Waiter waiter;
  static LibraryListener volumeListener(waiter);
  static struct : Zelkora::Media::IAudioSessionEventListener {
    void OnAudioSessionInterruptStarted() override {}
    void OnAudioSessionInterruptFinished() override {}
    void OnAudioSessionDisrupted() override {}
  } sessionListener;
  AudioVolumeManager* volume = AudioVolumeManager::GetInstance();
  auto* session = Zelkora::Media::AudioSessionManager::GetInstance();
  Require(volume != nullptr && session != nullptr, "no manager");
  Require(Zelkora::Media::VoipAudioSessionManager::GetInstance() != nullptr, "no call manager");
  Require(volume->AddAudioVolumeEventListener(volumeListener) == E_SUCCESS, "no listener");
  Require(session->SetAudioSessionEventListener(&sessionListener) == E_SUCCESS, "no listener");
  PrintWhatWaitingTakes();
}

void WaitAsASubscriber(int) {
  static Direct raw;
  raw.Watch([](int) {});
  PrintWhatWaitingTakes();
}

void WaitInACall(int) {
  auto* call = Zelkora::Media::VoipAudioSessionManager::GetInstance();
  Require(call != nullptr && call->EnterCallSession() == E_SUCCESS, "no call");
  PrintWhatWaitingTakes();
}

constexpr std::pair<const char*, void (*)(int)> kSides[] = {
    {"library-waits", WaitWithTheLibrary}, {"subscriber-waits", WaitAsASubscriber},
    {"call-waits", WaitInACall},           {"library-calls", PrintLibraryCalls},
    {"direct-calls", PrintDirectCalls},    {"library-changes", PrintLibraryChanges},
    {"raw-changes", PrintRawChanges},
};

using Samples = std::map<std::string, std::vector<double>>;

void MeasureSide(const char* side, int stream, Samples& samples) {
  Program program({"/proc/self/exe", side, std::to_string(stream)});
  for (std::string line = program.ReadLine(); !line.empty(); line = program.ReadLine()) {
    const std::size_t blank = line.find(' ');
    samples[line.substr(0, blank)].push_back(std::stod(line.substr(blank)));
  }
  Require(program.Finish() == 0, "a measuring process fails");
}

Samples MeasureAll(int stream) {
  Samples samples;
  std::mt19937 random(1);
  std::vector<const char*> sides;
  for (const char* side : {"library-calls", "direct-calls", "library-changes", "raw-changes"}) {
    sides.insert(sides.end(), kProcesses, side);
  }
  std::shuffle(sides.begin(), sides.end(), random);
  for (const char* side : sides) MeasureSide(side, stream, samples);
  return samples;
}

bool IsWithin(const std::string& what, double figure, double limit) {
  const bool holds = figure <= limit;
  std::printf("%s %.2f, limit %.2f: %s\n", what.c_str(), figure, limit,
              holds ? "holds" : "EXCEEDED");
  return holds;
}

/// \return whether the ratio of the medians is at most \p limit
bool Compare(const Samples& samples, const char* library, const char* other, double limit) {
  const double mine = Median(samples.at(library));
  const double theirs = Median(samples.at(other));
  std::printf("%s %.1f us, %s %.1f us: ", library, mine, other, theirs);
  return IsWithin("ratio", mine / theirs, limit);
}

/// \return what it takes a process to wait while \p meanwhile happens: "processor" and "sleeps"
template <typename Meanwhile>
std::map<std::string, double> MeasureWaiting(const char* side, Meanwhile meanwhile) {
  Program program({"/proc/self/exe", side, "0"});
  Require(program.ReadLine() == "ready", "a waiting process fails");
  meanwhile();
  Require(program.Finish() == 0, "a waiting process fails");
  std::map<std::string, double> figures;
  for (int i = 0; i < 2; ++i) {
    const std::string line = program.ReadLine();
    const std::size_t blank = line.find(' ');
    figures[line.substr(0, blank)] = std::stod(line.substr(blank));
  }
  return figures;
}

/// Processor time that changes from outside take a program that listens, against a subscriber.
bool CompareLoad(int stream, int changesASecond) {
  constexpr double kLimit = 2.5;
  Direct other;
  const auto change = [&] {
    for (int i = 0; i < 3 * changesASecond; ++i) {
      other.SetStreamLevel(stream, 1 + i % 2);
      std::this_thread::sleep_for(std::chrono::microseconds(1000000 / changesASecond));
    }
  };
  std::vector<double> library;
  std::vector<double> subscriber;
  for (int i = 0; i < 3; ++i) {
    library.push_back(MeasureWaiting("library-waits", change)["processor"]);
    subscriber.push_back(MeasureWaiting("subscriber-waits", change)["processor"]);
  }
  return IsWithin("processor time at " + std::to_string(changesASecond) +
                      " changes a second, against a subscriber:",
                  Median(library) / Median(subscriber), kLimit);
}

pid_t FindServer() {
  std::ifstream children("/proc/self/task/" + std::to_string(getpid()) + "/children");
  for (pid_t child = 0; children >> child;) {
    std::string name;
    std::ifstream("/proc/" + std::to_string(child) + "/comm") >> name;
    if (name == "pulseaudio") return child;
  }
  throw std::runtime_error("the sound server isn't found");
}

bool CountWakeUps() {
  static constexpr int kSeconds = 20;
  const auto wait = [] { std::this_thread::sleep_for(std::chrono::seconds(kSeconds)); };
  const double idle = MeasureWaiting("library-waits", wait)["sleeps"];
  const pid_t server = FindServer();
  long wakeUps = 0;
  MeasureWaiting("call-waits", [&] {
    const long before = CountSleeps(server);
    wait();
    wakeUps = CountSleeps(server) - before;
  });
  const bool isQuiet = IsWithin("wake-ups in 20 s with all managers listening:", idle, 0);
  return IsWithin("wake-ups of the server a second in an open call:",
                  static_cast<double>(wakeUps) / kSeconds, 12) &&
         isQuiet;
}

int RunAll() {
  SoundServer server;
  server.Start();
  bool holds = CountWakeUps();
  const Player player({"media.role=music"});
  const int stream = player.GetIndex();
  Direct().SetStreamLevel(stream, 5);  // so that a level is stored
  for (const int rate : {20, 100}) holds = CompareLoad(stream, rate) && holds;
  const Samples samples = MeasureAll(stream);
  holds = Compare(samples, "library-set", "direct-set", 1.30) && holds;
  holds = Compare(samples, "library-get", "direct-get", 1.10) && holds;
  return Compare(samples, "library-change", "raw-change", 1.35) && holds ? 0 : 1;
}

int Run(int count, char** arguments) {
  const std::string first = count > 1 ? arguments[1] : "";
  for (const auto& [side, print] : kSides) {
    if (first == side) return print(std::stoi(arguments[2])), 0;
  }
  return RunAll();
}

}  // namespace

int main(int count, char** arguments) try {
  return Run(count, arguments);
} catch (const std::exception& exception) {
  std::fprintf(stderr, "%s\n", exception.what());
  return 2;
}
