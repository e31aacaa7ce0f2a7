/// \file
#pragma once

#include "FilmTime.h"

#include <atomic>
#include <chrono>
#include <optional>
#include <vector>

namespace Desktop {

/// Where a film's key frames are, whatever its container says of them.
struct KeyFrameIndex {
  std::vector<FilmTime> keyFrames;  // ascending
  FilmTime end = 0;                 // of the last picture or sound
};

/// Reads all of a file, without decoding it. What of it can't be read is left out.
/// \param limit how long that may take; without one, as long as the file needs
/// \param isUnwanted ends it at once when it becomes other than 0
/// \return nothing when it took longer than that, or wasn't wanted any more
std::optional<KeyFrameIndex> ReadKeyFrames(const char* path,
                                           std::optional<std::chrono::milliseconds> limit,
                                           const std::atomic<int>& isUnwanted);

}  // namespace Desktop
