#include "TemporaryFolder.h"

#include "Failure.h"

#include <cerrno>
#include <cstdlib>
#include <mutex>
#include <set>
#include <system_error>

namespace CommandLine {
namespace {

namespace fs = std::filesystem;

std::mutex mutex;  // guards the folders that there are
std::set<fs::path> folders;

void Remove(const fs::path& folder) {
  std::error_code error;
  do {
    fs::remove_all(folder, error);
  } while (error == std::errc::directory_not_empty);  // another thread has just made a file
}

}  // namespace

TemporaryFolder::TemporaryFolder(const fs::path& parent, const std::string& attempt) {
  std::string pattern = parent / ".zelkora-XXXXXX";
  std::lock_guard lock(mutex);
  if (mkdtemp(pattern.data()) == nullptr) FailWithSystemError(attempt, errno);
  path_ = pattern;
  folders.insert(path_);
}

TemporaryFolder::~TemporaryFolder() {
  std::lock_guard lock(mutex);
  Remove(path_);
  folders.erase(path_);
}

void TemporaryFolder::RemoveAllForEver() {
  mutex.lock();
  for (const fs::path& folder : folders) Remove(folder);
}

}  // namespace CommandLine
