// The native player: what doesn't depend on the device.

#include "Contain.h"
#include "PlayerDevice.h"
#include "PlayerError.h"

#include <Host/Calls.h>

#include <sys/types.h>
#include <unistd.h>

#include <functional>
#include <memory>
#include <mutex>
#include <optional>

struct player_s {
  const pid_t process = getpid();
  std::mutex mutex;             // held during each operation, but for those on the effects
  std::atomic<int> closing{0};  // threads that want the file closed, which ends long work on it
  Native::SharedSettings effects;
  std::unique_ptr<PlayerDevice::File> file;  // null: none is open
};

namespace {

using Host::PlayerFailure;
using PlayerDevice::File;
using PlayerDevice::Range;

void CheckPath(const char* path) {
  if (path != nullptr && *path != '\0') return;
  throw PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "the path is empty");
}

/// Of a player: a forked child has neither its threads nor, perhaps, its locks.
bool IsUsable(player_h player) { return player != nullptr && player->process == getpid(); }

/// Runs \p operation unless the call is to fail or its arguments are wrong.
template <typename Operation>
int Run(std::optional<int> failure, bool isValid, Operation operation) noexcept {
  const auto run = [&] {
    try {
      operation();
      return int{PLAYER_ERROR_NONE};
    } catch (const Host::PlayerError& error) {
      return error.code;
    }
  };
  return Native::Contain(failure, isValid, run, [](int code, const char* reason) {
    return PlayerFailure(code, __LINE__, "%s", reason).code;
  });
}

template <typename Operation>
int WithFile(std::optional<int> failure, player_h player, bool isValid, Operation operation) {
  return Run(failure, IsUsable(player) && isValid, [&] {
    std::lock_guard lock(player->mutex);
    if (player->file == nullptr) {
      throw PlayerFailure(PLAYER_ERROR_INVALID_STATE, __LINE__, "no file is open");
    }
    std::invoke(operation, *player->file);
  });
}

/// \return the player's lock, held
std::unique_lock<std::mutex> CloseFile(player_s& player) {
  ++player.closing;
  std::unique_lock lock(player.mutex);
  --player.closing;
  player.file.reset();
  return lock;
}

/// Runs \p operation on the range of an effect that the player supports. Whoever calls logs a
/// failure.
template <typename Operation>
int WithEffect(std::optional<int> failure, player_h player, int effect, bool isValid,
               Operation operation) {
  const Host::ReasonsOnly reasonsOnly;
  return Run(failure, IsUsable(player) && isValid,
             [&] { operation(PlayerDevice::GetRange(effect)); });
}

int List(std::optional<int> failure, player_h player, bool (*callback)(int, void*), void* userData,
         void (*list)(const std::function<bool(int)>&)) {
  const Host::ReasonsOnly reasonsOnly;
  return Run(failure, IsUsable(player) && callback != nullptr,
             [&] { list([&](int value) { return callback(value, userData); }); });
}

}  // namespace

