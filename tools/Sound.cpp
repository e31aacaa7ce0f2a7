#include "Sound.h"

#include "Failure.h"

#include <fmt/format.h>

#include <memory>

namespace CommandLine {
namespace {

using Tizen::Base::Collection::IListT;

template <typename Value>
std::vector<Value> ToVector(IListT<Value>* owned, const char* attempt) {
  const std::unique_ptr<IListT<Value>> list(owned);
  if (list == nullptr) Check(GetLastResult(), attempt);
  std::vector<Value> values(static_cast<std::size_t>(list->GetCount()));
  for (int i = 0; i < list->GetCount(); ++i) list->GetAt(i, values[static_cast<std::size_t>(i)]);
  return values;
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
  Check(player_.RenderAudio(file.c_str()), fmt::format("write the sound to {}", file));
}

}  // namespace CommandLine
