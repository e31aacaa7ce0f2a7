/// \file
#pragma once

#include "native/EffectSettings.h"

#include <array>
#include <cstddef>

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

using Native::EffectSettings;
using Native::SharedSettings;

}  // namespace Desktop
