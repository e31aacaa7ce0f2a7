#pragma once

#include <string>

namespace CommandLine {

/// \return \p text broken between words into lines of at most 80 characters, with its own line ends
/// kept.
/// \param indentation of all lines but the first, which begins in that column
std::string Wrap(const std::string& text, std::size_t indentation);

/// \return a length of time in whole seconds: "0:07", "1:02:03".
std::string FormatSeconds(double seconds);

}  // namespace CommandLine
