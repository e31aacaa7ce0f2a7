#pragma once

#include <Tizen/Media/Player.h>
#include <Zelkora/Media/IAudioSessionEventListener.h>
#include <Zelkora/Media/IAudioVolumeEventListener.h>

#include <mutex>

/// Keeps the volume that its user chose, pauses on an interruption, resumes afterwards only if it
/// was playing, and plays on without what it isn't permitted to do.
///
/// To live as long as the program: the managers are deleted at exit and call no listener any more,
/// so it needn't be taken back from them, which could be refused.
class MusicPlayer : public Zelkora::Media::IAudioSessionEventListener,
                    public Zelkora::Media::IAudioVolumeEventListener {
 public:
  bool Open(const char* file);

  // Without the privilege there is no manager: music plays all the same.
  void FollowInterruptions();
  void KeepVolume();

  // Called on the main thread. Asking for music during an interruption means: afterwards.
  void Play();
  void Pause();

  // The rest is called on the platform's event thread.
  void OnAudioSessionInterruptStarted() override;
  void OnAudioSessionInterruptFinished() override;
  void OnAudioSessionDisrupted() override;
  void OnMediaVolumeChanged(int level) override;

 private:
  void Start();
  void Stop();

  std::mutex mutex_;  // guards what follows
  Tizen::Media::Player player_;
  bool wanted_ = false;  // the user wants to hear music
  bool interrupted_ = false;
};
