/// \file
#pragma once

#include <exception>
#include <new>
#include <optional>
#include <system_error>

namespace Native {

/// \name Codes that all native interfaces share
/// @{
inline constexpr int kOutOfMemory = -12;
inline constexpr int kRefused = -22;
inline constexpr int kDeviceFailure = -5;
/// @}

inline int ReturnCode(int code, const char*) { return code; }

/// Runs what a C function does, unless the call is to fail or its arguments are wrong. No exception
/// comes out of one: it becomes a code.
/// \param fail gives back the code that it is handed, with a reason
template <typename Operation, typename Fail = int (*)(int, const char*)>
int Contain(std::optional<int> failure, bool isValid, Operation operation,
            Fail fail = ReturnCode) noexcept try {
  if (failure) return *failure;
  return isValid ? operation() : fail(kRefused, "an argument is wrong");
} catch (const std::bad_alloc&) {
  return fail(kOutOfMemory, "out of memory");
} catch (const std::system_error& error) {
  return fail(kOutOfMemory, error.what());  // the system has no thread to give
} catch (const std::exception& error) {
  return fail(kDeviceFailure, error.what());
} catch (...) {
  return fail(kDeviceFailure, "an unknown exception");
}

}  // namespace Native
