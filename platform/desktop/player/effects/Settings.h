/// \file
#pragma once

#include <array>
#include <cstddef>
#include <mutex>

namespace Desktop {

/// The player interface's numbers.
enum Effect : int { kBass = 1, kTreble = 2, kReverb = 3, kStereoWidth = 4, kDynamics = 5 };

/// Of an effect's level: in dB for bass and treble, else in percent.
struct LevelRange {
  int min;
  int max;
};

inline constexpr std::array<LevelRange, 5> kLevelRanges{{
    {-12, 12},  // bass
    {-12, 12},  // treble
    {0, 100},   // reverb
    {0, 100},   // stereo width
    {0, 100},   // dynamics
}};

/// The level at which an effect does nothing.
inline constexpr int kDefaultLevel = 0;

inline constexpr int kNeutralPreset = 1;

inline constexpr bool IsEffect(int effect) { return effect >= kBass && effect <= kDynamics; }

/// What a listener has chosen.
struct EffectSettings {
  int Level(int effect) const { return levels[static_cast<std::size_t>(effect - kBass)]; }
  int& Level(int effect) { return levels[static_cast<std::size_t>(effect - kBass)]; }

  std::array<int, kLevelRanges.size()> levels{};
  int preset = kNeutralPreset;
};

/// A player's settings, which its pipeline's threads read while they are changed.
class SharedSettings {
 public:
  SharedSettings() = default;
  explicit SharedSettings(const EffectSettings& settings) : settings_(settings) {}

  EffectSettings Get() const {
    std::lock_guard lock(mutex_);
    return settings_;
  }

  void SetLevel(int effect, int level) {
    std::lock_guard lock(mutex_);
    settings_.Level(effect) = level;
  }

  void SetPreset(int preset) {
    std::lock_guard lock(mutex_);
    settings_.preset = preset;
  }

 private:
  mutable std::mutex mutex_;
  EffectSettings settings_;
};

}  // namespace Desktop
