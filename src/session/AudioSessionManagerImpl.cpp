#include "AudioSessionManagerImpl.h"

#include "AudioSessionEvent.h"
#include "base/Log.h"
#include "base/Native.h"
#include "base/SoundManagerError.h"

#include <Zelkora/Media/IAudioSessionEventListener.h>
#include <sound_manager.h>

#include <array>
#include <new>

namespace Zelkora::Media {
namespace {

/// The session type of each mode. Where it is `kMediaSessionType`, the media-session option
/// decides.
constexpr int kMediaSessionType = 0;
constexpr std::array kSessionTypes = {kMediaSessionType, kMediaSessionType, 3, 2, 1};
static_assert(kSessionTypes.size() == AUDIO_SESSION_MODE_ALARM + 1);

/// The media-session option pair of `AUDIO_SESSION_MODE_MEDIA_MIX`.
constexpr int kMixFirst = 1;
constexpr int kMixSecond = 0;

int ToSessionType(AudioSessionMode mode) {
  const auto row = static_cast<unsigned>(mode);
  return row < kSessionTypes.size() ? kSessionTypes[row] : kMediaSessionType;
}

/// \return the mode, or `AUDIO_SESSION_MODE_MEDIA` when the option decides.
AudioSessionMode ToMode(int sessionType) {
  for (int mode = AUDIO_SESSION_MODE_EMERGENCY; mode <= AUDIO_SESSION_MODE_ALARM; ++mode) {
    if (kSessionTypes[static_cast<unsigned>(mode)] == sessionType) {
      return static_cast<AudioSessionMode>(mode);
    }
  }
  return AUDIO_SESSION_MODE_MEDIA;
}

result FailSetting(int error, const char* failure, int line) {
  const result r = ConvertSoundManagerError(error);
  SysTryReturnResultInternal(kLogModule, r, kNoFunction, line, failure, error);
  return r;
}

/// Converts the answer to a setting, logging a failure with the raw code.
inline result Check(int error, const char* failure, int line = __builtin_LINE()) {
  return error == 0 ? E_SUCCESS : FailSetting(error, failure, line);
}

}  // namespace

result _AudioSessionManagerImpl::Construct() {
  auto* pEvent = new (std::nothrow) _AudioSessionEvent;
  delete __pAudioSessionEvent;
  __pAudioSessionEvent = pEvent;
  if (pEvent == nullptr) {
    return Fail(E_OUT_OF_MEMORY, "[E_OUT_OF_MEMORY] Memory allocation failed.");
  }
  const result r = pEvent->Construct();
  if (r != E_SUCCESS) return Propagate(r);

  const int error = sound_manager_set_session_interrupted_cb(
      [](auto code, void* userData) {
        SessionInterruptedCallback(static_cast<int>(code), userData);
      },
      this);
  if (error != 0) {
    return Fail(E_SYSTEM,
                "[E_SYSTEM] A system error has been occurred. Failed to perform "
                "sound_manager_set_session_interrupted_cb operation with error code : %d",
                error);
  }
  return E_SUCCESS;
}

_AudioSessionManagerImpl::~_AudioSessionManagerImpl() {
  // No callback may find the event gone, so it ends first, also if it was never registered.
  sound_manager_unset_session_interrupted_cb();
  __pAudioSessionEventListener = nullptr;
  delete __pAudioSessionEvent;
}

result _AudioSessionManagerImpl::SetMode(AudioSessionMode mode) {
  const result r = Check(CallNative(sound_manager_set_session_type, ToSessionType(mode)),
                         "Failed to perform sound_manager_set_session_type operation with error "
                         "code : 0x%x");
  if (r != E_SUCCESS || mode != AUDIO_SESSION_MODE_MEDIA_MIX) return r;
  return Check(sound_manager_set_media_session_option(kMixFirst, kMixSecond),
               "Failed to perform sound_manager_set_media_session_option operation with error "
               "code : 0x%x");
}

AudioSessionMode _AudioSessionManagerImpl::GetMode() const {
  int sessionType = 0;
  int first = 0;
  int second = 0;
  result r = ConvertSoundManagerError(CallNative(sound_manager_get_session_type, &sessionType));
  if (r != E_SUCCESS) return Propagate(r), AUDIO_SESSION_MODE_MEDIA;

  const AudioSessionMode mode = ToMode(sessionType);
  if (mode != AUDIO_SESSION_MODE_MEDIA) return mode;

  r = ConvertSoundManagerError(sound_manager_get_media_session_option(&first, &second));
  if (r != E_SUCCESS) return Propagate(r), AUDIO_SESSION_MODE_MEDIA;
  return first == kMixFirst ? AUDIO_SESSION_MODE_MEDIA_MIX : AUDIO_SESSION_MODE_MEDIA;
}

result _AudioSessionManagerImpl::SetAudioSessionEventListener(
    IAudioSessionEventListener* pListener) {
  if (__pAudioSessionEvent == nullptr) {
    return Fail(E_INVALID_OPERATION,
                "[E_INVALID_OPERATION] A error has been occurred. The value of "
                "__pAudioSessionEvent is null.");
  }
  if (__pAudioSessionEventListener != nullptr) {
    const result r = __pAudioSessionEvent->RemoveListener(*__pAudioSessionEventListener);
    if (r != E_SUCCESS) return Fail(r, "[%s] RemoveListener() failed", GetErrorMessage(r));
    __pAudioSessionEventListener = nullptr;
  }
  if (pListener == nullptr) return E_SUCCESS;

  const result r = __pAudioSessionEvent->AddListener(*pListener, false);
  if (r != E_SUCCESS) return Fail(r, "[%s] AddListener() failed", GetErrorMessage(r));
  __pAudioSessionEventListener = pListener;
  return E_SUCCESS;
}

void _AudioSessionManagerImpl::SessionInterruptedCallback(int code, void* userData) {
  LogDiagnostic("This instance received message code : %d", code);
  if (userData == nullptr) {
    Fail(E_OBJ_NOT_FOUND, "[E_OBJ_NOT_FOUND] _AudioSessionManagerImpl is null.");
    return;
  }
  static_cast<_AudioSessionManagerImpl*>(userData)->OnInterrupted(code);
}

void _AudioSessionManagerImpl::OnInterrupted(int code) {
  switch (code) {
    case 0:
      if (!__suppressInterruptFinished) FireSessionEvent(SESSION_EVENT_INTERRUPT_FINISHED);
      __suppressInterruptFinished = false;
      break;
    case 2:
      __suppressInterruptFinished = true;  // the end that follows belongs to a disruption
      [[fallthrough]];
    case 1:
    case 3:
    case 4: FireSessionEvent(SESSION_EVENT_DISRUPTED); break;
    case 5:
    case 6: FireSessionEvent(SESSION_EVENT_INTERRUPT_STARTED); break;
    default: Fail(E_SYSTEM, "A system error occurred. Invalid notify signal is %d", code);
  }
}

void _AudioSessionManagerImpl::FireSessionEvent(_AudioSessionEventType type) {
  auto* pArg = new (std::nothrow) _AudioSessionEventArg;
  if (pArg == nullptr) {
    Fail(E_OUT_OF_MEMORY, "[E_OUT_OF_MEMORY] Memory allocation failed.");
    return;
  }
  pArg->SetEventType(type);
  // The argument is the platform's now, whether that succeeds or not.
  const result r = __pAudioSessionEvent->FireAsync(*pArg);
  if (r == E_SUCCESS) return;
  LogDiagnostic(type == SESSION_EVENT_DISRUPTED ? "[%s]Failed to perform FireAsync operation."
                                                : "[%s] Failed to perform FireAsync operation.",
                GetErrorMessage(r));
}

}  // namespace Zelkora::Media
