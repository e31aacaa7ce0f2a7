#include "KeyFrameGate.h"

#include <algorithm>

namespace Desktop {
namespace {

/// Motion JPEG is decoded by what GStreamer counts among the decoders of images.
bool IsVideoDecoder(GstElement* element) {
  GstElementFactory* factory = gst_element_get_factory(element);
  constexpr GstElementFactoryListType kWhat = GST_ELEMENT_FACTORY_TYPE_DECODER |
                                              GST_ELEMENT_FACTORY_TYPE_MEDIA_VIDEO |
                                              GST_ELEMENT_FACTORY_TYPE_MEDIA_IMAGE;
  return factory != nullptr && gst_element_factory_list_is_type(factory, kWhat);
}

GstClockTime GetReordering(const GstBuffer* buffer) {
  if (!GST_BUFFER_DTS_IS_VALID(buffer) || GST_BUFFER_PTS(buffer) < GST_BUFFER_DTS(buffer)) return 0;
  return GST_BUFFER_PTS(buffer) - GST_BUFFER_DTS(buffer);
}

}  // namespace

KeyFrameGate::KeyFrameGate(GstElement* playbin) {
  g_signal_connect(playbin, "deep-element-added", G_CALLBACK(OnElementAdded), this);
  g_signal_connect(playbin, "deep-element-removed", G_CALLBACK(OnElementRemoved), this);
}

void KeyFrameGate::Prepare(std::optional<TimeSpan> first) {
  std::lock_guard lock(mutex_);
  next_ = first;
}

KeyFrameGate::Passage KeyFrameGate::GetPassage() const {
  std::lock_guard lock(mutex_);
  return passage_;
}

std::optional<KeyFrameGate::KeyFrame> KeyFrameGate::Find(GstClockTime shown) const {
  std::lock_guard lock(mutex_);
  const auto end = keyFrames_.begin() + count_;
  const auto found = std::find_if(keyFrames_.begin(), end, [=](const KeyFrame& frame) {
    // A decoder cuts a frame's begin off to where an exact seek went.
    const bool isWithin = shown > frame.stamp && GST_CLOCK_TIME_IS_VALID(frame.duration) &&
                          shown - frame.stamp < frame.duration;
    return shown == frame.stamp || isWithin;
  });
  if (found == end) return std::nullopt;
  return *found;
}

void KeyFrameGate::OnElementAdded(GstBin*, GstBin*, GstElement* element, gpointer data) {
  if (!IsVideoDecoder(element)) return;
  const PadPtr sink(gst_element_get_static_pad(element, "sink"));
  if (sink == nullptr) return;
  auto* gate = static_cast<KeyFrameGate*>(data);
  {
    std::lock_guard lock(gate->mutex_);
    if (gate->decoder_ != nullptr) return;
    gate->decoder_ = element;
  }
  constexpr int kWhat = GST_PAD_PROBE_TYPE_BUFFER | GST_PAD_PROBE_TYPE_EVENT_DOWNSTREAM |
                        GST_PAD_PROBE_TYPE_EVENT_FLUSH;
  gst_pad_add_probe(sink.get(), static_cast<GstPadProbeType>(kWhat), OnData, gate, nullptr);
}

void KeyFrameGate::OnElementRemoved(GstBin*, GstBin*, GstElement* element, gpointer data) {
  auto* gate = static_cast<KeyFrameGate*>(data);
  std::lock_guard lock(gate->mutex_);
  if (gate->decoder_ == element) gate->decoder_ = nullptr;
}

GstPadProbeReturn KeyFrameGate::OnData(GstPad* pad, GstPadProbeInfo* info, gpointer data) {
  auto* gate = static_cast<KeyFrameGate*>(data);
  std::unique_lock lock(gate->mutex_);
  if ((GST_PAD_PROBE_INFO_TYPE(info) & GST_PAD_PROBE_TYPE_BUFFER) == 0) {
    return gate->OnEvent(GST_PAD_PROBE_INFO_EVENT(info));
  }
  const GstBuffer* buffer = GST_PAD_PROBE_INFO_BUFFER(info);
  const bool wasWaiting = gate->passage_ == Passage::kWaiting;
  if (gate->LetsIn(buffer)) return GST_PAD_PROBE_OK;
  if (wasWaiting && gate->IsClosed()) {
    lock.unlock();
    // Nothing to show, and nothing to wait for.
    gst_pad_send_event(pad, gst_event_new_gap(GST_BUFFER_PTS(buffer), GST_CLOCK_TIME_NONE));
  }
  return GST_PAD_PROBE_DROP;
}

GstPadProbeReturn KeyFrameGate::OnEvent(GstEvent* event) {
  switch (GST_EVENT_TYPE(event)) {
    case GST_EVENT_FLUSH_STOP:
      first_ = next_;
      passage_ = first_ ? Passage::kWaiting : Passage::kOpen;
      count_ = 0;
      break;
    case GST_EVENT_SEGMENT: clock_.Follow(event); break;
    case GST_EVENT_GAP:
      if (passage_ == Passage::kWaiting) return GST_PAD_PROBE_DROP;
      break;
    default: break;
  }
  return GST_PAD_PROBE_OK;
}

bool KeyFrameGate::LetsIn(const GstBuffer* buffer) {
  const auto time = clock_.Convert(GST_BUFFER_PTS(buffer));
  if (passage_ == Passage::kWaiting && time) passage_ = Judge(buffer, *time);
  if (IsClosed()) return false;
  // Theora's headers come without a time.
  if (passage_ == Passage::kWaiting) {
    return !time && GST_BUFFER_FLAG_IS_SET(buffer, GST_BUFFER_FLAG_HEADER);
  }
  const bool isBefore = passage_ == Passage::kPassed && time && *time < first_->from;
  if (!isBefore && IsKeyFrame(buffer)) Remember(buffer);
  return !isBefore;
}

/// \return what becomes of the passage when \p buffer comes to a gate that waits.
KeyFrameGate::Passage KeyFrameGate::Judge(const GstBuffer* buffer, FilmTime time) const {
  if (time < first_->from) return Passage::kWaiting;
  if (time > first_->to) return Passage::kMissed;
  return IsKeyFrame(buffer) ? Passage::kPassed : Passage::kBroken;
}

void KeyFrameGate::Remember(const GstBuffer* buffer) {
  if (count_ == keyFrames_.size()) return;
  keyFrames_[count_++] = {GST_BUFFER_PTS(buffer), GST_BUFFER_DURATION(buffer),
                          GetReordering(buffer)};
}

}  // namespace Desktop
