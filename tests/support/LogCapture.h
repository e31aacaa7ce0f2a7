/// \file
#pragma once

#include <Host/Log.h>
#include <Tizen/Base/Result.h>

#include <mutex>
#include <string>
#include <vector>

using Lines = std::vector<std::string>;

/// Collects what the library logs while it lives; lines of the device itself are left out.
class LogCapture {
 public:
  LogCapture() { Host::SetLogSink(&LogCapture::Receive, this); }
  ~LogCapture() { Host::SetLogSink(nullptr, nullptr); }

  /// \return the lines since the last call, in order: "80: text", "80 info: text", "ZELKORA_MEDIA:
  /// text", "assertion: text". A result that the text doesn't name stands before the colon.
  Lines Take();

  /// The one that lines of the application family must be signed with, if any.
  std::string operation;

 private:
  static void Receive(const Host::LogRecord& record, void* context);

  std::string Text(const Host::LogRecord& record) const;

  std::mutex mutex_;
  Lines lines_;
};
