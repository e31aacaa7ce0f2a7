/// \file
/// The platform's plain types.
#pragma once

#include <cstddef>
#include <cstdint>

/// Outcome of an operation: 0 for success, else a failure code of the form 0xA000xxxx.
typedef std::uint32_t result;

/// The platform's spelling of the null pointer.
inline constexpr std::nullptr_t null = nullptr;
