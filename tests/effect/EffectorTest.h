/// \file
#pragma once

#include "support/Allocations.h"
#include "support/LibraryTest.h"

#include <Tizen/Media/Player.h>
#include <Zelkora/Media/AudioEffector.h>

#include <climits>

inline constexpr char kNotYet[] = "Not yet constructed! Construct() should be called before use";
inline constexpr char kUnknownEffect[] =
    "[E_INVALID_ARG] Invalid argument is used. Unsupported Audio Effect type.";
inline constexpr char kUnknownPreset[] =
    "[E_INVALID_ARG] Invalid argument is used. Unsupported Audio Preset type.";

/// What the operations that give a list call and log.
struct ListTexts {
  std::string type, operation, function, callback, unknown;

  std::string Signature(const std::string& className) const {
    return "Tizen::Base::Collection::IListT<Zelkora::Media::" + type +
           ">* Zelkora::Media::" + className + "::" + operation + "() const";
  }
  std::string Call() const { return function + "()"; }
  std::string NoMemory() const {
    return App(Signature("_AudioEffectorImpl"), "[E_OUT_OF_MEMORY] Memory allocation failed.");
  }
  std::string Failure(result r) const {
    return App(Signature("_AudioEffectorImpl"),
               Named(r, " Failed to perform " + function + " operation."));
  }
  std::string Unknown() const {
    return App("static bool Zelkora::Media::_AudioEffectorImpl::" + callback, unknown);
  }
};
inline const ListTexts kEffects = {
    "AudioEffectType", "GetSupportedEffectListN", "player_audio_effect_foreach_supported_effect",
    "PlayerAudioEffectSupportedEffectCallBack(audio_effect_e, void*)", kUnknownEffect};
inline const ListTexts kPresets = {
    "AudioEffectPreset", "GetSupportedEffectPresetListN",
    "player_audio_effect_foreach_supported_preset",
    "PlayerAudioEffectSupportedPresetCallBack(audio_effect_preset_e, void*)", kUnknownPreset};

/// An effector that isn't constructed, and a player that is. The platform's calls are recorded.
class EffectorTest : public LibraryTest {
 protected:
  EffectorTest() {
    EXPECT_EQ(player.Construct(), E_SUCCESS);
    Forget();
  }

  void Construct() {
    ASSERT_EQ(effector.Construct(player), E_SUCCESS);
    Forget();
  }

  Tizen::Media::Player player;
  Zelkora::Media::AudioEffector effector;
};
