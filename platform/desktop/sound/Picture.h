/// \file
/// What the server tells: its events, the questions that follow, and what the answers make known.
#pragma once

#include "Calls.h"
#include "Connection.h"
#include "Interruptions.h"
#include "Streams.h"
#include "Volumes.h"

#include <cstdint>

namespace Desktop {

/// What the server has told, and what follows from it. Under the connection's lock.
struct ServerState {
  Streams streams;
  Volumes volumes{streams};
  DefaultSink defaultSink{streams};
  Interruptions interruptions{streams, defaultSink};
  bool isPipeWire = false;
};

/// What is asked of the server, and its answers, which are written into its state. Under the
/// connection's lock; the answers are read on the connection's thread.
class Questions {
 public:
  Questions(Connection& connection, ServerState& state) : connection_(connection), state_(state) {}

  void AskForServer();
  void AskForDefaultSink();
  void AskForStream(std::uint32_t index);
  void AskForStreams();
  void AskForEntries();

  /// Asks for the entries once all streams have answered.
  void AskForEntriesLater();

  /// What is on the way won't be answered: the connection has ended.
  void Drop();

  /// \return whether all was answered at least once since the connection came up
  bool IsComplete() const { return isComplete_; }

  bool IsWaiting() const { return answered_ != asked_; }

  /// Waits for the answers to what was asked so far, and to what they ask. \return a native code
  int Await(Connection::Lock& lock, Connection::Time limit);

 private:
  void Ask(pa_operation* operation);
  void OnAnswered();
  bool PutStream(const pa_sink_input_info& info);
  static void OnServer(pa_context* context, const pa_server_info* info, void* self);
  static void OnDefaultSink(pa_context* context, const pa_sink_info* info, int end, void* self);
  static void OnStream(pa_context* context, const pa_sink_input_info* info, int end, void* self);
  static void OnStreams(pa_context* context, const pa_sink_input_info* info, int end, void* self);
  static void OnEntry(pa_context* context, const pa_ext_stream_restore_info* info, int end,
                      void* self);

  Connection& connection_;
  ServerState& state_;
  bool isComplete_ = false;
  bool areEntriesDue_ = false;
  bool areStreamsRead_ = false;  // an answer about all of them is on its way
  std::uint64_t asked_ = 0;
  std::uint64_t answered_ = 0;  // in the order of the questions
};

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
