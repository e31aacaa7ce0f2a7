#include "Input.h"

#include "base/Failure.h"

#include <fcntl.h>
#include <fmt/format.h>
#include <unistd.h>

#include <cerrno>
#include <utility>

namespace CommandLine {

std::optional<std::string> Input::TakeLine() {
  if (lines_.empty()) return std::nullopt;
  std::string line = std::move(lines_.front());
  lines_.pop_front();
  return line;
}

FileInput::FileInput(const std::string& path)
    : path_(path.empty() ? "standard input" : path),
      descriptor_(path.empty() ? STDIN_FILENO : open(path.c_str(), O_RDONLY | O_CLOEXEC)) {
  if (descriptor_ < 0) FailWithSystemError(fmt::format("open {}", path_), errno);
}

FileInput::~FileInput() {
  if (descriptor_ != STDIN_FILENO) close(descriptor_);
}

void FileInput::Receive() {
  char buffer[4096];
  const ssize_t size = read(descriptor_, buffer, sizeof buffer);
  if (size < 0) FailWithSystemError(fmt::format("read {}", path_), errno);
  rest_.append(buffer, std::size_t(size));
  ended_ = size == 0;
  SplitLines();
}

void FileInput::SplitLines() {
  if (ended_ && !rest_.empty()) rest_ += '\n';
  std::size_t begin = 0;
  for (std::size_t end; (end = rest_.find('\n', begin)) != std::string::npos; begin = end + 1) {
    lines_.push_back(rest_.substr(begin, end - begin));
  }
  rest_.erase(0, begin);
}

}  // namespace CommandLine
