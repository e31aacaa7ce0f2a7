/// \file
/// How this library reports a failure: one statement records the result, logs once with the place
/// of the caller and gives the result back.
///
/// The managers and everything beneath them use the platform family, whose exception log leaves the
/// result in the last result; the classes that an application makes itself use the application
/// family, which sets it beforehand.
#pragma once

#include <Tizen/Base/Log.h>
#include <Tizen/Base/Result.h>

namespace Zelkora::Media {

inline constexpr int kLogModule = 80;
inline constexpr char kLogTag[] = "ZELKORA_MEDIA";

/// The platform family names no function.
inline constexpr char kNoFunction[] = "";

/// A text together with the line of whoever gives it.
template <typename Character>
struct Placed {
  Placed(const Character* givenText, int givenLine = __builtin_LINE())
      : text(givenText), line(givenLine) {}

  const Character* text;
  int line;
};

using Format = Placed<char>;     ///< a message's printf-style text
using Signature = Placed<char>;  ///< a function's: `__PRETTY_FUNCTION__`
using Key = Placed<wchar_t>;     ///< a feature's or a privilege's

/// Reports a failure through the platform family, which makes \p r the last result.
/// \return r
template <typename... Arguments>
result Fail(result r, Format format, Arguments... arguments) {
  SysLogExceptionInternal(kLogModule, r, kNoFunction, format.line, format.text, arguments...);
  return r;
}

/// Reports a failure of a step that was called, through the platform family.
inline result Propagate(result r, int line = __builtin_LINE()) {
  return Fail(r, {"[%s] Propagating.", line}, GetErrorMessage(r));
}

/// Writes a line without a result through the platform family.
template <typename... Arguments>
void LogDiagnostic(Format format, Arguments... arguments) {
  SysLogInternal(kLogModule, kNoFunction, format.line, format.text, arguments...);
}

/// Reports a failure through the application family and makes \p r the last result.
/// \return r
template <typename... Arguments>
result FailTagged(result r, Signature caller, const char* format, Arguments... arguments) {
  SetLastResult(r);
  AppLogExceptionTagInternal(kLogTag, caller.text, caller.line, format, arguments...);
  return r;
}

}  // namespace Zelkora::Media
