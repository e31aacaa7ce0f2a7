#include <Host/Calls.h>

#include <cstdarg>
#include <cstdio>
#include <list>
#include <mutex>
#include <new>
#include <utility>

namespace Host {
namespace {

struct Failure {
  std::string function;
  int code;
  unsigned callsLeft;  // until the one that fails; 0: every call
};

struct State {
  std::mutex mutex;
  bool recording = false;
  std::vector<std::string> calls;
  std::list<Failure> failures;

  void UpdateWatched() { Internal::watched = recording || !failures.empty(); }

  std::optional<int> TakeFailure(const char* function) {
    for (auto failure = failures.begin(); failure != failures.end(); ++failure) {
      if (failure->function != function) continue;
      if (failure->callsLeft > 1) {
        --failure->callsLeft;
        continue;
      }
      const int code = failure->code;
      if (failure->callsLeft == 1) failures.erase(failure);
      UpdateWatched();
      return code;
    }
    return std::nullopt;
  }
};

/// Never destroyed: calls are made until the process is gone.
State& TheState() {
  static State& state = *new State;
  return state;
}

}  // namespace

namespace Internal {

std::atomic<bool> watched{false};

std::optional<int> OnWatchedCall(const char* function, const char* format, ...) noexcept {
  char arguments[512];
  va_list list;
  va_start(list, format);
  std::vsnprintf(arguments, sizeof arguments, format, list);
  va_end(list);

  State& state = TheState();
  std::lock_guard lock(state.mutex);
  if (state.recording) {
    try {
      state.calls.push_back(std::string(function) + "(" + arguments + ")");
    } catch (const std::bad_alloc&) {
      // The call matters more than its record.
    }
  }
  return state.TakeFailure(function);
}

}  // namespace Internal

void RecordCalls(bool on) {
  State& state = TheState();
  std::lock_guard lock(state.mutex);
  if (on) state.calls.clear();
  state.recording = on;
  state.UpdateWatched();
}

std::vector<std::string> TakeCalls() {
  State& state = TheState();
  std::lock_guard lock(state.mutex);
  return std::exchange(state.calls, {});
}

void FailCall(const char* function, int code, unsigned nth) {
  State& state = TheState();
  std::lock_guard lock(state.mutex);
  state.failures.push_back({function, code, nth});
  state.UpdateWatched();
}

void ClearFailures() {
  State& state = TheState();
  std::lock_guard lock(state.mutex);
  state.failures.clear();
  state.UpdateWatched();
}

}  // namespace Host
