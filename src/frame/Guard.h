/// \file
#pragma once

#include "Capabilities.h"

#include <Tizen/Base/Result.h>

#include <type_traits>

namespace Zelkora::Media {

/// A manager's privilege together with the line of the operation that needs it.
struct Privilege {
  Privilege(const wchar_t* privilegeKey, int callerLine = __builtin_LINE())
      : key(privilegeKey), line(callerLine) {}

  const wchar_t* key;
  int line;
};

/// Reports that a manager isn't constructed. \return `E_INVALID_STATE`, where that returns
result AssertNotConstructed(int line);

/// The guard before every operation of a manager: construction assertion, then privilege gate.
/// \param pImpl the manager's implementation object, null when it isn't constructed
/// \return `E_SUCCESS`, or `E_INVALID_STATE` or `E_PRIVILEGE_DENIED`, reported already
inline result Guard(const void* pImpl, Privilege privilege) {
  if (pImpl == nullptr) return AssertNotConstructed(privilege.line);
  return CheckPrivilege(privilege.key, privilege.line);
}

/// \return what an operation that is refused with \p r returns: \p r, or -1 in place of a value.
template <typename Value>
constexpr Value Refusal(result r) {
  if constexpr (std::is_same_v<Value, result>) {
    return r;
  } else {
    return static_cast<Value>(-1);
  }
}

/// Runs \p operation of a manager's implementation object behind the guard.
template <typename Implementation, typename Value, typename... Parameters, typename... Arguments>
Value Forward(Implementation* pImpl, Privilege privilege,
              Value (Implementation::*operation)(Parameters...), Arguments&&... arguments) {
  const result r = Guard(pImpl, privilege);
  return r == E_SUCCESS ? (pImpl->*operation)(arguments...) : Refusal<Value>(r);
}

template <typename Implementation, typename Value, typename... Parameters, typename... Arguments>
Value Forward(const Implementation* pImpl, Privilege privilege,
              Value (Implementation::*operation)(Parameters...) const, Arguments&&... arguments) {
  const result r = Guard(pImpl, privilege);
  return r == E_SUCCESS ? (pImpl->*operation)(arguments...) : Refusal<Value>(r);
}

}  // namespace Zelkora::Media
