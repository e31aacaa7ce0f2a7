#include "VideoKeyFrameSeekerImpl.h"

#include "frame/Assert.h"
#include "frame/Capabilities.h"
#include "frame/Log.h"

#include <Zelkora/Media/VideoKeyFrameSeeker.h>

#include <new>

namespace Zelkora::Media {

VideoKeyFrameSeeker::VideoKeyFrameSeeker() : __pVideoKeyFrameSeekerImpl(nullptr) {}

VideoKeyFrameSeeker::~VideoKeyFrameSeeker() {
  delete __pVideoKeyFrameSeekerImpl;
  __pVideoKeyFrameSeekerImpl = nullptr;
}

result VideoKeyFrameSeeker::Construct(Tizen::Media::Player& player) {
  result r = CheckFeature(kVideoKeyFrameSeekerFeature, __PRETTY_FUNCTION__);
  if (r != E_SUCCESS) return r;
  if (!APP_ASSERT(__pVideoKeyFrameSeekerImpl == null, kAlreadyConstructed)) return E_INVALID_STATE;

  __pVideoKeyFrameSeekerImpl = new (std::nothrow) _VideoKeyFrameSeekerImpl;
  if (__pVideoKeyFrameSeekerImpl == nullptr) {
    return FailTagged(E_OUT_OF_MEMORY, __PRETTY_FUNCTION__,
                      "[E_OUT_OF_MEMORY] Memory allocation failed");
  }
  r = __pVideoKeyFrameSeekerImpl->Construct(player);
  if (r != E_SUCCESS) {
    FailTagged(r, __PRETTY_FUNCTION__, "[%s] Failed to construct __pVideoKeyFrameSeekerImpl.",
               GetErrorMessage(r));
    delete __pVideoKeyFrameSeekerImpl;
    __pVideoKeyFrameSeekerImpl = nullptr;
    return r;
  }
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
