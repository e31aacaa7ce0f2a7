// What callers ask of the desktop's sound manager.

#include "native/SoundDevice.h"

#include "Log.h"
#include "Picture.h"

#include <unistd.h>

#include <array>
#include <atomic>

namespace Desktop {
namespace {

using Lock = Connection::Lock;
using Time = Connection::Time;

/// A local server answers within milliseconds; one that doesn't is stopped or stuck.
constexpr std::chrono::seconds kAnswerLimit{1};

/// How long to wait before PipeWire is asked again whether a change can be read.
constexpr std::chrono::milliseconds kReadBackPause{1};

/// The process that uses the device; a forked child has neither its thread nor its locks.
std::atomic<pid_t> user{0};

/// To be asked before any lock is taken: in a forked child its holder may be missing.
bool IsInForkedChild() {
  pid_t first = 0;
  const pid_t self = getpid();
  return !user.compare_exchange_strong(first, self) && first != self;
}

/// The picture of the server and the connection to it, made at the first use; never destroyed.
struct Device {
  Picture picture{connection};
  Connection connection{picture};
  std::array<unsigned, kCategories + 1> sets = {};  // of levels, and of mute-all

  /// Throws when memory or threads are short.
  static Device& Get();
};

Device* theDevice = nullptr;  // once it is made

/// Made when this library is loaded, and so destroyed after all that the program does at its exit.
struct AtExit {
  ~AtExit() {
    if (theDevice != nullptr && !IsInForkedChild()) theDevice->connection.Stop();
  }
} const atExit;

Device& Device::Get() {
  static Device& made = *(theDevice = new Device);
  return made;
}

const char* Describe(int error) {
  switch (error) {
    case SOUND_MANAGER_ERROR_NO_CONNECTION: return "the sound server can't be reached";
    case SOUND_MANAGER_ERROR_INVALID_OPERATION: return "the sound server can't do that now";
    case kTimedOut: return "the sound server doesn't answer";
    case kAccessRefused: return "the sound server refuses access";
    default: return "the sound server fails";
  }
}

/// Runs \p operation on the device under its lock. \return a native code
template <typename Operation>
int OnDevice(Operation operation) {
  if (IsInForkedChild()) return SOUND_MANAGER_ERROR_NO_CONNECTION;
  Device& made = Device::Get();
  Lock lock = made.connection.Acquire();
  const int error = operation(made, lock, Connection::Clock::now() + kAnswerLimit);
  if (error != SOUND_MANAGER_ERROR_NONE) LogReason(Describe(error));
  return error;
}

/// PipeWire acknowledges a change before it can be read: waits until \p isTold after \p refresh.
/// What another thread sets meanwhile, as a callback may, is told in its place.
template <typename Refresh, typename Condition>
int AwaitReadBack(Device& device, Lock& lock, Time limit, Refresh refresh, Condition isTold) {
  while (device.picture.GetState().isPipeWire) {
    if (const int error = refresh()) return error;
    if (isTold()) break;
    if (Connection::Clock::now() > limit) return kTimedOut;
    device.connection.Rest(lock, kReadBackPause);
  }
  return SOUND_MANAGER_ERROR_NONE;
}

}  // namespace
}  // namespace Desktop

using Desktop::Batch;
using Desktop::Device;
using Desktop::Lock;
using Desktop::OnDevice;
using Desktop::Picture;
using Desktop::Time;

int SoundDevice::GetMaxLevel(int, int& max) {
  max = Desktop::kMaxLevel;
  return SOUND_MANAGER_ERROR_NONE;
}

int SoundDevice::GetLevel(int type, int& level) {
  return OnDevice([&](Device& device, Lock& lock, Time limit) -> int {
    if (const int error = device.picture.Refresh(lock, limit)) return error;
    const Desktop::Volumes& volumes = device.picture.GetState().volumes;
    if (!volumes.AreStored()) return SOUND_MANAGER_ERROR_INVALID_OPERATION;
    level = volumes.GetLevel(type);
    return SOUND_MANAGER_ERROR_NONE;
  });
}

