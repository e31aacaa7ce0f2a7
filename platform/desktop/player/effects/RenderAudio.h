/// \file
#pragma once

#include "Settings.h"

namespace Desktop {

/// Writes the sound of the media at \p uri, with effects, to the WAV file \p path. Bounded by how
/// long it stands still, not by how long it takes. Failures are logged, thrown, and leave no file.
void RenderAudio(const char* uri, const EffectSettings& settings, const char* path);

}  // namespace Desktop
