/// \file
#pragma once

#include "Capabilities.h"

#include <Tizen/Base/Result.h>

#include <functional>
#include <type_traits>
#include <utility>

namespace Zelkora::Media {

/// Reports that a manager isn't constructed. \return `E_INVALID_STATE`, where that returns
result AssertNotConstructed(int line);

/// The guard before every operation of a manager: construction assertion, then privilege gate.
/// \param pImpl the manager's implementation object, null when it isn't constructed
/// \return `E_SUCCESS`, or `E_INVALID_STATE` or `E_PRIVILEGE_DENIED`, reported already
inline result Guard(const void* pImpl, Key privilege) {
  if (pImpl == nullptr) return AssertNotConstructed(privilege.line);
  return CheckPrivilege(privilege);
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
template <auto operation, typename Implementation, typename... Arguments>
inline auto Forward(Implementation* pImpl, Key privilege, Arguments&&... arguments) {
  using Value = std::invoke_result_t<decltype(operation), Implementation*, Arguments...>;
  const result r = Guard(pImpl, privilege);
  return r == E_SUCCESS ? std::invoke(operation, pImpl, std::forward<Arguments>(arguments)...)
                        : Refusal<Value>(r);
}

}  // namespace Zelkora::Media
