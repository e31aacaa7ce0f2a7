/// \file
#pragma once

#include "Pulse.h"
#include "Timer.h"

#include <chrono>

namespace Desktop {

/// The connection to the sound server, which comes back by itself when the server does. It never
/// starts a server. Everything happens under the loop's lock.
class Connection {
 public:
  class Owner {
   public:
    virtual void OnConnected(pa_context* context) = 0;

    /// Nothing is answered any more.
    /// \param isLost whether a connection was lost; else an attempt failed, or it was closed
    virtual void OnDisconnected(bool isLost) = 0;

   protected:
    ~Owner() = default;
  };

  Connection(PulseLoop& loop, Owner& owner)
      : loop_(loop), owner_(owner), retry_(loop, [this] { Connect(); }) {}

  /// Begins to connect, unless connected or on the way to it.
  void Connect();

  /// Disconnects for good.
  void Close();

  bool IsDown() const { return state_ == State::kDown || state_ == State::kClosed; }

  /// \return the context while connected, else null
  pa_context* GetContext() const { return state_ == State::kUp ? context_.get() : nullptr; }

  /// \return the native code for why the connection is down
  int GetErrorCode() const { return ToErrorCode(error_); }

  /// \return a number that no other connection has
  unsigned GetNumber() const { return number_; }

 private:
  enum class State { kDown, kConnecting, kUp, kClosed };

  static void OnStateChanged(pa_context* context, void* self);

  void OnReady();
  void OnFailed(int error);
  void ScheduleRetry();

  PulseLoop& loop_;
  Owner& owner_;
  State state_ = State::kDown;
  ContextPtr context_;
  unsigned number_ = 0;
  int error_ = PA_ERR_CONNECTIONREFUSED;
  bool isLossLogged_ = false;
  Timer retry_;
  std::chrono::milliseconds pause_{0};
};

}  // namespace Desktop
