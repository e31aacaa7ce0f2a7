/// \file
#pragma once

#include <Host/Events.h>
#include <sound_manager.h>

#include <chrono>
#include <condition_variable>
#include <functional>
#include <mutex>
#include <string>
#include <utility>
#include <vector>

/// What has been heard and nobody has taken.
class Inbox {
 public:
  void Put(std::string text) {
    std::lock_guard lock(mutex_);
    texts_.push_back(std::move(text));
    arrived_.notify_all();
  }

  /// \return the next text, waited for; "nothing" when none comes
  std::string Take() {
    std::unique_lock lock(mutex_);
    const auto isThere = [this] { return !texts_.empty(); };
    if (!arrived_.wait_for(lock, std::chrono::seconds(10), isThere)) return "nothing";
    const std::string text = texts_.front();
    texts_.erase(texts_.begin());
    return text;
  }

  /// \return the texts of all that the device has been told so far
  std::vector<std::string> TakeAll() {
    Host::WaitUntilDelivered();
    std::lock_guard lock(mutex_);
    return std::exchange(texts_, {});
  }

 private:
  std::mutex mutex_;
  std::condition_variable arrived_;
  std::vector<std::string> texts_;
};

/// How a change of a level is written down.
inline std::string Level(int type, int level) {
  return std::to_string(type) + "=" + std::to_string(level);
}

/// Writes down what the sound manager calls back while it lives: levels, "muted", "unmuted" and
/// "code 5".
class NativeListener : public Inbox {
 public:
  static constexpr int kLevels = 1, kMuteAll = 2, kInterruptions = 4, kAll = 7;

  /// \param kinds what it hears
  /// \param onReport called after each, if there is one
  explicit NativeListener(int kinds, std::function<void()> onReport = {})
      : kinds_(kinds), onReport_(std::move(onReport)) {
    if (kinds & kLevels) {
      sound_manager_set_volume_changed_cb(
          [](int type, int level, void* self) { Hear(self, Level(type, level)); }, this);
    }
    if (kinds & kMuteAll) {
      sound_manager_set_muteall_changed_cb(
          [](bool muteall, void* self) { Hear(self, muteall ? "muted" : "unmuted"); }, this);
    }
    if (kinds & kInterruptions) {
      sound_manager_set_session_interrupted_cb(
          [](int code, void* self) { Hear(self, "code " + std::to_string(code)); }, this);
    }
  }

  ~NativeListener() {
    if (kinds_ & kLevels) sound_manager_unset_volume_changed_cb();
    if (kinds_ & kMuteAll) sound_manager_unset_muteall_changed_cb();
    if (kinds_ & kInterruptions) sound_manager_unset_session_interrupted_cb();
  }

 private:
  static void Hear(void* self, std::string text) {
    auto& listener = *static_cast<NativeListener*>(self);
    listener.Put(std::move(text));
    if (listener.onReport_) listener.onReport_();
  }

  const int kinds_;
  const std::function<void()> onReport_;
};
