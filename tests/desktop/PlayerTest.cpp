// The media files are made beforehand by make-media, in the directory that ZELKORA_TEST_MEDIA
// names.

#include <Host/Log.h>
#include <Tizen/Base/Result.h>
#include <Tizen/Media/Player.h>
#include <Tizen/Media/PlayerImpl.h>
#include <Zelkora/Media/VideoKeyFrameSeeker.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <limits>
#include <map>
#include <mutex>
#include <random>
#include <set>
#include <string>
#include <thread>
#include <utility>
#include <vector>

namespace {

using Tizen::Media::_PlayerImpl;
using Tizen::Media::Player;
using Tizen::Media::VideoFrame;
using Zelkora::Media::VideoKeyFrameSeeker;

std::string Media(const std::string& name) {
  const char* directory = std::getenv("ZELKORA_TEST_MEDIA");
  if (directory == nullptr) ADD_FAILURE() << "ZELKORA_TEST_MEDIA isn't set";
  return std::string(directory == nullptr ? "." : directory) + "/" + name;
}

std::string ReadFile(const std::string& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), {}};
}

void WriteFile(const std::string& path, const std::string& content) {
  std::ofstream(path, std::ios::binary) << content;
}

std::vector<long> KeyFramesOf(const std::string& film) {
  std::ifstream list(Media(film + ".keyframes"));
  std::vector<long> keyFrames{std::istream_iterator<long>(list), {}};
  EXPECT_GT(keyFrames.size(), 10U) << "too few to test with";
  return keyFrames;
}

/// A player with a seeker, the failures they log, and no sound server.
class PlayerTest : public testing::Test {
 protected:
  PlayerTest() {
    setenv("PULSE_SERVER", "unix:/nonexistent/pulse", 1);
    Host::SetLogSink(
        [](const Host::LogRecord& record, void* test) {
          auto* self = static_cast<PlayerTest*>(test);
          std::lock_guard lock(self->logMutex_);
          self->log_ += std::string(record.message) + "\n";
        },
        this);
    EXPECT_EQ(player.Construct(), E_SUCCESS);
    EXPECT_EQ(seeker.Construct(player), E_SUCCESS);
  }

  ~PlayerTest() override { Host::SetLogSink(nullptr, nullptr); }

  result Open(const std::string& name) { return player.OpenFile(Media(name).c_str()); }

  result SeekExactly(long position) {
    return _PlayerImpl::GetInstance(&player)->SeekTo(position, true);
  }

  std::vector<unsigned char> Capture() {
    VideoFrame frame;
    EXPECT_EQ(player.CaptureFrame(frame), E_SUCCESS);
    EXPECT_EQ(frame.pixels.size(), static_cast<std::size_t>(frame.width * frame.height * 3));
    return frame.pixels;
  }

  std::string TakeLog() {
    std::lock_guard lock(logMutex_);
    return std::exchange(log_, {});
  }

  /// Every player must be as good as new after whatever happened to it.
  void ExpectPlayerWorks() {
    EXPECT_EQ(Open("sample.webm"), E_SUCCESS) << TakeLog();
    EXPECT_EQ(seeker.SeekTo(5000), E_SUCCESS) << TakeLog();
    EXPECT_EQ(player.GetPosition(), 4000);
  }

  /// Plays until \p position is passed. \return the first position that was reported
  long PlayBeyond(long position) {
    const long first = player.GetPosition();
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(10);
    while (player.GetPosition() <= position) {
      if (std::chrono::steady_clock::now() > end) {
        ADD_FAILURE() << "doesn't play beyond " << position;
        break;
      }
      std::this_thread::yield();
    }
    return first;
  }

  Player player;
  VideoKeyFrameSeeker seeker;

 private:
  std::mutex logMutex_;
  std::string log_;
};

struct Film {
  const char* name;
  long tolerance;  // in ms: how far from the key frame's time the landing may be
};

class FilmTest : public PlayerTest, public testing::WithParamInterface<Film> {
 protected:
  FilmTest() { EXPECT_EQ(Open(GetParam().name), E_SUCCESS) << TakeLog(); }

