#include "Steering.h"

#include <Simulated/Device.h>

// Only the simulated device's libraries define these. Weak, so that the program starts on any
// device; the loader leaves null where a device has none.
namespace Simulated {
// NOLINTBEGIN(readability-redundant-declaration)
void ReportVolume(int type, int level) __attribute__((weak));
void ReportMuteAll(bool muteall) __attribute__((weak));
void Interrupt(int code) __attribute__((weak));
// NOLINTEND(readability-redundant-declaration)
}  // namespace Simulated

namespace CommandLine::Steering {

bool IsPossible() noexcept { return &Simulated::Interrupt != nullptr; }

void ReportVolume(int type, int level) { Simulated::ReportVolume(type, level); }
void ReportMuteAll(bool muted) { Simulated::ReportMuteAll(muted); }
void Interrupt(int code) { Simulated::Interrupt(code); }

}  // namespace CommandLine::Steering
