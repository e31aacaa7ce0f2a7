#include "Session.h"

#include "native/Reports.h"

#include <atomic>
#include <chrono>

namespace Desktop {
namespace {

constexpr int kMediaType = 0;

/// The media role of player streams for each session type. What must be heard, an emergency, is an
/// alarm to the other programs.
constexpr const char* kRoleOfType[] = {"music", "alarm", "notification", "alarm"};

/// Media that mixes: calls don't cork it.
constexpr int kMix = 1;
constexpr char kMixRole[] = "game";

using Clock = std::chrono::steady_clock;

/// Longer than the server takes to tell that a stream has ended.
constexpr std::chrono::seconds kReplacement{1};

std::atomic<Clock::time_point> streamReplaced{};

}  // namespace

const char* GetPlayerRole() {
  const Native::Session session = Native::GetSession();
  const bool isMixing = session.type == kMediaType && session.options[0] == kMix;
  return isMixing ? kMixRole : kRoleOfType[session.type];
}

void NoteStreamReplaced() { streamReplaced = Clock::now(); }

bool WasStreamJustReplaced() { return Clock::now() - streamReplaced.load() < kReplacement; }

}  // namespace Desktop
