/// \file
/// What stands behind a player. For extensions of the media framework, not for applications.
#pragma once

#include <Tizen/Base/Object.h>
#include <player.h>

namespace Tizen::Media {

class Player;

/// The implementation object of a `Player`, which owns it.
class _PlayerImpl : public Tizen::Base::Object {
 public:
  /// \return the object behind \p pPlayer, or null when the pointer is null or the player was never
  /// constructed. It lives as long as the player.
  static _PlayerImpl* GetInstance(Player* pPlayer);

  _PlayerImpl() = default;
  ~_PlayerImpl() override;

  /// Creates the native player.
  result Construct();

  /// Moves the player and returns when the new position is known.
  /// \param msTime the position to move to, in milliseconds, from 0 to the length
  /// \param exact false: to the last key frame at or before the position, or to the first one of
  /// all; true: to the position itself
  /// \return `E_SUCCESS`; `E_INVALID_STATE` when no file is open; `E_INVALID_ARG` for a position
  /// outside the file; `E_INVALID_OPERATION` when the file has no video or can't be sought in;
  /// `E_OUT_OF_MEMORY`; `E_SYSTEM` when there is no intact key frame, or the media framework fails
  /// or doesn't answer in time. A failure is the caller's to log, only its reason is logged, at
  /// level debug; success leaves the last result alone.
  result SeekTo(long msTime, bool exact);

  /// The native player; null before `Construct`.
  player_h __hPlayer = nullptr;
};

}  // namespace Tizen::Media
