#include <Host/Calls.h>
#include <Host/Capabilities.h>
#include <Tizen/Security/AccessController.h>
#include <Tizen/System/SystemInfo.h>

#include <algorithm>
#include <array>
#include <atomic>
#include <cwchar>
#include <string_view>

namespace {

using Tizen::Base::String;

/// The answers to one kind of question, in the order of its names. Answers are atomic, because a
/// program may change them while another thread asks.
template <std::size_t N>
struct Answers {
  const std::string_view (&names)[N];
  std::array<std::atomic<result>, N> answers{};

  std::atomic<result>* Find(std::string_view name) {
    for (std::size_t i = 0; i < N; ++i) {
      if (names[i] == name) return &answers[i];
    }
    return nullptr;
  }

  /// A key is a URI whose path is \p prefix and a name; whose host it names doesn't matter here.
  result Ask(const wchar_t* key, const wchar_t* prefix, std::size_t prefixLength) const {
    constexpr std::size_t kSchemeLength = 7;
    if (std::wcsncmp(key, L"http://", kSchemeLength) != 0) return E_OBJ_NOT_FOUND;
    const wchar_t* path = std::wcschr(key + kSchemeLength, L'/');
    if (path == nullptr || std::wcsncmp(path, prefix, prefixLength) != 0) return E_OBJ_NOT_FOUND;
    const std::wstring_view name(path + prefixLength);
    for (std::size_t i = 0; i < N; ++i) {
      if (IsSameText(name, names[i])) return answers[i].load();
    }
    return E_OBJ_NOT_FOUND;
  }

  bool Set(std::string_view name, result answer) {
    std::atomic<result>* entry = Find(name);
    if (entry == nullptr) return false;
    *entry = answer;
    return true;
  }

  void Reset() {
    for (std::atomic<result>& answer : answers) answer = E_SUCCESS;
  }

 private:
  static bool IsSameText(std::wstring_view wide, std::string_view narrow) {
    return wide.size() == narrow.size() && std::equal(narrow.begin(), narrow.end(), wide.begin());
  }
};

constexpr wchar_t kFeaturePrefix[] = L"/tizen/feature/";
constexpr wchar_t kPrivilegePrefix[] = L"/tizen/privilege/";

Answers<std::size(Host::kFeatures)> features{Host::kFeatures};
Answers<std::size(Host::kPrivileges)> privileges{Host::kPrivileges};

}  // namespace

namespace Host {

bool SetFeature(std::string_view name, result answer) noexcept {
  return features.Set(name, answer);
}

bool SetPrivilege(std::string_view name, result answer) noexcept {
  return privileges.Set(name, answer);
}

void ResetCapabilities() noexcept {
  features.Reset();
  privileges.Reset();
}

}  // namespace Host

namespace Tizen::System {

result SystemInfo::GetValue(const String& key, bool& value) {
  if (auto failure = Host::OnCall("SystemInfo::GetValue", "%ls", key.GetPointer())) {
    return static_cast<result>(*failure);
  }
  const result answer =
      features.Ask(key.GetPointer(), kFeaturePrefix, std::size(kFeaturePrefix) - 1);
  if (answer != E_SUCCESS && answer != Host::kFeatureAbsent) return answer;
  value = answer == E_SUCCESS;
  return E_SUCCESS;
}

}  // namespace Tizen::System

namespace Tizen::Security {

result AccessController::CheckPrivilege(const String& privilege) {
  if (auto failure =
          Host::OnCall("AccessController::CheckPrivilege", "%ls", privilege.GetPointer())) {
    return static_cast<result>(*failure);
  }
  const result answer =
      privileges.Ask(privilege.GetPointer(), kPrivilegePrefix, std::size(kPrivilegePrefix) - 1);
  return answer == E_OBJ_NOT_FOUND ? E_PRIVILEGE_DENIED : answer;
}

}  // namespace Tizen::Security
