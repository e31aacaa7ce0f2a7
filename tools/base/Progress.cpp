#include "Progress.h"

#include "Text.h"

#include <fmt/format.h>
#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <string_view>
#include <utility>

namespace CommandLine {
namespace {

using std::chrono::duration;

constexpr std::chrono::seconds kPatience{1};  // of the user, without a bar
constexpr std::chrono::milliseconds kDrawEvery{100};
constexpr std::size_t kWidth = 40;  // in characters
constexpr const char* kEraseLine = "\r\033[K";

/// A terminal that can erase a line.
bool IsTerminal() {
  const char* kind = std::getenv("TERM");
  return isatty(STDERR_FILENO) == 1 && kind != nullptr && std::string_view(kind) != "dumb";
}

}  // namespace

Progress::Progress(std::size_t steps) : steps_(steps), isWanted_(IsTerminal()) {}

Progress::~Progress() {
  if (isDrawn_) std::fputs(kEraseLine, stderr);
}

void Progress::Advance() { Show(double(++done_) / double(steps_)); }

void Progress::Show(double share) {
  const Clock::time_point now = Clock::now();
  if (!isWanted_ || now - start_ < kPatience || now - drawn_ < kDrawEvery) return;
  share = std::clamp(share, 0.001, 1.0);
  const double left = duration<double>(now - start_).count() * (1 - share) / share;
  const auto filled = static_cast<std::size_t>(share * kWidth);
  fmt::print(stderr, "{}[{:#<{}}{:.<{}}] {:.0f} %, {} left", kEraseLine, "", filled, "",
             kWidth - filled, share * 100, FormatSeconds(left));
  drawn_ = now;
  isDrawn_ = true;
}

WatchedProgress::WatchedProgress(std::function<double()> share) : share_(std::move(share)) {
  if (IsTerminal()) thread_ = std::thread(&WatchedProgress::Run, this);
}

WatchedProgress::~WatchedProgress() {
  {
    std::lock_guard lock(mutex_);
    ended_ = true;
  }
  end_.notify_one();
  if (thread_.joinable()) thread_.join();
}

void WatchedProgress::Run() {
  Progress progress;
  std::unique_lock lock(mutex_);
  while (!end_.wait_for(lock, kDrawEvery * 2, [this] { return ended_; })) progress.Show(share_());
}

}  // namespace CommandLine
