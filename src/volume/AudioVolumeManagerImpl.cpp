#include "AudioVolumeManagerImpl.h"

#include "AudioVolumeEvent.h"
#include "AudioVolumeEventArg.h"
#include "SoundType.h"
#include "base/Log.h"
#include "base/Native.h"
#include "base/SoundManagerError.h"

#include <Zelkora/Media/IAudioVolumeEventListener.h>
#include <sound_manager.h>

#include <new>

namespace Zelkora::Media {
namespace {

result FailSoundManager(int error, Format failure) {
  const result r = ConvertSoundManagerError(error);
  return Fail(r, failure, GetErrorMessage(r), error);
}

/// Converts a sound manager's answer, logging a failure under the name of its function.
inline result Check(int error, Format failure) {
  return error == 0 ? E_SUCCESS : FailSoundManager(error, failure);
}

result SetMuteAll(bool muteAll) {
  return Check(sound_manager_set_muteall(muteAll), "[%s] sound_manager_set_muteall failed with %d");
}

AudioMuteStatus ToMuteStatus(bool muteAll) {
  return muteAll ? AUDIO_MUTE_STATUS_MUTED : AUDIO_MUTE_STATUS_UNMUTED;
}

_AudioVolumeEventArg* MakeEventArg() {
  auto* pArg = new (std::nothrow) _AudioVolumeEventArg;
  if (pArg == nullptr) Fail(E_OUT_OF_MEMORY, "[E_OUT_OF_MEMORY] Memory allocation failed.");
  return pArg;
}

result FailWithoutEvent(int line = __builtin_LINE()) {
  return Fail(E_INVALID_ARG, {"[E_INVALID_ARG] A error has been occurred. The value of "
                              "__pAudioSessionEvent is null.",
                              line});
}

_AudioVolumeManagerImpl* ToImpl(void* userData) {
  if (userData == nullptr) {
    Fail(E_OBJ_NOT_FOUND, "[E_OBJ_NOT_FOUND] _AudioVolumeManagerImpl is null.");
  }
  return static_cast<_AudioVolumeManagerImpl*>(userData);
}

}  // namespace

result _AudioVolumeManagerImpl::Construct() {
  __pAudioSessionEvent = new (std::nothrow) _AudioVolumeEvent;
  if (__pAudioSessionEvent == nullptr) {
    return Fail(E_OUT_OF_MEMORY, "[E_OUT_OF_MEMORY] Memory allocation failed.");
  }
  const result r = __pAudioSessionEvent->Construct();
  if (r != E_SUCCESS) return Propagate(r);

  int error = sound_manager_set_volume_changed_cb(
      [](auto type, auto volume, void* userData) {
        VolumeChangedCallback(static_cast<int>(type), static_cast<int>(volume), userData);
      },
      this);
  if (error != 0) {
    return Fail(E_SYSTEM,
                "[E_SYSTEM] A system error has been occurred. Failed to perform "
                "sound_manager_set_volume_changed_cb operation with error code : %d",
                error);
  }
  error = sound_manager_set_muteall_changed_cb(MuteAllChangedCallback, this);
  if (error != 0) {
    return Fail(E_SYSTEM,
                "[E_SYSTEM] A system error has been occurred. Failed to perform "
                "sound_manager_set_muteall_changed_cb operation with error code : %d",
                error);
  }
  return E_SUCCESS;
}

_AudioVolumeManagerImpl::~_AudioVolumeManagerImpl() {
  // No callback may find the event gone, so they end first, also those that were never registered.
  sound_manager_unset_volume_changed_cb();
  sound_manager_unset_muteall_changed_cb();
  delete __pAudioSessionEvent;
}

result _AudioVolumeManagerImpl::GetVolumeRange(int type, int& min, int& max) const {
  min = 0;
  return Check(CallNative(sound_manager_get_max_volume, type, &max),
               "[%s] sound_manager_get_max_volume failed with %d");
}

result _AudioVolumeManagerImpl::SetVolumeLevel(int type, int level) {
  return Check(CallNative(sound_manager_set_volume, type, level),
               "[%s] sound_manager_set_volume failed with %d");
}

int _AudioVolumeManagerImpl::GetCurrentVolumeLevel(int type) const {
  int level = 0;
  const result r = Check(CallNative(sound_manager_get_volume, type, &level),
                         "[%s] sound_manager_get_volume failed with %d");
  return r == E_SUCCESS ? level : -1;
}

result _AudioVolumeManagerImpl::MuteAll() { return SetMuteAll(true); }

result _AudioVolumeManagerImpl::UnmuteAll() { return SetMuteAll(false); }

AudioMuteStatus _AudioVolumeManagerImpl::GetMuteStatus() const {
  bool muteAll = false;
  const result r =
      Check(sound_manager_get_muteall(&muteAll), "[%s] sound_manager_get_muteall failed with %d");
  return r == E_SUCCESS ? ToMuteStatus(muteAll) : static_cast<AudioMuteStatus>(0);
}

result _AudioVolumeManagerImpl::AddAudioVolumeEventListener(IAudioVolumeEventListener& listener) {
  if (__pAudioSessionEvent == nullptr) return FailWithoutEvent();
  return __pAudioSessionEvent->AddListener(listener, false);
}

result _AudioVolumeManagerImpl::RemoveAudioVolumeEventListener(
    IAudioVolumeEventListener& listener) {
  if (__pAudioSessionEvent == nullptr) return FailWithoutEvent();
  return __pAudioSessionEvent->RemoveListener(listener);
}

void _AudioVolumeManagerImpl::VolumeChangedCallback(int type, int volume, void* userData) {
  auto* pImpl = ToImpl(userData);
  if (pImpl != nullptr) pImpl->FireVolumeChangedEvent(type, volume);
}

void _AudioVolumeManagerImpl::MuteAllChangedCallback(bool muteAll, void* userData) {
  auto* pImpl = ToImpl(userData);
  if (pImpl != nullptr) pImpl->FireMuteChangedEvent(muteAll);
}

void _AudioVolumeManagerImpl::FireVolumeChangedEvent(int type, int volume) {
  _AudioVolumeEventArg* pArg = MakeEventArg();
  if (pArg == nullptr) return;
  if (static_cast<unsigned>(type) >= kSoundTypeCount) {
    LogDiagnostic("sound type returned is wrong - %d", type);
    delete pArg;
    return;
  }
  pArg->SetEventType(type + 1);
  pArg->SetVolumeLevel(volume);
  Fire(*pArg);
}

void _AudioVolumeManagerImpl::FireMuteChangedEvent(bool muteAll) {
  _AudioVolumeEventArg* pArg = MakeEventArg();
  if (pArg == nullptr) return;
  pArg->SetEventType(VOLUME_EVENT_MUTE);
  pArg->SetMuteStatus(ToMuteStatus(muteAll));
  Fire(*pArg);
}

void _AudioVolumeManagerImpl::Fire(_AudioVolumeEventArg& arg) {
  // The argument is the platform's now, whether that succeeds or not.
  const result r = __pAudioSessionEvent->FireAsync(arg);
  if (r != E_SUCCESS)
    LogDiagnostic("[%s]Failed to perform FireAsync operation.", GetErrorMessage(r));
}

}  // namespace Zelkora::Media
