#include "Commands.h"
#include "Device.h"
#include "DeviceLog.h"
#include "Failure.h"
#include "Output.h"

#include <fmt/format.h>
#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>

#include <cstdio>
#include <new>
#include <sstream>
#include <string>
#include <string_view>

namespace CommandLine {
namespace {

constexpr int kFailed = 1;
constexpr int kWrongUsage = 2;

/// What the user asked for.
struct Request {
  std::string device;  // "" for the default
  bool verbose = false;
  Command command;
};

/// \return an error text, "" for the name of a device, as CLI11 wants it.
std::string CheckDeviceName(const std::string& name) {
  std::string names;
  for (const Device::Entry& device : Device::List()) {
    if (device.name == name) return "";
    names += (names.empty() ? "" : ", ") + device.name;
  }
  return fmt::format("there is no device '{}' here; there are: {}", name,
                     names.empty() ? "none" : names);
}

void AddOptions(CLI::App& program, Request& request) {
  program.name("zelkora");
  program.description("Tries what libzelkora-media offers, on a device of your choice.");
  program.set_version_flag("--version", "zelkora " ZELKORA_VERSION);
  program
      .add_option("--device", request.device, "Device to run on; \"zelkora devices\" lists them")
      ->check(CheckDeviceName)
      ->type_name("NAME");
  program.add_flag("--verbose", request.verbose, "Show the device's log");
  program.get_formatter()->label("SUBCOMMAND", "COMMAND");
  program.require_subcommand(0, 1);
  program.fallthrough();  // these options are understood behind a command too
  for (auto add : {AddCallCommand, AddDevicesCommand, AddEffectsCommand, AddFilmstripCommand,
                   AddMonitorCommand, AddMuteCommand, AddSeekCommand, AddSessionCommand,
                   AddShellCommand, AddVolumeCommand}) {
    add(program, request.command);
  }
  for (CLI::App* command : program.get_subcommands(nullptr)) command->group("Commands");
}

int PrintHelp(const CLI::App& program, const CLI::ParseError& request) {
  std::ostringstream help;
  program.exit(request, help);
  Print(help.str());
  return 0;
}

int RefuseUsage(std::string_view reason) {
  PrintError(reason);
  std::fputs("Try \"zelkora --help\".\n", stderr);
  return kWrongUsage;
}

int Run(const Request& request, char** arguments) {
  if (!request.device.empty()) Device::Use(request.device, arguments);
  DeviceLog::Install(request.verbose);
  return request.command();
}

int Main(int count, char** arguments) {
  CLI::App program;
  Request request;
  AddOptions(program, request);
  try {
    program.parse(count, arguments);
  } catch (const CLI::ParseError& error) {
    const bool isHelp = error.get_exit_code() == 0;
    return isHelp ? PrintHelp(program, error) : RefuseUsage(error.what());
  }
  if (!request.command) return RefuseUsage("no command is given");
  return Run(request, arguments);
}

int MainWithoutExceptions(int count, char** arguments) {
  try {
    return Main(count, arguments);
  } catch (const std::bad_alloc&) {
    PrintError("out of memory");
  } catch (const std::exception& error) {
    PrintError(error.what());
  } catch (const OutputIsClosed&) {
  }
  return kFailed;
}

}  // namespace
}  // namespace CommandLine

int main(int count, char** arguments) {
  CommandLine::ReserveStandardStreams();
  return CommandLine::MainWithoutExceptions(count, arguments);
}
