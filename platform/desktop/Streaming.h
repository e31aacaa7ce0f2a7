/// \file
#pragma once

#include "Gst.h"

namespace Desktop {

/// \return whether any of a pipeline's streaming threads is at work. When none is, nothing comes
/// any more.
bool IsStreaming(GstElement* pipeline);

}  // namespace Desktop
