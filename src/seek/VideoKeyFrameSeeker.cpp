#include <Zelkora/Media/VideoKeyFrameSeeker.h>

#include "VideoKeyFrameSeekerImpl.h"
#include "base/Assert.h"
#include "base/Capabilities.h"
#include "base/Log.h"

#include <memory>
#include <new>

namespace Zelkora::Media {

using Impl = _VideoKeyFrameSeekerImpl;

VideoKeyFrameSeeker::VideoKeyFrameSeeker() : __pVideoKeyFrameSeekerImpl(nullptr) {}

VideoKeyFrameSeeker::~VideoKeyFrameSeeker() {
  delete __pVideoKeyFrameSeekerImpl;
  __pVideoKeyFrameSeekerImpl = nullptr;
}

result VideoKeyFrameSeeker::Construct(Tizen::Media::Player& player) {
  result r = CheckFeature(kVideoKeyFrameSeekerFeature, __PRETTY_FUNCTION__);
  if (r != E_SUCCESS) return r;
  if (!APP_ASSERT(__pVideoKeyFrameSeekerImpl == null, kAlreadyConstructed)) return E_INVALID_STATE;

  std::unique_ptr<Impl> pImpl(new (std::nothrow) Impl);
  if (pImpl == nullptr) {
    return FailTagged(E_OUT_OF_MEMORY, __PRETTY_FUNCTION__,
                      "[E_OUT_OF_MEMORY] Memory allocation failed");
  }
  r = pImpl->Construct(player);
  if (r != E_SUCCESS) {
    return FailTagged(r, __PRETTY_FUNCTION__,
                      "[%s] Failed to construct __pVideoKeyFrameSeekerImpl.", GetErrorMessage(r));
  }
  __pVideoKeyFrameSeekerImpl = pImpl.release();
  SetLastResult(E_SUCCESS);
  return E_SUCCESS;
}

result VideoKeyFrameSeeker::SeekTo(long msTime) {
  if (!APP_ASSERT(__pVideoKeyFrameSeekerImpl != null, kAppNotYetConstructed)) {
    return E_INVALID_STATE;
  }
  const result r = __pVideoKeyFrameSeekerImpl->SeekTo(msTime);
  if (r != E_SUCCESS) return Fail(r, "[%s] SeekTo failed", GetErrorMessage(r));
  return E_SUCCESS;
}

}  // namespace Zelkora::Media
