#pragma once

#include <atomic>
#include <csignal>
#include <thread>

namespace CommandLine {

/// Receives Ctrl-C and other requests to end, on a thread of its own: a `StopSignal` is told, and
/// where there is none the program ends at once, with its temporary folders removed.
///
/// One a process, made before anything else starts threads, which don't get these signals then.
class SignalThread {
 public:
  SignalThread();
  ~SignalThread();
  SignalThread(const SignalThread&) = delete;
  SignalThread& operator=(const SignalThread&) = delete;

 private:
  void Run();

  sigset_t before_;
  std::atomic<bool> ended_{false};
  std::thread thread_;
};

/// A request to end, as something to wait for instead of a sudden end. Of several the newest is
/// told.
class StopSignal {
 public:
  StopSignal();
  ~StopSignal();
  StopSignal(const StopSignal&) = delete;
  StopSignal& operator=(const StopSignal&) = delete;

  /// \return a descriptor that is readable when a signal has come.
  int Descriptor() const { return descriptor_; }

  /// \return the signal that has come, which is forgotten, or 0.
  int Take();

  /// Waits for a signal. \param milliseconds how long; -1 for ever \return whether one came
  bool Wait(int milliseconds);

 private:
  friend class SignalThread;

  std::atomic<int> signal_{0};
  int descriptor_;
};

}  // namespace CommandLine
