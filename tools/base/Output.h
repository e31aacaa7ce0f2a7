#pragma once

#include <string_view>

/// Standard output.
namespace CommandLine {

/// Ends a command without a word: nobody reads its output any more.
struct OutputIsClosed {};

/// Writes a text at once. Throws `OutputIsClosed`, or a `Failure` when the device is full or fails.
void Print(std::string_view text);

/// Throws `OutputIsClosed` when nothing can ever be written: for a command that may have to wait
/// long for its first line.
void RequireOutput();

/// To be called first. Keeps the numbers of closed standard streams from files that are opened
/// later, which would else receive what is printed. A pipe that nobody reads any more and a limit
/// of a file's size are errors of writing from now on, not signals.
void ReserveStandardStreams();

}  // namespace CommandLine
