/// \file
#pragma once

#include "Film.h"
#include "Pipeline.h"

#include <optional>

namespace Desktop {

/// Where a seek to a key frame came.
struct Landed {
  FilmTime time;  ///< of the picture, in the container's time
  bool isKeyFrame;
  bool inTrickMode;  ///< only key frames come until another seek
  FilmTime begin;    ///< where the pipeline's clock stands: before the picture when it had to
};

/// Brings a pipeline to the last key frame at or before a time, or to the first one of all. Where
/// the container can be trusted that is one seek, which decodes the key frame only; else the film's
/// index says which key frame it is, and the gate before the decoder makes sure of it.
class Landing {
 public:
  Landing(Pipeline& pipeline, Film& film) : pipeline_(pipeline), film_(film) {}

  /// \return where the pipeline is then
  Landed LandAtOrBefore(FilmTime time);

  /// Goes there once more, so that all frames come after it.
  Landed Repeat(const Landed& landed);

  /// Goes to the time itself.
  void GoTo(FilmTime time);

  /// \return whether the picture that is shown since the last seek is a key frame.
  bool IsOnKeyFrame() const;

 private:
  std::optional<Landed> TryContainer(FilmTime time, bool* isFirst);
  std::optional<Landed> CorrectByList(FilmTime time, std::optional<Landed> landed);
  Landed LandByIndex(FilmTime time);
  std::optional<Landed> LandAt(FilmTime keyFrame);
  Landed LandSomewhere(FilmTime time);
  void Seek(FilmTime time, GstSeekFlags manner, std::optional<TimeSpan> first);
  bool IsAtGate() const;
  bool IsKeyFrame(const Shown& shown) const;

  Pipeline& pipeline_;
  Film& film_;
  FilmTime lead_ = 0;  // how much earlier a seek of this file has to begin
};

}  // namespace Desktop
