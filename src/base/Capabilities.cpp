#include "Capabilities.h"

#include <Tizen/Security/AccessController.h>
#include <Tizen/System/SystemInfo.h>

namespace Zelkora::Media {
namespace {

using Tizen::Base::String;

result QueryFeature(const wchar_t* key) {
  bool supported = false;
  const result r = Tizen::System::SystemInfo::GetValue(String(key), supported);
  const bool absent = r == E_OBJ_NOT_FOUND || (r == E_SUCCESS && !supported);
  return absent ? E_UNSUPPORTED_OPERATION : r;
}

}  // namespace

result CheckFeature(const wchar_t* key, Signature caller) {
  const result r = QueryFeature(key);
  if (r == E_SUCCESS) return E_SUCCESS;
  return FailTagged(r, caller, "[%s] Propagating.", GetErrorMessage(r));
}

bool HasPrivilege(const wchar_t* key) {
  return Tizen::Security::AccessController::CheckPrivilege(String(key)) == E_SUCCESS;
}

result FailPrivilege(int line) {
  return Fail(E_PRIVILEGE_DENIED,
              {"[E_PRIVILEGE_DENIED] This application does not have the privilege to call this "
               "method.",
               line});
}

}  // namespace Zelkora::Media
