#pragma once

#include <CLI/App.hpp>

#include <string>

namespace CommandLine {

/// \return the manual's page of the program, with all its commands and those of its shell, as
/// troff.
std::string ManPage(const CLI::App& program, const CLI::App& shell);

}  // namespace CommandLine
