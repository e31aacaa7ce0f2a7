#include "Picture.h"

#include "Session.h"

namespace Desktop {
namespace {

constexpr auto kWatched = static_cast<pa_subscription_mask_t>(
    PA_SUBSCRIPTION_MASK_SERVER | PA_SUBSCRIPTION_MASK_SINK | PA_SUBSCRIPTION_MASK_SINK_INPUT |
    PA_SUBSCRIPTION_MASK_MODULE);

Picture& ToPicture(void* self) { return *static_cast<Picture*>(self); }

/// For a request whose answer is of no interest.
void Forget(pa_operation* operation) { OperationPtr{operation}; }

}  // namespace

int Picture::Await(Connection::Lock& lock, Connection::Time limit) {
  connection_.Connect();  // at once, even if the time of the next attempt hasn't come
  return connection_.Await(lock, limit, [this] { return questions_.IsComplete(); });
}

int Picture::Refresh(Connection::Lock& lock, Connection::Time limit) {
  if (const int error = Await(lock, limit)) return error;
  questions_.AskForServer();
  if (state_.isPipeWire) questions_.AskForEntries();  // no event tells of them
  return questions_.Await(lock, limit);
}

int Picture::Settle(Connection::Lock& lock, Connection::Time limit) {
  if (const int error = Refresh(lock, limit)) return error;
  return connection_.Await(lock, limit, [this] { return !questions_.IsWaiting(); });
}

void Picture::OnConnected(pa_context* context) {
  pa_context_set_subscribe_callback(context, OnEvent, this);
  pa_ext_stream_restore_set_subscribe_cb(context, OnEntriesChanged, this);
  state_.volumes.Begin();
  Forget(pa_context_subscribe(context, kWatched, nullptr, nullptr));
  questions_.AskForServer();
  questions_.AskForDefaultSink();
  WatchEntries();
  questions_.AskForStreams();
  calls_.OpenStreams();
}

void Picture::OnDisconnected(bool isLost) {
  questions_.Drop();
  state_.streams.Clear();
  state_.defaultSink.OnServerLost();
  calls_.DropStreams();
  if (isLost) state_.interruptions.OnServerLost();
}

/// Without the module that keeps volumes this is refused, so it is done again when modules come.
void Picture::WatchEntries() {
  Forget(pa_ext_stream_restore_subscribe(connection_.GetContext(), true, nullptr, nullptr));
  questions_.AskForEntries();
}

void Picture::OnEvent(pa_context*, pa_subscription_event_type_t event, std::uint32_t index,
                      void* self) {
  const int type = event & PA_SUBSCRIPTION_EVENT_TYPE_MASK;
  Picture& picture = ToPicture(self);
  switch (event & PA_SUBSCRIPTION_EVENT_FACILITY_MASK) {
    case PA_SUBSCRIPTION_EVENT_SERVER: return picture.questions_.AskForDefaultSink();
    case PA_SUBSCRIPTION_EVENT_SINK: return picture.OnSinkEvent(type, index);
    case PA_SUBSCRIPTION_EVENT_SINK_INPUT:
      if (type == PA_SUBSCRIPTION_EVENT_REMOVE) return picture.OnStreamRemoved(index);
      return picture.questions_.AskForStream(index);
    case PA_SUBSCRIPTION_EVENT_MODULE: return picture.WatchEntries();
    default: return;
  }
}

void Picture::OnEntriesChanged(pa_context*, void* self) {
  ToPicture(self).questions_.AskForEntriesLater();
}

void Picture::OnSinkEvent(int type, std::uint32_t index) {
  if (type == PA_SUBSCRIPTION_EVENT_NEW) return calls_.OpenStreams();  // those that had no sink
  if (!state_.defaultSink.Is(index) && !state_.defaultSink.WasLast(index)) return;
  if (type == PA_SUBSCRIPTION_EVENT_REMOVE) state_.defaultSink.OnRemoved();
  questions_.AskForDefaultSink();
}

/// A player corks its stream before it closes it: while the stream is being read, its closing may
/// not be known yet.
void Picture::OnStreamRemoved(std::uint32_t index) {
  const Stream* stream = state_.streams.Find(index);
  if (stream != nullptr && stream->isPlayer && stream->IsHeard() && !stream->isBeingRead &&
      !WasStreamJustReplaced()) {
    state_.interruptions.OnKilled(index, stream->sink);
  }
  state_.streams.Remove(index);
  if (state_.interruptions.Update()) questions_.AskForStreams();
}

void Picture::OnCallKilled(std::uint32_t index) {
  const Stream* stream = state_.streams.Find(index);
  state_.interruptions.OnKilled(index, stream != nullptr ? stream->sink : PA_INVALID_INDEX);
  questions_.AskForStreams();
}

}  // namespace Desktop
