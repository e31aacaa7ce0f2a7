/// \file
#pragma once

#include <Tizen/Base/Runtime/Event.h>

#include <atomic>
#include <unordered_map>

namespace Tizen::Base::Runtime {

/// The listeners of one event, in the order of adding.
///
/// The dispatcher walks them without a lock while others add and remove: an entry is appended
/// complete, a removed one stays linked until `Tidy`. Everything but that walk is guarded by the
/// dispatcher.
class _Event::_Listeners {
 public:
  struct Entry {
    IEventListener& listener;
    const bool once;
    const std::uint64_t firstArgument;  ///< number of the first argument that it may hear
    std::atomic<bool> removed{false};
    std::atomic<Entry*> next{nullptr};
  };

  explicit _Listeners(const _Event& event);
  ~_Listeners();

  /// \return false when the listener is added already; throws when memory is short
  bool Add(const IEventListener& listener, bool once, std::uint64_t firstArgument);

  /// \return false when the listener isn't added
  bool Remove(const IEventListener& listener);

  void RemoveAll();

  /// Frees the removed entries, once they outnumber the others: the cost of a removal is constant
  /// on average. Not during a walk.
  void Tidy();

  const Entry* First() const { return first_.load(std::memory_order_acquire); }

  void Tell(_Event& event, IEventListener& listener, const IEventArg& arg) const {
    fireToListener_(&event, listener, arg);
  }

 private:
  using FireToListenerFunction = void (*)(_Event*, IEventListener&, const IEventArg&);

  static FireToListenerFunction FinalFireToListener(const _Event& event);

  const FireToListenerFunction fireToListener_;
  std::unordered_map<const IEventListener*, Entry*> entries_;
  std::atomic<Entry*> first_{nullptr};
  std::atomic<Entry*>* end_ = &first_;
  std::size_t removedCount_ = 0;
};

}  // namespace Tizen::Base::Runtime
