#include "AudioVolumeManagerImpl.h"
#include "SoundType.h"
#include "base/Capabilities.h"
#include "base/Guard.h"
#include "base/ManagerLife.h"

namespace Zelkora::Media {

using Impl = _AudioVolumeManagerImpl;

std::atomic<AudioVolumeManager*> AudioVolumeManager::__pInstance{nullptr};
pthread_once_t AudioVolumeManager::__onceBlock = PTHREAD_ONCE_INIT;

AudioVolumeManager* AudioVolumeManager::GetInstance() {
  return _ManagerLife::GetInstance<AudioVolumeManager>(kAudioVolumePrivilege, __PRETTY_FUNCTION__);
}

void AudioVolumeManager::InitSingleton() {
  _ManagerLife::InitSingleton<AudioVolumeManager>(kObjectNotCreated);
}

void AudioVolumeManager::DestroySingleton() {
  _ManagerLife::DestroySingleton<AudioVolumeManager>();
}

AudioVolumeManager::AudioVolumeManager() : __pImpl(nullptr) {}

AudioVolumeManager::~AudioVolumeManager() { delete __pImpl; }

result AudioVolumeManager::Construct() { return _ManagerLife::Construct(*this); }

result AudioVolumeManager::GetSystemVolumeRange(int& min, int& max) const {
  return Forward<&Impl::GetVolumeRange>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_SYSTEM, min,
                                        max);
}

result AudioVolumeManager::GetNotificationVolumeRange(int& min, int& max) const {
  return Forward<&Impl::GetVolumeRange>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_NOTIFICATION,
                                        min, max);
}

result AudioVolumeManager::GetAlarmVolumeRange(int& min, int& max) const {
  return Forward<&Impl::GetVolumeRange>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_ALARM, min, max);
}

result AudioVolumeManager::GetRingtoneVolumeRange(int& min, int& max) const {
  return Forward<&Impl::GetVolumeRange>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_RINGTONE, min,
                                        max);
}

result AudioVolumeManager::GetMediaVolumeRange(int& min, int& max) const {
  return Forward<&Impl::GetVolumeRange>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_MEDIA, min, max);
}

result AudioVolumeManager::GetCallVolumeRange(int& min, int& max) const {
  return Forward<&Impl::GetVolumeRange>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_CALL, min, max);
}

result AudioVolumeManager::SetSystemVolumeLevel(int level) {
  return Forward<&Impl::SetVolumeLevel>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_SYSTEM, level);
}

result AudioVolumeManager::SetNotificationVolumeLevel(int level) {
  return Forward<&Impl::SetVolumeLevel>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_NOTIFICATION,
                                        level);
}

result AudioVolumeManager::SetAlarmVolumeLevel(int level) {
  return Forward<&Impl::SetVolumeLevel>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_ALARM, level);
}

result AudioVolumeManager::SetRingtoneVolumeLevel(int level) {
  return Forward<&Impl::SetVolumeLevel>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_RINGTONE, level);
}

result AudioVolumeManager::SetMediaVolumeLevel(int level) {
  return Forward<&Impl::SetVolumeLevel>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_MEDIA, level);
}

result AudioVolumeManager::SetCallVolumeLevel(int level) {
  return Forward<&Impl::SetVolumeLevel>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_CALL, level);
}

int AudioVolumeManager::GetCurrentSystemVolumeLevel() const {
  return Forward<&Impl::GetCurrentVolumeLevel>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_SYSTEM);
}

int AudioVolumeManager::GetCurrentNotificationVolumeLevel() const {
  return Forward<&Impl::GetCurrentVolumeLevel>(__pImpl, kAudioVolumePrivilege,
                                               SOUND_TYPE_NOTIFICATION);
}

int AudioVolumeManager::GetCurrentAlarmVolumeLevel() const {
  return Forward<&Impl::GetCurrentVolumeLevel>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_ALARM);
}

int AudioVolumeManager::GetCurrentRingtoneVolumeLevel() const {
  return Forward<&Impl::GetCurrentVolumeLevel>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_RINGTONE);
}

int AudioVolumeManager::GetCurrentMediaVolumeLevel() const {
  return Forward<&Impl::GetCurrentVolumeLevel>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_MEDIA);
}

int AudioVolumeManager::GetCurrentCallVolumeLevel() const {
  return Forward<&Impl::GetCurrentVolumeLevel>(__pImpl, kAudioVolumePrivilege, SOUND_TYPE_CALL);
}

result AudioVolumeManager::MuteAll() {
  return Forward<&Impl::MuteAll>(__pImpl, kAudioVolumePrivilege);
}

result AudioVolumeManager::UnmuteAll() {
  return Forward<&Impl::UnmuteAll>(__pImpl, kAudioVolumePrivilege);
}

AudioMuteStatus AudioVolumeManager::GetMuteStatus() const {
  return Forward<&Impl::GetMuteStatus>(__pImpl, kAudioVolumePrivilege);
}

result AudioVolumeManager::AddAudioVolumeEventListener(IAudioVolumeEventListener& listener) {
  return Forward<&Impl::AddAudioVolumeEventListener>(__pImpl, kAudioVolumePrivilege, listener);
}

result AudioVolumeManager::RemoveAudioVolumeEventListener(IAudioVolumeEventListener& listener) {
  return Forward<&Impl::RemoveAudioVolumeEventListener>(__pImpl, kAudioVolumePrivilege, listener);
}

}  // namespace Zelkora::Media
