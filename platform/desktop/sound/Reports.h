/// \file
#pragma once

#include "Categories.h"
#include "sound/CallbackThread.h"

namespace Desktop {

/// What the program hears from the device: callbacks on a thread of their own, so that they may use
/// the sound manager. Reports are made one at a time, under the loop's lock.
class Reports {
 public:
  using Callback = Host::CallbackThread::Callback;

  /// \name Reports, none of which throws
  /// @{
  void ReportLevel(Category category, int level) noexcept;
  void ReportMuteAll(bool isMuted) noexcept;
  void ReportInterruption(int code) noexcept;
  /// @}

  /// A level is likely to be reported at once.
  void ExpectLevel() noexcept;

  /// Throws when memory or threads are short.
  void Set(Host::Kind kind, Callback callback) { thread_.Set(kind, std::move(callback)); }

  /// Waits for a callback that runs, which may need the loop's lock: it must not be held.
  void Unset(Host::Kind kind) { thread_.Unset(kind); }

  /// Waits until the callbacks for what was reported have returned. The loop's lock must not be held.
  void AwaitCallbacks() { thread_.WaitUntilReported(); }

 private:
  void Post(Host::Kind kind, int first, int second) noexcept;

  std::mutex mutex_;
  Host::CallbackThread thread_{mutex_};
};

}  // namespace Desktop
