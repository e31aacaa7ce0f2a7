#include "Global.h"

#include <Host/Calls.h>

#include <cstdarg>
#include <cstdio>
#include <list>
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

using TheState = Global<State>;

}  // namespace

namespace Internal {

std::atomic<bool> watched{false};

std::optional<int> OnWatchedCall(const char* function, const char* format, ...) noexcept {
  char arguments[512];
  va_list list;
  va_start(list, format);
  std::vsnprintf(arguments, sizeof arguments, format, list);
  va_end(list);

  return TheState::Use([&](State& state) {
    if (state.recording) {
      try {
        state.calls.push_back(std::string(function) + "(" + arguments + ")");
      } catch (const std::bad_alloc&) {
        // The call matters more than its record.
      }
    }
    return state.TakeFailure(function);
  });
}

}  // namespace Internal

void RecordCalls(bool on) {
  TheState::Use([=](State& state) {
    if (on) state.calls.clear();
    state.recording = on;
    state.UpdateWatched();
  });
}

std::vector<std::string> TakeCalls() {
  return TheState::Use([](State& state) { return std::exchange(state.calls, {}); });
}

void FailCall(const char* function, int code, unsigned nth) {
  TheState::Use([=](State& state) {
    state.failures.push_back({function, code, nth});
    state.UpdateWatched();
  });
}

void ClearFailures() {
  TheState::Use([](State& state) {
    state.failures.clear();
    state.UpdateWatched();
  });
}

}  // namespace Host
