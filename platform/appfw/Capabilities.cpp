#include <Host/Calls.h>
#include <Host/Capabilities.h>
#include <Tizen/Security/AccessController.h>
#include <Tizen/System/SystemInfo.h>

#include <algorithm>
#include <array>
#include <atomic>
#include <string_view>

namespace {

using Tizen::Base::String;

/// The answers to one kind of question, in the order of its names. Answers are atomic, because a
/// program may change them while another thread asks.
template <std::size_t N>
struct Answers {
  const std::string_view (&names)[N];
  std::array<std::atomic<result>, N> answers{};

  /// \param name in characters of any width
  template <typename Name>
  std::atomic<result>* Find(const Name& name) {
    for (std::size_t i = 0; i < N; ++i) {
      if (std::equal(name.begin(), name.end(), names[i].begin(), names[i].end())) {
        return &answers[i];
      }
    }
    return nullptr;
  }

  /// A key is a URI whose path is \p prefix and a name; whose host it names doesn't matter here.
  result Ask(std::wstring_view key, std::wstring_view prefix) {
    constexpr std::wstring_view kScheme = L"http://";
    const std::size_t path = key.find(L'/', kScheme.size());
    if (key.substr(0, kScheme.size()) != kScheme || path == key.npos ||
        key.substr(path, prefix.size()) != prefix) {
      return E_OBJ_NOT_FOUND;
    }
    const std::atomic<result>* answer = Find(key.substr(path + prefix.size()));
    return answer == nullptr ? E_OBJ_NOT_FOUND : answer->load();
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
};

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
  const result answer = features.Ask(key.GetPointer(), L"/tizen/feature/");
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
  const result answer = privileges.Ask(privilege.GetPointer(), L"/tizen/privilege/");
  return answer == E_OBJ_NOT_FOUND ? E_PRIVILEGE_DENIED : answer;
}

}  // namespace Tizen::Security
