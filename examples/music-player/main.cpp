// A music player's skeleton: keeps the volume that its user chose, pauses on an interruption,
// resumes afterwards only if it was playing, and plays on without what it isn't permitted to do.
//
//     music-player FILE        reads "play", "pause" and "quit" from standard input

#include <Tizen/Base/Result.h>
#include <Tizen/Media/Player.h>
#include <Zelkora/Media/AudioSessionManager.h>
#include <Zelkora/Media/AudioVolumeManager.h>
#include <Zelkora/Media/IAudioSessionEventListener.h>
#include <Zelkora/Media/IAudioVolumeEventListener.h>

#include <fstream>
#include <iostream>
#include <mutex>
#include <string>

using namespace Zelkora::Media;

namespace {

constexpr char kVolumeFile[] = "music-player.volume";  // in the current folder

void Tell(const std::string& text) { std::cout << text << std::endl; }

std::string WithLastResult(const char* text) {
  return std::string(text) + ": " + GetErrorMessage(GetLastResult());
}

class MusicPlayer : public IAudioSessionEventListener, public IAudioVolumeEventListener {
 public:
  bool Open(const char* file) {
    return player_.Construct() == E_SUCCESS && player_.OpenFile(file) == E_SUCCESS;
  }

  // Without the privilege there is no manager: music plays all the same.
  void FollowInterruptions() {
    AudioSessionManager* session = AudioSessionManager::GetInstance();
    if (session == nullptr || session->SetAudioSessionEventListener(this) != E_SUCCESS) {
      Tell(WithLastResult("not pausing on interruptions"));
    }
  }

  void KeepVolume() {
    AudioVolumeManager* volume = AudioVolumeManager::GetInstance();
    if (volume == nullptr || volume->AddAudioVolumeEventListener(*this) != E_SUCCESS) {
      return Tell(WithLastResult("not keeping the volume"));
    }
    int level = 0;
    if (std::ifstream(kVolumeFile) >> level) volume->SetMediaVolumeLevel(level);
    level = volume->GetCurrentMediaVolumeLevel();
    Tell(level >= 0 ? "volume " + std::to_string(level) : WithLastResult("volume unknown"));
  }

  // Called on the main thread. Asking for music during an interruption means: afterwards.
  void Play() {
    std::lock_guard lock(mutex_);
    wanted_ = true;
    if (interrupted_) return Tell("will play after the interruption");
    Start();
  }

  void Pause() {
    std::lock_guard lock(mutex_);
    Stop();
  }

  // The rest is called on the platform's event thread.
  void OnAudioSessionInterruptStarted() override {
    std::lock_guard lock(mutex_);
    interrupted_ = true;
    if (wanted_ && player_.Pause() == E_SUCCESS) Tell("paused for an interruption");
  }

  void OnAudioSessionInterruptFinished() override {
    std::lock_guard lock(mutex_);
    interrupted_ = false;
    if (wanted_) Start();
  }

  void OnAudioSessionDisrupted() override {
    std::lock_guard lock(mutex_);
    interrupted_ = false;  // its end may never be told
    Stop();
  }

  void OnMediaVolumeChanged(int level) override { std::ofstream(kVolumeFile) << level << '\n'; }

 private:
  void Start() { Tell(player_.Play() == E_SUCCESS ? "playing" : WithLastResult("not playing")); }

  void Stop() {
    wanted_ = false;
    Tell(player_.Pause() == E_SUCCESS ? "paused" : WithLastResult("not paused"));
  }

  std::mutex mutex_;  // guards what follows
  Tizen::Media::Player player_;
  bool wanted_ = false;  // the user wants to hear music
  bool interrupted_ = false;
};

// Made before the managers, so it outlives them: they are deleted at exit and call no listener any
// more. It needn't be taken back from them, which could be refused.
MusicPlayer music;

}  // namespace

int main(int count, char** arguments) {
  if (count != 2) return Tell("usage: music-player FILE"), 2;
  if (!music.Open(arguments[1])) return Tell(WithLastResult("cannot open the file")), 1;
  music.KeepVolume();
  music.FollowInterruptions();
  music.Play();
  for (std::string line; std::getline(std::cin, line) && line != "quit";) {
    if (line == "play") music.Play();
    if (line == "pause") music.Pause();
  }
}
