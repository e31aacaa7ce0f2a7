#include "support/Allocations.h"
#include "support/LibraryTest.h"

#include <Tizen/Media/Player.h>
#include <Tizen/Media/PlayerImpl.h>
#include <Zelkora/Media/AudioEffector.h>

#include <climits>
#include <memory>
#include <optional>
#include <utility>

namespace {

using Tizen::Media::Player;
using Zelkora::Media::AudioEffector;
using Zelkora::Media::AudioEffectPreset;
using Zelkora::Media::AudioEffectType;
using Values = std::vector<int>;

constexpr char kFeature[] = "audio_effector";
constexpr char kFeatureQuery[] =
    "SystemInfo::GetValue(http://developer.zelkora.example/tizen/feature/audio_effector)";
constexpr char kNotYet[] = "Not yet constructed! Construct() should be called before use";
constexpr char kNoMemory[] = "[E_OUT_OF_MEMORY] Memory allocation failed";

/// What the player's codes come to.
constexpr std::pair<int, result> kCodes[] = {{0, E_SUCCESS},
                                             {-22, E_INVALID_ARG},
                                             {-12, E_OUT_OF_MEMORY},
                                             {-38, E_INVALID_OPERATION},
                                             {-1, E_SYSTEM},
                                             {22, E_SYSTEM},
                                             {static_cast<int>(0xFE6C0022), E_INVALID_STATE}};

std::string Failed(result r, const std::string& what) {
  return Named(r, " Failed to perform " + what + " operation.");
}

/// How an operation signs its lines.
struct Operation {
  std::string type, name, parameters;

  std::string In(const char* className) const {
    return type + " Zelkora::Media::" + className + "::" + name + parameters;
  }
  std::string Facade(const std::string& text) const { return App(In("AudioEffector"), text); }
  std::string Insides(const std::string& text) const { return App(In("_AudioEffectorImpl"), text); }
  std::string NotYet() const {
    return Assertion(In("AudioEffector"), "__pAudioEffectorImpl != null", kNotYet);
  }
};
const Operation kConstruct = {"result", "Construct", "(Tizen::Media::Player&)"};
const Operation kReset = {"result", "ResetAllToDefault", "()"};

/// Effects or presets, and the operation that lists them.
struct Kind {
  Operation operation;
  std::optional<Values> (*get)(const AudioEffector&);
  Values Simulated::Effects::*reported;
  int lowest;
  Values numbers;  // the player's, of the values from the lowest one on
  std::string enumeration, callback, unknown;

  int End() const { return lowest + static_cast<int>(numbers.size()); }
  Values UnknownValues() const { return {INT_MIN, lowest - 1, End(), INT_MAX}; }
  std::string Call() const { return enumeration + "()"; }
  std::string Failure(result r) const { return operation.Insides(Failed(r, enumeration)); }
  std::string Unknown() const {
    return App("static bool Zelkora::Media::_AudioEffectorImpl::" + callback, unknown);
  }
};

/// \return what a list holds; nothing when it is null
template <typename T, auto operation>
std::optional<Values> Get(const AudioEffector& effector) {
  const std::unique_ptr<Tizen::Base::Collection::IListT<T>> list((effector.*operation)());
  if (list == nullptr) return std::nullopt;
  Values values;
  for (T value; list->GetAt(static_cast<int>(values.size()), value) == E_SUCCESS;) {
    values.push_back(value);
  }
  return values;
}

const Kind kEffects = {{"Tizen::Base::Collection::IListT<Zelkora::Media::AudioEffectType>*",
                        "GetSupportedEffectListN", "() const"},
                       Get<AudioEffectType, &AudioEffector::GetSupportedEffectListN>,
                       &Simulated::Effects::effects,
                       1,
                       {1, 2, 3, 4, 5},
                       "player_audio_effect_foreach_supported_effect",
                       "PlayerAudioEffectSupportedEffectCallBack(audio_effect_e, void*)",
                       "[E_INVALID_ARG] Invalid argument is used. Unsupported Audio Effect type."};
const Kind kPresets = {{"Tizen::Base::Collection::IListT<Zelkora::Media::AudioEffectPreset>*",
                        "GetSupportedEffectPresetListN", "() const"},
                       Get<AudioEffectPreset, &AudioEffector::GetSupportedEffectPresetListN>,
                       &Simulated::Effects::presets,
                       0,
                       {1, 0, 2, 3, 4, 5, 6, 7, 8, 9, 11, 12, 13, 14, 15, 10, 16, 17, 18, 19},
                       "player_audio_effect_foreach_supported_preset",
                       "PlayerAudioEffectSupportedPresetCallBack(audio_effect_preset_e, void*)",
                       "[E_INVALID_ARG] Invalid argument is used. Unsupported Audio Preset type."};

/// An operation on one effect or preset.
struct ValueOperation : Operation {
  std::string function;  // the player's
  const Kind& kind;

