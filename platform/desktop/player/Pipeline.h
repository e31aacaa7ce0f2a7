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

/// GStreamer's player of one file, with an answer to each order. Failures are logged and given back
/// as codes of the player interface. After one, or an answer that didn't come in time, all that
/// follows fails.
class Pipeline {
 public:
  Pipeline() = default;

  /// Ends the streaming threads, and so what they use.
  ~Pipeline();

  Pipeline(const Pipeline&) = delete;
  Pipeline& operator=(const Pipeline&) = delete;

  /// Builds the pipeline and pauses it where the file starts. To be called once, and first.
  /// \param audioFilter what the sound passes
  int Open(const char* path, GstElement* audioFilter);

  int ChangeState(GstState state);

  /// Seeks, and waits until that is done.
  int Move(FilmTime time, GstSeekFlags manner);

  /// \return a failure of before
  int Check() const;
  bool IsBroken() const { return isTimedOut_ || watch_->HasFailed(); }

  /// \return whether everything has been played.
  bool HasEnded() const { return watch_->HasEnded(); }

  int GetPosition(FilmTime* position) const;
  int GetDuration(FilmTime* duration) const;

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
  KeyFrameGate& GetGate() { return *gate_; }

 private:
  int Build(const char* path, GstElement* audioFilter);
  bool Preroll();
  int CheckStreams(const char* path) const;
  int ReportOpenFailure(const char* path) const;
  int AwaitAnswer();
  int Query(gboolean (*query)(GstElement*, GstFormat, gint64*), const char* what,
            FilmTime* time) const;
  gint CountStreams(const char* property) const;

  std::unique_ptr<KeyFrameGate> gate_;
  std::unique_ptr<PipelineWatch> watch_;
  ElementPtr videoSink_;
  ElementPtr playbin_;  // which uses all of them to its end
  bool isTimedOut_ = false;
};

}  // namespace Desktop
