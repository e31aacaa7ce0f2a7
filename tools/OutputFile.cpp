#include "OutputFile.h"

#include "Failure.h"

#include <fmt/format.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <filesystem>
#include <utility>

namespace CommandLine {
namespace {

namespace fs = std::filesystem;

/// A temporary file is private; this gives it the rights that any new file has.
void GiveUsualRights(int descriptor) {
  const mode_t mask = umask(0);
  umask(mask);
  fchmod(descriptor, 0666 & ~mask);
}

}  // namespace

OutputFile::OutputFile(const std::string& path) : path_(path), target_(path) {
  std::error_code error;
  const fs::file_status status = fs::status(path, error);
  if (fs::exists(status)) {
    if (fs::is_directory(status)) Fail(EISDIR);
    if (!fs::is_regular_file(status)) throw Failure(fmt::format("{} is not a file", path));
    target_ = fs::canonical(path);
  }
  temporary_ = target_ + ".XXXXXX";
  descriptor_ = mkstemp(temporary_.data());
  if (descriptor_ < 0) Fail(errno);
  GiveUsualRights(descriptor_);
}

OutputFile::~OutputFile() {
  if (descriptor_ >= 0) close(descriptor_);
  if (!temporary_.empty()) unlink(temporary_.c_str());
}

bool OutputFile::Write(const void* data, std::size_t size) noexcept {
  const char* bytes = static_cast<const char*>(data);
  while (size > 0 && error_ == 0) {
    const ssize_t written = write(descriptor_, bytes, size);
    if (written < 0) {
      if (errno != EINTR) error_ = errno;
      continue;
    }
    bytes += written;
    size -= static_cast<std::size_t>(written);
  }
  return error_ == 0;
}

void OutputFile::Complete() {
  if (error_ != 0) Fail(error_);
  if (close(std::exchange(descriptor_, -1)) != 0) Fail(errno);
  if (rename(temporary_.c_str(), target_.c_str()) != 0) Fail(errno);
  temporary_.clear();
}

void OutputFile::Fail(int error) const {
  FailWithSystemError(fmt::format("write {}", path_), error);
}

}  // namespace CommandLine
