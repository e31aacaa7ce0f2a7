#include "Pipeline.h"

#include "AudioSink.h"
#include "Streaming.h"
#include "native/PlayerError.h"

#include <chrono>

namespace Desktop {
namespace {

using Host::PlayerFailure;

/// An answer that takes longer, even on a slow device, isn't expected any more.
constexpr std::chrono::seconds kAnswerLimit{10};
constexpr std::chrono::milliseconds kGlance{200};
constexpr int kIdleGlances = 5;  // fewer may come of a busy machine

/// GstPlayFlags, which has no header: video as it is decoded, and audio; no subtitles, no
/// visualisation, no volume of our own.
constexpr int kNativeVideoAndAudio = 0x1 | 0x40 | 0x2;

/// \return a sink that shows nothing, in real time, and keeps the frame that it would show. It
/// takes frames in the system's memory only, so that they can be read whichever decoder makes them.
ElementPtr MakeVideoSink() {
  ElementPtr sink = MakeElement("appsink");
  const CapsPtr anyFrame(gst_caps_new_empty_simple("video/x-raw"));
  if (sink != nullptr) {
    g_object_set(sink.get(), "caps", anyFrame.get(), "max-buffers", 1, "drop", TRUE, "wait-on-eos",
                 FALSE, nullptr);
  }
  return sink;
}

}  // namespace

Pipeline::~Pipeline() {
  if (playbin_ != nullptr) gst_element_set_state(playbin_.get(), GST_STATE_NULL);
}

int Pipeline::Open(const char* path, GstElement* audioFilter) {
  if (const int error = Build(path, audioFilter)) return error;
  return Preroll() ? CheckStreams(path) : ReportOpenFailure(path);
}

int Pipeline::Build(const char* path, GstElement* audioFilter) {
  playbin_ = MakeElement("playbin");
  videoSink_ = MakeVideoSink();
  const ElementPtr audioSink = MakeAudioSink();
  if (playbin_ == nullptr || videoSink_ == nullptr || audioSink == nullptr ||
      audioFilter == nullptr) {
    return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "GStreamer's base plug-ins are missing");
  }
  GError* reason = nullptr;
  const TextPtr uri(gst_filename_to_uri(path, &reason));
  const ErrorPtr error(reason);
  if (uri == nullptr) {
    return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "\"%s\": %s", path,
                         error->message);
  }
  g_object_set(playbin_.get(), "uri", uri.get(), "flags", kNativeVideoAndAudio, "video-sink",
               videoSink_.get(), "audio-sink", audioSink.get(), "audio-filter", audioFilter,
               nullptr);
  gate_ = std::make_unique<KeyFrameGate>(playbin_.get());
  watch_ = std::make_unique<PipelineWatch>(playbin_.get());
  return PLAYER_ERROR_NONE;
}

bool Pipeline::Preroll() {
  using Answer = PipelineWatch::Answer;
  watch_->ExpectAnswer();
  if (gst_element_set_state(playbin_.get(), GST_STATE_PAUSED) == GST_STATE_CHANGE_FAILURE) {
    return false;
  }
  Answer answer = Answer::kNone;
  int idle = 0;
  for (std::chrono::milliseconds waited{0}; waited < kAnswerLimit; waited += kGlance) {
    // A demuxer that fails as soon as it is plugged in stops, and decodebin may swallow its error.
    idle = IsStreaming(playbin_.get()) ? 0 : idle + 1;
    answer = watch_->WaitForAnswer(kGlance);
    if (answer != Answer::kNone || idle == kIdleGlances) break;
  }
  return answer == Answer::kDone;
}

int Pipeline::ReportOpenFailure(const char* path) const {
  if (!watch_->HasFailed()) {
    const bool isTooSlow = IsStreaming(playbin_.get());
    return PlayerFailure(isTooSlow ? PLAYER_ERROR_IO : PLAYER_ERROR_INVALID_PARAMETER, __LINE__,
                         "\"%s\" can't be played: GStreamer %s", path,
                         isTooSlow ? "doesn't answer" : "gave up");
  }
  const PipelineWatch::Failure failure = watch_->GetFailure();
  return PlayerFailure(failure.atMedia ? PLAYER_ERROR_INVALID_PARAMETER : PLAYER_ERROR_IO, __LINE__,
                       "\"%s\" can't be played: %s", path, failure.reason.c_str());
}

/// A file may end before its first frame: that too is prerolled. Video that starts later than the
/// sound has none yet either.
int Pipeline::CheckStreams(const char* path) const {
  gboolean isVideoOver = FALSE;
  g_object_get(videoSink_.get(), "eos", &isVideoOver, nullptr);
  if (HasVideo() ? GetFrame() != nullptr || !isVideoOver : HasAudio()) return PLAYER_ERROR_NONE;
  return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "\"%s\" holds nothing to play",
                       path);
}

