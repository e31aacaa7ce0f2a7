#include "Picture.h"

#include "Log.h"
#include "Session.h"

#include <cstring>
#include <utility>

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
  return connection_.Await(lock, limit, [this] { return isComplete_; });
}

int Picture::Refresh(Connection::Lock& lock, Connection::Time limit) {
  if (const int error = Await(lock, limit)) return error;
  AskForServer();
  if (isPipeWire_) AskForEntries();  // no event tells of them
  for (int turn = 0; turn < 2; ++turn) {
    const auto isAnswered = [this, asked = asked_] { return answered_ >= asked; };
    if (const int error = connection_.Await(lock, limit, isAnswered)) return error;
  }
  return SOUND_MANAGER_ERROR_NONE;
}

int Picture::Settle(Connection::Lock& lock, Connection::Time limit) {
  if (const int error = Refresh(lock, limit)) return error;
  return connection_.Await(lock, limit, [this] { return !IsWaiting(); });
}

void Picture::OnConnected(pa_context* context) {
  pa_context_set_subscribe_callback(context, OnEvent, this);
  pa_ext_stream_restore_set_subscribe_cb(context, OnEntriesChanged, this);
  volumes_.Begin();
  Forget(pa_context_subscribe(context, kWatched, nullptr, nullptr));
  AskForServer();
  AskForDefaultSink();
  WatchEntries();
  AskForStreams();
  calls_.OpenStreams();
}

void Picture::OnDisconnected(bool isLost) {
  isComplete_ = areEntriesDue_ = areStreamsRead_ = false;
  answered_ = asked_;  // what is on the way won't be answered
  streams_.Clear();
  defaultSink_.OnServerLost();
  calls_.DropStreams();
  if (isLost) interruptions_.OnServerLost();
}

/// A question that couldn't be asked isn't waited for: the connection is about to end.
void Picture::Ask(pa_operation* operation) {
  if (OperationPtr(operation) != nullptr) ++asked_;
}

void Picture::AskForServer() {
  Ask(pa_context_get_server_info(connection_.GetContext(), OnServer, this));
}

void Picture::AskForDefaultSink() {
  Ask(pa_context_get_sink_info_by_name(connection_.GetContext(), DefaultSink::kName, OnDefaultSink,
                                       this));
}

/// What happens to a stream before its answer is sent is in the answer: one question at a time will
/// do.
void Picture::AskForStream(std::uint32_t index) {
  Stream* stream = streams_.Find(index);
  if (stream != nullptr && std::exchange(stream->isBeingRead, true)) return;
  Ask(pa_context_get_sink_input_info(connection_.GetContext(), index, OnStream, this));
}

void Picture::AskForStreams() {
  if (std::exchange(areStreamsRead_, true)) return;
  Ask(pa_context_get_sink_input_info_list(connection_.GetContext(), OnStreams, this));
}

void Picture::AskForEntries() {
  areEntriesDue_ = false;
  Ask(pa_ext_stream_restore_read(connection_.GetContext(), OnEntry, this));
}

/// Without the module that keeps volumes this is refused, so it is done again when modules come.
void Picture::WatchEntries() {
  Forget(pa_ext_stream_restore_subscribe(connection_.GetContext(), true, nullptr, nullptr));
  AskForEntries();
}

void Picture::OnAnswered() {
  ++answered_;
  connection_.NotifyProgress();
  if (IsWaiting()) return;
  isComplete_ = true;
  if (areEntriesDue_) AskForEntries();
}

void Picture::OnServer(pa_context*, const pa_server_info* info, void* self) {
  Picture& picture = ToPicture(self);
  const char* name = info != nullptr ? info->server_name : nullptr;
  const bool wasPipeWire = picture.isPipeWire_;
  picture.isPipeWire_ = name != nullptr && std::strstr(name, "PipeWire") != nullptr;
  if (picture.isPipeWire_ && !wasPipeWire) {
    LogChange("PipeWire doesn't tell when stored volumes change: only streams tell of theirs.");
  }
  if (picture.areEntriesDue_) picture.AskForEntries();  // somebody waits for them
  picture.OnAnswered();
}

