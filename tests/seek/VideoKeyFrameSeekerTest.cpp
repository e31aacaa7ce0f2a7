#include "support/Allocations.h"
#include "support/LibraryTest.h"

#include <Tizen/Media/Player.h>
#include <Zelkora/Media/VideoKeyFrameSeeker.h>

namespace {

using testing::ElementsAre;
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
  SeekerConstruction() { EXPECT_EQ(player.Construct(), E_SUCCESS); }

  /// A seeker that failed to be constructed must not reach any player.
  void ExpectUnconstructed() {
    log.Take();
    EXPECT_EQ(seeker.SeekTo(0), E_INVALID_STATE);
    EXPECT_THAT(log.Take(),
                ElementsAre(Assertion(kSeekTo, "__pVideoKeyFrameSeekerImpl != null", kNotYet)));
  }

  Player player;
  VideoKeyFrameSeeker seeker;
};

TEST_F(SeekerConstruction, RefusedFeatureIsPropagatedAndAskedAgain) {
  const struct {
    result answer, expected;
  } rows[] = {
      {Host::kFeatureAbsent, E_UNSUPPORTED_OPERATION},
      {E_OBJ_NOT_FOUND, E_UNSUPPORTED_OPERATION},
      {E_SYSTEM, E_SYSTEM},
      {0xA0001234, 0xA0001234},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(GetErrorMessage(row.answer));
    Host::SetFeature(kFeature, row.answer);
    EXPECT_EQ(seeker.Construct(player), row.expected);
    EXPECT_EQ(GetLastResult(), row.expected);
    EXPECT_THAT(log.Take(),
                ElementsAre(App(kConstruct, "[" + std::string(GetErrorMessage(row.expected)) +
                                                "] Propagating.")));
    ExpectUnconstructed();
  }
  Host::SetFeature(kFeature, E_SUCCESS);
  EXPECT_EQ(seeker.Construct(player), E_SUCCESS);
}

TEST_F(SeekerConstruction, RefusedFeatureAllocatesNothing) {
  Host::SetFeature(kFeature, E_OBJ_NOT_FOUND);
  Host::SetLogSink([](const Host::LogRecord&, void*) {}, nullptr);  // the capture would allocate
  const std::size_t before = CountAllocations();
  EXPECT_EQ(seeker.Construct(player), E_UNSUPPORTED_OPERATION);
  EXPECT_EQ(CountAllocations(), before);
}

TEST_F(SeekerConstruction, PlayerWithoutImplementationIsAnInvalidArgument) {
  Player neverConstructed;
  EXPECT_EQ(seeker.Construct(neverConstructed), E_INVALID_ARG);
  EXPECT_EQ(GetLastResult(), E_INVALID_ARG);
  EXPECT_THAT(log.Take(),
              ElementsAre(Sys(E_INVALID_ARG, "[E_INVALID_ARG] player instance is wrong"),
                          App(kConstruct,
                              "[E_INVALID_ARG] Failed to construct __pVideoKeyFrameSeekerImpl.")));
  ExpectUnconstructed();
}

TEST_F(SeekerConstruction, EachFailingAllocationIsReportedOnce) {
  std::size_t sites = 0;
  for (;; ++sites) {
    FailingAllocation failing(sites + 1);
    const result r = seeker.Construct(player);
    if (!failing.HasFailed()) break;
    EXPECT_EQ(r, E_OUT_OF_MEMORY);
    EXPECT_EQ(GetLastResult(), E_OUT_OF_MEMORY);
    EXPECT_THAT(log.Take(),
                ElementsAre(App(kConstruct, "[E_OUT_OF_MEMORY] Memory allocation failed")));
    ExpectUnconstructed();
  }
  EXPECT_EQ(sites, 1u);
  EXPECT_EQ(player.OpenFile("movie"), E_SUCCESS);
  EXPECT_EQ(seeker.SeekTo(4000), E_SUCCESS);
}

TEST_F(SeekerConstruction, SuccessClearsAnEarlierFailureAndAsksForTheFeatureOnce) {
  SetLastResult(E_SYSTEM);
  Host::RecordCalls(true);
  EXPECT_EQ(seeker.Construct(player), E_SUCCESS);
  EXPECT_EQ(GetLastResult(), E_SUCCESS);
  EXPECT_THAT(Host::TakeCalls(), ElementsAre(kFeatureQuery, "_PlayerImpl::GetInstance()"));
  EXPECT_THAT(log.Take(), IsEmpty());
}

TEST_F(SeekerConstruction, SecondConstructAssertsBehindTheFeatureGate) {
  ASSERT_EQ(seeker.Construct(player), E_SUCCESS);
  SetLastResult(E_SYSTEM);
  Player other;
  ASSERT_EQ(other.Construct(), E_SUCCESS);
  EXPECT_EQ(seeker.Construct(other), E_INVALID_STATE);
  EXPECT_EQ(GetLastResult(), E_SYSTEM);
  EXPECT_THAT(log.Take(),
              ElementsAre(Assertion(kConstruct, "__pVideoKeyFrameSeekerImpl == null", kAlready)));

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
  SetLastResult(E_SYSTEM);
  Host::RecordCalls(true);
  EXPECT_EQ(seeker.SeekTo(4999), E_SUCCESS);
  EXPECT_THAT(Host::TakeCalls(),
              ElementsAre("_PlayerImpl::SeekTo(4999, false)", "player_seek(4999, false)"));
  EXPECT_EQ(GetLastResult(), E_SYSTEM);
  EXPECT_EQ(player.GetPosition(), 4000);
  EXPECT_TRUE(player.IsKeyFrame());
  EXPECT_THAT(log.Take(), IsEmpty());
}

TEST_F(Seeking, PlayersFailureIsPassedOnUnchanged) {
  for (const result r : {E_INVALID_STATE, E_OUT_OF_MEMORY, E_SYSTEM, result{0xA0001234}}) {
    ClearLastResult();
    Host::FailCall("_PlayerImpl::SeekTo", r, 1);
    EXPECT_EQ(seeker.SeekTo(0), r);
    EXPECT_EQ(GetLastResult(), r);
    EXPECT_THAT(log.Take(),
                ElementsAre(Sys(r, "[" + std::string(GetErrorMessage(r)) + "] SeekTo failed")));
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
