// What the server tells the device: events, and answers to the questions that they raise. All of it
// runs on the loop's thread. Events carry no values, so each is followed by a question.

#include "Device.h"
#include "Log.h"
#include "Session.h"

#include <cstring>
#include <utility>

namespace Desktop {
namespace {

constexpr auto kWatched = static_cast<pa_subscription_mask_t>(
    PA_SUBSCRIPTION_MASK_SERVER | PA_SUBSCRIPTION_MASK_SINK | PA_SUBSCRIPTION_MASK_SINK_INPUT |
    PA_SUBSCRIPTION_MASK_MODULE);

/// How long what is hardly news may wait to be asked for.
constexpr std::chrono::milliseconds kLater{10};

Device& ToDevice(void* self) { return *static_cast<Device*>(self); }

/// For a request whose answer is of no interest.
void Forget(pa_operation* operation) { OperationPtr{operation}; }

}  // namespace

void Device::OnConnected(pa_context* context) {
  pa_context_set_subscribe_callback(context, OnEvent, this);
  pa_ext_stream_restore_set_subscribe_cb(context, OnStoredVolumesChanged, this);
  Forget(pa_context_subscribe(context, kWatched, nullptr, nullptr));
  questions_.Ask(pa_context_get_server_info(context, OnServer, this));
  AskForOutput();
  AskForChangesOfVolumes();
  questions_.Ask(pa_context_get_sink_input_info_list(context, OnStream, this));
  OpenCalls();
}

void Device::OnDisconnected(bool isLost) {
  isComplete_ = false;
  questions_.Forget();
  areVolumesDue_ = false;
  later_.Stop();
  streams_.Clear();
  output_.OnNone();
  for (auto& [number, call] : calls_) call.Drop();
  if (isLost) interruptions_.OnServerLost();
  loop_.NotifyProgress();
}

void Device::OpenCalls() {
  for (auto& [number, call] : calls_) call.Open(connection_.GetContext());
}

void Device::AskForOutput() {
  questions_.Ask(
      pa_context_get_sink_info_by_name(connection_.GetContext(), Output::kName, OnOutput, this));
}

/// What happens to a stream before its answer is sent is in the answer: one question at a time will do.
void Device::AskForStream(std::uint32_t index) {
  Stream* stream = streams_.Find(index);
  if (stream != nullptr && stream->isBeingRead) return;
  const bool isAsked = questions_.Ask(
      pa_context_get_sink_input_info(connection_.GetContext(), index, OnStream, this));
  if (stream != nullptr) stream->isBeingRead = isAsked;
}

void Device::AskForVolumes() {
  areVolumesDue_ = false;
  // PipeWire acknowledges a write before it can be read, and so would seem to take it back.
  if (isPipeWire_ && isComplete_) return;
  questions_.Ask(pa_ext_stream_restore_read(connection_.GetContext(), OnVolume, this));
}

/// While streams are being asked, their answers are likely to tell the same. The question makes work
/// for the server, which somebody who drags a slider would feel.
void Device::AskForVolumesSoon() {
  if (questions_.AreAllAnswered()) return AskForVolumes();
  areVolumesDue_ = true;
  later_.Start(kLater);
}

void Device::AskLater() {
  if (areVolumesDue_) AskForVolumes();
  for (const auto& [index, stream] : streams_.All()) {
    if (stream.isToBeRead) AskForStream(index);
  }
}

/// Without the module that keeps volumes this is refused, so it is asked again when modules come.
void Device::AskForChangesOfVolumes() {
  Forget(pa_ext_stream_restore_subscribe(connection_.GetContext(), true, nullptr, nullptr));
  AskForVolumes();
}

void Device::OnAnswered() {
  questions_.OnAnswered();
  if (questions_.AreAllAnswered()) isComplete_ = true;
  loop_.NotifyProgress();
}

void Device::OnEvent(pa_context*, pa_subscription_event_type_t event, std::uint32_t index,
                     void* self) {
  constexpr int kFacility = PA_SUBSCRIPTION_EVENT_FACILITY_MASK;
  const int type = event & PA_SUBSCRIPTION_EVENT_TYPE_MASK;
  Device& device = ToDevice(self);
  switch (event & kFacility) {
    case PA_SUBSCRIPTION_EVENT_SERVER: return device.AskForOutput();
    case PA_SUBSCRIPTION_EVENT_SINK: return device.OnSinkEvent(type, index);
    case PA_SUBSCRIPTION_EVENT_SINK_INPUT: return device.OnStreamEvent(type, index);
    case PA_SUBSCRIPTION_EVENT_MODULE: return device.AskForChangesOfVolumes();
    default: return;
  }
}

void Device::OnStoredVolumesChanged(pa_context*, void* self) {
  Device& device = ToDevice(self);
  if (device.ownWrites_ > 0) {
    --device.ownWrites_;  // what it changes will be known from the answer
  } else {
    device.AskForVolumesSoon();
  }
}

void Device::OnSinkEvent(int type, std::uint32_t index) {
  if (type == PA_SUBSCRIPTION_EVENT_NEW) return OpenCalls();  // those that had no sink
  if (!output_.Is(index)) return;
  if (type == PA_SUBSCRIPTION_EVENT_REMOVE) output_.OnRemoved();
  AskForOutput();
}

void Device::OnStreamEvent(int type, std::uint32_t index) {
  if (type == PA_SUBSCRIPTION_EVENT_REMOVE) return OnStreamRemoved(index);
  Stream* stream = streams_.Find(index);
  if (stream != nullptr && std::exchange(stream->isEchoDue, false)) {
    stream->isToBeRead = true;  // another program may have changed it at the same moment
    return later_.Start(kLater);
  }
  AskForStream(index);
  // Not at once, because waking threads up takes time: the server has its question first.
  loop_.ExpectAnswer([this] { reports_.ExpectLevel(); });
}

void Device::OnStreamRemoved(std::uint32_t index) {
  // A player corks its stream before it closes it, but a server that has both to tell at once leaves
  // the corking out.
  const Stream* stream = streams_.Find(index);
  if (stream != nullptr && stream->isPlayer && stream->IsHeard() && !stream->isBeingRead &&
      !stream->isToBeRead && !WasStreamJustReplaced()) {
    reports_.ReportInterruption(kTakenOver);
  }
  streams_.Remove(index);
  interruptions_.Update();
}

void Device::OnServer(pa_context*, const pa_server_info* info, void* self) {
  Device& device = ToDevice(self);
  const char* name = info != nullptr ? info->server_name : nullptr;
  const bool wasPipeWire = device.isPipeWire_;
  device.isPipeWire_ = name != nullptr && std::strstr(name, "PipeWire") != nullptr;
  if (device.isPipeWire_ && !wasPipeWire) {
    LogChange("PipeWire doesn't tell when stored volumes change: only streams tell of theirs.");
  }
  device.OnAnswered();
}

void Device::OnOutput(pa_context*, const pa_sink_info* info, int end, void* self) {
  Device& device = ToDevice(self);
  if (info != nullptr) return device.output_.OnTold(*info);
  if (end < 0) device.output_.OnNone();
  device.OnAnswered();
}

void Device::OnStream(pa_context*, const pa_sink_input_info* info, int, void* self) {
  Device& device = ToDevice(self);
  if (info != nullptr) return device.PutStream(*info);
  device.OnAnswered();
}

void Device::PutStream(const pa_sink_input_info& info) {
  const Stream* known = streams_.Find(info.index);
  Stream stream = streams_.Describe(info);
  // PipeWire acknowledges a volume before it tells of it.
  if (isPipeWire_ && known != nullptr && known->isEchoDue) {
    stream.volume = known->volume;
    stream.isEchoDue = true;
  }
  const bool isMoved = known != nullptr && known->GetLevel() != stream.GetLevel();
  streams_.Put(info.index, stream);
  if (isMoved) volumes_.OnStreamMoved(stream, !isPipeWire_ && stream.hasStoredVolume);
  interruptions_.Update();
}

void Device::OnVolume(pa_context*, const pa_ext_stream_restore_info* info, int end, void* self) {
  Device& device = ToDevice(self);
  if (info != nullptr) return device.volumes_.OnEntry(*info);
  if (!device.volumes_.OnEndOfEntries(end > 0)) device.AskForVolumes();
  device.OnAnswered();
}

}  // namespace Desktop
