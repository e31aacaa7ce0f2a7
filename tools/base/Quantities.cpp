#include "Quantities.h"

#include <fmt/format.h>

#include <algorithm>
#include <charconv>
#include <cmath>
#include <filesystem>
#include <limits>
#include <regex>

namespace CommandLine {
namespace {

namespace fs = std::filesystem;

std::optional<long> ToWholeNumber(const std::string& text) {
  long number = 0;
  const char* end = text.data() + text.size();
  const auto [rest, error] = std::from_chars(text.data(), end, number);
  return rest == end && error == std::errc() ? std::optional(number) : std::nullopt;
}

std::optional<long> ToMilliseconds(double seconds) {
  const double milliseconds = std::round(seconds * 1000);
  if (milliseconds >= static_cast<double>(std::numeric_limits<long>::max())) return std::nullopt;
  return static_cast<long>(milliseconds);
}

double ToNumber(const std::string& digits) { return digits.empty() ? 0 : std::stod(digits); }

CLI::Validator Validator(std::function<std::string(std::string&)> check) {
  return CLI::Validator(std::move(check), "");
}

}  // namespace

std::optional<long> ToMilliseconds(const std::string& text) {
  static const std::regex kPlain(R"((-?\d{1,18})(ms)?)");
  static const std::regex kSeconds(R"((\d{1,18}(\.\d{1,18})?)s)");
  static const std::regex kClock(R"(((\d{1,9}):)?(\d{1,9}):(\d\d?(\.\d{1,18})?))");
  std::smatch parts;
  if (std::regex_match(text, parts, kPlain)) return ToWholeNumber(parts[1]);
  if (std::regex_match(text, parts, kSeconds)) return ToMilliseconds(ToNumber(parts[1]));
  if (!std::regex_match(text, parts, kClock)) return std::nullopt;
  const double hours = ToNumber(parts[2]), minutes = ToNumber(parts[3]);
  const double seconds = ToNumber(parts[4]);
  if (seconds >= 60 || (parts[2].matched && minutes >= 60)) return std::nullopt;
  return ToMilliseconds((hours * 60 + minutes) * 60 + seconds);
}

CLI::Validator IsPosition() {
  return Validator([](std::string& text) -> std::string {
    if (ToMilliseconds(text)) return "";
    return fmt::format("'{}' is no position; write 1500 or 1500ms, 90s or 1.5s, 1:30 or 1:02:03.5",
                       text);
  });
}

int LevelChange::ApplyTo(int level, int min, int max) const {
  switch (kind) {
    case Kind::kLevel: return number;
    case Kind::kStep: return std::clamp(level + number, min, max);
    case Kind::kPercent: return min + ((max - min) * number + 50) / 100;
  }
  return level;
}

std::optional<LevelChange> ToLevelChange(const std::string& text) {
  static const std::regex kChange(R"(([+-]?)(\d{1,6})(%?))");
  std::smatch parts;
  if (!std::regex_match(text, parts, kChange)) return std::nullopt;
  const bool isStep = parts[1].length() > 0, isPercent = parts[3].length() > 0;
  const int number = std::stoi(parts[2]);
  if (isPercent && (isStep || number > 100)) return std::nullopt;
  if (isStep) return LevelChange{LevelChange::Kind::kStep, parts[1] == "-" ? -number : number};
  return LevelChange{isPercent ? LevelChange::Kind::kPercent : LevelChange::Kind::kLevel, number};
}

CLI::Validator IsLevelChange() {
  return Validator([](std::string& text) -> std::string {
    if (ToLevelChange(text)) return "";
    return fmt::format("'{}' is no level; write 9, +1, -2 or 60%", text);
  });
}

CLI::Validator IsWholeNumber(long min, long max) {
  return Validator([=](std::string& text) -> std::string {
    const auto number = ToWholeNumber(text);
    if (number && *number >= min && *number <= max) return "";
    return fmt::format("'{}' is no whole number from {} to {}", text, min, max);
  });
}

CLI::Validator EndsIn(const std::vector<std::string>& endings) {
  return Validator([endings](std::string& name) -> std::string {
    std::error_code ignored;
    const bool isPipe = name == "-" || fs::is_fifo(name, ignored);
    std::string ending = CLI::detail::to_lower(fs::path(name).extension());
    if (isPipe || std::count(endings.begin(), endings.end(), ending) > 0) return "";
    return fmt::format("'{}' doesn't end in {}", name, fmt::join(endings, " or "));
  });
}

}  // namespace CommandLine
