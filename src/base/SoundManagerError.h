/// \file
#pragma once

#include <Tizen/Base/Result.h>

namespace Zelkora::Media {

/// \return the result that an error code of the native sound manager stands for.
constexpr result ConvertSoundManagerError(int error) noexcept {
  if (error == 0) return E_SUCCESS;  // first: nearly every call
  switch (error) {
    case -12: return E_OUT_OF_MEMORY;
    case -22: return E_INVALID_ARG;
    case -38: return E_INVALID_OPERATION;
    default: return E_SYSTEM;
  }
}

}  // namespace Zelkora::Media
