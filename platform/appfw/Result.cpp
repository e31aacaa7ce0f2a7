#include <Tizen/Base/Result.h>

#include <cinttypes>
#include <cstdio>

namespace {

thread_local result lastResult = E_SUCCESS;

struct CodeName {
  result code;
  const char* name;
};

constexpr CodeName kCodeNames[] = {
    {E_SUCCESS, "E_SUCCESS"},
    {E_INVALID_ARG, "E_INVALID_ARG"},
    {E_INVALID_OPERATION, "E_INVALID_OPERATION"},
    {E_INVALID_STATE, "E_INVALID_STATE"},
    {E_OBJ_NOT_FOUND, "E_OBJ_NOT_FOUND"},
    {E_OUT_OF_MEMORY, "E_OUT_OF_MEMORY"},
    {E_PRIVILEGE_DENIED, "E_PRIVILEGE_DENIED"},
    {E_SYSTEM, "E_SYSTEM"},
    {E_UNSUPPORTED_OPERATION, "E_UNSUPPORTED_OPERATION"},
};

}  // namespace

void ClearLastResult() noexcept { lastResult = E_SUCCESS; }

void SetLastResult(result r) noexcept { lastResult = r; }

result GetLastResult() noexcept { return lastResult; }

const char* GetErrorMessage(result r) noexcept {
  for (const CodeName& entry : kCodeNames) {
    if (entry.code == r) return entry.name;
  }
  thread_local char unnamed[24];
  std::snprintf(unnamed, sizeof unnamed, "result 0x%08" PRIX32, r);
  return unnamed;
}
