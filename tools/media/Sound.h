#pragma once

#include "base/Names.h"

#include <Tizen/Media/Player.h>
#include <Zelkora/Media/AudioEffector.h>

#include <functional>
#include <string>
#include <vector>

namespace CommandLine {

inline constexpr Named<Zelkora::Media::AudioEffectType> kEffects[] = {
    {"bass", Zelkora::Media::AUDIO_EFFECT_BASS},
    {"treble", Zelkora::Media::AUDIO_EFFECT_TREBLE},
    {"reverb", Zelkora::Media::AUDIO_EFFECT_REVERB},
    {"stereo-width", Zelkora::Media::AUDIO_EFFECT_STEREO_WIDTH},
    {"dynamics", Zelkora::Media::AUDIO_EFFECT_DYNAMICS},
};

inline constexpr Named<Zelkora::Media::AudioEffectPreset> kPresets[] = {
    {"normal", Zelkora::Media::AUDIO_EFFECT_PRESET_NORMAL},
    {"pop", Zelkora::Media::AUDIO_EFFECT_PRESET_POP},
    {"rock", Zelkora::Media::AUDIO_EFFECT_PRESET_ROCK},
    {"dance", Zelkora::Media::AUDIO_EFFECT_PRESET_DANCE},
    {"jazz", Zelkora::Media::AUDIO_EFFECT_PRESET_JAZZ},
    {"classical", Zelkora::Media::AUDIO_EFFECT_PRESET_CLASSICAL},
    {"vocal", Zelkora::Media::AUDIO_EFFECT_PRESET_VOCAL},
    {"bass-boost", Zelkora::Media::AUDIO_EFFECT_PRESET_BASS_BOOST},
    {"treble-boost", Zelkora::Media::AUDIO_EFFECT_PRESET_TREBLE_BOOST},
    {"acoustic", Zelkora::Media::AUDIO_EFFECT_PRESET_ACOUSTIC},
    {"electronic", Zelkora::Media::AUDIO_EFFECT_PRESET_ELECTRONIC},
    {"hip-hop", Zelkora::Media::AUDIO_EFFECT_PRESET_HIP_HOP},
    {"latin", Zelkora::Media::AUDIO_EFFECT_PRESET_LATIN},
    {"metal", Zelkora::Media::AUDIO_EFFECT_PRESET_METAL},
    {"country", Zelkora::Media::AUDIO_EFFECT_PRESET_COUNTRY},
    {"rhythm-and-blues", Zelkora::Media::AUDIO_EFFECT_PRESET_RHYTHM_AND_BLUES},
    {"concert-hall", Zelkora::Media::AUDIO_EFFECT_PRESET_CONCERT_HALL},
    {"speech", Zelkora::Media::AUDIO_EFFECT_PRESET_SPEECH},
    {"loudness", Zelkora::Media::AUDIO_EFFECT_PRESET_LOUDNESS},
    {"small-speakers", Zelkora::Media::AUDIO_EFFECT_PRESET_SMALL_SPEAKERS},
};

/// A player whose sound can be changed. Operations throw a `Failure` when they can't be done.
class Sound {
 public:
  using Effect = Zelkora::Media::AudioEffectType;
  using Preset = Zelkora::Media::AudioEffectPreset;

  /// A change of the sound.
  struct Change {
    std::string text;  // "bass 6"
    std::function<result(Zelkora::Media::AudioEffector&)> apply;
    std::string preset;  // the one that is current then; "" for the one before
  };

  struct Level {
    int now = 0;
    int min = 0;
    int max = 0;
  };

  Sound();

  void Open(const std::string& file);

  std::vector<Effect> Effects() const;
  std::vector<Preset> Presets() const;
  Level LevelOf(Effect effect) const;

  void Apply(const std::vector<Change>& changes);

  void Play();
  void Pause();
  long Position() const;  // in milliseconds
  long Duration() const;  // in milliseconds

  /// Writes the sound of the open file to a WAV file.
  void Render(const std::string& file) const;

 private:
  Tizen::Media::Player player_;  // before the effector, which needs it as long as it lives
  Zelkora::Media::AudioEffector effector_;
};

}  // namespace CommandLine
