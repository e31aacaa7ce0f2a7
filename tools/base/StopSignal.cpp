#include "StopSignal.h"

#include "Failure.h"
#include "TemporaryFolder.h"

#include <poll.h>
#include <sys/eventfd.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <mutex>
#include <vector>

namespace CommandLine {
namespace {

std::mutex mutex;                   // guards those below
std::vector<StopSignal*> stoppers;  // the newest last

/// Those that end a program. A hang-up that the user had ignored, as with nohup, stays so.
sigset_t EndingSignals() {
  sigset_t signals;
  sigemptyset(&signals);
  for (int signal : {SIGINT, SIGTERM}) sigaddset(&signals, signal);
  struct sigaction hangUp;
  sigaction(SIGHUP, nullptr, &hangUp);
  if (hangUp.sa_handler != SIG_IGN) sigaddset(&signals, SIGHUP);
  return signals;
}

void EndBy(int signal) {
  TemporaryFolder::RemoveAllForEver();
  std::signal(signal, SIG_DFL);
  sigset_t wanted;
  sigemptyset(&wanted);
  sigaddset(&wanted, signal);
  pthread_sigmask(SIG_UNBLOCK, &wanted, nullptr);
  raise(signal);
}

}  // namespace

SignalThread::SignalThread() {
  const sigset_t signals = EndingSignals();
  pthread_sigmask(SIG_BLOCK, &signals, &before_);
  thread_ = std::thread(&SignalThread::Run, this);
}

SignalThread::~SignalThread() {
  ended_ = true;
  pthread_kill(thread_.native_handle(), SIGINT);
  thread_.join();
  pthread_sigmask(SIG_SETMASK, &before_, nullptr);
}

void SignalThread::Run() {
  const sigset_t signals = EndingSignals();
  for (int signal = 0; sigwait(&signals, &signal) == 0 && !ended_;) {
    std::lock_guard lock(mutex);
    if (stoppers.empty()) return EndBy(signal);
    stoppers.back()->signal_ = signal;
    eventfd_write(stoppers.back()->descriptor_, 1);
  }
}

StopSignal::StopSignal() : descriptor_(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)) {
  if (descriptor_ < 0) FailWithSystemError("wait for signals", errno);
  std::lock_guard lock(mutex);
  stoppers.push_back(this);
}

StopSignal::~StopSignal() {
  std::lock_guard lock(mutex);
  stoppers.erase(std::find(stoppers.begin(), stoppers.end(), this));
  close(descriptor_);
}

int StopSignal::Take() {
  eventfd_t ignored;
  eventfd_read(descriptor_, &ignored);
  return signal_.exchange(0);
}

bool StopSignal::Wait(int milliseconds) {
  pollfd ready{descriptor_, POLLIN, 0};
  return poll(&ready, 1, milliseconds) > 0 && Take() != 0;
}

}  // namespace CommandLine
