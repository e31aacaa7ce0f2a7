// From the native callback to the listeners: the library's events against the queue that one would
// write by hand. Prints ratios of medians, both sides taking turns within one run.

#include <Host/Events.h>
#include <Zelkora/Media/AudioVolumeManager.h>
#include <Zelkora/Media/IAudioVolumeEventListener.h>
#include <sound_manager.h>

#include <algorithm>
#include <array>
#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstdio>
#include <cstdlib>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <new>
#include <thread>
#include <vector>

namespace {

using Clock = std::chrono::steady_clock;
using Zelkora::Media::AudioVolumeManager;
using Zelkora::Media::IAudioVolumeEventListener;

std::atomic<std::size_t> allocations{0};

sound_manager_volume_changed_cb volumeChanged = nullptr;
void* volumeChangedData = nullptr;

}  // namespace

// In place of the device's: so the callback is called as a device would, without a device between.
extern "C" int sound_manager_set_volume_changed_cb(sound_manager_volume_changed_cb callback,
                                                   void* user_data) {
  volumeChanged = callback;
  volumeChangedData = user_data;
  return 0;
}

void* operator new(std::size_t size) {
  allocations.fetch_add(1, std::memory_order_relaxed);
  if (void* memory = std::malloc(size)) return memory;
  throw std::bad_alloc();
}
void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
  allocations.fetch_add(1, std::memory_order_relaxed);
  return std::malloc(size);
}
void operator delete(void* memory) noexcept { std::free(memory); }
void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }

namespace {

/// Counts what it hears; the one that is waited for also takes the time.
struct Listener : IAudioVolumeEventListener {
  void OnMediaVolumeChanged(int level) override {
    last = level;
    heard.store(heard.load(std::memory_order_relaxed) + 1, std::memory_order_release);
  }

  void WaitFor(std::size_t count) const {
    while (heard.load(std::memory_order_acquire) < count) std::this_thread::yield();
  }

  std::atomic<std::size_t> heard{0};
  int last = 0;
};

using Listeners = std::vector<std::unique_ptr<Listener>>;

/// One way from the callback to the listeners.
struct Side {
  virtual ~Side() = default;
  virtual void Add(IAudioVolumeEventListener& listener) = 0;
  virtual void Remove(IAudioVolumeEventListener& listener) = 0;
  virtual void Report(int level) = 0;
};

struct Library : Side {
  void Add(IAudioVolumeEventListener& listener) override {
    manager->AddAudioVolumeEventListener(listener);
  }
  void Remove(IAudioVolumeEventListener& listener) override {
    manager->RemoveAudioVolumeEventListener(listener);
  }
  void Report(int level) override { volumeChanged(4, level, volumeChangedData); }

  AudioVolumeManager* manager = AudioVolumeManager::GetInstance();
};

/// Mutex, condition variable, deque of std::function: a call is queued for each listener.
class HandWritten : public Side {
 public:
  ~HandWritten() override {
    Post(nullptr);
    thread_.join();
  }

  void Add(IAudioVolumeEventListener& listener) override {
    std::lock_guard lock(mutex_);
    listeners_.push_back(&listener);
  }

  void Remove(IAudioVolumeEventListener& listener) override {
    std::lock_guard lock(mutex_);
    listeners_.erase(std::find(listeners_.begin(), listeners_.end(), &listener));
  }

  void Report(int level) override {
    std::lock_guard lock(mutex_);
    for (IAudioVolumeEventListener* listener : listeners_) {
      queue_.emplace_back([listener, level] { listener->OnMediaVolumeChanged(level); });
    }
    changed_.notify_one();
  }

 private:
  void Post(std::function<void()> call) {
    std::lock_guard lock(mutex_);
    queue_.push_back(std::move(call));
    changed_.notify_one();
  }

  void Run() {
    for (;;) {
      std::unique_lock lock(mutex_);
      changed_.wait(lock, [this] { return !queue_.empty(); });
      const std::function<void()> call = std::move(queue_.front());
      queue_.pop_front();
      lock.unlock();
      if (!call) return;
      call();
    }
  }

