/// \file
/// The three managers as tables: what tells them apart, and each of their operations as a row.
#pragma once

#include "LogCapture.h"

#include <Zelkora/Media/AudioSessionManager.h>
#include <Zelkora/Media/AudioVolumeManager.h>
#include <Zelkora/Media/IAudioVolumeEventListener.h>
#include <Zelkora/Media/VoipAudioSessionManager.h>

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <type_traits>
#include <vector>

/// An operation of a manager. Called one after the other, all of a manager's operations succeed.
template <typename Manager>
struct Operation {
  std::string name;
  std::string platformCall;  ///< the one call that it makes behind the gate, "" for none
  bool givesValue;           ///< whether it gives a value; else it gives a result
  std::function<std::int64_t(Manager&)> call;

  /// \return what the operation gives when the gate refuses it with \p r
  std::int64_t Refused(result r) const { return givesValue ? -1 : std::int64_t{r}; }

  /// \return the name of the platform's function that is called
  std::string Function() const { return platformCall.substr(0, platformCall.find('(')); }
};

/// The row of an operation that is called with \p arguments.
template <typename Manager, typename Function, typename... Arguments>
Operation<Manager> Row(const std::string& name, const std::string& platformCall, Function function,
                       Arguments... arguments) {
  using Value = std::invoke_result_t<Function, Manager&, Arguments&...>;
  return {name, platformCall, !std::is_same_v<Value, result>, [=](Manager& manager) mutable {
            return static_cast<std::int64_t>(std::invoke(function, manager, arguments...));
          }};
}

using Volume = Zelkora::Media::AudioVolumeManager;

/// A sound category of the volume manager.
struct SoundCategory {
  const char* name;
  int soundType;
  result (Volume::*getRange)(int&, int&) const;
  result (Volume::*setLevel)(int);
  int (Volume::*getLevel)() const;
};

inline constexpr SoundCategory kSoundCategories[] = {
    {"System", 0, &Volume::GetSystemVolumeRange, &Volume::SetSystemVolumeLevel,
     &Volume::GetCurrentSystemVolumeLevel},
    {"Notification", 1, &Volume::GetNotificationVolumeRange, &Volume::SetNotificationVolumeLevel,
     &Volume::GetCurrentNotificationVolumeLevel},
    {"Alarm", 2, &Volume::GetAlarmVolumeRange, &Volume::SetAlarmVolumeLevel,
     &Volume::GetCurrentAlarmVolumeLevel},
    {"Ringtone", 3, &Volume::GetRingtoneVolumeRange, &Volume::SetRingtoneVolumeLevel,
     &Volume::GetCurrentRingtoneVolumeLevel},
    {"Media", 4, &Volume::GetMediaVolumeRange, &Volume::SetMediaVolumeLevel,
     &Volume::GetCurrentMediaVolumeLevel},
    {"Call", 5, &Volume::GetCallVolumeRange, &Volume::SetCallVolumeLevel,
     &Volume::GetCurrentCallVolumeLevel},
};

/// What a manager is known by, and its operations.
template <typename Manager>
struct Facts;

template <>
struct Facts<Zelkora::Media::AudioSessionManager> {
  using Manager = Zelkora::Media::AudioSessionManager;
  static constexpr char kName[] = "AudioSessionManager";
  static constexpr char kPrivilege[] = "audiomanager.session";
  static constexpr char kManagerNotCreated[] = "  The object is not created.";
  static std::vector<std::string> Callbacks() { return {"session_interrupted"}; }

  static std::vector<Operation<Manager>> Operations() {
    return {
        Row<Manager>("SetAudioSessionEventListener", "", &Manager::SetAudioSessionEventListener,
                     nullptr),
        Row<Manager>("SetMode", "sound_manager_set_session_type(1)", &Manager::SetMode,
                     Zelkora::Media::AUDIO_SESSION_MODE_ALARM),
        Row<Manager>("GetMode", "sound_manager_get_session_type()", &Manager::GetMode),
    };
  }
};

template <>
struct Facts<Zelkora::Media::VoipAudioSessionManager> {
  using Manager = Zelkora::Media::VoipAudioSessionManager;
  static constexpr char kName[] = "VoipAudioSessionManager";
  static constexpr char kPrivilege[] = "audiomanager.voipsession";
  static constexpr char kManagerNotCreated[] = "\tThe object is not created.";
  static std::vector<std::string> Callbacks() { return {}; }

