// The simulated device's player: media without bytes, a clock that stands still, so that a position
// changes only by a seek, and effects that are kept and not heard.

#include "appfw/Global.h"
#include "native/PlayerDevice.h"
#include "native/PlayerError.h"

#include <Simulated/Device.h>

#include <algorithm>
#include <memory>
#include <mutex>
#include <optional>

using Host::PlayerFailure;
using Simulated::Effects;
using Simulated::Media;

struct PlayerDevice::Player {
  std::shared_ptr<const Media> media;  // null: no file is open
  long position = 0;
  bool showsKeyFrame = false;
  bool isAtEnd = false;

  std::mutex levelsMutex;
  std::array<std::optional<int>, 5> levels;  // of effects 1 to 5; without a value: the initial one
};

namespace {

constexpr int kOk = PLAYER_ERROR_NONE;

int Refuse(int error, const char* reason, int line = __builtin_LINE()) {
  return PlayerFailure(error, line, "%s", reason);
}

int RefuseVideo() { return Refuse(PLAYER_ERROR_INVALID_OPERATION, "the file has no video"); }

/// What is set for all players, and replaced as a whole.
template <typename Value>
struct Setting {
  std::shared_ptr<const Value> value = std::make_shared<const Value>();
};

template <typename Value>
std::shared_ptr<const Value> Get() {
  return Host::Global<Setting<Value>>::Use([](const auto& setting) { return setting.value; });
}

template <typename Value>
void Set(const Value& value) {
  auto changed = std::make_shared<const Value>(value);
  Host::Global<Setting<Value>>::Use([&](auto& setting) { setting.value.swap(changed); });
}

long KeyFrameAtOrBefore(const Media& media, long position) {
  if (media.keyFrames.empty()) return position - position % media.keyFrameInterval;
  const auto after = std::upper_bound(media.keyFrames.begin(), media.keyFrames.end(), position);
  return after == media.keyFrames.begin() ? media.keyFrames.front() : *(after - 1);
}

/// A picture whose bar and colour tell the position.
struct Picture {
  static constexpr int kWidth = 320, kHeight = 180, kStride = kWidth * 3;
  std::vector<unsigned char> pixels;

  Picture(long position, long duration) : pixels(std::size_t{kStride} * kHeight) {
    const long bar = duration > 0 ? position * kWidth / duration : 0;
    unsigned char* pixel = pixels.data();
    for (int y = 0; y < kHeight; ++y) {
      for (int x = 0; x < kWidth; ++x, pixel += 3) {
        pixel[0] = static_cast<unsigned char>(position / 50 % 256);
        pixel[1] = static_cast<unsigned char>(y);
        pixel[2] = x <= bar ? 255 : 64;
      }
    }
  }
};

int List(const std::vector<int> Effects::*values, const std::function<bool(int)>& visit) {
  const auto effects = Get<Effects>();
  const std::vector<int>& list = (*effects).*values;
  const bool isWhole = std::all_of(list.begin(), list.end(), visit);
  if (!isWhole || effects->enumerationError == 0) return kOk;
  return Refuse(effects->enumerationError, "the enumeration fails");
}

bool Contains(const std::vector<int>& values, int value) {
  return std::find(values.begin(), values.end(), value) != values.end();
}

std::size_t IndexOf(int effect) { return static_cast<std::size_t>(effect) - 1; }

}  // namespace

namespace PlayerDevice {

int Create(Player*& player) { return player = new Player, kOk; }

void Destroy(Player* player) { delete player; }

int Open(Player& player, const char*, const std::atomic<int>&) {
  player.media = Get<Media>();
  player.position = 0;
  player.showsKeyFrame = player.isAtEnd = false;
  return kOk;
}

void Close(Player& player) { player.media = nullptr; }

bool IsOpen(const Player& player) { return player.media != nullptr; }

int Play(Player& player) {
  if (player.isAtEnd) player.position = 0;
  player.isAtEnd = player.position == player.media->duration;
  return kOk;
}

int Pause(Player&) { return kOk; }

bool IsAtEnd(const Player& player) { return player.isAtEnd; }

int Seek(Player& player, long position, bool isExact) {
  if (!player.media->hasVideo) return RefuseVideo();
  if (position < 0 || position > player.media->duration) {
    return PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__,
                         "position %ld ms is outside the file, which is %ld ms long", position,
                         player.media->duration);
  }
  const long keyFrame = KeyFrameAtOrBefore(*player.media, position);
  player.position = isExact ? position : keyFrame;
  player.showsKeyFrame = player.position == keyFrame;
  player.isAtEnd = false;
  return kOk;
}

int GetPosition(Player& player, long& position) { return position = player.position, kOk; }

int GetDuration(Player& player, long& duration) { return duration = player.media->duration, kOk; }

bool IsKeyFrame(const Player& player) { return player.showsKeyFrame; }

int ListKeyFrames(Player& player, const std::function<bool(long)>& visit) {
  const Media& media = *player.media;
  if (!media.hasVideo) return RefuseVideo();
  if (media.keyFrames.empty()) {
    for (long at = 0; at <= media.duration && visit(at);) at += media.keyFrameInterval;
  } else {
    std::all_of(media.keyFrames.begin(), media.keyFrames.end(), visit);
  }
  return kOk;
}

int CaptureFrame(Player& player, player_frame_cb callback, void* userData) {
  if (!player.media->hasVideo) return RefuseVideo();
  const Picture picture(player.position, player.media->duration);
  callback(picture.pixels.data(), Picture::kWidth, Picture::kHeight, Picture::kStride, userData);
  return kOk;
}

int RenderAudio(Player&, const char*) {
  return Refuse(PLAYER_ERROR_INVALID_OPERATION, "a simulated player's sound can't be heard");
}

int ListEffects(const std::function<bool(int)>& visit) { return List(&Effects::effects, visit); }

int ListPresets(const std::function<bool(int)>& visit) { return List(&Effects::presets, visit); }

int GetRange(int effect, Range& range) {
  const auto effects = Get<Effects>();
  if (IndexOf(effect) >= effects->ranges.size() || !Contains(effects->effects, effect)) {
    return Refuse(PLAYER_ERROR_INVALID_PARAMETER, "the effect isn't supported");
  }
  const auto [min, max, initial] = effects->ranges[IndexOf(effect)];
  range = {min, max, initial};
  return kOk;
}

int SetLevel(Player& player, int effect, int level) {
  std::lock_guard lock(player.levelsMutex);
  player.levels[IndexOf(effect)] = level;
  return kOk;
}

int GetLevel(Player& player, int effect, int& level) {
  const int initial = Get<Effects>()->ranges[IndexOf(effect)].initial;
  std::lock_guard lock(player.levelsMutex);
  level = player.levels[IndexOf(effect)].value_or(initial);
  return kOk;
}

int SetPreset(Player&, int preset) {
  if (Contains(Get<Effects>()->presets, preset)) return kOk;
  return Refuse(PLAYER_ERROR_INVALID_PARAMETER, "the preset isn't supported");
}

}  // namespace PlayerDevice

namespace Simulated {

void SetMedia(const Media& media) { Set(media); }

void SetEffects(const Effects& effects) { Set(effects); }

void ResetPlayer() {
  SetMedia(Media());
  SetEffects(Effects());
}

}  // namespace Simulated
