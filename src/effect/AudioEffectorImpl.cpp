#include "AudioEffectorImpl.h"

#include "EffectTables.h"
#include "base/Assert.h"
#include "base/Log.h"

#include <Tizen/Base/Collection/ArrayListT.h>
#include <Tizen/Media/PlayerImpl.h>

#include <memory>
#include <new>

namespace Zelkora::Media {
namespace {

using Tizen::Base::Collection::ArrayListT;
using Tizen::Base::Collection::IListT;
using Tizen::Media::_PlayerImpl;

constexpr char kUnsupportedEffect[] =
    "[E_INVALID_ARG] Invalid argument is used. Unsupported Audio Effect type.";
constexpr char kUnsupportedPreset[] =
    "[E_INVALID_ARG] Invalid argument is used. Unsupported Audio Preset type.";

/// Fills a new list by one of the player's enumerations, which hands it to \p callback.
/// \return the list, or null, reported with \p failure
template <typename T, typename Value>
IListT<T>* MakeSupportedListN(int (*enumerate)(player_h, bool (*)(Value, void*), void*),
                              player_h hPlayer, bool (*callback)(Value, void*), const char* failure,
                              Signature caller) {
  std::unique_ptr<ArrayListT<T>> pList(new (std::nothrow) ArrayListT<T>);
  if (pList == nullptr) {
    FailTagged(E_OUT_OF_MEMORY, caller, "[E_OUT_OF_MEMORY] Memory allocation failed.");
    return nullptr;
  }
  const result r = ConvertPlayerError(enumerate(hPlayer, callback, pList.get()));
  if (r != E_SUCCESS) {
    FailTagged(r, caller, failure, GetErrorMessage(r));
    pList->RemoveAll();
    return nullptr;
  }
  return pList.release();
}

template <typename T>
bool HasEntries(const IListT<T>* pList) {
  return pList != nullptr && pList->GetCount() > 0;
}

}  // namespace

result _AudioEffectorImpl::Construct(Tizen::Media::Player& player) {
  __pPlayerImpl = _PlayerImpl::GetInstance(&player);
  if (__pPlayerImpl == nullptr) {
    return FailTagged(E_OUT_OF_MEMORY, __PRETTY_FUNCTION__,
                      "[E_OUT_OF_MEMORY] Memory allocation failed");
  }
  if (!APP_ASSERT(__pPlayerImpl->__hPlayer != null, kAppNotYetConstructed)) return E_INVALID_STATE;
  __hPlayer = __pPlayerImpl->__hPlayer;
  if (!IsAudioEffectSupported()) {
    FailTagged(E_UNSUPPORTED_OPERATION, __PRETTY_FUNCTION__,
               "[E_UNSUPPORTED_OPERATION] This feature is not supported in the current device.");
    __hPlayer = nullptr;
    return E_UNSUPPORTED_OPERATION;
  }
  return E_SUCCESS;
}

bool _AudioEffectorImpl::IsAudioEffectSupported() const {
  // Both are always asked for, whatever the first says. A list that can't be had counts as empty.
  const std::unique_ptr<IListT<AudioEffectType>> pEffects(GetSupportedEffectListN());
  const std::unique_ptr<IListT<AudioEffectPreset>> pPresets(GetSupportedEffectPresetListN());
  return HasEntries(pEffects.get()) || HasEntries(pPresets.get());
}

IListT<AudioEffectType>* _AudioEffectorImpl::GetSupportedEffectListN() const {
  return MakeSupportedListN<AudioEffectType>(
      player_audio_effect_foreach_supported_effect, __hPlayer,
      PlayerAudioEffectSupportedEffectCallBack,
      "[%s] Failed to perform player_audio_effect_foreach_supported_effect operation.",
      __PRETTY_FUNCTION__);
}

IListT<AudioEffectPreset>* _AudioEffectorImpl::GetSupportedEffectPresetListN() const {
  if (!APP_ASSERT(__hPlayer != null, kAppNotYetConstructed)) return nullptr;
  return MakeSupportedListN<AudioEffectPreset>(
      player_audio_effect_foreach_supported_preset, __hPlayer,
      PlayerAudioEffectSupportedPresetCallBack,
      "[%s] Failed to perform player_audio_effect_foreach_supported_preset operation.",
      __PRETTY_FUNCTION__);
}

bool _AudioEffectorImpl::PlayerAudioEffectSupportedEffectCallBack(audio_effect_e effect,
                                                                  void* userData) {
  AudioEffectType type;
  if (ConvertFromPlatformEffect(effect, type) == E_SUCCESS) {
    static_cast<ArrayListT<AudioEffectType>*>(userData)->Add(type);
  } else {
    FailTagged(E_INVALID_ARG, __PRETTY_FUNCTION__, kUnsupportedEffect);
  }
  return true;
}

bool _AudioEffectorImpl::PlayerAudioEffectSupportedPresetCallBack(
    audio_effect_preset_e platformPreset, void* userData) {
  AudioEffectPreset preset;
  if (ConvertFromPlatformPreset(platformPreset, preset) == E_SUCCESS) {
    static_cast<ArrayListT<AudioEffectPreset>*>(userData)->Add(preset);
  } else {
    FailTagged(E_INVALID_ARG, __PRETTY_FUNCTION__, kUnsupportedPreset);
  }
  return true;
}

result _AudioEffectorImpl::SetEffectLevel(AudioEffectType type, int level) {
  if (!APP_ASSERT(__hPlayer != null, kAppNotYetConstructed)) return E_INVALID_STATE;
  audio_effect_e effect;
  const result r = ConvertToPlatformEffect(type, effect);
  if (r != E_SUCCESS) return FailTagged(r, __PRETTY_FUNCTION__, kUnsupportedEffect);
  return ConvertPlayerError(player_audio_effect_set_value(__hPlayer, effect, level));
}

result _AudioEffectorImpl::GetEffectLevel(AudioEffectType type, int& level) const {
  if (!APP_ASSERT(__hPlayer != null, kAppNotYetConstructed)) return E_INVALID_STATE;
  audio_effect_e effect;
  const result r = ConvertToPlatformEffect(type, effect);
  if (r != E_SUCCESS) return FailTagged(r, __PRETTY_FUNCTION__, kUnsupportedEffect);
  return ConvertPlayerError(player_audio_effect_get_value(__hPlayer, effect, &level));
}

result _AudioEffectorImpl::GetEffectLevelRange(AudioEffectType type, int& minValue,
                                               int& maxValue) const {
  if (!APP_ASSERT(__hPlayer != null, kAppNotYetConstructed)) return E_INVALID_STATE;
  audio_effect_e effect;
  const result r = ConvertToPlatformEffect(type, effect);
  if (r != E_SUCCESS) return FailTagged(r, __PRETTY_FUNCTION__, kUnsupportedEffect);
  const int error = player_audio_effect_get_value_range(__hPlayer, effect, &minValue, &maxValue);
  AppLogTagInternal(kLogTag, __PRETTY_FUNCTION__, __LINE__,
                    "minValue is %d ,maxValue is %d and ret is %d after "
                    "player_audio_effect_get_value_range operation.",
                    minValue, maxValue, error);
  return ConvertPlayerError(error);
}

result _AudioEffectorImpl::ResetAllToDefault() {
  if (!APP_ASSERT(__hPlayer != null, kAppNotYetConstructed)) return E_INVALID_STATE;
  for (const auto& row : kEffects) {
    if (player_audio_effect_clear(__hPlayer, row.platformValue) != 0) {
      return FailTagged(E_INVALID_ARG, __PRETTY_FUNCTION__, kUnsupportedEffect);
    }
  }
  return ConvertPlayerError(player_audio_effect_set_preset(__hPlayer, kNeutralPlatformPreset));
}

result _AudioEffectorImpl::SetEffectPreset(AudioEffectPreset preset) {
  if (!APP_ASSERT(__hPlayer != null, kAppNotYetConstructed)) return E_INVALID_STATE;
  audio_effect_preset_e platformPreset;
  const result r = ConvertToPlatformPreset(preset, platformPreset);
  if (r != E_SUCCESS) return FailTagged(r, __PRETTY_FUNCTION__, kUnsupportedPreset);
  return ConvertPlayerError(player_audio_effect_set_preset(__hPlayer, platformPreset));
}

}  // namespace Zelkora::Media
