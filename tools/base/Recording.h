#pragma once

#include "OutputFile.h"

#include <chrono>
#include <string>

namespace CommandLine {

/// Writes what `Events` tells as a scenario: on the simulated device the shell plays it back, and
/// the same is heard.
class Recording {
 public:
  /// \param mode the session's mode, set before; "" for none
  Recording(const std::string& file, const std::string& mode);

  /// Adds an event of now, in the words of `Events`.
  void Add(const std::string& event);

  bool IsStandardOutput() const { return file_.IsStandardOutput(); }

  void Complete() { file_.Complete(); }

 private:
  using Clock = std::chrono::steady_clock;

  void Write(const std::string& line);

  OutputFile file_;
  Clock::time_point last_ = Clock::now();
};

}  // namespace CommandLine
