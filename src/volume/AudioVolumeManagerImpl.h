/// \file
#pragma once

#include <Tizen/Base/Object.h>
#include <Zelkora/Media/AudioVolumeManager.h>

namespace Zelkora::Media {

class IAudioVolumeEventListener;
class _AudioVolumeEvent;
class _AudioVolumeEventArg;

/// Asks the sound manager for everything, and turns its notifications into events.
class _AudioVolumeManagerImpl : public Tizen::Base::Object {
 public:
  _AudioVolumeManagerImpl() = default;
  ~_AudioVolumeManagerImpl() override;

  result Construct();

  // The three operations of a sound category; \p type is a `_SoundType`.
  result GetVolumeRange(int type, int& min, int& max) const;
  result SetVolumeLevel(int type, int level);
  int GetCurrentVolumeLevel(int type) const;

  result MuteAll();
  result UnmuteAll();
  AudioMuteStatus GetMuteStatus() const;

  result AddAudioVolumeEventListener(IAudioVolumeEventListener& listener);
  result RemoveAudioVolumeEventListener(IAudioVolumeEventListener& listener);

 private:
  // Called by the sound manager on a thread of its own; the user data is the implementation object.
  static void VolumeChangedCallback(int type, int volume, void* userData);
  static void MuteAllChangedCallback(bool muteAll, void* userData);

  void FireVolumeChangedEvent(int type, int volume);
  void FireMuteChangedEvent(bool muteAll);
  void Fire(_AudioVolumeEventArg& arg);

  _AudioVolumeEvent* __pAudioSessionEvent = nullptr;
};

}  // namespace Zelkora::Media
