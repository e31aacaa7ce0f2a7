/// \file
/// Every public operation of the five classes, by class and name.
#pragma once

#include "Managers.h"

#include <Tizen/Media/Player.h>
#include <Zelkora/Media/AudioEffector.h>
#include <Zelkora/Media/VideoKeyFrameSeeker.h>

#include <map>
#include <memory>
#include <optional>

namespace Zelkora::Media {

/// \name What operations are called on and with
/// @{
template <typename Manager>
inline Manager* instance = nullptr;
inline std::optional<Tizen::Media::Player> player;
inline std::optional<AudioEffector> effector;
inline std::optional<VideoKeyFrameSeeker> seeker;
inline struct SilentListener : IAudioSessionEventListener {
  void OnAudioSessionInterruptStarted() override {}
  void OnAudioSessionInterruptFinished() override {}
} silentListener;
inline IAudioSessionEventListener* const sessionListener = &silentListener;
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

/// \return a call of \p operation on what \p pointer and with what \p arguments hold by then
template <typename Pointer, typename Function, typename... Arguments>
std::function<Answer()> On(Pointer& pointer, Function operation, Arguments&... arguments) {
  return [operation, &pointer, &arguments...] {
    return std::invoke(operation, *pointer, arguments...);
  };
}

template <typename Manager>
Answer GetInstance() {
  return instance<Manager> = Manager::GetInstance();
}

/// \return "Media"
inline std::string NameInOperations(const Category& category) {
  std::string name = category.name;
  name[0] = static_cast<char>(std::toupper(name[0]));
  return name;
}

inline const std::map<std::string, std::function<Answer()>> kOperations = [] {
  using Effector = AudioEffector;
  const std::string sessions = "AudioSessionManager::", calls = "VoipAudioSessionManager::",
                    volumes = "AudioVolumeManager::", effectors = "AudioEffector::";
  std::map<std::string, std::function<Answer()>> all = {
      {sessions + "GetInstance", GetInstance<Session>},
      {sessions + "SetAudioSessionEventListener",
       On(instance<Session>, &Session::SetAudioSessionEventListener, sessionListener)},
      {sessions + "SetMode", On(instance<Session>, &Session::SetMode, sessionMode)},
      {sessions + "GetMode", On(instance<Session>, &Session::GetMode)},
      {calls + "GetInstance", GetInstance<Call>},
      {calls + "EnterCallSession", On(instance<Call>, &Call::EnterCallSession)},
      {calls + "SetCallSessionMode", On(instance<Call>, &Call::SetCallSessionMode, callMode)},
      {calls + "GetCallSessionMode", On(instance<Call>, &Call::GetCallSessionMode)},
      {calls + "ExitCallSession", On(instance<Call>, &Call::ExitCallSession)},
      {volumes + "GetInstance", GetInstance<Volume>},
      {volumes + "AddAudioVolumeEventListener",
       On(instance<Volume>, &Volume::AddAudioVolumeEventListener, volumeListener)},
      {volumes + "RemoveAudioVolumeEventListener",
       On(instance<Volume>, &Volume::RemoveAudioVolumeEventListener, volumeListener)},
      {volumes + "MuteAll", On(instance<Volume>, &Volume::MuteAll)},
      {volumes + "UnmuteAll", On(instance<Volume>, &Volume::UnmuteAll)},
      {volumes + "GetMuteStatus", On(instance<Volume>, &Volume::GetMuteStatus)},
      {effectors + "Construct", [] { return effector->Construct(*player); }},
      {effectors + "GetSupportedEffectListN", On(effector, &Effector::GetSupportedEffectListN)},
      {effectors + "GetSupportedEffectPresetListN",
       On(effector, &Effector::GetSupportedEffectPresetListN)},
      {effectors + "SetEffectLevel", On(effector, &Effector::SetEffectLevel, effect, level)},
      {effectors + "GetEffectLevel", On(effector, &Effector::GetEffectLevel, effect, low)},
      {effectors + "GetEffectLevelRange",
       On(effector, &Effector::GetEffectLevelRange, effect, low, high)},
      {effectors + "ResetAllToDefault", On(effector, &Effector::ResetAllToDefault)},
      {effectors + "SetEffectPreset", On(effector, &Effector::SetEffectPreset, preset)},
      {"VideoKeyFrameSeeker::Construct", [] { return seeker->Construct(*player); }},
      {"VideoKeyFrameSeeker::SeekTo", On(seeker, &VideoKeyFrameSeeker::SeekTo, position)},
  };
  for (const Category& of : kCategories) {
    const std::string name = NameInOperations(of);
    all[volumes + "Get" + name + "VolumeRange"] = On(instance<Volume>, of.range, low, high);
    all[volumes + "Set" + name + "VolumeLevel"] = On(instance<Volume>, of.setLevel, level);
    all[volumes + "GetCurrent" + name + "VolumeLevel"] = On(instance<Volume>, of.level);
  }
  return all;
}();

/// Makes what an operation is called on: nothing that itself makes.
inline void Prepare(const std::string& operation) {
  player.emplace().Construct();
  effector.emplace();
  seeker.emplace();
  if (operation == "GetInstance") return;
  instance<Session> = Session::GetInstance();
  instance<Call> = Call::GetInstance();
  instance<Volume> = Volume::GetInstance();
  if (operation == "Construct") return;
  effector->Construct(*player);
  seeker->Construct(*player);
}

/// Makes the state in which an operation succeeds.
inline void MakeReady(const std::string& operation) {
  const bool isCall = operation.find("CallSession") != operation.npos;
  if (isCall && operation != "EnterCallSession") instance<Call>->EnterCallSession();
  if (operation == "SeekTo") player->OpenFile("movie");
  if (operation == "RemoveAudioVolumeEventListener") {
    kOperations.at("AudioVolumeManager::AddAudioVolumeEventListener")();
  }
}

}  // namespace Zelkora::Media
