/// \file
#pragma once

#include <Tizen/Base/Collection/IListT.h>
#include <Tizen/Base/Object.h>
#include <Zelkora/Media/Export.h>

namespace Tizen::Media {
class Player;
}

namespace Zelkora::Media {

class _AudioEffectorImpl;

/// An effect on a player's sound. The names are those of the host platform; the sound itself is the
/// player's.
enum AudioEffectType : int {
  AUDIO_EFFECT_BASS = 1,          ///< Low frequencies up or down.
  AUDIO_EFFECT_TREBLE = 2,        ///< High frequencies up or down.
  AUDIO_EFFECT_REVERB = 3,        ///< The sound of a room.
  AUDIO_EFFECT_STEREO_WIDTH = 4,  ///< Left and right further apart.
  AUDIO_EFFECT_DYNAMICS = 5,      ///< Quiet and loud closer together.
};

/// A named setting of a player's sound. The names are those of the host platform; the sound itself
/// is the player's.
enum AudioEffectPreset : int {
  AUDIO_EFFECT_PRESET_NORMAL = 0,  ///< The neutral one, which `ResetAllToDefault` selects.
  AUDIO_EFFECT_PRESET_POP = 1,
  AUDIO_EFFECT_PRESET_ROCK = 2,
  AUDIO_EFFECT_PRESET_DANCE = 3,
  AUDIO_EFFECT_PRESET_JAZZ = 4,
  AUDIO_EFFECT_PRESET_CLASSICAL = 5,
  AUDIO_EFFECT_PRESET_VOCAL = 6,
  AUDIO_EFFECT_PRESET_BASS_BOOST = 7,
  AUDIO_EFFECT_PRESET_TREBLE_BOOST = 8,
  AUDIO_EFFECT_PRESET_ACOUSTIC = 9,
  AUDIO_EFFECT_PRESET_ELECTRONIC = 10,
  AUDIO_EFFECT_PRESET_HIP_HOP = 11,
  AUDIO_EFFECT_PRESET_LATIN = 12,
  AUDIO_EFFECT_PRESET_METAL = 13,
  AUDIO_EFFECT_PRESET_COUNTRY = 14,
  AUDIO_EFFECT_PRESET_RHYTHM_AND_BLUES = 15,
  AUDIO_EFFECT_PRESET_CONCERT_HALL = 16,
  AUDIO_EFFECT_PRESET_SPEECH = 17,
  AUDIO_EFFECT_PRESET_LOUDNESS = 18,
  AUDIO_EFFECT_PRESET_SMALL_SPEAKERS = 19,
};

/// Changes the sound of a media player: effects with a level each, and presets.
///
/// The device must have the feature "/tizen/feature/audio_effector"; no privilege is needed. Levels
/// and the chosen preset live in the player and are asked for at every call.
///
/// On the host platform levels are: bass and treble -12 to 12 dB; reverb, stereo width and dynamics
/// 0 to 100 %; all 0 by default. A preset and the levels act together: a level that is changed by
/// hand leaves the preset selected, and a preset leaves the levels.
///
/// \code
/// AudioEffector effector;
/// if (effector.Construct(player) == E_SUCCESS) {
///   effector.SetEffectPreset(AUDIO_EFFECT_PRESET_ROCK);
///   effector.SetEffectLevel(AUDIO_EFFECT_BASS, 6);
/// }
/// \endcode
///
/// Using an effector before `Construct` has succeeded is a programming error, reported by an
/// assertion. Where assertions return, the operation then does nothing and returns
/// `E_INVALID_STATE`, or null in place of a list; one that clears the last result has done that.
///
/// Results of the player, named "the player's refusal" below: `E_INVALID_ARG`, `E_OUT_OF_MEMORY`,
/// `E_INVALID_OPERATION`, `E_INVALID_STATE`, `E_SYSTEM`. Every failure is logged, but for the one
/// that `ResetAllToDefault` names.
///
/// Ownership: the effector keeps the player's native handle without owning it. The player must
/// outlive every use of the effector; destroying the effector leaves the player and its sound as
/// they are.
///
/// Threads: work is done on the caller's thread. Calls of one effector may overlap as far as the
/// player permits it, but not with `Construct` or with the effector's destruction.
class ZELKORA_MEDIA_API AudioEffector : public Tizen::Base::Object {
 public:
  /// Makes an effector that is bound to no player: `Construct` must succeed before use.
  AudioEffector();

