/// \file
#pragma once

#include <Tizen/Base/Object.h>
#include <Zelkora/Media/Export.h>

namespace Tizen::Media {
class Player;
}

namespace Zelkora::Media {

class _VideoKeyFrameSeekerImpl;

/// Moves a media player to a key frame near a given position.
///
/// A key frame is decoded without any other, so moving there is fast: what a scrubbing bar or a
/// strip of thumbnails wants. The device must have the feature
/// "/tizen/feature/zelkora_extension_2.2"; no privilege is needed.
///
/// \code
/// VideoKeyFrameSeeker seeker;
/// if (seeker.Construct(player) == E_SUCCESS && seeker.SeekTo(90000) == E_SUCCESS) {
///   long landed = player.GetPosition();  // at or before 90,000 ms
/// }
/// \endcode
///
/// Ownership: the seeker keeps a pointer into the player without owning it. The player must outlive
/// every use of the seeker; destroying the seeker doesn't touch the player.
///
/// Threads: work is done on the caller's thread. Calls of one seeker may overlap as far as the
/// player permits it, but not with `Construct` or with the seeker's destruction.
class ZELKORA_MEDIA_API VideoKeyFrameSeeker : public Tizen::Base::Object {
 public:
  /// Makes a seeker that is bound to no player: `Construct` must succeed before use.
  VideoKeyFrameSeeker();

  /// Releases the seeker; the player is left as it is.
  ~VideoKeyFrameSeeker() override;

  /// Binds the seeker to a player for the rest of its life. After a failure the seeker is as
  /// before, and `Construct` may be called again; after a success that is a programming error,
  /// reported by an assertion.
  ///
  /// \param player a constructed player; a file need not be open yet
  /// \return what is then also the last result, on success too, except for `E_INVALID_STATE`, which
  /// doesn't touch it:
  /// - `E_SUCCESS`
  /// - `E_UNSUPPORTED_OPERATION` when the device lacks the feature
  /// - another code of the feature's lookup when that fails, unchanged
  /// - `E_OUT_OF_MEMORY`
  /// - `E_INVALID_ARG` when the player was never constructed
  /// - `E_INVALID_STATE` when the seeker is constructed already, where assertions return
  result Construct(Tizen::Media::Player& player);

  /// Moves the player to a key frame near \p msTime. Calling it before `Construct` is a programming
  /// error, reported by an assertion.
  ///
  /// The position goes to the player unchanged; which key frame is near and what positions are
  /// outside the media is the player's to judge.
  ///
  /// On the host platform it is the last key frame at or before the position, or the first one of
  /// the file. A position means its whole millisecond: a key frame at 1999.6 ms counts for 1999.
  /// The first seek in a file may have to read all of it, for at most five seconds.
  ///
  /// \param msTime the position to move to, in milliseconds from the start
  /// \return `E_SUCCESS`, which leaves the last result as it was; `E_INVALID_STATE` when the seeker
  /// is not constructed, where assertions return, which leaves it too; else the player's code,
  /// unchanged, which is then also the last result. The host platform's player gives:
  /// - `E_INVALID_STATE` when no file is open
  /// - `E_INVALID_ARG` for a position below 0 or above the file's length
  /// - `E_INVALID_OPERATION` when the file has no video, or can't be sought in
  /// - `E_OUT_OF_MEMORY`
  /// - `E_SYSTEM` when there is no intact key frame, or the media framework fails or doesn't answer
  result SeekTo(long msTime);

 private:
  _VideoKeyFrameSeekerImpl* __pVideoKeyFrameSeekerImpl;
};

}  // namespace Zelkora::Media
