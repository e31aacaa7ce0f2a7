/// \file
#pragma once

#include <array>
#include <cstddef>
#include <mutex>
#include <optional>

namespace Native {

/// What a listener has chosen for a player's sound.
struct EffectSettings {
  /// \param initial the level while none was chosen
  int GetLevel(int effect, int initial = 0) const {
    return levels[Index(effect)].value_or(initial);
  }
  void SetLevel(int effect, int level) { levels[Index(effect)] = level; }

  static std::size_t Index(int effect) { return static_cast<std::size_t>(effect) - 1; }

  std::array<std::optional<int>, 5> levels;  ///< of effects 1 to 5
  int preset = 1;                            ///< the neutral one
};

/// A player's settings, which the threads that play read while they are changed.
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
    settings_.SetLevel(effect, level);
  }

  void SetPreset(int preset) {
    std::lock_guard lock(mutex_);
    settings_.preset = preset;
  }

 private:
  mutable std::mutex mutex_;
  EffectSettings settings_;
};

}  // namespace Native
