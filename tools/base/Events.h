#pragma once

#include <Zelkora/Media/AudioSessionManager.h>
#include <Zelkora/Media/IAudioSessionEventListener.h>
#include <Zelkora/Media/IAudioVolumeEventListener.h>

#include <mutex>
#include <string>
#include <vector>

namespace CommandLine {

/// Lines of text that any thread writes and the program's main thread prints.
class Lines {
 public:
  Lines();
  ~Lines();
  Lines(const Lines&) = delete;
  Lines& operator=(const Lines&) = delete;

  /// Adds a line at the end.
  void Add(std::string line);

  /// \return the lines in order, which are forgotten.
  std::vector<std::string> Take();

  /// \return a descriptor that is readable while there are lines.
  int Descriptor() const { return descriptor_; }

 private:
  const int descriptor_;
  std::mutex mutex_;
  std::vector<std::string> lines_;
};

/// Hears of volumes, of muting and of interruptions for as long as it exists, and puts each event
/// in the words that also the commands have: "volume media 9", "mute on", "interruption started".
class Events : public Zelkora::Media::IAudioVolumeEventListener,
               public Zelkora::Media::IAudioSessionEventListener {
 public:
  /// \param lines receives a line for each event; must outlive this
  /// \param mark what the lines begin with
  explicit Events(Lines& lines, std::string mark = "") : lines_(lines), mark_(std::move(mark)) {}
  ~Events() override;

  // Each begins to listen, or throws a `Failure`.
  void ListenToVolumes();
  void ListenToSession();

 private:
  void OnSystemVolumeChanged(int level) override { AddVolume("system", level); }
  void OnNotificationVolumeChanged(int level) override { AddVolume("notification", level); }
  void OnAlarmVolumeChanged(int level) override { AddVolume("alarm", level); }
  void OnRingtoneVolumeChanged(int level) override { AddVolume("ringtone", level); }
  void OnMediaVolumeChanged(int level) override { AddVolume("media", level); }
  void OnCallVolumeChanged(int level) override { AddVolume("call", level); }
  void OnMuteAllStatusChanged(Zelkora::Media::AudioMuteStatus status) override;
  void OnAudioSessionInterruptStarted() override { Add("interruption started"); }
  void OnAudioSessionInterruptFinished() override { Add("interruption finished"); }
  void OnAudioSessionDisrupted() override { Add("disruption"); }

  void Add(const std::string& event) { lines_.Add(mark_ + event); }
  void AddVolume(const char* category, int level);

  Lines& lines_;
  const std::string mark_;
  Zelkora::Media::AudioVolumeManager* volumes_ = nullptr;   // null while this doesn't listen to it
  Zelkora::Media::AudioSessionManager* session_ = nullptr;  // likewise
};

}  // namespace CommandLine
