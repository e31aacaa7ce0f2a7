#include "support/Allocations.h"
#include "support/LibraryTest.h"

#include <Tizen/Media/Player.h>
#include <Zelkora/Media/VideoKeyFrameSeeker.h>

namespace {

using testing::IsEmpty;
using Tizen::Media::Player;
using Zelkora::Media::VideoKeyFrameSeeker;

constexpr char kConstruct[] =
    "result Zelkora::Media::VideoKeyFrameSeeker::Construct(Tizen::Media::Player&)";
constexpr char kSeekTo[] = "result Zelkora::Media::VideoKeyFrameSeeker::SeekTo(long int)";
constexpr char kFeature[] = "zelkora_extension_2.2";
constexpr char kNotYet[] = "Not yet constructed! Construct() should be called before use";
constexpr char kAlready[] =
    "Already constructed. Calling Construct() twice or more on a same instance is not allowed for "
    "this class.";
constexpr char kFeatureQuery[] =
    "SystemInfo::GetValue(http://developer.zelkora.example/tizen/feature/zelkora_extension_2.2)";

class SeekerConstruction : public LibraryTest {
 protected:
  SeekerConstruction() {
    EXPECT_EQ(player.Construct(), E_SUCCESS);
    Forget();
  }

  /// A seeker that failed to be constructed must not reach any player.
  void ExpectUnconstructed() {
    EXPECT_EQ(seeker.SeekTo(0), E_INVALID_STATE);
    ExpectLeft(kUntouched, {Assertion(kSeekTo, "__pVideoKeyFrameSeekerImpl != null", kNotYet)}, {});
  }

