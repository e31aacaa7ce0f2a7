#include "Calls.h"

#include "Log.h"

#include <array>
#include <cstring>
#include <string>

namespace Desktop {
namespace {

constexpr pa_sample_spec kSilence = {PA_SAMPLE_S16NE, 8000, 1};

/// A second of silence, refilled by quarters. What is refilled at once decides how late the sink
/// may be: with halves the server asks it for no latency at all, and wakes up a thousand times a
/// second.
constexpr std::uint32_t kBytesPerSecond = 16000;
constexpr std::uint32_t kByDefault = UINT32_MAX;
constexpr pa_buffer_attr kBuffer = {kByDefault, kBytesPerSecond, 0, kBytesPerSecond / 4,
                                    kByDefault};

constexpr char kModeProperty[] = "zelkora.call.mode";
constexpr std::array<const char*, 3> kModeNames = {"voice", "ringtone", "media"};

PropertiesPtr DescribeMode(int mode) {
  const char* name = kModeNames[static_cast<std::size_t>(mode)];
  PropertiesPtr properties(pa_proplist_new());
  pa_proplist_sets(properties.get(), PA_PROP_MEDIA_ROLE, "phone");
  pa_proplist_sets(properties.get(), PA_PROP_MEDIA_NAME,
                   (std::string("zelkora call: ") + name).c_str());
  pa_proplist_sets(properties.get(), kModeProperty, name);
  return properties;
}

pa_operation* SendMode(pa_stream* stream, int mode, pa_stream_success_cb_t onAnswer, void* data) {
  return pa_stream_proplist_update(stream, PA_UPDATE_REPLACE, DescribeMode(mode).get(), onAnswer,
                                   data);
}

}  // namespace

int Calls::Open(Connection::Lock& lock, Connection::Time limit, int& number) {
  const int added = ++last_;
  calls_.try_emplace(added, *this);
  const int error = AwaitStream(lock, limit, added);
  if (error == SOUND_MANAGER_ERROR_NONE) {
    number = added;
  } else {
    End(added);
  }
  return error;
}

int Calls::Close(Connection::Lock& lock, Connection::Time limit, int number) {
  if (Find(number) == nullptr) return SOUND_MANAGER_ERROR_INVALID_PARAMETER;
  End(number);
  connection_.Await(lock, limit, [=] { return calls_.count(number) == 0; });
  return SOUND_MANAGER_ERROR_NONE;
}

int Calls::SetMode(Connection::Lock& lock, Connection::Time limit, int number, int mode) {
  if (Find(number) == nullptr) return SOUND_MANAGER_ERROR_INVALID_PARAMETER;
  if (const int error = AwaitStream(lock, limit, number)) return error;
  Batch batch(connection_);
  batch.WhenDone([=] {
    if (Call* call = Find(number)) call->mode = mode;
  });
  batch.AddOfStream([&](pa_stream_success_cb_t onAnswer, void* data) {
    return SendMode(Find(number)->stream.get(), mode, onAnswer, data);
  });
  const int error = batch.Await(lock, limit);
  const Call* call = Find(number);
  if (error == kTimedOut && call != nullptr && call->IsOpen()) {
    // The server may do it later; then it does this next.
    const OperationPtr undoing(SendMode(call->stream.get(), call->mode, nullptr, nullptr));
  }
  return error;
}

int Calls::GetMode(int number, int& mode) {
  const Call* call = Find(number);
  if (call == nullptr) return SOUND_MANAGER_ERROR_INVALID_PARAMETER;
  mode = call->mode;
  return SOUND_MANAGER_ERROR_NONE;
}

Calls::Call* Calls::Find(int number) {
  const auto found = calls_.find(number);
  return found == calls_.end() || !found->second.isWanted ? nullptr : &found->second;
}

/// Waits until a session's stream, opened if need be, is open. \return a native code
int Calls::AwaitStream(Connection::Lock& lock, Connection::Time limit, int number) {
  Find(number)->OpenStream(connection_.GetContext());
  const int error = connection_.Await(lock, limit, [=] {
    const Call* call = Find(number);
    return call == nullptr || !call->IsOpening();
  });
  if (error != SOUND_MANAGER_ERROR_NONE) return error;
  const Call* call = Find(number);
  if (call == nullptr) return SOUND_MANAGER_ERROR_INVALID_PARAMETER;
  return call->IsOpen() ? int{SOUND_MANAGER_ERROR_NONE} : ToErrorCode(call->error);
}

/// Ends a session. The server refuses to end a stream that it is still to make, and would keep it:
/// its end comes with its making then.
void Calls::End(int number) {
  Call* call = Find(number);
  if (call == nullptr) return;
  call->isWanted = false;
  if (call->IsOpen()) pa_stream_disconnect(call->stream.get());
  Sweep();
}

/// Forgets the sessions that have ended.
void Calls::Sweep() {
  for (auto at = calls_.begin(); at != calls_.end();) {
    const Call& call = at->second;
    const bool isOver = !call.isWanted && !call.IsOpening() && !call.IsOpen();
    at = isOver ? calls_.erase(at) : std::next(at);
  }
}

void Calls::OpenStreams() {
  for (auto& [number, call] : calls_) {
    if (call.isWanted) call.OpenStream(connection_.GetContext());
  }
}

void Calls::DropStreams() {
  for (auto& [number, call] : calls_) call.Drop();
  Sweep();
}

void Calls::Call::OpenStream(pa_context* context) {
  if (IsOpening() || IsOpen()) return;
  Drop();
  error = PA_OK;
  stream.reset(
      pa_stream_new_with_proplist(context, nullptr, &kSilence, nullptr, DescribeMode(mode).get()));
  if (stream == nullptr) {
    error = pa_context_errno(context);
    return;
  }
  pa_stream_set_state_callback(stream.get(), OnStateChanged, this);
  pa_stream_set_write_callback(stream.get(), OnWanted, this);
  if (pa_stream_connect_playback(stream.get(), nullptr, &kBuffer, PA_STREAM_NOFLAGS, nullptr,
                                 nullptr) < 0) {
    error = pa_context_errno(context);
  }
}

void Calls::Call::Drop() {
  index = PA_INVALID_INDEX;
  if (stream == nullptr) return;
  pa_stream_set_state_callback(stream.get(), nullptr, nullptr);
  pa_stream_set_write_callback(stream.get(), nullptr, nullptr);
  if (IsOpen()) pa_stream_disconnect(stream.get());
  stream.reset();
}

void Calls::OnStateChanged(pa_stream* stream, void* self) {
  auto& call = *static_cast<Call*>(self);
  Calls& calls = call.calls;
  if (call.IsOpen()) {
    call.index = pa_stream_get_index(stream);
    if (!call.isWanted) pa_stream_disconnect(stream);  // comes back here
  } else if (call.HasState(PA_STREAM_FAILED)) {
    calls.OnFailed(call);
  }
  calls.connection_.NotifyProgress();
  calls.Sweep();
}

void Calls::OnFailed(Call& call) {
  pa_context* context = pa_stream_get_context(call.stream.get());
  call.error = pa_context_errno(context);
  if (pa_context_get_state(context) != PA_CONTEXT_READY || !call.isWanted) return;
  const bool wasOpen = call.index != PA_INVALID_INDEX;
  if (!wasOpen) return;  // which is told to the caller
  LogFailure("The call session was ended", pa_strerror(call.error));
  owner_.OnCallKilled(call.index);
}

void Calls::OnWanted(pa_stream* stream, std::size_t size, void*) {
  void* data = nullptr;
  if (pa_stream_begin_write(stream, &data, &size) < 0 || data == nullptr) return;
  std::memset(data, 0, size);
  pa_stream_write(stream, data, size, nullptr, 0, PA_SEEK_RELATIVE);
}

}  // namespace Desktop
