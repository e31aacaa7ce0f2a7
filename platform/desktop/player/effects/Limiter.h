/// \file
#pragma once

#include "desktop/player/Gst.h"

#include <atomic>
#include <cstddef>
#include <vector>

namespace Desktop {

/// Keeps stereo sound in floating point below full scale: a plug-in's limiter, which looks ahead
/// and so delays the sound by some milliseconds. Here the delay is taken out of the time stamps and
/// reported as latency, the sound's end is fetched out of the plug-in, and at rest the sound that
/// went in comes out, delayed as ever, bit by bit.
class Limiter {
 public:
  Limiter() = default;
  Limiter(const Limiter&) = delete;
  Limiter& operator=(const Limiter&) = delete;

  /// \return a new element, or null, logged once, when the plug-in isn't installed
  static ElementPtr MakeElement();

  /// To be called before the first sound, by the owner of \p element, which outlives its streaming.
  void Attach(GstElement* element);

  /// Of the streaming thread: what comes is limited, or left alone. The other is faded to, unless a
  /// new sound begins.
  void SetActive(bool isActive) { isActive_ = isActive; }

 private:
  static GstPadProbeReturn OnInput(GstPad* pad, GstPadProbeInfo* info, gpointer limiter);
  static GstPadProbeReturn OnOutput(GstPad*, GstPadProbeInfo* info, gpointer limiter);
  static GstPadProbeReturn OnLatencyQuery(GstPad*, GstPadProbeInfo* info, gpointer limiter);

  void Keep(GstBuffer* buffer);
  void HandleEvent(GstPad* pad, GstEvent* event);
  void Drain(GstPad* pad);
  void Restart();
  void Begin();
  bool Trim(GstBuffer* buffer);
  void Mix(GstBuffer* buffer);
  void Fade(float* begin, const float* end, float target);
  GstClockTime ToTime(std::size_t frames) const;

  GstElement* element_ = nullptr;
  std::atomic<GstClockTime> latency_{0};

  // Of the streaming thread.
  int rate_ = 0;
  bool isActive_ = false;
  bool isBeginning_ = true;
  float share_ = 0;             // of the limited sound in what comes out
  std::size_t delay_ = 0;       // in frames
  std::size_t skipped_ = 0;     // of the delay, since the sound began
  std::vector<float> waiting_;  // what went in and hasn't come out
  GstClockTime end_ = 0;        // of what went in
};

}  // namespace Desktop
