/// \file
/// Where the host platform's log goes, and what its assertions do.
#pragma once

#include <Tizen/Base/Types.h>

#include <cstddef>

namespace Host {

/// `kDebug`: why something fails that whoever called logs as an error.
enum class LogLevel { kDebug, kInfo, kError, kAssertion };

/// One log line. The texts are valid during the sink's call.
struct LogRecord {
  LogLevel level;
  int module;            ///< the platform family's module number; 0 in the application family
  const char* tag;       ///< the application family's tag; "" without one
  bool hasResult;        ///< whether the line carries a result
  result code;           ///< the result; `E_SUCCESS` without one
  const char* function;  ///< "" when the caller gives none
  int line;              ///< the caller's line
  const char* message;   ///< the formatted message, cut off at 1,023 bytes
};

/// Writes a line's text, without an end of line, cut off at \p size with a zero behind it.
void FormatLog(const LogRecord& record, char* text, std::size_t size) noexcept;

/// Receives log lines, also those of level `kDebug`. Called on the thread that logs, by several
/// threads at once. What a sink itself logs goes to standard error. It must not call `SetLogSink`.
using LogSink = void (*)(const LogRecord& record, void* context);

/// Sends log lines to \p sink in place of standard error; null sends them there again, those of
/// level `kDebug` only when the environment variable ZELKORA_LOG is "debug" at the first of them.
/// Returns when no call of the sink before is running.
void SetLogSink(LogSink sink, void* context) noexcept;

/// What follows a reported assertion.
enum class AssertionAction { kStop, kReturn };

/// Chooses what assertions do from now on, in the whole process. At start they stop the process,
/// or, when the platform was built with `NDEBUG`, return.
void SetAssertionAction(AssertionAction action) noexcept;

/// For a device: logs why a function fails, at level `kDebug`. The last result stays.
void LogReason(int module, result r, int line, const char* format, ...) noexcept
    __attribute__((format(printf, 4, 5)));

}  // namespace Host
