#include "Commands.h"
#include "Output.h"
#include "Shell.h"
#include "StopSignal.h"
#include "TerminalInput.h"

#include <unistd.h>

#include <memory>
#include <string>

namespace CommandLine {
namespace {

int RunShell(const std::string& file) {
  StopSignal stop;
  if (file.empty() && isatty(STDIN_FILENO) == 1 && isatty(STDOUT_FILENO) == 1) {
    TerminalInput input;
    return Shell(input, stop, "").Run();
  }
  FileInput input(file);
  return Shell(input, stop, file.empty() ? "standard input" : file).Run();
}

}  // namespace

void AddShellCommand(CLI::App& program, Command& chosen) {
  auto file = std::make_shared<std::string>();
  auto* command = program.add_subcommand("shell", "Run commands line by line in one process");
  command->add_option("FILE", *file, "A scenario to run; without it standard input")->type_name("");
  command->footer(
      "\"help\" in the shell lists its commands. A scenario's commands are shown behind \"> \",\n"
      "what the library reports behind \"< \", its log behind \"! \". An operation that fails is\n"
      "part of the scenario; a line that isn't understood ends it with exit code 2.");
  command->callback([file, &chosen] { chosen = [file] { return RunShell(*file); }; });
}

}  // namespace CommandLine
