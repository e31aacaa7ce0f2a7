#include "SoundManagerError.h"

namespace Zelkora::Media {

result ConvertSoundManagerError(int error) noexcept {
  switch (error) {
    case 0: return E_SUCCESS;
    case -12: return E_OUT_OF_MEMORY;
    case -22: return E_INVALID_ARG;
    case -38: return E_INVALID_OPERATION;
    default: return E_SYSTEM;
  }
}

}  // namespace Zelkora::Media
