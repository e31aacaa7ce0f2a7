#include "Playback.h"

#include "../media/PlayerError.h"
#include "AudioSink.h"
#include "Frame.h"
#include "Streaming.h"
#include "effects/RenderAudio.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <cstring>

namespace Desktop {
namespace {

using Host::PlayerFailure;

/// Longer than any answer takes that still comes, on a slow device too.
constexpr std::chrono::seconds kAnswerLimit{10};
constexpr std::chrono::milliseconds kGlance{200};

/// Of an asked millisecond nearly the whole counts, so that a position, which is reported without
/// its fraction, leads back to its frame. Not quite the whole, because demuxers round.
constexpr GstClockTime kWithinMillisecond = 900 * GST_USECOND;

/// GstPlayFlags, which has no header: video as it is decoded, and audio; no subtitles, no
/// visualisation, no volume of our own.
constexpr int kNativeVideoAndAudio = 0x1 | 0x40 | 0x2;

constexpr GstSeekFlags kExact = GST_SEEK_FLAG_ACCURATE;

/// Only the key frame is decoded. Without trick mode, a target that is a key frame itself is often
/// missed by a frame when there is sound, and then a whole group of pictures is decoded.
constexpr auto kToKeyFrame =
    static_cast<GstSeekFlags>(GST_SEEK_FLAG_KEY_UNIT | GST_SEEK_FLAG_TRICKMODE_KEY_UNITS);

long ToMilliseconds(GstClockTime time) { return static_cast<long>(GST_TIME_AS_MSECONDS(time)); }

/// Refuses what can't be media, before a pipeline waits for it.
int CheckFile(const char* path) {
  struct stat status;
  if (stat(path, &status) != 0) {
    const int reason = errno;
    const bool isMissing = reason == ENOENT || reason == ENOTDIR;
    return PlayerFailure(isMissing ? PLAYER_ERROR_NO_SUCH_FILE : PLAYER_ERROR_IO, __LINE__,
                         "\"%s\": %s", path, std::strerror(reason));
  }
  if (!S_ISREG(status.st_mode)) {
    return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "\"%s\" is not a plain file",
                         path);
  }
  if (access(path, R_OK) != 0) {
    return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "\"%s\": %s", path, std::strerror(errno));
  }
  return PLAYER_ERROR_NONE;
}

/// \return a sink that shows nothing, in real time, and keeps the frame that it would show. It
/// takes frames in the system's memory only, so that they can be read whichever decoder makes them.
ElementPtr MakeVideoSink() {
  ElementPtr sink = MakeElement("appsink");
  const CapsPtr anyFrame(gst_caps_new_empty_simple("video/x-raw"));
  if (sink != nullptr) {
    g_object_set(sink.get(), "caps", anyFrame.get(), "max-buffers", 1, "drop", TRUE, nullptr);
  }
  return sink;
}

}  // namespace

Playback::Playback(const SharedSettings& effects) : settings_(effects), effects_(effects) {}

Playback::~Playback() {
  // Ends the streaming threads, which use the probe, the watch and the effects.
  if (pipeline_ != nullptr) gst_element_set_state(pipeline_.get(), GST_STATE_NULL);
}

int Playback::Open(const char* path) {
  if (const int error = CheckFile(path)) return error;
  if (const int error = Build(path)) return error;
  return Preroll() ? CheckStreams(path) : ReportOpenFailure(path);
}

bool Playback::Preroll() {
  using Answer = PipelineWatch::Answer;
  watch_->ExpectAnswer();
  if (gst_element_set_state(pipeline_.get(), GST_STATE_PAUSED) == GST_STATE_CHANGE_FAILURE) {
    return false;
  }
  Answer answer = Answer::kNone;
  for (std::chrono::milliseconds waited{0}; waited < kAnswerLimit; waited += kGlance) {
    // A demuxer that fails as soon as it is plugged in stops, and decodebin may swallow its error.
    const bool isStreaming = IsStreaming(pipeline_.get());
    answer = watch_->WaitForAnswer(kGlance);
    if (answer != Answer::kNone || !isStreaming) break;
  }
  return answer == Answer::kDone;
}

