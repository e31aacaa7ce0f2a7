/// \file
#pragma once

#include <Tizen/Base/Object.h>
#include <Tizen/Base/Runtime/IEventArg.h>
#include <Tizen/Base/Runtime/IEventListener.h>

#include <memory>

namespace Tizen::Base::Runtime {

/// An event that tells its listeners later, on the process's one dispatcher thread, in the order of
/// firing.
///
/// All operations may be called on any thread, also from inside a listener's call. An exception
/// that leaves a listener is logged and ends there.
class _Event : public Tizen::Base::Object {
 public:
  _Event();

  /// Drops what is still queued and waits for a listener's call that is running, unless it is
  /// called from inside one.
  ~_Event() override;

  /// Makes the event ready; until then every other operation fails with `E_INVALID_STATE`.
  /// \return `E_SUCCESS`, `E_OUT_OF_MEMORY`, or `E_SYSTEM` when the dispatcher can't be started
  result Initialize();

  /// Adds a listener, which hears what is fired from now on and must live until it is removed.
  /// \param listener the listener, which isn't owned
  /// \param once true: it hears one event only and is removed then
  /// \return `E_SUCCESS`; `E_INVALID_OPERATION` when it is added already; `E_OUT_OF_MEMORY`
  result AddListener(const IEventListener& listener, bool once);

  /// Removes a listener. No call of it is running when this returns, unless it is called from
  /// inside that call, and none follows. \return `E_SUCCESS`, `E_OBJ_NOT_FOUND` when it isn't added
  result RemoveListener(const IEventListener& listener);

  /// Queues \p arg, which was made with `new` and belongs to the platform from now on: it is freed
  /// after the last delivery, or at once when this fails.
  /// \return `E_SUCCESS`, or another code when nothing was queued
  result FireAsync(IEventArg& arg);

 protected:
  /// Tells one listener; called for every listener of every argument.
  virtual void FireToListener(IEventListener& listener, const IEventArg& arg) = 0;

 private:
  friend class _Dispatcher;
  class _Listeners;

  std::unique_ptr<_Listeners> __pListeners;
};

}  // namespace Tizen::Base::Runtime
