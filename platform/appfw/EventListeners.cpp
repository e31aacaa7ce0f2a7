#include "EventListeners.h"

#include <cstring>

namespace Tizen::Base::Runtime {

/// Looks up now which function a call of `FireToListener` comes to, and never again: the
/// destructors of derived classes change the virtual table's pointer while the dispatcher may still
/// be calling.
///
/// The language has no word for this. In the C++ ABI that every compiler follows here, a pointer to
/// a virtual member function holds the function's offset in the virtual table (plus one on some
/// processors), the table's address stands first in the object, and a member function is called
/// like a plain one with the object in front.
_Event::_Listeners::FireToListenerFunction _Event::_Listeners::FinalFireToListener(
    const _Event& event) {
  struct {
    std::uintptr_t offset;
    std::ptrdiff_t adjustment;
  } member;
  const auto fireToListener = &_Event::FireToListener;
  static_assert(sizeof member == sizeof fireToListener);
  std::memcpy(&member, &fireToListener, sizeof member);

  const char* table;
  std::memcpy(&table, static_cast<const void*>(&event), sizeof table);
  FireToListenerFunction function;
  std::memcpy(&function, table + (member.offset & ~std::uintptr_t{1}), sizeof function);
  return function;
}

_Event::_Listeners::_Listeners(const _Event& event) : fireToListener_(FinalFireToListener(event)) {}

_Event::_Listeners::~_Listeners() {
  Entry* entry = first_;
  while (entry != nullptr) {
    const std::unique_ptr<Entry> freed(entry);
    entry = freed->next;
  }
}

bool _Event::_Listeners::Add(const IEventListener& listener, bool once,
                             std::uint64_t firstArgument) {
  std::unique_ptr<Entry> entry(
      new Entry{const_cast<IEventListener&>(listener), once, firstArgument});
  if (!entries_.try_emplace(&listener, entry.get()).second) return false;
  end_->store(entry.get(), std::memory_order_release);
  end_ = &entry.release()->next;
  return true;
}

bool _Event::_Listeners::Remove(const IEventListener& listener) {
  const auto found = entries_.find(&listener);
  if (found == entries_.end()) return false;
  found->second->removed = true;
  entries_.erase(found);
  ++removedCount_;
  return true;
}

void _Event::_Listeners::RemoveAll() {
  for (const auto& [listener, entry] : entries_) entry->removed = true;
  removedCount_ += entries_.size();
  entries_.clear();
}

void _Event::_Listeners::Tidy() {
  if (removedCount_ <= entries_.size()) return;
  std::atomic<Entry*>* link = &first_;
  while (Entry* entry = *link) {
    if (entry->removed) {
      *link = entry->next.load();
      delete entry;
    } else {
      link = &entry->next;
    }
  }
  end_ = link;
  removedCount_ = 0;
}

}  // namespace Tizen::Base::Runtime
