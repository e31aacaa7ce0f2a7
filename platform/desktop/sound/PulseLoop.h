/// \file
#pragma once

#include <poll.h>
#include <pulse/mainloop.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <condition_variable>
#include <functional>
#include <mutex>
#include <thread>
#include <vector>

namespace Desktop {

/// The thread that talks to the server, and the lock for all that it and its callers share; it holds
/// the lock whenever it doesn't wait for the server.
///
/// libpulse's own threaded loop has no wait with a bound, and doesn't tell whether it has something
/// to read. Never destroyed: callers come until the process is gone.
class PulseLoop {
 public:
  using Clock = std::chrono::steady_clock;
  using Time = Clock::time_point;

  /// Throws when memory or threads are short.
  PulseLoop();

  std::mutex& GetMutex() { return mutex_; }
  pa_mainloop_api* GetApi() { return pa_mainloop_get_api(loop_); }

  /// Waits until the thread has read all that the server has sent. \return false when it doesn't in time
  bool AwaitReading(std::unique_lock<std::mutex>& lock, Time limit);

  /// Wakes those who wait for progress. The lock must be held.
  void NotifyProgress();

  /// Waits until \p condition holds, which progress may change. \return false when it doesn't in time
  template <typename Condition>
  bool WaitForProgress(std::unique_lock<std::mutex>& lock, Time limit, Condition condition) {
    const Time end = std::min(limit, Clock::now() + kMoment);
    while (!condition() && Clock::now() < end) WaitAwake(lock, end);
    return progress_.wait_until(lock, limit, condition);
  }

  /// An answer is near: the thread waits for it awake, a moment at most, having called \p meanwhile
  /// once everything is sent. The lock must be held, and is then; the last function counts.
  void ExpectAnswer(std::function<void()> meanwhile) { meanwhile_ = std::move(meanwhile); }

  /// Ends the thread. The lock must not be held, and goes on working.
  void Stop();

 private:
  /// A local server answers in less, and waking up would take as long again.
  static constexpr std::chrono::microseconds kMoment{300};

  static int PollAwake(pollfd* files, unsigned long count);
  static int Poll(pollfd* files, unsigned long count, int timeout, void* self);
  void Run();
  void WaitAwake(std::unique_lock<std::mutex>& lock, Time end);
  void TellProgress();
  bool HasUnread();

  std::mutex mutex_;
  pa_mainloop* loop_;
  std::vector<pollfd> files_;        // that the thread waits for, or waited for last
  std::function<void()> meanwhile_;  // null: no answer is near
  std::condition_variable progress_;
  std::atomic<unsigned> progressCount_{0};  // for those who wait awake
  bool isDispatching_ = false;              // the thread holds the lock
  unsigned turns_ = 0;
  int readers_ = 0;           // callers that wait for the thread's next turn
  bool hasProgress_ = false;  // it has to wake those who wait
  std::thread thread_;
};

}  // namespace Desktop
