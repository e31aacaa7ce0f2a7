/// \file
#pragma once

#include <string>

namespace Desktop {

/// \return whether a file says itself where its key frames are, completely and truly, so that
/// GStreamer's demuxer of that name can go there.
bool HasTrustedIndex(const std::string& demuxer, const char* path);

/// \return whether times in such a file count from some moment before its start.
bool HasOwnOrigin(const std::string& demuxer);

/// \return whether GStreamer's demuxer of that name can't seek to before that start.
bool IsLostBefore(const std::string& demuxer);

/// \return whether the length that it tells counts from time stamp 0, though the film starts later.
bool CountsFromZero(const std::string& demuxer);

}  // namespace Desktop
