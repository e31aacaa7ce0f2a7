/// \file
#pragma once

namespace Tizen::Base::Runtime {

/// Base of everything that listens to events.
class __attribute__((visibility("default"))) IEventListener {
 public:
  virtual ~IEventListener() = default;
};

}  // namespace Tizen::Base::Runtime
