/// \file
#pragma once

#include <appfw/Standby.h>

#include <sys/types.h>

#include <array>
#include <condition_variable>
#include <cstdint>
#include <functional>
#include <mutex>
#include <thread>
#include <vector>

namespace Host {

/// What the device reports to the program: a volume (type, level), mute-all (0 or 1) or an
/// interruption (code).
enum class Kind { kVolume, kMuteAll, kInterruption };
inline constexpr std::size_t kKinds = 3;

struct Report {
  Kind kind;
  int first;
  int second;
  bool withUserData = true;
};

/// The device's own thread, which calls the program's callbacks one after the other.
///
/// Never destroyed, because threads may report until the process is gone. Reports that are on the way
/// at exit are dropped.
class CallbackThread {
 public:
  using Callback = std::function<void(const Report&)>;

  /// \param stateMutex guards the device's state and the reports about it, so that a change and its
  /// report are one step and cost one lock
  explicit CallbackThread(std::mutex& stateMutex) : mutex_(stateMutex) {}

  /// Sets the callback for one kind of reports, those from now on, and starts the thread unless it
  /// runs; throws when memory is short or the thread can't be started.
  void Set(Kind kind, Callback callback);

  /// Removes the callback and drops the reports for it. No call of it is running when this returns,
  /// unless this is called from inside a callback.
  void Unset(Kind kind);

  /// Queues a report, unless nobody hears it. The state's mutex must be held. Throws, with nothing
  /// done, when memory is short.
  void Post(const Report& report);

  /// A report is likely to come soon: keeps the thread awake for it, and the dispatcher of the events
  /// that are made of it, if anybody hears it. The state's mutex must be held.
  void Expect(Kind kind);

  /// Drops the reports that are queued. The state's mutex must not be held.
  void DropReports();

  /// Returns when the reports made before have been delivered; at once when called from a callback.
  void WaitUntilReported();

 private:
  struct Slot {
    Callback callback;
    std::uint64_t firstReport = 0;  // number of the first report that isn't dropped
  };

  void Start();
  void Stop();
  void Run();
  bool TakeBatch();
  void Deliver(const Report& report, std::unique_lock<std::mutex>& lock);
  void Finish(std::uint64_t count);
  void WaitUntilFinished(std::uint64_t count, std::unique_lock<std::mutex>& lock);

  Slot& SlotOf(Kind kind) { return slots_[static_cast<std::size_t>(kind)]; }

  std::mutex& mutex_;
  std::condition_variable queued_;
  std::vector<Report> queue_;
  std::uint64_t postedCount_ = 0;
  bool sleeping_ = false;
  Standby standby_;
  bool stopped_ = false;
  std::thread thread_;
  pid_t process_ = 0;

  std::vector<Report> batch_;  // the thread's own

  // Guards what follows. Taken after the state's mutex; changing a slot takes both, so either lock
  // will do to read it.
  std::mutex callMutex_;
  std::condition_variable progressed_;
  std::array<Slot, kKinds> slots_;
  std::uint64_t finishedCount_ = 0;
  std::uint64_t awaitedCount_ = UINT64_MAX;  // the lowest count that somebody waits for
  const Slot* calling_ = nullptr;
};

}  // namespace Host
