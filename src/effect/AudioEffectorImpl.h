/// \file
#pragma once

#include <Tizen/Base/Object.h>
#include <Zelkora/Media/AudioEffector.h>
#include <player.h>

namespace Tizen::Media {
class Player;
class _PlayerImpl;
}  // namespace Tizen::Media

namespace Zelkora::Media {

/// Calls the native player's effect functions.
class _AudioEffectorImpl : public Tizen::Base::Object {
 public:
  _AudioEffectorImpl() = default;

  result Construct(Tizen::Media::Player& player);

  Tizen::Base::Collection::IListT<AudioEffectType>* GetSupportedEffectListN() const;
  Tizen::Base::Collection::IListT<AudioEffectPreset>* GetSupportedEffectPresetListN() const;

  result SetEffectLevel(AudioEffectType type, int level);
  result GetEffectLevel(AudioEffectType type, int& level) const;
  result GetEffectLevelRange(AudioEffectType type, int& minValue, int& maxValue) const;
  result ResetAllToDefault();
  result SetEffectPreset(AudioEffectPreset preset);

 private:
  // Called by the player on the thread that asks for a list; the user data is the list.
  static bool PlayerAudioEffectSupportedEffectCallBack(audio_effect_e effect, void* userData);
  static bool PlayerAudioEffectSupportedPresetCallBack(audio_effect_preset_e platformPreset,
                                                       void* userData);

  bool IsAudioEffectSupported() const;

  // Both the player's own.
  Tizen::Media::_PlayerImpl* __pPlayerImpl = nullptr;
  player_h __hPlayer = nullptr;
};

}  // namespace Zelkora::Media
