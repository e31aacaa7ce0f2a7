#include "OutputFile.h"

#include "Failure.h"
#include "Output.h"

#include <fcntl.h>
#include <fmt/format.h>
#include <sys/stat.h>
#include <unistd.h>
#include <CLI/Error.hpp>

#include <cerrno>
#include <fstream>
#include <system_error>
#include <utility>

namespace CommandLine {
namespace {

namespace fs = std::filesystem;

constexpr const char* kFile = "file";  // its name while it isn't complete

}  // namespace

OutputFile::OutputFile(const std::string& name) : name_(name), target_(name) {
  std::error_code error;
  const fs::file_status status = fs::status(name, error);
  direct_ = name == "-" || fs::is_fifo(status);
  if (direct_) {
    OpenPipe();
  } else if (fs::is_directory(status)) {
    Fail(EISDIR);
  } else if (fs::exists(status) && !fs::is_regular_file(status)) {
    throw Failure(fmt::format("{} is not a file", name));
  } else {
    OpenFile();
  }
}

OutputFile::~OutputFile() {
  if (descriptor_ >= 0) close(descriptor_);
}

void OutputFile::OpenPipe() {
  const bool toOutput = name_ == "-";
  if (toOutput && isatty(STDOUT_FILENO) == 1) {
    throw Failure("standard output is a terminal, which can't show this");
  }
  descriptor_ = toOutput ? fcntl(STDOUT_FILENO, F_DUPFD_CLOEXEC, 0)
                         : open(name_.c_str(), O_WRONLY | O_CLOEXEC);
  if (descriptor_ < 0) Fail(errno);
  struct stat output, here;
  isStandardOutput_ = fstat(STDOUT_FILENO, &output) == 0 && fstat(descriptor_, &here) == 0 &&
                      output.st_dev == here.st_dev && output.st_ino == here.st_ino;
}

void OutputFile::OpenFile() {
  if (fs::exists(target_)) {
    if (access(name_.c_str(), W_OK) != 0) Fail(errno);  // to replace it would take no right to it
    target_ = fs::canonical(target_);
  } else if (fs::is_symlink(target_)) {
    Fail(ENOENT);  // the link would be lost
  }
  const fs::path parent = target_.parent_path();
  folder_.emplace(parent.empty() ? "." : parent, "write " + name_);
  descriptor_ = open(folder_->PathOf(kFile).c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0666);
  if (descriptor_ < 0) Fail(errno);
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

std::string OutputFile::Path() {
  if (!folder_) folder_.emplace();
  return folder_->PathOf(kFile);
}

void OutputFile::CopyToPipe() {
  std::ifstream file(Path(), std::ios::binary);
  char buffer[65536];
  while (file.read(buffer, sizeof buffer), file.gcount() > 0) {
    if (!Write(buffer, static_cast<std::size_t>(file.gcount()))) return;
  }
}

void OutputFile::Complete() {
  if (direct_ && folder_) CopyToPipe();
  if (error_ == EPIPE && isStandardOutput_) throw OutputIsClosed();
  if (error_ != 0) Fail(error_);
  if (close(std::exchange(descriptor_, -1)) != 0) Fail(errno);
  if (!direct_ && rename(Path().c_str(), target_.c_str()) != 0) Fail(errno);
}

void OutputFile::Fail(int error) const {
  FailWithSystemError(fmt::format("write {}", name_), error);
}

void RefuseSameFile(const std::string& output, const std::string& other) {
  std::error_code ignored;
  if (!fs::equivalent(output, other, ignored)) return;
  throw CLI::ValidationError(fmt::format("{} would be written over {}", output, other));
}

}  // namespace CommandLine
