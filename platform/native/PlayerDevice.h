/// \file
/// What a device gives for `player.h`, to native/PlayerFunctions.cpp.
#pragma once

#include "EffectSettings.h"

#include <player.h>

#include <atomic>
#include <functional>
#include <memory>

/// All of it may throw, for a failure what `Host::PlayerFailure` gives back. Pointers and paths
/// have been checked. Several players are used at once.
namespace PlayerDevice {

/// An open file, paused at first. Its operations are called one after the other.
class File {
 public:
  virtual ~File() = default;

  virtual void Play() = 0;
  virtual void Pause() = 0;
  virtual bool IsAtEnd() const = 0;
  virtual void Seek(long position, bool isExact) = 0;
  virtual long GetPosition() = 0;
  virtual long GetDuration() = 0;
  virtual bool IsKeyFrame() const = 0;

  /// \param visit returns whether to go on
  virtual void ListKeyFrames(const std::function<bool(long)>& visit) = 0;
  virtual void CaptureFrame(player_frame_cb callback, void* userData) = 0;
  virtual void RenderAudio(const char* path) = 0;
};

/// Called for each player, before all else.
void Start();

/// \param effects followed
/// \param isUnwanted ends long work on the file when it becomes other than 0. Both outlive the file
std::unique_ptr<File> Open(const char* path, const Native::SharedSettings& effects,
                           const std::atomic<int>& isUnwanted);

/// \name Sound effects
/// Called at any time, also during a file's operations. Effects and presets aren't checked.
/// @{
void ListEffects(const std::function<bool(int)>& visit);
void ListPresets(const std::function<bool(int)>& visit);

/// Of an effect's level.
struct Range {
  int min;
  int max;
  int initial;
};

/// Fails for an effect that isn't supported.
Range GetRange(int effect);

/// Fails for a preset that isn't supported.
void CheckPreset(int preset);
/// @}

}  // namespace PlayerDevice
