#include "Commands.h"
#include "base/Device.h"
#include "base/Output.h"

#include <fmt/format.h>

#include <algorithm>

namespace CommandLine {
namespace {

int ListDevices() {
  const auto devices = Device::List();
  std::size_t width = 0;
  for (const auto& device : devices) width = std::max(width, device.name.size());
  for (const auto& device : devices) {
    Print(fmt::format("{} {:<{}}  {}\n", device.loaded ? '*' : ' ', device.name, width,
                      device.folder));
  }
  return 0;
}

}  // namespace

void AddDevicesCommand(CLI::App& program, Command& chosen) {
  auto* command = program.add_subcommand("devices", "List the devices to run on");
  command->footer("The star marks the device in use; --device NAME chooses another.");
  command->callback([&chosen] { chosen = ListDevices; });
}

}  // namespace CommandLine
