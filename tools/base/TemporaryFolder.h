#pragma once

#include <filesystem>
#include <string>

namespace CommandLine {

/// A folder for files of a moment; it goes with this, or when a signal ends the program.
class TemporaryFolder {
 public:
  /// Throws a `Failure` when it can't be made.
  /// \param parent where it is made \param attempt what it is for: "write a.png"
  explicit TemporaryFolder(
      const std::filesystem::path& parent = std::filesystem::temp_directory_path(),
      const std::string& attempt = "make a temporary folder");
  ~TemporaryFolder();
  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;

  std::string PathOf(const std::string& name) const { return path_ / name; }

  /// Removes all that there are. Other threads, which may be writing there, wait here for the
  /// program's end.
  static void RemoveAllForEver();

 private:
  std::filesystem::path path_;
};

}  // namespace CommandLine
