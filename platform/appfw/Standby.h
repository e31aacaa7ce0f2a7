/// \file
#pragma once

#include <atomic>
#include <chrono>
#include <mutex>
#include <thread>
#include <utility>

namespace Host {

/// Keeps a thread awake that waits for work, for a moment, when work is likely to come: waking a
/// thread up can take as long as a round trip to a server.
class Standby {
 public:
  /// Work is likely to come soon. The lock of `Wait` must be held.
  void Expect() { isExpected_ = true; }

  /// There is work.
  void Notify() { hasWork_.store(true, std::memory_order_release); }

  /// Waits for work without sleeping, a moment at most, if it is expected; \p lock is released
  /// meanwhile, and \p prepare called first.
  /// \return false when no work is expected
  template <typename Prepare>
  bool Wait(std::unique_lock<std::mutex>& lock, Prepare prepare) {
    if (!std::exchange(isExpected_, false)) return false;
    hasWork_.store(false, std::memory_order_relaxed);
    lock.unlock();
    prepare();
    const auto end = std::chrono::steady_clock::now() + kMoment;
    while (!hasWork_.load(std::memory_order_acquire) && std::chrono::steady_clock::now() < end) {
      std::this_thread::yield();
    }
    lock.lock();
    return true;
  }

 private:
  /// A local server answers in less.
  static constexpr std::chrono::microseconds kMoment{300};

  bool isExpected_ = false;
  std::atomic<bool> hasWork_{false};
};

}  // namespace Host
