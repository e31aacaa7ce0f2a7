/// \file
/// The device that the managers' tests run on, and what goes on around the program there: one such
/// file of functions for the simulated device, one for a desktop with a sound server of the test's own.
#pragma once

#include <vector>

namespace World {

/// Puts the device back to its start: media at level 7, nothing muted, the media session, no failures,
/// no other program. Nothing of it is heard later. Calls stay open.
void Reset();

/// \name What other programs do
/// @{
void ChangeLevel(int soundType, int level);
void ChangeMuteAll(bool isMuted);
void BeginCall();
void BeginAlarm();
void EndCallOrAlarm();
/// Takes the sound's output away.
void TakeOutput();
/// @}

/// \return the modes of this process's open calls, as others see them
std::vector<int> GetCallModes();

}  // namespace World
