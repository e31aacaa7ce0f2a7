#include "base/Completion.h"
#include "base/Device.h"
#include "base/DeviceLog.h"
#include "base/Failure.h"
#include "base/Help.h"
#include "base/ManPage.h"
#include "base/Output.h"
#include "base/StopSignal.h"
#include "commands/Commands.h"

#include <fmt/format.h>

#include <cstdio>
#include <memory>
#include <new>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

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

std::string DeviceNames(const char* separator) {
  std::string names;
  for (const Device::Entry& device : Device::List()) {
    names += (names.empty() ? "" : separator) + device.name;
  }
  return names;
}

/// \return an error text, "" for the name of a device, as CLI11 wants it.
std::string CheckDeviceName(std::string& name) {
  for (const Device::Entry& device : Device::List()) {
    if (device.name == name) return "";
  }
  const std::string names = DeviceNames(", ");
  return fmt::format("there is no device '{}' here; there are: {}", name,
                     names.empty() ? "none" : names);
}

void AddOptions(CLI::App& program, Request& request) {
  program.name("zelkora");
  program.formatter(std::make_shared<HelpFormatter>());
  program.description("Tries what libzelkora-media offers, on a device of your choice.");
  program.set_version_flag("--version", "zelkora " ZELKORA_VERSION);
  program
      .add_option("--device", request.device, "Device to run on; \"zelkora devices\" lists them")
      ->check(CLI::Validator(CheckDeviceName, DeviceNames(" ")))
      ->type_name("NAME");
  program.add_flag("--verbose", request.verbose, "Show the device's log");
  program.require_subcommand(0, 1);
  program.fallthrough();  // these options are understood behind a command too
  program.footer("\"zelkora COMMAND --help\" tells more.");
  AddCommands(program, request.command, kInProgram);
}

int PrintHelp(const CLI::App& program, const CLI::ParseError& request) {
  std::ostringstream help;
  program.exit(request, help);
  Print(help.str());
  return 0;
}

int RefuseUsage(const CLI::App& program, std::string_view reason) {
  PrintError(reason);
  std::string command = "zelkora";
  for (const CLI::App* app = &program; !app->get_subcommands().empty();) {
    app = app->get_subcommands().back();
    command += " " + app->get_name();
  }
  fmt::print(stderr, "Try \"{} --help\".\n", command);
  return kWrongUsage;
}

int Run(const Request& request, char** arguments) {
  if (!request.device.empty()) Device::Use(request.device, arguments);
  const SignalThread signals;  // behind a start anew, which would inherit what it blocks
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
    return isHelp ? PrintHelp(program, error) : RefuseUsage(program, Explain(program, error));
  }
  if (!request.command) return RefuseUsage(program, "no command is given");
  return Run(request, arguments);
}

/// What shells and the build ask for; people needn't know. \return whether it was that
bool AnswerHiddenRequest(const std::vector<std::string>& words) {
  CLI::App program, shell;
  Request request;
  if (words.empty() || (words[0] != "--complete" && words[0] != "--man-page")) return false;
  AddOptions(program, request);
  if (words[0] == "--complete") {
    const Completion completion = Complete(program, {words.begin() + 1, words.end()});
    for (const std::string& word : completion.words) Print(word + "\n");
    if (completion.isFile) Print("FILE\n");
  } else {
    AddCommands(shell, request.command, Offer(kInShell | kOnAnyDevice));
    Print(ManPage(program, shell));
  }
  return true;
}

int MainWithoutExceptions(int count, char** arguments) {
  try {
    if (AnswerHiddenRequest({arguments + 1, arguments + count})) return 0;
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
