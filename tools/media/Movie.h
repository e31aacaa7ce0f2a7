#pragma once

#include <Tizen/Media/Player.h>
#include <Zelkora/Media/VideoKeyFrameSeeker.h>

#include <string>
#include <vector>

namespace CommandLine {

/// A video file that is open and can be moved by key frame.
class Movie {
 public:
  /// Opens the file; throws a `Failure` when that can't be done.
  explicit Movie(const std::string& path);

  /// \return the length in milliseconds; throws a `Failure` when it isn't known.
  long Duration() const;

  /// Moves to a key frame near \p position, in milliseconds.
  /// \param landed receives where that is; untouched on failure
  result SeekTo(long position, long& landed);

  /// \return the positions of all key frames; throws a `Failure` when they can't be found.
  std::vector<long> KeyFrames() const;

  bool IsOnKeyFrame() const { return player_.IsKeyFrame(); }

  /// \return the picture at the current position; throws a `Failure` when there is none.
  Tizen::Media::VideoFrame Capture() const;

 private:
  Tizen::Media::Player player_;  // before the seeker, which needs it as long as it lives
  Zelkora::Media::VideoKeyFrameSeeker seeker_;
};

}  // namespace CommandLine