  testing::AssertionResult IsNear(long position, long expected) const {
    if (std::abs(position - expected) <= GetParam().tolerance) return testing::AssertionSuccess();
    return testing::AssertionFailure() << position << " isn't " << expected;
  }

  /// The last key frame that begins in the asked millisecond or before.
  long ExpectedLanding(long asked) const {
    return *std::prev(std::upper_bound(keyFrames.begin(), keyFrames.end(), asked));
  }

  /// Two hundred places: the ends, each key frame and its neighbours, and some at random.
  std::vector<long> Places() const {
    const long duration = player.GetDuration();
    std::vector<long> places{duration, duration - 1};
    for (const long keyFrame : keyFrames) {
      places.insert(places.end(), {keyFrame, keyFrame + 1, std::max(keyFrame - 1, 0L)});
    }
    std::mt19937 random(7);
    while (places.size() < 200) places.push_back(static_cast<long>(random()) % (duration + 1));
    std::shuffle(places.begin(), places.end(), random);
    return places;
  }

  const std::vector<long> keyFrames = KeyFramesOf(GetParam().name);
};

INSTANTIATE_TEST_SUITE_P(, FilmTest, testing::Values(Film{"sample.webm", 0}, Film{"movie.mp4", 1}),
                         [](const auto& film) {
                           return film.index == 0 ? "Vp8WithVorbis" : "H264WithAac";
                         });

TEST_P(FilmTest, KeyFrameSeekShowsTheKeyFrameBeforeEachPlace) {
  std::map<long, std::vector<unsigned char>> frames;
  for (const long asked : Places()) {
    SCOPED_TRACE("asked for " + std::to_string(asked));
    ASSERT_EQ(seeker.SeekTo(asked), E_SUCCESS) << TakeLog();
    const long expected = ExpectedLanding(asked);
    EXPECT_TRUE(IsNear(player.GetPosition(), expected));
    EXPECT_LE(player.GetPosition(), asked);
    EXPECT_TRUE(player.IsKeyFrame());
    const auto frame = Capture();
    EXPECT_EQ(frames.emplace(expected, frame).first->second, frame) << "another frame than before";
  }
  std::set<std::vector<unsigned char>> different;
  for (const auto& [keyFrame, frame] : frames) different.insert(frame);
  EXPECT_EQ(different.size(), keyFrames.size());
}

TEST_P(FilmTest, ReportedPositionLeadsBackToItsFrame) {
  for (const bool exact : {false, true}) {
    ASSERT_EQ(exact ? SeekExactly(7310) : seeker.SeekTo(7310), E_SUCCESS);
    const auto frame = Capture();
    const long landed = player.GetPosition();
    ASSERT_EQ(seeker.SeekTo(0), E_SUCCESS);
    ASSERT_EQ(SeekExactly(landed), E_SUCCESS);
    EXPECT_EQ(player.GetPosition(), landed);
    EXPECT_EQ(Capture(), frame);
  }
}

TEST_P(FilmTest, ExactSeekTellsKeyFramesFromOthers) {
  ASSERT_EQ(SeekExactly(3500), E_SUCCESS) << TakeLog();
  EXPECT_TRUE(IsNear(player.GetPosition(), 3500));
  EXPECT_FALSE(player.IsKeyFrame());
  ASSERT_EQ(SeekExactly(4000), E_SUCCESS) << TakeLog();
  EXPECT_TRUE(IsNear(player.GetPosition(), 4000));
  EXPECT_TRUE(player.IsKeyFrame());
}

TEST_P(FilmTest, PlayGoesOnFromTheLandingFrameByFrame) {
  ASSERT_EQ(seeker.SeekTo(9000), E_SUCCESS) << TakeLog();
  const auto keyFrame = Capture();
  ASSERT_EQ(player.Play(), E_SUCCESS) << TakeLog();
  const long first = PlayBeyond(8200);
  EXPECT_GE(first, 8000);
  EXPECT_LT(first, 9000);
  ASSERT_EQ(player.Pause(), E_SUCCESS) << TakeLog();
  EXPECT_NE(Capture(), keyFrame) << "still shows key frames only";
}

