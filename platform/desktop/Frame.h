/// \file
#pragma once

#include "Gst.h"

#include <player.h>

namespace Desktop {

/// Converts a decoded frame and hands it to \p callback.
int HandOver(GstSample* frame, player_frame_cb callback, void* userData);

}  // namespace Desktop