extern "C" {

int player_create(player_h* player) {
  return Run(Host::OnCall(__func__), player != nullptr, [=] {
    PlayerDevice::Start();
    *player = new player_s;
  });
}

int player_destroy(player_h player) {
  return Run(Host::OnCall(__func__), player != nullptr, [=] {
    if (IsUsable(player)) delete player;  // else what it is made of is the parent's
  });
}

int player_open(player_h player, const char* path) {
  const auto failure = Host::OnCall(__func__, "%s", path == nullptr ? "null" : path);
  return Run(failure, IsUsable(player), [=] {
    const auto lock = CloseFile(*player);
    CheckPath(path);
    player->file = PlayerDevice::Open(path, player->effects, player->closing);
  });
}

int player_close(player_h player) {
  return Run(Host::OnCall(__func__), IsUsable(player), [=] { CloseFile(*player); });
}

int player_play(player_h player) {
  return WithFile(Host::OnCall(__func__), player, true, &File::Play);
}

int player_pause(player_h player) {
  return WithFile(Host::OnCall(__func__), player, true, &File::Pause);
}

int player_is_at_end(player_h player, bool* at_end) {
  return WithFile(Host::OnCall(__func__), player, at_end != nullptr,
                  [=](File& file) { *at_end = file.IsAtEnd(); });
}

int player_seek(player_h player, long position, bool exact) {
  const Host::ReasonsOnly reasonsOnly;
  return WithFile(Host::OnCall(__func__, "%ld, %s", position, exact ? "true" : "false"), player,
                  true, [=](File& file) { file.Seek(position, exact); });
}

int player_get_position(player_h player, long* position) {
  return WithFile(Host::OnCall(__func__), player, position != nullptr,
                  [=](File& file) { *position = file.GetPosition(); });
}

int player_get_duration(player_h player, long* duration) {
  return WithFile(Host::OnCall(__func__), player, duration != nullptr,
                  [=](File& file) { *duration = file.GetDuration(); });
}

int player_is_key_frame(player_h player, bool* key_frame) {
  return WithFile(Host::OnCall(__func__), player, key_frame != nullptr,
                  [=](File& file) { *key_frame = file.IsKeyFrame(); });
}

int player_foreach_key_frame(player_h player, player_key_frame_cb callback, void* user_data) {
  return WithFile(Host::OnCall(__func__), player, callback != nullptr, [=](File& file) {
    file.ListKeyFrames([=](long position) { return callback(position, user_data); });
  });
}

int player_capture_frame(player_h player, player_frame_cb callback, void* user_data) {
  return WithFile(Host::OnCall(__func__), player, callback != nullptr,
                  [=](File& file) { file.CaptureFrame(callback, user_data); });
}

int player_render_audio(player_h player, const char* path) {
  const auto failure = Host::OnCall(__func__, "%s", path == nullptr ? "null" : path);
  return WithFile(failure, player, true, [=](File& file) {
    CheckPath(path);
    file.RenderAudio(path);
  });
}

int player_audio_effect_foreach_supported_effect(player_h player,
                                                 player_audio_effect_supported_effect_cb callback,
                                                 void* user_data) {
  return List(Host::OnCall(__func__), player, callback, user_data, PlayerDevice::ListEffects);
}

int player_audio_effect_foreach_supported_preset(player_h player,
                                                 player_audio_effect_supported_preset_cb callback,
                                                 void* user_data) {
  return List(Host::OnCall(__func__), player, callback, user_data, PlayerDevice::ListPresets);
}

int player_audio_effect_set_value(player_h player, audio_effect_e effect, int value) {
  return WithEffect(Host::OnCall(__func__, "%d, %d", effect, value), player, effect, true,
                    [=](const Range& range) {
                      if (value < range.min || value > range.max) {
                        throw PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__,
                                            "level %d is outside %d to %d", value, range.min,
                                            range.max);
                      }
                      player->effects.SetLevel(effect, value);
                    });
}

int player_audio_effect_get_value(player_h player, audio_effect_e effect, int* value) {
  return WithEffect(
      Host::OnCall(__func__, "%d", effect), player, effect, value != nullptr,
      [=](const Range& range) { *value = player->effects.Get().GetLevel(effect, range.initial); });
}

int player_audio_effect_get_value_range(player_h player, audio_effect_e effect, int* min,
                                        int* max) {
  return WithEffect(Host::OnCall(__func__, "%d", effect), player, effect,
                    min != nullptr && max != nullptr, [=](const Range& range) {
                      *min = range.min;
                      *max = range.max;
                    });
}

int player_audio_effect_clear(player_h player, audio_effect_e effect) {
  return WithEffect(Host::OnCall(__func__, "%d", effect), player, effect, true,
                    [=](const Range& range) { player->effects.SetLevel(effect, range.initial); });
}

int player_audio_effect_set_preset(player_h player, audio_effect_preset_e preset) {
  const Host::ReasonsOnly reasonsOnly;
  return Run(Host::OnCall(__func__, "%d", preset), IsUsable(player), [=] {
    PlayerDevice::CheckPreset(preset);
    player->effects.SetPreset(preset);
  });
}

}  // extern "C"
