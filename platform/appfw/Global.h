/// \file
#pragma once

#include "NeverDestroyed.h"

#include <pthread.h>

#include <mutex>
#include <new>

namespace Host {

/// The one object of a type, under a lock, for all threads until the process is gone. Nobody holds
/// the lock while the process forks, so a child finds it free and the object whole.
template <typename T>
class Global {
 public:
  /// Runs \p operation on the object; it must not use other globals. Throws `std::bad_alloc` when
  /// the object can't be made.
  template <typename Operation>
  static auto Use(Operation operation) {
    Global& global = The();
    std::lock_guard lock(global.mutex_);
    return operation(global.object_);
  }

 private:
  friend class NeverDestroyed<Global>;

  Global() {
    const auto unlock = [] { The().mutex_.unlock(); };
    if (pthread_atfork([] { The().mutex_.lock(); }, unlock, unlock) != 0) throw std::bad_alloc();
  }

  static Global& The() {
    static NeverDestroyed<Global> global;
    return *global;
  }

  std::mutex mutex_;
  T object_;
};

}  // namespace Host
