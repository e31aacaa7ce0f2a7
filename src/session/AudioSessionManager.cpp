#include "AudioSessionManagerImpl.h"
#include "base/Capabilities.h"
#include "base/Guard.h"
#include "base/ManagerLife.h"

namespace Zelkora::Media {

using Impl = _AudioSessionManagerImpl;

std::atomic<AudioSessionManager*> AudioSessionManager::__pInstance{nullptr};
pthread_once_t AudioSessionManager::__onceBlock = PTHREAD_ONCE_INIT;

AudioSessionManager* AudioSessionManager::GetInstance() {
  return _ManagerLife::GetInstance<AudioSessionManager>(kAudioSessionPrivilege,
                                                        __PRETTY_FUNCTION__);
}

void AudioSessionManager::InitSingleton() {
  _ManagerLife::InitSingleton<AudioSessionManager>(kObjectNotCreated);
}

void AudioSessionManager::DestroySingleton() {
  _ManagerLife::DestroySingleton<AudioSessionManager>();
}

AudioSessionManager::AudioSessionManager() : __pImpl(nullptr) {}

AudioSessionManager::~AudioSessionManager() { delete __pImpl; }

result AudioSessionManager::Construct() { return _ManagerLife::Construct(*this); }

result AudioSessionManager::SetAudioSessionEventListener(IAudioSessionEventListener* pListener) {
  return Forward<&Impl::SetAudioSessionEventListener>(__pImpl, kAudioSessionPrivilege, pListener);
}

result AudioSessionManager::SetMode(AudioSessionMode mode) {
  return Forward<&Impl::SetMode>(__pImpl, kAudioSessionPrivilege, mode);
}

AudioSessionMode AudioSessionManager::GetMode() const {
  return Forward<&Impl::GetMode>(__pImpl, kAudioSessionPrivilege);
}

}  // namespace Zelkora::Media
