#include "Streaming.h"

namespace Desktop {
namespace {

using IteratorPtr = std::unique_ptr<GstIterator, FreeWith<gst_iterator_free>>;

/// When the pipeline changes meanwhile, the iterator starts again.
bool HasAny(GstIterator* iterator, GCompareFunc isOther) {
  GValue found = G_VALUE_INIT;
  const bool hasFound = gst_iterator_find_custom(iterator, isOther, &found, nullptr);
  if (hasFound) g_value_unset(&found);
  return hasFound;
}

int IsIdlePad(gconstpointer value, gconstpointer) {
  auto* pad = GST_PAD(g_value_get_object(static_cast<const GValue*>(value)));
  return gst_pad_get_task_state(pad) == GST_TASK_STARTED ? 0 : 1;
}

int IsIdleElement(gconstpointer value, gconstpointer) {
  auto* element = GST_ELEMENT(g_value_get_object(static_cast<const GValue*>(value)));
  const IteratorPtr pads(gst_element_iterate_pads(element));
  return HasAny(pads.get(), IsIdlePad) ? 0 : 1;
}

/// What only reads the tags around a file is a demuxer to GStreamer too.
int IsNoDemuxer(gconstpointer value, gconstpointer) {
  auto* element = GST_ELEMENT(g_value_get_object(static_cast<const GValue*>(value)));
  GstElementFactory* factory = gst_element_get_factory(element);
  if (factory == nullptr) return 1;
  const bool isDemuxer =
      gst_element_factory_list_is_type(factory, GST_ELEMENT_FACTORY_TYPE_DEMUXER) &&
      !gst_element_factory_list_is_type(factory, GST_ELEMENT_FACTORY_TYPE_MEDIA_METADATA);
  return isDemuxer ? 0 : 1;
}

}  // namespace

std::string FindDemuxer(GstElement* pipeline) {
  const IteratorPtr elements(gst_bin_iterate_recurse(GST_BIN(pipeline)));
  GValue found = G_VALUE_INIT;
  std::string name;
  if (gst_iterator_find_custom(elements.get(), IsNoDemuxer, &found, nullptr)) {
    auto* demuxer = GST_ELEMENT(g_value_get_object(&found));
    name = GST_OBJECT_NAME(gst_element_get_factory(demuxer));
    g_value_unset(&found);
  }
  return name;
}

bool IsStreaming(GstElement* pipeline) {
  const IteratorPtr elements(gst_bin_iterate_recurse(GST_BIN(pipeline)));
  return HasAny(elements.get(), IsIdleElement);
}

}  // namespace Desktop
