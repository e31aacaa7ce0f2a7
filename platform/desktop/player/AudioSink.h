/// \file
#pragma once

#include "Gst.h"

namespace Desktop {

/// \return where a player's sound goes: to the sound server, or, when none answers at once,
/// nowhere, in real time. Null when not even that can be made. The stream on the server follows the
/// session's role; when the server is lost, the sink fails.
ElementPtr MakeAudioSink();

/// For any thread. \return whether \p object is such a sink between two streams. Asked for the time
/// then, the sink posts a spurious error; a real one is posted again afterwards.
bool IsReplacingStream(GstObject* object);

}  // namespace Desktop
