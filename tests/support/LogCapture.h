/// \file
#pragma once

#include <Host/Log.h>
#include <Tizen/Base/Result.h>

#include <mutex>
#include <string>
#include <utility>
#include <vector>

using Lines = std::vector<std::string>;

/// Collects what the library logs while it lives; lines of the device itself are left out.
class LogCapture {
 public:
  LogCapture() { Host::SetLogSink(&LogCapture::Receive, this); }
  ~LogCapture() { Host::SetLogSink(nullptr, nullptr); }

  /// \return the lines since the last call, in order: "80: text", "80 info: text", "ZELKORA_MEDIA:
  /// text", "assertion: text". A result that the text doesn't name stands before the colon.
  Lines Take() {
    std::lock_guard lock(mutex_);
    return std::exchange(lines_, {});
  }

  /// The one that lines of the application family must be signed with, if any.
  std::string operation;

 private:
  static void Receive(const Host::LogRecord& record, void* context) {
    const bool library = record.module == 80 || record.tag == std::string("ZELKORA_MEDIA") ||
                         record.level == Host::LogLevel::kAssertion;
    if (!library) return;
    auto& capture = *static_cast<LogCapture*>(context);
    std::string text = capture.Text(record);
    std::lock_guard lock(capture.mutex_);
    capture.lines_.push_back(std::move(text));
  }

  std::string Text(const Host::LogRecord& record) const {
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

  std::mutex mutex_;
  Lines lines_;
};
