#include "support/LibraryTest.h"

#include <Tizen/Media/Player.h>
#include <Zelkora/Media/VideoKeyFrameSeeker.h>

namespace {

using Tizen::Media::Player;

constexpr char kFeature[] = "zelkora_extension_2.2";
constexpr char kFeatureQuery[] =
    "SystemInfo::GetValue(http://developer.zelkora.example/tizen/feature/zelkora_extension_2.2)";

/// A seeker that isn't constructed, and a player with a film.
class SeekerTest : public LibraryTest {
 protected:
  SeekerTest() {
    EXPECT_EQ(player.Construct(), E_SUCCESS);
    EXPECT_EQ(player.OpenFile("movie"), E_SUCCESS);
    Forget();
  }

  Player player;
  Zelkora::Media::VideoKeyFrameSeeker seeker;
};

TEST_F(SeekerTest, IsConstructedOnceBehindTheFeatureGateAndKeepsItsPlayer) {
  Player other;
  EXPECT_EQ(seeker.Construct(other), E_INVALID_ARG);
  EXPECT_EQ(seeker.SeekTo(0), E_INVALID_STATE);
  Forget();
  EXPECT_EQ(seeker.Construct(player), E_SUCCESS);
  ExpectLeft(E_SUCCESS, {}, {kFeatureQuery, "_PlayerImpl::GetInstance()"});
  EXPECT_EQ(seeker.Construct(other), E_INVALID_STATE);
  Host::SetFeature(kFeature, Host::kFeatureAbsent);
  EXPECT_EQ(seeker.Construct(other), E_UNSUPPORTED_OPERATION);
  EXPECT_EQ(Host::TakeCalls(), (Lines{kFeatureQuery, kFeatureQuery}));
  EXPECT_EQ(seeker.SeekTo(5000), E_SUCCESS);
  EXPECT_EQ(player.GetPosition(), 4000);
}

TEST_F(SeekerTest, PositionAndThePlayersAnswerArePassedOnUnchanged) {
  EXPECT_EQ(seeker.Construct(player), E_SUCCESS);
  for (const long position : {4999L, long{INT32_MIN}, long{INT32_MAX}, 0L}) {
    Host::FailCall("_PlayerImpl::SeekTo", E_SUCCESS, 1);
    Forget();
    EXPECT_EQ(seeker.SeekTo(position), E_SUCCESS);
    ExpectLeft(kUntouched, {}, {"_PlayerImpl::SeekTo(" + std::to_string(position) + ", false)"});
  }
}

TEST(SeekerAssertionDeathTest, StoppingBackEndEndsTheProcessAfterTheReport) {
  Host::SetAssertionAction(Host::AssertionAction::kStop);
  Zelkora::Media::VideoKeyFrameSeeker seeker;
  EXPECT_DEATH(seeker.SeekTo(0), "__pVideoKeyFrameSeekerImpl != null.*Not yet constructed!");
}

}  // namespace
