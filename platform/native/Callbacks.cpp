#include "Callbacks.h"

#include "appfw/NeverDestroyed.h"
#include "appfw/Worker.h"

#include <sound_manager.h>

#include <array>

namespace Native {
namespace {

using Worker = Host::Worker<Report>;

/// The callback for one kind of reports. Changed under the worker's lock.
struct Slot {
  Callback callback = nullptr;
  void* userData = nullptr;
  std::atomic<unsigned> registration{0};  // 0: nobody listens
};

struct Slots {
  std::array<Slot, 3> all;
  unsigned lastRegistration = 0;
  std::atomic<bool> isWithUserData{true};

  Slot& Of(Kind kind) { return all[static_cast<std::size_t>(kind)]; }

  /// Begins afresh: what was reported before isn't for the callback.
  void Register(Slot& slot) { slot.registration = ++lastRegistration; }
};

Slots& TheSlots() {
  static Host::NeverDestroyed<Slots> slots;
  return *slots;
}

void Deliver(Report& report, Worker::Lock& lock);

Worker& TheWorker() {
  static Host::NeverDestroyed<Worker> worker(Deliver);
  return *worker;
}

void Tell(const Report& report, Callback callback, void* userData) {
  switch (report.kind) {
    case Kind::kVolume:
      return reinterpret_cast<sound_manager_volume_changed_cb>(callback)(report.first,
                                                                         report.second, userData);
    case Kind::kMuteAll:
      return reinterpret_cast<sound_manager_muteall_changed_cb>(callback)(report.first != 0,
                                                                          userData);
    case Kind::kInterruption:
      return reinterpret_cast<sound_manager_session_interrupted_cb>(callback)(report.first,
                                                                              userData);
  }
}

void Deliver(Report& report, Worker::Lock& lock) {
  const Slot& slot = TheSlots().Of(report.kind);
  if (slot.registration != report.registration) return;
  const Callback callback = slot.callback;
  void* const userData = report.isWithUserData ? slot.userData : nullptr;
  TheWorker().Call(&slot, lock, [&] { Tell(report, callback, userData); });
}

void Post(Kind kind, int first, int second) {
  Slots& slots = TheSlots();
  const unsigned registration = slots.Of(kind).registration;
  if (registration == 0) return;
  TheWorker().Post({kind, first, second, registration, slots.isWithUserData});
}

}  // namespace

void ReportLevel(int type, int level) { Post(Kind::kVolume, type, level); }

void ReportMuteAll(bool isMuted) { Post(Kind::kMuteAll, isMuted, 0); }

void ReportInterruption(int code) { Post(Kind::kInterruption, code, 0); }

bool SetCallback(Kind kind, Callback callback, void* userData) {
  Worker& worker = TheWorker();
  if (!worker.Start()) return false;
  const auto lock = worker.Acquire();
  Slot& slot = TheSlots().Of(kind);
  slot.callback = callback;
  slot.userData = userData;
  slot.registration = 0;
  return true;
}

void BeginReports(Kind kind) {
  const auto lock = TheWorker().Acquire();
  Slot& slot = TheSlots().Of(kind);
  if (slot.callback != nullptr) TheSlots().Register(slot);  // it may have been removed meanwhile
}

void UnsetCallback(Kind kind) {
  Worker& worker = TheWorker();
  if (worker.IsForked()) return;
  auto lock = worker.Acquire();
  Slot& slot = TheSlots().Of(kind);
  slot.callback = nullptr;
  slot.registration = 0;
  worker.WaitWhile(lock, [&] { return worker.IsCalling(&slot); });
}

void DropReports() {
  if (TheWorker().IsForked()) return;
  const auto lock = TheWorker().Acquire();
  for (Slot& slot : TheSlots().all) {
    if (slot.registration != 0) TheSlots().Register(slot);
  }
}

void ReportWithoutUserData(bool on) { TheSlots().isWithUserData = !on; }

void WaitUntilReported() { TheWorker().WaitUntilDelivered(); }

}  // namespace Native
