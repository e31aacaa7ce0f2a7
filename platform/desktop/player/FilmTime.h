/// \file
#pragma once

#include "Gst.h"

#include <algorithm>
#include <optional>
#include <vector>

namespace Desktop {

/// A time in a film, in nanoseconds. Below 0: before its start.
using FilmTime = GstClockTimeDiff;

/// Demuxers, parsers and decoders round times, not always the same way.
constexpr FilmTime kRounding = GST_MSECOND;

/// From one time to another, both included.
struct TimeSpan {
  FilmTime from;
  FilmTime to;

  bool Holds(FilmTime time) const { return time >= from && time <= to; }
};

/// \return the last of \p times, which ascend, at or before \p time, or the first. There must be
/// one.
inline auto FindAtOrBefore(const std::vector<FilmTime>& times, FilmTime time) {
  const auto after = std::upper_bound(times.begin(), times.end(), time);
  return after == times.begin() ? after : after - 1;
}

/// \return the times that are as good as \p time.
constexpr TimeSpan Around(FilmTime time) { return {time - kRounding, time + kRounding}; }

/// \return when a time stamp is shown, which edit lists and containers shift, or nothing when there
/// is no such time.
inline std::optional<FilmTime> ConvertToFilmTime(const GstSegment& segment, GstClockTime stamp) {
  if (segment.format != GST_FORMAT_TIME || !GST_CLOCK_TIME_IS_VALID(stamp)) return std::nullopt;
  guint64 time = 0;
  const int sign = gst_segment_to_stream_time_full(&segment, GST_FORMAT_TIME, stamp, &time);
  if (sign == 0) return std::nullopt;
  return sign * static_cast<FilmTime>(time);
}

/// Follows one stream's times.
class FilmClock {
 public:
  FilmClock() { gst_segment_init(&segment_, GST_FORMAT_UNDEFINED); }

  void Follow(GstEvent* segment) { gst_event_copy_segment(segment, &segment_); }

  std::optional<FilmTime> Convert(GstClockTime stamp) const {
    return ConvertToFilmTime(segment_, stamp);
  }

 private:
  GstSegment segment_;
};

/// \return whether a stream's buffer holds a frame that is decoded without any other, and that the
/// parser doesn't mark as broken.
inline bool IsKeyFrame(const GstBuffer* buffer) {
  constexpr guint kNone = GST_BUFFER_FLAG_DELTA_UNIT | GST_BUFFER_FLAG_CORRUPTED;
  return (GST_BUFFER_FLAGS(buffer) & kNone) == 0;
}

}  // namespace Desktop
