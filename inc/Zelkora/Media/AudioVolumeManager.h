/// \file
#pragma once

#include <Tizen/Base/Object.h>
#include <Zelkora/Media/Export.h>

#include <pthread.h>

#include <atomic>

namespace Zelkora::Media {

class IAudioVolumeEventListener;
class _AudioVolumeManagerImpl;
class _ManagerLife;

/// Whether all sound is muted.
enum AudioMuteStatus : int {
  AUDIO_MUTE_STATUS_MUTED = 1,
  AUDIO_MUTE_STATUS_UNMUTED = 2,
};

/// Reads and sets the device's volumes, mutes all sound, and reports changes to listeners.
///
/// There is one manager a process. It keeps no state: every answer comes from the device at the
/// time of the call.
///
/// Needs
/// - the device's feature "/tizen/feature/audio_manager", at every `GetInstance`;
/// - the privilege "/tizen/privilege/audiomanager.volume", at every call.
///
/// \code
/// AudioVolumeManager* volume = AudioVolumeManager::GetInstance();
/// if (volume != nullptr) volume->SetMediaVolumeLevel(9);
/// \endcode
///
/// Levels are integers in steps of the device's own, from 0 to the category's maximum, which the
/// range query tells; they don't depend on the mute status.
///
/// Results that every operation can have:
/// - `E_PRIVILEGE_DENIED`, or -1 from those that return a value: the application lacks the
///   privilege, and nothing was done
/// - `E_OUT_OF_MEMORY`, `E_INVALID_ARG`, `E_INVALID_OPERATION`, `E_SYSTEM`, or the value that the
///   operation names: the device's refusal
///
/// Each failure is logged and becomes the last result. Success leaves the last result alone, so it
/// tells something only after a failure.
///
/// Threads: every operation may be called on any thread, and several at once.
///
/// At exit the manager is deleted by an exit handler. A call that comes after that, and a thread
/// that is inside an operation then, is the application's error.
class ZELKORA_MEDIA_API AudioVolumeManager : public Tizen::Base::Object {
 public:
  /// Gives the one manager. The first call that passes both tests, which are made at every call,
  /// creates it; never delete it.
  ///
  /// \return the manager, with `E_SUCCESS` in the last result; or null, with the cause there:
  /// - `E_PRIVILEGE_DENIED`
  /// - `E_UNSUPPORTED_OPERATION` when the device lacks the feature, or the code of a failing lookup
  /// - `E_OUT_OF_MEMORY`, `E_SYSTEM` when a callback can't be registered, or the code with which
  ///   the platform's events refuse to start: the manager couldn't be made
  /// - `E_SUCCESS` after that, because it is tried once in the life of a process, on another thread
  ///   too; and when the manager has been deleted at exit
  static AudioVolumeManager* GetInstance();

  /// \name Volume ranges
  /// \param min receives 0, also when the device refuses the query
  /// \param max receives the highest level; after a refusal what the device left in it
  /// \return `E_SUCCESS` or a code of the class's list; a denied privilege leaves both as they were
  /// @{
  result GetSystemVolumeRange(int& min, int& max) const;
  result GetNotificationVolumeRange(int& min, int& max) const;
  result GetAlarmVolumeRange(int& min, int& max) const;
  result GetRingtoneVolumeRange(int& min, int& max) const;
  result GetMediaVolumeRange(int& min, int& max) const;
  result GetCallVolumeRange(int& min, int& max) const;
  /// @}

  /// \name Setting levels
  /// \param level the new level, handed to the device unchanged, which judges it: the host
  /// platform's devices answer `E_INVALID_ARG` to one out of range
  /// \return `E_SUCCESS` or a code of the class's list
  /// @{
  result SetSystemVolumeLevel(int level);
  result SetNotificationVolumeLevel(int level);
  result SetAlarmVolumeLevel(int level);
  result SetRingtoneVolumeLevel(int level);
  result SetMediaVolumeLevel(int level);
  result SetCallVolumeLevel(int level);
  /// @}

  /// \name Current levels
  /// \return the level, or -1 on any failure
  /// @{
  int GetCurrentSystemVolumeLevel() const;
  int GetCurrentNotificationVolumeLevel() const;
  int GetCurrentAlarmVolumeLevel() const;
  int GetCurrentRingtoneVolumeLevel() const;
  int GetCurrentMediaVolumeLevel() const;
  int GetCurrentCallVolumeLevel() const;
  /// @}

  /// Mutes all sound; levels stay as they are.
  /// \return `E_SUCCESS` or a code of the class's list
  result MuteAll();

  /// Ends `MuteAll`.
  /// \return `E_SUCCESS` or a code of the class's list
  result UnmuteAll();

  /// Tells whether all sound is muted.
  ///
  /// \return
  /// - `AUDIO_MUTE_STATUS_MUTED` or `AUDIO_MUTE_STATUS_UNMUTED`
  /// - 0, a value outside the enumeration, when the device refuses the query
  /// - -1, likewise outside, when the privilege is denied
  AudioMuteStatus GetMuteStatus() const;

  /// Adds a listener, which hears every change from now on until it is removed: those that this
  /// application makes and those from outside. No listener is called inside `SetMediaVolumeLevel`
  /// and its like.
  ///
  /// \param listener the listener; it stays the application's and must live until it is removed
  /// \return
  /// - `E_SUCCESS`
  /// - `E_PRIVILEGE_DENIED`
  /// - the platform's refusal, which isn't logged and doesn't become the last result: on the host
  ///   platform `E_INVALID_OPERATION` when the listener is added already, or `E_OUT_OF_MEMORY`
  result AddAudioVolumeEventListener(IAudioVolumeEventListener& listener);

  /// Removes a listener. On the host platform no call of it is running when this returns, unless it
  /// is called from inside one.
  ///
  /// \return
  /// - `E_SUCCESS`
  /// - `E_PRIVILEGE_DENIED`
  /// - the platform's refusal, which isn't logged and doesn't become the last result: on the host
  ///   platform `E_OBJ_NOT_FOUND` when the listener isn't added
  result RemoveAudioVolumeEventListener(IAudioVolumeEventListener& listener);

 private:
  friend class _ManagerLife;

  AudioVolumeManager();
  ~AudioVolumeManager() override;
  result Construct();
  static void InitSingleton();
  static void DestroySingleton();

  static std::atomic<AudioVolumeManager*> __pInstance;
  static pthread_once_t __onceBlock;

  _AudioVolumeManagerImpl* __pImpl;
};

}  // namespace Zelkora::Media