  std::mutex mutex_;
  std::condition_variable changed_;
  std::vector<IAudioVolumeEventListener*> listeners_;
  std::deque<std::function<void()>> queue_;
  std::thread thread_{[this] { Run(); }};
};

double Seconds(Clock::duration duration) { return std::chrono::duration<double>(duration).count(); }

/// Time from the first report until the last listener has heard all.
double Throughput(Side& side, const Listeners& listeners, std::size_t sources,
                  std::size_t reports) {
  const std::size_t heard = listeners.back()->heard;
  const auto begin = Clock::now();
  std::vector<std::thread> threads;
  for (std::size_t source = 0; source < sources; ++source) {
    threads.emplace_back([&] {
      for (std::size_t i = 0; i < reports / sources; ++i) side.Report(static_cast<int>(i));
    });
  }
  for (std::thread& thread : threads) thread.join();
  listeners.back()->WaitFor(heard + reports / sources * sources);
  return Seconds(Clock::now() - begin);
}

/// Time from one report until its listener has heard it, nothing else being under way.
double Latency(Side& side, const Listeners& listeners) {
  const std::size_t heard = listeners.back()->heard;
  const auto begin = Clock::now();
  side.Report(1);
  listeners.back()->WaitFor(heard + 1);
  return Seconds(Clock::now() - begin);
}

double Quantile(std::vector<double> values, double part) {
  std::sort(values.begin(), values.end());
  return values[static_cast<std::size_t>(part * static_cast<double>(values.size() - 1))];
}

bool Show(const char* what, double library, double handWritten, double limit) {
  const double ratio = library / handWritten;
  std::printf("%-44s %10.2f us %10.2f us   ratio %.2f (limit %.2f)\n", what, library * 1e6,
              handWritten * 1e6, ratio, limit);
  return ratio <= limit;
}

struct Setting {
  std::size_t listeners, sources, reports;
  double limit;
};

/// Runs \p measure on both sides by turns. \return the values of each
template <typename Measure>
std::array<std::vector<double>, 2> TakeTurns(Side* const (&sides)[2], std::size_t turns,
                                             Measure measure) {
  std::array<std::vector<double>, 2> values;
  for (std::size_t turn = 0; turn < turns; ++turn) {
    const std::size_t first = turn % 2;
    for (std::size_t i : {first, 1 - first}) values[i].push_back(measure(*sides[i], i));
  }
  return values;
}

bool MeasureSetting(Side* const (&sides)[2], const Setting& setting) {
  Listeners listeners[2];
  for (std::size_t side = 0; side < 2; ++side) {
    for (std::size_t i = 0; i < setting.listeners; ++i) {
      listeners[side].push_back(std::make_unique<Listener>());
      sides[side]->Add(*listeners[side].back());
    }
  }
  char what[64];
  const auto n = static_cast<double>(setting.reports);
  const auto time = TakeTurns(sides, 11, [&](Side& side, std::size_t i) {
    return Throughput(side, listeners[i], setting.sources, setting.reports) / n;
  });
  std::snprintf(what, sizeof what, "an event, %zu listeners, %zu sources", setting.listeners,
                setting.sources);
  bool good = Show(what, Quantile(time[0], 0.5), Quantile(time[1], 0.5), setting.limit);
  if (setting.listeners == 1 && setting.sources == 1) {
    const auto latency = TakeTurns(
        sides, 4000, [&](Side& side, std::size_t i) { return Latency(side, listeners[i]); });
    for (const double part : {0.5, 0.99}) {
      std::snprintf(what, sizeof what, "latency, p%.0f", part * 100);
      good &= Show(what, Quantile(latency[0], part), Quantile(latency[1], part), 1.1);
    }
  }
  for (std::size_t side = 0; side < 2; ++side) {
    for (const auto& listener : listeners[side]) sides[side]->Remove(*listener);
  }
  return good;
}

bool CountAllocationsPerEvent(Library& library) {
  constexpr std::size_t kEvents = 1000;
  const std::size_t before = allocations;
  for (std::size_t i = 0; i < kEvents; ++i) library.Report(1);
  Host::WaitUntilDelivered();
  const double perEvent = static_cast<double>(allocations - before) / kEvents;
  std::printf("%-44s %10.2f (limit 1)\n", "allocations an event", perEvent);
  return perEvent <= 1;
}

}  // namespace

int main() {
  Library library;
  if (library.manager == nullptr || volumeChanged == nullptr) return 1;
  HandWritten handWritten;
  Side* const sides[] = {&library, &handWritten};

  std::printf("%-44s %13s %13s\n", "", "library", "by hand");
  bool good = true;
  for (const Setting& setting :
       {Setting{1, 1, 40000, 0.75}, Setting{1, 4, 40000, 0.75}, Setting{10, 1, 10000, 0.75},
        Setting{10, 4, 10000, 0.75}, Setting{1000, 1, 200, 1.05}, Setting{1000, 4, 200, 1.05}}) {
    good &= MeasureSetting(sides, setting);
  }
  good &= CountAllocationsPerEvent(library);
  return good ? 0 : 1;
}
