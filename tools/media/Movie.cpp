#include "Movie.h"

#include "base/Failure.h"

#include <fmt/format.h>

namespace CommandLine {

Movie::Movie(const std::string& path) {
  Check(player_.Construct(), "start the player");
  Check(seeker_.Construct(player_), "move by key frame");
  Check(player_.OpenFile(path.c_str()), fmt::format("open {}", path));
}

long Movie::Duration() const {
  const long duration = player_.GetDuration();
  if (duration < 0) Check(GetLastResult(), "tell how long the video is");
  return duration;
}

result Movie::SeekTo(long position, long& landed) {
  const result r = seeker_.SeekTo(position);
  if (r != E_SUCCESS) return r;
  const long reached = player_.GetPosition();
  if (reached < 0) return GetLastResult();
  landed = reached;
  return E_SUCCESS;
}

std::vector<long> Movie::KeyFrames() const {
  std::vector<long> positions;
  Check(player_.GetKeyFrames(positions), "find the key frames");
  return positions;
}

Tizen::Media::VideoFrame Movie::Capture() const {
  Tizen::Media::VideoFrame frame;
  Check(player_.CaptureFrame(frame), "capture a frame");
  return frame;
}

}  // namespace CommandLine
