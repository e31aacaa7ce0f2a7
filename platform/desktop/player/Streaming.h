/// \file
#pragma once

#include "Gst.h"

#include <string>

namespace Desktop {

/// \return whether any of a pipeline's streaming threads is at work. When none is, nothing comes
/// any more.
bool IsStreaming(GstElement* pipeline);

/// \return the name of the element that takes the pipeline's file apart, or "".
std::string FindDemuxer(GstElement* pipeline);

}  // namespace Desktop
