#include "Help.h"

#include "Text.h"

#include <fmt/format.h>

namespace CommandLine {
namespace {

constexpr std::size_t kColumn = 26;  // of the descriptions

/// \return a row of the help: a name, and its description to the right of it.
std::string Row(const std::string& name, const std::string& description) {
  std::string row = "  " + name;
  row += row.size() + 2 > kColumn ? "\n" + std::string(kColumn, ' ')
                                  : std::string(kColumn - row.size(), ' ');
  return row + Wrap(description, kColumn) + "\n";
}

bool IsMany(const CLI::Option& option) {
  return option.get_expected_max() >= CLI::detail::expected_max_vector_size;
}

/// \return "'a b'": words as they stood on the line.
std::string Quote(const std::vector<std::string>& words) {
  return fmt::format("'{}'", fmt::join(words, " "));
}

std::string ExplainExtras(const CLI::App& program) {
  const std::vector<std::string> extras = program.remaining(true);
  const CLI::App& command = InnermostCommand(program);
  if (extras.empty()) return "too many words";
  if (extras[0].size() > 1 && extras[0][0] == '-') {
    return fmt::format("there is no option '{}'", extras[0]);
  }
  if (&command == &program || command.get_require_subcommand_min() > 0) {
    return fmt::format("there is no command '{}'", extras[0]);
  }
  return fmt::format("{} is too much", Quote(extras));
}

}  // namespace

std::string HelpFormatter::make_option(const CLI::Option* option, bool isPositional) const {
  std::string name = make_option_name(option, isPositional);
  const std::string value = isPositional ? "" : ValueNameOf(*option);
  if (!value.empty()) name += " " + value;
  if (IsMany(*option)) name += "...";
  std::string description = option->get_description();
  if (!option->get_default_str().empty()) {
    description += fmt::format(" (without it {})", option->get_default_str());
  }
  return Row(name, description);
}

std::string HelpFormatter::make_subcommand(const CLI::App* command) const {
  return Row(command->get_name(), command->get_description());
}

std::string HelpFormatter::make_description(const CLI::App* command) const {
  return command->get_description().empty() ? "" : Wrap(command->get_description(), 0) + "\n";
}

std::string HelpFormatter::make_footer(const CLI::App* command) const {
  return command->get_footer().empty() ? "" : Wrap(command->get_footer(), 0) + "\n";
}

std::string ValueNameOf(const CLI::Option& option) {
  if (option.get_type_size() == 0) return "";
  const std::string type = option.get_type_name();
  return type.substr(0, type.find(':'));
}

std::vector<std::string> ValuesOf(const CLI::Option& option) {
  const std::string type = option.get_type_name();
  const std::size_t colon = type.find(':');
  if (option.get_type_size() == 0 || colon == std::string::npos) return {};
  return CLI::detail::split(type.substr(colon + 1), ' ');
}

const CLI::App* FindCommand(const CLI::App& program, const std::string& name) {
  const auto found =
      program.get_subcommands([&](const CLI::App* command) { return command->get_name() == name; });
  return found.empty() ? nullptr : found.front();
}

const CLI::App& InnermostCommand(const CLI::App& program) {
  const CLI::App* command = &program;
  while (!command->get_subcommands().empty()) command = command->get_subcommands().back();
  return *command;
}

std::string Explain(const CLI::App& program, const CLI::ParseError& error) {
  if (dynamic_cast<const CLI::ExtrasError*>(&error) != nullptr) return ExplainExtras(program);
  std::string text = error.what();
  if (text == "A subcommand is required") return "no command is given";
  const CLI::Option* option = nullptr;
  if (dynamic_cast<const CLI::ArgumentMismatch*>(&error) != nullptr) {
    option = InnermostCommand(program).get_option_no_throw(text.substr(0, text.find(':')));
  }
  if (option == nullptr) return text;
  return fmt::format("{} needs its {}", option->get_name(), ValueNameOf(*option));
}

}  // namespace CommandLine
