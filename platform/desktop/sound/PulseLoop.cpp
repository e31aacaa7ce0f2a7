#include "PulseLoop.h"

#include <pthread.h>

#include <csignal>
#include <new>
#include <utility>

namespace Desktop {
namespace {

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

PulseLoop::PulseLoop() : loop_(pa_mainloop_new()) {
  if (loop_ == nullptr) throw std::bad_alloc();
  pa_mainloop_set_poll_func(loop_, Poll, this);
  try {
    const BlockedSignals blocked;
    thread_ = std::thread(&PulseLoop::Run, this);
  } catch (...) {
    pa_mainloop_free(loop_);
    throw;
  }
  pthread_setname_np(thread_.native_handle(), "zelkora-sound");
}

void PulseLoop::Run() {
  std::lock_guard lock(mutex_);
  pa_mainloop_run(loop_, nullptr);
}

int PulseLoop::PollAwake(pollfd* files, unsigned long count) {
  const Time end = Clock::now() + kMoment;
  int ready = 0;
  while ((ready = poll(files, count, 0)) == 0 && Clock::now() < end) std::this_thread::yield();
  return ready;
}

int PulseLoop::Poll(pollfd* files, unsigned long count, int timeout, void* self) {
  auto& loop = *static_cast<PulseLoop*>(self);
  loop.files_.assign(files, files + count);
  const auto meanwhile = std::exchange(loop.meanwhile_, nullptr);
  if (meanwhile != nullptr) meanwhile();
  loop.isDispatching_ = false;
  ++loop.turns_;
  const bool hasProgress = std::exchange(loop.hasProgress_, false) || loop.readers_ > 0;
  loop.mutex_.unlock();
  if (hasProgress) loop.TellProgress();
  int ready = meanwhile != nullptr ? PollAwake(files, count) : 0;
  if (ready == 0) ready = poll(files, count, timeout);
  loop.mutex_.lock();
  loop.isDispatching_ = true;
  return ready;
}

/// Who is woken while the lock is held wakes up twice.
void PulseLoop::NotifyProgress() {
  if (isDispatching_) {
    hasProgress_ = true;
  } else {
    TellProgress();
  }
}

void PulseLoop::TellProgress() {
  ++progressCount_;
  progress_.notify_all();
}

void PulseLoop::WaitAwake(std::unique_lock<std::mutex>& lock, Time end) {
  const unsigned count = progressCount_;
  lock.unlock();
  while (progressCount_ == count && Clock::now() < end) std::this_thread::yield();
  lock.lock();
}

bool PulseLoop::AwaitReading(std::unique_lock<std::mutex>& lock, Time limit) {
  bool isInTime = true;
  ++readers_;
  while (isInTime && HasUnread()) {
    isInTime = WaitForProgress(lock, limit, [this, turn = turns_] { return turns_ != turn; });
  }
  --readers_;
  return isInTime;
}

bool PulseLoop::HasUnread() { return poll(files_.data(), files_.size(), 0) != 0; }

void PulseLoop::Stop() {
  {
    std::lock_guard lock(mutex_);
    pa_mainloop_quit(loop_, 0);
  }
  thread_.join();
}

}  // namespace Desktop
