/// \file
#pragma once

#include <pthread.h>

#include <algorithm>
#include <atomic>
#include <condition_variable>
#include <cstdint>
#include <cstdlib>
#include <mutex>
#include <new>
#include <thread>
#include <utility>
#include <vector>

namespace Host {

/// A thread that delivers what others post, in order.
///
/// One lock guards the queue, what is being delivered, and what its owner keeps beside it; it is
/// released while others are called. There is one worker for a type of items, never destroyed.
///
/// A forked child has no thread, and the lock may be held for ever: there `IsForked` comes before
/// all else.
template <typename Item>
class Worker {
 public:
  using Lock = std::unique_lock<std::mutex>;

  /// Delivers an item on the worker's thread. The lock is held; others are called by `Call`.
  using Deliver = void (*)(Item& item, Lock& lock);

  explicit Worker(Deliver deliver) : deliver_(deliver) { instance_ = this; }

  bool IsForked() const { return isForked_.load(std::memory_order_relaxed); }
  bool IsOnThread() const { return id_ == std::this_thread::get_id(); }

  /// Starts the thread unless it runs. It ends with the process, after the call that is running.
  /// Throws `std::bad_alloc` or `std::system_error`.
  /// \return false when the process is ending
  bool Start();

  /// Throws `std::bad_alloc`, with \p item as it was. \return false when the process is ending
  bool Post(Item&& item);

  /// \return the lock, held
  Lock Acquire() { return Lock(mutex_); }

  /// \return the number of the next item to be posted; the lock must be held.
  std::uint64_t CountPosted() const { return posted_; }

  /// \return the number of the item that is being delivered; the lock must be held.
  std::uint64_t CountFinished() const { return finished_; }

  /// Calls \p visit with everything that isn't delivered; the lock must be held.
  template <typename Function>
  void ForEachPending(Function visit);

  /// Runs \p function, which calls \p callee, without the lock. On the worker's thread.
  template <typename Function>
  void Call(const void* callee, Lock& lock, Function function);

  /// \return whether \p callee is being called; the lock must be held.
  bool IsCalling(const void* callee) const { return calling_ == callee; }

  /// Waits until \p condition, which the end of a delivery or of a call changes, is false. At once
  /// on the worker's own thread.
  template <typename Condition>
  void WaitWhile(Lock& lock, Condition condition);

  /// Returns when what was posted before has been delivered, at once on the worker's own thread.
  void WaitUntilDelivered();

 private:
  void Stop();
  void Run();
  bool TakeBatch(Lock& lock);
  void NotifyProgress();

  static inline Worker* instance_ = nullptr;

  const Deliver deliver_;
  std::atomic<bool> isForked_{false};
  std::atomic<std::thread::id> id_{};  // also after the thread was detached
  std::thread thread_;

  std::mutex mutex_;
  std::condition_variable posting_;
  std::condition_variable progressed_;
  std::vector<Item> queue_;
  std::vector<Item> batch_;  // taken from the queue; what was delivered of it is empty
  std::uint64_t posted_ = 0;
  std::uint64_t finished_ = 0;
  const void* calling_ = nullptr;
  int waiting_ = 0;                     // threads that wait for the end of a delivery or a call
  std::uint64_t awaited_ = UINT64_MAX;  // the lowest number of finished items that is waited for
  bool isSleeping_ = false;             // the thread waits for items and must be woken
  bool isStopped_ = false;
};

template <typename Item>
bool Worker<Item>::Start() {
  if (IsForked()) return false;
  const Lock lock(mutex_);
  if (isStopped_) return false;
  if (thread_.joinable()) return true;
  // Exit handlers run in reverse order: those that delete what is delivered to come later, and so
  // run first.
  if (std::atexit([] { instance_->Stop(); }) != 0) throw std::bad_alloc();
  const auto onFork = [] { instance_->isForked_ = instance_->thread_.joinable(); };
  if (pthread_atfork(nullptr, nullptr, onFork) != 0) throw std::bad_alloc();
  thread_ = std::thread(&Worker::Run, this);
  return true;
}

template <typename Item>
void Worker<Item>::Stop() {
  if (IsForked()) return;  // a child that ends: the thread stayed with the parent
  {
    const Lock lock(mutex_);
    isStopped_ = true;
  }
  posting_.notify_one();
  if (!thread_.joinable()) return;
  if (IsOnThread()) {
    thread_.detach();  // whoever is called ends the process: the call never returns
  } else {
    thread_.join();
  }
  progressed_.notify_all();
}

template <typename Item>
bool Worker<Item>::Post(Item&& item) {
  if (IsForked()) return false;
  Lock lock(mutex_);
  if (isStopped_) return false;
  queue_.push_back(std::move(item));
  ++posted_;
  const bool wake = std::exchange(isSleeping_, false);
  lock.unlock();
  if (wake) posting_.notify_one();
  return true;
}

template <typename Item>
template <typename Function>
void Worker<Item>::ForEachPending(Function visit) {
  for (Item& item : batch_) visit(item);
  for (Item& item : queue_) visit(item);
}

template <typename Item>
template <typename Function>
void Worker<Item>::Call(const void* callee, Lock& lock, Function function) {
  calling_ = callee;
  lock.unlock();
  function();
  lock.lock();
  calling_ = nullptr;
  if (waiting_ > 0) NotifyProgress();
}

template <typename Item>
template <typename Condition>
void Worker<Item>::WaitWhile(Lock& lock, Condition condition) {
  if (IsOnThread()) return;
  ++waiting_;
  while (condition()) progressed_.wait(lock);
  --waiting_;
}

template <typename Item>
void Worker<Item>::NotifyProgress() {
  awaited_ = UINT64_MAX;
  progressed_.notify_all();
}

template <typename Item>
void Worker<Item>::WaitUntilDelivered() {
  if (IsForked() || IsOnThread()) return;
  Lock lock(mutex_);
  const std::uint64_t posted = posted_;
  while (finished_ < posted && !isStopped_) {
    awaited_ = std::min(awaited_, posted);
    progressed_.wait(lock);
  }
}

template <typename Item>
void Worker<Item>::Run() {
  id_ = std::this_thread::get_id();
  std::vector<Item> dropped[2];  // freed without the lock
  Lock lock(mutex_);
  while (TakeBatch(lock)) {
    for (std::size_t i = 0; i < batch_.size() && !isStopped_; ++i) {
      deliver_(batch_[i], lock);
      if (++finished_ >= awaited_ || waiting_ > 0) NotifyProgress();
    }
  }
  dropped[0].swap(batch_);
  dropped[1].swap(queue_);
}

/// \return false when the process is ending
template <typename Item>
bool Worker<Item>::TakeBatch(Lock& lock) {
  if (isStopped_) return false;
  batch_.clear();
  while (queue_.empty() && !isStopped_) {
    isSleeping_ = true;
    posting_.wait(lock);
  }
  isSleeping_ = false;
  batch_.swap(queue_);
  return !isStopped_;
}

}  // namespace Host
