/// \file
#pragma once

#include "PulseLoop.h"

#include <chrono>
#include <functional>

namespace Desktop {

/// Calls a function later, on the loop's thread. Under the loop's lock; lives as long as the loop.
class Timer {
 public:
  Timer(PulseLoop& loop, std::function<void()> onTime) : loop_(loop), onTime_(std::move(onTime)) {}

  Timer(const Timer&) = delete;
  Timer& operator=(const Timer&) = delete;

  /// Calls the function once, when \p time has passed, unless it waits for its time already.
  void Start(std::chrono::milliseconds time);
  void Stop();

 private:
  static void OnTime(pa_mainloop_api* api, pa_time_event* event, const timeval* time, void* self);

  PulseLoop& loop_;
  const std::function<void()> onTime_;
  pa_time_event* event_ = nullptr;
  bool isRunning_ = false;
};

}  // namespace Desktop
