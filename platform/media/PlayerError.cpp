#include "PlayerError.h"

#include <Tizen/Base/Log.h>

#include <cstdarg>
#include <cstdio>

namespace Host {

int PlayerFailure(int error, int line, const char* format, ...) noexcept {
  char reason[512];
  va_list arguments;
  va_start(arguments, format);
  std::vsnprintf(reason, sizeof reason, format, arguments);
  va_end(arguments);
  const result r = ConvertPlayerErrorToResult(error);
  const result before = GetLastResult();
  SysLogExceptionInternal(kPlayerModule, r, "", line, "[%s] %s", GetErrorMessage(r), reason);
  SetLastResult(before);
  return error;
}

}  // namespace Host
