/// \file
#pragma once

#include <cstdint>

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
  std::uint64_t __number = 0;  // in the order of firing, over all events
};

}  // namespace Tizen::Base::Runtime
