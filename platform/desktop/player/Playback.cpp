#include "Playback.h"

#include "Frame.h"
#include "desktop/player/effects/RenderAudio.h"
#include "native/PlayerError.h"

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>

namespace Desktop {
namespace {

using Host::PlayerFailure;

/// Positions are told without the fraction of their millisecond: so a seek aims at its end, but for
/// what demuxers round.
constexpr FilmTime kWithinMillisecond = 900 * GST_USECOND;

long ToMilliseconds(FilmTime time) { return static_cast<long>(time / GST_MSECOND); }

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

int RefuseWithoutVideo(int line = __builtin_LINE()) {
  return PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, line, "the file has no video");
}

}  // namespace

Playback::Playback(const char* path, const SharedSettings& effects,
                   const std::atomic<int>& isUnwanted)
    : settings_(effects), effects_(effects), path_(path), film_(path, isUnwanted) {}

int Playback::Open() {
  if (const int error = CheckFile(path_.c_str())) return error;
  if (const int error = pipeline_.Open(path_.c_str(), effects_.GetElement())) return error;
  FilmTime first = 0;
  if (const int error = pipeline_.GetPosition(&first)) return error;
  film_.SetContainer(pipeline_.FindDemuxer(), first, pipeline_.GetShift());
  return PLAYER_ERROR_NONE;
}

int Playback::Play() {
  if (isPlaying_ && !IsAtEnd()) return pipeline_.Check();
  if (const int error = IsAtEnd() ? Rewind() : LeaveLanding()) return error;
  const int error = pipeline_.ChangeState(GST_STATE_PLAYING);
  isPlaying_ = error == PLAYER_ERROR_NONE;
  if (isPlaying_) landed_.reset();
  return error;
}

int Playback::Rewind() {
  if (const int error = Pause()) return error;
  return landing_.GoTo(film_.GetOrigin());
}

int Playback::Pause() {
  const int error = pipeline_.ChangeState(GST_STATE_PAUSED);
  isPlaying_ = false;
  return error;
}

int Playback::Seek(long position, bool exact) {
  if (const int error = CheckSeek(position)) return error;
  const bool goesOn = isPlaying_ && !IsAtEnd();
  // Playing on meanwhile would leave the place that was sought.
  if (isPlaying_) {
    if (const int error = Pause()) return error;
  }
  FilmTime before = 0;
  const bool wasSomewhere = FindTime(&before) == PLAYER_ERROR_NONE;
  const int error = Land(position, exact);
  // A gate that waits for a key frame in vain stays closed until the next seek.
  if (error != PLAYER_ERROR_NONE && wasSomewhere && !pipeline_.IsBroken()) GoBack(before);
  if (!goesOn || pipeline_.IsBroken()) return error;
  const int playError = Play();
  return error == PLAYER_ERROR_NONE ? playError : error;
}

/// To where a seek that failed began.
void Playback::GoBack(FilmTime time) {
  if (landing_.GoTo(time) == PLAYER_ERROR_NONE) isKeyFrame_ = landing_.IsOnKeyFrame();
}

int Playback::Land(long position, bool exact) {
  const FilmTime time =
      film_.GetOrigin() + static_cast<FilmTime>(position) * GST_MSECOND + kWithinMillisecond;
  landed_.reset();
  isKeyFrame_ = false;
  if (!exact) {
    if (const int error = landing_.LandAtOrBefore(time, &landed_)) return error;
    isKeyFrame_ = landed_->isKeyFrame;
    return PLAYER_ERROR_NONE;
  }
  if (const int error = landing_.GoTo(time)) return error;
  isKeyFrame_ = landing_.IsOnKeyFrame();  // at the very end there is no frame
  return PLAYER_ERROR_NONE;
}

int Playback::CheckSeek(long position) {
  if (const int error = pipeline_.Check()) return error;
  if (!pipeline_.HasVideo()) return RefuseWithoutVideo();
  long duration = 0;
  if (const int error = GetDuration(&duration)) return error;
  if (position < 0 || position > duration) {
    return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__,
                         "%ld ms is not between 0 and the duration of %ld ms", position, duration);
  }
  return PLAYER_ERROR_NONE;
}

/// Makes the pipeline ready to play on from the picture that is shown.
int Playback::LeaveLanding() {
  if (!landed_) return pipeline_.Check();
  if (landed_->inTrickMode) {
    std::optional<Landed> again;
    if (const int error = landing_.Repeat(*landed_, &again)) return error;
    landed_ = again;
  }
  if (landed_->begin < landed_->time) pipeline_.SetStart(landed_->time - landed_->begin);
  return PLAYER_ERROR_NONE;
}

int Playback::GetPosition(long* position) {
  if (IsAtEnd()) return GetDuration(position);
  FilmTime time = 0;
  if (const int error = FindTime(&time)) return error;
  *position = ToMilliseconds(std::max<FilmTime>(0, time - film_.GetOrigin()));
  return PLAYER_ERROR_NONE;
}

int Playback::FindTime(FilmTime* time) const {
  if (!landed_) return pipeline_.GetPosition(time);
  *time = landed_->time;
  return pipeline_.Check();
}

int Playback::GetDuration(long* duration) {
  FilmTime time = 0;
  if (const int error = pipeline_.GetDuration(&time)) return error;
  if (pipeline_.HasVideo()) time = film_.FindDuration(time);
  *duration = ToMilliseconds(time);
  return PLAYER_ERROR_NONE;
}

int Playback::ListKeyFrames(const std::function<bool(long)>& onKeyFrame) {
  if (const int error = pipeline_.Check()) return error;
  if (!pipeline_.HasVideo()) return RefuseWithoutVideo();
  const KeyFrameIndex* index = film_.FindIndexAtAnyRate();
  if (index == nullptr) {
    return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the file's key frames can't be read");
  }
  for (const FilmTime keyFrame : index->keyFrames) {
    if (!onKeyFrame(ToMilliseconds(keyFrame - film_.GetOrigin()))) break;
  }
  return PLAYER_ERROR_NONE;
}

int Playback::CaptureFrame(player_frame_cb callback, void* userData) const {
  if (const int error = pipeline_.Check()) return error;
  if (!pipeline_.HasVideo()) return RefuseWithoutVideo();
  const SamplePtr frame = pipeline_.GetFrame();
  if (frame == nullptr) {
    return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "there is no frame at the position");
  }
  if (GST_BUFFER_FLAG_IS_SET(gst_sample_get_buffer(frame.get()), GST_BUFFER_FLAG_CORRUPTED)) {
    return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the frame at the position is damaged");
  }
  return HandOver(frame.get(), pipeline_.GetVideoTags().get(), callback, userData);
}

int Playback::RenderAudio(const char* path) const {
  if (const int error = pipeline_.Check()) return error;
  if (!pipeline_.HasAudio() || pipeline_.IsEmpty()) {
    return PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__, "the file has no sound");
  }
  return Desktop::RenderAudio(pipeline_.GetUri().get(), settings_.Get(), path);
}

}  // namespace Desktop
