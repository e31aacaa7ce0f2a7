/// \file
#pragma once

#include <Tizen/Base/Object.h>

namespace Tizen::Media {
class Player;
class _PlayerImpl;
}  // namespace Tizen::Media

namespace Zelkora::Media {

class _VideoKeyFrameSeekerImpl : public Tizen::Base::Object {
 public:
  _VideoKeyFrameSeekerImpl() = default;
  ~_VideoKeyFrameSeekerImpl() override;

  result Construct(Tizen::Media::Player& player);
  result SeekTo(long msTime);

 private:
  Tizen::Media::_PlayerImpl* __pPlayerImpl = nullptr;  // the player's own
};

}  // namespace Zelkora::Media
