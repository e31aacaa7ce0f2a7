#include "Playback.h"

#include "Frame.h"
#include "desktop/player/effects/RenderAudio.h"
#include "native/PlayerError.h"

#include <algorithm>

namespace Desktop {
namespace {

using Host::PlayerFailure;

/// Positions are told without the fraction of their millisecond: so a seek aims at its end, but for
/// what demuxers round.
constexpr FilmTime kWithinMillisecond = 900 * GST_USECOND;

long ToMilliseconds(FilmTime time) { return static_cast<long>(time / GST_MSECOND); }

/// For what is worth a try. \return whether it succeeded; a failure has been logged
template <typename Operation>
bool Succeeds(Operation operation) {
  try {
    operation();
    return true;
  } catch (const Host::PlayerError&) {
    return false;
  }
}

}  // namespace

Playback::Playback(const char* path, const SharedSettings& effects,
                   const std::atomic<int>& isUnwanted)
    : settings_(effects),
      effects_(effects),
      pipeline_(path, effects_.GetElement()),
      film_(path, isUnwanted, pipeline_.FindDemuxer(), pipeline_.GetPosition(),
            pipeline_.GetShift()) {}

void Playback::Play() {
  if (isPlaying_ && !IsAtEnd()) return pipeline_.Check();
  IsAtEnd() ? Rewind() : LeaveLanding();
  pipeline_.ChangeState(GST_STATE_PLAYING);
  isPlaying_ = true;
  landed_.reset();
}

void Playback::Rewind() {
  Pause();
  landing_.GoTo(film_.GetOrigin());
}

void Playback::Pause() {
  isPlaying_ = false;
  pipeline_.ChangeState(GST_STATE_PAUSED);
}

void Playback::Seek(long position, bool isExact) {
  CheckVideo();
  const long duration = GetDuration();
  if (position < 0 || position > duration) {
    throw PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__,
                        "%ld ms is not between 0 and the duration of %ld ms", position, duration);
  }
  const bool goesOn = isPlaying_ && !IsAtEnd();
  // Playing on meanwhile would leave the place that was sought.
  if (isPlaying_) Pause();
  FilmTime before = 0;
  const bool wasSomewhere = Succeeds([&] { before = FindTime(); });
  const auto playOn = [&] {
    if (goesOn && !pipeline_.IsBroken()) Play();
  };
  try {
    Land(film_.GetOrigin() + position * GST_MSECOND + kWithinMillisecond, isExact);
  } catch (const Host::PlayerError&) {
    // A gate that waits for a key frame in vain stays closed until the next seek.
    if (wasSomewhere && !pipeline_.IsBroken()) Succeeds([&] { GoTo(before); });
    Succeeds(playOn);
    throw;
  }
  playOn();
}

void Playback::Land(FilmTime time, bool isExact) {
  landed_.reset();
  isKeyFrame_ = false;
  if (isExact) return GoTo(time);
  landed_ = landing_.LandAtOrBefore(time);
  isKeyFrame_ = landed_->isKeyFrame;
}

void Playback::GoTo(FilmTime time) {
  landing_.GoTo(time);
  isKeyFrame_ = landing_.IsOnKeyFrame();  // at the very end there is no frame
}

void Playback::CheckVideo() const {
  pipeline_.Check();
  if (pipeline_.HasVideo()) return;
  throw PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__, "the file has no video");
}

/// Makes the pipeline ready to play on from the picture that is shown.
void Playback::LeaveLanding() {
  if (!landed_) return pipeline_.Check();
  if (landed_->inTrickMode) landed_ = landing_.Repeat(*landed_);
  if (landed_->begin < landed_->time) pipeline_.SetStart(landed_->time - landed_->begin);
}

long Playback::GetPosition() {
  if (IsAtEnd()) return GetDuration();
  return ToMilliseconds(std::max<FilmTime>(0, FindTime() - film_.GetOrigin()));
}

FilmTime Playback::FindTime() const {
  if (!landed_) return pipeline_.GetPosition();
  pipeline_.Check();
  return landed_->time;
}

long Playback::GetDuration() {
  const FilmTime told = pipeline_.GetDuration();
  return ToMilliseconds(pipeline_.HasVideo() ? film_.FindDuration(told) : told);
}

void Playback::ListKeyFrames(const std::function<bool(long)>& visit) {
  CheckVideo();
  const KeyFrameIndex* index = film_.FindIndexAtAnyRate();
  if (index == nullptr) {
    throw PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the file's key frames can't be read");
  }
  for (const FilmTime keyFrame : index->keyFrames) {
    if (!visit(ToMilliseconds(keyFrame - film_.GetOrigin()))) break;
  }
}

void Playback::CaptureFrame(player_frame_cb callback, void* userData) {
  CheckVideo();
  const SamplePtr frame = pipeline_.GetFrame();
  if (frame == nullptr) {
    throw PlayerFailure(PLAYER_ERROR_IO, __LINE__, "there is no frame at the position");
  }
  if (GST_BUFFER_FLAG_IS_SET(gst_sample_get_buffer(frame.get()), GST_BUFFER_FLAG_CORRUPTED)) {
    throw PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the frame at the position is damaged");
  }
  HandOver(frame.get(), pipeline_.GetVideoTags().get(), callback, userData);
}

void Playback::RenderAudio(const char* path) {
  pipeline_.Check();
  if (!pipeline_.HasAudio() || pipeline_.IsEmpty()) {
    throw PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__, "the file has no sound");
  }
  Desktop::RenderAudio(pipeline_.GetUri().get(), settings_.Get(), path);
}

}  // namespace Desktop
