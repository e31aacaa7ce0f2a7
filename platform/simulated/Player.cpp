// The simulated device's player: media without bytes, a clock that stands still, so that a position
// changes only by a seek, and effects that are kept and not heard.

#include "appfw/Global.h"
#include "native/PlayerDevice.h"
#include "native/PlayerError.h"

#include <Simulated/Device.h>

#include <algorithm>
#include <memory>
#include <optional>
#include <utility>

using Host::PlayerFailure;
using Simulated::Effects;
using Simulated::Media;

namespace {

/// What is set for all players.
using CurrentMedia = Host::Global<Media>;
using CurrentEffects = Host::Global<Effects>;

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

class SimulatedFile : public PlayerDevice::File {
 public:
  explicit SimulatedFile(Media media) : media_(std::move(media)) {}

  void Play() override {
    if (isAtEnd_) position_ = 0;
    isAtEnd_ = position_ == media_.duration;
  }

  void Pause() override {}

  bool IsAtEnd() const override { return isAtEnd_; }

  void Seek(long position, bool isExact) override {
    CheckVideo();
    if (position < 0 || position > media_.duration) {
      throw PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__,
                          "position %ld ms is outside the file, which is %ld ms long", position,
                          media_.duration);
    }
    const long keyFrame = KeyFrameAtOrBefore(media_, position);
    position_ = isExact ? position : keyFrame;
    showsKeyFrame_ = position_ == keyFrame;
    isAtEnd_ = false;
  }

  long GetPosition() override { return position_; }

  long GetDuration() override { return media_.duration; }

  bool IsKeyFrame() const override { return showsKeyFrame_; }

  void ListKeyFrames(const std::function<bool(long)>& visit) override {
    CheckVideo();
    if (media_.keyFrames.empty()) {
      for (long at = 0; at <= media_.duration && visit(at);) at += media_.keyFrameInterval;
    } else {
      std::all_of(media_.keyFrames.begin(), media_.keyFrames.end(), visit);
    }
  }

  void CaptureFrame(player_frame_cb callback, void* userData) override {
    CheckVideo();
    const Picture picture(position_, media_.duration);
    callback(picture.pixels.data(), Picture::kWidth, Picture::kHeight, Picture::kStride, userData);
  }

  void RenderAudio(const char*) override {
    throw PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__,
                        "a simulated player's sound can't be heard");
  }

 private:
  void CheckVideo() const {
    if (media_.hasVideo) return;
    throw PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__, "the file has no video");
  }

  const Media media_;
  long position_ = 0;
  bool showsKeyFrame_ = false;
  bool isAtEnd_ = false;
};

void List(const std::vector<int> Effects::*values, const std::function<bool(int)>& visit) {
  const auto effects = CurrentEffects::Use([](const Effects& current) { return current; });
  const std::vector<int>& list = effects.*values;
  const bool isWhole = std::all_of(list.begin(), list.end(), visit);
  if (!isWhole || effects.enumerationError == PLAYER_ERROR_NONE) return;
  throw PlayerFailure(effects.enumerationError, __LINE__, "the enumeration fails");
}

bool Contains(const std::vector<int>& values, int value) {
  return std::find(values.begin(), values.end(), value) != values.end();
}

}  // namespace

namespace PlayerDevice {

void Start() {}

std::unique_ptr<File> Open(const char*, const Native::SharedSettings&, const std::atomic<int>&) {
  return std::make_unique<SimulatedFile>(
      CurrentMedia::Use([](const Media& current) { return current; }));
}

void ListEffects(const std::function<bool(int)>& visit) { List(&Effects::effects, visit); }

void ListPresets(const std::function<bool(int)>& visit) { List(&Effects::presets, visit); }

Range GetRange(int effect) {
  const auto range = CurrentEffects::Use([=](const Effects& effects) -> std::optional<Range> {
    const auto index = Native::EffectSettings::Index(effect);
    if (index >= effects.ranges.size() || !Contains(effects.effects, effect)) return std::nullopt;
    const auto [min, max, initial] = effects.ranges[index];
    return Range{min, max, initial};
  });
  if (range) return *range;
  throw PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "the effect isn't supported");
}

void CheckPreset(int preset) {
  const auto isListed = [=](const Effects& effects) { return Contains(effects.presets, preset); };
  if (CurrentEffects::Use(isListed)) return;
  throw PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "the preset isn't supported");
}

}  // namespace PlayerDevice

namespace Simulated {

void SetMedia(const Media& media) {
  CurrentMedia::Use([&](Media& current) { current = Media(media); });
}

void SetEffects(const Effects& effects) {
  CurrentEffects::Use([&](Effects& current) { current = Effects(effects); });
}

void ResetPlayer() {
  SetMedia(Media());
  SetEffects(Effects());
}

}  // namespace Simulated
