/// \file
#pragma once

#include <Tizen/Base/Object.h>
#include <Zelkora/Media/Export.h>

#include <pthread.h>

#include <atomic>

namespace Zelkora::Media {

class IAudioSessionEventListener;
class _AudioSessionManagerImpl;
class _ManagerLife;

/// What the application's sound is, and so what it gives way to. The names are those of the host
/// platform's session types; what each does to the sound is the device's business.
enum AudioSessionMode : int {
  /// Media that has the stage to itself. Sends session type 0.
  AUDIO_SESSION_MODE_MEDIA = 0,
  /// Media that plays along with other applications' media. Sends session type 0, then the
  /// media-session option pair (1, 0).
  AUDIO_SESSION_MODE_MEDIA_MIX = 1,
  /// A sound that must be heard. Sends session type 3.
  AUDIO_SESSION_MODE_EMERGENCY = 2,
  /// A short notice. Sends session type 2.
  AUDIO_SESSION_MODE_NOTIFICATION = 3,
  /// An alarm. Sends session type 1.
  AUDIO_SESSION_MODE_ALARM = 4,
};

/// Chooses the application's audio session mode and tells one listener about interruptions.
///
/// There is one manager a process. The mode is the device's: it is asked for at every call.
///
/// Needs
/// - the device's feature "/tizen/feature/audio_manager", at every `GetInstance`;
/// - the privilege "/tizen/privilege/audiomanager.session", at every call.
///
/// Set the listener right after `GetInstance`: one that is set later hears the end of what began
/// before, not its beginning.
///
/// \code
/// AudioSessionManager* session = AudioSessionManager::GetInstance();
/// if (session != nullptr) session->SetAudioSessionEventListener(&listener);
/// \endcode
///
/// Each failure is logged and becomes the last result; a device's refusal of `SetMode` does so on
/// the host platform, elsewhere that is the platform's decision. Success leaves the last result
/// alone.
///
/// Threads: every operation may be called on any thread; calls of `SetAudioSessionEventListener`
/// must not overlap.
///
/// At exit the manager is deleted by an exit handler. A call that comes after that, and a thread
/// that is inside an operation then, is the application's error.
class ZELKORA_MEDIA_API AudioSessionManager : public Tizen::Base::Object {
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
  static AudioSessionManager* GetInstance();

  /// Names the one listener that hears of interruptions, in place of the one before.
  ///
  /// On the host platform no call of the listener before is running when this returns, unless it is
  /// called from inside one.
  ///
  /// \param pListener the listener, or null for none; it stays the application's and must live
  /// until another, or null, takes its place
  /// \return
  /// - `E_SUCCESS`
  /// - `E_PRIVILEGE_DENIED`
  /// - the platform's code when the listener before can't be removed, which then stays
  /// - the platform's code when the new one can't be added, after which there is none
  result SetAudioSessionEventListener(IAudioSessionEventListener* pListener);

  /// Sets the mode.
  ///
  /// Every value is accepted: one outside the enumeration sends session type 0. The option pair is
  /// never taken back, so after `AUDIO_SESSION_MODE_MEDIA_MIX` the mode `AUDIO_SESSION_MODE_MEDIA`
  /// is read as the former for as long as the device keeps the pair.
  ///
  /// \return
  /// - `E_SUCCESS`
  /// - `E_PRIVILEGE_DENIED`
  /// - `E_OUT_OF_MEMORY`, `E_INVALID_ARG`, `E_INVALID_OPERATION` or `E_SYSTEM` when the device
  ///   refuses the session type, or the option pair; the session type is set then
  result SetMode(AudioSessionMode mode);

  /// Reads the mode.
  ///
  /// \return
  /// - the mode
  /// - -1, a value outside the enumeration, when the privilege is denied
  /// - `AUDIO_SESSION_MODE_MEDIA` also when the device refuses the query; the last result, cleared
  ///   before, tells: it is `E_OUT_OF_MEMORY`, `E_INVALID_ARG`, `E_INVALID_OPERATION` or `E_SYSTEM`
  AudioSessionMode GetMode() const;

 private:
  friend class _ManagerLife;

  AudioSessionManager();
  ~AudioSessionManager() override;
  result Construct();
  static void InitSingleton();
  static void DestroySingleton();

  static std::atomic<AudioSessionManager*> __pInstance;
  static pthread_once_t __onceBlock;

  _AudioSessionManagerImpl* __pImpl;
};

}  // namespace Zelkora::Media
