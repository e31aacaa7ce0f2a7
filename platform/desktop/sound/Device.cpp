#include "Device.h"

#include <Host/Events.h>

#include <unistd.h>

namespace Desktop {
namespace {

/// A local server answers within milliseconds; one that doesn't is stopped or stuck.
constexpr std::chrono::seconds kAnswerLimit{1};

Device* device = nullptr;  // once it is made

}  // namespace

/// Made when this library is loaded, and so destroyed after all that the program does at its exit.
struct AtExit {
  ~AtExit() {
    if (device != nullptr) device->Stop();
  }
};
static const AtExit atExit;

Device& Device::Get() {
  static Device& made = *new Device;
  return made;
}

Device::Device() : process_(getpid()) {
  device = this;
  Host::SetDeviceWait([] { device->AwaitReports(); });
}

void Device::Stop() {
  if (getpid() != process_) return;  // a forked child that ends: the thread stayed with the parent
  {
    Lock lock(loop_.GetMutex());
    connection_.Close();
  }
  loop_.Stop();
}

Device::Time Device::GetLimit() { return std::chrono::steady_clock::now() + kAnswerLimit; }

template <typename Condition>
int Device::AwaitPicture(Lock& lock, Time limit, Condition condition) {
  const auto isDecided = [&] { return connection_.IsDown() || (isComplete_ && condition()); };
  if (!loop_.WaitForProgress(lock, limit, isDecided)) return kTimedOut;
  return connection_.IsDown() ? connection_.GetErrorCode() : SOUND_MANAGER_ERROR_NONE;
}

int Device::AwaitPicture(Lock& lock, Time limit) {
  connection_.Connect();  // at once, even if the time of the next attempt hasn't come
  return AwaitPicture(lock, limit, [] { return true; });
}

int Device::Refresh(Lock& lock, Time limit) {
  if (const int error = AwaitPicture(lock, limit)) return error;
  if (!loop_.AwaitReading(lock, limit)) return kTimedOut;
  if (areVolumesDue_) AskForVolumes();
  return AwaitPicture(
      lock, limit, [this, asked = questions_.GetAsked()] { return questions_.AreAnswered(asked); });
}

int Device::Await(Lock& lock, Time limit, const Batch& batch) {
  const unsigned connection = connection_.GetNumber();
  const auto isLost = [&] {
    return connection_.GetContext() == nullptr || connection_.GetNumber() != connection;
  };
  if (!loop_.WaitForProgress(lock, limit, [&] { return batch.IsDone() || isLost(); })) {
    return kTimedOut;
  }
  return batch.IsDone() ? batch.GetErrorCode() : int{SOUND_MANAGER_ERROR_NO_CONNECTION};
}

int Device::SetLevel(Category category, int level) {
  Lock lock(loop_.GetMutex());
  const Time limit = GetLimit();
  // What is stored is written as a whole, so what others have changed must be known.
  if (const int error = Refresh(lock, limit)) return error;
  if (!volumes_.AreStored()) return SOUND_MANAGER_ERROR_INVALID_OPERATION;
  Batch batch(loop_, [=] { volumes_.OnDone(category, level); });
  volumes_.Send(connection_.GetContext(), category, level, !isPipeWire_, batch);
  ++ownWrites_;
  const int error = Await(lock, limit, batch);
  // The event comes before the answer. One that doesn't must not hide another program's.
  ownWrites_ = 0;
  return error;
}

int Device::GetLevel(Category category, int& level) {
  Lock lock(loop_.GetMutex());
  if (const int error = Refresh(lock, GetLimit())) return error;
  if (!volumes_.AreStored()) return SOUND_MANAGER_ERROR_INVALID_OPERATION;
  level = volumes_.GetLevel(category);
  return SOUND_MANAGER_ERROR_NONE;
}

int Device::SetMuteAll(bool isMuted) {
  Lock lock(loop_.GetMutex());
  const Time limit = GetLimit();
  if (const int error = AwaitPicture(lock, limit)) return error;
  Batch batch(loop_, [=] { output_.OnMuted(isMuted); });
  batch.Add([&](pa_context_success_cb_t onAnswer, void* data) {
    return pa_context_set_sink_mute_by_name(connection_.GetContext(), Output::kName, isMuted,
                                            onAnswer, data);
  });
  return Await(lock, limit, batch);
}

int Device::GetMuteAll(bool& isMuted) {
  Lock lock(loop_.GetMutex());
  if (const int error = Refresh(lock, GetLimit())) return error;
  if (!output_.Exists()) return SOUND_MANAGER_ERROR_INVALID_OPERATION;
  isMuted = output_.IsMuted();
  return SOUND_MANAGER_ERROR_NONE;
}

void Device::SetCallback(Host::Kind kind, Reports::Callback callback) {
  Lock lock(loop_.GetMutex());
  // What the callback is told are changes of what is so now, if there is a server.
  AwaitPicture(lock, GetLimit());
  reports_.Set(kind, std::move(callback));
  if (kind == Host::Kind::kInterruption) interruptions_.Repeat();
}

void Device::AwaitReports() {
  {
    Lock lock(loop_.GetMutex());
    if (connection_.GetContext() != nullptr) AskLater();
    Refresh(lock, GetLimit());  // without a server there is nothing to read
  }
  reports_.AwaitCallbacks();
}

CallSession* Device::FindCall(int number) {
  const auto found = calls_.find(number);
  return found == calls_.end() ? nullptr : &found->second;
}

int Device::OpenCall(int& number) {
  Lock lock(loop_.GetMutex());
  const Time limit = GetLimit();
  if (const int error = AwaitPicture(lock, limit)) return error;
  const int added = ++lastCall_;
  calls_.try_emplace(added, static_cast<CallSession::Owner&>(*this));
  const int error = AwaitOpenCall(lock, limit, added);
  if (error == SOUND_MANAGER_ERROR_NONE) {
    number = added;
  } else {
    calls_.erase(added);
  }
  return error;
}

int Device::AwaitOpenCall(Lock& lock, Time limit, int number) {
  const unsigned connection = connection_.GetNumber();
  FindCall(number)->Open(connection_.GetContext());
  const auto isDecided = [&] {
    const CallSession* call = FindCall(number);
    return call == nullptr || !call->IsOpening() || connection_.GetNumber() != connection;
  };
  if (!loop_.WaitForProgress(lock, limit, isDecided)) return kTimedOut;
  const CallSession* call = FindCall(number);
  if (call == nullptr) return SOUND_MANAGER_ERROR_INVALID_PARAMETER;
  if (call->IsOpen()) return SOUND_MANAGER_ERROR_NONE;
  const bool isLost = connection_.GetContext() == nullptr || call->GetErrorCode() == 0;
  return isLost ? int{SOUND_MANAGER_ERROR_NO_CONNECTION} : call->GetErrorCode();
}

int Device::CloseCall(int number) {
  Lock lock(loop_.GetMutex());
  const auto node = calls_.extract(number);
  if (node.empty()) return SOUND_MANAGER_ERROR_INVALID_PARAMETER;
  CallSession& call = node.mapped();
  call.Close();
  loop_.WaitForProgress(lock, GetLimit(), [&] { return !call.IsOpen() && !call.IsOpening(); });
  return SOUND_MANAGER_ERROR_NONE;
}

int Device::SetCallMode(int number, int mode) {
  Lock lock(loop_.GetMutex());
  const Time limit = GetLimit();
  if (FindCall(number) == nullptr) return SOUND_MANAGER_ERROR_INVALID_PARAMETER;
  if (const int error = AwaitPicture(lock, limit)) return error;
  if (FindCall(number) == nullptr) return SOUND_MANAGER_ERROR_INVALID_PARAMETER;
  if (const int error = AwaitOpenCall(lock, limit, number)) return error;
  Batch batch(loop_, [=] {
    if (CallSession* call = FindCall(number)) call->SetMode(mode);
  });
  FindCall(number)->SendMode(mode, batch);
  return Await(lock, limit, batch);
}

int Device::GetCallMode(int number, int& mode) {
  Lock lock(loop_.GetMutex());
  const CallSession* call = FindCall(number);
  if (call == nullptr) return SOUND_MANAGER_ERROR_INVALID_PARAMETER;
  mode = call->GetMode();
  return SOUND_MANAGER_ERROR_NONE;
}

}  // namespace Desktop
