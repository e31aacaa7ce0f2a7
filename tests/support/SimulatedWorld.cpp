#include "World.h"

#include <Simulated/Device.h>

namespace World {

void Reset() { Simulated::Reset(); }

std::vector<int> GetCallModes() { return Simulated::GetCallSessionModes(); }

}  // namespace World
