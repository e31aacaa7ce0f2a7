/// \file
#pragma once

#include <Tizen/Base/Object.h>

#include <vector>

namespace Tizen::Media {

class _PlayerImpl;

/// A picture: rows from top to bottom without padding, three bytes (red, green, blue) a pixel.
///
/// It stands upright, and its pixels are square, whichever way the file stores it. A picture that
/// is known to be damaged is never handed out; damage that the decoder conceals can't be known.
struct VideoFrame {
  int width = 0;
  int height = 0;
  std::vector<unsigned char> pixels;
};

/// Plays a media file.
///
/// An operation blocks until the player has done what it says, at most some seconds; positions and
/// durations are in milliseconds. Every failure is logged and recorded as the last result; success
/// leaves the last result alone. After a failure the player stays usable: another file can be
/// opened. One player may be used by several threads; operations run one after the other.
class Player : public Tizen::Base::Object {
 public:
  Player() = default;

  /// Closes the file.
  ~Player() override;

  /// Makes the player ready for use; until then it has no implementation object and every other
  /// operation fails with `E_INVALID_STATE`.
  /// \return `E_SUCCESS`, `E_INVALID_STATE` when constructed already, `E_OUT_OF_MEMORY`, or
  /// `E_SYSTEM` when the device's media framework can't be started
  result Construct();

  /// Opens a file, replacing the one that is open, and pauses on its first frame.
  /// \param path the file's path, in the file system's encoding
  /// \return `E_SUCCESS`; `E_INVALID_ARG` for a null or empty path or a file that isn't playable
  /// media; `E_OBJ_NOT_FOUND` when there is no such file; `E_OUT_OF_MEMORY`; `E_SYSTEM` when it
  /// can't be read or the media framework fails. After a failure no file is open.
  result OpenFile(const char* path);

  /// Closes the file. \return `E_SUCCESS`, also when no file is open
  result Close();

  /// Starts or resumes playing; at the end of the file, from its start again.
  /// \return `E_SUCCESS`, `E_INVALID_STATE` when no file is open, `E_INVALID_OPERATION` when a file
  /// that can't be sought in would have to start over, `E_SYSTEM`
  result Play();

  /// Pauses at the current position.
  /// \return `E_SUCCESS`, `E_INVALID_STATE` when no file is open, `E_SYSTEM`
  result Pause();

  /// Tells whether playing has come to the end of the file. The player then stands there: its
  /// position is the end, `CaptureFrame` gives the last picture, and a seek leaves it paused.
  /// \return false also when no file is open
  bool IsAtEnd() const;

  /// \return the position in milliseconds, or -1: `E_INVALID_STATE` when no file is open, else
  /// `E_SYSTEM`
  long GetPosition() const;

  /// The first time, a file whose container doesn't tell may be read for it, for some seconds.
  /// \return the length in milliseconds, or -1: `E_INVALID_STATE` when no file is open, else
  /// `E_SYSTEM`
  long GetDuration() const;

  /// Tells whether the last seek showed a key frame: a frame that is decoded without any other.
  /// \return false also when there was no seek or no file is open, or when nobody can know
  bool IsKeyFrame() const;

  /// Finds all key frames of the file, which is read whole for it: that takes as long as the file
  /// needs. Closing the file meanwhile, on another thread, ends it.
  /// \param positions receives where they are, ascending, in milliseconds; untouched on failure
  /// \return `E_SUCCESS`; `E_INVALID_STATE` when no file is open; `E_INVALID_OPERATION` when the
  /// file has no video; `E_OUT_OF_MEMORY`; `E_SYSTEM`
  result GetKeyFrames(std::vector<long>& positions) const;

  /// Copies the frame at the current position.
  /// \param frame receives the picture; untouched on failure
  /// \return `E_SUCCESS`; `E_INVALID_STATE` when no file is open; `E_INVALID_OPERATION` when the
  /// file has no video; `E_OUT_OF_MEMORY`; `E_SYSTEM`, also when there is no frame, as before video
  /// that starts late, or the frame is damaged
  result CaptureFrame(VideoFrame& frame) const;

  /// Writes the sound of the open file, as it would be heard with the effects that are set, to a
  /// WAV file of 16-bit stereo samples, faster than in real time. Position and playing go on as
  /// they were. Unlike other operations it takes as long as the file needs.
  /// \param path the file to write; one that exists is replaced, and a failure leaves none
  /// \return `E_SUCCESS`; `E_INVALID_ARG` for a null or empty path; `E_INVALID_STATE` when no file
  /// is open; `E_INVALID_OPERATION` when the file has no sound, or the device renders none;
  /// `E_SYSTEM` when the file can't be written or the media framework fails
  result RenderAudio(const char* path) const;

 private:
  friend class _PlayerImpl;

  _PlayerImpl* __pPlayerImpl = nullptr;
};

}  // namespace Tizen::Media
