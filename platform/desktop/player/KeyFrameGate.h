/// \file
#pragma once

#include "FilmTime.h"

#include <array>
#include <mutex>
#include <optional>

namespace Desktop {

/// Stands before the video decoder of a pipeline, whichever decoder that will be. It sees what
/// enters there, and can keep everything out that comes before a key frame.
class KeyFrameGate {
 public:
  /// What enters the decoder as a key frame, unbroken as far as the parser can tell.
  struct KeyFrame {
    GstClockTime stamp;
    GstClockTime duration;
    GstClockTime reordering;  ///< how much later it is shown than decoded
  };

  enum class Passage {
    kOpen,     ///< everything passes
    kWaiting,  ///< the key frame hasn't come yet
    kPassed,   ///< it came, and the decoder began with it
    kMissed,   ///< something later came first; nothing passes
    kBroken    ///< it came, and is none or is damaged; nothing passes
  };

  /// \param playbin a pipeline not yet started. The gate must outlive its streaming threads.
  explicit KeyFrameGate(GstElement* playbin);

  KeyFrameGate(const KeyFrameGate&) = delete;
  KeyFrameGate& operator=(const KeyFrameGate&) = delete;

  /// To be called before a seek: from there on the decoder is to begin with the key frame that is
  /// shown in \p first, or, without such a time, with whatever comes. What is still on the way
  /// passes as before.
  void Prepare(std::optional<TimeSpan> first);

  Passage GetPassage() const;

  /// \param shown the time stamp of a frame that was decoded soon after the last seek
  /// \return the key frame if that frame is one, else nothing. Decoding always begins with a key
  /// frame, also for an exact seek, so that alone tells nothing of the frame shown.
  std::optional<KeyFrame> Find(GstClockTime shown) const;

 private:
  static void OnElementAdded(GstBin*, GstBin*, GstElement* element, gpointer gate);
  static void OnElementRemoved(GstBin*, GstBin*, GstElement* element, gpointer gate);
  static GstPadProbeReturn OnData(GstPad*, GstPadProbeInfo* info, gpointer gate);
  GstPadProbeReturn OnEvent(GstEvent* event);
  bool LetsIn(const GstBuffer* buffer);
  Passage Judge(const GstBuffer* buffer, FilmTime time) const;
  bool IsClosed() const { return passage_ == Passage::kMissed || passage_ == Passage::kBroken; }
  void Remember(const GstBuffer* buffer);

  mutable std::mutex mutex_;
  GstElement* decoder_ = nullptr;  // compared only; of several the first
  FilmClock clock_;
  std::optional<TimeSpan> next_;  // of the next flush
  std::optional<TimeSpan> first_;
  Passage passage_ = Passage::kOpen;
  std::array<KeyFrame, 256> keyFrames_;  // the first ones since the last seek
  std::size_t count_ = 0;
};

}  // namespace Desktop