  static std::vector<Operation<Manager>> Operations() {
    return {
        Row<Manager>("EnterCallSession", "sound_manager_call_session_create(1)",
                     &Manager::EnterCallSession),
        Row<Manager>("SetCallSessionMode", "sound_manager_call_session_set_mode(1, 2)",
                     &Manager::SetCallSessionMode, Zelkora::Media::VOIP_AUDIO_SESSION_MODE_MEDIA),
        Row<Manager>("GetCallSessionMode", "sound_manager_call_session_get_mode(1)",
                     &Manager::GetCallSessionMode),
        Row<Manager>("ExitCallSession", "sound_manager_call_session_destroy(1)",
                     &Manager::ExitCallSession),
    };
  }
};

template <>
struct Facts<Volume> {
  static constexpr char kName[] = "AudioVolumeManager";
  static constexpr char kPrivilege[] = "audiomanager.volume";
  static constexpr char kManagerNotCreated[] = "  The object is not created.";
  static std::vector<std::string> Callbacks() { return {"volume_changed", "muteall_changed"}; }

  static std::vector<Operation<Volume>> Operations() {
    static Zelkora::Media::IAudioVolumeEventListener listener;
    std::vector<Operation<Volume>> rows = {
        Row<Volume>("AddAudioVolumeEventListener", "_Event::AddListener()",
                    &Volume::AddAudioVolumeEventListener, std::ref(listener)),
        Row<Volume>("RemoveAudioVolumeEventListener", "_Event::RemoveListener()",
                    &Volume::RemoveAudioVolumeEventListener, std::ref(listener)),
        Row<Volume>("MuteAll", "sound_manager_set_muteall(true)", &Volume::MuteAll),
        Row<Volume>("UnmuteAll", "sound_manager_set_muteall(false)", &Volume::UnmuteAll),
        Row<Volume>("GetMuteStatus", "sound_manager_get_muteall()", &Volume::GetMuteStatus),
    };
    for (const SoundCategory& category : kSoundCategories) {
      const std::string name = category.name;
      const std::string type = std::to_string(category.soundType);
      rows.push_back(Row<Volume>("Get" + name + "VolumeRange",
                                 "sound_manager_get_max_volume(" + type + ")", category.getRange, 7,
                                 7));
      rows.push_back(Row<Volume>("Set" + name + "VolumeLevel",
                                 "sound_manager_set_volume(" + type + ", 9)", category.setLevel,
                                 9));
      rows.push_back(Row<Volume>("GetCurrent" + name + "VolumeLevel",
                                 "sound_manager_get_volume(" + type + ")", category.getLevel));
    }
    return rows;
  }
};

using Managers = testing::Types<Zelkora::Media::AudioSessionManager,
                                Zelkora::Media::VoipAudioSessionManager, Volume>;

/// Names typed tests after the manager.
struct ManagerNames {
  template <typename Manager>
  static std::string GetName(int) {
    return Facts<Manager>::kName;
  }
};

/// The records of the gates' questions.
template <typename Manager>
std::string PrivilegeQuery() {
  return "AccessController::CheckPrivilege(http://developer.zelkora.example/tizen/privilege/" +
         std::string(Facts<Manager>::kPrivilege) + ")";
}
inline constexpr char kFeatureQuery[] =
    "SystemInfo::GetValue(http://developer.zelkora.example/tizen/feature/audio_manager)";

inline constexpr char kDenied[] =
    "[E_PRIVILEGE_DENIED] This application does not have the privilege to call this method.";

/// Codes of the sound manager, how "0x%x" prints them, and the results that they stand for.
inline constexpr struct {
  int code;
  const char* hex;
  result r;
} kPlatformFailures[] = {
    {-12, "0xfffffff4", E_OUT_OF_MEMORY},
    {-22, "0xffffffea", E_INVALID_ARG},
    {-38, "0xffffffda", E_INVALID_OPERATION},
    {-1, "0xffffffff", E_SYSTEM},
};

/// \return the text with the result's name in its brackets, as "[%s]..." is filled.
inline std::string Named(result r, const std::string& text) {
  return "[" + std::string(GetErrorMessage(r)) + "]" + text;
}

inline std::string SysNamed(result r, const std::string& text) { return Sys(r, Named(r, text)); }
