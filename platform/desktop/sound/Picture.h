/// \file
#pragma once

#include "Calls.h"
#include "Connection.h"
#include "Interruptions.h"
#include "Streams.h"
#include "Volumes.h"

namespace Desktop {

/// What the server has told: a picture of it that its events keep up to date, and from which
/// changes are reported. Events carry no values, so each is followed by a question. Under the
/// connection's lock; the server's events and answers are read on the connection's thread.
class Picture final : public Connection::Owner, private Calls::Owner {
 public:
  explicit Picture(Connection& connection) : connection_(connection) {}

  /// \name What the picture shows
  /// @{
  Volumes& GetVolumes() { return volumes_; }
  DefaultSink& GetDefaultSink() { return defaultSink_; }
  Interruptions& GetInterruptions() { return interruptions_; }
  Calls& GetCalls() { return calls_; }
  bool IsOfPipeWire() const { return isPipeWire_; }
  /// @}

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

  /// \name Questions
  /// @{
  void Ask(pa_operation* operation);
  void AskForServer();
  void AskForDefaultSink();
  void AskForStream(std::uint32_t index);
  void AskForStreams();
  void AskForEntries();
  void WatchEntries();
  bool IsWaiting() const { return answered_ != asked_; }
  /// @}

  /// \name The server's answers
  /// @{
  static void OnServer(pa_context* context, const pa_server_info* info, void* self);
  static void OnDefaultSink(pa_context* context, const pa_sink_info* info, int end, void* self);
  static void OnStream(pa_context* context, const pa_sink_input_info* info, int end, void* self);
  static void OnStreams(pa_context* context, const pa_sink_input_info* info, int end, void* self);
  static void OnEntry(pa_context* context, const pa_ext_stream_restore_info* info, int end,
                      void* self);
  void PutStream(const pa_sink_input_info& info);
  void OnAnswered();
  /// @}

  /// \name Its events
  /// @{
  static void OnEvent(pa_context* context, pa_subscription_event_type_t event, std::uint32_t index,
                      void* self);
  static void OnEntriesChanged(pa_context* context, void* self);
  void OnSinkEvent(int type, std::uint32_t index);
  void OnStreamRemoved(std::uint32_t index);
  void UpdateInterruptions();
  /// @}

  Connection& connection_;
  Streams streams_;
  Volumes volumes_{streams_};
  DefaultSink defaultSink_{streams_};
  Interruptions interruptions_{streams_, defaultSink_};
  Calls calls_{connection_, *this};
  bool isPipeWire_ = false;
  bool isComplete_ = false;      // all of the server has been seen since it was connected
  bool areEntriesDue_ = false;   // they are asked for once all streams have answered
  bool areStreamsRead_ = false;  // an answer about all of them is on its way
  std::uint64_t asked_ = 0;      // questions
  std::uint64_t answered_ = 0;   // in the order of the questions
};

}  // namespace Desktop
