#include "CallbackThread.h"

#include <Host/Events.h>

#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <new>
#include <utility>

namespace Host {
namespace {

thread_local bool onCallbackThread = false;

CallbackThread* stoppedAtExit = nullptr;

}  // namespace

void CallbackThread::Set(Kind kind, Callback callback) {
  std::lock_guard lock(mutex_);
  Start();
  std::lock_guard callLock(callMutex_);
  SlotOf(kind) = {std::move(callback), postedCount_};
}

void CallbackThread::Unset(Kind kind) {
  Slot& slot = SlotOf(kind);
  std::unique_lock lock(mutex_);
  std::unique_lock callLock(callMutex_);
  slot = {nullptr, postedCount_};
  lock.unlock();
  if (onCallbackThread) return;
  // The call that runs now, not one of a callback that is set meanwhile.
  if (calling_ == &slot) WaitUntilFinished(finishedCount_ + 1, callLock);
}

void CallbackThread::Post(const Report& report) {
  if (stopped_ || SlotOf(report.kind).callback == nullptr) return;
  queue_.push_back(report);
  ++postedCount_;
  standby_.Notify();
  if (std::exchange(sleeping_, false)) queued_.notify_one();
}

void CallbackThread::Expect(Kind kind) {
  if (SlotOf(kind).callback == nullptr) return;
  standby_.Expect();
  if (std::exchange(sleeping_, false)) queued_.notify_one();
}

void CallbackThread::DropReports() {
  std::lock_guard lock(mutex_);
  std::lock_guard callLock(callMutex_);
  for (Slot& slot : slots_) slot.firstReport = postedCount_;
}

void CallbackThread::WaitUntilReported() {
  if (onCallbackThread) return;
  std::unique_lock lock(mutex_);
  const std::uint64_t posted = postedCount_;
  lock.unlock();
  std::unique_lock callLock(callMutex_);
  WaitUntilFinished(posted, callLock);
}

void CallbackThread::WaitUntilFinished(std::uint64_t count, std::unique_lock<std::mutex>& lock) {
  while (finishedCount_ < count) {
    awaitedCount_ = std::min(awaitedCount_, count);
    progressed_.wait(lock);
  }
}

void CallbackThread::Finish(std::uint64_t count) {
  finishedCount_ = count;
  if (finishedCount_ < awaitedCount_) return;
  awaitedCount_ = UINT64_MAX;
  progressed_.notify_all();
}

void CallbackThread::Start() {
  if (thread_.joinable() || stopped_) return;
  stoppedAtExit = this;
  // Registered before whatever unsets the callbacks at exit, and so called after it.
  if (std::atexit([] { stoppedAtExit->Stop(); }) != 0) throw std::bad_alloc();
  process_ = getpid();
  thread_ = std::thread(&CallbackThread::Run, this);
}

void CallbackThread::Stop() {
  if (getpid() != process_) return;  // a forked child that ends: the thread stayed with the parent
  for (const Kind kind : {Kind::kVolume, Kind::kMuteAll, Kind::kInterruption}) Unset(kind);
  {
    std::lock_guard lock(mutex_);
    stopped_ = true;
    queued_.notify_one();
  }
  if (!thread_.joinable()) return;
  if (onCallbackThread) {
    thread_.detach();  // a callback ends the process: its call never returns
  } else {
    thread_.join();
  }
  std::lock_guard callLock(callMutex_);
  Finish(postedCount_);
}

void CallbackThread::Run() {
  onCallbackThread = true;
  while (TakeBatch()) {
    std::unique_lock callLock(callMutex_);
    for (const Report& report : batch_) Deliver(report, callLock);
    batch_.clear();
  }
}

/// \return false when the process is ending
bool CallbackThread::TakeBatch() {
  std::unique_lock lock(mutex_);
  while (queue_.empty() && !stopped_) {
    if (standby_.Wait(lock, ExpectEvents)) continue;
    sleeping_ = true;
    queued_.wait(lock);
  }
  sleeping_ = false;
  batch_.swap(queue_);
  return !stopped_;
}

void CallbackThread::Deliver(const Report& report, std::unique_lock<std::mutex>& lock) {
  Slot& slot = SlotOf(report.kind);
  if (slot.callback != nullptr && finishedCount_ >= slot.firstReport) {
    calling_ = &slot;
    const Callback callback = slot.callback;
    lock.unlock();
    callback(report);
    lock.lock();
    calling_ = nullptr;
  }
  Finish(finishedCount_ + 1);
}

}  // namespace Host
