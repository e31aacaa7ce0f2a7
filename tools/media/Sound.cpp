#include "Sound.h"

#include "base/Failure.h"
#include "base/Progress.h"

#include <fmt/format.h>

#include <algorithm>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <memory>

namespace CommandLine {
namespace {

namespace fs = std::filesystem;
using Tizen::Base::Collection::IListT;

constexpr std::streamoff kRatePlace = 24;  // in a WAV file's head, lowest byte first
constexpr double kBytesASample = 4;

template <typename Value>
std::vector<Value> ToVector(IListT<Value>* owned, const char* attempt) {
  const std::unique_ptr<IListT<Value>> list(owned);
  if (list == nullptr) Check(GetLastResult(), attempt);
  std::vector<Value> values(static_cast<std::size_t>(list->GetCount()));
  for (int i = 0; i < list->GetCount(); ++i) list->GetAt(i, values[static_cast<std::size_t>(i)]);
  return values;
}

/// \return how much of a WAV file of 16-bit stereo is there, under its name or a longer one.
double ShareWritten(const std::string& name, long duration) {
  std::error_code ignored;
  const fs::path path(name);
  double share = 0;
  for (const fs::directory_entry& entry : fs::directory_iterator(path.parent_path(), ignored)) {
    std::ifstream file(entry.path(), std::ios::binary);
    std::uint32_t rate = 0;  // in samples a second
    file.seekg(kRatePlace).read(reinterpret_cast<char*>(&rate), sizeof rate);
    const bool isPart = entry.path().filename().string().rfind(path.filename().string(), 0) == 0;
    if (!file || rate == 0 || !isPart) continue;
    const auto bytes = static_cast<double>(entry.file_size(ignored));
    share = std::max(share, bytes / kBytesASample / rate * 1000 / static_cast<double>(duration));
  }
  return share;
}

}  // namespace

Sound::Sound() {
  Check(player_.Construct(), "start the player");
  Check(effector_.Construct(player_), "change the sound");
}

void Sound::Open(const std::string& file) {
  Check(player_.OpenFile(file.c_str()), fmt::format("open {}", file));
}

std::vector<Sound::Effect> Sound::Effects() const {
  return ToVector(effector_.GetSupportedEffectListN(), "list the effects");
}

std::vector<Sound::Preset> Sound::Presets() const {
  return ToVector(effector_.GetSupportedEffectPresetListN(), "list the presets");
}

Sound::Level Sound::LevelOf(Effect effect) const {
  Level level;
  const std::string attempt = fmt::format("read the level of {}", NameOf(kEffects, effect));
  Check(effector_.GetEffectLevel(effect, level.now), attempt);
  Check(effector_.GetEffectLevelRange(effect, level.min, level.max), attempt);
  return level;
}

void Sound::Apply(const std::vector<Change>& changes) {
  for (const Change& change : changes) {
    Check(change.apply(effector_), fmt::format("set {}", change.text));
  }
}

void Sound::Play() { Check(player_.Play(), "play"); }

void Sound::Pause() { Check(player_.Pause(), "pause"); }

long Sound::Position() const {
  const long position = player_.GetPosition();
  if (position < 0) Check(GetLastResult(), "tell the position");
  return position;
}

long Sound::Duration() const {
  const long duration = player_.GetDuration();
  if (duration < 0) Check(GetLastResult(), "tell the length");
  return duration;
}

void Sound::Render(const std::string& file) const {
  const WatchedProgress progress(
      [&file, duration = Duration()] { return ShareWritten(file, duration); });
  Check(player_.RenderAudio(file.c_str()), "write the sound");
}

}  // namespace CommandLine
