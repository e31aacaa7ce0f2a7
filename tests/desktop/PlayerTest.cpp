// The media files are made beforehand by make-media, in the directory that ZELKORA_TEST_MEDIA
// names.

#include "GstreamerEnd.h"

#include <Tizen/Base/Result.h>
#include <Tizen/Media/Player.h>
#include <Tizen/Media/PlayerImpl.h>
#include <Zelkora/Media/VideoKeyFrameSeeker.h>
#include <gmock/gmock.h>
#include <sys/stat.h>

#include <algorithm>
#include <chrono>
#include <climits>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <map>
#include <random>
#include <set>
#include <string>
#include <thread>
#include <utility>
#include <vector>

namespace {

using testing::Each;
using testing::HasSubstr;
using testing::Not;
using testing::internal::CaptureStderr;
using testing::internal::GetCapturedStderr;
using Tizen::Media::_PlayerImpl;
using Tizen::Media::Player;
using Tizen::Media::VideoFrame;

std::string Media(const std::string& name) {
  return std::string(std::getenv("ZELKORA_TEST_MEDIA")) + "/" + name;
}

std::string ReadFile(const std::string& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), {}};
}

void WriteFile(const std::string& path, const std::string& content) {
  std::ofstream(path, std::ios::binary) << content;
}

/// A player with a seeker, and no sound server.
class PlayerTest : public testing::Test {
 protected:
  PlayerTest() {
    setenv("PULSE_SERVER", "unix:/nonexistent/pulse", 1);
    EXPECT_EQ(player.Construct(), E_SUCCESS);
    EXPECT_EQ(seeker.Construct(player), E_SUCCESS);
  }

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

  /// Every player must be as good as new after whatever happened to it.
  void ExpectPlayerWorks() {
    SetLastResult(E_OBJ_NOT_FOUND);
    CaptureStderr();
    EXPECT_EQ(Open("sample.webm"), E_SUCCESS);
    EXPECT_FALSE(player.IsKeyFrame()) << "without a seek";
    EXPECT_EQ(seeker.SeekTo(5000), E_SUCCESS);
    EXPECT_EQ(player.GetPosition(), 4000);
    EXPECT_EQ(GetLastResult(), E_OBJ_NOT_FOUND) << "success changed it";
    EXPECT_THAT(GetCapturedStderr(), Not(HasSubstr("[E_")));
  }

  /// Expects that the player goes on playing from within a second of \p begin on.
  void ExpectPlaying(long begin) {
    const long first = player.GetPosition();
    EXPECT_GE(first, begin);
    EXPECT_LT(first, begin + 1000);
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(10);
    while (player.GetPosition() <= begin + 200) ASSERT_LT(std::chrono::steady_clock::now(), end);
  }

  Player player;
  Zelkora::Media::VideoKeyFrameSeeker seeker;
};

struct Film {
  const char* codecs;
  const char* name;
  long tolerance;  // in ms: how far from the key frame's time the landing may be
};

class FilmTest : public PlayerTest, public testing::WithParamInterface<Film> {
 protected:
  FilmTest() {
    EXPECT_EQ(Open(GetParam().name), E_SUCCESS);
    std::ifstream list(Media(std::string(GetParam().name) + ".keyframes"));
    keyFrames.assign(std::istream_iterator<long>(list), {});
  }

