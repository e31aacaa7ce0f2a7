// The native player: what doesn't depend on the device.

#include "Contain.h"
#include "PlayerDevice.h"
#include "PlayerError.h"

#include <Host/Calls.h>

#include <sys/types.h>
#include <unistd.h>

#include <memory>
#include <mutex>
#include <optional>

struct player_s {
  const pid_t process = getpid();
  std::mutex mutex;             // held during each operation, but for those on the effects
  std::atomic<int> closing{0};  // threads that want the file closed, which ends long work on it
  PlayerDevice::Player* device = nullptr;
};

namespace {

using Host::PlayerFailure;
using PlayerDevice::Player;
using PlayerDevice::Range;

constexpr int kOk = PLAYER_ERROR_NONE;

int Refuse(const char* reason, int line = __builtin_LINE()) {
  return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, line, "%s", reason);
}

/// Of a player: a forked child has neither its threads nor, perhaps, its locks.
bool IsUsable(player_h player) { return player != nullptr && player->process == getpid(); }

/// Runs \p operation unless the call is to fail or its arguments are wrong.
template <typename Operation>
int Run(std::optional<int> failure, bool isValid, Operation operation) noexcept {
  return Native::Contain(failure, isValid, operation, [](int code, const char* reason) {
    return PlayerFailure(code, __LINE__, "%s", reason);
  });
}

template <typename Operation>
int WithFile(std::optional<int> failure, player_h player, bool isValid, Operation operation) {
  return Run(failure, IsUsable(player) && isValid, [&] {
    std::lock_guard lock(player->mutex);
    if (PlayerDevice::IsOpen(*player->device)) return operation(*player->device);
    return PlayerFailure(PLAYER_ERROR_INVALID_STATE, __LINE__, "no file is open");
  });
}

/// Closes the file and then runs \p operation.
template <typename Operation>
int WithoutFile(std::optional<int> failure, player_h player, Operation operation) {
  return Run(failure, IsUsable(player), [&] {
    ++player->closing;
    std::lock_guard lock(player->mutex);
    --player->closing;
    PlayerDevice::Close(*player->device);
    return operation(*player->device);
  });
}

/// Runs \p operation on an effect that the player supports. Whoever calls logs a failure.
template <typename Operation>
int WithEffect(std::optional<int> failure, player_h player, int effect, bool isValid,
               Operation operation) {
  const Host::ReasonsOnly reasonsOnly;
  return Run(failure, IsUsable(player) && isValid, [&] {
    Range range;
    if (const int error = PlayerDevice::GetRange(effect, range)) return error;
    return operation(*player->device, range);
  });
}

int List(std::optional<int> failure, player_h player, bool (*callback)(int, void*), void* userData,
         int (*list)(const std::function<bool(int)>&)) {
  const Host::ReasonsOnly reasonsOnly;
  return Run(failure, IsUsable(player) && callback != nullptr,
             [&] { return list([&](int value) { return callback(value, userData); }); });
}

}  // namespace

