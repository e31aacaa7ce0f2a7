/// \file
/// The simulated device's player.
#pragma once

#include <PlayerError.h>
#include <Simulated/Device.h>
#include <player.h>

#include <array>
#include <memory>
#include <mutex>
#include <optional>

struct player_s {
  std::mutex mutex;                               // held by every function that uses the player
  std::shared_ptr<const Simulated::Media> media;  // null: no file is open
  long position = 0;
  bool showsKeyFrame = false;
  std::array<std::optional<int>, 5> levels;  // of effects 1 to 5; without a value: the initial one

  void Open(std::shared_ptr<const Simulated::Media> opened);
  int Seek(long target, bool exact);
};

namespace Simulated {

/// Logs why a player's function fails. \return \p error
inline int Refuse(int error, const char* reason, int line = __builtin_LINE()) {
  return Host::PlayerFailure(error, line, "%s", reason);
}

/// Sets what players can do to their sound back to what it is at start.
void ResetEffects();

}  // namespace Simulated
