/// \file
#pragma once

#include "Assert.h"
#include "Capabilities.h"
#include "Log.h"

#include <pthread.h>

#include <atomic>
#include <cstdlib>
#include <new>
#include <type_traits>

namespace Zelkora::Media {

/// Text of the managers for want of memory. The call manager's `InitSingleton` has a tab in place
/// of the two blanks.
inline constexpr char kObjectNotCreated[] =
    "[E_OUT_OF_MEMORY] Memory allocation failed.  The object is not created.";

/// The life of a manager: once a process, from the first `GetInstance` that passes both gates to
/// process exit. A manager's class makes this one its friend and declares, all private: the statics
/// `__pInstance`, `__onceBlock`, `InitSingleton` and `DestroySingleton`, `Construct` and `__pImpl`.
class _ManagerLife {
 public:
  _ManagerLife() = delete;

  template <typename Manager>
  static Manager* GetInstance(const wchar_t* privilege, Signature caller) {
    ClearLastResult();
    if (CheckPrivilege({privilege, caller.line}) != E_SUCCESS) return nullptr;
    if (CheckFeature(kAudioManagerFeature, caller) != E_SUCCESS) return nullptr;
    if (Manager* pInstance = Published<Manager>()) return pInstance;

    pthread_once(&Manager::__onceBlock, Manager::InitSingleton);
    const result r = GetLastResult();
    if (Manager* pInstance = Published<Manager>()) return pInstance;
    Propagate(r, caller.line);
    return nullptr;
  }

  template <typename Manager>
  static void InitSingleton(Format notCreated) {
    Manager* pManager = new (std::nothrow) Manager;
    if (pManager == nullptr) {
      Fail(E_OUT_OF_MEMORY, notCreated);
      return;
    }
    const result r = pManager->Construct();
    if (r != E_SUCCESS) {
      Propagate(r, notCreated.line);
      delete pManager;
      return;
    }
    // Released here, acquired by each GetInstance: whoever sees the pointer sees the object too.
    Manager::__pInstance.store(pManager, std::memory_order_release);
    std::atexit(Manager::DestroySingleton);
  }

  /// Leaves null behind, which a late `GetInstance` returns.
  template <typename Manager>
  static void DestroySingleton() {
    delete Manager::__pInstance.exchange(nullptr, std::memory_order_acq_rel);
  }

  template <typename Manager>
  static result Construct(Manager& manager, int line = __builtin_LINE()) {
    if (manager.__pImpl != nullptr) {
      SysAssertfInternal("__pImpl == null", kNoFunction, line, kAlreadyConstructed);
      return E_INVALID_STATE;
    }
    using Implementation = std::remove_pointer_t<decltype(manager.__pImpl)>;
    auto* pImpl = new (std::nothrow) Implementation;
    if (pImpl == nullptr) return Fail(E_OUT_OF_MEMORY, {kObjectNotCreated, line});
    const result r = pImpl->Construct();
    if (r != E_SUCCESS) {
      Propagate(r, line);
      delete pImpl;
      return r;
    }
    manager.__pImpl = pImpl;
    return E_SUCCESS;
  }

 private:
  template <typename Manager>
  static Manager* Published() {
    return Manager::__pInstance.load(std::memory_order_acquire);
  }
};

}  // namespace Zelkora::Media