  void ExpectNear(long expected) {
    EXPECT_LE(std::abs(player.GetPosition() - expected), GetParam().tolerance)
        << player.GetPosition() << " isn't " << expected;
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

  std::vector<long> keyFrames;
};

INSTANTIATE_TEST_SUITE_P(, FilmTest,
                         testing::Values(Film{"Vp8WithVorbis", "sample.webm", 0},
                                         Film{"H264WithAac", "movie.mp4", 1}),
                         [](const auto& film) { return film.param.codecs; });

TEST_P(FilmTest, KeyFrameSeekShowsTheKeyFrameBeforeEachPlaceWithinTheFile) {
  ASSERT_GT(keyFrames.size(), 10U) << "too few to test with";
  std::map<long, std::vector<unsigned char>> frames;
  for (const long asked : Places()) {
    SCOPED_TRACE("asked for " + std::to_string(asked));
    ASSERT_EQ(seeker.SeekTo(asked), E_SUCCESS);
    // The last one that begins in the asked millisecond or before.
    const long expected = *--std::upper_bound(keyFrames.begin(), keyFrames.end(), asked);
    ExpectNear(expected);
    EXPECT_LE(player.GetPosition(), asked);
    EXPECT_TRUE(player.IsKeyFrame());
    const auto frame = Capture();
    EXPECT_EQ(frames.emplace(expected, frame).first->second, frame) << "another frame than before";
  }
  const long landed = player.GetPosition();
  for (const long outside : {-1L, player.GetDuration() + 1, LONG_MIN, LONG_MAX}) {
    EXPECT_EQ(seeker.SeekTo(outside), E_INVALID_ARG) << outside;
    EXPECT_EQ(player.GetPosition(), landed);
  }
  std::set<std::vector<unsigned char>> different;
  for (const auto& [keyFrame, frame] : frames) different.insert(frame);
  EXPECT_EQ(different.size(), keyFrames.size());
}

TEST_P(FilmTest, ExactSeekTellsKeyFramesFromOthersAndReturnsToEachReportedPosition) {
  for (const auto& [exact, asked, expected] :
       {std::tuple(false, 7310L, 6000L), {true, 7310L, 7310L}, {true, 4000L, 4000L}}) {
    SCOPED_TRACE(asked);
    ASSERT_EQ(exact ? SeekExactly(asked) : seeker.SeekTo(asked), E_SUCCESS);
    ExpectNear(expected);
    EXPECT_EQ(player.IsKeyFrame(), expected % 2000 == 0);
    const auto frame = Capture();
    const long landed = player.GetPosition();
    ASSERT_EQ(seeker.SeekTo(0), E_SUCCESS);
    ASSERT_EQ(SeekExactly(landed), E_SUCCESS);
    EXPECT_EQ(player.GetPosition(), landed);
    EXPECT_EQ(Capture(), frame);
  }
}

TEST_P(FilmTest, PlayGoesOnFromEachLandingFrameByFrame) {
  ASSERT_EQ(seeker.SeekTo(9000), E_SUCCESS);
  const auto keyFrame = Capture();
  ASSERT_EQ(player.Play(), E_SUCCESS);
  ExpectPlaying(8000);
  ASSERT_EQ(player.Pause(), E_SUCCESS);
  EXPECT_NE(Capture(), keyFrame) << "still shows key frames only";
  ASSERT_EQ(player.Play(), E_SUCCESS);
  for (const long keyFrameAt : {20000L, 2000L}) {
    ASSERT_EQ(seeker.SeekTo(keyFrameAt + 1500), E_SUCCESS);
    EXPECT_TRUE(player.IsKeyFrame());
    ExpectPlaying(keyFrameAt);
  }
}

TEST_F(PlayerTest, WhatCantBeOpenedIsRefusedWithItsReason) {
  WriteFile(Media("cut.mp4"), ReadFile(Media("movie.mp4")).substr(0, 60000));
  mkfifo(Media("pipe.webm").c_str(), 0600);
  const struct {
    const char* name;
    result expected;
    const char* reason;
  } kCases[] = {{"missing.webm", E_OBJ_NOT_FOUND, "No such file"},
                {"text.webm/film.webm", E_OBJ_NOT_FOUND, "Not a directory"},
                {"", E_INVALID_ARG, "not a plain file"},
                {"pipe.webm", E_INVALID_ARG, "not a plain file"},
                {"empty.webm", E_INVALID_ARG, "can't be played: "},
                {"text.webm", E_INVALID_ARG, "can't be played: "},
                {"truncated.webm", E_INVALID_ARG, "can't be played: "},
                {"cut.mp4", E_INVALID_ARG, "can't be played: "}};
  for (const auto& bad : kCases) {
    SCOPED_TRACE(bad.name);
    ExpectPlayerWorks();
    CaptureStderr();
    EXPECT_EQ(Open(bad.name), bad.expected);
    EXPECT_EQ(GetLastResult(), bad.expected);
    EXPECT_THAT(GetCapturedStderr(), HasSubstr(bad.reason));
    EXPECT_EQ(player.GetPosition(), -1) << "a file is still open";
  }
  ExpectPlayerWorks();
}

TEST_F(PlayerTest, NullsAndWhatNeedsAFileAreRefused) {
  VideoFrame frame;
  EXPECT_THAT((std::vector<result>{seeker.SeekTo(0), player.Play(), player.Pause(),
                                   player.CaptureFrame(frame)}),
              Each(E_INVALID_STATE));
  EXPECT_EQ(player.GetDuration(), -1);
  EXPECT_EQ(player.Close(), E_SUCCESS);
  EXPECT_EQ(player.OpenFile(""), E_INVALID_ARG);
  const player_h handle = _PlayerImpl::GetInstance(&player)->__hPlayer;
  EXPECT_THAT((std::vector<int>{
                  player_create(nullptr), player_destroy(nullptr), player_open(handle, nullptr),
                  player_seek(nullptr, 0, false), player_get_position(handle, nullptr),
                  player_get_duration(handle, nullptr), player_is_key_frame(handle, nullptr),
                  player_capture_frame(handle, nullptr, nullptr)}),
              Each(int{PLAYER_ERROR_INVALID_PARAMETER}));
}

TEST_F(PlayerTest, SoundPlaysButHasNoFrames) {
  ASSERT_EQ(Open("sound.ogg"), E_SUCCESS);
  VideoFrame frame;
  EXPECT_EQ(seeker.SeekTo(1000), E_INVALID_OPERATION);
  EXPECT_EQ(player.CaptureFrame(frame), E_INVALID_OPERATION);
  EXPECT_EQ(player.Play(), E_SUCCESS);
  ExpectPlaying(0);
}

TEST_F(PlayerTest, SeeksOfTwoThreadsEachLandOnAKeyFrame) {
  ASSERT_EQ(Open("sample.webm"), E_SUCCESS);
  const auto seekAround = [this](long step) {
    for (long i = 0; i < 50; ++i) {
      EXPECT_EQ(seeker.SeekTo(i * step % 30000), E_SUCCESS);
      EXPECT_EQ(player.GetPosition() % 2000, 0);
    }
  };
  std::thread other(seekAround, 7901);
  seekAround(12007);
  other.join();
  EXPECT_TRUE(player.IsKeyFrame());
}

/// Damages a film somehow, the same way for the same \p seed.
std::string Damage(std::string film, unsigned seed) {
  std::mt19937 random(seed);
  // The headers are worth as much as all the rest.
  const std::size_t reach = seed % 2 == 0 ? film.size() : 600;
  if (seed % 3 == 0) return film.substr(0, random() % reach);
  for (int i = 0; i < 12; ++i) film[random() % reach] ^= static_cast<char>(1U << random() % 8);
  return film;
}

TEST_F(PlayerTest, FilesThatAreDamagedOrShrinkWhileOpenEndInAResult) {
  const std::string film = ReadFile(Media("short.webm")), path = Media("damaged.webm");
  int opened = 0;
  for (unsigned seed = 0; seed < 90; ++seed) {
    SCOPED_TRACE(seed);
    WriteFile(path, film);
    ASSERT_EQ(player.OpenFile(path.c_str()), E_SUCCESS);
    WriteFile(path, Damage(film, seed));
    for (const bool isReopened : {false, true}) {
      if (isReopened && player.OpenFile(path.c_str()) != E_SUCCESS) continue;
      opened += isReopened;
      for (const long asked : {2500L, 0L}) {
        VideoFrame frame;
        if (seeker.SeekTo(asked) == E_SUCCESS && player.CaptureFrame(frame) == E_SUCCESS) {
          EXPECT_GT(frame.width, 0);
        }
      }
      player.Play();
      player.Pause();
    }
  }
  EXPECT_TRUE(opened > 20 && opened < 70) << "the damage isn't one to test with";
  ExpectPlayerWorks();
}

}  // namespace