void Picture::OnDefaultSink(pa_context*, const pa_sink_info* info, int end, void* self) {
  Picture& picture = ToPicture(self);
  if (info != nullptr) return picture.defaultSink_.Put(*info);
  if (end < 0) picture.defaultSink_.Clear();
  picture.OnAnswered();
}

void Picture::OnStream(pa_context*, const pa_sink_input_info* info, int, void* self) {
  Picture& picture = ToPicture(self);
  if (info != nullptr) return picture.PutStream(*info);
  picture.UpdateInterruptions();
  picture.OnAnswered();
}

void Picture::OnStreams(pa_context*, const pa_sink_input_info* info, int, void* self) {
  Picture& picture = ToPicture(self);
  if (info != nullptr) return picture.PutStream(*info);
  picture.areStreamsRead_ = false;
  picture.interruptions_.Settle();
  picture.OnAnswered();
}

void Picture::OnEntry(pa_context*, const pa_ext_stream_restore_info* info, int end, void* self) {
  Picture& picture = ToPicture(self);
  if (info != nullptr) return picture.volumes_.OnEntry(*info);
  picture.volumes_.OnEndOfEntries(end > 0);
  picture.OnAnswered();
}

void Picture::PutStream(const pa_sink_input_info& info) {
  const Stream* known = streams_.Find(info.index);
  const bool wasKnown = known != nullptr && known->isVolumeKnown;
  const int before = wasKnown ? known->volume.GetLevel() : 0;
  const Stream& stream = streams_.Put(info, isPipeWire_);
  if (stream.category == kNoCategory || !wasKnown) return;
  if (stream.volume.GetLevel() != before) volumes_.OnStreamMoved(stream);
}

void Picture::OnEvent(pa_context*, pa_subscription_event_type_t event, std::uint32_t index,
                      void* self) {
  const int type = event & PA_SUBSCRIPTION_EVENT_TYPE_MASK;
  Picture& picture = ToPicture(self);
  switch (event & PA_SUBSCRIPTION_EVENT_FACILITY_MASK) {
    case PA_SUBSCRIPTION_EVENT_SERVER: return picture.AskForDefaultSink();
    case PA_SUBSCRIPTION_EVENT_SINK: return picture.OnSinkEvent(type, index);
    case PA_SUBSCRIPTION_EVENT_SINK_INPUT:
      if (type == PA_SUBSCRIPTION_EVENT_REMOVE) return picture.OnStreamRemoved(index);
      return picture.AskForStream(index);
    case PA_SUBSCRIPTION_EVENT_MODULE: return picture.WatchEntries();
    default: return;
  }
}

/// While streams are being asked, their answers are likely to tell the same. The question makes
/// work for the server, which somebody who drags a slider would feel.
void Picture::OnEntriesChanged(pa_context*, void* self) {
  Picture& picture = ToPicture(self);
  picture.areEntriesDue_ = true;
  if (!picture.IsWaiting()) picture.AskForEntries();
}

void Picture::OnSinkEvent(int type, std::uint32_t index) {
  if (type == PA_SUBSCRIPTION_EVENT_NEW) return calls_.OpenStreams();  // those that had no sink
  if (!defaultSink_.Is(index) && !defaultSink_.WasLast(index)) return;
  if (type == PA_SUBSCRIPTION_EVENT_REMOVE) defaultSink_.OnRemoved();
  AskForDefaultSink();
}

/// A player corks its stream before it closes it: while the stream is being read, its closing may
/// not be known yet.
void Picture::OnStreamRemoved(std::uint32_t index) {
  const Stream* stream = streams_.Find(index);
  if (stream != nullptr && stream->isPlayer && stream->IsHeard() && !stream->isBeingRead &&
      !WasStreamJustReplaced()) {
    interruptions_.OnKilled(index, stream->sink);
  }
  streams_.Remove(index);
  UpdateInterruptions();
}

void Picture::OnCallKilled(std::uint32_t index) {
  const Stream* stream = streams_.Find(index);
  interruptions_.OnKilled(index, stream != nullptr ? stream->sink : PA_INVALID_INDEX);
  AskForStreams();
}

void Picture::UpdateInterruptions() {
  if (interruptions_.Update()) AskForStreams();
}

}  // namespace Desktop
