/// \file
#pragma once

#include <poll.h>
#include <pulse/mainloop.h>

#include <mutex>
#include <thread>
#include <vector>

namespace Desktop {

/// The thread that talks to the server, and the lock for all that it and its callers share; it holds
/// the lock whenever it doesn't wait for the server.
///
/// libpulse's own threaded loop has no wait with a bound, and doesn't tell whether it has something
/// to read. Never destroyed: callers come until the process is gone.
class PulseLoop {
 public:
  /// Throws when memory or threads are short.
  PulseLoop();

  std::mutex& GetMutex() { return mutex_; }
  pa_mainloop_api* GetApi() { return pa_mainloop_get_api(loop_); }

  /// \return whether the server may have sent something that the thread hasn't come to yet. The lock
  /// must be held.
  bool HasUnread();

  /// Ends the thread. The lock must not be held, and goes on working.
  void Stop();

 private:
  static int Poll(pollfd* files, unsigned long count, int timeout, void* self);
  void Run();

  std::mutex mutex_;
  pa_mainloop* loop_;
  std::vector<pollfd> files_;  // that the thread waits for, or waited for last
  std::thread thread_;
};

}  // namespace Desktop