  /// Releases the effector.
  ~AudioEffector() override;

  /// Binds the effector to a player for the rest of its life. After a failure the effector is as
  /// before, and `Construct` may be called again; after a success that is a programming error,
  /// reported by an assertion.
  ///
  /// \param player a constructed player; a file need not be open yet
  /// \return what is then also the last result, on success too:
  /// - `E_SUCCESS`
  /// - `E_UNSUPPORTED_OPERATION` when the device lacks the feature
  /// - `E_UNSUPPORTED_OPERATION` when the player supports no effect and no preset; a list that
  ///   can't be had counts as empty
  /// - another code of the feature's lookup when that fails, unchanged
  /// - `E_OUT_OF_MEMORY` for want of memory, and when the player was never constructed
  /// - `E_INVALID_STATE` where assertions return: when the player has no native handle; when the
  ///   effector is constructed already, which leaves the last result as it was
  result Construct(Tizen::Media::Player& player);

  /// Lists the effects that the player supports, in the player's order.
  ///
  /// Success leaves the last result as it was, unless the player reports an effect that isn't known
  /// here: that is left out, logged, and makes the last result `E_INVALID_ARG`. An entry for which
  /// memory is short is left out and logged, no more.
  ///
  /// \return a new list, possibly empty, which the caller deletes; or null, with the last result
  /// - `E_OUT_OF_MEMORY`
  /// - the player's refusal
  Tizen::Base::Collection::IListT<AudioEffectType>* GetSupportedEffectListN() const;

  /// Lists the presets that the player supports, like the effects.
  Tizen::Base::Collection::IListT<AudioEffectPreset>* GetSupportedEffectPresetListN() const;

  /// Sets an effect's level.
  /// \param type the effect
  /// \param level the level, handed to the player unchanged, which judges it
  /// \return what is then also the last result:
  /// - `E_SUCCESS`
  /// - `E_INVALID_ARG` for an unknown effect
  /// - the player's refusal
  result SetEffectLevel(AudioEffectType type, int level);

  /// Reads an effect's level.
  /// \param type the effect
  /// \param level receives the level; untouched for an unknown effect; after the player's refusal
  /// what the player left in it
  /// \return as of `SetEffectLevel`
  result GetEffectLevel(AudioEffectType type, int& level) const;

  /// Reads the range of an effect's level.
  /// \param type the effect
  /// \param minValue receives the lowest level, on failure like the level of `GetEffectLevel`
  /// \param maxValue receives the highest level, likewise
  /// \return as of `SetEffectLevel`
  result GetEffectLevelRange(AudioEffectType type, int& minValue, int& maxValue) const;

  /// Puts every effect back to its default, then selects `AUDIO_EFFECT_PRESET_NORMAL`. The first
  /// step that fails ends it; what was put back before stays so.
  /// \return
  /// - `E_SUCCESS`, which is also the last result
  /// - `E_INVALID_ARG`, also the last result, when an effect can't be put back, whatever the reason
  /// - the player's refusal when the preset can't be selected, which isn't logged; the last result
  ///   is `E_SUCCESS`
  result ResetAllToDefault();

  /// Selects a preset.
  /// \return what is then also the last result:
  /// - `E_SUCCESS`
  /// - `E_INVALID_ARG` for an unknown preset
  /// - the player's refusal
  result SetEffectPreset(AudioEffectPreset preset);

 private:
  _AudioEffectorImpl* __pAudioEffectorImpl;
};

}  // namespace Zelkora::Media