  result Perform(AudioEffector& effector, int value, int& first, int& second) const {
    const auto effect = AudioEffectType(value);
    if (name == "SetEffectLevel") return effector.SetEffectLevel(effect, first);
    if (name == "GetEffectLevel") return effector.GetEffectLevel(effect, first);
    if (name == "GetEffectLevelRange") return effector.GetEffectLevelRange(effect, first, second);
    return effector.SetEffectPreset(AudioEffectPreset(value));
  }
  std::string Call(int number, int level) const {
    const std::string set = name == "SetEffectLevel" ? ", " + std::to_string(level) : "";
    return function + "(" + std::to_string(number) + set + ")";
  }
  /// The lines that a call of the player leaves.
  Lines Left(int first, int second, int code, result r) const {
    Lines lines;
    if (name == "GetEffectLevelRange") {
      lines = {AppInfo(In("_AudioEffectorImpl"),
                       "minValue is " + std::to_string(first) + " ,maxValue is " +
                           std::to_string(second) + " and ret is " + std::to_string(code) +
                           " after player_audio_effect_get_value_range operation.")};
    }
    if (r != E_SUCCESS) lines.push_back(Facade(Failed(r, name)));
    return lines;
  }
};
const ValueOperation kValueOperations[] = {
    {"result", "SetEffectLevel", "(Zelkora::Media::AudioEffectType, int)",
     "player_audio_effect_set_value", kEffects},
    {"result", "GetEffectLevel", "(Zelkora::Media::AudioEffectType, int&) const",
     "player_audio_effect_get_value", kEffects},
    {"result", "GetEffectLevelRange", "(Zelkora::Media::AudioEffectType, int&, int&) const",
     "player_audio_effect_get_value_range", kEffects},
    {"result", "SetEffectPreset", "(Zelkora::Media::AudioEffectPreset)",
     "player_audio_effect_set_preset", kPresets},
};

class EffectorTest : public LibraryTest {
 protected:
  EffectorTest() {
    EXPECT_EQ(player.Construct(), E_SUCCESS);
    Forget();
  }

  void Construct() {
    ASSERT_EQ(effector.Construct(player), E_SUCCESS);
    Forget();
  }

  /// Constructs an effector behind the feature gate. Only when that fails it can be tried again.
  void ExpectConstruct(Player& with, result expected, Lines lines, const Lines& asked) {
    AudioEffector another;
    EXPECT_EQ(another.Construct(with), expected);
    if (expected != E_SUCCESS) {
      lines.push_back(
          kConstruct.Facade(Named(expected, " Failed to construct pAudioEffectorImpl.")));
    }
    Lines calls = {kFeatureQuery, "_PlayerImpl::GetInstance()"};
    calls.insert(calls.end(), asked.begin(), asked.end());
    ExpectLeft(expected, lines, calls);
    EXPECT_EQ(another.Construct(neverConstructed) == E_INVALID_STATE, expected == E_SUCCESS);
    Forget();
  }

