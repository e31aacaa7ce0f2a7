/// \file
#pragma once

#include "Film.h"
#include "Landing.h"
#include "Pipeline.h"
#include "desktop/player/effects/Chain.h"

#include <player.h>

#include <functional>
#include <optional>
#include <string>

namespace Desktop {

/// An open file that is played, paused at first.
///
/// Operations give back an error code of the player interface and log their failures. None waits
/// without a bound, but for a sound server that is stopped and not gone: GStreamer's sink waits
/// until it goes on or ends. After a failure of the pipeline, or an answer that didn't come in
/// time, every further operation fails: the file has to be opened again. For one thread at a time.
class Playback {
 public:
  /// \param effects followed
  /// \param isUnwanted ends long work when it becomes other than 0. Both must outlive the playback.
  Playback(const char* path, const SharedSettings& effects, const std::atomic<int>& isUnwanted);

  Playback(const Playback&) = delete;
  Playback& operator=(const Playback&) = delete;

  /// Pauses on the file's first frame. To be called once, and first.
  int Open();

  /// At the end, plays again from the start.
  int Play();
  int Pause();

  /// \return whether playing has come to the end, and stands there.
  bool IsAtEnd() const { return pipeline_.HasEnded(); }

  /// A player that plays goes on playing from where it lands. To a key frame, that is the last one
  /// at or before the position, or the first one of all. A seek that fails leaves it where it was.
  int Seek(long position, bool exact);

  int GetPosition(long* position);
  int GetDuration(long* duration);
  bool IsKeyFrame() const { return isKeyFrame_; }

  /// Reads the whole file, for as long as that takes.
  int ListKeyFrames(const std::function<bool(long)>& onKeyFrame);
  int CaptureFrame(player_frame_cb callback, void* userData) const;

  /// Writes the file's sound with the effects as they are now. For as long as that takes.
  int RenderAudio(const char* path) const;

 private:
  int CheckSeek(long position);
  int Land(long position, bool exact);
  void GoBack(FilmTime time);
  int FindTime(FilmTime* time) const;
  int LeaveLanding();
  int Rewind();

  const SharedSettings& settings_;
  const EffectChain effects_;
  std::string path_;
  Film film_;
  Pipeline pipeline_;  // which uses the effects to its end
  Landing landing_{pipeline_, film_};
  bool isPlaying_ = false;
  /// Where the last seek went, until it plays on. With sound, the pipeline's own position is a few
  /// milliseconds beside it.
  std::optional<Landed> landed_;
  bool isKeyFrame_ = false;
};

}  // namespace Desktop
