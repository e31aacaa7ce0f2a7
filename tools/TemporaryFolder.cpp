#include "TemporaryFolder.h"

#include "Failure.h"

#include <cerrno>
#include <cstdlib>
#include <system_error>

namespace CommandLine {

TemporaryFolder::TemporaryFolder() {
  std::string pattern = std::filesystem::temp_directory_path() / "zelkora-XXXXXX";
  if (mkdtemp(pattern.data()) == nullptr) FailWithSystemError("make " + pattern, errno);
  path_ = pattern;
}

TemporaryFolder::~TemporaryFolder() {
  std::error_code ignored;
  std::filesystem::remove_all(path_, ignored);
}

}  // namespace CommandLine
