#include "World.h"

#include <Simulated/Device.h>

namespace World {

void Reset() { Simulated::Reset(); }

void ChangeLevel(int soundType, int level) { Simulated::ReportVolume(soundType, level); }
void ChangeMuteAll(bool isMuted) { Simulated::ReportMuteAll(isMuted); }
void BeginCall() { Simulated::Interrupt(5); }
void BeginAlarm() { Simulated::Interrupt(6); }
void EndCallOrAlarm() { Simulated::Interrupt(0); }
void TakeOutput() { Simulated::Interrupt(3); }

std::vector<int> GetCallModes() { return Simulated::GetCallSessionModes(); }

}  // namespace World