TEST_P(FilmTest, SeekWhilePlayingGoesOnPlaying) {
  ASSERT_EQ(player.Play(), E_SUCCESS) << TakeLog();
  for (const long asked : {21500L, 3500L}) {
    ASSERT_EQ(seeker.SeekTo(asked), E_SUCCESS) << TakeLog();
    EXPECT_TRUE(player.IsKeyFrame());
    const long first = PlayBeyond(asked - 1300);
    EXPECT_GE(first, asked - 1500);
    EXPECT_LT(first, asked);
  }
}

TEST_F(PlayerTest, SuccessLeavesLastResultAndLogAlone) {
  SetLastResult(E_OBJ_NOT_FOUND);
  ASSERT_EQ(Open("sample.webm"), E_SUCCESS);
  EXPECT_FALSE(player.IsKeyFrame()) << "without a seek";
  EXPECT_EQ(seeker.SeekTo(5000), E_SUCCESS);
  EXPECT_EQ(GetLastResult(), E_OBJ_NOT_FOUND);
  EXPECT_EQ(TakeLog(), "");
}

TEST_F(PlayerTest, WhatCantBeOpenedIsRefusedWithItsReason) {
  WriteFile(Media("cut.mp4"), ReadFile(Media("movie.mp4")).substr(0, 60000));
  mkfifo(Media("pipe.webm").c_str(), 0600);
  const struct {
    const char* name;
    result expected;
    const char* reason;
  } kCases[] = {
      {"missing.webm", E_OBJ_NOT_FOUND, "No such file"},
      {"text.webm/film.webm", E_OBJ_NOT_FOUND, "Not a directory"},
      {"", E_INVALID_ARG, "not a plain file"},
      {"pipe.webm", E_INVALID_ARG, "not a plain file"},
      {"empty.webm", E_INVALID_ARG, "can't be played: "},
      {"text.webm", E_INVALID_ARG, "can't be played: "},
      {"truncated.webm", E_INVALID_ARG, "can't be played: "},
      {"cut.mp4", E_INVALID_ARG, "can't be played: "},
  };
  for (const auto& bad : kCases) {
    SCOPED_TRACE(bad.name);
    ExpectPlayerWorks();
    EXPECT_EQ(Open(bad.name), bad.expected);
    EXPECT_EQ(GetLastResult(), bad.expected);
    EXPECT_NE(TakeLog().find(bad.reason), std::string::npos);
    EXPECT_EQ(player.GetPosition(), -1) << "a file is still open";
  }
  EXPECT_EQ(player.OpenFile(nullptr), E_INVALID_ARG);
  EXPECT_EQ(player.OpenFile(""), E_INVALID_ARG);
  ExpectPlayerWorks();
}

TEST_F(PlayerTest, WithoutFileOnlyCloseSucceeds) {
  VideoFrame frame;
  EXPECT_EQ(seeker.SeekTo(0), E_INVALID_STATE);
  EXPECT_EQ(player.Play(), E_INVALID_STATE);
  EXPECT_EQ(player.Pause(), E_INVALID_STATE);
  EXPECT_EQ(player.CaptureFrame(frame), E_INVALID_STATE);
  EXPECT_EQ(player.GetDuration(), -1);
  EXPECT_FALSE(player.IsKeyFrame());
  EXPECT_EQ(player.Close(), E_SUCCESS);
}

TEST_F(PlayerTest, SoundPlaysButHasNoFrames) {
  ASSERT_EQ(Open("sound.ogg"), E_SUCCESS) << TakeLog();
  VideoFrame frame;
  EXPECT_EQ(seeker.SeekTo(1000), E_INVALID_OPERATION);
  EXPECT_EQ(player.CaptureFrame(frame), E_INVALID_OPERATION);
  EXPECT_EQ(player.Play(), E_SUCCESS);
  PlayBeyond(50);
}

