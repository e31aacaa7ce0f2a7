#pragma once

#include "TemporaryFolder.h"

#include <cstddef>
#include <optional>
#include <string>

namespace CommandLine {

/// What a command writes for the user.
///
/// A file appears under its name only when it is complete, in place of an older one; until then it
/// lies in a temporary folder beside. Standard output and pipes are written directly.
class OutputFile {
 public:
  /// Throws a `Failure` when it can't be written: a terminal, a device and a folder can't.
  /// \param name "-" for standard output
  explicit OutputFile(const std::string& name);
  ~OutputFile();
  OutputFile(const OutputFile&) = delete;
  OutputFile& operator=(const OutputFile&) = delete;

  /// \return the name as the user wrote it.
  const std::string& Name() const { return name_; }

  /// \return whether what is printed would get into it.
  bool IsStandardOutput() const { return isStandardOutput_; }

  /// \return false when the device is full or fails; `Complete` then throws the reason.
  bool Write(const void* data, std::size_t size) noexcept;

  /// For who writes by name, and not by `Write`: \return the file to write in place of this one.
  std::string Path();

  /// Ends writing; throws a `Failure` when anything went wrong.
  void Complete();

 private:
  void OpenPipe();
  void OpenFile();
  void CopyToPipe();
  [[noreturn]] void Fail(int error) const;

  const std::string name_;
  bool direct_ = false;  // to standard output or a pipe
  bool isStandardOutput_ = false;
  std::filesystem::path target_;           // with links followed
  std::optional<TemporaryFolder> folder_;  // beside it; for a pipe when `Path` was asked for
  int descriptor_ = -1;
  int error_ = 0;  // the first error number of a write
};

/// Refuses to write a file that the command reads, or writes for something else, whatever links
/// lead to it: throws a `CLI::ValidationError`.
/// \param output the file to be written \param other "" for none
void RefuseSameFile(const std::string& output, const std::string& other);

}  // namespace CommandLine
