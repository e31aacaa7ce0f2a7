#pragma once

#include <CLI/App.hpp>
#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>

#include <string>

/// What the user reads about commands and options.
namespace CommandLine {

/// Help that fits a terminal of 80 columns.
class HelpFormatter : public CLI::Formatter {
 public:
  HelpFormatter() { label("SUBCOMMAND", "COMMAND"); }

  std::string make_option(const CLI::Option* option, bool isPositional) const override;
  std::string make_subcommand(const CLI::App* command) const override;
  std::string make_description(const CLI::App* command) const override;
  std::string make_footer(const CLI::App* command) const override;
};

/// \return what an option's value is called: "LEVEL"; "" for a switch.
std::string ValueNameOf(const CLI::Option& option);

/// \return the values that an option takes, where they are known.
std::vector<std::string> ValuesOf(const CLI::Option& option);

/// \return the command of that name among \p program's, or null.
const CLI::App* FindCommand(const CLI::App& program, const std::string& name);

/// \return the command that parsing has reached, or \p program.
const CLI::App& InnermostCommand(const CLI::App& program);

/// \return what is wrong with the command line, in the user's own order of words.
std::string Explain(const CLI::App& program, const CLI::ParseError& error);

}  // namespace CommandLine
