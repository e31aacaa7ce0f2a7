#include "EffectTables.h"

#include <Tizen/Base/Result.h>

namespace Zelkora::Media {
namespace {

constexpr int kInvalidPlayerState = -26476510;
static_assert(static_cast<unsigned>(kInvalidPlayerState) == 0xFE6C0022);

/// Finds the row whose field \p from holds \p value and writes its field \p to.
template <typename Table, typename From, typename To, typename Row>
result LookUp(const Table& table, From Row::*from, From value, To Row::*to, To& found) noexcept {
  for (const Row& row : table) {
    if (row.*from == value) {
      found = row.*to;
      return E_SUCCESS;
    }
  }
  return E_INVALID_ARG;
}

using Effect = EffectRow<AudioEffectType, audio_effect_e>;
using Preset = EffectRow<AudioEffectPreset, audio_effect_preset_e>;

}  // namespace

result ConvertToPlatformEffect(AudioEffectType type, audio_effect_e& effect) noexcept {
  return LookUp(kEffects, &Effect::publicValue, type, &Effect::platformValue, effect);
}

result ConvertFromPlatformEffect(audio_effect_e effect, AudioEffectType& type) noexcept {
  return LookUp(kEffects, &Effect::platformValue, effect, &Effect::publicValue, type);
}

result ConvertToPlatformPreset(AudioEffectPreset preset,
                               audio_effect_preset_e& platformPreset) noexcept {
  return LookUp(kPresets, &Preset::publicValue, preset, &Preset::platformValue, platformPreset);
}

result ConvertFromPlatformPreset(audio_effect_preset_e platformPreset,
                                 AudioEffectPreset& preset) noexcept {
  return LookUp(kPresets, &Preset::platformValue, platformPreset, &Preset::publicValue, preset);
}

result ConvertPlayerError(int error) noexcept {
  switch (error) {
    case 0: return E_SUCCESS;
    case -22: return E_INVALID_ARG;
    case -12: return E_OUT_OF_MEMORY;
    case -38: return E_INVALID_OPERATION;
    case kInvalidPlayerState: return E_INVALID_STATE;
    default: return E_SYSTEM;
  }
}

}  // namespace Zelkora::Media
