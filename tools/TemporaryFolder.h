#pragma once

#include <filesystem>
#include <string>

namespace CommandLine {

/// An empty folder that is gone, with all in it, at the end.
class TemporaryFolder {
 public:
  /// Throws a `Failure` when it can't be made.
  TemporaryFolder();
  ~TemporaryFolder();
  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;

  std::string PathOf(const char* name) const { return path_ / name; }

 private:
  std::filesystem::path path_;
};

}  // namespace CommandLine
