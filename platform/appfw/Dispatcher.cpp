#include "Dispatcher.h"

#include <Host/Events.h>
#include <Tizen/Base/Log.h>

#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <exception>
#include <new>
#include <system_error>
#include <utility>

namespace Tizen::Base::Runtime {
namespace {

constexpr int kLogModule = 1;

thread_local bool onDispatcherThread = false;

std::atomic<void (*)()> deviceWait{nullptr};

}  // namespace

void _Dispatcher::Arguments::Clear() {
  while (first_ != nullptr) delete TakeFirst();
}

void _Dispatcher::Arguments::Append(IEventArg& arg) {
  arg.__pNext = nullptr;
  (first_ == nullptr ? first_ : last_->__pNext) = &arg;
  last_ = &arg;
}

IEventArg* _Dispatcher::Arguments::TakeFirst() {
  IEventArg* arg = first_;
  if (arg != nullptr) first_ = arg->__pNext;
  return arg;
}

void _Dispatcher::Arguments::AppendAll(Arguments& from) {
  if (from.first_ == nullptr) return;
  (first_ == nullptr ? first_ : last_->__pNext) = std::exchange(from.first_, nullptr);
  last_ = from.last_;
}

void _Dispatcher::Arguments::AppendAllOf(const _Event& event, Arguments& from) {
  Arguments others;
  while (IEventArg* arg = from.TakeFirst()) (arg->__pEvent == &event ? *this : others).Append(*arg);
  from.AppendAll(others);
}

_Dispatcher& _Dispatcher::Get() {
  alignas(_Dispatcher) static unsigned char memory[sizeof(_Dispatcher)];
  static _Dispatcher& dispatcher = *new (memory) _Dispatcher;
  return dispatcher;
}

result _Dispatcher::Start() try {
  std::lock_guard lock(queueMutex_);
  if (thread_.joinable()) return E_SUCCESS;
  if (stopped_) return E_SYSTEM;
  // Registered before whatever deletes the caller's event at exit, and so called after it.
  if (std::atexit([] { Get().Stop(); }) != 0) return E_OUT_OF_MEMORY;
  process_ = getpid();
  thread_ = std::thread(&_Dispatcher::Run, this);
  return E_SUCCESS;
} catch (const std::bad_alloc&) {
  return E_OUT_OF_MEMORY;
} catch (const std::system_error&) {
  return E_SYSTEM;
}

void _Dispatcher::Stop() {
  if (getpid() != process_) return;  // a forked child that ends: the thread stayed with the parent
  Arguments dropped;
  {
    std::lock_guard lock(mutex_);
    std::lock_guard queueLock(queueMutex_);
    stopped_ = true;
    dropped.AppendAll(batch_);
    dropped.AppendAll(queue_);
    dropped.AppendAll(spent_);
    delivered_.notify_all();
    queued_.notify_one();
  }
  if (!thread_.joinable()) return;
  if (onDispatcherThread) {
    thread_.detach();  // a listener ends the process: its call never returns
  } else {
    thread_.join();
    deliveredBatch_.Clear();
  }
}

result _Dispatcher::Fire(_Event& event, IEventArg& arg) {
  std::unique_ptr<IEventArg> owned(&arg);
  std::unique_lock lock(queueMutex_);
  if (stopped_) return E_SYSTEM;
  arg.__pEvent = &event;
  arg.__number = ++lastNumber_;
  queue_.Append(*owned.release());
  const bool own = spent_.First() != nullptr && spent_.First()->__pEvent == &event;
  const std::unique_ptr<IEventArg> spent(own ? spent_.TakeFirst() : nullptr);
  standby_.Notify();
  const bool wake = std::exchange(sleeping_, false);
  lock.unlock();
  if (wake) queued_.notify_one();
  return E_SUCCESS;
}

result _Dispatcher::Add(Listeners& listeners, const IEventListener& listener, bool once) try {
  std::lock_guard lock(mutex_);
  std::unique_lock queueLock(queueMutex_);
  const std::uint64_t next = lastNumber_ + 1;
  queueLock.unlock();
  return listeners.Add(listener, once, next) ? E_SUCCESS : E_INVALID_OPERATION;
} catch (const std::bad_alloc&) {
  return E_OUT_OF_MEMORY;
}

result _Dispatcher::Remove(Listeners& listeners, const IEventListener& listener) {
  std::unique_lock lock(mutex_);
  const bool found = listeners.Remove(listener);
  if (!onDispatcherThread) {
    WaitWhile(lock, [&] { return delivering_ == &listeners && calling_ == &listener; });
  }
  if (delivering_ != &listeners) listeners.Tidy();
  return found ? E_SUCCESS : E_OBJ_NOT_FOUND;
}

void _Dispatcher::Close(_Event& event) {
  Arguments freed;  // when the locks are released, as the listeners are
  std::unique_ptr<Listeners> listeners;
  std::unique_lock lock(mutex_);
  listeners = std::move(event.__pListeners);
  {
    std::lock_guard queueLock(queueMutex_);
    freed.AppendAllOf(event, batch_);
    freed.AppendAllOf(event, queue_);
  }
  delivered_.notify_all();
  listeners->RemoveAll();
  if (onDispatcherThread) {
    if (delivering_ == listeners.get()) orphans_ = std::move(listeners);
    return;
  }
  WaitWhile(lock, [&] { return delivering_ == listeners.get() || freeing_ > 0; });
  std::lock_guard queueLock(queueMutex_);
  freed.AppendAllOf(event, deliveredBatch_);
  freed.AppendAllOf(event, spent_);
}

void _Dispatcher::Run() {
  onDispatcherThread = true;
  std::unique_lock lock(mutex_);
  while (TakeBatch(lock)) {
    while (IEventArg* arg = batch_.TakeFirst()) Deliver(std::unique_ptr<IEventArg>(arg), lock);
  }
}

/// \return false when the process is ending
bool _Dispatcher::TakeBatch(std::unique_lock<std::mutex>& lock) {
  for (;;) {
    Arguments left;
    {
      std::lock_guard queueLock(queueMutex_);
      if (stopped_) return false;
      batch_.AppendAll(queue_);
      left.AppendAll(spent_);
      (batch_.First() != nullptr ? spent_ : left).AppendAll(deliveredBatch_);
    }
    Free(left, lock);
    if (batch_.First() != nullptr) return true;
    lock.unlock();
    WaitForArguments();
    lock.lock();
  }
}

/// Frees what has been delivered; \p lock, the batch's, is released meanwhile.
void _Dispatcher::Free(Arguments& arguments, std::unique_lock<std::mutex>& lock) {
  if (arguments.First() == nullptr) return;
  ++freeing_;
  lock.unlock();
  arguments.Clear();
  lock.lock();
  --freeing_;
  if (waiting_ != 0) progressed_.notify_all();
}

void _Dispatcher::WaitForArguments() {
  std::unique_lock lock(queueMutex_);
  while (queue_.First() == nullptr && !stopped_) {
    if (standby_.Wait(lock, [] {})) continue;
    sleeping_ = true;
    queued_.wait(lock);
  }
  sleeping_ = false;
}

void _Dispatcher::Expect() {
  std::lock_guard lock(queueMutex_);
  standby_.Expect();
  if (std::exchange(sleeping_, false)) queued_.notify_one();
}

void _Dispatcher::Deliver(std::unique_ptr<IEventArg> arg, std::unique_lock<std::mutex>& lock) {
  _Event& event = *arg->__pEvent;
  Listeners& listeners = *event.__pListeners;
  delivering_ = &listeners;
  deliveringNumber_ = arg->__number;
  lock.unlock();
  TellListeners(event, listeners, *arg);
  lock.lock();
  deliveredBatch_.Append(*arg.release());
  FinishDelivery(listeners);
}

void _Dispatcher::TellListeners(_Event& event, Listeners& listeners, const IEventArg& arg) {
  for (const Listeners::Entry* entry = listeners.First();
       entry != nullptr && entry->firstArgument <= arg.__number;
       entry = entry->next.load(std::memory_order_acquire)) {
    if (!BeginCall(listeners, *entry)) continue;
    try {
      listeners.Tell(event, entry->listener, arg);
    } catch (const std::exception& exception) {
      SysLogExceptionInternal(kLogModule, E_SYSTEM, "", __LINE__,
                              "[E_SYSTEM] A listener let an exception out: %s", exception.what());
    } catch (...) {
      SysLogExceptionInternal(kLogModule, E_SYSTEM, "", __LINE__,
                              "[E_SYSTEM] A listener let an exception out.");
    }
  }
}

/// \return false when the listener isn't to be called, having been removed
bool _Dispatcher::BeginCall(Listeners& listeners, const Listeners::Entry& entry) {
  if (entry.removed.load(std::memory_order_relaxed)) return false;
  calling_ = &entry.listener;
  if (waiting_ != 0) {
    std::lock_guard lock(mutex_);
    progressed_.notify_all();
  }
  if (entry.removed) return false;
  if (!entry.once) return true;
  std::lock_guard lock(mutex_);
  return !entry.removed && listeners.Remove(entry.listener);
}

void _Dispatcher::FinishDelivery(Listeners& listeners) {
  calling_.store(nullptr, std::memory_order_relaxed);  // read under the lock
  delivering_ = nullptr;
  if (orphans_ != nullptr) {
    orphans_.reset();
  } else {
    listeners.Tidy();
  }
  if (waiting_ != 0) progressed_.notify_all();
  if (awaited_ != kNone && awaited_ < OldestUndelivered()) {
    awaited_ = kNone;
    delivered_.notify_all();
  }
}

template <typename Condition>
void _Dispatcher::WaitWhile(std::unique_lock<std::mutex>& lock, Condition condition) {
  ++waiting_;
  while (condition()) progressed_.wait(lock);
  --waiting_;
}

void _Dispatcher::WaitUntilDelivered() {
  std::unique_lock lock(mutex_);
  std::unique_lock queueLock(queueMutex_);
  const std::uint64_t last = lastNumber_;
  queueLock.unlock();
  while (OldestUndelivered() <= last) {
    awaited_ = std::min(awaited_, last);
    delivered_.wait(lock);
  }
  Arguments spent;
  queueLock.lock();
  spent.AppendAll(deliveredBatch_);
  spent.AppendAll(spent_);
  queueLock.unlock();
  Free(spent, lock);
  WaitWhile(lock, [this] { return freeing_ > 0; });
}

std::uint64_t _Dispatcher::OldestUndelivered() {
  if (delivering_ != nullptr) return deliveringNumber_;
  if (batch_.First() != nullptr) return batch_.First()->__number;
  std::lock_guard queueLock(queueMutex_);
  return queue_.First() != nullptr ? queue_.First()->__number : kNone;
}

}  // namespace Tizen::Base::Runtime

void Host::ExpectEvents() { Tizen::Base::Runtime::_Dispatcher::Get().Expect(); }

void Host::SetDeviceWait(void (*wait)()) { Tizen::Base::Runtime::deviceWait = wait; }

void Host::WaitUntilDelivered() {
  using namespace Tizen::Base::Runtime;
  if (onDispatcherThread) return;
  if (const auto wait = deviceWait.load()) wait();
  _Dispatcher::Get().WaitUntilDelivered();
}
