/// \file
/// Owners of GStreamer's and GLib's things.
#pragma once

#include "FreeWith.h"

#include <gst/gst.h>

#include <memory>

namespace Desktop {

using ElementPtr = std::unique_ptr<GstElement, FreeWith<gst_object_unref>>;
using BusPtr = std::unique_ptr<GstBus, FreeWith<gst_object_unref>>;
using PadPtr = std::unique_ptr<GstPad, FreeWith<gst_object_unref>>;
using SamplePtr = std::unique_ptr<GstSample, FreeWith<gst_sample_unref>>;
using CapsPtr = std::unique_ptr<GstCaps, FreeWith<gst_caps_unref>>;
using ErrorPtr = std::unique_ptr<GError, FreeWith<g_error_free>>;
using TextPtr = std::unique_ptr<char, FreeWith<g_free>>;

/// \return a new element, or null when no plug-in offers one.
inline ElementPtr MakeElement(const char* factory) {
  GstElement* element = gst_element_factory_make(factory, nullptr);
  return ElementPtr(element == nullptr ? nullptr : GST_ELEMENT(gst_object_ref_sink(element)));
}

}  // namespace Desktop
