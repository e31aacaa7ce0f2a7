#pragma once

#include <CLI/App.hpp>

#include <functional>

/// All commands; a new one is its file and a line here. COMMAND(X, offered) stands for the function
/// `AddXCommand`, and for where the command is offered.
#define ZELKORA_COMMANDS(COMMAND)           \
  COMMAND(Seek, kInBoth)                    \
  COMMAND(Filmstrip, kInBoth)               \
  COMMAND(Effects, kInBoth)                 \
  COMMAND(Volume, kInBoth)                  \
  COMMAND(Mute, kInBoth)                    \
  COMMAND(Session, kInBoth)                 \
  COMMAND(Call, kInProgram)                 \
  COMMAND(CallSteps, kInShell)              \
  COMMAND(Monitor, kInProgram)              \
  COMMAND(Shell, kInProgram)                \
  COMMAND(Devices, kInProgram)              \
  COMMAND(Doctor, kInProgram)               \
  COMMAND(Interrupt, kInShell | kSimulated) \
  COMMAND(Report, kInShell | kSimulated)    \
  COMMAND(Feature, kInShell)                \
  COMMAND(Privilege, kInShell)              \
  COMMAND(Fail, kInShell)                   \
  COMMAND(Calls, kInShell)                  \
  COMMAND(Log, kInShell)                    \
  COMMAND(Wait, kInShell)                   \
  COMMAND(Help, kInShell)                   \
  COMMAND(Exit, kInShell)

namespace CommandLine {

/// The command that the user chose, with its options; returns the program's exit code.
using Command = std::function<int()>;

// Each adds one command; parsing stores it in `chosen` when the user names it.
#define ZELKORA_DECLARE(name, offered) void Add##name##Command(CLI::App& program, Command& chosen);
ZELKORA_COMMANDS(ZELKORA_DECLARE)
#undef ZELKORA_DECLARE

/// Where a command is offered.
enum Offer : unsigned {
  kInProgram = 1,
  kInShell = 2,
  kInBoth = kInProgram | kInShell,
  kSimulated = 4,   ///< on the simulated device alone
  kOnAnyDevice = 8  ///< for a list: also what the device in use doesn't have
};

/// Adds all commands that are offered there on the device in use.
void AddCommands(CLI::App& program, Command& chosen, Offer place);

/// \return whether another device has a command of that name, there.
bool IsForAnotherDevice(const std::string& name, Offer place);

}  // namespace CommandLine
