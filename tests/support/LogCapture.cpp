#include "LogCapture.h"

#include <utility>

void LogCapture::Receive(const Host::LogRecord& record, void* context) {
  const bool library = record.module == 80 || record.tag == std::string("ZELKORA_MEDIA") ||
                       record.level == Host::LogLevel::kAssertion;
  if (!library) return;
  auto& capture = *static_cast<LogCapture*>(context);
  std::string text = capture.Text(record);
  std::lock_guard lock(capture.mutex_);
  capture.lines_.push_back(std::move(text));
}

std::string LogCapture::Text(const Host::LogRecord& record) const {
  const std::string message = record.message, function = record.function;
  const std::string name = GetErrorMessage(record.code);
  std::string text = record.module != 0 ? std::to_string(record.module) : record.tag;
  if (record.level == Host::LogLevel::kAssertion) text = "assertion";
  if (record.level == Host::LogLevel::kInfo) text += " info";
  if (record.hasResult && message.find("[" + name + "]") == message.npos) text += " " + name;
  const bool isSigned = record.module == 80
                            ? function.empty()
                            : function.find("::" + operation + "(") != function.npos ||
                                  function.find("CallBack(") != function.npos;
  if (!operation.empty() && !isSigned) text += " in " + function;
  // A line that doesn't say where it comes from is of no use at two in the morning.
  if (record.line <= 0) text += " without a line number";
  return text + ": " + message;
}

Lines LogCapture::Take() {
  std::lock_guard lock(mutex_);
  return std::exchange(lines_, {});
}
