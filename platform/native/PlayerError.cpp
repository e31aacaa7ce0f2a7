#include "PlayerError.h"

#include <Host/Log.h>
#include <Tizen/Base/Log.h>

#include <cstdarg>
#include <cstdio>
#include <utility>

namespace Host {
namespace {

thread_local bool logsReasonsOnly = false;

}  // namespace

ReasonsOnly::ReasonsOnly() : before_(std::exchange(logsReasonsOnly, true)) {}

ReasonsOnly::~ReasonsOnly() { logsReasonsOnly = before_; }

PlayerError PlayerFailure(int error, int line, const char* format, ...) noexcept {
  char reason[512];
  va_list arguments;
  va_start(arguments, format);
  std::vsnprintf(reason, sizeof reason, format, arguments);
  va_end(arguments);
  const result r = ConvertPlayerErrorToResult(error);
  if (logsReasonsOnly) {
    LogReason(kPlayerModule, r, line, "[%s] %s", GetErrorMessage(r), reason);
    return {error};
  }
  const result before = GetLastResult();
  SysLogExceptionInternal(kPlayerModule, r, "", line, "[%s] %s", GetErrorMessage(r), reason);
  SetLastResult(before);
  return {error};
}

}  // namespace Host
