#pragma once

#include <CLI/App.hpp>

#include <optional>
#include <string>

/// Positions, levels and numbers, as the user types them. The validators are CLI11's.
namespace CommandLine {

/// \return the milliseconds in "1500", "1500ms", "90s", "1.5s", "1:30" or "1:02:03.5", if it is
/// one.
std::optional<long> ToMilliseconds(const std::string& text);

CLI::Validator IsPosition();

/// What is to become of a level: "9", "+1", "-2" or "60%".
struct LevelChange {
  enum class Kind { kLevel, kStep, kPercent };

  Kind kind;
  int number;

  /// \return the level that it comes to; a step ends at the range's ends.
  int ApplyTo(int level, int min, int max) const;
};

std::optional<LevelChange> ToLevelChange(const std::string& text);

CLI::Validator IsLevelChange();

CLI::Validator IsWholeNumber(long min, long max);

/// Accepts names that end in one of \p endings, such as ".png", standard output and pipes.
CLI::Validator EndsIn(const std::vector<std::string>& endings);

}  // namespace CommandLine
