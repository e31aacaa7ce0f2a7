// The effects of the simulated device's player: numbers that are kept and nothing that is heard.

#include "Player.h"

#include <Host/Calls.h>

#include <algorithm>

namespace {

using Simulated::Effects;
using Simulated::Refuse;

std::mutex effectsMutex;
std::shared_ptr<const Effects> currentEffects;  // null: the default

std::shared_ptr<const Effects> CurrentEffects() {
  std::lock_guard lock(effectsMutex);
  if (currentEffects == nullptr) currentEffects = std::make_shared<Effects>();
  return currentEffects;
}

bool Contains(const std::vector<int>& values, int value) {
  return std::find(values.begin(), values.end(), value) != values.end();
}

int Enumerate(player_h player, const std::vector<int> Effects::*values,
              bool (*callback)(int, void*), void* userData) {
  if (player == nullptr || callback == nullptr) {
    return Refuse(PLAYER_ERROR_INVALID_PARAMETER, "the player or the callback is null");
  }
  const auto effects = CurrentEffects();
  for (const int value : (*effects).*values) {
    if (!callback(value, userData)) return PLAYER_ERROR_NONE;
  }
  if (effects->enumerationError == 0) return PLAYER_ERROR_NONE;
  return Refuse(effects->enumerationError, "the enumeration fails");
}

/// Runs \p operation on the level and the range of an effect that the player supports.
template <typename Operation>
int WithEffect(player_h player, audio_effect_e effect, Operation operation) {
  if (player == nullptr) return Refuse(PLAYER_ERROR_INVALID_PARAMETER, "the player is null");
  const auto effects = CurrentEffects();
  const auto index = static_cast<std::size_t>(effect) - 1;
  if (index >= player->levels.size() || !Contains(effects->effects, effect)) {
    return Refuse(PLAYER_ERROR_INVALID_PARAMETER, "the effect isn't supported");
  }
  std::lock_guard lock(player->mutex);
  return operation(player->levels[index], effects->ranges[index]);
}

}  // namespace

extern "C" {

int player_audio_effect_foreach_supported_effect(player_h player,
                                                 player_audio_effect_supported_effect_cb callback,
                                                 void* user_data) {
  if (auto failure = Host::OnCall("player_audio_effect_foreach_supported_effect", "%s", "")) {
    return *failure;
  }
  return Enumerate(player, &Effects::effects, callback, user_data);
}

int player_audio_effect_foreach_supported_preset(player_h player,
                                                 player_audio_effect_supported_preset_cb callback,
                                                 void* user_data) {
  if (auto failure = Host::OnCall("player_audio_effect_foreach_supported_preset", "%s", "")) {
    return *failure;
  }
  return Enumerate(player, &Effects::presets, callback, user_data);
}

int player_audio_effect_set_value(player_h player, audio_effect_e effect, int value) {
  if (auto failure = Host::OnCall("player_audio_effect_set_value", "%d, %d", effect, value)) {
    return *failure;
  }
  return WithEffect(player, effect, [=](std::optional<int>& level, const Effects::Range& range) {
    if (value < range.min || value > range.max) {
      return Host::PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__,
                                 "level %d is outside %d to %d", value, range.min, range.max);
    }
    level = value;
    return int{PLAYER_ERROR_NONE};
  });
}

int player_audio_effect_get_value(player_h player, audio_effect_e effect, int* value) {
  if (auto failure = Host::OnCall("player_audio_effect_get_value", "%d", effect)) return *failure;
  return WithEffect(player, effect,
                    [=](const std::optional<int>& level, const Effects::Range& range) {
                      *value = level.value_or(range.initial);
                      return PLAYER_ERROR_NONE;
                    });
}

int player_audio_effect_get_value_range(player_h player, audio_effect_e effect, int* min,
                                        int* max) {
  if (auto failure = Host::OnCall("player_audio_effect_get_value_range", "%d", effect)) {
    return *failure;
  }
  return WithEffect(player, effect, [=](const std::optional<int>&, const Effects::Range& range) {
    *min = range.min;
    *max = range.max;
    return PLAYER_ERROR_NONE;
  });
}

int player_audio_effect_clear(player_h player, audio_effect_e effect) {
  if (auto failure = Host::OnCall("player_audio_effect_clear", "%d", effect)) return *failure;
  return WithEffect(player, effect, [=](std::optional<int>& level, const Effects::Range&) {
    level.reset();
    return PLAYER_ERROR_NONE;
  });
}

int player_audio_effect_set_preset(player_h player, audio_effect_preset_e preset) {
  if (auto failure = Host::OnCall("player_audio_effect_set_preset", "%d", preset)) return *failure;
  if (player == nullptr || !Contains(CurrentEffects()->presets, preset)) {
    return Refuse(PLAYER_ERROR_INVALID_PARAMETER, "the preset isn't supported");
  }
  return PLAYER_ERROR_NONE;
}

}  // extern "C"

namespace Simulated {

void SetEffects(const Effects& effects) {
  auto copy = std::make_shared<const Effects>(effects);
  std::lock_guard lock(effectsMutex);
  currentEffects = std::move(copy);
}

void ResetEffects() { SetEffects(Effects()); }

}  // namespace Simulated