  Player player;
  VideoKeyFrameSeeker seeker;
};

TEST_F(SeekerConstruction, RefusedFeatureIsPropagatedAndAskedAgain) {
  for (const auto& [answer, expected] : kFeatureRefusals) {
    Host::SetFeature(kFeature, answer);
    EXPECT_EQ(seeker.Construct(player), expected);
    ExpectLeft(expected, {App(kConstruct, Named(expected, " Propagating."))}, {kFeatureQuery});
    ExpectUnconstructed();
  }
  Host::SetFeature(kFeature, E_SUCCESS);
  EXPECT_EQ(seeker.Construct(player), E_SUCCESS);
}

TEST_F(SeekerConstruction, RefusedFeatureAllocatesNothing) {
  Host::SetFeature(kFeature, E_OBJ_NOT_FOUND);
  Host::SetLogSink([](const Host::LogRecord&, void*) {}, nullptr);  // the capture would allocate
  Host::RecordCalls(false);
  const std::size_t before = CountAllocations();
  EXPECT_EQ(seeker.Construct(player), E_UNSUPPORTED_OPERATION);
  EXPECT_EQ(CountAllocations(), before);
}

TEST_F(SeekerConstruction, PlayerWithoutImplementationIsAnInvalidArgument) {
  Player neverConstructed;
  EXPECT_EQ(seeker.Construct(neverConstructed), E_INVALID_ARG);
  ExpectLeft(E_INVALID_ARG,
             {Sys(E_INVALID_ARG, "[E_INVALID_ARG] player instance is wrong"),
              App(kConstruct, "[E_INVALID_ARG] Failed to construct __pVideoKeyFrameSeekerImpl.")},
             {kFeatureQuery, "_PlayerImpl::GetInstance()"});
  ExpectUnconstructed();
}

TEST_F(SeekerConstruction, FailingAllocationIsReportedAndSuccessClearsTheLastResult) {
  Host::RecordCalls(false);  // the record would allocate
  {
    FailingAllocation failing(1);
    EXPECT_EQ(seeker.Construct(player), E_OUT_OF_MEMORY);
  }
  ExpectLeft(E_OUT_OF_MEMORY, {App(kConstruct, "[E_OUT_OF_MEMORY] Memory allocation failed")}, {});
  ExpectUnconstructed();
  const std::size_t before = CountAllocations();
  EXPECT_EQ(seeker.Construct(player), E_SUCCESS);
  EXPECT_EQ(CountAllocations(), before + 1);
  ExpectLeft(E_SUCCESS, {}, {});
}

TEST_F(SeekerConstruction, SecondConstructAssertsBehindTheFeatureGate) {
  ASSERT_EQ(seeker.Construct(player), E_SUCCESS);
  ExpectLeft(E_SUCCESS, {}, {kFeatureQuery, "_PlayerImpl::GetInstance()"});
  Player other;
  ASSERT_EQ(other.Construct(), E_SUCCESS);
  Forget();
  EXPECT_EQ(seeker.Construct(other), E_INVALID_STATE);
  ExpectLeft(kUntouched, {Assertion(kConstruct, "__pVideoKeyFrameSeekerImpl == null", kAlready)},
             {kFeatureQuery});
  Host::SetFeature(kFeature, Host::kFeatureAbsent);
  EXPECT_EQ(seeker.Construct(other), E_UNSUPPORTED_OPERATION);

  ASSERT_EQ(player.OpenFile("movie"), E_SUCCESS);  // still bound to the first player
  EXPECT_EQ(seeker.SeekTo(5000), E_SUCCESS);
  EXPECT_EQ(player.GetPosition(), 4000);
}

class Seeking : public SeekerConstruction {
 protected:
  Seeking() {
    EXPECT_EQ(player.OpenFile("movie"), E_SUCCESS);
    EXPECT_EQ(seeker.Construct(player), E_SUCCESS);
  }
};

TEST_F(Seeking, LandsOnTheKeyFrameAndLeavesTheLastResult) {
  Forget();
  EXPECT_EQ(seeker.SeekTo(4999), E_SUCCESS);
  ExpectLeft(kUntouched, {}, {"_PlayerImpl::SeekTo(4999, false)", "player_seek(4999, false)"});
  EXPECT_EQ(player.GetPosition(), 4000);
  EXPECT_TRUE(player.IsKeyFrame());
}

TEST_F(Seeking, PlayersFailureIsPassedOnUnchanged) {
  for (const result r : {E_INVALID_STATE, E_OUT_OF_MEMORY, E_SYSTEM, kForeign}) {
    Forget();
    Host::FailCall("_PlayerImpl::SeekTo", r, 1);
    EXPECT_EQ(seeker.SeekTo(0), r);
    ExpectLeft(r, {Sys(r, Named(r, " SeekTo failed"))}, {"_PlayerImpl::SeekTo(0, false)"});
  }
}

TEST_F(Seeking, PositionsReachThePlayerUnchangedAndBadOnesLoseNothing) {
  ASSERT_EQ(seeker.SeekTo(6000), E_SUCCESS);
  for (const long position : {-1L, 60001L, static_cast<long>(INT32_MIN), 2147483647L}) {
    EXPECT_EQ(seeker.SeekTo(position), E_INVALID_ARG) << position;
    EXPECT_EQ(player.GetPosition(), 6000);
  }
  EXPECT_EQ(seeker.SeekTo(60000), E_SUCCESS);
  EXPECT_EQ(player.Close(), E_SUCCESS);
  EXPECT_EQ(seeker.SeekTo(0), E_INVALID_STATE);
  Simulated::Media soundOnly;
  soundOnly.hasVideo = false;
  Simulated::SetMedia(soundOnly);
  ASSERT_EQ(player.OpenFile("song"), E_SUCCESS);
  EXPECT_EQ(seeker.SeekTo(0), E_INVALID_OPERATION);
}

TEST_F(LibraryTest, DestroyingASeekerNeverTouchesThePlayer) {
  Player player;
  ASSERT_EQ(player.Construct(), E_SUCCESS);
  Host::RecordCalls(true);
  { VideoKeyFrameSeeker unconstructed; }
  {
    VideoKeyFrameSeeker refused;
    Host::SetFeature(kFeature, Host::kFeatureAbsent);
    EXPECT_EQ(refused.Construct(player), E_UNSUPPORTED_OPERATION);
    Host::SetFeature(kFeature, E_SUCCESS);
  }
  Host::TakeCalls();
  {
    VideoKeyFrameSeeker bound;
    EXPECT_EQ(bound.Construct(player), E_SUCCESS);
    Host::TakeCalls();
  }
  EXPECT_THAT(Host::TakeCalls(), IsEmpty());
}

TEST(SeekerAssertionDeathTest, StoppingBackEndEndsTheProcessAfterTheReport) {
  EXPECT_DEATH(
      {
        Host::SetAssertionAction(Host::AssertionAction::kStop);
        VideoKeyFrameSeeker seeker;
        seeker.SeekTo(0);
      },
      "__pVideoKeyFrameSeekerImpl != null.*Not yet constructed! Construct\\(\\) should be called");
}

}  // namespace
