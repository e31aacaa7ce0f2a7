#include "DeviceLog.h"

#include <cstdio>
#include <cstring>
#include <mutex>
#include <utility>

namespace CommandLine::DeviceLog {
namespace {

constexpr int kLibraryModule = 80;  // its lines only pass the device's failures on

std::mutex mutex;  // guards the two below: a device logs on its own threads too
result lastCode = E_SUCCESS;
char lastMessage[1024];  // of fixed size because a sink must not throw

void Remember(const Host::LogRecord& record) {
  std::lock_guard lock(mutex);
  lastCode = record.code;
  std::snprintf(lastMessage, sizeof lastMessage, "%s", record.message);
}

void WriteLine(const Host::LogRecord& record) {
  char text[2048];
  Host::FormatLog(record, text, sizeof text);
  std::fprintf(stderr, "%s\n", text);
}

bool IsFromDevice(const Host::LogRecord& record) {
  return record.hasResult && record.module != 0 && record.module != kLibraryModule;
}

bool verboseOutput = false;  // these two change only while no line is received
Show shown;

void Receive(const Host::LogRecord& record, void*) noexcept {
  if (IsFromDevice(record)) Remember(record);
  try {
    if (shown) return shown(record);
  } catch (...) {
    // Nobody reads; the command itself finds out.
    return;
  }
  if (verboseOutput || record.level == Host::LogLevel::kAssertion) WriteLine(record);
}

/// \return \p text behind the first \p end when it begins with \p begin.
const char* Skip(const char* text, char begin, const char* end) {
  const char* found = text[0] == begin ? std::strstr(text, end) : nullptr;
  return found == nullptr ? text : found + std::strlen(end);
}

/// "[E_SYSTEM] "a.mp4": no such file" -> "no such file": the rest is told anyway.
const char* ReasonIn(const char* message) { return Skip(Skip(message, '[', "] "), '"', "\": "); }

}  // namespace

void Install(bool verbose) {
  verboseOutput = verbose;
  Host::SetLogSink(Receive, nullptr);
}

bool IsVerbose() { return verboseOutput; }

void ShowWith(Show show) {
  Host::SetLogSink(nullptr, nullptr);
  shown = std::move(show);
  Host::SetLogSink(Receive, nullptr);
}

std::string TakeReason(result r) {
  std::lock_guard lock(mutex);
  std::string reason = lastCode == r ? ReasonIn(lastMessage) : "";
  lastMessage[0] = '\0';
  return reason;
}

}  // namespace CommandLine::DeviceLog
