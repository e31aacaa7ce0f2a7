#include <Tizen/Base/Runtime/Event.h>

#include "NeverDestroyed.h"
#include "Worker.h"

#include <Host/Calls.h>
#include <Host/Events.h>
#include <Tizen/Base/Log.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <exception>
#include <optional>
#include <system_error>

namespace {

constexpr int kLogModule = 1;

std::atomic<void (*)()> deviceWait{nullptr};

}  // namespace

namespace Tizen::Base::Runtime {

/// The listeners of one event, in the order of adding, and the delivery to them. Everything happens
/// under the worker's lock, but for the calls of listeners.
class _EventListeners {
 public:
  /// An argument on its way; without it when its event is gone.
  struct Firing {
    _EventListeners* listeners;
    std::unique_ptr<IEventArg> arg;
  };
  using Worker = Host::Worker<Firing>;

  static Worker& GetWorker() {
    static Host::NeverDestroyed<Worker> worker([](Firing& item, Worker::Lock& lock) {
      if (item.arg != nullptr) item.listeners->Deliver(std::move(item.arg), lock);
    });
    return *worker;
  }

  /// \return the failure that a call is to end with at once, if any
  static std::optional<result> OnCall(const char* operation, bool isReady) {
    if (auto failure = Host::OnCall(operation, "%s", "")) return static_cast<result>(*failure);
    if (!isReady) return E_INVALID_STATE;
    if (GetWorker().IsForked()) return E_SYSTEM;
    return std::nullopt;
  }

  explicit _EventListeners(_Event& event)
      : event_(event), fireToListener_(FinalFireToListener(event)) {}

  result Add(const IEventListener& listener);
  result Remove(const IEventListener& listener);

  /// The event ends. Frees \p listeners once nothing uses them.
  static void Close(std::unique_ptr<_EventListeners> listeners);

 private:
  using FireToListenerFunction = void (*)(_Event*, IEventListener&, const IEventArg&);

  struct Entry {
    const IEventListener* listener;  // null: removed while listeners are being told
    std::uint64_t firstNumber;       // of what it hears
  };

  static FireToListenerFunction FinalFireToListener(const _Event& event);

  void Deliver(std::unique_ptr<IEventArg> arg, Worker::Lock& lock);
  void Tell(const IEventListener& listener, const IEventArg& arg) const noexcept;
  void DropPending();

  std::vector<Entry>::iterator Find(const IEventListener* listener) {
    return std::find_if(entries_.begin(), entries_.end(),
                        [=](const Entry& entry) { return entry.listener == listener; });
  }

