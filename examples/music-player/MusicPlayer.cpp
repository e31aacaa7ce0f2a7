#include "MusicPlayer.h"

#include <Tizen/Base/Result.h>
#include <Zelkora/Media/AudioSessionManager.h>
#include <Zelkora/Media/AudioVolumeManager.h>

#include <fstream>
#include <iostream>
#include <string>

using namespace Zelkora::Media;

namespace {

constexpr char kVolumeFile[] = "music-player.volume";  // in the current folder

void Tell(const std::string& text) { std::cout << text << std::endl; }

std::string WithLastResult(const char* text) {
  return std::string(text) + ": " + GetErrorMessage(GetLastResult());
}

}  // namespace

bool MusicPlayer::Open(const char* file) {
  return player_.Construct() == E_SUCCESS && player_.OpenFile(file) == E_SUCCESS;
}

void MusicPlayer::FollowInterruptions() {
  AudioSessionManager* session = AudioSessionManager::GetInstance();
  if (session == nullptr || session->SetAudioSessionEventListener(this) != E_SUCCESS) {
    Tell(WithLastResult("not pausing on interruptions"));
  }
}

void MusicPlayer::KeepVolume() {
  AudioVolumeManager* volume = AudioVolumeManager::GetInstance();
  if (volume == nullptr || volume->AddAudioVolumeEventListener(*this) != E_SUCCESS) {
    return Tell(WithLastResult("not keeping the volume"));
  }
  int level = 0;
  if (std::ifstream(kVolumeFile) >> level) volume->SetMediaVolumeLevel(level);
  level = volume->GetCurrentMediaVolumeLevel();
  Tell(level >= 0 ? "volume " + std::to_string(level) : WithLastResult("volume unknown"));
}

void MusicPlayer::Play() {
  std::lock_guard lock(mutex_);
  wanted_ = true;
  if (interrupted_) return Tell("will play after the interruption");
  Start();
}

void MusicPlayer::Pause() {
  std::lock_guard lock(mutex_);
  Stop();
}

void MusicPlayer::OnAudioSessionInterruptStarted() {
  std::lock_guard lock(mutex_);
  interrupted_ = true;
  if (wanted_ && player_.Pause() == E_SUCCESS) Tell("paused for an interruption");
}

void MusicPlayer::OnAudioSessionInterruptFinished() {
  std::lock_guard lock(mutex_);
  interrupted_ = false;
  if (wanted_) Start();
}

void MusicPlayer::OnAudioSessionDisrupted() {
  std::lock_guard lock(mutex_);
  interrupted_ = false;  // its end may never be told
  Stop();
}

void MusicPlayer::OnMediaVolumeChanged(int level) { std::ofstream(kVolumeFile) << level << '\n'; }

void MusicPlayer::Start() {
  Tell(player_.Play() == E_SUCCESS ? "playing" : WithLastResult("not playing"));
}

void MusicPlayer::Stop() {
  wanted_ = false;
  Tell(player_.Pause() == E_SUCCESS ? "paused" : WithLastResult("not paused"));
}
