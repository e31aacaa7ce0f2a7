#pragma once

#include "Drawing.h"

#include <Tizen/Media/Player.h>

#include <string>
#include <vector>

namespace CommandLine {

class OutputFile;

/// Frames of a video side by side on one picture, each with its time below.
class Filmstrip {
 public:
  struct Size {
    int width;
    int height;
  };

  /// Adds a frame at the end; keeps only a thumbnail of it.
  /// \param position its time, in milliseconds
  void Add(const Tizen::Media::VideoFrame& frame, long position);

  std::size_t Count() const { return thumbnails_.size(); }

  /// Draws the picture of the frames added so far, one at least, and writes it as PNG.
  Size Write(OutputFile& file) const;

 private:
  struct Thumbnail {
    Surface picture;
    std::string time;
  };

  std::vector<Thumbnail> thumbnails_;
  Size largest_{96, 0};  // of the thumbnails, and wide enough for a time
};

}  // namespace CommandLine
