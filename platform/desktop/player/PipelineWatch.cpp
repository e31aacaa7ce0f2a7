#include "PipelineWatch.h"

#include "AudioSink.h"

#include <gst/pbutils/pbutils.h>

#include <new>

namespace Desktop {
namespace {

bool IsAtMedia(const GError& error) {
  return error.domain == GST_STREAM_ERROR ||
         g_error_matches(&error, GST_CORE_ERROR, GST_CORE_ERROR_MISSING_PLUGIN);
}

}  // namespace

PipelineWatch::PipelineWatch(GstElement* pipeline) : bus_(gst_element_get_bus(pipeline)) {
  gst_bus_set_sync_handler(bus_.get(), OnMessage, this, nullptr);
}

PipelineWatch::~PipelineWatch() { gst_bus_set_sync_handler(bus_.get(), nullptr, nullptr, nullptr); }

void PipelineWatch::ExpectAnswer() {
  std::lock_guard lock(mutex_);
  if (answer_ != Answer::kFailed) answer_ = Answer::kNone;
}

PipelineWatch::Answer PipelineWatch::WaitForAnswer(std::chrono::milliseconds limit) {
  std::unique_lock lock(mutex_);
  answered_.wait_for(lock, limit, [this] { return answer_ != Answer::kNone; });
  return answer_;
}

bool PipelineWatch::WaitForEnd(std::chrono::milliseconds limit) {
  std::unique_lock lock(mutex_);
  return answered_.wait_for(lock, limit,
                            [this] { return hasEnded_ || answer_ == Answer::kFailed; });
}

bool PipelineWatch::HasEnded() const {
  std::lock_guard lock(mutex_);
  return hasEnded_;
}

void PipelineWatch::ForgetEnd() {
  std::lock_guard lock(mutex_);
  hasEnded_ = false;
}

bool PipelineWatch::HasFailed() const {
  std::lock_guard lock(mutex_);
  return answer_ == Answer::kFailed;
}

PipelineWatch::Failure PipelineWatch::GetFailure() const {
  std::lock_guard lock(mutex_);
  return failure_;
}

GstBusSyncReply PipelineWatch::OnMessage(GstBus*, GstMessage* message, gpointer watch) {
  try {
    static_cast<PipelineWatch*>(watch)->Read(message);
  } catch (const std::bad_alloc&) {
    // Only a text is lost: the answer was set before.
  }
  gst_message_unref(message);
  return GST_BUS_DROP;
}

void PipelineWatch::Read(GstMessage* message) {
  switch (GST_MESSAGE_TYPE(message)) {
    case GST_MESSAGE_ASYNC_DONE: SetDone(false); break;
    case GST_MESSAGE_EOS: SetDone(true); break;
    case GST_MESSAGE_ERROR: ReadError(message); break;
    case GST_MESSAGE_ELEMENT: ReadMissingPlugin(message); break;
    default: break;
  }
}

void PipelineWatch::ReadError(GstMessage* message) {
  if (IsReplacingStream(GST_MESSAGE_SRC(message))) return;
  GError* parsed = nullptr;
  gst_message_parse_error(message, &parsed, nullptr);
  const ErrorPtr error(parsed);
  std::lock_guard lock(mutex_);
  if (answer_ == Answer::kFailed) return;
  answer_ = Answer::kFailed;
  failure_.atMedia = IsAtMedia(*error);
  answered_.notify_all();
  failure_.reason = error->message;
  if (!missingPlugin_.empty()) failure_.reason += " (" + missingPlugin_ + " is missing)";
}

void PipelineWatch::ReadMissingPlugin(GstMessage* message) {
  if (!gst_is_missing_plugin_message(message)) return;
  const TextPtr description(gst_missing_plugin_message_get_description(message));
  std::lock_guard lock(mutex_);
  missingPlugin_ = description.get();
}

void PipelineWatch::SetDone(bool isEnd) {
  std::lock_guard lock(mutex_);
  if (answer_ == Answer::kFailed) return;
  answer_ = Answer::kDone;
  hasEnded_ = hasEnded_ || isEnd;
  answered_.notify_all();
}

}  // namespace Desktop
