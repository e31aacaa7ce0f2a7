#pragma once

#include <cstddef>

namespace CommandLine {

/// A bar on standard error that is gone at the end; nothing where that isn't a terminal.
class Progress {
 public:
  explicit Progress(std::size_t steps);
  ~Progress();
  Progress(const Progress&) = delete;
  Progress& operator=(const Progress&) = delete;

  /// Shows that one more step is done.
  void Advance();

 private:
  void Draw() const;

  const std::size_t steps_;
  std::size_t done_ = 0;
  const bool visible_;
};

}  // namespace CommandLine
