#include "VoipAudioSessionManagerImpl.h"

#include "base/Log.h"
#include "base/Native.h"
#include "base/SoundManagerError.h"

#include <array>

namespace Zelkora::Media {
namespace {

constexpr int kVoipCall = 1;

/// The platform mode of each mode.
constexpr std::array kPlatformModes = {0, 0, 1, 2};
static_assert(kPlatformModes.size() == VOIP_AUDIO_SESSION_MODE_MEDIA + 1);

bool IsKnown(VoipAudioSessionMode mode) {
  return static_cast<unsigned>(mode) < kPlatformModes.size();
}

VoipAudioSessionMode FromPlatformMode(int platformMode) {
  for (int mode = VOIP_AUDIO_SESSION_MODE_VOICE; mode <= VOIP_AUDIO_SESSION_MODE_MEDIA; ++mode) {
    if (kPlatformModes[static_cast<unsigned>(mode)] == platformMode) {
      return static_cast<VoipAudioSessionMode>(mode);
    }
  }
  return VOIP_AUDIO_SESSION_MODE_NONE;
}

result FailNotEntered(int line = __builtin_LINE()) {
  return Fail(E_INVALID_STATE,
              {"[E_INVALID_STATE] EnterCallSession() should be called before use", line});
}

}  // namespace

_VoipAudioSessionManagerImpl::~_VoipAudioSessionManagerImpl() {
  if (__soundCallSessionHandle == nullptr) return;
  const result r =
      ConvertSoundManagerError(sound_manager_call_session_destroy(__soundCallSessionHandle));
  if (r != E_SUCCESS) {
    LogDiagnostic("[%s] Failed to perform sound_manager_call_session_destroy operation.",
                  GetErrorMessage(r));
  }
  __soundCallSessionHandle = nullptr;
}

result _VoipAudioSessionManagerImpl::Construct() { return E_SUCCESS; }

result _VoipAudioSessionManagerImpl::EnterCallSession() {
  if (__soundCallSessionHandle != nullptr) {
    return Fail(E_INVALID_OPERATION,
                "[E_INVALID_OPERATION] A error has been occurred. The value of "
                "__soundCallSessionHandle is not null.");
  }
  const int error =
      CallNative(sound_manager_call_session_create, kVoipCall, &__soundCallSessionHandle);
  result r = ConvertSoundManagerError(error);
  if (r == E_SUCCESS && __soundCallSessionHandle != nullptr) return E_SUCCESS;

  if (r == E_SUCCESS) {
    r = Fail(E_SYSTEM,
             "[E_SYSTEM] A system error has been occurred. The value of __soundCallSessionHandle "
             "is null.");
  } else {
    Fail(r,
         "[%s] Failed to perform sound_manager_call_session_create operation with error code : "
         "0x%x",
         GetErrorMessage(r), error);
  }
  if (__soundCallSessionHandle != nullptr) {  // left behind by a device that failed
    sound_manager_call_session_destroy(__soundCallSessionHandle);
    __soundCallSessionHandle = nullptr;
  }
  return r;
}

result _VoipAudioSessionManagerImpl::ExitCallSession() {
  if (__soundCallSessionHandle == nullptr) {
    return Fail(E_INVALID_OPERATION,
                "[E_INVALID_OPERATION] A error has been occurred. The value of "
                "__soundCallSessionHandle is null.");
  }
  const result r =
      ConvertSoundManagerError(sound_manager_call_session_destroy(__soundCallSessionHandle));
  if (r != E_SUCCESS) {
    return Fail(r, "[%s] Failed to perform sound_manager_call_session_destroy operation.",
                GetErrorMessage(r));
  }
  __soundCallSessionHandle = nullptr;
  return E_SUCCESS;
}

result _VoipAudioSessionManagerImpl::SetCallSessionMode(VoipAudioSessionMode mode) {
  if (__soundCallSessionHandle == nullptr) return FailNotEntered();
  if (!IsKnown(mode)) {
    return Fail(E_INVALID_ARG,
                " [E_INVALID_ARG] Invalid argument is used. The mode is not correct : %d", mode);
  }
  const result r = ConvertSoundManagerError(
      CallNative(sound_manager_call_session_set_mode, __soundCallSessionHandle,
                 kPlatformModes[static_cast<unsigned>(mode)]));
  if (r != E_SUCCESS) {
    return Fail(r, "[%s] Failed to perform sound_manager_call_session_set_mode operation.",
                GetErrorMessage(r));
  }
  return E_SUCCESS;
}

VoipAudioSessionMode _VoipAudioSessionManagerImpl::GetCallSessionMode() const {
  if (__soundCallSessionHandle == nullptr) return FailNotEntered(), VOIP_AUDIO_SESSION_MODE_NONE;

  int platformMode = 0;
  const int error =
      CallNative(sound_manager_call_session_get_mode, __soundCallSessionHandle, &platformMode);
  const result r = ConvertSoundManagerError(error);
  if (r != E_SUCCESS) {
    Fail(r,
         "[%s] Failed to perform sound_manager_call_session_get_mode operation with error code : "
         "0x%x",
         GetErrorMessage(r), error);
    return VOIP_AUDIO_SESSION_MODE_NONE;
  }
  return FromPlatformMode(platformMode);
}

}  // namespace Zelkora::Media
