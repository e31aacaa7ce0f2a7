// The shell's own commands.

#include "Shell.h"
#include "base/Help.h"
#include "base/Managers.h"
#include "base/Output.h"
#include "base/Quantities.h"
#include "commands/Commands.h"

#include <memory>
#include <string>
#include <vector>

namespace CommandLine {
namespace {

constexpr long kLongestWait = 24L * 60 * 60 * 1000;  // in milliseconds

/// Throws what parsing throws when there is no such command.
int ShowHelp(const CLI::App& app, const std::vector<std::string>& words) {
  const CLI::App* command = &app;
  for (const std::string& word : words) {
    command = FindCommand(*command, word);
    if (command == nullptr) throw CLI::ValidationError("there is no command '" + word + "'");
  }
  // Asked of the formatter: the app itself would show the help of the command that was parsed.
  Print(app.get_formatter()->make_help(command, command->get_name(), CLI::AppFormatMode::Normal));
  return 0;
}

}  // namespace

void AddHelpCommand(CLI::App& program, Command& chosen) {
  auto words = std::make_shared<std::vector<std::string>>();
  auto* command = program.add_subcommand("help", "List the commands, or tell more of one");
  command->add_option("COMMAND", *words, "The command")->type_name("");
  command->callback([&program, words, &chosen] {
    chosen = [&program, words] { return ShowHelp(program, *words); };
  });
}

void AddExitCommand(CLI::App& program, Command& chosen) {
  program.add_subcommand("exit", "Leave the shell")->callback([&chosen] {
    chosen = [] { return Shell::Current()->End(0), 0; };
  });
}

void AddLogCommand(CLI::App& program, Command& chosen) {
  auto wanted = std::make_shared<std::string>();
  auto* command =
      program.add_subcommand("log", "Show also what is no failure in the library's log");
  command->add_option("SWITCH", *wanted, NamesIn(kSwitch))
      ->check(OneOf(kSwitch, "switch"))
      ->required()
      ->type_name("");
  command->callback([wanted, &chosen] {
    chosen = [wanted] {
      return Shell::Current()->ShowInformation(Find(kSwitch, *wanted)->value), 0;
    };
  });
}

void AddWaitCommand(CLI::App& program, Command& chosen) {
  auto time = std::make_shared<long>(0);
  auto* command = program.add_subcommand("wait", "Pause, for a scenario that is watched");
  command->add_option("MS", *time, "How long, in milliseconds")
      ->check(IsWholeNumber(0, kLongestWait))
      ->required()
      ->type_name("");
  command->callback(
      [time, &chosen] { chosen = [time] { return Shell::Current()->Pause(*time), 0; }; });
}

}  // namespace CommandLine
