#include "Questions.h"

#include "Log.h"

#include <cstring>
#include <utility>

namespace Desktop {
namespace {

Questions& ToQuestions(void* self) { return *static_cast<Questions*>(self); }

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
  if (info != nullptr) return questions.PutStream(*info);
  if (questions.state_.interruptions.Update()) questions.AskForStreams();
  questions.OnAnswered();
}

void Questions::OnStreams(pa_context*, const pa_sink_input_info* info, int, void* self) {
  Questions& questions = ToQuestions(self);
  if (info != nullptr) return questions.PutStream(*info);
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

void Questions::PutStream(const pa_sink_input_info& info) {
  const Stream* known = state_.streams.Find(info.index);
  const bool wasKnown = known != nullptr && known->isVolumeKnown;
  const int before = wasKnown ? known->volume.GetLevel() : 0;
  const Stream& stream = state_.streams.Put(info, state_.isPipeWire);
  if (stream.category == kNoCategory || !wasKnown) return;
  if (stream.volume.GetLevel() != before) state_.volumes.OnStreamMoved(stream);
}

}  // namespace Desktop
