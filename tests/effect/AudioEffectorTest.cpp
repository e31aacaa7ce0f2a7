#include "EffectorTest.h"

#include <Tizen/Media/PlayerImpl.h>

#include <utility>

namespace {

using Simulated::Effects;
using Tizen::Media::_PlayerImpl;
using Tizen::Media::Player;
using Zelkora::Media::AudioEffector;
using Zelkora::Media::AudioEffectPreset;
using Zelkora::Media::AudioEffectType;

constexpr char kFeature[] = "audio_effector";
constexpr char kFeatureQuery[] =
    "SystemInfo::GetValue(http://developer.zelkora.example/tizen/feature/audio_effector)";
constexpr char kGetInstance[] = "_PlayerImpl::GetInstance()";
constexpr char kConstruct[] =
    "result Zelkora::Media::AudioEffector::Construct(Tizen::Media::Player&)";
constexpr char kImplConstruct[] =
    "result Zelkora::Media::_AudioEffectorImpl::Construct(Tizen::Media::Player&)";
constexpr char kNoMemory[] = "[E_OUT_OF_MEMORY] Memory allocation failed";
constexpr char kUnsupported[] =
    "[E_UNSUPPORTED_OPERATION] This feature is not supported in the current device.";

/// What the player's codes come to.
constexpr std::pair<int, result> kCodes[] = {{0, E_SUCCESS},
                                             {-22, E_INVALID_ARG},
                                             {-12, E_OUT_OF_MEMORY},
                                             {-38, E_INVALID_OPERATION},
                                             {-1, E_SYSTEM},
                                             {5, E_SYSTEM},
                                             {22, E_SYSTEM},
                                             {INT_MIN, E_SYSTEM},
                                             {static_cast<int>(0xFE6C0022), E_INVALID_STATE}};

std::string NotConstructed(result r) {
  return App(kConstruct, Named(r, " Failed to construct pAudioEffectorImpl."));
}

std::string NotYet(const std::string& signature) {
  return Assertion(signature, "__pAudioEffectorImpl != null", kNotYet);
}

/// An operation on one effect or preset.
struct Operation {
  const char* name;
  const char* parameters;  // the rest of its signature
  result (*call)(AudioEffector&, int value, int& first, int& second);
  const char* function;   // the player's
  const char* arguments;  // what that is given besides the player's number
  const char* unknown;    // the report of a value that isn't known
  int lowest, highest;    // of the known values

