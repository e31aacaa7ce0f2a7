#include "VoipAudioSessionManagerImpl.h"
#include "base/Capabilities.h"
#include "base/Guard.h"
#include "base/ManagerLife.h"

namespace Zelkora::Media {

using Impl = _VoipAudioSessionManagerImpl;

std::atomic<VoipAudioSessionManager*> VoipAudioSessionManager::__pInstance{nullptr};
pthread_once_t VoipAudioSessionManager::__onceBlock = PTHREAD_ONCE_INIT;

VoipAudioSessionManager* VoipAudioSessionManager::GetInstance() {
  return _ManagerLife::GetInstance<VoipAudioSessionManager>(kVoipAudioSessionPrivilege,
                                                            __PRETTY_FUNCTION__);
}

void VoipAudioSessionManager::InitSingleton() {
  _ManagerLife::InitSingleton<VoipAudioSessionManager>(
      "[E_OUT_OF_MEMORY] Memory allocation failed.\tThe object is not created.");
}

void VoipAudioSessionManager::DestroySingleton() {
  _ManagerLife::DestroySingleton<VoipAudioSessionManager>();
}

VoipAudioSessionManager::VoipAudioSessionManager() : __pImpl(nullptr) {}

VoipAudioSessionManager::~VoipAudioSessionManager() { delete __pImpl; }

result VoipAudioSessionManager::Construct() { return _ManagerLife::Construct(*this); }

result VoipAudioSessionManager::EnterCallSession() {
  return Forward<&Impl::EnterCallSession>(__pImpl, kVoipAudioSessionPrivilege);
}

result VoipAudioSessionManager::ExitCallSession() {
  return Forward<&Impl::ExitCallSession>(__pImpl, kVoipAudioSessionPrivilege);
}

result VoipAudioSessionManager::SetCallSessionMode(VoipAudioSessionMode mode) {
  return Forward<&Impl::SetCallSessionMode>(__pImpl, kVoipAudioSessionPrivilege, mode);
}

VoipAudioSessionMode VoipAudioSessionManager::GetCallSessionMode() const {
  return Forward<&Impl::GetCallSessionMode>(__pImpl, kVoipAudioSessionPrivilege);
}

}  // namespace Zelkora::Media
