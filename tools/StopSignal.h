#pragma once

#include <csignal>

namespace CommandLine {

/// Ctrl-C and other requests to end, as something to wait for instead of a sudden end.
///
/// While it exists, the calling thread and all that it starts don't get these signals; make it
/// before the library or a device starts threads.
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
  sigset_t before_;
  int descriptor_;
};

}  // namespace CommandLine
