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

  /// \return the lines since the last call, in order, as `Sys`, `SysPlain`, `App` and their like
  /// write them.
  Lines Take();

 private:
  static void Receive(const Host::LogRecord& record, void* context);

  std::mutex mutex_;
  Lines lines_;
};

/// A line of the platform family's exception log: module 80, no function name.
std::string Sys(result r, const std::string& message);

/// A line of the platform family without a result.
std::string SysPlain(const std::string& message);

/// A line of the application family's exception log, under the library's tag.
std::string App(const std::string& function, const std::string& message);

/// An informational line of the application family, under the library's tag.
std::string AppInfo(const std::string& function, const std::string& message);

/// A report of an assertion; the platform family names no function.
std::string Assertion(const std::string& function, const std::string& condition,
                      const std::string& message);
