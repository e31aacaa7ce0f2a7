#include <Zelkora/Media/AudioEffector.h>

#include "AudioEffectorImpl.h"
#include "base/Assert.h"
#include "base/Capabilities.h"
#include "base/Log.h"

#include <functional>
#include <memory>
#include <new>
#include <utility>

namespace Zelkora::Media {

using Tizen::Base::Collection::IListT;
using Impl = _AudioEffectorImpl;

namespace {

/// Runs an operation whose failure the effector reports once more, as \p failure.
template <typename Operation, typename... Arguments>
result Perform(Impl* pImpl, Signature caller, const char* failure, Operation operation,
               Arguments&&... arguments) {
  ClearLastResult();
  if (pImpl == nullptr) {
    AppassertfInternal("__pAudioEffectorImpl != null", caller.text, caller.line,
                       kAppNotYetConstructed);
    return E_INVALID_STATE;
  }
  const result r = std::invoke(operation, pImpl, std::forward<Arguments>(arguments)...);
  return r == E_SUCCESS ? r : FailTagged(r, caller, failure, GetErrorMessage(r));
}

}  // namespace

AudioEffector::AudioEffector() : __pAudioEffectorImpl(nullptr) {}

AudioEffector::~AudioEffector() {
  delete __pAudioEffectorImpl;
  __pAudioEffectorImpl = nullptr;
}

result AudioEffector::Construct(Tizen::Media::Player& player) {
  result r = CheckFeature(kAudioEffectorFeature, __PRETTY_FUNCTION__);
  if (r != E_SUCCESS) return r;
  if (!APP_ASSERT(__pAudioEffectorImpl == null, kAlreadyConstructed)) return E_INVALID_STATE;

  std::unique_ptr<Impl> pImpl(new (std::nothrow) Impl);
  if (pImpl == nullptr) {
    return FailTagged(E_OUT_OF_MEMORY, __PRETTY_FUNCTION__,
                      "[E_OUT_OF_MEMORY] Memory allocation failed");
  }
  r = pImpl->Construct(player);
  if (r != E_SUCCESS) {
    return FailTagged(r, __PRETTY_FUNCTION__, "[%s] Failed to construct pAudioEffectorImpl.",
                      GetErrorMessage(r));
  }
  __pAudioEffectorImpl = pImpl.release();
  SetLastResult(E_SUCCESS);
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
  return Perform(__pAudioEffectorImpl, __PRETTY_FUNCTION__,
                 "[%s] Failed to perform SetEffectLevel operation.", &Impl::SetEffectLevel, type,
                 level);
}

result AudioEffector::GetEffectLevel(AudioEffectType type, int& level) const {
  return Perform(__pAudioEffectorImpl, __PRETTY_FUNCTION__,
                 "[%s] Failed to perform GetEffectLevel operation.", &Impl::GetEffectLevel, type,
                 level);
}

result AudioEffector::GetEffectLevelRange(AudioEffectType type, int& minValue,
                                          int& maxValue) const {
  return Perform(__pAudioEffectorImpl, __PRETTY_FUNCTION__,
                 "[%s] Failed to perform GetEffectLevelRange operation.",
                 &Impl::GetEffectLevelRange, type, minValue, maxValue);
}

result AudioEffector::ResetAllToDefault() {
  ClearLastResult();
  if (!APP_ASSERT(__pAudioEffectorImpl != null, kAppNotYetConstructed)) return E_INVALID_STATE;
  return __pAudioEffectorImpl->ResetAllToDefault();
}

result AudioEffector::SetEffectPreset(AudioEffectPreset preset) {
  return Perform(__pAudioEffectorImpl, __PRETTY_FUNCTION__,
                 "[%s] Failed to perform SetEffectPreset operation.", &Impl::SetEffectPreset,
                 preset);
}

}  // namespace Zelkora::Media
