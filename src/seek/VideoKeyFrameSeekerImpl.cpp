#include "VideoKeyFrameSeekerImpl.h"

#include "base/Log.h"

#include <Tizen/Media/PlayerImpl.h>

namespace Zelkora::Media {

using Tizen::Media::_PlayerImpl;

_VideoKeyFrameSeekerImpl::~_VideoKeyFrameSeekerImpl() { __pPlayerImpl = nullptr; }

result _VideoKeyFrameSeekerImpl::Construct(Tizen::Media::Player& player) {
  __pPlayerImpl = _PlayerImpl::GetInstance(&player);
  if (__pPlayerImpl == nullptr) {
    return Fail(E_INVALID_ARG, "[E_INVALID_ARG] player instance is wrong");
  }
  return E_SUCCESS;
}

result _VideoKeyFrameSeekerImpl::SeekTo(long msTime) {
  constexpr bool kExact = false;  // to a key frame, not to the position itself
  return __pPlayerImpl->SeekTo(msTime, kExact);
}

}  // namespace Zelkora::Media
