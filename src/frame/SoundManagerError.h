/// \file
#pragma once

#include <Tizen/Base/Result.h>

namespace Zelkora::Media {

/// \return the result that an error code of the native sound manager stands for.
result ConvertSoundManagerError(int error) noexcept;

}  // namespace Zelkora::Media
