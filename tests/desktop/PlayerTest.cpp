// The media files are made beforehand by make-media, in the directory that ZELKORA_TEST_MEDIA
// names.

#include "PlayerOnMedia.h"

#include <sys/stat.h>

#include <climits>
#include <random>
#include <tuple>

namespace {

using namespace testing;
using namespace Tizen::Media;
using testing::internal::CaptureStderr;
using testing::internal::GetCapturedStderr;

class PlayerTest : public PlayerOnMedia {
 protected:
  result SeekExactly(long position) {
    return _PlayerImpl::GetInstance(&player)->SeekTo(position, true);
  }

  /// Does what may fail, but must come to an end.
  void Use() {
    for (const long asked : {2500L, 0L}) {
      VideoFrame frame;
      if (seeker.SeekTo(asked) == E_SUCCESS && player.CaptureFrame(frame) == E_SUCCESS) {
        EXPECT_GT(frame.width, 0);
      }
    }
    player.Play();
    player.Pause();
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
};

TEST_F(PlayerTest, ExactSeekTellsKeyFramesFromOthersAndReturnsToEachReportedPosition) {
  for (const auto& [film, tolerance] : {std::pair("sample.webm", 0L), {"movie.mp4", 1L}}) {
    ASSERT_EQ(Open(film), E_SUCCESS);
    for (const auto& [exact, asked, expected] :
         {std::tuple(false, 7310L, 6000L), {true, 7310L, 7310L}, {true, 4000L, 4000L}}) {
      SCOPED_TRACE(film + std::string(" at ") + std::to_string(asked));
      ASSERT_EQ(exact ? SeekExactly(asked) : seeker.SeekTo(asked), E_SUCCESS);
      const long landed = player.GetPosition();
      EXPECT_LE(std::abs(landed - expected), tolerance) << landed << " isn't " << expected;
      EXPECT_EQ(player.IsKeyFrame(), expected % 2000 == 0);
      const auto frame = Capture();
      ASSERT_EQ(seeker.SeekTo(0), E_SUCCESS);
      ASSERT_EQ(SeekExactly(landed), E_SUCCESS);
      EXPECT_EQ(player.GetPosition(), landed);
      EXPECT_EQ(Capture(), frame);
      for (const long outside : {-1L, player.GetDuration() + 1, LONG_MIN, LONG_MAX}) {
        EXPECT_EQ(seeker.SeekTo(outside), E_INVALID_ARG) << outside;
        EXPECT_EQ(player.GetPosition(), landed);
      }
    }
  }
}

TEST_F(PlayerTest, WhatCantBeOpenedIsRefusedWithItsReason) {
  mkfifo(Media("pipe.webm").c_str(), 0600);
  for (const auto& [name, expected, reason] :
       {std::tuple{"missing.webm", E_OBJ_NOT_FOUND, "No such file"},
        {"text.webm/film.webm", E_OBJ_NOT_FOUND, "Not a directory"},
        {"", E_INVALID_ARG, "not a plain file"},
        {"pipe.webm", E_INVALID_ARG, "not a plain file"},
        {"empty.webm", E_INVALID_ARG, "can't be played: "},
        {"text.webm", E_INVALID_ARG, "can't be played: "},
        {"truncated.webm", E_INVALID_ARG, "can't be played: "},
        {"cut.mp4", E_INVALID_ARG, "can't be played: "}}) {
    SCOPED_TRACE(name);
    ExpectPlayerWorks();
    CaptureStderr();
    EXPECT_EQ(Open(name), expected);
    EXPECT_EQ(GetLastResult(), expected);
    EXPECT_THAT(GetCapturedStderr(), HasSubstr(reason));
    EXPECT_EQ(player.GetPosition(), -1) << "a file is still open";
  }
  ExpectPlayerWorks();
}

TEST_F(PlayerTest, NullsAndWhatTheFileDoesNotGiveAreRefused) {
  VideoFrame frame;
  EXPECT_EQ(player.OpenFile(""), E_INVALID_ARG);
  const player_h handle = _PlayerImpl::GetInstance(&player)->__hPlayer;
  EXPECT_THAT((std::vector<int>{
                  player_create(nullptr), player_destroy(nullptr), player_open(handle, nullptr),
                  player_seek(nullptr, 0, false), player_get_position(handle, nullptr),
                  player_get_duration(handle, nullptr), player_is_key_frame(handle, nullptr),
                  player_capture_frame(handle, nullptr, nullptr)}),
              Each(int{PLAYER_ERROR_INVALID_PARAMETER}));

  ASSERT_EQ(Open("sound.ogg"), E_SUCCESS);
  EXPECT_EQ(seeker.SeekTo(1000), E_INVALID_OPERATION);
  EXPECT_EQ(player.CaptureFrame(frame), E_INVALID_OPERATION);
  EXPECT_EQ(player.Play(), E_SUCCESS);
  ExpectPlaying(0);
}

TEST_F(PlayerTest, AtTheEndItStandsOnTheLastPictureAndPlaysFromTheStartAgain) {
  ASSERT_EQ(Open("short.webm"), E_SUCCESS);
  ASSERT_EQ(SeekExactly(player.GetDuration() - 300), E_SUCCESS);
  ASSERT_EQ(player.Play(), E_SUCCESS);
  EXPECT_FALSE(player.IsAtEnd());
  ExpectSoon([this] { return player.IsAtEnd(); });
  EXPECT_EQ(player.GetPosition(), player.GetDuration());
  const auto last = Capture();
  EXPECT_EQ(player.Pause(), E_SUCCESS);
  EXPECT_TRUE(player.IsAtEnd());
  ASSERT_EQ(player.Play(), E_SUCCESS);
  ExpectPlaying(0);
  ASSERT_EQ(SeekExactly(player.GetDuration() - 100), E_SUCCESS);
  ExpectSoon([this] { return player.IsAtEnd(); });
  EXPECT_EQ(Capture(), last);
  ASSERT_EQ(seeker.SeekTo(2500), E_SUCCESS);
  EXPECT_FALSE(player.IsAtEnd());
  std::this_thread::sleep_for(std::chrono::milliseconds(100));
  EXPECT_EQ(player.GetPosition(), 2000) << "it went on";
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

TEST_F(PlayerTest, FileThatIsDamagedOrShrinksWhileOpenEndsInAResultInBoundedTime) {
  for (const char* name : {"short.webm", "h264.ts", "mpeg2.mpg", "fragmented.mp4", "noindex.mkv"}) {
    const std::string film = ReadFile(Media(name));
    const ScratchFile damaged(name);
    int opened = 0;
    for (unsigned seed = 0; seed < 12; ++seed) {
      SCOPED_TRACE(name + std::string(" with seed ") + std::to_string(seed));
      const auto begin = std::chrono::steady_clock::now();
      WriteFile(damaged.path, film);
      ASSERT_EQ(player.OpenFile(damaged.path.c_str()), E_SUCCESS);
      WriteFile(damaged.path, Damage(film, seed));
      Use();
      if (player.OpenFile(damaged.path.c_str()) == E_SUCCESS) {
        ++opened;
        Use();
      }
      EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(60));
    }
    EXPECT_GT(opened, 2) << "the damage isn't one to test with";
    ExpectPlayerWorks();
  }
}

TEST_F(PlayerTest, FileTooLongToBeReadIsSoughtInAsWellAsItsContainerCanAndClosedAtOnce) {
  using namespace std::chrono;
  const ScratchFile film("long.ts", ReadFile(Media("h264.ts")));
  ASSERT_EQ(truncate(film.path.c_str(), 300'000'000'000), 0);
  ASSERT_EQ(player.OpenFile(film.path.c_str()), E_SUCCESS);
  CaptureStderr();
  auto begin = steady_clock::now();
  EXPECT_EQ(seeker.SeekTo(3500), E_SUCCESS);
  EXPECT_THAT(GetCapturedStderr(), HasSubstr("takes too long"));
  EXPECT_GE(steady_clock::now() - begin, seconds(5));
  begin = steady_clock::now();
  EXPECT_EQ(seeker.SeekTo(5500), E_SUCCESS);
  EXPECT_FALSE(player.IsKeyFrame()) << "which nobody knows";
  EXPECT_LT(steady_clock::now() - begin, seconds(3)) << "it was read again";

  std::vector<long> keyFrames{7};
  std::thread search([&] { EXPECT_EQ(player.GetKeyFrames(keyFrames), E_SYSTEM); });
  std::this_thread::sleep_for(milliseconds(300));
  begin = steady_clock::now();
  EXPECT_EQ(player.Close(), E_SUCCESS);
  EXPECT_LT(steady_clock::now() - begin, seconds(3));
  search.join();
  EXPECT_EQ(keyFrames, std::vector<long>{7});
}

TEST_F(PlayerTest, BehindAJumpOfTheClockItLandsOnTheKeyFrameOrIsRefusedInWords) {
  ASSERT_EQ(Open("jump.ts"), E_SUCCESS);
  for (const auto& [asked, keyFrame] :
       {std::pair(5500L, 5000L), {11900L, 11000L}, {16500L, 16420L}, {5500L, 5000L}}) {
    SCOPED_TRACE(asked);
    const long before = player.GetPosition();
    CaptureStderr();
    const result landed = seeker.SeekTo(asked);
    const bool isRefused = keyFrame == 16420 && landed == E_SYSTEM;
    EXPECT_EQ(landed, isRefused ? E_SYSTEM : E_SUCCESS);
    EXPECT_EQ(GetCapturedStderr().find("doesn't find the key frame") != std::string::npos,
              isRefused);
    EXPECT_EQ(player.GetPosition(), isRefused ? before : keyFrame) << "lost its place";
    Capture();
  }
}

}  // namespace
