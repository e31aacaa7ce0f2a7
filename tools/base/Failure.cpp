#include "Failure.h"

#include "DeviceLog.h"
#include "Text.h"

#include <fmt/format.h>
#include <unistd.h>

#include <cstdio>
#include <system_error>

namespace CommandLine {
namespace {

/// For results whose reason no device has logged.
const char* WordsFor(result r) {
  switch (r) {
    case E_INVALID_ARG: return "an argument is rejected";
    case E_INVALID_OPERATION: return "that can't be done now";
    case E_INVALID_STATE: return "a step that must come first is missing";
    case E_OBJ_NOT_FOUND: return "not found";
    case E_OUT_OF_MEMORY: return "out of memory";
    case E_PRIVILEGE_DENIED: return "the privilege for it is denied";
    case E_UNSUPPORTED_OPERATION: return "the device doesn't offer it";
    default: return "the device failed";
  }
}

}  // namespace

std::string Describe(std::string_view attempt, result r) {
  std::string reason = DeviceLog::TakeReason(r);
  if (reason.empty()) reason = WordsFor(r);
  return fmt::format("cannot {}: {} ({})", attempt, reason, GetErrorMessage(r));
}

void Check(result r, std::string_view attempt) {
  if (r != E_SUCCESS) throw Failure(Describe(attempt, r));
}

void FailWithSystemError(std::string_view attempt, int error) {
  throw Failure(fmt::format("cannot {}: {}", attempt, std::generic_category().message(error)));
}

void PrintError(std::string_view text) noexcept {
  try {
    const std::string line = "zelkora: " + std::string(text);
    fmt::print(stderr, "{}\n", isatty(STDERR_FILENO) == 1 ? Wrap(line, 0) : line);
  } catch (...) {  // there is no memory, or nobody reads
    std::fprintf(stderr, "zelkora: %.*s\n", static_cast<int>(text.size()), text.data());
  }
}

}  // namespace CommandLine
