#pragma once

#include <CLI/App.hpp>

#include <functional>

namespace CommandLine {

/// The command that the user chose, with its options; returns the program's exit code.
using Command = std::function<int()>;

// Each function adds one command to the program; parsing stores it in `chosen` when the user names
// it.
void AddCallCommand(CLI::App& program, Command& chosen);
void AddDevicesCommand(CLI::App& program, Command& chosen);
void AddEffectsCommand(CLI::App& program, Command& chosen);
void AddFilmstripCommand(CLI::App& program, Command& chosen);
void AddMonitorCommand(CLI::App& program, Command& chosen);
void AddMuteCommand(CLI::App& program, Command& chosen);
void AddSeekCommand(CLI::App& program, Command& chosen);
void AddSessionCommand(CLI::App& program, Command& chosen);
void AddShellCommand(CLI::App& program, Command& chosen);
void AddVolumeCommand(CLI::App& program, Command& chosen);

// The same for the shell's own commands.

/// A call in steps: the session stays open from one line to the next.
void AddCallStepsCommand(CLI::App& shell, Command& chosen);

/// What happens to the program from outside, and what the platform answers it.
void AddSteeringCommands(CLI::App& shell, Command& chosen);

}  // namespace CommandLine