int Playback::Build(const char* path) {
  pipeline_ = MakeElement("playbin");
  const ElementPtr videoSink = MakeVideoSink();
  const ElementPtr audioSink = MakeAudioSink();
  if (pipeline_ == nullptr || videoSink == nullptr || audioSink == nullptr ||
      effects_.GetElement() == nullptr) {
    return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "GStreamer's base plug-ins are missing");
  }
  GError* reason = nullptr;
  const TextPtr uri(gst_filename_to_uri(path, &reason));
  const ErrorPtr error(reason);
  if (uri == nullptr) {
    return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "\"%s\": %s", path,
                         error->message);
  }
  g_object_set(pipeline_.get(), "uri", uri.get(), "flags", kNativeVideoAndAudio, "video-sink",
               videoSink.get(), "audio-sink", audioSink.get(), "audio-filter",
               effects_.GetElement(), nullptr);
  probe_ = std::make_unique<KeyFrameProbe>(pipeline_.get());
  watch_ = std::make_unique<PipelineWatch>(pipeline_.get());
  return PLAYER_ERROR_NONE;
}

int Playback::ReportOpenFailure(const char* path) const {
  if (!watch_->HasFailed()) {
    const bool isTooSlow = IsStreaming(pipeline_.get());
    return PlayerFailure(isTooSlow ? PLAYER_ERROR_IO : PLAYER_ERROR_INVALID_PARAMETER, __LINE__,
                         "\"%s\" can't be played: GStreamer %s", path,
                         isTooSlow ? "doesn't answer" : "gave up");
  }
  const PipelineWatch::Failure failure = watch_->GetFailure();
  return PlayerFailure(failure.atMedia ? PLAYER_ERROR_INVALID_PARAMETER : PLAYER_ERROR_IO, __LINE__,
                       "\"%s\" can't be played: %s", path, failure.reason.c_str());
}

/// A file may end before its first frame: that too is prerolled.
int Playback::CheckStreams(const char* path) const {
  if (HasVideo() ? GetFrame() != nullptr : HasAudio()) return PLAYER_ERROR_NONE;
  return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "\"%s\" holds nothing to play",
                       path);
}

int Playback::Play() {
  if (isPlaying_) return Check();
  if (const int error = LeaveTrickMode()) return error;
  const int error = ChangeState(GST_STATE_PLAYING);
  isPlaying_ = error == PLAYER_ERROR_NONE;
  return error;
}

int Playback::Pause() {
  const int error = ChangeState(GST_STATE_PAUSED);
  isPlaying_ = false;
  return error;
}

int Playback::Seek(long position, bool exact) {
  if (const int error = CheckSeek(position)) return error;
  const bool goesOn = isPlaying_;
  // Playing on meanwhile would leave the place that was sought.
  if (goesOn) {
    if (const int error = Pause()) return error;
  }
  const int error = Land(position, exact);
  if (!goesOn || IsBroken()) return error;
  const int playError = Play();
  return error == PLAYER_ERROR_NONE ? playError : error;
}

int Playback::Land(long position, bool exact) {
  const auto target = static_cast<GstClockTime>(position) * GST_MSECOND + kWithinMillisecond;
  if (const int error = Move(target, exact ? kExact : kToKeyFrame)) return error;
  landed_.reset();
  isKeyFrame_ = false;
  const SamplePtr shown = GetFrame();
  if (shown == nullptr) {
    if (exact) return PLAYER_ERROR_NONE;  // at the very end there is none
    return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the file holds no frame near %ld ms",
                         position);
  }
  const GstClockTime stamp = GST_BUFFER_PTS(gst_sample_get_buffer(shown.get()));
  isKeyFrame_ = probe_->IsKeyFrame(stamp);
  if (!exact) {
    // A time stamp isn't a time in the film: edit lists and reordered frames shift it.
    landed_ =
        gst_segment_to_stream_time(gst_sample_get_segment(shown.get()), GST_FORMAT_TIME, stamp);
  }
  return PLAYER_ERROR_NONE;
}

