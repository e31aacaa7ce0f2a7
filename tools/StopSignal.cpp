#include "StopSignal.h"

#include "Failure.h"

#include <poll.h>
#include <sys/signalfd.h>
#include <unistd.h>

#include <cerrno>

namespace CommandLine {

StopSignal::StopSignal() {
  sigset_t signals;
  sigemptyset(&signals);
  for (int signal : {SIGINT, SIGTERM, SIGHUP}) sigaddset(&signals, signal);
  descriptor_ = signalfd(-1, &signals, SFD_CLOEXEC | SFD_NONBLOCK);
  if (descriptor_ < 0) FailWithSystemError("wait for signals", errno);
  pthread_sigmask(SIG_BLOCK, &signals, &before_);
}

StopSignal::~StopSignal() {
  while (Take() != 0) {
  }  // answered by now; else they would end the program here
  close(descriptor_);
  pthread_sigmask(SIG_SETMASK, &before_, nullptr);
}

int StopSignal::Take() {
  signalfd_siginfo info;
  return read(descriptor_, &info, sizeof info) == sizeof info ? static_cast<int>(info.ssi_signo)
                                                              : 0;
}

bool StopSignal::Wait(int milliseconds) {
  pollfd ready{descriptor_, POLLIN, 0};
  return poll(&ready, 1, milliseconds) > 0 && Take() != 0;
}

}  // namespace CommandLine
