#include "support/Operations.h"

#include <climits>

namespace {

using namespace Zelkora::Media;

constexpr char kFeatureQuery[] =
    "SystemInfo::GetValue(http://developer.zelkora.example/tizen/feature/zelkora_extension_2.2)";

/// A seeker that isn't constructed, and a player with a film.
class SeekerTest : public LibraryTest {
 protected:
  SeekerTest() {
    Prepare("Construct");
    EXPECT_EQ(player->OpenFile("movie"), E_SUCCESS);
    Forget();
  }
};

TEST_F(SeekerTest, IsConstructedOnceBehindTheFeatureGateAndKeepsItsPlayer) {
  Tizen::Media::Player other;
  EXPECT_EQ(seeker->Construct(other), E_INVALID_ARG);
  EXPECT_EQ(seeker->SeekTo(0), E_INVALID_STATE);
  Forget();
  EXPECT_EQ(seeker->Construct(*player), E_SUCCESS);
  ExpectLeft(E_SUCCESS, {}, {kFeatureQuery, "_PlayerImpl::GetInstance()"});
  EXPECT_EQ(seeker->Construct(other), E_INVALID_STATE);
  Host::SetFeature("zelkora_extension_2.2", Host::kFeatureAbsent);
  EXPECT_EQ(seeker->Construct(other), E_UNSUPPORTED_OPERATION);
  EXPECT_EQ(Host::TakeCalls(), (Lines{kFeatureQuery, kFeatureQuery}));
  Forget();
  EXPECT_EQ(seeker->SeekTo(5000), E_SUCCESS);
  ExpectLeft(kUntouched, {}, {"_PlayerImpl::SeekTo(5000, false)", "player_seek(5000, false)"});
  EXPECT_EQ(player->GetPosition(), 4000);
}

TEST_F(SeekerTest, LandsOnTheLastKeyFrameAtOrBeforeAPositionInTheFilm) {
  EXPECT_EQ(seeker->Construct(*player), E_SUCCESS);
  Simulated::SetMedia({9000, 0, {100, 2500, 9000}, true});
  player->OpenFile("scenes");
  for (const auto& [asked, landed] :
       {std::pair(0L, 100L), {2499L, 100L}, {2500L, 2500L}, {9000L, 9000L}}) {
    EXPECT_EQ(seeker->SeekTo(asked), E_SUCCESS);
    EXPECT_EQ(player->GetPosition(), landed);
    for (const long outside : {-1L, 9001L, LONG_MIN, LONG_MAX}) {
      EXPECT_EQ(seeker->SeekTo(outside), E_INVALID_ARG);
      EXPECT_EQ(player->GetPosition(), landed);
    }
  }
}

TEST(SeekerAssertionDeathTest, StoppingBackEndEndsTheProcessAfterTheReport) {
  Host::SetAssertionAction(Host::AssertionAction::kStop);
  EXPECT_DEATH(VideoKeyFrameSeeker().SeekTo(0),
               "__pVideoKeyFrameSeekerImpl != null.*Not yet constructed!");
}

}  // namespace
