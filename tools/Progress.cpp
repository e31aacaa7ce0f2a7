#include "Progress.h"

#include <fmt/format.h>
#include <unistd.h>

namespace CommandLine {
namespace {

constexpr std::size_t kWidth = 40;  // in characters
constexpr const char* kEraseLine = "\r\033[K";

}  // namespace

Progress::Progress(std::size_t steps) : steps_(steps), visible_(isatty(STDERR_FILENO) == 1) {
  Draw();
}

Progress::~Progress() {
  if (visible_) std::fputs(kEraseLine, stderr);
}

void Progress::Advance() {
  ++done_;
  Draw();
}

void Progress::Draw() const {
  if (!visible_) return;
  const std::size_t filled = done_ * kWidth / steps_;
  fmt::print(stderr, "{}[{:#<{}}{:.<{}}] {}/{}", kEraseLine, "", filled, "", kWidth - filled, done_,
             steps_);
}

}  // namespace CommandLine
