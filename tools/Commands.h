#pragma once

#include <CLI/App.hpp>

#include <functional>

namespace CommandLine {

/// The command that the user chose, with its options; returns the program's exit code.
using Command = std::function<int()>;

// Each function adds one command to the program; parsing stores it in `chosen` when the user names
// it.
void AddDevicesCommand(CLI::App& program, Command& chosen);
void AddFilmstripCommand(CLI::App& program, Command& chosen);
void AddSeekCommand(CLI::App& program, Command& chosen);

}  // namespace CommandLine