extern "C" {

int player_create(player_h* player) {
  return Run(Host::OnCall(__func__, "%s", ""), player != nullptr, [=] {
    auto created = std::make_unique<player_s>();
    if (const int error = PlayerDevice::Create(created->device)) return error;
    *player = created.release();
    return kOk;
  });
}

int player_destroy(player_h player) {
  return Run(Host::OnCall(__func__, "%s", ""), player != nullptr, [=] {
    if (!IsUsable(player)) return kOk;  // what it is made of is the parent's
    PlayerDevice::Destroy(player->device);
    delete player;
    return kOk;
  });
}

int player_open(player_h player, const char* path) {
  const auto failure = Host::OnCall(__func__, "%s", path == nullptr ? "null" : path);
  return WithoutFile(failure, player, [=](Player& device) {
    if (path == nullptr || *path == '\0') return Refuse("the path is empty");
    return PlayerDevice::Open(device, path, player->closing);
  });
}

int player_close(player_h player) {
  return WithoutFile(Host::OnCall(__func__, "%s", ""), player, [](Player&) { return kOk; });
}

int player_play(player_h player) {
  return WithFile(Host::OnCall(__func__, "%s", ""), player, true, PlayerDevice::Play);
}

int player_pause(player_h player) {
  return WithFile(Host::OnCall(__func__, "%s", ""), player, true, PlayerDevice::Pause);
}

int player_is_at_end(player_h player, bool* at_end) {
  return WithFile(Host::OnCall(__func__, "%s", ""), player, at_end != nullptr,
                  [=](Player& device) { return *at_end = PlayerDevice::IsAtEnd(device), kOk; });
}

int player_seek(player_h player, long position, bool exact) {
  const Host::ReasonsOnly reasonsOnly;
  return WithFile(Host::OnCall(__func__, "%ld, %s", position, exact ? "true" : "false"), player,
                  true,
                  [=](Player& device) { return PlayerDevice::Seek(device, position, exact); });
}

int player_get_position(player_h player, long* position) {
  return WithFile(Host::OnCall(__func__, "%s", ""), player, position != nullptr,
                  [=](Player& device) { return PlayerDevice::GetPosition(device, *position); });
}

int player_get_duration(player_h player, long* duration) {
  return WithFile(Host::OnCall(__func__, "%s", ""), player, duration != nullptr,
                  [=](Player& device) { return PlayerDevice::GetDuration(device, *duration); });
}

int player_is_key_frame(player_h player, bool* key_frame) {
  return WithFile(
      Host::OnCall(__func__, "%s", ""), player, key_frame != nullptr,
      [=](Player& device) { return *key_frame = PlayerDevice::IsKeyFrame(device), kOk; });
}

int player_foreach_key_frame(player_h player, player_key_frame_cb callback, void* user_data) {
  return WithFile(Host::OnCall(__func__, "%s", ""), player, callback != nullptr,
                  [=](Player& device) {
                    return PlayerDevice::ListKeyFrames(
                        device, [=](long position) { return callback(position, user_data); });
                  });
}

int player_capture_frame(player_h player, player_frame_cb callback, void* user_data) {
  return WithFile(
      Host::OnCall(__func__, "%s", ""), player, callback != nullptr,
      [=](Player& device) { return PlayerDevice::CaptureFrame(device, callback, user_data); });
}

int player_render_audio(player_h player, const char* path) {
  const auto failure = Host::OnCall(__func__, "%s", path == nullptr ? "null" : path);
  return WithFile(failure, player, true, [=](Player& device) {
    if (path == nullptr || *path == '\0') return Refuse("the path is empty");
    return PlayerDevice::RenderAudio(device, path);
  });
}

int player_audio_effect_foreach_supported_effect(player_h player,
                                                 player_audio_effect_supported_effect_cb callback,
                                                 void* user_data) {
  return List(Host::OnCall(__func__, "%s", ""), player, callback, user_data,
              PlayerDevice::ListEffects);
}

int player_audio_effect_foreach_supported_preset(player_h player,
                                                 player_audio_effect_supported_preset_cb callback,
                                                 void* user_data) {
  return List(Host::OnCall(__func__, "%s", ""), player, callback, user_data,
              PlayerDevice::ListPresets);
}

int player_audio_effect_set_value(player_h player, audio_effect_e effect, int value) {
  return WithEffect(Host::OnCall(__func__, "%d, %d", effect, value), player, effect, true,
                    [=](Player& device, const Range& range) {
                      if (value >= range.min && value <= range.max) {
                        return PlayerDevice::SetLevel(device, effect, value);
                      }
                      return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__,
                                           "level %d is outside %d to %d", value, range.min,
                                           range.max);
                    });
}

int player_audio_effect_get_value(player_h player, audio_effect_e effect, int* value) {
  return WithEffect(
      Host::OnCall(__func__, "%d", effect), player, effect, value != nullptr,
      [=](Player& device, const Range&) { return PlayerDevice::GetLevel(device, effect, *value); });
}

int player_audio_effect_get_value_range(player_h player, audio_effect_e effect, int* min,
                                        int* max) {
  return WithEffect(Host::OnCall(__func__, "%d", effect), player, effect,
                    min != nullptr && max != nullptr, [=](Player&, const Range& range) {
                      *min = range.min;
                      *max = range.max;
                      return kOk;
                    });
}

int player_audio_effect_clear(player_h player, audio_effect_e effect) {
  return WithEffect(Host::OnCall(__func__, "%d", effect), player, effect, true,
                    [=](Player& device, const Range& range) {
                      return PlayerDevice::SetLevel(device, effect, range.initial);
                    });
}

int player_audio_effect_set_preset(player_h player, audio_effect_preset_e preset) {
  const Host::ReasonsOnly reasonsOnly;
  return Run(Host::OnCall(__func__, "%d", preset), IsUsable(player),
             [=] { return PlayerDevice::SetPreset(*player->device, preset); });
}

}  // extern "C"