  std::string Signature(const char* className) const {
    return std::string("result Zelkora::Media::") + className + "::" + name + parameters;
  }
  std::string Failure(result r) const {
    return App(Signature("AudioEffector"),
               Named(r, std::string(" Failed to perform ") + name + " operation."));
  }
  std::string Call(int value) const {
    return std::string(function) + "(" + std::to_string(value) + arguments + ")";
  }
  /// The lines that every call of the player leaves.
  Lines Information(int first, int second, int code) const {
    if (name != std::string("GetEffectLevelRange")) return {};
    return {AppInfo(Signature("_AudioEffectorImpl"),
                    "minValue is " + std::to_string(first) + " ,maxValue is " +
                        std::to_string(second) + " and ret is " + std::to_string(code) +
                        " after player_audio_effect_get_value_range operation.")};
  }
};

const Operation kOperations[] = {
    {"SetEffectLevel", "(Zelkora::Media::AudioEffectType, int)",
     [](AudioEffector& effector, int value, int& first, int&) {
       return effector.SetEffectLevel(AudioEffectType(value), first);
     },
     "player_audio_effect_set_value", ", 9", kUnknownEffect, 1, 5},
    {"GetEffectLevel", "(Zelkora::Media::AudioEffectType, int&) const",
     [](AudioEffector& effector, int value, int& first, int&) {
       return effector.GetEffectLevel(AudioEffectType(value), first);
     },
     "player_audio_effect_get_value", "", kUnknownEffect, 1, 5},
    {"GetEffectLevelRange", "(Zelkora::Media::AudioEffectType, int&, int&) const",
     [](AudioEffector& effector, int value, int& first, int& second) {
       return effector.GetEffectLevelRange(AudioEffectType(value), first, second);
     },
     "player_audio_effect_get_value_range", "", kUnknownEffect, 1, 5},
    {"SetEffectPreset", "(Zelkora::Media::AudioEffectPreset)",
     [](AudioEffector& effector, int value, int&, int&) {
       return effector.SetEffectPreset(AudioEffectPreset(value));
     },
     "player_audio_effect_set_preset", "", kUnknownPreset, 0, 19},
};

TEST_F(EffectorTest, RefusedFeatureIsPropagatedAndAskedAgain) {
  for (const auto& [answer, expected] : kFeatureRefusals) {
    Host::SetFeature(kFeature, answer);
    EXPECT_EQ(effector.Construct(player), expected);
    ExpectLeft(expected, {App(kConstruct, Named(expected, " Propagating."))}, {kFeatureQuery});
  }
  Host::SetFeature(kFeature, E_SUCCESS);
  Construct();
}

TEST_F(EffectorTest, PlayerNeverConstructedOrWithoutNativeHandleIsRefusedAndNeverAsked) {
  Player neverConstructed;
  EXPECT_EQ(effector.Construct(neverConstructed), E_OUT_OF_MEMORY);
  ExpectLeft(E_OUT_OF_MEMORY, {App(kImplConstruct, kNoMemory), NotConstructed(E_OUT_OF_MEMORY)},
             {kFeatureQuery, kGetInstance});
  player_h& handle = _PlayerImpl::GetInstance(&player)->__hPlayer;
  const player_h kept = std::exchange(handle, nullptr);
  Forget();
  EXPECT_EQ(effector.Construct(player), E_INVALID_STATE);
  ExpectLeft(E_INVALID_STATE,
             {Assertion(kImplConstruct, "__pPlayerImpl->__hPlayer != null", kNotYet),
              NotConstructed(E_INVALID_STATE)},
             {kFeatureQuery, kGetInstance});
  handle = kept;
  Construct();
}

TEST_F(EffectorTest, PlayerIsSupportedWithAnyKnownEffectOrPreset) {
  const std::string effectsFail = kEffects.Failure(E_INVALID_OPERATION);
  const std::string presetsFail = kPresets.Failure(E_INVALID_OPERATION);
  const struct {
    const char* situation;
    std::vector<int> effects, presets;
    std::string failing;  // the enumeration that fails at once
    int enumerationError;
    bool supported;
    Lines lines;
  } rows[] = {
      {"neither", {}, {}, "", 0, false, {}},
      {"unknown alone", {6}, {20}, "", 0, false, {kEffects.Unknown(), kPresets.Unknown()}},
      {"effects fail, no preset", {1}, {}, kEffects.function, 0, false, {effectsFail}},
      {"both fail at their end", {1}, {4}, "", -38, false, {effectsFail, presetsFail}},
      {"effects alone", {3}, {}, "", 0, true, {}},
      {"presets alone", {}, {0}, "", 0, true, {}},
      {"effects fail, presets", {1}, {4}, kEffects.function, 0, true, {effectsFail}},
      {"effects, presets fail", {1}, {4}, kPresets.function, 0, true, {presetsFail}},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.situation);
    Simulated::SetEffects({row.effects, row.presets, Effects().ranges, row.enumerationError});
    if (!row.failing.empty()) Host::FailCall(row.failing.c_str(), -38, 1);
    Lines lines = row.lines;
    if (!row.supported) {
      lines.push_back(App(kImplConstruct, kUnsupported));
      lines.push_back(NotConstructed(E_UNSUPPORTED_OPERATION));
    }
    const result expected = row.supported ? E_SUCCESS : E_UNSUPPORTED_OPERATION;
    AudioEffector another;
    EXPECT_EQ((row.supported ? another : effector).Construct(player), expected);
    ExpectLeft(expected, lines, {kFeatureQuery, kGetInstance, kEffects.Call(), kPresets.Call()});
  }
  Construct();  // refused many times, but still unconstructed
}

