#include "CallSession.h"

#include "Log.h"

#include <array>
#include <cstring>
#include <string>

namespace Desktop {
namespace {

constexpr pa_sample_spec kSilence = {PA_SAMPLE_S16NE, 8000, 1};

/// A second of silence, wanted by halves: what plays doesn't matter, but waking up does.
constexpr std::uint32_t kBytesPerSecond = 16000;
constexpr std::uint32_t kByDefault = UINT32_MAX;
constexpr pa_buffer_attr kBuffer = {kByDefault, kBytesPerSecond, 0, kBytesPerSecond / 2,
                                    kByDefault};

constexpr char kModeProperty[] = "zelkora.call.mode";
constexpr std::array<const char*, CallSession::kModes> kModeNames = {"voice", "ringtone", "media"};

PropertiesPtr DescribeMode(int mode) {
  const char* name = kModeNames[static_cast<std::size_t>(mode)];
  PropertiesPtr properties(pa_proplist_new());
  pa_proplist_sets(properties.get(), PA_PROP_MEDIA_ROLE, "phone");
  pa_proplist_sets(properties.get(), PA_PROP_MEDIA_NAME,
                   (std::string("zelkora call: ") + name).c_str());
  pa_proplist_sets(properties.get(), kModeProperty, name);
  return properties;
}

}  // namespace

void CallSession::Open(pa_context* context) {
  if (IsOpening() || IsOpen()) return;
  Drop();
  error_ = PA_OK;
  stream_.reset(
      pa_stream_new_with_proplist(context, nullptr, &kSilence, nullptr, DescribeMode(mode_).get()));
  if (stream_ == nullptr) {
    error_ = pa_context_errno(context);
    return;
  }
  pa_stream_set_state_callback(stream_.get(), OnStateChanged, this);
  pa_stream_set_write_callback(stream_.get(), OnWanted, this);
  if (pa_stream_connect_playback(stream_.get(), nullptr, &kBuffer, PA_STREAM_NOFLAGS, nullptr,
                                 nullptr) < 0) {
    error_ = pa_context_errno(context);
  }
}

void CallSession::Close() {
  wasOpen_ = false;
  if (IsOpening() || IsOpen()) pa_stream_disconnect(stream_.get());
}

void CallSession::Drop() {
  wasOpen_ = false;
  if (stream_ == nullptr) return;
  pa_stream_set_state_callback(stream_.get(), nullptr, nullptr);
  pa_stream_set_write_callback(stream_.get(), nullptr, nullptr);
  Close();
  stream_.reset();
}

void CallSession::SendMode(int mode, Batch& batch) {
  batch.AddOfStream([&](pa_stream_success_cb_t onAnswer, void* data) {
    return pa_stream_proplist_update(stream_.get(), PA_UPDATE_REPLACE, DescribeMode(mode).get(),
                                     onAnswer, data);
  });
}

void CallSession::OnStateChanged(pa_stream* stream, void* self) {
  auto& session = *static_cast<CallSession*>(self);
  const pa_stream_state_t state = pa_stream_get_state(stream);
  pa_context* context = pa_stream_get_context(stream);
  if (state == PA_STREAM_READY) session.wasOpen_ = true;
  if (state == PA_STREAM_FAILED) {
    session.error_ = pa_context_errno(context);
    const bool isServerThere = pa_context_get_state(context) == PA_CONTEXT_READY;
    if (isServerThere) {
      LogFailure(session.wasOpen_ ? "The call session was ended" : "The call session isn't opened",
                 pa_strerror(session.error_));
      if (session.wasOpen_) session.owner_.OnCallKilled();
    }
    session.wasOpen_ = false;
  }
  session.owner_.OnCallChanged();
}

void CallSession::OnWanted(pa_stream* stream, std::size_t size, void*) {
  void* data = nullptr;
  if (pa_stream_begin_write(stream, &data, &size) < 0 || data == nullptr) return;
  std::memset(data, 0, size);
  pa_stream_write(stream, data, size, nullptr, 0, PA_SEEK_RELATIVE);
}

}  // namespace Desktop
