#include "KeyFrameProbe.h"

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

}  // namespace

KeyFrameProbe::KeyFrameProbe(GstElement* playbin) {
  g_signal_connect(playbin, "deep-element-added", G_CALLBACK(OnElementAdded), this);
}

bool KeyFrameProbe::IsKeyFrame(GstClockTime shown) const {
  std::lock_guard lock(mutex_);
  return std::any_of(keyFrames_.begin(), keyFrames_.begin() + count_, [=](const KeyFrame& frame) {
    // A decoder cuts a frame's begin off to where an exact seek went.
    const bool isWithin = shown > frame.begin && GST_CLOCK_TIME_IS_VALID(frame.duration) &&
                          shown - frame.begin < frame.duration;
    return shown == frame.begin || isWithin;
  });
}

void KeyFrameProbe::OnElementAdded(GstBin*, GstBin*, GstElement* element, gpointer probe) {
  if (!IsVideoDecoder(element)) return;
  const PadPtr sink(gst_element_get_static_pad(element, "sink"));
  if (sink == nullptr) return;
  constexpr int kWhat = GST_PAD_PROBE_TYPE_BUFFER | GST_PAD_PROBE_TYPE_EVENT_FLUSH;
  gst_pad_add_probe(sink.get(), static_cast<GstPadProbeType>(kWhat), OnData, probe, nullptr);
}

GstPadProbeReturn KeyFrameProbe::OnData(GstPad*, GstPadProbeInfo* info, gpointer data) {
  auto* probe = static_cast<KeyFrameProbe*>(data);
  if (GST_PAD_PROBE_INFO_TYPE(info) & GST_PAD_PROBE_TYPE_BUFFER) {
    probe->OnBuffer(GST_PAD_PROBE_INFO_BUFFER(info));
  } else if (GST_EVENT_TYPE(GST_PAD_PROBE_INFO_EVENT(info)) == GST_EVENT_FLUSH_STOP) {
    probe->OnFlush();
  }
  return GST_PAD_PROBE_OK;
}

void KeyFrameProbe::OnFlush() {
  std::lock_guard lock(mutex_);
  count_ = 0;
}

void KeyFrameProbe::OnBuffer(const GstBuffer* buffer) {
  if (GST_BUFFER_FLAG_IS_SET(buffer, GST_BUFFER_FLAG_DELTA_UNIT)) return;
  std::lock_guard lock(mutex_);
  if (count_ == keyFrames_.size()) return;
  keyFrames_[count_++] = {GST_BUFFER_PTS(buffer), GST_BUFFER_DURATION(buffer)};
}

}  // namespace Desktop
