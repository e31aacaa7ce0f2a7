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

Questions& ToQuestions(void* self) { return *static_cast<Questions*>(self); }

Picture& ToPicture(void* self) { return *static_cast<Picture*>(self); }

/// For a request whose answer is of no interest.
void Forget(pa_operation* operation) { OperationPtr{operation}; }

}  // namespace

/// A question that couldn't be asked isn't waited for: the connection is about to end.
void Questions::Ask(pa_operation* operation) {
  if (OperationPtr(operation) != nullptr) ++asked_;
}

void Questions::AskForServer() {
  Ask(pa_context_get_server_info(connection_.GetContext(), OnServer, this));
}

void Questions::AskForDefaultSink() {
  Ask(pa_context_get_sink_info_by_name(connection_.GetContext(), DefaultSink::kName, OnDefaultSink,
                                       this));
}

/// What happens to a stream before its answer is sent is in the answer: one question at a time will
/// do.
void Questions::AskForStream(std::uint32_t index) {
  Stream* stream = state_.streams.Find(index);
  if (stream != nullptr && std::exchange(stream->isBeingRead, true)) return;
  Ask(pa_context_get_sink_input_info(connection_.GetContext(), index, OnStream, this));
}

void Questions::AskForStreams() {
  if (std::exchange(areStreamsRead_, true)) return;
  Ask(pa_context_get_sink_input_info_list(connection_.GetContext(), OnStreams, this));
}

void Questions::AskForEntries() {
  areEntriesDue_ = false;
  Ask(pa_ext_stream_restore_read(connection_.GetContext(), OnEntry, this));
}

/// While streams are being asked, their answers are likely to tell the same. The question makes
/// work for the server, which somebody who drags a slider would feel.
void Questions::AskForEntriesLater() {
  areEntriesDue_ = true;
  if (!IsWaiting()) AskForEntries();
}

void Questions::Drop() {
  isComplete_ = areEntriesDue_ = areStreamsRead_ = false;
  answered_ = asked_;
}

/// An answer may lead to another question.
int Questions::Await(Connection::Lock& lock, Connection::Time limit) {
  for (int turn = 0; turn < 2; ++turn) {
    const auto isAnswered = [this, asked = asked_] { return answered_ >= asked; };
    if (const int error = connection_.Await(lock, limit, isAnswered)) return error;
  }
  return SOUND_MANAGER_ERROR_NONE;
}

void Questions::OnAnswered() {
  ++answered_;
  connection_.NotifyProgress();
  if (IsWaiting()) return;
  isComplete_ = true;
  if (areEntriesDue_) AskForEntries();
}

void Questions::OnServer(pa_context*, const pa_server_info* info, void* self) {
  Questions& questions = ToQuestions(self);
  const char* name = info != nullptr ? info->server_name : nullptr;
  bool& isPipeWire = questions.state_.isPipeWire;
  const bool wasPipeWire = isPipeWire;
  isPipeWire = name != nullptr && std::strstr(name, "PipeWire") != nullptr;
  if (isPipeWire && !wasPipeWire) {
    LogChange("PipeWire doesn't tell when stored volumes change: only streams tell of theirs.");
  }
  if (questions.areEntriesDue_) questions.AskForEntries();  // somebody waits for them
  questions.OnAnswered();
}

void Questions::OnDefaultSink(pa_context*, const pa_sink_info* info, int end, void* self) {
  Questions& questions = ToQuestions(self);
  DefaultSink& defaultSink = questions.state_.defaultSink;
  if (info != nullptr) return defaultSink.Put(*info);
  if (end < 0) defaultSink.Clear();
  questions.OnAnswered();
}

void Questions::OnStream(pa_context*, const pa_sink_input_info* info, int, void* self) {
  Questions& questions = ToQuestions(self);
  if (info == nullptr) return questions.OnAnswered();
  const bool mayInterrupt = questions.PutStream(*info);
  if (mayInterrupt && questions.state_.interruptions.Update()) questions.AskForStreams();
}

void Questions::OnStreams(pa_context*, const pa_sink_input_info* info, int, void* self) {
  Questions& questions = ToQuestions(self);
  if (info != nullptr) {
    questions.PutStream(*info);
    return;
  }
  questions.areStreamsRead_ = false;
  questions.state_.interruptions.Settle();
  questions.OnAnswered();
}

void Questions::OnEntry(pa_context*, const pa_ext_stream_restore_info* info, int end, void* self) {
  Questions& questions = ToQuestions(self);
  Volumes& volumes = questions.state_.volumes;
  if (info != nullptr) return volumes.OnEntry(*info);
  volumes.OnEndOfEntries(end > 0);
  questions.OnAnswered();
}

/// \return whether something else is heard now
bool Questions::PutStream(const pa_sink_input_info& info) {
  const Stream* known = state_.streams.Find(info.index);
  const Stream before = known != nullptr ? *known : Stream{};
  const Stream& stream = state_.streams.Put(info, state_.isPipeWire);
  const bool hasMoved =
      before.isVolumeKnown && stream.volume.GetLevel() != before.volume.GetLevel();
  if (hasMoved && stream.category != kNoCategory) state_.volumes.OnStreamMoved(stream);
  return stream.IsHeard() != before.IsHeard() || stream.category != before.category;
}

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
