/// \file
#pragma once

#include "Calls.h"
#include "Questions.h"

namespace Desktop {

/// A picture of the server that its events keep up to date, and from which changes are reported.
/// Events carry no values, so each is followed by a question. Under the connection's lock; the
/// server's events are read on the connection's thread.
class Picture final : public Connection::Owner, private Calls::Owner {
 public:
  explicit Picture(Connection& connection) : connection_(connection) {}

  ServerState& GetState() { return state_; }
  Calls& GetCalls() { return calls_; }

  /// Waits until there is a picture, having begun to connect if need be. \return a native code
  int Await(Connection::Lock& lock, Connection::Time limit);

  /// Waits for one answer of the server, which comes behind the events of all that happened before,
  /// and for the answers about those. \return a native code
  int Refresh(Connection::Lock& lock, Connection::Time limit);

  /// The same, and waits for all that was asked meanwhile, however much happens.
  int Settle(Connection::Lock& lock, Connection::Time limit);

 private:
  void OnConnected(pa_context* context) override;
  void OnDisconnected(bool isLost) override;
  void OnCallKilled(std::uint32_t stream) override;
  void WatchEntries();

  /// \name The server's events
  /// @{
  static void OnEvent(pa_context* context, pa_subscription_event_type_t event, std::uint32_t index,
                      void* self);
  static void OnEntriesChanged(pa_context* context, void* self);
  void OnSinkEvent(int type, std::uint32_t index);
  void OnStreamRemoved(std::uint32_t index);
  /// @}

  Connection& connection_;
  ServerState state_;
  Questions questions_{connection_, state_};
  Calls calls_{connection_, *this};
};

}  // namespace Desktop