TEST_F(PlayerTest, SeekOutsideTheFileIsRefusedAndChangesNothing) {
  ExpectPlayerWorks();
  const auto frame = Capture();
  const long duration = player.GetDuration();
  EXPECT_EQ(duration / 100, 300);
  for (const long outside :
       {-1L, duration + 1, std::numeric_limits<long>::min(), std::numeric_limits<long>::max()}) {
    EXPECT_EQ(seeker.SeekTo(outside), E_INVALID_ARG) << outside;
    EXPECT_EQ(player.GetPosition(), 4000);
    EXPECT_EQ(Capture(), frame);
  }
  EXPECT_EQ(seeker.SeekTo(duration), E_SUCCESS);
  EXPECT_EQ(player.GetPosition(), 28000);
}

TEST_F(PlayerTest, NullArgumentsOfNativeFunctionsAreRefused) {
  const player_h handle = _PlayerImpl::GetInstance(&player)->__hPlayer;
  EXPECT_EQ(player_create(nullptr), PLAYER_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(player_destroy(nullptr), PLAYER_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(player_seek(nullptr, 0, false), PLAYER_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(player_get_position(handle, nullptr), PLAYER_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(player_get_duration(handle, nullptr), PLAYER_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(player_is_key_frame(handle, nullptr), PLAYER_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(player_capture_frame(handle, nullptr, nullptr), PLAYER_ERROR_INVALID_PARAMETER);
}

TEST_F(PlayerTest, SeeksOfTwoThreadsEachLandOnAKeyFrame) {
  ASSERT_EQ(Open("sample.webm"), E_SUCCESS);
  const auto seekAround = [this](unsigned seed) {
    std::mt19937 random(seed);
    for (int i = 0; i < 50; ++i) {
      EXPECT_EQ(seeker.SeekTo(static_cast<long>(random() % 30000)), E_SUCCESS);
      EXPECT_EQ(player.GetPosition() % 2000, 0);
    }
  };
  std::thread other(seekAround, 1);
  seekAround(2);
  other.join();
  EXPECT_TRUE(player.IsKeyFrame());
}

TEST_F(PlayerTest, FileThatShrinksWhileOpenFailsAtMost) {
  const std::string path = Media("shrinking.webm");
  for (const std::uintmax_t size : {400000U, 1000U, 0U}) {
    std::filesystem::copy_file(Media("sample.webm"), path,
                               std::filesystem::copy_options::overwrite_existing);
    ASSERT_EQ(player.OpenFile(path.c_str()), E_SUCCESS) << TakeLog();
    std::filesystem::resize_file(path, size);
    for (const long asked : {25000L, 1000L, 29000L}) seeker.SeekTo(asked);
    player.Play();
    player.Pause();
    ExpectPlayerWorks();
  }
}

/// Damages a film somehow, the same way for the same \p seed.
std::string Damage(std::string film, unsigned seed) {
  std::mt19937 random(seed);
  // The headers are worth as much as all the rest.
  const std::size_t reach = seed % 2 == 0 ? film.size() : std::min<std::size_t>(600, film.size());
  const auto place = [&] { return random() % reach; };
  switch (seed % 3) {
    case 0: return film.substr(0, place());
    case 1:
      for (int i = 0; i < 12; ++i) film[place()] ^= static_cast<char>(1U << random() % 8);
      return film;
    default:
      const std::size_t begin = place();
      const std::size_t length = std::min<std::size_t>(random() % 2000, film.size() - begin);
      return film.replace(begin, length, length, '\0');
  }
}

TEST_F(PlayerTest, DamagedFilesEndInAResult) {
  const std::string film = ReadFile(Media("short.webm"));
  const std::string path = Media("damaged.webm");
  int opened = 0;
  for (unsigned seed = 0; seed < 150; ++seed) {
    SCOPED_TRACE(seed);
    WriteFile(path, Damage(film, seed));
    if (player.OpenFile(path.c_str()) != E_SUCCESS) continue;
    ++opened;
    for (const long asked : {2500L, 0L}) {
      VideoFrame frame;
      if (seeker.SeekTo(asked) == E_SUCCESS && player.CaptureFrame(frame) == E_SUCCESS) {
        EXPECT_GT(frame.width, 0);
      }
    }
    player.Play();
    player.Pause();
  }
  EXPECT_GT(opened, 20) << "the damage is too great to test with";
  EXPECT_LT(opened, 130) << "the damage is too small to test with";
  ExpectPlayerWorks();
}

}  // namespace
