#include "Recording.h"

#include "Names.h"

#include <fmt/format.h>

namespace CommandLine {
namespace {

constexpr long kShortestWait = 10;  // in milliseconds; what is closer came at once

// The platform's codes: of each kind one that brings about that event and no other. A disruption by
// code 2 would also swallow the end of the next interruption.
constexpr Named<int> kCodes[] = {
    {"interruption started", 5}, {"interruption finished", 0}, {"disruption", 1}};

std::string ToCommand(const std::string& event) {
  const auto* interruption = Find(kCodes, event);
  return interruption == nullptr ? "report " + event
                                 : fmt::format("interrupt {}", interruption->value);
}

}  // namespace

Recording::Recording(const std::string& file, const std::string& mode) : file_(file) {
  Write("# What happened on a device, for \"zelkora --device simulated shell\".");
  if (!mode.empty()) Write("session " + mode);
}

void Recording::Add(const std::string& event) {
  using std::chrono::milliseconds;
  const Clock::time_point now = Clock::now();
  const auto waited = std::chrono::duration_cast<milliseconds>(now - last_).count();
  last_ = now;
  if (waited >= kShortestWait) Write(fmt::format("wait {}", waited));
  Write(ToCommand(event));
}

void Recording::Write(const std::string& line) {
  file_.Write(line.data(), line.size());
  file_.Write("\n", 1);
}

}  // namespace CommandLine
