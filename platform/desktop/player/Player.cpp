// What native/ asks of the desktop's player.

#include "Playback.h"
#include "desktop/player/effects/Settings.h"
#include "native/PlayerDevice.h"
#include "native/PlayerError.h"

#include <memory>

using Host::PlayerFailure;

struct PlayerDevice::Player {
  Desktop::SharedSettings effects;
  std::unique_ptr<Desktop::Playback> playback;  // follows the effects
};

namespace {

int StartFramework() {
  // Else GStreamer would set signal handlers, which belong to the program.
  gst_segtrap_set_enabled(FALSE);
  GError* reason = nullptr;
  const bool isStarted = gst_init_check(nullptr, nullptr, &reason);
  const Desktop::ErrorPtr error(reason);
  if (isStarted) return PLAYER_ERROR_NONE;
  return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "GStreamer can't be started: %s",
                       error == nullptr ? "no reason given" : error->message);
}

}  // namespace

namespace PlayerDevice {

int Create(Player*& player) {
  if (const int error = StartFramework()) return error;
  if (Desktop::MakeElement("playbin") == nullptr) {
    return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "GStreamer's plug-in \"playbin\" is missing");
  }
  player = new Player;
  return PLAYER_ERROR_NONE;
}

void Destroy(Player* player) { delete player; }

int Open(Player& player, const char* path, const std::atomic<int>& isUnwanted) {
  auto playback = std::make_unique<Desktop::Playback>(path, player.effects, isUnwanted);
  const int error = playback->Open();
  if (error == PLAYER_ERROR_NONE) player.playback = std::move(playback);
  return error;
}

void Close(Player& player) { player.playback.reset(); }

bool IsOpen(const Player& player) { return player.playback != nullptr; }

int Play(Player& player) { return player.playback->Play(); }

int Pause(Player& player) { return player.playback->Pause(); }

bool IsAtEnd(const Player& player) { return player.playback->IsAtEnd(); }

int Seek(Player& player, long position, bool isExact) {
  return player.playback->Seek(position, isExact);
}

int GetPosition(Player& player, long& position) { return player.playback->GetPosition(&position); }

int GetDuration(Player& player, long& duration) { return player.playback->GetDuration(&duration); }

bool IsKeyFrame(const Player& player) { return player.playback->IsKeyFrame(); }

int ListKeyFrames(Player& player, const std::function<bool(long)>& visit) {
  return player.playback->ListKeyFrames(visit);
}

int CaptureFrame(Player& player, player_frame_cb callback, void* userData) {
  return player.playback->CaptureFrame(callback, userData);
}

int RenderAudio(Player& player, const char* path) { return player.playback->RenderAudio(path); }

int ListEffects(const std::function<bool(int)>& visit) {
  for (int effect = Desktop::kBass; Desktop::IsEffect(effect); ++effect) {
    if (Desktop::IsEffectSupported(effect) && !visit(effect)) break;
  }
  return PLAYER_ERROR_NONE;
}

int ListPresets(const std::function<bool(int)>& visit) {
  for (int preset = 0; Desktop::IsPreset(preset); ++preset) {
    if (Desktop::IsPresetSupported(preset) && !visit(preset)) break;
  }
  return PLAYER_ERROR_NONE;
}

int GetRange(int effect, Range& range) {
  if (!Desktop::IsEffect(effect)) {
    return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "there is no effect %d", effect);
  }
  if (!Desktop::IsEffectSupported(effect)) {
    return PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__,
                         "the effect %d needs an element of GStreamer that is missing", effect);
  }
  const auto [min, max] = Desktop::kLevelRanges[static_cast<std::size_t>(effect - Desktop::kBass)];
  range = {min, max, Desktop::kDefaultLevel};
  return PLAYER_ERROR_NONE;
}

int SetLevel(Player& player, int effect, int level) {
  player.effects.SetLevel(effect, level);
  return PLAYER_ERROR_NONE;
}

int GetLevel(Player& player, int effect, int& level) {
  level = player.effects.Get().Level(effect);
  return PLAYER_ERROR_NONE;
}

int SetPreset(Player& player, int preset) {
  if (!Desktop::IsPreset(preset)) {
    return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "there is no preset %d", preset);
  }
  if (!Desktop::IsPresetSupported(preset)) {
    return PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__,
                         "the preset %d needs an element of GStreamer that is missing", preset);
  }
  player.effects.SetPreset(preset);
  return PLAYER_ERROR_NONE;
}

}  // namespace PlayerDevice
