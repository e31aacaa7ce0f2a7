#include "Timer.h"

#include <pulse/timeval.h>

#include <utility>

namespace Desktop {

void Timer::Start(std::chrono::milliseconds time) {
  if (std::exchange(isRunning_, true)) return;
  timeval end;
  pa_timeval_add(pa_gettimeofday(&end), static_cast<pa_usec_t>(time.count()) * PA_USEC_PER_MSEC);
  pa_mainloop_api* api = loop_.GetApi();
  if (event_ == nullptr) {
    event_ = api->time_new(api, &end, OnTime, this);
  } else {
    api->time_restart(event_, &end);
  }
}

void Timer::Stop() {
  isRunning_ = false;
  if (event_ != nullptr) loop_.GetApi()->time_restart(event_, nullptr);
}

void Timer::OnTime(pa_mainloop_api*, pa_time_event*, const timeval*, void* self) {
  auto& timer = *static_cast<Timer*>(self);
  timer.isRunning_ = false;
  timer.onTime_();
}

}  // namespace Desktop
