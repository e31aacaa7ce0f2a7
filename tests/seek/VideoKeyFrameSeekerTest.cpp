#include "support/Allocations.h"
#include "support/LibraryTest.h"

#include <Tizen/Media/Player.h>
#include <Zelkora/Media/VideoKeyFrameSeeker.h>

#include <utility>

namespace {

using Tizen::Media::Player;

constexpr char kConstruct[] =
    "result Zelkora::Media::VideoKeyFrameSeeker::Construct(Tizen::Media::Player&)";
constexpr char kFeature[] = "zelkora_extension_2.2";
constexpr char kFeatureQuery[] =
    "SystemInfo::GetValue(http://developer.zelkora.example/tizen/feature/zelkora_extension_2.2)";
constexpr char kGetInstance[] = "_PlayerImpl::GetInstance()";

/// A seeker that isn't constructed, and a player with a film.
class SeekerTest : public LibraryTest {
 protected:
  SeekerTest() {
    EXPECT_EQ(player.Construct(), E_SUCCESS);
    EXPECT_EQ(player.OpenFile("movie"), E_SUCCESS);
    Forget();
  }

  /// Expects what a construction that failed left. The seeker must not reach any player then.
  void ExpectUnconstructed(result failure, const Lines& lines, const Lines& calls) {
    ExpectLeft(failure, lines, calls);
    EXPECT_EQ(seeker.SeekTo(0), E_INVALID_STATE);
    ExpectLeft(kUntouched,
               {Assertion("result Zelkora::Media::VideoKeyFrameSeeker::SeekTo(long int)",
                          "__pVideoKeyFrameSeekerImpl != null",
                          "Not yet constructed! Construct() should be called before use")},
               {});
  }

  void Construct() {
    EXPECT_EQ(seeker.Construct(player), E_SUCCESS);
    ExpectLeft(E_SUCCESS, {}, {kFeatureQuery, kGetInstance});
  }

  Player player;
  Zelkora::Media::VideoKeyFrameSeeker seeker;
};

TEST_F(SeekerTest, FailedConstructionLeavesItUnconstructedUntilOneSucceeds) {
  for (const auto& [answer, expected] : kFeatureRefusals) {
    Host::SetFeature(kFeature, answer);
    EXPECT_EQ(seeker.Construct(player), expected);
    ExpectUnconstructed(expected, {App(kConstruct, Named(expected, " Propagating."))},
                        {kFeatureQuery});
  }
  Host::SetFeature(kFeature, E_SUCCESS);
  Player neverConstructed;
  EXPECT_EQ(seeker.Construct(neverConstructed), E_INVALID_ARG);
  ExpectUnconstructed(
      E_INVALID_ARG,
      {Sys(E_INVALID_ARG, "[E_INVALID_ARG] player instance is wrong"),
       App(kConstruct, "[E_INVALID_ARG] Failed to construct __pVideoKeyFrameSeekerImpl.")},
      {kFeatureQuery, kGetInstance});
  Host::RecordCalls(false);  // the record would allocate
  {
    FailingAllocation failing(1);
    EXPECT_EQ(seeker.Construct(player), E_OUT_OF_MEMORY);
  }
  ExpectUnconstructed(E_OUT_OF_MEMORY,
                      {App(kConstruct, "[E_OUT_OF_MEMORY] Memory allocation failed")}, {});
  Forget();
  Construct();
}

TEST_F(SeekerTest, SecondConstructAssertsBehindTheFeatureGateAndKeepsThePlayer) {
  Construct();
  Player other;
  EXPECT_EQ(seeker.Construct(other), E_INVALID_STATE);
  ExpectLeft(kUntouched,
             {Assertion(kConstruct, "__pVideoKeyFrameSeekerImpl == null",
                        "Already constructed. Calling Construct() twice or more on a same instance "
                        "is not allowed for this class.")},
             {kFeatureQuery});
  Host::SetFeature(kFeature, Host::kFeatureAbsent);
  EXPECT_EQ(seeker.Construct(other), E_UNSUPPORTED_OPERATION);
  EXPECT_EQ(seeker.SeekTo(5000), E_SUCCESS);
  EXPECT_EQ(player.GetPosition(), 4000);
}

TEST_F(SeekerTest, PositionAndThePlayersAnswerArePassedOnUnchanged) {
  Construct();
  const std::pair<long, result> rows[] = {
      {4999, E_SUCCESS}, {INT32_MIN, E_INVALID_ARG}, {INT32_MAX, E_INVALID_STATE}, {0, kForeign}};
  for (const auto& [position, r] : rows) {
    Host::FailCall("_PlayerImpl::SeekTo", r, 1);
    EXPECT_EQ(seeker.SeekTo(position), r);
    const bool isSuccess = r == E_SUCCESS;
    ExpectLeft(isSuccess ? kUntouched : r,
               isSuccess ? Lines() : Lines{Sys(r, Named(r, " SeekTo failed"))},
               {"_PlayerImpl::SeekTo(" + std::to_string(position) + ", false)"});
  }
}

TEST(SeekerAssertionDeathTest, StoppingBackEndEndsTheProcessAfterTheReport) {
  Host::SetAssertionAction(Host::AssertionAction::kStop);
  Zelkora::Media::VideoKeyFrameSeeker seeker;
  EXPECT_DEATH(seeker.SeekTo(0), "__pVideoKeyFrameSeekerImpl != null.*Not yet constructed!");
}

}  // namespace
