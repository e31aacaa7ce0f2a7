#include "Guard.h"

#include "Assert.h"
#include "Capabilities.h"

namespace Zelkora::Media {

result Guard(const void* pImpl, Privilege privilege) {
  if (pImpl == nullptr) {
    SysAssertfInternal("__pImpl != null", kNoFunction, privilege.line, kSysNotYetConstructed);
    return E_INVALID_STATE;
  }
  return CheckPrivilege(privilege.key, privilege.line);
}

}  // namespace Zelkora::Media
