#include "Guard.h"

#include "Assert.h"

namespace Zelkora::Media {

result AssertNotConstructed(int line) {
  SysAssertfInternal("__pImpl != null", kNoFunction, line, kSysNotYetConstructed);
  return E_INVALID_STATE;
}

}  // namespace Zelkora::Media
