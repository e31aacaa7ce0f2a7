/// \file
#pragma once

#include "EventListeners.h"
#include "Standby.h"

#include <sys/types.h>

#include <condition_variable>
#include <mutex>
#include <thread>

namespace Tizen::Base::Runtime {

/// The process's one dispatcher thread, and what it has to deliver.
///
/// Two locks, so that firing and delivering seldom meet: one guards the queue that is fired into,
/// the other the batch that is being delivered and every event's listeners. Where both are needed
/// the batch's is taken first. No lock is held while a listener is called or an argument freed.
class _Dispatcher {
 public:
  using Listeners = _Event::_Listeners;

  /// \return the dispatcher. It is never destroyed, because threads may fire until the process is
  /// gone.
  static _Dispatcher& Get();

  /// Starts the thread unless it runs.
  result Start();

  result Fire(_Event& event, IEventArg& arg);
  result Add(Listeners& listeners, const IEventListener& listener, bool once);
  result Remove(Listeners& listeners, const IEventListener& listener);

  /// Ends an event, as its destructor promises.
  void Close(_Event& event);

  /// Not to be called on the dispatcher's thread.
  void WaitUntilDelivered();

  /// Arguments are likely to be fired soon.
  void Expect();

 private:
  /// Arguments in the order of firing. Frees what it holds.
  class Arguments {
   public:
    Arguments() = default;
    Arguments(const Arguments&) = delete;
    Arguments& operator=(const Arguments&) = delete;
    ~Arguments() { Clear(); }

    void Clear();

    const IEventArg* First() const { return first_; }
    void Append(IEventArg& arg);
    IEventArg* TakeFirst();

    /// Moves what \p from holds behind what is here.
    void AppendAll(Arguments& from);

    /// Moves what belongs to \p event out of \p from, behind what is here.
    void AppendAllOf(const _Event& event, Arguments& from);

   private:
    IEventArg* first_ = nullptr;
    IEventArg* last_ = nullptr;
  };

  static constexpr std::uint64_t kNone = UINT64_MAX;

  _Dispatcher() = default;

  void Stop();

  void Run();
  bool TakeBatch(std::unique_lock<std::mutex>& lock);
  void Free(Arguments& arguments, std::unique_lock<std::mutex>& lock);
  void WaitForArguments();
  void Deliver(std::unique_ptr<IEventArg> arg, std::unique_lock<std::mutex>& lock);
  void TellListeners(_Event& event, Listeners& listeners, const IEventArg& arg);
  bool BeginCall(Listeners& listeners, const Listeners::Entry& entry);
  void FinishDelivery(Listeners& listeners);

  /// Waits until \p condition, which the dispatcher's progress from call to call changes, is false.
  template <typename Condition>
  void WaitWhile(std::unique_lock<std::mutex>& lock, Condition condition);
  std::uint64_t OldestUndelivered();

  alignas(64) std::mutex queueMutex_;
  std::condition_variable queued_;
  Arguments queue_;
  // What has been delivered is freed by those who fire the same event next: memory goes back to the
  // thread that takes it, which costs the allocator the least. What they leave, the dispatcher frees
  // when it takes the next batch.
  Arguments spent_;
  std::uint64_t lastNumber_ = 0;
  bool sleeping_ = false;  // the dispatcher waits for arguments and must be woken
  Host::Standby standby_;
  bool stopped_ = false;
  std::thread thread_;
  pid_t process_ = 0;

  alignas(64) std::mutex mutex_;
  std::condition_variable progressed_;
  std::condition_variable delivered_;
  Arguments batch_;
  Arguments deliveredBatch_;               // on its way to `spent_`
  int freeing_ = 0;                        // threads that free arguments of any event
  const Listeners* delivering_ = nullptr;  // the listeners of the event that is being delivered
  std::uint64_t deliveringNumber_ = 0;
  std::unique_ptr<Listeners> orphans_;  // those, when the event was destroyed meanwhile
  std::uint64_t awaited_ = kNone;       // the oldest argument whose delivery somebody waits for

  // The dispatcher stores the listener and then reads whether it was removed; who removes one does
  // it the other way round. Hence at least one of them sees the other.
  std::atomic<const IEventListener*> calling_{nullptr};
  std::atomic<int> waiting_{0};  // threads that wait for progress
};

}  // namespace Tizen::Base::Runtime
