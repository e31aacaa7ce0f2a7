/// \file
/// Result codes and the calling thread's last result.
#pragma once

#include <Tizen/Base/Types.h>

constexpr result E_SUCCESS = 0x00000000;      ///< The operation succeeded.
constexpr result E_INVALID_ARG = 0xA0000775;  ///< An argument is rejected.
constexpr result E_INVALID_OPERATION =
    0xA0000780;                                 ///< The operation doesn't fit the object's state.
constexpr result E_INVALID_STATE = 0xA0000786;  ///< A step that must come first is missing.
constexpr result E_OBJ_NOT_FOUND = 0xA00009C5;  ///< The thing asked for isn't known.
constexpr result E_OUT_OF_MEMORY = 0xA00009CA;  ///< Memory could not be allocated.
constexpr result E_PRIVILEGE_DENIED = 0xA0000A2A;       ///< The application lacks the privilege.
constexpr result E_SYSTEM = 0xA0000B62;                 ///< A platform step failed; no closer code.
constexpr result E_UNSUPPORTED_OPERATION = 0xA0000C23;  ///< The device lacks the feature.

/// Sets the calling thread's last result to `E_SUCCESS`.
void ClearLastResult() noexcept;

/// Sets the calling thread's last result to \p r.
void SetLastResult(result r) noexcept;

/// \return the calling thread's last result; `E_SUCCESS` on a thread that never set one.
result GetLastResult() noexcept;

/// \return the name of \p r, such as "E_SYSTEM", valid for ever. For a code without a name, the
/// code in hexadecimal, valid until the thread's next call with such a code.
const char* GetErrorMessage(result r) noexcept;