int SoundDevice::SetLevel(int type, int level) {
  return OnDevice([=](Device& device, Lock& lock, Time limit) -> int {
    Picture& picture = device.picture;
    Desktop::Volumes& volumes = picture.GetState().volumes;
    const auto refresh = [&] { return picture.Refresh(lock, limit); };
    // So that what another program changed before is reported first; and a stored volume can only
    // be written with its other fields.
    if (const int error = refresh()) return error;
    if (!volumes.AreStored()) return SOUND_MANAGER_ERROR_INVALID_OPERATION;
    const unsigned number = ++device.sets[static_cast<std::size_t>(type)];
    Batch batch(device.connection);
    const auto streams = volumes.Send(device.connection.GetContext(), type, level, batch);
    if (!picture.GetState().isPipeWire)
      batch.WhenDone([&] { volumes.OnDone(type, level, streams); });
    if (const int error = batch.Await(lock, limit)) return error;
    return AwaitReadBack(device, lock, limit, refresh, [&] {
      const bool isOvertaken = device.sets[static_cast<std::size_t>(type)] != number;
      return isOvertaken || volumes.IsToldAs(type, level);
    });
  });
}

int SoundDevice::GetMuteAll(bool& muted) {
  return OnDevice([&](Device& device, Lock& lock, Time limit) -> int {
    if (const int error = device.picture.Refresh(lock, limit)) return error;
    const Desktop::DefaultSink& defaultSink = device.picture.GetState().defaultSink;
    if (!defaultSink.Exists()) return SOUND_MANAGER_ERROR_INVALID_OPERATION;
    muted = defaultSink.IsMuted();
    return SOUND_MANAGER_ERROR_NONE;
  });
}

int SoundDevice::SetMuteAll(bool muted) {
  return OnDevice([=](Device& device, Lock& lock, Time limit) -> int {
    Picture& picture = device.picture;
    Desktop::DefaultSink& defaultSink = picture.GetState().defaultSink;
    const auto refresh = [&] { return picture.Refresh(lock, limit); };
    // So that what another program changed before is reported first.
    if (const int error = refresh()) return error;
    const unsigned number = ++device.sets.back();
    Batch batch(device.connection);
    batch.Add([&](pa_context_success_cb_t onAnswer, void* data) {
      return pa_context_set_sink_mute_by_name(device.connection.GetContext(),
                                              Desktop::DefaultSink::kName, muted, onAnswer, data);
    });
    if (!picture.GetState().isPipeWire) batch.WhenDone([&] { defaultSink.OnMuted(muted); });
    if (const int error = batch.Await(lock, limit)) return error;
    return AwaitReadBack(device, lock, limit, refresh, [&] {
      return device.sets.back() != number || defaultSink.IsMuted() == muted;
    });
  });
}

void SoundDevice::OnSessionChanged() {}  // a player looks at the session with each buffer of sound

/// The callback is told of changes from the present state on; without a server, from its coming on.
void SoundDevice::OnListening(Native::Kind kind) {
  OnDevice([=](Device& device, Lock& lock, Time limit) -> int {
    const int error = device.picture.Refresh(lock, limit);
    Native::BeginReports(kind);
    if (kind == Native::Kind::kInterruption) device.picture.GetState().interruptions.Repeat();
    return error;
  });
}

void SoundDevice::AwaitReports() {
  OnDevice([](Device& device, Lock& lock, Time limit) -> int {
    return device.picture.Settle(lock, limit);  // without a server there is nothing to tell
  });
}

int SoundDevice::OpenCall(int& number) {
  return OnDevice([&](Device& device, Lock& lock, Time limit) -> int {
    if (const int error = device.picture.Await(lock, limit)) return error;
    return device.picture.GetCalls().Open(lock, limit, number);
  });
}

/// In a forked child there is nothing to end: the session is the parent's.
int SoundDevice::CloseCall(int number) {
  if (Desktop::IsInForkedChild()) return SOUND_MANAGER_ERROR_NONE;
  return OnDevice([=](Device& device, Lock& lock, Time limit) -> int {
    return device.picture.GetCalls().Close(lock, limit, number);
  });
}

int SoundDevice::SetCallMode(int number, int mode) {
  return OnDevice([=](Device& device, Lock& lock, Time limit) -> int {
    Desktop::Calls& calls = device.picture.GetCalls();
    int before = 0;
    if (const int error = calls.GetMode(number, before)) return error;
    if (const int error = device.picture.Await(lock, limit)) return error;
    return calls.SetMode(lock, limit, number, mode);
  });
}

int SoundDevice::GetCallMode(int number, int& mode) {
  return OnDevice([&](Device& device, Lock&, Time) -> int {
    return device.picture.GetCalls().GetMode(number, mode);
  });
}
