#include "PulseLoop.h"

#include <pthread.h>

#include <csignal>
#include <new>

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

int PulseLoop::Poll(pollfd* files, unsigned long count, int timeout, void* self) {
  auto& loop = *static_cast<PulseLoop*>(self);
  loop.files_.assign(files, files + count);
  loop.mutex_.unlock();
  const int ready = poll(files, count, timeout);
  loop.mutex_.lock();
  return ready;
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