TEST_F(EffectorTest, ConstructionCanSpareAllMemoryButTheFirst) {
  Simulated::SetEffects({{1}, {1}, Effects().ranges, 0});
  Host::RecordCalls(false);  // the record would allocate
  std::size_t nth = 0;
  for (bool failed = true; failed;) {
    AudioEffector another;
    FailingAllocation failing(++nth);
    const result r = another.Construct(player);
    failed = failing.HasFailed();
    EXPECT_EQ(r, nth == 1 ? E_OUT_OF_MEMORY : E_SUCCESS);
    EXPECT_EQ(GetLastResult(), r);
  }
  EXPECT_EQ(nth, 6u);  // the effector, and each list with its one value
  ExpectLeft(E_SUCCESS, {App(kConstruct, kNoMemory), kEffects.NoMemory(), kPresets.NoMemory()}, {});
}

TEST_F(EffectorTest, SecondOneIsAssertedBehindTheFeatureGateAndChangesNothing) {
  Construct();
  Player neverConstructed;
  EXPECT_EQ(effector.Construct(neverConstructed), E_INVALID_STATE);
  ExpectLeft(kUntouched,
             {Assertion(kConstruct, "__pAudioEffectorImpl == null",
                        "Already constructed. Calling Construct() twice or more on a same instance "
                        "is not allowed for this class.")},
             {kFeatureQuery});
  Host::SetFeature(kFeature, Host::kFeatureAbsent);
  EXPECT_EQ(effector.Construct(neverConstructed), E_UNSUPPORTED_OPERATION);
  ExpectLeft(E_UNSUPPORTED_OPERATION, {App(kConstruct, "[E_UNSUPPORTED_OPERATION] Propagating.")},
             {kFeatureQuery});
  EXPECT_EQ(effector.SetEffectLevel(AudioEffectType(1), 5), E_SUCCESS);
}

TEST_F(EffectorTest, UnconstructedEffectorAssertsAndDoesNothing) {
  for (const Operation& operation : kOperations) {
    SCOPED_TRACE(operation.name);
    int number = 9;
    EXPECT_EQ(operation.call(effector, 2, number, number), E_INVALID_STATE);
    ExpectLeft(E_SUCCESS, {NotYet(operation.Signature("AudioEffector"))}, {});
    EXPECT_EQ(number, 9);
  }
  EXPECT_EQ(effector.ResetAllToDefault(), E_INVALID_STATE);
  ExpectLeft(E_SUCCESS, {NotYet("result Zelkora::Media::AudioEffector::ResetAllToDefault()")}, {});
  EXPECT_EQ(effector.GetSupportedEffectListN(), nullptr);
  ExpectLeft(kUntouched, {NotYet(kEffects.Signature("AudioEffector"))}, {});
  EXPECT_EQ(effector.GetSupportedEffectPresetListN(), nullptr);
  ExpectLeft(kUntouched, {NotYet(kPresets.Signature("AudioEffector"))}, {});
}

TEST(EffectorAssertionDeathTest, StoppingBackEndEndsTheProcessAfterTheReport) {
  Host::SetAssertionAction(Host::AssertionAction::kStop);
  AudioEffector effector;
  EXPECT_DEATH(effector.GetSupportedEffectListN(), "__pAudioEffectorImpl != null.*Not yet");
}

class ConstructedEffector : public EffectorTest {
 protected:
  ConstructedEffector() { Construct(); }
};

TEST_F(ConstructedEffector, PlayersAnswerIsConvertedAndAFailureReportedByTheFacade) {
  for (const Operation& operation : kOperations) {
    for (const auto& [code, expected] : kCodes) {
      SCOPED_TRACE(operation.name + std::string(" gives ") + std::to_string(code));
      Host::FailCall(operation.function, code, 1);
      int first = 9, second = 10;
      EXPECT_EQ(operation.call(effector, 3, first, second), expected);
      Lines lines = operation.Information(9, 10, code);
      if (expected != E_SUCCESS) lines.push_back(operation.Failure(expected));
      ExpectLeft(expected, lines, {operation.Call(3)});
    }
  }
}

