/// \file
#pragma once

#include <Tizen/Base/Object.h>
#include <Zelkora/Media/Export.h>

#include <pthread.h>

#include <atomic>

namespace Zelkora::Media {

class _ManagerLife;
class _VoipAudioSessionManagerImpl;

/// What a call's sound is at the moment. The names are those of the host platform's call modes;
/// what each does to the sound is the device's business.
enum VoipAudioSessionMode : int {
  /// No mode could be read. When set, sends platform mode 0, like `VOIP_AUDIO_SESSION_MODE_VOICE`.
  VOIP_AUDIO_SESSION_MODE_NONE = 0,
  /// The parties talk. Sends platform mode 0.
  VOIP_AUDIO_SESSION_MODE_VOICE = 1,
  /// An incoming call rings. Sends platform mode 1.
  VOIP_AUDIO_SESSION_MODE_RINGTONE = 2,
  /// Media plays in the call, such as music on hold. Sends platform mode 2.
  VOIP_AUDIO_SESSION_MODE_MEDIA = 3,
};

/// Opens a call session for a voice-over-IP call, switches its mode and closes it.
///
/// There is one manager a process, and one call session at a time. A session that is open at
/// process exit is closed there.
///
/// Needs
/// - the device's feature "/tizen/feature/audio_manager", at every `GetInstance`;
/// - the privilege "/tizen/privilege/audiomanager.voipsession", at every call.
///
/// \code
/// VoipAudioSessionManager* call = VoipAudioSessionManager::GetInstance();
/// if (call != nullptr && call->EnterCallSession() == E_SUCCESS) {
///   call->SetCallSessionMode(VOIP_AUDIO_SESSION_MODE_VOICE);
///   // the parties talk
///   call->ExitCallSession();
/// }
/// \endcode
///
/// Each failure is logged and becomes the last result. Success leaves the last result alone. Where
/// "the device's refusal" is named, it is one of `E_OUT_OF_MEMORY`, `E_INVALID_ARG`,
/// `E_INVALID_OPERATION` and `E_SYSTEM`.
///
/// Threads: every operation may be called on any thread, but calls must not overlap.
///
/// At exit the manager is deleted by an exit handler. A call that comes after that, and a thread
/// that is inside an operation then, is the application's error.
class ZELKORA_MEDIA_API VoipAudioSessionManager : public Tizen::Base::Object {
 public:
  /// Gives the one manager. The first call that passes both tests, which are made at every call,
  /// creates it; never delete it.
  ///
  /// \return the manager, with `E_SUCCESS` in the last result; or null, with the cause there:
  /// - `E_PRIVILEGE_DENIED`
  /// - `E_UNSUPPORTED_OPERATION` when the device lacks the feature, or the code of a failing lookup
  /// - `E_OUT_OF_MEMORY` when the manager couldn't be made
  /// - `E_SUCCESS` after that, because it is tried once in the life of a process, on another thread
  ///   too; and when the manager has been deleted at exit
  static VoipAudioSessionManager* GetInstance();

  /// Opens the call session.
  /// \return
  /// - `E_SUCCESS`
  /// - `E_PRIVILEGE_DENIED`
  /// - `E_INVALID_OPERATION` when it is open already, which it stays
  /// - `E_SYSTEM` when the device gives no session
  /// - the device's refusal
  result EnterCallSession();

  /// Closes the call session.
  /// \return
  /// - `E_SUCCESS`
  /// - `E_PRIVILEGE_DENIED`
  /// - `E_INVALID_OPERATION` when none is open
  /// - the device's refusal, after which the session is still open: call again
  result ExitCallSession();

  /// Switches the open session's mode.
  /// \param mode one of the enumeration's values
  /// \return
  /// - `E_SUCCESS`
  /// - `E_PRIVILEGE_DENIED`
  /// - `E_INVALID_STATE` when no session is open
  /// - `E_INVALID_ARG` for another value
  /// - the device's refusal
  result SetCallSessionMode(VoipAudioSessionMode mode);

  /// Reads the open session's mode.
  ///
  /// \return
  /// - the mode
  /// - `VOIP_AUDIO_SESSION_MODE_NONE` when no session is open: the last result is `E_INVALID_STATE`
  /// - the same when the device refuses the query: the last result is its refusal
  /// - the same when it reports a mode that isn't known: the last result is as it was
  /// - -1, a value outside the enumeration, when the privilege is denied
  VoipAudioSessionMode GetCallSessionMode() const;

 private:
  friend class _ManagerLife;

  VoipAudioSessionManager();
  ~VoipAudioSessionManager() override;
  result Construct();
  static void InitSingleton();
  static void DestroySingleton();

  static std::atomic<VoipAudioSessionManager*> __pInstance;
  static pthread_once_t __onceBlock;

  _VoipAudioSessionManagerImpl* __pImpl;
};

}  // namespace Zelkora::Media
