/// \file
#pragma once

#include "Gst.h"
#include "KeyFrameProbe.h"
#include "PipelineWatch.h"
#include "effects/Chain.h"

#include <player.h>

#include <optional>

namespace Desktop {

/// An open file: a pipeline that plays it, paused at first.
///
/// Operations give back an error code of the player interface and log their failures. None waits
/// without a bound, but for a sound server that is stopped and not gone: GStreamer's sink waits until it
/// goes on or ends. After a failure of the pipeline, or an answer that didn't come in time, every
/// further operation fails: the file has to be opened again. For one thread at a time.
class Playback {
 public:
  /// \param effects must outlive the playback, which follows them.
  explicit Playback(const SharedSettings& effects);
  ~Playback();

  Playback(const Playback&) = delete;
  Playback& operator=(const Playback&) = delete;

  /// Builds the pipeline and pauses it on the file's first frame. To be called once, and first.
  int Open(const char* path);

  int Play();
  int Pause();

  /// A player that plays goes on playing from where it lands. To a key frame, that is at or before
  /// the position in MP4, Matroska, WebM and AVI. It isn't where the file has no index of its key
  /// frames: MPEG-TS and fragmented MP4 land near the position, Ogg a frame late. `GetPosition` and
  /// `IsKeyFrame` then tell what is shown.
  int Seek(long position, bool exact);

  int GetPosition(long* position) const;
  int GetDuration(long* duration) const;
  bool IsKeyFrame() const { return isKeyFrame_; }
  int CaptureFrame(player_frame_cb callback, void* userData) const;

  /// Writes the file's sound with the effects as they are now. For as long as that takes.
  int RenderAudio(const char* path) const;

 private:
  int Build(const char* path);
  int CheckStreams(const char* path) const;
  int ReportOpenFailure(const char* path) const;
  bool Preroll();
  int CheckSeek(long position) const;
  int Land(long position, bool exact);
  int LeaveTrickMode();
  int Move(GstClockTime position, GstSeekFlags manner);
  int ChangeState(GstState state);
  int AwaitAnswer();
  bool IsBroken() const { return isTimedOut_ || watch_->HasFailed(); }
  int Check() const;
  int Query(gboolean (*query)(GstElement*, GstFormat, gint64*), const char* what,
            gint64* time) const;
  bool HasAudio() const;
  bool HasVideo() const;
  SamplePtr GetFrame() const;

  const SharedSettings& settings_;
  const EffectChain effects_;
  ElementPtr pipeline_;
  std::unique_ptr<KeyFrameProbe> probe_;
  std::unique_ptr<PipelineWatch> watch_;
  bool isPlaying_ = false;
  bool isTimedOut_ = false;
  /// The time of the key frame that is shown in trick mode, in which only key frames come until an
  /// ordinary seek. With sound, the pipeline's own position is a few milliseconds beside it.
  std::optional<GstClockTime> landed_;
  bool isKeyFrame_ = false;
};

}  // namespace Desktop
