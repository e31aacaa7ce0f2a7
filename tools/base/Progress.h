#pragma once

#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <functional>
#include <mutex>
#include <thread>

namespace CommandLine {

/// A bar on standard error, with the time that is left, for what takes longer than a second; it is
/// gone at the end. Nothing where that isn't a terminal.
class Progress {
 public:
  /// For work in equal steps.
  explicit Progress(std::size_t steps = 1);
  ~Progress();
  Progress(const Progress&) = delete;
  Progress& operator=(const Progress&) = delete;

  /// Shows that one more step is done.
  void Advance();

  /// Shows that a share of all is done, from 0 to 1.
  void Show(double share);

 private:
  using Clock = std::chrono::steady_clock;

  const std::size_t steps_;
  std::size_t done_ = 0;
  const bool isWanted_;
  bool isDrawn_ = false;
  const Clock::time_point start_ = Clock::now();
  Clock::time_point drawn_ = start_;
};

/// The same for work that tells nothing by itself: asks again and again, on a thread of its own.
class WatchedProgress {
 public:
  /// \param share tells how much is done, from 0 to 1
  explicit WatchedProgress(std::function<double()> share);
  ~WatchedProgress();
  WatchedProgress(const WatchedProgress&) = delete;
  WatchedProgress& operator=(const WatchedProgress&) = delete;

 private:
  void Run();

  const std::function<double()> share_;
  std::mutex mutex_;  // guards that below
  bool ended_ = false;
  std::condition_variable end_;
  std::thread thread_;
};

}  // namespace CommandLine
