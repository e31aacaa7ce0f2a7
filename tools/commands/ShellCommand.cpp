#include "Commands.h"
#include "base/Output.h"
#include "shell/Shell.h"
#include "shell/TerminalInput.h"

#include <unistd.h>

#include <memory>
#include <string>

namespace CommandLine {
namespace {

struct Options {
  std::string file;  // "" for standard input
  bool skipsPauses = false;
};

int Run(Input& input, const Options& options) {
  Shell shell(input, options.file.empty() ? "standard input" : options.file);
  if (options.skipsPauses) shell.SkipPauses();
  return shell.Run();
}

int RunShell(const Options& options) {
  if (options.file.empty() && isatty(STDIN_FILENO) == 1 && isatty(STDOUT_FILENO) == 1) {
    TerminalInput input;
    return Run(input, options);
  }
  FileInput input(options.file);
  return Run(input, options);
}

}  // namespace

void AddShellCommand(CLI::App& program, Command& chosen) {
  auto options = std::make_shared<Options>();
  auto* command = program.add_subcommand("shell", "Run commands line by line in one process");
  command->add_option("FILE", options->file, "A scenario to run; without it standard input")
      ->type_name("");
  command->add_flag("--no-wait", options->skipsPauses, "Skip a scenario's pauses");
  command->footer(
      "\"help\" in the shell lists its commands. A scenario's commands are shown behind \"> \",\n"
      "what the library reports behind \"< \", its log behind \"! \". An operation that fails is\n"
      "part of the scenario; a line that isn't understood ends it with exit code 2.");
  command->callback([options, &chosen] { chosen = [options] { return RunShell(*options); }; });
}

}  // namespace CommandLine
