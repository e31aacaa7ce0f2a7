#include "Commands.h"

#include "base/Help.h"
#include "shell/Steering.h"

#include <string>

namespace CommandLine {
namespace {

struct Row {
  void (*add)(CLI::App& program, Command& chosen);
  unsigned offered;
};

#define ZELKORA_ROW(name, offered) {Add##name##Command, offered},
constexpr Row kCommands[] = {ZELKORA_COMMANDS(ZELKORA_ROW)};
#undef ZELKORA_ROW

bool IsHere(const Row& row) { return (row.offered & kSimulated) == 0 || Steering::IsPossible(); }

}  // namespace

void AddCommands(CLI::App& program, Command& chosen, Offer place) {
  for (const Row& row : kCommands) {
    const bool isWanted = IsHere(row) || (place & kOnAnyDevice) != 0;
    if ((row.offered & place) != 0 && isWanted) row.add(program, chosen);
  }
  for (CLI::App* command : program.get_subcommands(nullptr)) command->group("Commands");
}

bool IsForAnotherDevice(const std::string& name, Offer place) {
  CLI::App others;
  Command ignored;
  for (const Row& row : kCommands) {
    if ((row.offered & place) != 0 && !IsHere(row)) row.add(others, ignored);
  }
  return FindCommand(others, name) != nullptr;
}

}  // namespace CommandLine
