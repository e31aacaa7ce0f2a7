/// \file
#pragma once

#include "../media/PlayerError.h"
#include "Playback.h"
#include "effects/Settings.h"

#include <player.h>

#include <exception>
#include <memory>
#include <mutex>
#include <new>

struct player_s {
  std::mutex mutex;  // held during each operation, but for those on the effects
  Desktop::SharedSettings effects;
  std::unique_ptr<Desktop::Playback> playback;  // follows the effects
};

namespace Desktop {

/// Keeps exceptions from the caller.
template <typename Operation>
int Guard(Operation operation) noexcept {
  try {
    return operation();
  } catch (const std::bad_alloc&) {
    return Host::PlayerFailure(PLAYER_ERROR_OUT_OF_MEMORY, __LINE__,
                               "no memory for the player's work");
  } catch (const std::exception& exception) {
    return Host::PlayerFailure(PLAYER_ERROR_IO, __LINE__, "%s", exception.what());
  } catch (...) {
    return Host::PlayerFailure(PLAYER_ERROR_IO, __LINE__, "an unknown exception");
  }
}

template <typename Operation>
int Use(player_h player, Operation operation) noexcept {
  if (player == nullptr) {
    return Host::PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "the player is null");
  }
  return Guard([&] {
    std::lock_guard lock(player->mutex);
    return operation(*player);
  });
}

template <typename Operation>
int UseFile(player_h player, Operation operation) noexcept {
  return Use(player, [&](player_s& user) {
    if (user.playback == nullptr) {
      return Host::PlayerFailure(PLAYER_ERROR_INVALID_STATE, __LINE__, "no file is open");
    }
    return operation(*user.playback);
  });
}

}  // namespace Desktop
