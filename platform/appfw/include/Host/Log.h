/// \file
/// Where the host platform's log goes, and what its assertions do.
#pragma once

#include <Tizen/Base/Types.h>

namespace Host {

enum class LogLevel { kInfo, kError, kAssertion };

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

/// Receives log lines. Called on the thread that logs, by several threads at once. What a sink
/// itself logs goes to standard error. It must not call `SetLogSink`.
using LogSink = void (*)(const LogRecord& record, void* context);

/// Sends log lines to \p sink in place of standard error; null sends them there again. Returns when
/// no call of the sink before is running.
void SetLogSink(LogSink sink, void* context) noexcept;

/// What follows a reported assertion.
enum class AssertionAction { kStop, kReturn };

/// Chooses what assertions do from now on, in the whole process. At start they stop the process,
/// or, when the platform was built with `NDEBUG`, return.
void SetAssertionAction(AssertionAction action) noexcept;

/// \return what assertions do.
AssertionAction GetAssertionAction() noexcept;

}  // namespace Host
