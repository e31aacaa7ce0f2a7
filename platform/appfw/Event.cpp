#include <Tizen/Base/Runtime/Event.h>

#include "Dispatcher.h"

#include <Host/Calls.h>

#include <new>
#include <optional>

namespace Tizen::Base::Runtime {
namespace {

/// \return the failure that a call is to end with at once, if any
std::optional<result> OnEventCall(const char* operation, bool ready) {
  if (auto failure = Host::OnCall(operation, "%s", "")) return static_cast<result>(*failure);
  if (!ready) return E_INVALID_STATE;
  return std::nullopt;
}

}  // namespace

_Event::_Event() = default;

_Event::~_Event() {
  if (__pListeners != null) _Dispatcher::Get().Close(*this);
}

result _Event::Initialize() try {
  if (auto failure = OnEventCall("_Event::Initialize", true)) return *failure;
  if (__pListeners != null) return E_INVALID_OPERATION;
  auto pListeners = std::make_unique<_Listeners>(*this);
  const result r = _Dispatcher::Get().Start();
  if (r == E_SUCCESS) __pListeners = std::move(pListeners);
  return r;
} catch (const std::bad_alloc&) {
  return E_OUT_OF_MEMORY;
}

result _Event::AddListener(const IEventListener& listener, bool once) {
  if (auto failure = OnEventCall("_Event::AddListener", __pListeners != null)) return *failure;
  return _Dispatcher::Get().Add(*__pListeners, listener, once);
}

result _Event::RemoveListener(const IEventListener& listener) {
  if (auto failure = OnEventCall("_Event::RemoveListener", __pListeners != null)) return *failure;
  return _Dispatcher::Get().Remove(*__pListeners, listener);
}

result _Event::FireAsync(IEventArg& arg) {
  if (auto failure = OnEventCall("_Event::FireAsync", __pListeners != null)) {
    delete &arg;
    return *failure;
  }
  return _Dispatcher::Get().Fire(*this, arg);
}

}  // namespace Tizen::Base::Runtime
