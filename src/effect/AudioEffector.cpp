#include <Zelkora/Media/AudioEffector.h>

#include "AudioEffectorImpl.h"
#include "frame/Assert.h"
#include "frame/Capabilities.h"
#include "frame/Log.h"

#include <memory>
#include <new>

namespace Zelkora::Media {

using Tizen::Base::Collection::IListT;

AudioEffector::AudioEffector() : __pAudioEffectorImpl(nullptr) {}

AudioEffector::~AudioEffector() {
  delete __pAudioEffectorImpl;
  __pAudioEffectorImpl = nullptr;
}

result AudioEffector::Construct(Tizen::Media::Player& player) {
  result r = CheckFeature(kAudioEffectorFeature, __PRETTY_FUNCTION__);
  if (r != E_SUCCESS) return r;
  if (!APP_ASSERT(__pAudioEffectorImpl == null, kAlreadyConstructed)) return E_INVALID_STATE;

  std::unique_ptr<_AudioEffectorImpl> pImpl(new (std::nothrow) _AudioEffectorImpl);
  if (pImpl == nullptr) {
    return FailTagged(E_OUT_OF_MEMORY, __PRETTY_FUNCTION__,
                      "[E_OUT_OF_MEMORY] Memory allocation failed");
  }
  r = pImpl->Construct(player);
  if (r != E_SUCCESS) {
    return FailTagged(r, __PRETTY_FUNCTION__, "[%s] Failed to construct pAudioEffectorImpl.",
                      GetErrorMessage(r));
  }
  SetLastResult(E_SUCCESS);
  __pAudioEffectorImpl = pImpl.release();
  return E_SUCCESS;
}

IListT<AudioEffectType>* AudioEffector::GetSupportedEffectListN() const {
  if (!APP_ASSERT(__pAudioEffectorImpl != null, kAppNotYetConstructed)) return nullptr;
  return __pAudioEffectorImpl->GetSupportedEffectListN();
}

IListT<AudioEffectPreset>* AudioEffector::GetSupportedEffectPresetListN() const {
  if (!APP_ASSERT(__pAudioEffectorImpl != null, kAppNotYetConstructed)) return nullptr;
  return __pAudioEffectorImpl->GetSupportedEffectPresetListN();
}

result AudioEffector::SetEffectLevel(AudioEffectType type, int level) {
  ClearLastResult();
  if (!APP_ASSERT(__pAudioEffectorImpl != null, kAppNotYetConstructed)) return E_INVALID_STATE;
  const result r = __pAudioEffectorImpl->SetEffectLevel(type, level);
  if (r == E_SUCCESS) return r;
  return FailTagged(r, __PRETTY_FUNCTION__, "[%s] Failed to perform SetEffectLevel operation.",
                    GetErrorMessage(r));
}

result AudioEffector::GetEffectLevel(AudioEffectType type, int& level) const {
  ClearLastResult();
  if (!APP_ASSERT(__pAudioEffectorImpl != null, kAppNotYetConstructed)) return E_INVALID_STATE;
  const result r = __pAudioEffectorImpl->GetEffectLevel(type, level);
  if (r == E_SUCCESS) return r;
  return FailTagged(r, __PRETTY_FUNCTION__, "[%s] Failed to perform GetEffectLevel operation.",
                    GetErrorMessage(r));
}

result AudioEffector::GetEffectLevelRange(AudioEffectType type, int& minValue,
                                          int& maxValue) const {
  ClearLastResult();
  if (!APP_ASSERT(__pAudioEffectorImpl != null, kAppNotYetConstructed)) return E_INVALID_STATE;
  const result r = __pAudioEffectorImpl->GetEffectLevelRange(type, minValue, maxValue);
  if (r == E_SUCCESS) return r;
  return FailTagged(r, __PRETTY_FUNCTION__, "[%s] Failed to perform GetEffectLevelRange operation.",
                    GetErrorMessage(r));
}

result AudioEffector::ResetAllToDefault() {
  ClearLastResult();
  if (!APP_ASSERT(__pAudioEffectorImpl != null, kAppNotYetConstructed)) return E_INVALID_STATE;
  return __pAudioEffectorImpl->ResetAllToDefault();
}

result AudioEffector::SetEffectPreset(AudioEffectPreset preset) {
  ClearLastResult();
  if (!APP_ASSERT(__pAudioEffectorImpl != null, kAppNotYetConstructed)) return E_INVALID_STATE;
  const result r = __pAudioEffectorImpl->SetEffectPreset(preset);
  if (r == E_SUCCESS) return r;
  return FailTagged(r, __PRETTY_FUNCTION__, "[%s] Failed to perform SetEffectPreset operation.",
                    GetErrorMessage(r));
}

}  // namespace Zelkora::Media
