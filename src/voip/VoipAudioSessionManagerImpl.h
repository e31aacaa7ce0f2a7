/// \file
#pragma once

#include <Tizen/Base/Object.h>
#include <Zelkora/Media/VoipAudioSessionManager.h>
#include <sound_manager.h>

namespace Zelkora::Media {

/// Holds the platform's call session while it is open.
class _VoipAudioSessionManagerImpl : public Tizen::Base::Object {
 public:
  _VoipAudioSessionManagerImpl() = default;

  /// Closes a session that is still open.
  ~_VoipAudioSessionManagerImpl() override;

  result Construct();

  result EnterCallSession();
  result ExitCallSession();
  result SetCallSessionMode(VoipAudioSessionMode mode);
  VoipAudioSessionMode GetCallSessionMode() const;

 private:
  sound_call_session_h __soundCallSessionHandle = nullptr;  // null: no session is open
};

}  // namespace Zelkora::Media
