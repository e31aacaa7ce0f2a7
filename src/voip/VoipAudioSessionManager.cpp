#include "VoipAudioSessionManagerImpl.h"
#include "frame/Capabilities.h"
#include "frame/Guard.h"
#include "frame/ManagerLife.h"

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
  return Forward(__pImpl, kVoipAudioSessionPrivilege, &Impl::EnterCallSession);
}

result VoipAudioSessionManager::ExitCallSession() {
  return Forward(__pImpl, kVoipAudioSessionPrivilege, &Impl::ExitCallSession);
}

result VoipAudioSessionManager::SetCallSessionMode(VoipAudioSessionMode mode) {
  return Forward(__pImpl, kVoipAudioSessionPrivilege, &Impl::SetCallSessionMode, mode);
}

VoipAudioSessionMode VoipAudioSessionManager::GetCallSessionMode() const {
  return Forward(__pImpl, kVoipAudioSessionPrivilege, &Impl::GetCallSessionMode);
}

}  // namespace Zelkora::Media
