/// \file
#pragma once

#include "Gst.h"

#include <player.h>

namespace Desktop {

/// Converts a decoded frame, square in its pixels and turned as \p tags say, and hands it to
/// \p callback.
/// \param tags of the video; may be null
void HandOver(GstSample* frame, const GstTagList* tags, player_frame_cb callback, void* userData);

}  // namespace Desktop
