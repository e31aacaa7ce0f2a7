/// \file
#pragma once

#include "Film.h"
#include "Landing.h"
#include "Pipeline.h"
#include "desktop/player/effects/Chain.h"
#include "native/PlayerDevice.h"

#include <optional>

namespace Desktop {

/// An open file that is played.
///
/// Operations log their failures and throw them. None waits without a bound, but for a sound server
/// that is stopped and not gone: GStreamer's sink waits until it goes on or ends. After a failure
/// of the pipeline, or an answer that didn't come in time, every further operation fails: the file
/// has to be opened again. For one thread at a time.
class Playback : public PlayerDevice::File {
 public:
  /// Pauses on the file's first frame.
  /// \param effects followed
  /// \param isUnwanted ends long work when it becomes other than 0. Both must outlive the playback.
  Playback(const char* path, const SharedSettings& effects, const std::atomic<int>& isUnwanted);

  /// At the end, plays again from the start.
  void Play() override;
  void Pause() override;

  /// \return whether playing has come to the end, and stands there.
  bool IsAtEnd() const override { return pipeline_.HasEnded(); }

  /// A player that plays goes on playing from where it lands. To a key frame, that is the last one
  /// at or before the position, or the first one of all. A seek that fails leaves it where it was.
  void Seek(long position, bool isExact) override;

  long GetPosition() override;
  long GetDuration() override;
  bool IsKeyFrame() const override { return isKeyFrame_; }

  /// Reads the whole file, for as long as that takes.
  void ListKeyFrames(const std::function<bool(long)>& visit) override;
  void CaptureFrame(player_frame_cb callback, void* userData) override;

  /// Writes the file's sound with the effects as they are now. For as long as that takes.
  void RenderAudio(const char* path) override;

 private:
  void CheckVideo() const;
  void Land(FilmTime time, bool isExact);
  void GoTo(FilmTime time);
  FilmTime FindTime() const;
  void LeaveLanding();
  void Rewind();

  const SharedSettings& settings_;
  const EffectChain effects_;
  Pipeline pipeline_;  // which uses the effects to its end
  Film film_;
  Landing landing_{pipeline_, film_};
  bool isPlaying_ = false;
  /// Where the last seek went, until it plays on. With sound, the pipeline's own position is a few
  /// milliseconds beside it.
  std::optional<Landed> landed_;
  bool isKeyFrame_ = false;
};

}  // namespace Desktop
