/// \file
/// Owners of GStreamer's and GLib's things.
#pragma once

#include "desktop/FreeWith.h"

#include <gst/gst.h>

#include <memory>

namespace Desktop {

/// For what GStreamer itself frees by inline functions.
struct Unref {
  template <typename T>
  void operator()(T* thing) const {
    gst_mini_object_unref(GST_MINI_OBJECT_CAST(thing));
  }
};

using ElementPtr = std::unique_ptr<GstElement, FreeWith<gst_object_unref>>;
using BusPtr = std::unique_ptr<GstBus, FreeWith<gst_object_unref>>;
using PadPtr = std::unique_ptr<GstPad, FreeWith<gst_object_unref>>;
using SamplePtr = std::unique_ptr<GstSample, Unref>;
using CapsPtr = std::unique_ptr<GstCaps, Unref>;
using TagsPtr = std::unique_ptr<GstTagList, Unref>;
using ErrorPtr = std::unique_ptr<GError, FreeWith<g_error_free>>;
using TextPtr = std::unique_ptr<char, FreeWith<g_free>>;

/// Ends an element's streaming threads, and so what they use.
struct Stop {
  void operator()(GstElement* element) const { gst_element_set_state(element, GST_STATE_NULL); }
};

using StreamingPtr = std::unique_ptr<GstElement, Stop>;

/// \param description an element as gst-launch takes it: "fakesink sync=true"
/// \return a new one, or null when no plug-in offers it
inline ElementPtr MakeElement(const char* description) {
  GstElement* element =
      gst_parse_launch_full(description, nullptr, GST_PARSE_FLAG_FATAL_ERRORS, nullptr);
  return ElementPtr(element == nullptr ? nullptr : GST_ELEMENT(gst_object_ref_sink(element)));
}

inline bool IsInstalled(const char* factory) {
  using FactoryPtr = std::unique_ptr<GstElementFactory, FreeWith<gst_object_unref>>;
  return FactoryPtr(gst_element_factory_find(factory)) != nullptr;
}

/// Calls \p callback for what comes to a pad of \p element.
/// \param what values of `GstPadProbeType`
inline void Observe(GstElement* element, const char* pad, int what, GstPadProbeCallback callback,
                    gpointer data) {
  const PadPtr observed(gst_element_get_static_pad(element, pad));
  gst_pad_add_probe(observed.get(), static_cast<GstPadProbeType>(what), callback, data, nullptr);
}

}  // namespace Desktop
