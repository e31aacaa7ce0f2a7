/// \file
#pragma once

#include "FilmTime.h"
#include "KeyFrameGate.h"
#include "PipelineWatch.h"

#include <optional>
#include <string>

namespace Desktop {

/// A picture that a pipeline shows.
struct Shown {
  GstClockTime stamp;
  FilmTime time;
  bool isBroken;  ///< the decoder says so
};

/// GStreamer's player of one file, with an answer to each order. Failures are logged and thrown.
/// After one, or an answer that didn't come in time, all that follows fails.
class Pipeline {
 public:
  /// Builds the pipeline and pauses it where the file starts.
  /// \param audioFilter what the sound passes
  Pipeline(const char* path, GstElement* audioFilter);

  void ChangeState(GstState state);

  /// Seeks, and waits until that is done.
  void Move(FilmTime time, GstSeekFlags manner);

  /// Fails after a failure of before.
  void Check() const;
  bool IsBroken() const { return isTimedOut_ || watch_.HasFailed(); }

  /// \return whether everything has been played.
  bool HasEnded() const { return watch_.HasEnded(); }

  FilmTime GetPosition() const;
  FilmTime GetDuration() const;

  /// \return whether the file is known to last no time at all.
  bool IsEmpty() const;

  /// Has playing go on \p ahead of where the last seek went.
  void SetStart(FilmTime ahead);

  bool HasAudio() const { return CountStreams("n-audio") > 0; }
  bool HasVideo() const { return CountStreams("n-video") > 0; }

  /// \return the name of what takes the file apart, or "".
  std::string FindDemuxer() const;

  /// \return the frame that is shown, or null.
  SamplePtr GetFrame() const;
  std::optional<Shown> GetShown() const;

  /// \return how much the video's time stamps are ahead of the times in the film, if that is known.
  FilmTime GetShift() const;

  /// \return what is known of the video, or null.
  TagsPtr GetVideoTags() const;

  TextPtr GetUri() const;
  KeyFrameGate& GetGate() { return gate_; }

 private:
  bool Preroll();
  void CheckStreams(const char* path) const;
  [[noreturn]] void FailToOpen(const char* path) const;
  void AwaitAnswer();
  FilmTime Query(gboolean (*query)(GstElement*, GstFormat, gint64*), const char* what) const;
  gint CountStreams(const char* property) const;

  const ElementPtr videoSink_;
  const ElementPtr playbin_;
  KeyFrameGate gate_{playbin_.get()};
  PipelineWatch watch_{playbin_.get()};
  bool isTimedOut_ = false;
  const StreamingPtr streaming_{playbin_.get()};  // uses all of them
};

}  // namespace Desktop
