/// \file
#pragma once

#include "Container.h"
#include "KeyFrameIndex.h"

#include <atomic>
#include <optional>
#include <string>
#include <vector>

namespace Desktop {

/// What is known of an open file beside the pipeline that plays it.
class Film {
 public:
  /// \param isUnwanted ends the search for key frames when it becomes other than 0
  /// \param demuxer what takes the file apart
  /// \param first the position before the first seek
  /// \param shift how much its time stamps are ahead of the times in the film
  Film(const char* path, const std::atomic<int>& isUnwanted, const std::string& demuxer,
       FilmTime first, FilmTime shift);

  /// \return whether the file's own index leads a seek to a key frame.
  bool IsTrusted() const { return own_.isTrusted; }

  /// \return the time stamps of key frames that the file's own index lists, where GStreamer may
  /// miss some.
  const std::vector<FilmTime>& GetListed() const { return own_.keyFrames; }

  /// \return whether the flags of frames tell key frames from others, also after a seek.
  bool HasTrueFlags() const { return origin_ < 0; }

  /// \return where the film starts in the container's time.
  FilmTime GetOrigin() const { return origin_ < 0 ? 0 : origin_; }

  /// \return the earliest time to seek to.
  FilmTime GetFloor() const { return floor_; }

  /// \return when a key frame of the index may be shown. Some demuxers shift the very first frames,
  /// so the first key frame is the first one that comes.
  TimeSpan GetSpan(FilmTime keyFrame) const;

  /// \return how long the film is, for which it may have to be read.
  /// \param told what the demuxer says
  FilmTime FindDuration(FilmTime told);

  /// \return the key frames, in the container's time, if the file was read for them.
  const KeyFrameIndex* GetIndex() const { return index_ ? &*index_ : nullptr; }

  /// \return the key frames, for which the file is read at the first call, or null when that takes
  /// too long, or none is found. It isn't tried again.
  const KeyFrameIndex* FindIndex();

  /// The same without a time limit, also after an attempt that was given up.
  const KeyFrameIndex* FindIndexAtAnyRate();

 private:
  const std::string path_;
  const std::atomic<int>& isUnwanted_;
  const OwnIndex own_;
  const FilmTime origin_;
  const FilmTime floor_;
  const FilmTime excess_;  // of the length that the demuxer tells
  std::optional<KeyFrameIndex> index_;
  bool isGivenUp_ = false;
};

}  // namespace Desktop
