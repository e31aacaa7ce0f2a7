/// \file
#pragma once

#include "FilmTime.h"

#include <string>
#include <vector>

namespace Desktop {

/// What a file's own index is worth.
struct OwnIndex {
  bool isTrusted = false;  ///< it is complete and true, so that GStreamer's demuxer can use it

  /// The time stamps of the key frames that it lists, where the demuxer may miss some. Ascending.
  std::vector<FilmTime> keyFrames;
};

/// \param demuxer the name of GStreamer's demuxer of the file
OwnIndex ReadOwnIndex(const std::string& demuxer, const char* path);

/// \return whether times in such a file count from some moment before its start.
bool HasOwnOrigin(const std::string& demuxer);

/// \return whether GStreamer's demuxer of that name can't seek to before that start.
bool IsLostBefore(const std::string& demuxer);

/// \return whether the length that it tells counts from time stamp 0, though the film starts later.
bool CountsFromZero(const std::string& demuxer);

}  // namespace Desktop
