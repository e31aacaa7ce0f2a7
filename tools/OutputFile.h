#pragma once

#include <cstddef>
#include <string>

namespace CommandLine {

/// A file that appears under its name only when it is complete.
class OutputFile {
 public:
  /// Throws a `Failure` when the file can't be created; leaves nothing behind.
  static void Try(const std::string& path) { OutputFile file(path); }

  /// Creates it under a temporary name in the same folder; throws a `Failure` when that fails, or
  /// when something other than a file has the name.
  explicit OutputFile(const std::string& path);

  /// Removes the file unless it is complete.
  ~OutputFile();
  OutputFile(const OutputFile&) = delete;
  OutputFile& operator=(const OutputFile&) = delete;

  /// \return false when the device is full or fails; `Complete` then throws the reason.
  bool Write(const void* data, std::size_t size) noexcept;

  /// Gives the file its name, in place of an older file; throws a `Failure` when anything went
  /// wrong.
  void Complete();

 private:
  [[noreturn]] void Fail(int error) const;

  const std::string path_;  // as the user wrote it
  std::string target_;      // with links followed
  std::string temporary_;   // "" when complete
  int descriptor_ = -1;
  int error_ = 0;  // the first error number of a write
};

}  // namespace CommandLine
