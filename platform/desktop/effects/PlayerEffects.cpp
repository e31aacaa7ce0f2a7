// The effects of a player. They don't wait for what the player does: settings have a lock of their
// own.

#include "../Player.h"
#include "Chain.h"

#include <Host/Calls.h>

namespace {

using Host::PlayerFailure;

int Refuse(const char* reason) {
  return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "%s", reason);
}

int CheckEffect(player_h player, int effect) {
  if (player == nullptr) return Refuse("the player is null");
  if (!Desktop::IsEffect(effect)) {
    return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "there is no effect %d", effect);
  }
  if (Desktop::IsEffectSupported(effect)) return PLAYER_ERROR_NONE;
  return PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__,
                       "the effect %d needs an element of GStreamer that is missing", effect);
}

Desktop::LevelRange RangeOf(int effect) {
  return Desktop::kLevelRanges[static_cast<std::size_t>(effect - Desktop::kBass)];
}

}  // namespace

int player_audio_effect_foreach_supported_effect(player_h player,
                                                 player_audio_effect_supported_effect_cb callback,
                                                 void* user_data) {
  if (auto failure = Host::OnCall("player_audio_effect_foreach_supported_effect", "%s", "")) {
    return *failure;
  }
  if (player == nullptr || callback == nullptr) return Refuse("the player or the callback is null");
  for (int effect = Desktop::kBass; Desktop::IsEffect(effect); ++effect) {
    if (Desktop::IsEffectSupported(effect) && !callback(effect, user_data)) break;
  }
  return PLAYER_ERROR_NONE;
}

int player_audio_effect_foreach_supported_preset(player_h player,
                                                 player_audio_effect_supported_preset_cb callback,
                                                 void* user_data) {
  if (auto failure = Host::OnCall("player_audio_effect_foreach_supported_preset", "%s", "")) {
    return *failure;
  }
  if (player == nullptr || callback == nullptr) return Refuse("the player or the callback is null");
  for (int preset = 0; Desktop::IsPreset(preset); ++preset) {
    if (Desktop::IsPresetSupported(preset) && !callback(preset, user_data)) break;
  }
  return PLAYER_ERROR_NONE;
}

int player_audio_effect_set_value(player_h player, audio_effect_e effect, int value) {
  if (auto failure = Host::OnCall("player_audio_effect_set_value", "%d, %d", effect, value)) {
    return *failure;
  }
  if (const int error = CheckEffect(player, effect)) return error;
  const Desktop::LevelRange range = RangeOf(effect);
  if (value < range.min || value > range.max) {
    return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "level %d is outside %d to %d",
                         value, range.min, range.max);
  }
  player->effects.SetLevel(effect, value);
  return PLAYER_ERROR_NONE;
}

int player_audio_effect_get_value(player_h player, audio_effect_e effect, int* value) {
  if (auto failure = Host::OnCall("player_audio_effect_get_value", "%d", effect)) return *failure;
  if (const int error = CheckEffect(player, effect)) return error;
  if (value == nullptr) return Refuse("the place for the level is null");
  *value = player->effects.Get().Level(effect);
  return PLAYER_ERROR_NONE;
}

int player_audio_effect_get_value_range(player_h player, audio_effect_e effect, int* min,
                                        int* max) {
  if (auto failure = Host::OnCall("player_audio_effect_get_value_range", "%d", effect)) {
    return *failure;
  }
  if (const int error = CheckEffect(player, effect)) return error;
  if (min == nullptr || max == nullptr) return Refuse("the place for the range is null");
  *min = RangeOf(effect).min;
  *max = RangeOf(effect).max;
  return PLAYER_ERROR_NONE;
}

int player_audio_effect_clear(player_h player, audio_effect_e effect) {
  if (auto failure = Host::OnCall("player_audio_effect_clear", "%d", effect)) return *failure;
  if (const int error = CheckEffect(player, effect)) return error;
  player->effects.SetLevel(effect, Desktop::kDefaultLevel);
  return PLAYER_ERROR_NONE;
}

int player_audio_effect_set_preset(player_h player, audio_effect_preset_e preset) {
  if (auto failure = Host::OnCall("player_audio_effect_set_preset", "%d", preset)) return *failure;
  if (player == nullptr) return Refuse("the player is null");
  if (!Desktop::IsPreset(preset)) {
    return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "there is no preset %d", preset);
  }
  if (!Desktop::IsPresetSupported(preset)) {
    return PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__,
                         "the preset %d needs an element of GStreamer that is missing", preset);
  }
  player->effects.SetPreset(preset);
  return PLAYER_ERROR_NONE;
}

int player_render_audio(player_h player, const char* path) {
  if (auto failure = Host::OnCall("player_render_audio", "%s", path == nullptr ? "null" : path)) {
    return *failure;
  }
  return Desktop::UseFile(player, [&](Desktop::Playback& playback) {
    if (path == nullptr || *path == '\0') return Refuse("the path is empty");
    return playback.RenderAudio(path);
  });
}
