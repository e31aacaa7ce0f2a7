/// \file
#pragma once

namespace Tizen::Base::Runtime {

/// Base of what an event tells its listeners.
class __attribute__((visibility("default"))) IEventArg {
 public:
  virtual ~IEventArg() = default;
};

}  // namespace Tizen::Base::Runtime
