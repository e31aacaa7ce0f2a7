// The simulated device's player: media without bytes, and a clock that stands still, so that a
// position changes only by a seek.

#include "Player.h"

#include <Host/Calls.h>
#include <Simulated/Device.h>

#include <algorithm>
#include <new>

namespace {

using Simulated::Refuse;

std::mutex mediaMutex;
std::shared_ptr<const Simulated::Media> nextMedia;  // null: the default

std::shared_ptr<const Simulated::Media> NextMedia() {
  std::lock_guard lock(mediaMutex);
  if (nextMedia == nullptr) nextMedia = std::make_shared<Simulated::Media>();
  return nextMedia;
}

long KeyFrameAtOrBefore(const Simulated::Media& media, long position) {
  if (media.keyFrames.empty()) return position - position % media.keyFrameInterval;
  const auto after = std::upper_bound(media.keyFrames.begin(), media.keyFrames.end(), position);
  return after == media.keyFrames.begin() ? media.keyFrames.front() : *(after - 1);
}

/// Runs \p operation on a player that has a file open.
template <typename Operation>
int WithFile(player_h player, Operation operation, int line = __builtin_LINE()) {
  if (player == nullptr) return Refuse(PLAYER_ERROR_INVALID_PARAMETER, "the player is null", line);
  std::lock_guard lock(player->mutex);
  if (player->media == nullptr) {
    return Refuse(PLAYER_ERROR_INVALID_STATE, "no file is open", line);
  }
  return operation();
}

/// A picture whose bar and colour tell the position.
struct Picture {
  static constexpr int kWidth = 320, kHeight = 180, kStride = kWidth * 3;
  std::vector<unsigned char> pixels;

  Picture(long position, long duration) : pixels(kStride * kHeight) {
    const long bar = duration > 0 ? position * kWidth / duration : 0;
    for (int y = 0; y < kHeight; ++y) {
      for (int x = 0; x < kWidth; ++x) {
        unsigned char* pixel = &pixels[static_cast<std::size_t>(y * kStride + x * 3)];
        pixel[0] = static_cast<unsigned char>(position / 50 % 256);
        pixel[1] = static_cast<unsigned char>(y);
        pixel[2] = x <= bar ? 255 : 64;
      }
    }
  }
};

}  // namespace

void player_s::Open(std::shared_ptr<const Simulated::Media> opened) {
  media = std::move(opened);
  position = 0;
  showsKeyFrame = false;
}

int player_s::Seek(long target, bool exact) {
  if (!media->hasVideo) {
    return Refuse(PLAYER_ERROR_INVALID_OPERATION, "the file has no video");
  }
  if (target < 0 || target > media->duration) {
    return Host::PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__,
                               "position %ld ms is outside the file, which is %ld ms long", target,
                               media->duration);
  }
  const long keyFrame = KeyFrameAtOrBefore(*media, target);
  position = exact ? target : keyFrame;
  showsKeyFrame = position == keyFrame;
  return PLAYER_ERROR_NONE;
}

extern "C" {

int player_create(player_h* player) {
  if (auto failure = Host::OnCall("player_create", "%s", "")) return *failure;
  if (player == nullptr) return Refuse(PLAYER_ERROR_INVALID_PARAMETER, "the player is null");
  *player = new (std::nothrow) player_s;
  if (*player == nullptr) return Refuse(PLAYER_ERROR_OUT_OF_MEMORY, "no memory for a player");
  return PLAYER_ERROR_NONE;
}

int player_destroy(player_h player) {
  if (auto failure = Host::OnCall("player_destroy", "%s", "")) return *failure;
  delete player;
  return PLAYER_ERROR_NONE;
}

int player_open(player_h player, const char* path) try {
  if (auto failure = Host::OnCall("player_open", "%s", path == nullptr ? "null" : path)) {
    return *failure;
  }
  if (player == nullptr) return Refuse(PLAYER_ERROR_INVALID_PARAMETER, "the player is null");
  std::lock_guard lock(player->mutex);
  player->Open(nullptr);
  if (path == nullptr || *path == '\0') {
    return Refuse(PLAYER_ERROR_INVALID_PARAMETER, "the path is empty");
  }
  player->Open(NextMedia());
  return PLAYER_ERROR_NONE;
} catch (const std::bad_alloc&) {
  return Refuse(PLAYER_ERROR_OUT_OF_MEMORY, "no memory for the file");
}

int player_close(player_h player) {
  if (auto failure = Host::OnCall("player_close", "%s", "")) return *failure;
  if (player == nullptr) return Refuse(PLAYER_ERROR_INVALID_PARAMETER, "the player is null");
  std::lock_guard lock(player->mutex);
  player->Open(nullptr);
  return PLAYER_ERROR_NONE;
}

int player_play(player_h player) {
  if (auto failure = Host::OnCall("player_play", "%s", "")) return *failure;
  return WithFile(player, [] { return PLAYER_ERROR_NONE; });
}

int player_pause(player_h player) {
  if (auto failure = Host::OnCall("player_pause", "%s", "")) return *failure;
  return WithFile(player, [] { return PLAYER_ERROR_NONE; });
}

int player_seek(player_h player, long position, bool exact) {
  if (auto failure = Host::OnCall("player_seek", "%ld, %s", position, exact ? "true" : "false")) {
    return *failure;
  }
  return WithFile(player, [=] { return player->Seek(position, exact); });
}

int player_get_position(player_h player, long* position) {
  if (auto failure = Host::OnCall("player_get_position", "%s", "")) return *failure;
  return WithFile(player, [=] { return *position = player->position, PLAYER_ERROR_NONE; });
}

int player_get_duration(player_h player, long* duration) {
  if (auto failure = Host::OnCall("player_get_duration", "%s", "")) return *failure;
  return WithFile(player, [=] { return *duration = player->media->duration, PLAYER_ERROR_NONE; });
}

int player_is_key_frame(player_h player, bool* key_frame) {
  if (auto failure = Host::OnCall("player_is_key_frame", "%s", "")) return *failure;
  return WithFile(player, [=] { return *key_frame = player->showsKeyFrame, PLAYER_ERROR_NONE; });
}

int player_capture_frame(player_h player, player_frame_cb callback, void* user_data) {
  if (auto failure = Host::OnCall("player_capture_frame", "%s", "")) return *failure;
  return WithFile(player, [=]() -> int {
    if (!player->media->hasVideo) {
      return Refuse(PLAYER_ERROR_INVALID_OPERATION, "the file has no video");
    }
    try {
      const Picture picture(player->position, player->media->duration);
      callback(picture.pixels.data(), Picture::kWidth, Picture::kHeight, Picture::kStride,
               user_data);
      return PLAYER_ERROR_NONE;
    } catch (const std::bad_alloc&) {
      return Refuse(PLAYER_ERROR_OUT_OF_MEMORY, "no memory for a frame");
    }
  });
}

int player_render_audio(player_h player, const char* path) {
  if (auto failure = Host::OnCall("player_render_audio", "%s", path == nullptr ? "null" : path)) {
    return *failure;
  }
  return WithFile(player, [] {
    return Refuse(PLAYER_ERROR_INVALID_OPERATION, "a simulated player's sound can't be heard");
  });
}

}  // extern "C"

namespace Simulated {

void SetMedia(const Media& media) {
  auto copy = std::make_shared<const Media>(media);
  std::lock_guard lock(mediaMutex);
  nextMedia = std::move(copy);
}

void ResetPlayer() {
  SetMedia(Media());
  ResetEffects();
}

}  // namespace Simulated
