/// \file
#pragma once

#include "Pulse.h"

#include <poll.h>

#include <chrono>
#include <condition_variable>
#include <mutex>
#include <thread>

namespace Desktop {

/// The connection to the sound server, which comes back by itself when the server does, and the
/// thread that serves it. It never starts a server.
///
/// One lock guards all that this thread and its callers share; the thread holds it whenever it
/// doesn't sleep. libpulse's own threaded loop has no wait with a bound. Never destroyed: callers
/// come until the process is gone.
class Connection {
 public:
  using Clock = std::chrono::steady_clock;
  using Time = Clock::time_point;
  using Lock = std::unique_lock<std::mutex>;

  /// Told on the thread, with the lock held, and when an attempt fails at once on the caller's.
  class Owner {
   public:
    virtual void OnConnected(pa_context* context) = 0;

    /// Nothing is answered any more.
    /// \param isLost whether a connection was lost; else an attempt failed, or it was closed
    virtual void OnDisconnected(bool isLost) = 0;

   protected:
    ~Owner() = default;
  };

  /// Starts the thread; throws when memory or threads are short.
  explicit Connection(Owner& owner);

  Lock Acquire() { return Lock(mutex_); }

  /// Begins to connect, unless connected or on the way to it. The lock must be held.
  void Connect();

  /// Disconnects for good and ends the thread. The caller must not hold the lock, which can still
  /// be used afterwards.
  void Stop();

  /// \return the context while connected, else null
  pa_context* GetContext() const { return state_ == State::kUp ? context_.get() : nullptr; }

  /// Something has happened that somebody may wait for. The lock must be held.
  void NotifyProgress() { hasProgress_ = true; }

  /// Waits, having begun to connect, until \p condition holds on this connection.
  /// \return a native code: 0, -110 when it doesn't in time, or why the connection ended
  template <typename Condition>
  int Await(Lock& lock, Time limit, Condition condition) {
    const unsigned number = number_;
    const auto isOver = [&] { return IsDown() || number_ != number; };
    if (!progress_.wait_until(lock, limit, [&] { return isOver() || condition(); })) {
      return kTimedOut;
    }
    return isOver() ? ToErrorCode(error_) : int{SOUND_MANAGER_ERROR_NONE};
  }

  /// Gives the lock up for a moment, so that the thread can work. The lock must be held.
  void Rest(Lock& lock, std::chrono::milliseconds moment) { progress_.wait_for(lock, moment); }

 private:
  enum class State { kDown, kConnecting, kUp, kClosed };

  static int Poll(pollfd* files, unsigned long count, int timeout, void* self);
  static void OnStateChanged(pa_context* context, void* self);
  static void OnRetry(pa_mainloop_api* api, pa_time_event* event, const timeval* time, void* self);

  bool IsDown() const { return state_ == State::kDown || state_ == State::kClosed; }
  void Run();
  void OnReady();
  void OnFailed(int error);
  void ScheduleRetry();
  void StopRetry();
  void Close();

  Owner& owner_;
  std::mutex mutex_;
  std::condition_variable progress_;
  bool hasProgress_ = false;
  pa_mainloop* loop_;
  pa_mainloop_api* api_;
  pa_time_event* retry_;
  std::chrono::milliseconds pause_{0};
  State state_ = State::kDown;
  ContextPtr context_;
  unsigned number_ = 0;                   // no other connection has it
  int error_ = PA_ERR_CONNECTIONREFUSED;  // of the last connection that ended
  bool isLossLogged_ = false;
  std::thread thread_;
};

}  // namespace Desktop
