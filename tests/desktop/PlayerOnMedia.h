/// \file
#pragma once

#include "GstreamerEnd.h"
#include "support/ReadFile.h"

#include <Tizen/Base/Result.h>
#include <Tizen/Media/Player.h>
#include <Tizen/Media/PlayerImpl.h>
#include <Zelkora/Media/VideoKeyFrameSeeker.h>
#include <gmock/gmock.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <string>
#include <thread>
#include <vector>

/// \return the path of a file that make-media made.
inline std::string Media(const std::string& name) {
  return std::string(std::getenv("ZELKORA_TEST_MEDIA")) + "/" + name;
}

inline void WriteFile(const std::string& path, const std::string& content) {
  std::ofstream(path, std::ios::binary) << content;
}

/// A file that only this process has, and only as long as this lives.
struct ScratchFile {
  explicit ScratchFile(const std::string& name, const std::string& content = "")
      : path(Media(std::to_string(getpid()) + "-" + name)) {
    WriteFile(path, content);
  }
  ~ScratchFile() { unlink(path.c_str()); }

  const std::string path;
};

/// A player with a seeker, and no sound server.
class PlayerOnMedia : public testing::Test {
 protected:
  PlayerOnMedia() {
    setenv("PULSE_SERVER", "unix:/nonexistent/pulse", 1);
    setenv("ZELKORA_LOG", "debug", 1);
    EXPECT_EQ(player.Construct(), E_SUCCESS);
    EXPECT_EQ(seeker.Construct(player), E_SUCCESS);
  }

  result Open(const std::string& name) { return player.OpenFile(Media(name).c_str()); }

  std::vector<unsigned char> Capture() {
    Tizen::Media::VideoFrame frame;
    EXPECT_EQ(player.CaptureFrame(frame), E_SUCCESS);
    EXPECT_EQ(frame.pixels.size(), static_cast<std::size_t>(frame.width * frame.height * 3));
    return frame.pixels;
  }

  /// Expects that the player goes on playing from within a second of \p begin on.
  void ExpectPlaying(long begin) {
    const long first = player.GetPosition();
    EXPECT_GE(first, begin);
    EXPECT_LT(first, begin + 1000);
    ExpectSoon([=] { return player.GetPosition() > begin + 200; });
  }

  template <typename Condition>
  static void ExpectSoon(Condition condition) {
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(10);
    while (!condition()) {
      ASSERT_LT(std::chrono::steady_clock::now(), end);
      std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
  }

  Tizen::Media::Player player;
  Zelkora::Media::VideoKeyFrameSeeker seeker;
};
