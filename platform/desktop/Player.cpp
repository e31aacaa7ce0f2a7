#include "Player.h"

#include <Host/Calls.h>

using Desktop::Guard;
using Desktop::Playback;
using Desktop::Use;
using Desktop::UseFile;
using Host::PlayerFailure;

namespace {

int RefuseNull(const char* what) {
  return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "%s is null", what);
}

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

int player_create(player_h* player) {
  if (auto failure = Host::OnCall("player_create", "%s", "")) return *failure;
  if (player == nullptr) return RefuseNull("the place for the player");
  return Guard([&] {
    if (const int error = StartFramework()) return error;
    if (Desktop::MakeElement("playbin") == nullptr) {
      return PlayerFailure(PLAYER_ERROR_IO, __LINE__, "GStreamer's plug-in \"playbin\" is missing");
    }
    *player = new player_s;
    return int(PLAYER_ERROR_NONE);
  });
}

int player_destroy(player_h player) {
  if (auto failure = Host::OnCall("player_destroy", "%s", "")) return *failure;
  if (player == nullptr) return RefuseNull("the player");
  delete player;
  return PLAYER_ERROR_NONE;
}

int player_open(player_h player, const char* path) {
  if (auto failure = Host::OnCall("player_open", "%s", path == nullptr ? "null" : path)) {
    return *failure;
  }
  return Use(player, [&](player_s& user) {
    user.playback.reset();
    if (path == nullptr || *path == '\0') {
      return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "the path is empty");
    }
    auto playback = std::make_unique<Playback>(user.effects);
    const int error = playback->Open(path);
    if (error == PLAYER_ERROR_NONE) user.playback = std::move(playback);
    return error;
  });
}

int player_close(player_h player) {
  if (auto failure = Host::OnCall("player_close", "%s", "")) return *failure;
  return Use(player, [](player_s& user) {
    user.playback.reset();
    return int(PLAYER_ERROR_NONE);
  });
}

int player_play(player_h player) {
  if (auto failure = Host::OnCall("player_play", "%s", "")) return *failure;
  return UseFile(player, [](Playback& playback) { return playback.Play(); });
}

int player_pause(player_h player) {
  if (auto failure = Host::OnCall("player_pause", "%s", "")) return *failure;
  return UseFile(player, [](Playback& playback) { return playback.Pause(); });
}

int player_seek(player_h player, long position, bool exact) {
  if (auto failure = Host::OnCall("player_seek", "%ld, %s", position, exact ? "true" : "false")) {
    return *failure;
  }
  return UseFile(player, [=](Playback& playback) { return playback.Seek(position, exact); });
}

int player_get_position(player_h player, long* position) {
  if (auto failure = Host::OnCall("player_get_position", "%s", "")) return *failure;
  if (position == nullptr) return RefuseNull("the place for the position");
  return UseFile(player, [=](Playback& playback) { return playback.GetPosition(position); });
}

int player_get_duration(player_h player, long* duration) {
  if (auto failure = Host::OnCall("player_get_duration", "%s", "")) return *failure;
  if (duration == nullptr) return RefuseNull("the place for the duration");
  return UseFile(player, [=](Playback& playback) { return playback.GetDuration(duration); });
}

int player_is_key_frame(player_h player, bool* key_frame) {
  if (auto failure = Host::OnCall("player_is_key_frame", "%s", "")) return *failure;
  if (key_frame == nullptr) return RefuseNull("the place for the answer");
  return UseFile(player, [=](Playback& playback) {
    *key_frame = playback.IsKeyFrame();
    return int(PLAYER_ERROR_NONE);
  });
}

int player_capture_frame(player_h player, player_frame_cb callback, void* user_data) {
  if (auto failure = Host::OnCall("player_capture_frame", "%s", "")) return *failure;
  if (callback == nullptr) return RefuseNull("the callback");
  return UseFile(player,
                 [=](Playback& playback) { return playback.CaptureFrame(callback, user_data); });
}
