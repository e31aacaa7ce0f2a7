#include "Connection.h"

#include "Log.h"

#include <pthread.h>
#include <pulse/timeval.h>

#include <algorithm>
#include <csignal>
#include <new>
#include <utility>

namespace Desktop {
namespace {

/// How long to wait before the next attempt to connect: doubled each time. An attempt costs a
/// refused `connect`.
constexpr std::chrono::milliseconds kFirstPause{25};
constexpr std::chrono::milliseconds kLongestPause{800};

/// Keeps the program's signals away from a thread that is started meanwhile.
class BlockedSignals {
 public:
  BlockedSignals() {
    sigset_t all;
    sigfillset(&all);
    pthread_sigmask(SIG_SETMASK, &all, &before_);
  }
  ~BlockedSignals() { pthread_sigmask(SIG_SETMASK, &before_, nullptr); }

  BlockedSignals(const BlockedSignals&) = delete;
  BlockedSignals& operator=(const BlockedSignals&) = delete;

 private:
  sigset_t before_;
};

}  // namespace

Connection::Connection(Owner& owner) : owner_(owner), loop_(pa_mainloop_new()) {
  if (loop_ == nullptr) throw std::bad_alloc();
  pa_mainloop_set_poll_func(loop_, Poll, this);
  api_ = pa_mainloop_get_api(loop_);
  const timeval never = {};
  retry_ = api_->time_new(api_, &never, OnRetry, this);
  StopRetry();
  try {
    const BlockedSignals blocked;
    thread_ = std::thread(&Connection::Run, this);
  } catch (...) {
    pa_mainloop_free(loop_);
    throw;
  }
  pthread_setname_np(thread_.native_handle(), "zelkora-sound");
}

void Connection::Run() {
  std::lock_guard lock(mutex_);
  pa_mainloop_run(loop_, nullptr);
}

/// Waiters are woken after unlocking: one that wakes up before would have to wait for the lock.
int Connection::Poll(pollfd* files, unsigned long count, int timeout, void* self) {
  auto& connection = *static_cast<Connection*>(self);
  const bool hasProgress = std::exchange(connection.hasProgress_, false);
  connection.mutex_.unlock();
  if (hasProgress) connection.progress_.notify_all();
  const int ready = poll(files, count, timeout);
  connection.mutex_.lock();
  return ready;
}

void Connection::Stop() {
  {
    const Lock lock = Acquire();
    Close();
    pa_mainloop_quit(loop_, 0);
  }
  thread_.join();
  progress_.notify_all();
}

void Connection::Connect() {
  if (state_ != State::kDown) return;
  StopRetry();
  state_ = State::kConnecting;
  ++number_;
  context_.reset(pa_context_new(api_, "zelkora"));
  if (context_ == nullptr) return OnFailed(PA_ERR_INTERNAL);
  pa_context_set_state_callback(context_.get(), OnStateChanged, this);
  if (pa_context_connect(context_.get(), nullptr, PA_CONTEXT_NOAUTOSPAWN, nullptr) < 0) {
    OnFailed(pa_context_errno(context_.get()));
  }
}

void Connection::Close() {
  StopRetry();
  state_ = State::kClosed;
  error_ = PA_ERR_CONNECTIONTERMINATED;
  owner_.OnDisconnected(false);
  if (context_ == nullptr) return;
  pa_context_set_state_callback(context_.get(), nullptr, nullptr);
  pa_context_disconnect(context_.get());
  context_.reset();
}

void Connection::OnStateChanged(pa_context* context, void* self) {
  auto& connection = *static_cast<Connection*>(self);
  const pa_context_state_t state = pa_context_get_state(context);
  if (state == PA_CONTEXT_READY) connection.OnReady();
  if (!PA_CONTEXT_IS_GOOD(state)) connection.OnFailed(pa_context_errno(context));
}

void Connection::OnReady() {
  state_ = State::kUp;
  pause_ = kFirstPause;
  if (isLossLogged_) LogChange("The sound server is back.");
  isLossLogged_ = false;
  owner_.OnConnected(context_.get());
}

void Connection::OnFailed(int error) {
  if (IsDown()) return;  // told already
  const bool wasConnected = state_ == State::kUp;
  state_ = State::kDown;
  error_ = error;
  if (!isLossLogged_) {
    LogFailure(wasConnected ? "The sound server is gone" : "The sound server can't be reached",
               pa_strerror(error));
  }
  isLossLogged_ = true;
  owner_.OnDisconnected(wasConnected);
  NotifyProgress();
  ScheduleRetry();
}

void Connection::ScheduleRetry() {
  timeval time;
  pa_gettimeofday(&time);
  pa_timeval_add(&time, static_cast<pa_usec_t>(pause_.count()) * PA_USEC_PER_MSEC);
  api_->time_restart(retry_, &time);
  pause_ = std::clamp(2 * pause_, kFirstPause, kLongestPause);
}

void Connection::StopRetry() { api_->time_restart(retry_, nullptr); }

void Connection::OnRetry(pa_mainloop_api*, pa_time_event*, const timeval*, void* self) {
  static_cast<Connection*>(self)->Connect();
}

}  // namespace Desktop
