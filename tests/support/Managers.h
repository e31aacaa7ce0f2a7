/// \file
/// The three managers as tables: what tells them apart, and each of their operations as a row.
#pragma once

#include "LibraryTest.h"

#include <Zelkora/Media/AudioSessionManager.h>
#include <Zelkora/Media/AudioVolumeManager.h>
#include <Zelkora/Media/IAudioSessionEventListener.h>
#include <Zelkora/Media/IAudioVolumeEventListener.h>
#include <Zelkora/Media/VoipAudioSessionManager.h>

#include <functional>
#include <type_traits>

namespace Zelkora::Media {

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

using Session = AudioSessionManager;
using Call = VoipAudioSessionManager;
using Volume = AudioVolumeManager;

/// A sound category of the volume manager.
struct SoundCategory {
  std::string name;
  int soundType;
  result (Volume::*getRange)(int&, int&) const;
  result (Volume::*setLevel)(int);
  int (Volume::*getLevel)() const;
};

inline const SoundCategory kSoundCategories[] = {
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
struct Facts<Session> {
  static constexpr char kName[] = "AudioSessionManager";
  static constexpr char kPrivilege[] = "audiomanager.session";
  static constexpr char kManagerNotCreated[] = "  The object is not created.";
  static Lines Callbacks() { return {"session_interrupted"}; }

  static std::vector<Operation<Session>> Operations() {
    return {
        Row<Session>("SetAudioSessionEventListener", "", &Session::SetAudioSessionEventListener,
                     nullptr),
        Row<Session>("SetMode", "sound_manager_set_session_type(1)", &Session::SetMode,
                     AUDIO_SESSION_MODE_ALARM),
        Row<Session>("GetMode", "sound_manager_get_session_type()", &Session::GetMode),
    };
  }
};

template <>
struct Facts<Call> {
  static constexpr char kName[] = "VoipAudioSessionManager";
  static constexpr char kPrivilege[] = "audiomanager.voipsession";
  static constexpr char kManagerNotCreated[] = "\tThe object is not created.";
  static Lines Callbacks() { return {}; }

  static std::vector<Operation<Call>> Operations() {
    return {
        Row<Call>("EnterCallSession", "sound_manager_call_session_create(1)",
                  &Call::EnterCallSession),
        Row<Call>("SetCallSessionMode", "sound_manager_call_session_set_mode(1, 2)",
                  &Call::SetCallSessionMode, VOIP_AUDIO_SESSION_MODE_MEDIA),
        Row<Call>("GetCallSessionMode", "sound_manager_call_session_get_mode(1)",
                  &Call::GetCallSessionMode),
        Row<Call>("ExitCallSession", "sound_manager_call_session_destroy(1)",
                  &Call::ExitCallSession),
    };
  }
};

template <>
struct Facts<Volume> {
  static constexpr char kName[] = "AudioVolumeManager";
  static constexpr char kPrivilege[] = "audiomanager.volume";
  static constexpr char kManagerNotCreated[] = "  The object is not created.";
  static Lines Callbacks() { return {"volume_changed", "muteall_changed"}; }

  static std::vector<Operation<Volume>> Operations() {
    static IAudioVolumeEventListener listener;
    std::vector<Operation<Volume>> rows = {
        Row<Volume>("AddAudioVolumeEventListener", "_Event::AddListener()",
                    &Volume::AddAudioVolumeEventListener, std::ref(listener)),
        Row<Volume>("RemoveAudioVolumeEventListener", "_Event::RemoveListener()",
                    &Volume::RemoveAudioVolumeEventListener, std::ref(listener)),
        Row<Volume>("MuteAll", "sound_manager_set_muteall(true)", &Volume::MuteAll),
        Row<Volume>("UnmuteAll", "sound_manager_set_muteall(false)", &Volume::UnmuteAll),
        Row<Volume>("GetMuteStatus", "sound_manager_get_muteall()", &Volume::GetMuteStatus),
    };
    for (const auto& [name, soundType, getRange, setLevel, getLevel] : kSoundCategories) {
      const std::string volume = "volume(" + std::to_string(soundType);
      const std::string get = "sound_manager_get_";
      rows.push_back(
          Row<Volume>("Get" + name + "VolumeRange", get + "max_" + volume + ")", getRange, 7, 7));
      rows.push_back(Row<Volume>("Set" + name + "VolumeLevel",
                                 "sound_manager_set_" + volume + ", 9)", setLevel, 9));
      rows.push_back(
          Row<Volume>("GetCurrent" + name + "VolumeLevel", get + volume + ")", getLevel));
    }
    return rows;
  }
};

using Managers = testing::Types<Session, Call, Volume>;

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

inline std::string SysNamed(result r, const std::string& text) { return Sys(r, Named(r, text)); }

/// A test of a manager that exists.
template <typename Manager>
class ManagerTest : public LibraryTest {
 protected:
  ManagerTest() { Forget(); }

  /// Expects what an operation left behind that passed the gate, with its calls behind that.
  void ExpectLeftBehindGate(result last, const Lines& lines, Lines calls = {},
                            int line = __builtin_LINE()) {
    calls.insert(calls.begin(), PrivilegeQuery<Manager>());
    ExpectLeft(last, lines, calls, line);
  }

  Manager& manager = *Manager::GetInstance();
};

}  // namespace Zelkora::Media
