#include <Host/Log.h>
#include <Tizen/Base/Log.h>
#include <Tizen/Base/Result.h>

#include <poll.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <mutex>
#include <shared_mutex>

namespace {

using Host::LogLevel;
using Host::LogRecord;

constexpr std::size_t kMessageSize = 1024;

std::shared_mutex sinkMutex;  // held shared during a sink's call
Host::LogSink sink = nullptr;
void* sinkContext = nullptr;
thread_local bool insideSink = false;

#ifdef NDEBUG
std::atomic<Host::AssertionAction> assertionAction{Host::AssertionAction::kReturn};
#else
std::atomic<Host::AssertionAction> assertionAction{Host::AssertionAction::kStop};
#endif

void WriteFully(const char* text, std::size_t size) {
  while (size > 0) {
    const ssize_t written = write(STDERR_FILENO, text, size);
    if (written >= 0) {
      text += written;
      size -= static_cast<std::size_t>(written);
    } else if (errno == EAGAIN) {
      pollfd ready{STDERR_FILENO, POLLOUT, 0};
      poll(&ready, 1, -1);
    } else if (errno != EINTR) {
      return;  // standard error is gone: there is nobody left to tell
    }
  }
}

/// Appends to a text of limited size.
class Text {
 public:
  Text(char* text, std::size_t size) : text_(text), limit_(size) {}

  void Append(const char* format, ...) __attribute__((format(printf, 2, 3))) {
    va_list arguments;
    va_start(arguments, format);
    const int wanted = std::vsnprintf(text_ + size_, limit_ - size_, format, arguments);
    va_end(arguments);
    if (wanted > 0) size_ = std::min(size_ + static_cast<std::size_t>(wanted), limit_ - 1);
  }

 private:
  char* const text_;
  const std::size_t limit_;
  std::size_t size_ = 0;
};

const char* NameOf(LogLevel level) {
  switch (level) {
    case LogLevel::kDebug: return "debug";
    case LogLevel::kInfo: return "info";
    case LogLevel::kError: return "error";
    case LogLevel::kAssertion: return "assertion";
  }
  return "";
}

bool IsDebugShown() {
  static const char* const level = std::getenv("ZELKORA_LOG");
  static const bool isShown = level != nullptr && std::strcmp(level, "debug") == 0;
  return isShown;
}

/// In one piece, so that threads' lines don't mix.
void WriteToStandardError(const LogRecord& record) {
  if (record.level == LogLevel::kDebug && !IsDebugShown()) return;
  char text[2 * kMessageSize];
  Host::FormatLog(record, text, sizeof text);
  const std::size_t size = std::strlen(text);
  text[size] = '\n';
  WriteFully(text, size + 1);
}

void Deliver(const LogRecord& record) noexcept {
  const int savedErrno = errno;
  if (insideSink) {
    WriteToStandardError(record);
  } else {
    std::shared_lock lock(sinkMutex);
    if (sink == nullptr) {
      WriteToStandardError(record);
    } else {
      insideSink = true;
      sink(record, sinkContext);
      insideSink = false;
    }
  }
  errno = savedErrno;
}

void DeliverFormatted(LogRecord record, const char* format, va_list arguments) noexcept {
  char message[kMessageSize];
  if (std::vsnprintf(message, sizeof message, format, arguments) < 0) message[0] = '\0';
  record.message = message;
  Deliver(record);
}

void ReportAssertion(LogRecord record, const char* condition, const char* message) noexcept {
  char text[kMessageSize];
  std::snprintf(text, sizeof text, "Assertion \"%s\" failed: %s", condition, message);
  record.level = LogLevel::kAssertion;
  record.message = text;
  Deliver(record);
  if (assertionAction.load() == Host::AssertionAction::kStop) std::abort();
}

LogRecord PlatformRecord(LogLevel level, int module, const char* function, int line) {
  return {level, module, "", false, E_SUCCESS, function, line, ""};
}

LogRecord PlatformFailure(int module, result r, const char* function, int line,
                          LogLevel level = LogLevel::kError) {
  return {level, module, "", true, r, function, line, ""};
}

LogRecord ApplicationRecord(LogLevel level, const char* tag, const char* function, int line) {
  return {level, 0, tag, false, E_SUCCESS, function, line, ""};
}

}  // namespace

namespace Host {

void FormatLog(const LogRecord& record, char* text, std::size_t size) noexcept {
  Text line(text, size);
  line.Append("zelkora %s", NameOf(record.level));
  if (record.module != 0) line.Append(" module=%d", record.module);
  if (record.tag[0] != '\0') line.Append(" tag=%s", record.tag);
  if (record.hasResult) line.Append(" result=%s", GetErrorMessage(record.code));
  if (record.function[0] != '\0') line.Append(" function=\"%s\"", record.function);
  line.Append(" line=%d: %s", record.line, record.message);
}

void SetLogSink(LogSink newSink, void* context) noexcept {
  std::unique_lock lock(sinkMutex);
  sink = newSink;
  sinkContext = context;
}

void SetAssertionAction(AssertionAction action) noexcept { assertionAction = action; }

}  // namespace Host

// A variable argument list can't be handed on but as a va_list, hence the same four lines each
// time.
#define DELIVER_FORMATTED(record)              \
  va_list arguments;                           \
  va_start(arguments, format);                 \
  DeliverFormatted(record, format, arguments); \
  va_end(arguments)

void Host::LogReason(int module, result r, int line, const char* format, ...) noexcept {
  DELIVER_FORMATTED(PlatformFailure(module, r, "", line, LogLevel::kDebug));
}

void SysLogExceptionInternal(int module, result r, const char* function, int line,
                             const char* format, ...) noexcept {
  DELIVER_FORMATTED(PlatformFailure(module, r, function, line));
  SetLastResult(r);
}

void SysTryReturnResultInternal(int module, result r, const char* function, int line,
                                const char* format, ...) noexcept {
  DELIVER_FORMATTED(PlatformFailure(module, r, function, line));
  SetLastResult(r);
}

void SysLogInternal(int module, const char* function, int line, const char* format, ...) noexcept {
  DELIVER_FORMATTED(PlatformRecord(LogLevel::kInfo, module, function, line));
}

void AppLogExceptionTagInternal(const char* tag, const char* function, int line, const char* format,
                                ...) noexcept {
  DELIVER_FORMATTED(ApplicationRecord(LogLevel::kError, tag, function, line));
}

void AppLogExceptionInternal(const char* function, int line, const char* format, ...) noexcept {
  DELIVER_FORMATTED(ApplicationRecord(LogLevel::kError, "", function, line));
}

void AppLogTagInternal(const char* tag, const char* function, int line, const char* format,
                       ...) noexcept {
  DELIVER_FORMATTED(ApplicationRecord(LogLevel::kInfo, tag, function, line));
}

void SysAssertfInternal(const char* condition, const char* function, int line,
                        const char* message) noexcept {
  ReportAssertion(PlatformRecord(LogLevel::kAssertion, 0, function, line), condition, message);
}

void AppassertfInternal(const char* condition, const char* function, int line,
                        const char* message) noexcept {
  ReportAssertion(ApplicationRecord(LogLevel::kAssertion, "", function, line), condition, message);
}
