#include "Text.h"

#include <fmt/format.h>

#include <cmath>
#include <sstream>

namespace CommandLine {
namespace {

constexpr std::size_t kLineLength = 80;

std::string WrapLine(const std::string& line, std::size_t indentation) {
  std::string wrapped = line.substr(0, line.find_first_not_of(' '));  // as far as it is set in
  std::size_t column = indentation + wrapped.size();
  bool first = true;
  std::istringstream words(line);
  for (std::string word; words >> word; first = false) {
    if (!first && column + 1 + word.size() > kLineLength) {
      wrapped += "\n" + std::string(indentation, ' ');
      column = indentation;
    } else if (!first) {
      wrapped += " ";
      ++column;
    }
    wrapped += word;
    column += word.size();
  }
  return wrapped;
}

}  // namespace

std::string Wrap(const std::string& text, std::size_t indentation) {
  std::string wrapped;
  std::istringstream lines(text);
  for (std::string line; std::getline(lines, line);) {
    if (!wrapped.empty()) wrapped += "\n" + std::string(indentation, ' ');
    wrapped += line.size() + indentation <= kLineLength ? line : WrapLine(line, indentation);
  }
  return wrapped;
}

std::string FormatSeconds(double seconds) {
  const long whole = std::lround(seconds);
  const long minutes = whole / 60;
  if (minutes < 60) return fmt::format("{}:{:02}", minutes, whole % 60);
  return fmt::format("{}:{:02}:{:02}", minutes / 60, minutes % 60, whole % 60);
}

}  // namespace CommandLine
