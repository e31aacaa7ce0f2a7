/// \file
#pragma once

#include <Tizen/Base/Object.h>
#include <Tizen/Base/Runtime/IEventArg.h>
#include <Tizen/Base/Runtime/IEventListener.h>

#include <memory>

namespace Tizen::Base::Runtime {

class _EventListeners;

/// An event that tells its listeners later, on the process's one event thread, in the order of
/// firing over all events.
///
/// All operations but construction, `Initialize` and destruction may be called on any thread at any
/// time, also from inside a listener's call. An exception that leaves a listener is logged and ends
/// there. At process exit the thread stops once the call that is running has returned, and
/// frees what is still queued; events may live on. A forked child has no such thread: there
/// everything but destruction fails with `E_SYSTEM`.
class _Event : public Tizen::Base::Object {
 public:
  _Event();

  /// Drops and frees what is still queued, and waits for a listener's call that is running and its
  /// argument to be freed. From inside a listener's call it doesn't wait: the other listeners then
  /// hear nothing more, and the argument is freed after the call.
  ~_Event() override;

  /// Makes the event ready; until then every other operation fails with `E_INVALID_STATE`. The type
  /// that the object has now is the one whose `FireToListener` is called.
  /// \return `E_SUCCESS`; `E_INVALID_OPERATION` when it is ready already; `E_OUT_OF_MEMORY`;
  /// `E_SYSTEM` when the event thread can't be started
  result Initialize();

  /// Adds a listener, which hears what is fired from now on, not what is queued already, and must
  /// live until it is removed.
  /// \param listener the listener, which isn't owned
  /// \param once false; listeners that hear one event only are `E_UNSUPPORTED_OPERATION`
  /// \return `E_SUCCESS`; `E_INVALID_OPERATION` when it is added already; `E_OUT_OF_MEMORY`
  result AddListener(const IEventListener& listener, bool once);

  /// Removes a listener, which hears nothing more, not even what is queued. No call of it is
  /// running when this returns, unless this is called from inside a listener's call.
  /// \return `E_SUCCESS`, `E_OBJ_NOT_FOUND` when it isn't added
  result RemoveListener(const IEventListener& listener);

  /// Queues \p arg, which was made with `new` and belongs to the platform from now on: it is freed
  /// after the last delivery, or at once when this fails.
  /// \return `E_SUCCESS`, or another code when nothing was queued: `E_OUT_OF_MEMORY`; `E_SYSTEM`
  /// when the process is ending
  result FireAsync(IEventArg& arg);

 protected:
  /// Tells one listener; called for every listener of every argument, in the order of adding.
  virtual void FireToListener(IEventListener& listener, const IEventArg& arg) = 0;

 private:
  friend class _EventListeners;

  std::unique_ptr<_EventListeners> __pListeners;  // null until the event is ready
};

}  // namespace Tizen::Base::Runtime
