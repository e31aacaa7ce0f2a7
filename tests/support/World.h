/// \file
/// The device that the managers' tests run on: one such file of functions for the simulated device,
/// one for a desktop with a sound server of the test's own.
#pragma once

#include <vector>

namespace World {

/// Puts the device back to its start: media at level 7, nothing muted, the media session, no
/// failures. Nothing of it is heard later. Calls stay open.
void Reset();

/// \return the modes of this process's open calls, as others see them
std::vector<int> GetCallModes();

}  // namespace World
