#include "Commands.h"
#include "base/Device.h"
#include "base/Managers.h"
#include "base/Output.h"

#include <Host/Needs.h>
#include <fmt/format.h>

#include <algorithm>
#include <string>
#include <vector>

// Not all devices define these; the loader leaves null then.
namespace Host {
// NOLINTBEGIN(readability-redundant-declaration)
std::vector<Need> ListPlayerNeeds() __attribute__((weak));
std::vector<Need> ListSoundManagerNeeds() __attribute__((weak));
// NOLINTEND(readability-redundant-declaration)
}  // namespace Host

namespace CommandLine {
namespace {

constexpr int kMissing = 1;

std::vector<Host::Need> ListNeeds() {
  std::vector<Host::Need> needs;
  for (auto list : {Host::ListPlayerNeeds, Host::ListSoundManagerNeeds}) {
    if (list == nullptr) continue;
    for (Host::Need& need : list()) needs.push_back(std::move(need));
  }
  return needs;
}

int Examine() {
  for (const Device::Entry& device : Device::List()) {
    if (device.loaded) Print(fmt::format("device: {}\n", device.name));
  }
  const std::vector<Host::Need> needs = ListNeeds();
  for (const Host::Need& need : needs) {
    Print(fmt::format("{:<8} {}\n", need.isMet ? "ok" : "missing", need.what));
    if (!need.isMet) Print(fmt::format("         mend it: {}\n", need.remedy));
  }
  const auto missing =
      std::count_if(needs.begin(), needs.end(), [](const Host::Need& need) { return !need.isMet; });
  Print(missing == 0 ? "nothing is missing\n" : fmt::format("{} missing\n", missing));
  return missing == 0 ? 0 : kMissing;
}

}  // namespace

void AddDoctorCommand(CLI::App& program, Command& chosen) {
  auto* command = program.add_subcommand(
      "doctor", "Tell what the device needs, what of it is missing, and what mends that");
  command->footer("Exits with 1 when something is missing.");
  command->callback([&chosen] { chosen = Examine; });
}

}  // namespace CommandLine
