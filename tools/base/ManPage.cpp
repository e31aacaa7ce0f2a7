#include "ManPage.h"

#include "Help.h"

#include <fmt/format.h>

#include <sstream>

namespace CommandLine {
namespace {

/// \return \p text with nothing left in it that troff would take for its own.
std::string Plain(const std::string& text) {
  std::string plain;
  for (char character : text) {
    if (character == '\\') plain += "\\e";
    if (character == '-') plain += "\\-";
    if (character != '\\' && character != '-') plain += character;
  }
  return plain;
}

/// \return lines, each on a line of its own in the page; the first may begin with anything.
std::string Lines(const std::string& text) {
  std::string lines;
  std::istringstream stream(text);
  for (std::string line; std::getline(stream, line);) {
    lines += (lines.empty() ? "" : ".br\n") + Plain(line) + "\n";
  }
  return lines;
}

std::string Option(const CLI::Option& option) {
  const bool isPositional = option.get_positional();
  std::string name = option.get_name(isPositional, !isPositional);
  std::string text = fmt::format(".TP\n\\fB{}\\fR", Plain(name));
  if (!isPositional && !ValueNameOf(option).empty()) {
    text += fmt::format(" \\fI{}\\fR", Plain(ValueNameOf(option)));
  }
  text += "\n" + Lines(option.get_description());
  if (!option.get_default_str().empty()) {
    text += Plain(fmt::format("Without it {}.", option.get_default_str())) + "\n";
  }
  return text;
}

std::string Options(const CLI::App& command) {
  std::string text;
  for (const CLI::Option* option : command.get_options({})) {
    if (option != command.get_help_ptr()) text += Option(*option);
  }
  return text;
}

std::string Usage(const CLI::App& command) {
  std::string usage;
  for (const CLI::Option* option : command.get_options({})) {
    if (!option->get_positional()) continue;
    const bool isMany = option->get_expected_max() >= CLI::detail::expected_max_vector_size;
    const std::string name = option->get_name(true) + (isMany ? "..." : "");
    usage += option->get_required() ? " " + name : " [" + name + "]";
  }
  return usage;
}

/// \param name with those of the commands above it
// NOLINTNEXTLINE(misc-no-recursion) commands are a tree
std::string Section(const CLI::App& command, const std::string& name) {
  std::string text = fmt::format(".SS {}{}\n{}.\n", Plain(name), Plain(Usage(command)),
                                 Plain(command.get_description()));
  text += Options(command);
  if (!command.get_footer().empty()) text += ".PP\n" + Lines(command.get_footer());
  for (const CLI::App* inner : command.get_subcommands({})) {
    text += Section(*inner, name + " " + inner->get_name());
  }
  return text;
}

std::string Sections(const CLI::App& program) {
  std::string text;
  for (const CLI::App* command : program.get_subcommands({})) {
    text += Section(*command, command->get_name());
  }
  return text;
}

}  // namespace

std::string ManPage(const CLI::App& program, const CLI::App& shell) {
  return fmt::format(
      ".TH ZELKORA 1 \"\" \"{}\" \"User Commands\"\n"
      ".SH NAME\nzelkora \\- {}\n"
      ".SH SYNOPSIS\n.B zelkora\n[OPTIONS] COMMAND ...\n"
      ".SH OPTIONS\n{}.SH COMMANDS\n{}"
      ".SH COMMANDS OF THE SHELL\nWhat \\fBzelkora shell\\fR understands.\n{}"
      ".SH EXIT STATUS\n0 on success, 1 when something failed, 2 when the command line wasn't "
      "understood.\n",
      Plain(program.version()), Plain(program.get_description()), Options(program),
      Sections(program), Sections(shell));
}

}  // namespace CommandLine
