/// \file
/// Every public operation of the five classes, by class and name.
#pragma once

#include "managers/Listeners.h"

#include <Tizen/Media/Player.h>
#include <Zelkora/Media/AudioEffector.h>
#include <Zelkora/Media/VideoKeyFrameSeeker.h>

#include <map>
#include <memory>
#include <optional>

namespace Zelkora::Media {

/// \name What operations are called on and with
/// @{
inline Session* session = nullptr;
inline Call* call = nullptr;
inline Volume* volume = nullptr;
inline std::optional<Tizen::Media::Player> player;
inline std::optional<AudioEffector> effector;
inline std::optional<VideoKeyFrameSeeker> seeker;
inline SessionListener sessionListener;
inline IAudioVolumeEventListener volumeListener;
inline AudioSessionMode sessionMode = AUDIO_SESSION_MODE_MEDIA_MIX;
inline VoipAudioSessionMode callMode = VOIP_AUDIO_SESSION_MODE_MEDIA;
inline AudioEffectType effect = AUDIO_EFFECT_BASS;
inline AudioEffectPreset preset = AUDIO_EFFECT_PRESET_ROCK;
inline int level = 9, low = 0, high = 0;
inline long position = 4200;
/// @}

/// What an operation gives: a result, a value, or whether there is an object. A list is deleted.
struct Answer {
  template <typename Given>
  Answer(Given given) : isResult(std::is_same_v<Given, result>) {
    if constexpr (std::is_pointer_v<Given>) {
      isObject = true;
      value = given != nullptr;
      if constexpr (!std::is_convertible_v<Given, const Tizen::Base::Object*>) delete given;
    } else {
      value = static_cast<std::int64_t>(given);
    }
  }

  std::string Text() const {
    if (isObject) return value == 0 ? "null" : "a list";  // of objects, only lists are told
    return isResult ? GetErrorMessage(result(value)) : std::to_string(value);
  }
  /// \return the result, which is the last one unless it was given
  result Result() const { return isResult ? result(value) : GetLastResult(); }

  bool isResult, isObject = false;
  std::int64_t value;
};

/// \return "Media"
inline std::string NameInOperations(const Category& category) {
  std::string name = category.name;
  name[0] = static_cast<char>(std::toupper(name[0]));
  return name;
}

inline const std::map<std::string, std::function<Answer()>> kOperations = [] {
  const std::string sessions = "AudioSessionManager::", calls = "VoipAudioSessionManager::",
                    volumes = "AudioVolumeManager::", effectors = "AudioEffector::";
  std::map<std::string, std::function<Answer()>> all = {
      {sessions + "GetInstance", [] { return session = Session::GetInstance(); }},
      {sessions + "SetAudioSessionEventListener",
       [] { return session->SetAudioSessionEventListener(&sessionListener); }},
      {sessions + "SetMode", [] { return session->SetMode(sessionMode); }},
      {sessions + "GetMode", [] { return session->GetMode(); }},
      {calls + "GetInstance", [] { return call = Call::GetInstance(); }},
      {calls + "EnterCallSession", [] { return call->EnterCallSession(); }},
      {calls + "SetCallSessionMode", [] { return call->SetCallSessionMode(callMode); }},
      {calls + "GetCallSessionMode", [] { return call->GetCallSessionMode(); }},
      {calls + "ExitCallSession", [] { return call->ExitCallSession(); }},
      {volumes + "GetInstance", [] { return volume = Volume::GetInstance(); }},
      {volumes + "AddAudioVolumeEventListener",
       [] { return volume->AddAudioVolumeEventListener(volumeListener); }},
      {volumes + "RemoveAudioVolumeEventListener",
       [] { return volume->RemoveAudioVolumeEventListener(volumeListener); }},
      {volumes + "MuteAll", [] { return volume->MuteAll(); }},
      {volumes + "UnmuteAll", [] { return volume->UnmuteAll(); }},
      {volumes + "GetMuteStatus", [] { return volume->GetMuteStatus(); }},
      {effectors + "Construct", [] { return effector->Construct(*player); }},
      {effectors + "GetSupportedEffectListN", [] { return effector->GetSupportedEffectListN(); }},
      {effectors + "GetSupportedEffectPresetListN",
       [] { return effector->GetSupportedEffectPresetListN(); }},
      {effectors + "SetEffectLevel", [] { return effector->SetEffectLevel(effect, level); }},
      {effectors + "GetEffectLevel", [] { return effector->GetEffectLevel(effect, low); }},
      {effectors + "GetEffectLevelRange",
       [] { return effector->GetEffectLevelRange(effect, low, high); }},
      {effectors + "ResetAllToDefault", [] { return effector->ResetAllToDefault(); }},
      {effectors + "SetEffectPreset", [] { return effector->SetEffectPreset(preset); }},
      {"VideoKeyFrameSeeker::Construct", [] { return seeker->Construct(*player); }},
      {"VideoKeyFrameSeeker::SeekTo", [] { return seeker->SeekTo(position); }},
  };
  for (const Category& of : kCategories) {
    const std::string name = NameInOperations(of);
    all[volumes + "Get" + name + "VolumeRange"] = [&of] { return (volume->*of.range)(low, high); };
    all[volumes + "Set" + name + "VolumeLevel"] = [&of] { return (volume->*of.setLevel)(level); };
    all[volumes + "GetCurrent" + name + "VolumeLevel"] = [&of] { return (volume->*of.level)(); };
  }
  return all;
}();

/// Makes what an operation is called on: nothing that itself makes.
inline void Prepare(const std::string& operation) {
  player.emplace().Construct();
  effector.emplace();
  seeker.emplace();
  if (operation == "GetInstance") return;
  session = Session::GetInstance();
  call = Call::GetInstance();
  volume = Volume::GetInstance();
  if (operation == "Construct") return;
  effector->Construct(*player);
  seeker->Construct(*player);
}

/// Makes the state in which an operation succeeds.
inline void MakeReady(const std::string& operation) {
  const bool isCall = operation.find("CallSession") != operation.npos;
  if (isCall && operation != "EnterCallSession") call->EnterCallSession();
  if (operation == "SeekTo") player->OpenFile("movie");
  if (operation == "RemoveAudioVolumeEventListener") {
    kOperations.at("AudioVolumeManager::AddAudioVolumeEventListener")();
  }
}

}  // namespace Zelkora::Media