  Player player, neverConstructed;
  AudioEffector effector;
};

TEST_F(EffectorTest, FeatureIsAskedForEachTimeAndASecondConstructChangesNothing) {
  for (const bool isConstructed : {false, true}) {
    for (const auto& [answer, expected] : kFeatureRefusals) {
      Host::SetFeature(kFeature, answer);
      EXPECT_EQ(effector.Construct(neverConstructed), expected);
      ExpectLeft(expected, {kConstruct.Facade(Named(expected, " Propagating."))}, {kFeatureQuery});
    }
    Host::SetFeature(kFeature, E_SUCCESS);
    if (!isConstructed) Construct();
  }
  EXPECT_EQ(effector.Construct(neverConstructed), E_INVALID_STATE);
  ExpectLeft(kUntouched,
             {Assertion(kConstruct.In("AudioEffector"), "__pAudioEffectorImpl == null",
                        "Already constructed. Calling Construct() twice or more on a same instance "
                        "is not allowed for this class.")},
             {kFeatureQuery});
  EXPECT_EQ(effector.ResetAllToDefault(), E_SUCCESS);
}

TEST_F(EffectorTest, PlayerNeverConstructedOrWithoutNativeHandleIsRefusedAndNeverAsked) {
  ExpectConstruct(neverConstructed, E_OUT_OF_MEMORY, {kConstruct.Insides(kNoMemory)}, {});
  player_h& handle = Tizen::Media::_PlayerImpl::GetInstance(&player)->__hPlayer;
  const player_h kept = std::exchange(handle, nullptr);
  Forget();
  ExpectConstruct(
      player, E_INVALID_STATE,
      {Assertion(kConstruct.In("_AudioEffectorImpl"), "__pPlayerImpl->__hPlayer != null", kNotYet)},
      {});
  handle = kept;
}

TEST_F(EffectorTest, PlayerIsSupportedWithAnyKnownEffectOrPreset) {
  const std::string unsupported = kConstruct.Insides(
      "[E_UNSUPPORTED_OPERATION] This feature is not supported in the current device.");
  const auto expect = [&](const Simulated::Effects& effects, result r, const Lines& lines) {
    Simulated::SetEffects(effects);
    ExpectConstruct(player, r, lines, {kEffects.Call(), kPresets.Call()});
  };
  expect({{6}, {20}}, E_UNSUPPORTED_OPERATION,
         {kEffects.Unknown(), kPresets.Unknown(), unsupported});
  expect({{3}, {}}, E_SUCCESS, {});
  expect({{}, {1}}, E_SUCCESS, {});
  Host::FailCall(kEffects.enumeration.c_str(), -1, 1);
  expect({{1}, {}}, E_UNSUPPORTED_OPERATION, {kEffects.Failure(E_SYSTEM), unsupported});
  Host::FailCall(kPresets.enumeration.c_str(), -1, 1);
  expect({{1}, {1}}, E_SUCCESS, {kPresets.Failure(E_SYSTEM)});
}

TEST_F(EffectorTest, UnconstructedEffectorAssertsAndDoesNothing) {
  for (const ValueOperation& operation : kValueOperations) {
    int number = 9;
    EXPECT_EQ(operation.Perform(effector, 2, number, number), E_INVALID_STATE);
    ExpectLeft(E_SUCCESS, {operation.NotYet()}, {});
  }
  EXPECT_EQ(effector.ResetAllToDefault(), E_INVALID_STATE);
  ExpectLeft(E_SUCCESS, {kReset.NotYet()}, {});
  for (const Kind* kind : {&kEffects, &kPresets}) {
    EXPECT_EQ(kind->get(effector), std::nullopt);
    ExpectLeft(kUntouched, {kind->operation.NotYet()}, {});
  }
}

TEST_F(EffectorTest, WithoutMemoryThereIsNoEffectorNorListAndAListLacksWhatItCouldNotTakeIn) {
  const auto withFailing = [](std::size_t nth, auto operation) {
    FailingAllocation failing(nth);
    return operation();
  };
  Host::RecordCalls(false);  // the record would allocate
  EXPECT_EQ(withFailing(1, [&] { return effector.Construct(player); }), E_OUT_OF_MEMORY);
  ExpectLeft(E_OUT_OF_MEMORY, {kConstruct.Facade(kNoMemory)}, {});
  EXPECT_EQ(effector.Construct(player), E_SUCCESS);
  Simulated::SetEffects({{2, 3}, {2, 3}, {}, 0});
  for (const Kind* kind : {&kEffects, &kPresets}) {
    SetLastResult(kUntouched);
    EXPECT_EQ(withFailing(2, [&] { return kind->get(effector); }), Values{3});
    ExpectLeft(kUntouched, {}, {});
    EXPECT_EQ(withFailing(1, [&] { return kind->get(effector); }), std::nullopt);
    ExpectLeft(E_OUT_OF_MEMORY, {kind->operation.Insides(std::string(kNoMemory) + ".")}, {});
  }
}

class ConstructedEffector : public EffectorTest {
 protected:
  ConstructedEffector() { Construct(); }
};

TEST_F(ConstructedEffector, PlayersAnswerIsConvertedAndAFailureReportedByTheFacade) {
  for (const ValueOperation& operation : kValueOperations) {
    for (const auto& [code, expected] : kCodes) {
      SCOPED_TRACE(operation.name + " gives " + std::to_string(code));
      Host::FailCall(operation.function.c_str(), code, 1);
      int first = INT_MIN, second = INT_MAX;  // levels are the player's to judge
      EXPECT_EQ(operation.Perform(effector, 2, first, second), expected);
      ExpectLeft(expected, operation.Left(INT_MIN, INT_MAX, code, expected),
                 {operation.Call(2, INT_MIN)});
    }
  }
}

TEST_F(ConstructedEffector, KnownValuesAloneReachThePlayerUnderItsNumbers) {
  for (const ValueOperation& operation : kValueOperations) {
    SCOPED_TRACE(operation.name);
    const Kind& kind = operation.kind;
    for (int value = kind.lowest; value < kind.End(); ++value) {
      int first = operation.name == "SetEffectLevel" ? value : 0, second = 0;
      EXPECT_EQ(operation.Perform(effector, value, first, second), E_SUCCESS);
      ExpectLeft(E_SUCCESS, operation.Left(first, second, 0, E_SUCCESS),
                 {operation.Call(kind.numbers[std::size_t(value - kind.lowest)], first)});
      const int min = value < 3 ? -12 : 0;
      const int effects = operation.name == "GetEffectLevelRange" ? min : value;
      EXPECT_EQ(first, &kind == &kPresets ? 0 : effects);
    }
    for (const int value : kind.UnknownValues()) {
      int kept = 9;
      EXPECT_EQ(operation.Perform(effector, value, kept, kept), E_INVALID_ARG);
      ExpectLeft(E_INVALID_ARG,
                 {operation.Insides(kind.unknown),
                  operation.Facade(Failed(E_INVALID_ARG, operation.name))},
                 {});
      EXPECT_EQ(kept, 9);
    }
  }
}

TEST_F(ConstructedEffector, ResetClearsTheEffectsInOrderThenSelectsTheNeutralPreset) {
  Lines steps;
  for (unsigned i = 1; i <= 5; ++i) {
    Host::FailCall("player_audio_effect_clear", -38, i);
    EXPECT_EQ(effector.ResetAllToDefault(), E_INVALID_ARG);
    steps.push_back("player_audio_effect_clear(" + std::to_string(i) + ")");
    ExpectLeft(E_INVALID_ARG, {kReset.Insides(kEffects.unknown)}, steps);
  }
  steps.push_back("player_audio_effect_set_preset(1)");
  for (const auto& [code, expected] : kCodes) {
    Host::FailCall("player_audio_effect_set_preset", code, 1);
    EXPECT_EQ(effector.ResetAllToDefault(), expected);
    ExpectLeft(E_SUCCESS, {}, steps);  // whatever the preset came to
  }
}

TEST_F(ConstructedEffector, ListHoldsTheKnownValuesInThePlayersOrderAndIsNullWhenThePlayerFails) {
  for (const Kind* kind : {&kEffects, &kPresets}) {
    SCOPED_TRACE(kind->operation.name);
    Simulated::Effects effects;
    Values& reported = effects.*(kind->reported);
    reported = kind->UnknownValues();
    reported.insert(reported.end(), kind->numbers.begin(), kind->numbers.end());
    reported.push_back(kind->numbers.front());  // again
    Values known;
    for (int value = kind->lowest; value < kind->End(); ++value) known.push_back(value);
    known.push_back(kind->lowest);
    Simulated::SetEffects(effects);
    EXPECT_EQ(kind->get(effector), known);
    ExpectLeft(E_INVALID_ARG, Lines(4, kind->Unknown()), {kind->Call()});

    reported = {};
    Simulated::SetEffects(effects);
    EXPECT_EQ(kind->get(effector), Values());
    ExpectLeft(kUntouched, {}, {kind->Call()});

    reported = {1, 2};
    effects.enumerationError = -22;
    Simulated::SetEffects(effects);
    EXPECT_EQ(kind->get(effector), std::nullopt);
    ExpectLeft(E_INVALID_ARG, {kind->Failure(E_INVALID_ARG)}, {kind->Call()});
  }
}

}  // namespace
