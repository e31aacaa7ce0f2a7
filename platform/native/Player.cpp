#include "PlayerError.h"

#include <Host/Calls.h>
#include <Tizen/Base/Log.h>
#include <Tizen/Media/Player.h>
#include <Tizen/Media/PlayerImpl.h>

#include <cstddef>
#include <memory>
#include <new>
#include <utility>

namespace Tizen::Media {
namespace {

/// Reports a failure found before the native player was asked.
result Fail(result r, const char* reason, int line = __builtin_LINE()) {
  SysLogExceptionInternal(Host::kPlayerModule, r, "", line, "[%s] %s", GetErrorMessage(r), reason);
  return r;
}

/// \return the result of a native function, which has logged its failure, as the last result too.
result Report(int error) {
  const result r = Host::ConvertPlayerErrorToResult(error);
  if (r != E_SUCCESS) SetLastResult(r);
  return r;
}

/// Runs a native function, which logs its own failures, on the player behind \p pImpl.
template <typename... Parameters, typename... Arguments>
result Call(_PlayerImpl* pImpl, int (*function)(player_h, Parameters...), Arguments... arguments) {
  if (pImpl == nullptr) return Fail(E_INVALID_STATE, "the player is not constructed");
  return Report(function(pImpl->__hPlayer, arguments...));
}

/// \return what a native function tells of the player, or \p otherwise when it fails
template <typename Value>
Value Ask(_PlayerImpl* pImpl, int (*function)(player_h, Value*), Value otherwise) {
  Value told = otherwise;
  return Call(pImpl, function, &told) == E_SUCCESS ? told : otherwise;
}

}  // namespace

_PlayerImpl* _PlayerImpl::GetInstance(Player* pPlayer) {
  Host::OnCall("_PlayerImpl::GetInstance");
  return pPlayer == nullptr ? nullptr : pPlayer->__pPlayerImpl;
}

_PlayerImpl::~_PlayerImpl() {
  if (__hPlayer != nullptr) player_destroy(__hPlayer);
}

result _PlayerImpl::Construct() { return Report(player_create(&__hPlayer)); }

result _PlayerImpl::SeekTo(long msTime, bool exact) {
  if (auto failure =
          Host::OnCall("_PlayerImpl::SeekTo", "%ld, %s", msTime, exact ? "true" : "false")) {
    return static_cast<result>(*failure);
  }
  return Call(this, player_seek, msTime, exact);
}

Player::~Player() { delete __pPlayerImpl; }

result Player::Construct() {
  if (__pPlayerImpl != nullptr) return Fail(E_INVALID_STATE, "the player is constructed already");
  std::unique_ptr<_PlayerImpl> pImpl(new (std::nothrow) _PlayerImpl);
  if (pImpl == nullptr) return Fail(E_OUT_OF_MEMORY, "no memory for a player");
  const result r = pImpl->Construct();
  if (r == E_SUCCESS) __pPlayerImpl = pImpl.release();
  return r;
}

result Player::OpenFile(const char* path) { return Call(__pPlayerImpl, player_open, path); }

result Player::Close() { return Call(__pPlayerImpl, player_close); }

result Player::Play() { return Call(__pPlayerImpl, player_play); }

result Player::Pause() { return Call(__pPlayerImpl, player_pause); }

long Player::GetPosition() const { return Ask(__pPlayerImpl, player_get_position, -1L); }

long Player::GetDuration() const { return Ask(__pPlayerImpl, player_get_duration, -1L); }

bool Player::IsKeyFrame() const { return Ask(__pPlayerImpl, player_is_key_frame, false); }

bool Player::IsAtEnd() const { return Ask(__pPlayerImpl, player_is_at_end, false); }

// What a callback throws becomes an error code of the function that calls it.

result Player::GetKeyFrames(std::vector<long>& positions) const {
  std::vector<long> found;
  const auto add = [](long position, void* userData) {
    static_cast<std::vector<long>*>(userData)->push_back(position);
    return true;
  };
  const result r = Call(__pPlayerImpl, player_foreach_key_frame, player_key_frame_cb(add),
                        static_cast<void*>(&found));
  if (r == E_SUCCESS) positions = std::move(found);
  return r;
}

result Player::CaptureFrame(VideoFrame& frame) const {
  VideoFrame captured;
  const auto copy = [](const unsigned char* pixels, int width, int height, int stride,
                       void* userData) {
    auto& target = *static_cast<VideoFrame*>(userData);
    for (int row = 0; row < height; ++row, pixels += stride) {
      target.pixels.insert(target.pixels.end(), pixels, pixels + std::ptrdiff_t{3} * width);
    }
    target.width = width;
    target.height = height;
  };
  const result r = Call(__pPlayerImpl, player_capture_frame, player_frame_cb(copy),
                        static_cast<void*>(&captured));
  if (r == E_SUCCESS) frame = std::move(captured);
  return r;
}

result Player::RenderAudio(const char* path) const {
  return Call(__pPlayerImpl, player_render_audio, path);
}

}  // namespace Tizen::Media