TEST_F(ConstructedEffector, UnknownValueNeverReachesThePlayer) {
  for (const Operation& operation : kOperations) {
    for (const int value : {operation.lowest - 1, operation.highest + 1, INT_MIN, INT_MAX}) {
      SCOPED_TRACE(operation.name + std::string(" of ") + std::to_string(value));
      int number = 9;
      EXPECT_EQ(operation.call(effector, value, number, number), E_INVALID_ARG);
      ExpectLeft(E_INVALID_ARG,
                 {App(operation.Signature("_AudioEffectorImpl"), operation.unknown),
                  operation.Failure(E_INVALID_ARG)},
                 {});
      EXPECT_EQ(number, 9);
    }
  }
}

TEST_F(ConstructedEffector, EachEffectIsThePlayersOfTheSameNumber) {
  Simulated::SetEffects(
      {{1, 2, 3, 4, 5}, {}, {{{-1, 10, 0}, {-2, 20, 0}, {-3, 30, 0}, {-4, 40, 0}, {-5, 50, 0}}}});
  for (int i = 1; i <= 5; ++i) {
    const auto type = AudioEffectType(i);
    EXPECT_EQ(effector.SetEffectLevel(type, -i), E_SUCCESS);
    int level = 0, min = 0, max = 0;
    EXPECT_EQ(effector.GetEffectLevel(type, level), E_SUCCESS);
    EXPECT_EQ(effector.GetEffectLevelRange(type, min, max), E_SUCCESS);
    EXPECT_THAT((std::vector{level, min, max}), testing::ElementsAre(-i, -i, 10 * i));
  }
  Host::TakeCalls();
  for (const int level : {-2, 11, INT_MIN, INT_MAX}) {  // the player's to judge
    EXPECT_EQ(effector.SetEffectLevel(AudioEffectType(1), level), E_INVALID_ARG);
    EXPECT_THAT(Host::TakeCalls(), testing::ElementsAre("player_audio_effect_set_value(1, " +
                                                        std::to_string(level) + ")"));
  }
}

TEST_F(ConstructedEffector, EachPresetIsSentUnderThePlayersNumber) {
  constexpr int kNumbers[20] = {1,  0,  2,  3,  4,  5,  6,  7,  8,  9,
                                11, 12, 13, 14, 15, 10, 16, 17, 18, 19};
  for (int i = 0; i < 20; ++i) {
    EXPECT_EQ(effector.SetEffectPreset(AudioEffectPreset(i)), E_SUCCESS);
    ExpectLeft(E_SUCCESS, {},
               {"player_audio_effect_set_preset(" + std::to_string(kNumbers[i]) + ")"});
  }
}

TEST_F(ConstructedEffector, ResetClearsTheEffectsInOrderThenSelectsTheNeutralPreset) {
  Lines steps;
  for (int i = 1; i <= 5; ++i)
    steps.push_back("player_audio_effect_clear(" + std::to_string(i) + ")");
  steps.push_back("player_audio_effect_set_preset(1)");
  for (int failing = 1; failing <= 5; ++failing) {
    Host::FailCall("player_audio_effect_clear", -38, static_cast<unsigned>(failing));
    EXPECT_EQ(effector.ResetAllToDefault(), E_INVALID_ARG);
    ExpectLeft(
        E_INVALID_ARG,
        {App("result Zelkora::Media::_AudioEffectorImpl::ResetAllToDefault()", kUnknownEffect)},
        Lines(steps.begin(), steps.begin() + failing));
  }
  for (const auto& [code, expected] : kCodes) {
    SCOPED_TRACE(code);
    Host::FailCall("player_audio_effect_set_preset", code, 1);
    EXPECT_EQ(effector.ResetAllToDefault(), expected);
    ExpectLeft(E_SUCCESS, {}, steps);  // whatever the preset came to
  }
}

}  // namespace