  _Event& event_;
  const FireToListenerFunction fireToListener_;
  std::vector<Entry> entries_;
  bool isBeingTold_ = false;
  std::unique_ptr<_EventListeners> orphan_;  // itself, when a listener's call ended the event
};

/// Looks up now which function a call of `FireToListener` comes to, and never again: the
/// destructors of derived classes change the virtual table's pointer while the worker may still be
/// calling.
///
/// The language has no word for this. In the C++ ABI that every compiler follows here, a pointer to
/// a virtual member function holds the function's offset in the virtual table (plus one on some
/// processors), the table's address stands first in the object, and a member function is called
/// like a plain one with the object in front.
_EventListeners::FireToListenerFunction _EventListeners::FinalFireToListener(const _Event& event) {
  struct {
    std::uintptr_t offset;
    std::ptrdiff_t adjustment;
  } member;
  const auto fireToListener = &_Event::FireToListener;
  static_assert(sizeof member == sizeof fireToListener);
  std::memcpy(&member, &fireToListener, sizeof member);

  const char* table;
  std::memcpy(&table, static_cast<const void*>(&event), sizeof table);
  FireToListenerFunction function;
  std::memcpy(&function, table + (member.offset & ~std::uintptr_t{1}), sizeof function);
  return function;
}

result _EventListeners::Add(const IEventListener& listener) try {
  const auto lock = GetWorker().Acquire();
  if (Find(&listener) != entries_.end()) return E_INVALID_OPERATION;
  entries_.push_back({&listener, GetWorker().CountPosted()});
  return E_SUCCESS;
} catch (const std::bad_alloc&) {
  return E_OUT_OF_MEMORY;
}

result _EventListeners::Remove(const IEventListener& listener) {
  Worker& worker = GetWorker();
  auto lock = worker.Acquire();
  const auto entry = Find(&listener);
  const bool isFound = entry != entries_.end();
  if (isFound && isBeingTold_) {
    entry->listener = nullptr;
  } else if (isFound) {
    entries_.erase(entry);
  }
  worker.WaitWhile(lock, [&] { return isBeingTold_ && worker.IsCalling(&listener); });
  return isFound ? E_SUCCESS : E_OBJ_NOT_FOUND;
}

void _EventListeners::Close(std::unique_ptr<_EventListeners> listeners) {
  Worker& worker = GetWorker();
  {
    const auto lock = worker.Acquire();
    listeners->entries_.clear();
  }
  listeners->DropPending();
  auto lock = worker.Acquire();
  worker.WaitWhile(lock, [&] { return listeners->isBeingTold_; });
  if (listeners->isBeingTold_) listeners->orphan_ = std::move(listeners);
}

/// Some at a time: nothing can be allocated here, and no lock may be held while they are freed.
void _EventListeners::DropPending() {
  for (bool isMore = true; isMore;) {
    std::array<std::unique_ptr<IEventArg>, 64> dropped;
    std::size_t count = 0;
    const auto lock = GetWorker().Acquire();
    GetWorker().ForEachPending([&](Firing& firing) {
      const bool isOwn = firing.listeners == this && firing.arg != nullptr;
      if (isOwn && count < dropped.size()) dropped[count++] = std::move(firing.arg);
    });
    isMore = count == dropped.size();
  }
}

/// Tells the listeners, and frees the argument after the last one's call.
void _EventListeners::Deliver(std::unique_ptr<IEventArg> arg, Worker::Lock& lock) {
  const std::uint64_t number = GetWorker().CountFinished();
  isBeingTold_ = true;
  for (std::size_t i = 0; i < entries_.size() && entries_[i].firstNumber <= number; ++i) {
    const IEventListener* const listener = entries_[i].listener;
    if (listener == nullptr) continue;
    const bool isLast = i + 1 == entries_.size();
    GetWorker().Call(listener, lock, [&] {
      Tell(*listener, *arg);
      if (isLast) arg.reset();
    });
  }
  if (arg != nullptr) GetWorker().Call(nullptr, lock, [&] { arg.reset(); });
  entries_.erase(std::remove_if(entries_.begin(), entries_.end(),
                                [](const Entry& entry) { return entry.listener == nullptr; }),
                 entries_.end());
  isBeingTold_ = false;
  const std::unique_ptr<_EventListeners> orphan = std::move(orphan_);  // deletes this
}

void _EventListeners::Tell(const IEventListener& listener, const IEventArg& arg) const noexcept
    try {
  fireToListener_(&event_, const_cast<IEventListener&>(listener), arg);
} catch (const std::exception& exception) {
  SysLogExceptionInternal(kLogModule, E_SYSTEM, "", __LINE__,
                          "[E_SYSTEM] A listener let an exception out: %s", exception.what());
} catch (...) {
  SysLogExceptionInternal(kLogModule, E_SYSTEM, "", __LINE__,
                          "[E_SYSTEM] A listener let an exception out.");
}

_Event::_Event() = default;

_Event::~_Event() {
  if (__pListeners == null || _EventListeners::GetWorker().IsForked()) return;
  _EventListeners::Close(std::move(__pListeners));
}

result _Event::Initialize() try {
  if (auto failure = _EventListeners::OnCall("_Event::Initialize", true)) return *failure;
  if (__pListeners != null) return E_INVALID_OPERATION;
  auto pListeners = std::make_unique<_EventListeners>(*this);
  if (!_EventListeners::GetWorker().Start()) return E_SYSTEM;
  __pListeners = std::move(pListeners);
  return E_SUCCESS;
} catch (const std::bad_alloc&) {
  return E_OUT_OF_MEMORY;
} catch (const std::system_error&) {
  return E_SYSTEM;
}

result _Event::AddListener(const IEventListener& listener, bool once) {
  if (auto failure = _EventListeners::OnCall("_Event::AddListener", __pListeners != null))
    return *failure;
  return once ? E_UNSUPPORTED_OPERATION : __pListeners->Add(listener);
}

result _Event::RemoveListener(const IEventListener& listener) {
  if (auto failure = _EventListeners::OnCall("_Event::RemoveListener", __pListeners != null))
    return *failure;
  return __pListeners->Remove(listener);
}

result _Event::FireAsync(IEventArg& arg) try {
  std::unique_ptr<IEventArg> owned(&arg);
  if (auto failure = _EventListeners::OnCall("_Event::FireAsync", __pListeners != null))
    return *failure;
  const bool isPosted = _EventListeners::GetWorker().Post({__pListeners.get(), std::move(owned)});
  return isPosted ? E_SUCCESS : E_SYSTEM;
} catch (const std::bad_alloc&) {
  return E_OUT_OF_MEMORY;
}

}  // namespace Tizen::Base::Runtime

void Host::SetDeviceWait(void (*wait)()) { deviceWait = wait; }

void Host::WaitUntilDelivered() {
  auto& worker = Tizen::Base::Runtime::_EventListeners::GetWorker();
  if (worker.IsForked() || worker.IsOnThread()) return;
  if (const auto wait = deviceWait.load()) wait();
  worker.WaitUntilDelivered();
}
