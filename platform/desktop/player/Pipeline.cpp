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
  return MakeElement("appsink caps=video/x-raw max-buffers=1 drop=true wait-on-eos=false");
}

ElementPtr MakePlaybin(const char* path, GstElement* videoSink, GstElement* audioFilter) {
  ElementPtr playbin = MakeElement("playbin");
  const ElementPtr audioSink = MakeAudioSink();
  if (playbin == nullptr || videoSink == nullptr || audioSink == nullptr ||
      audioFilter == nullptr) {
    throw PlayerFailure(PLAYER_ERROR_IO, __LINE__, "GStreamer's base plug-ins are missing");
  }
  GError* reason = nullptr;
  const TextPtr uri(gst_filename_to_uri(path, &reason));
  const ErrorPtr error(reason);
  if (uri == nullptr) {
    throw PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "\"%s\": %s", path,
                        error->message);
  }
  g_object_set(playbin.get(), "uri", uri.get(), "flags", kNativeVideoAndAudio, "video-sink",
               videoSink, "audio-sink", audioSink.get(), "audio-filter", audioFilter, nullptr);
  return playbin;
}

}  // namespace

Pipeline::Pipeline(const char* path, GstElement* audioFilter)
    : videoSink_(MakeVideoSink()), playbin_(MakePlaybin(path, videoSink_.get(), audioFilter)) {
  if (!Preroll()) FailToOpen(path);
  CheckStreams(path);
}

bool Pipeline::Preroll() {
  using Answer = PipelineWatch::Answer;
  watch_.ExpectAnswer();
  if (gst_element_set_state(playbin_.get(), GST_STATE_PAUSED) == GST_STATE_CHANGE_FAILURE) {
    return false;
  }
  Answer answer = Answer::kNone;
  int idle = 0;
  for (std::chrono::milliseconds waited{0}; waited < kAnswerLimit; waited += kGlance) {
    // A demuxer that fails as soon as it is plugged in stops, and decodebin may swallow its error.
    idle = IsStreaming(playbin_.get()) ? 0 : idle + 1;
    answer = watch_.WaitForAnswer(kGlance);
    if (answer != Answer::kNone || idle == kIdleGlances) break;
  }
  return answer == Answer::kDone;
}

void Pipeline::FailToOpen(const char* path) const {
  if (!watch_.HasFailed()) {
    const bool isTooSlow = IsStreaming(playbin_.get());
    throw PlayerFailure(isTooSlow ? PLAYER_ERROR_IO : PLAYER_ERROR_INVALID_PARAMETER, __LINE__,
                        "\"%s\" can't be played: GStreamer %s", path,
                        isTooSlow ? "doesn't answer" : "gave up");
  }
  const PipelineWatch::Failure failure = watch_.GetFailure();
  throw PlayerFailure(failure.atMedia ? PLAYER_ERROR_INVALID_PARAMETER : PLAYER_ERROR_IO, __LINE__,
                      "\"%s\" can't be played: %s", path, failure.reason.c_str());
}

/// A file may end before its first frame: that too is prerolled. Video that starts later than the
/// sound has none yet either.
void Pipeline::CheckStreams(const char* path) const {
  gboolean isVideoOver = FALSE;
  g_object_get(videoSink_.get(), "eos", &isVideoOver, nullptr);
  if (HasVideo() ? GetFrame() != nullptr || !isVideoOver : HasAudio()) return;
  throw PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "\"%s\" holds nothing to play",
                      path);
}

void Pipeline::ChangeState(GstState state) {
  Check();
  watch_.ExpectAnswer();
  switch (gst_element_set_state(playbin_.get(), state)) {
    case GST_STATE_CHANGE_ASYNC: return AwaitAnswer();
    case GST_STATE_CHANGE_FAILURE:
      Check();
      throw PlayerFailure(PLAYER_ERROR_IO, __LINE__, "GStreamer can't change to %s",
                          gst_element_state_get_name(state));
    default: return;
  }
}

void Pipeline::Move(FilmTime time, GstSeekFlags manner) {
  const auto flags = static_cast<GstSeekFlags>(manner | GST_SEEK_FLAG_FLUSH);
  watch_.ExpectAnswer();
  watch_.ForgetEnd();
  const bool isMoving = gst_element_seek_simple(playbin_.get(), GST_FORMAT_TIME, flags, time);
  if (isMoving) return AwaitAnswer();
  Check();
  throw PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__, "the file can't be sought in");
}

void Pipeline::AwaitAnswer() {
  isTimedOut_ = watch_.WaitForAnswer(kAnswerLimit) == PipelineWatch::Answer::kNone;
  Check();
}

void Pipeline::Check() const {
  if (watch_.HasFailed()) {
    throw PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the file can't be played on: %s",
                        watch_.GetFailure().reason.c_str());
  }
  if (isTimedOut_) throw PlayerFailure(PLAYER_ERROR_IO, __LINE__, "GStreamer doesn't answer");
}

FilmTime Pipeline::GetPosition() const {
  Check();
  // Of two sinks the pipeline asks the one that is ahead: sound may not have begun yet.
  FilmTime position = 0;
  const bool isKnown =
      HasVideo() && gst_element_query_position(videoSink_.get(), GST_FORMAT_TIME, &position);
  return isKnown ? position : Query(gst_element_query_position, "position");
}

FilmTime Pipeline::GetDuration() const { return Query(gst_element_query_duration, "duration"); }

bool Pipeline::IsEmpty() const {
  FilmTime duration = 0;
  return gst_element_query_duration(playbin_.get(), GST_FORMAT_TIME, &duration) && duration == 0;
}

FilmTime Pipeline::Query(gboolean (*query)(GstElement*, GstFormat, gint64*),
                         const char* what) const {
  Check();
  FilmTime time = 0;
  if (query(playbin_.get(), GST_FORMAT_TIME, &time) && time >= 0) return time;
  throw PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the %s isn't known", what);
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
