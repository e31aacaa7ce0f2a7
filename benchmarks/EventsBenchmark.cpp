// What an event costs from the native callback to the listeners, against a queue that one would
// write by hand: one closure an event, and the same cast of the listener. Prints ratios of
// processor time, medians, both sides taking turns within one run. Where the threads run matters
// more than what they do, so that isn't left to the kernel.
//
// A burst on two cores has no limit: the queue by hand holds its lock for nearly all the time that
// reporting an event takes, so its listeners hear next to nothing before the last one is reported,
// and little moves between the cores.

#include <Host/Events.h>
#include <Zelkora/Media/AudioVolumeManager.h>
#include <Zelkora/Media/IAudioVolumeEventListener.h>
#include <sound_manager.h>

#include <sched.h>

#include <algorithm>
#include <atomic>
#include <condition_variable>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <deque>
#include <functional>
#include <future>
#include <memory>
#include <mutex>
#include <new>
#include <thread>
#include <vector>

namespace {

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

// Not inline, as GCC then warns of memory from one of these that another frees.
__attribute__((noinline)) void* operator new(std::size_t size) {
  allocations.fetch_add(1, std::memory_order_relaxed);
  if (void* memory = std::malloc(size)) return memory;
  throw std::bad_alloc();
}
__attribute__((noinline)) void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
  allocations.fetch_add(1, std::memory_order_relaxed);
  return std::malloc(size);
}
__attribute__((noinline)) void operator delete(void* memory) noexcept { std::free(memory); }
__attribute__((noinline)) void operator delete(void* memory, std::size_t) noexcept {
  std::free(memory);
}

namespace {

using Tizen::Base::Runtime::IEventListener;

/// Counts what it hears.
struct Listener : IAudioVolumeEventListener {
  void OnMediaVolumeChanged(int) override {
    if (--missing == 0) heardAll.set_value();
  }

  std::size_t missing = 0;
  std::promise<void> heardAll;
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

/// Mutex, condition variable, deque of std::function.
class HandWritten : public Side {
 public:
  ~HandWritten() override {
    Post(nullptr);
    thread_.join();
  }

  void Add(IAudioVolumeEventListener& listener) override { listeners_.push_back(&listener); }

  void Remove(IAudioVolumeEventListener& listener) override {
    listeners_.erase(std::find(listeners_.begin(), listeners_.end(), &listener));
  }

  void Report(int level) override {
    Post([this, level] {
      for (IEventListener* listener : listeners_) {
        dynamic_cast<IAudioVolumeEventListener*>(listener)->OnMediaVolumeChanged(level);
      }
    });
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
  std::vector<IEventListener*> listeners_;  // changes only while nothing is queued
  std::deque<std::function<void()>> queue_;
  std::thread thread_{[this] { Run(); }};
};

/// \return the process's time on processors, in seconds
double ProcessorTime() {
  timespec time;
  clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &time);
  return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_nsec) * 1e-9;
}

/// The calling thread, and those that it starts, run there from now on.
void RunOn(std::size_t core) {
  cpu_set_t set;
  CPU_ZERO(&set);
  CPU_SET(core, &set);
  if (sched_setaffinity(0, sizeof set, &set) != 0) std::abort();
}

/// \return the cores that this process may use
std::vector<std::size_t> Cores() {
  cpu_set_t set;
  if (sched_getaffinity(0, sizeof set, &set) != 0) std::abort();
  std::vector<std::size_t> cores;
  for (std::size_t core = 0; core < CPU_SETSIZE; ++core) {
    if (CPU_ISSET(core, &set)) cores.push_back(core);
  }
  return cores;
}

/// What is measured: so many reports at a time, the next ones when all listeners have heard these.
struct Load {
  const char* name;
  std::size_t listeners, reports, atATime;
  double limit = 0;  // of the ratio; 0: none
};

/// Processor time of \p load; \p last is the listener that is told last.
double Measure(Side& side, Listener& last, const Load& load) {
  const double begin = ProcessorTime();
  for (std::size_t done = 0; done < load.reports; done += load.atATime) {
    last.missing = load.atATime;
    last.heardAll = {};
    for (std::size_t i = 0; i < load.atATime; ++i) side.Report(static_cast<int>(i % 16));
    last.heardAll.get_future().wait();
  }
  return ProcessorTime() - begin;
}

double Median(std::vector<double> values) {
  std::sort(values.begin(), values.end());
  return values[values.size() / 2];
}

/// \return whether the ratio of the two sides' processor time is within the limit
bool Compare(Side* const (&sides)[2], const Load& load) {
  Listeners added[2];
  for (std::size_t side = 0; side < 2; ++side) {
    for (std::size_t i = 0; i < load.listeners; ++i) {
      added[side].push_back(std::make_unique<Listener>());
      sides[side]->Add(*added[side].back());
    }
  }
  std::vector<double> times[2];
  for (std::size_t turn = 0; turn < 41; ++turn) {
    for (const std::size_t i : {turn % 2, 1 - turn % 2}) {
      times[i].push_back(Measure(*sides[i], *added[i].back(), load));
    }
  }
  Host::WaitUntilDelivered();
  for (std::size_t side = 0; side < 2; ++side) {
    for (const auto& listener : added[side]) sides[side]->Remove(*listener);
  }
  const double scale = 1e6 / static_cast<double>(load.reports);
  const double ratio = Median(times[0]) / Median(times[1]);
  std::printf("  %4zu listeners, %-13s %8.2f us %8.2f us   ratio %.2f", load.listeners, load.name,
              Median(times[0]) * scale, Median(times[1]) * scale, ratio);
  if (load.limit > 0) std::printf(" (limit %.2f)", load.limit);
  std::printf("\n");
  return load.limit == 0 || ratio <= load.limit;
}

bool CountAllocationsPerEvent(Library& library) {
  constexpr std::size_t kEvents = 1000;
  const std::size_t before = allocations;
  for (std::size_t i = 0; i < kEvents; ++i) library.Report(1);
  Host::WaitUntilDelivered();
  const double perEvent = static_cast<double>(allocations - before) / kEvents;
  std::printf("allocations an event %.2f (limit 1)\n", perEvent);
  return perEvent <= 1;
}

}  // namespace

int main() {
  const std::vector<std::size_t> cores = Cores();
  RunOn(cores.back());
  Library library;
  if (library.manager == nullptr || volumeChanged == nullptr) return 1;
  HandWritten handWritten;
  Side* const sides[] = {&library, &handWritten};

  std::printf("%-31s %11s %11s\n", "an event's processor time", "library", "by hand");
  std::printf("reported and delivered on one core\n");
  bool good = Compare(sides, {"one at a time", 1, 2000, 1, 1.25});
  good &= Compare(sides, {"a burst", 1, 40000, 40000, 1.25});
  good &= Compare(sides, {"a burst", 10, 10000, 10000});
  good &= Compare(sides, {"a burst", 1000, 200, 200});
  if (cores.size() > 1) {
    RunOn(cores.front());
    std::printf("reported on one core and delivered on another\n");
    good &= Compare(sides, {"one at a time", 1, 2000, 1, 1.25});
    good &= Compare(sides, {"a burst", 1, 40000, 40000});
  }
  return CountAllocationsPerEvent(library) && good ? 0 : 1;
}
