/// \file
/// The platform's numbers of effects and presets. A lookup writes its result, or returns
/// `E_INVALID_ARG` and writes nothing; it doesn't report.
#pragma once

#include <Tizen/Base/Result.h>
#include <Zelkora/Media/AudioEffector.h>
#include <player.h>

namespace Zelkora::Media {

template <typename Public, typename Platform>
struct EffectRow {
  Public publicValue;
  Platform platformValue;
};

using EffectTypeRow = EffectRow<AudioEffectType, audio_effect_e>;
using PresetRow = EffectRow<AudioEffectPreset, audio_effect_preset_e>;

/// In the order in which effects are put back.
inline constexpr EffectTypeRow kEffects[] = {
    {AUDIO_EFFECT_BASS, audio_effect_e(1)},     {AUDIO_EFFECT_TREBLE, audio_effect_e(2)},
    {AUDIO_EFFECT_REVERB, audio_effect_e(3)},   {AUDIO_EFFECT_STEREO_WIDTH, audio_effect_e(4)},
    {AUDIO_EFFECT_DYNAMICS, audio_effect_e(5)},
};

inline constexpr audio_effect_preset_e kNeutralPlatformPreset = audio_effect_preset_e(1);

inline constexpr PresetRow kPresets[] = {
    {AUDIO_EFFECT_PRESET_NORMAL, kNeutralPlatformPreset},
    {AUDIO_EFFECT_PRESET_POP, audio_effect_preset_e(0)},
    {AUDIO_EFFECT_PRESET_ROCK, audio_effect_preset_e(2)},
    {AUDIO_EFFECT_PRESET_DANCE, audio_effect_preset_e(3)},
    {AUDIO_EFFECT_PRESET_JAZZ, audio_effect_preset_e(4)},
    {AUDIO_EFFECT_PRESET_CLASSICAL, audio_effect_preset_e(5)},
    {AUDIO_EFFECT_PRESET_VOCAL, audio_effect_preset_e(6)},
    {AUDIO_EFFECT_PRESET_BASS_BOOST, audio_effect_preset_e(7)},
    {AUDIO_EFFECT_PRESET_TREBLE_BOOST, audio_effect_preset_e(8)},
    {AUDIO_EFFECT_PRESET_ACOUSTIC, audio_effect_preset_e(9)},
    {AUDIO_EFFECT_PRESET_RHYTHM_AND_BLUES, audio_effect_preset_e(10)},
    {AUDIO_EFFECT_PRESET_ELECTRONIC, audio_effect_preset_e(11)},
    {AUDIO_EFFECT_PRESET_HIP_HOP, audio_effect_preset_e(12)},
    {AUDIO_EFFECT_PRESET_LATIN, audio_effect_preset_e(13)},
    {AUDIO_EFFECT_PRESET_METAL, audio_effect_preset_e(14)},
    {AUDIO_EFFECT_PRESET_COUNTRY, audio_effect_preset_e(15)},
    {AUDIO_EFFECT_PRESET_CONCERT_HALL, audio_effect_preset_e(16)},
    {AUDIO_EFFECT_PRESET_SPEECH, audio_effect_preset_e(17)},
    {AUDIO_EFFECT_PRESET_LOUDNESS, audio_effect_preset_e(18)},
    {AUDIO_EFFECT_PRESET_SMALL_SPEAKERS, audio_effect_preset_e(19)},
};

/// Finds the row of \p table whose field \p from holds \p value and writes its field \p to.
template <auto& table, auto from, auto to, typename From, typename To>
result LookUp(From value, To& found) noexcept {
  for (const auto& row : table) {
    if (row.*from != value) continue;
    found = row.*to;
    return E_SUCCESS;
  }
  return E_INVALID_ARG;
}

inline result ConvertToPlatformEffect(AudioEffectType type, audio_effect_e& effect) noexcept {
  return LookUp<kEffects, &EffectTypeRow::publicValue, &EffectTypeRow::platformValue>(type, effect);
}

inline result ConvertFromPlatformEffect(audio_effect_e effect, AudioEffectType& type) noexcept {
  return LookUp<kEffects, &EffectTypeRow::platformValue, &EffectTypeRow::publicValue>(effect, type);
}

inline result ConvertToPlatformPreset(AudioEffectPreset preset,
                                      audio_effect_preset_e& platformPreset) noexcept {
  return LookUp<kPresets, &PresetRow::publicValue, &PresetRow::platformValue>(preset,
                                                                              platformPreset);
}

inline result ConvertFromPlatformPreset(audio_effect_preset_e platformPreset,
                                        AudioEffectPreset& preset) noexcept {
  return LookUp<kPresets, &PresetRow::platformValue, &PresetRow::publicValue>(platformPreset,
                                                                              preset);
}

/// \return the result that a return code of the player's effect functions stands for.
constexpr result ConvertPlayerError(int error) noexcept {
  constexpr int kInvalidPlayerState = -26476510;
  static_assert(static_cast<unsigned>(kInvalidPlayerState) == 0xFE6C0022);
  if (error == 0) return E_SUCCESS;  // first: nearly every call
  switch (error) {
    case -22: return E_INVALID_ARG;
    case -12: return E_OUT_OF_MEMORY;
    case -38: return E_INVALID_OPERATION;
    case kInvalidPlayerState: return E_INVALID_STATE;
    default: return E_SYSTEM;
  }
}

}  // namespace Zelkora::Media
