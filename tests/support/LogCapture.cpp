#include "LogCapture.h"

#include <utility>

namespace {

constexpr int kModule = 80;
constexpr char kTag[] = "ZELKORA_MEDIA";

std::string Text(const Host::LogRecord& record) {
  static const char* const kLevels[] = {"info", "error", "assertion"};
  std::string text = kLevels[static_cast<int>(record.level)];
  if (record.module != 0) text += " " + std::to_string(record.module);
  if (record.tag[0] != '\0') text += std::string(" ") + record.tag;
  if (record.hasResult) text += std::string(" ") + GetErrorMessage(record.code);
  return text + " <" + record.function + "> " + record.message;
}

}  // namespace

void LogCapture::Receive(const Host::LogRecord& record, void* context) {
  const bool library = record.module == kModule || record.tag == std::string(kTag) ||
                       record.level == Host::LogLevel::kAssertion;
  if (!library) return;
  auto& capture = *static_cast<LogCapture*>(context);
  // A line that doesn't say where it comes from is of no use at two in the morning.
  std::string text = record.line > 0 ? Text(record) : "line number missing: " + Text(record);
  std::lock_guard lock(capture.mutex_);
  capture.lines_.push_back(std::move(text));
}

Lines LogCapture::Take() {
  std::lock_guard lock(mutex_);
  return std::exchange(lines_, {});
}

std::string Sys(result r, const std::string& message) {
  return std::string("error 80 ") + GetErrorMessage(r) + " <> " + message;
}

std::string SysPlain(const std::string& message) { return "info 80 <> " + message; }

std::string App(const std::string& function, const std::string& message) {
  return "error ZELKORA_MEDIA <" + function + "> " + message;
}

std::string AppInfo(const std::string& function, const std::string& message) {
  return "info ZELKORA_MEDIA <" + function + "> " + message;
}

std::string Assertion(const std::string& function, const std::string& condition,
                      const std::string& message) {
  return "assertion <" + function + "> Assertion \"" + condition + "\" failed: " + message;
}
