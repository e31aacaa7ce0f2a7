/// \file
#pragma once

#include <new>
#include <utility>

namespace Host {

/// A value that outlives the end of the program: threads may use it until the process is gone.
template <typename T>
class NeverDestroyed {
 public:
  template <typename... Arguments>
  explicit NeverDestroyed(Arguments&&... arguments) {
    new (memory_) T(std::forward<Arguments>(arguments)...);
  }

  NeverDestroyed(const NeverDestroyed&) = delete;
  NeverDestroyed& operator=(const NeverDestroyed&) = delete;

  T& operator*() { return *std::launder(static_cast<T*>(static_cast<void*>(memory_))); }
  T* operator->() { return &**this; }

 private:
  alignas(T) unsigned char memory_[sizeof(T)];
};

}  // namespace Host
