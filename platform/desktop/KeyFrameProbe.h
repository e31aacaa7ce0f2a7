/// \file
#pragma once

#include "Gst.h"

#include <array>
#include <mutex>

namespace Desktop {

/// Sees what enters the video decoder of a pipeline, whichever decoder that will be.
class KeyFrameProbe {
 public:
  /// \param playbin a pipeline not yet started. The probe must outlive its streaming threads.
  explicit KeyFrameProbe(GstElement* playbin);

  KeyFrameProbe(const KeyFrameProbe&) = delete;
  KeyFrameProbe& operator=(const KeyFrameProbe&) = delete;

  /// \param shown the time stamp of a frame that was decoded soon after the last seek
  /// \return whether it is a key frame. That decoding began at one doesn't say so: it begins there
  /// for an exact seek too, and sometimes a key frame earlier than needed.
  bool IsKeyFrame(GstClockTime shown) const;

 private:
  static void OnElementAdded(GstBin*, GstBin*, GstElement* element, gpointer probe);
  static GstPadProbeReturn OnData(GstPad*, GstPadProbeInfo* info, gpointer probe);
  void OnFlush();
  void OnBuffer(const GstBuffer* buffer);

  struct KeyFrame {
    GstClockTime begin;
    GstClockTime duration;
  };

  mutable std::mutex mutex_;
  std::array<KeyFrame, 256> keyFrames_;  // the first ones since the last seek
  std::size_t count_ = 0;
};

}  // namespace Desktop