int Pipeline::ChangeState(GstState state) {
  if (const int error = Check()) return error;
  watch_->ExpectAnswer();
  switch (gst_element_set_state(playbin_.get(), state)) {
    case GST_STATE_CHANGE_ASYNC: return AwaitAnswer();
    case GST_STATE_CHANGE_FAILURE:
      if (const int error = Check()) return error;
      return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "GStreamer can't change to %s",
                           gst_element_state_get_name(state));
    default: return PLAYER_ERROR_NONE;
  }
}

int Pipeline::Move(FilmTime time, GstSeekFlags manner) {
  const auto flags = static_cast<GstSeekFlags>(manner | GST_SEEK_FLAG_FLUSH);
  watch_->ExpectAnswer();
  watch_->ForgetEnd();
  const bool isMoving = gst_element_seek_simple(playbin_.get(), GST_FORMAT_TIME, flags, time);
  if (isMoving) return AwaitAnswer();
  if (const int error = Check()) return error;
  return PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__, "the file can't be sought in");
}

int Pipeline::AwaitAnswer() {
  isTimedOut_ = watch_->WaitForAnswer(kAnswerLimit) == PipelineWatch::Answer::kNone;
  return Check();
}

int Pipeline::Check() const {
  if (watch_->HasFailed()) {
    return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the file can't be played on: %s",
                         watch_->GetFailure().reason.c_str());
  }
  if (isTimedOut_) return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "GStreamer doesn't answer");
  return PLAYER_ERROR_NONE;
}

int Pipeline::GetPosition(FilmTime* position) const {
  if (const int error = Check()) return error;
  // Of two sinks the pipeline asks the one that is ahead: sound may not have begun yet.
  const bool isKnown =
      HasVideo() && gst_element_query_position(videoSink_.get(), GST_FORMAT_TIME, position);
  return isKnown ? int(PLAYER_ERROR_NONE) : Query(gst_element_query_position, "position", position);
}

int Pipeline::GetDuration(FilmTime* duration) const {
  return Query(gst_element_query_duration, "duration", duration);
}

bool Pipeline::IsEmpty() const {
  FilmTime duration = 0;
  return gst_element_query_duration(playbin_.get(), GST_FORMAT_TIME, &duration) && duration == 0;
}

int Pipeline::Query(gboolean (*query)(GstElement*, GstFormat, gint64*), const char* what,
                    FilmTime* time) const {
  if (const int error = Check()) return error;
  if (query(playbin_.get(), GST_FORMAT_TIME, time) && *time >= 0) return PLAYER_ERROR_NONE;
  return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the %s isn't known", what);
}

/// A pipeline starts to play where its time began, which is now \p ahead.
void Pipeline::SetStart(FilmTime ahead) {
  gst_element_set_start_time(playbin_.get(), static_cast<GstClockTime>(ahead));
}

std::string Pipeline::FindDemuxer() const { return Desktop::FindDemuxer(playbin_.get()); }

std::optional<Shown> Pipeline::GetShown() const {
  const SamplePtr frame = GetFrame();
  if (frame == nullptr) return std::nullopt;
  const GstBuffer* buffer = gst_sample_get_buffer(frame.get());
  // A time stamp isn't a time in the film: edit lists and reordered frames shift it.
  const auto time = ConvertToFilmTime(*gst_sample_get_segment(frame.get()), GST_BUFFER_PTS(buffer));
  if (!time) return std::nullopt;
  return Shown{GST_BUFFER_PTS(buffer), *time,
               bool(GST_BUFFER_FLAG_IS_SET(buffer, GST_BUFFER_FLAG_CORRUPTED))};
}

FilmTime Pipeline::GetShift() const {
  const SamplePtr frame = GetFrame();
  if (frame == nullptr) return 0;
  const GstSegment* segment = gst_sample_get_segment(frame.get());
  return static_cast<FilmTime>(segment->start) - static_cast<FilmTime>(segment->time);
}

TagsPtr Pipeline::GetVideoTags() const {
  GstTagList* tags = nullptr;
  g_signal_emit_by_name(playbin_.get(), "get-video-tags", 0, &tags);
  return TagsPtr(tags);
}

TextPtr Pipeline::GetUri() const {
  gchar* uri = nullptr;
  g_object_get(playbin_.get(), "current-uri", &uri, nullptr);
  return TextPtr(uri);
}

gint Pipeline::CountStreams(const char* property) const {
  gint streams = 0;
  g_object_get(playbin_.get(), property, &streams, nullptr);
  return streams;
}

SamplePtr Pipeline::GetFrame() const {
  GstSample* frame = nullptr;
  g_object_get(playbin_.get(), "sample", &frame, nullptr);
  return SamplePtr(frame);
}

}  // namespace Desktop
