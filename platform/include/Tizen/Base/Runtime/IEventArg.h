/// \file
#pragma once

namespace Tizen::Base::Runtime {

class _Event;
class _Dispatcher;

/// Base of what an event tells its listeners.
class __attribute__((visibility("default"))) IEventArg {
 public:
  virtual ~IEventArg() = default;

 private:
  // The queue is threaded through the arguments, so that firing an event allocates nothing.
  friend class _Dispatcher;
  IEventArg* __pNext = nullptr;
  _Event* __pEvent = nullptr;
};

}  // namespace Tizen::Base::Runtime
