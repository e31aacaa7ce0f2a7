/// \file
#pragma once

#include "Connection.h"
#include "ServerState.h"

#include <cstdint>

namespace Desktop {

/// What is asked of the server, in whose state the answers are written. Under the connection's
/// lock; the answers are read on the connection's thread.
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
  void PutStream(const pa_sink_input_info& info);
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

}  // namespace Desktop
