#pragma once

#include <Tizen/Base/Result.h>

#include <stdexcept>
#include <string>
#include <string_view>

namespace CommandLine {

/// Ends a command; the text is what the user reads after "zelkora: ".
struct Failure : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// Puts a failed operation in words: "cannot open a.mp4: no such file (E_OBJ_NOT_FOUND)".
/// \param attempt what was attempted: "open a.mp4"
std::string Describe(std::string_view attempt, result r);

/// Throws a `Failure` unless \p r is `E_SUCCESS`.
void Check(result r, std::string_view attempt);

/// Throws a `Failure` for the error number \p error of the system: "cannot write a.png: ...".
[[noreturn]] void FailWithSystemError(std::string_view attempt, int error);

/// Writes a line to standard error, with the program's name in front; on a terminal it breaks
/// between words.
void PrintError(std::string_view text) noexcept;

}  // namespace CommandLine