int Playback::CheckSeek(long position) const {
  if (const int error = Check()) return error;
  if (!HasVideo()) {
    return PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__, "the file has no video");
  }
  long duration = 0;
  if (const int error = GetDuration(&duration)) return error;
  if (position < 0 || position > duration) {
    return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__,
                         "%ld ms is not between 0 and the duration of %ld ms", position, duration);
  }
  return PLAYER_ERROR_NONE;
}

int Playback::LeaveTrickMode() {
  if (!landed_) return Check();
  if (const int error = Move(*landed_, kExact)) return error;
  landed_.reset();
  return PLAYER_ERROR_NONE;
}

int Playback::Move(GstClockTime position, GstSeekFlags manner) {
  const auto flags = static_cast<GstSeekFlags>(manner | GST_SEEK_FLAG_FLUSH);
  watch_->ExpectAnswer();
  const bool isMoving = gst_element_seek_simple(pipeline_.get(), GST_FORMAT_TIME, flags,
                                                static_cast<gint64>(position));
  if (isMoving) return AwaitAnswer();
  if (const int error = Check()) return error;
  return PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__, "the file can't be sought in");
}

int Playback::ChangeState(GstState state) {
  if (const int error = Check()) return error;
  watch_->ExpectAnswer();
  switch (gst_element_set_state(pipeline_.get(), state)) {
    case GST_STATE_CHANGE_ASYNC: return AwaitAnswer();
    case GST_STATE_CHANGE_FAILURE:
      if (const int error = Check()) return error;
      return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "GStreamer can't change to %s",
                           gst_element_state_get_name(state));
    default: return PLAYER_ERROR_NONE;
  }
}

int Playback::AwaitAnswer() {
  isTimedOut_ = watch_->WaitForAnswer(kAnswerLimit) == PipelineWatch::Answer::kNone;
  return Check();
}

int Playback::Check() const {
  if (watch_->HasFailed()) {
    return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the file can't be played on: %s",
                         watch_->GetFailure().reason.c_str());
  }
  if (isTimedOut_) return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "GStreamer doesn't answer");
  return PLAYER_ERROR_NONE;
}

int Playback::GetPosition(long* position) const {
  gint64 time = 0;
  if (const int error = Query(gst_element_query_position, "position", &time)) return error;
  *position = landed_ ? ToMilliseconds(*landed_) : ToMilliseconds(static_cast<GstClockTime>(time));
  return PLAYER_ERROR_NONE;
}

int Playback::GetDuration(long* duration) const {
  gint64 time = 0;
  if (const int error = Query(gst_element_query_duration, "duration", &time)) return error;
  *duration = ToMilliseconds(static_cast<GstClockTime>(time));
  return PLAYER_ERROR_NONE;
}

int Playback::Query(gboolean (*query)(GstElement*, GstFormat, gint64*), const char* what,
                    gint64* time) const {
  if (const int error = Check()) return error;
  if (query(pipeline_.get(), GST_FORMAT_TIME, time) && *time >= 0) return PLAYER_ERROR_NONE;
  return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the %s isn't known", what);
}

int Playback::CaptureFrame(player_frame_cb callback, void* userData) const {
  if (const int error = Check()) return error;
  if (!HasVideo()) {
    return PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__, "the file has no video");
  }
  const SamplePtr frame = GetFrame();
  if (frame == nullptr) {
    return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "there is no frame at the position");
  }
  return HandOver(frame.get(), callback, userData);
}

int Playback::RenderAudio(const char* path) const {
  if (const int error = Check()) return error;
  if (!HasAudio()) {
    return PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__, "the file has no sound");
  }
  gchar* uri = nullptr;
  g_object_get(pipeline_.get(), "current-uri", &uri, nullptr);
  return Desktop::RenderAudio(TextPtr(uri).get(), settings_.Get(), path);
}

bool Playback::HasAudio() const {
  gint streams = 0;
  g_object_get(pipeline_.get(), "n-audio", &streams, nullptr);
  return streams > 0;
}

bool Playback::HasVideo() const {
  gint streams = 0;
  g_object_get(pipeline_.get(), "n-video", &streams, nullptr);
  return streams > 0;
}

SamplePtr Playback::GetFrame() const {
  GstSample* frame = nullptr;
  g_object_get(pipeline_.get(), "sample", &frame, nullptr);
  return SamplePtr(frame);
}

}  // namespace Desktop
