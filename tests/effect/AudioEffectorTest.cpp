#include "support/Operations.h"

#include <climits>
#include <tuple>

namespace {

using namespace Zelkora::Media;

using Values = std::vector<int>;

constexpr char kEffectorQuery[] =
    "SystemInfo::GetValue(http://developer.zelkora.example/tizen/feature/audio_effector)";

/// Effects or presets, and the operation that lists them.
struct Kind {
  std::optional<Values> (*get)(const AudioEffector&);
  Values Simulated::Effects::*reported;
  int lowest;
  Values numbers;  // the player's, of the values from the lowest one on
  std::string enumeration;

  int End() const { return lowest + static_cast<int>(numbers.size()); }
  Values UnknownValues() const { return {INT_MIN, lowest - 1, End(), INT_MAX}; }
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

const Kind kEffects = {Get<AudioEffectType, &AudioEffector::GetSupportedEffectListN>,
                       &Simulated::Effects::effects,
                       1,
                       {1, 2, 3, 4, 5},
                       "player_audio_effect_foreach_supported_effect"};
const Kind kPresets = {Get<AudioEffectPreset, &AudioEffector::GetSupportedEffectPresetListN>,
                       &Simulated::Effects::presets,
                       0,
                       {1, 0, 2, 3, 4, 5, 6, 7, 8, 9, 11, 12, 13, 14, 15, 10, 16, 17, 18, 19},
                       "player_audio_effect_foreach_supported_preset"};

/// What an operation finds in its arguments, and leaves there unless it answers.
constexpr std::pair kUnwritten(999, 999);

class EffectorTest : public LibraryTest {
 protected:
  EffectorTest() {
    Prepare("SetEffectLevel");
    Forget();
  }
};

TEST_F(EffectorTest, FeatureIsAskedForFirstAndASecondConstructChangesNothing) {
  Tizen::Media::Player neverConstructed;
  Host::SetFeature("audio_effector", Host::kFeatureAbsent);
  EXPECT_EQ(effector->Construct(neverConstructed), E_UNSUPPORTED_OPERATION);
  Host::SetFeature("audio_effector", E_SUCCESS);
  EXPECT_EQ(effector->Construct(neverConstructed), E_INVALID_STATE);
  EXPECT_EQ(Host::TakeCalls(), (Lines{kEffectorQuery, kEffectorQuery}));
  EXPECT_EQ(effector->ResetAllToDefault(), E_SUCCESS);
}

TEST_F(EffectorTest, PlayerIsSupportedWithAnyKnownEffectOrPreset) {
  const std::tuple<Values, Values, result> rows[] = {
      {{3}, {}, E_SUCCESS}, {{}, {1}, E_SUCCESS}, {{6}, {20}, E_UNSUPPORTED_OPERATION}};
  for (const auto& [effects, presets, expected] : rows) {
    AudioEffector another;
    Simulated::SetEffects({effects, presets});
    Forget();
    EXPECT_EQ(another.Construct(*player), expected);
    EXPECT_EQ(GetLastResult(), expected);
    EXPECT_EQ(Host::TakeCalls(), (Lines{kEffectorQuery, "_PlayerImpl::GetInstance()",
                                        kEffects.enumeration + "()", kPresets.enumeration + "()"}));
  }
}

TEST_F(EffectorTest, KnownValuesAloneReachThePlayerUnderItsNumbers) {
  const std::tuple<std::string, std::string, const Kind&, std::pair<int, int> (*)(int)> rows[] = {
      {"SetEffectLevel", "player_audio_effect_set_value", kEffects, [](int) { return kUnwritten; }},
      {"GetEffectLevel", "player_audio_effect_get_value", kEffects,
       [](int value) { return std::pair(value, 999); }},
      {"GetEffectLevelRange", "player_audio_effect_get_value_range", kEffects,
       [](int value) { return value < 3 ? std::pair(-12, 12) : std::pair(0, 100); }},
      {"SetEffectPreset", "player_audio_effect_set_preset", kPresets,
       [](int) { return kUnwritten; }},
  };
  for (const auto& [name, function, kind, answer] : rows) {
    const auto& perform = kOperations.at("AudioEffector::" + name);
    const auto expect = [&](int value, result r, const Lines& calls, std::pair<int, int> written) {
      SCOPED_TRACE(function + " " + std::to_string(value));
      effect = AudioEffectType(value);
      preset = AudioEffectPreset(value);
      level = value;
      std::tie(low, high) = kUnwritten;
      EXPECT_EQ(perform().Result(), r);
      EXPECT_EQ(Host::TakeCalls(), calls);
      EXPECT_EQ(std::pair(low, high), written);
    };
    for (const int value : kind.UnknownValues()) expect(value, E_INVALID_ARG, {}, kUnwritten);
    for (int value = kind.lowest; value < kind.End(); ++value) {
      const std::string number = std::to_string(kind.numbers[std::size_t(value - kind.lowest)]);
      const std::string set = name == "SetEffectLevel" ? ", " + std::to_string(value) : "";
      expect(value, E_SUCCESS, {function + "(" + number + set + ")"}, answer(value));
    }
  }
}

TEST_F(EffectorTest, ThePlayerJudgesLevels) {
  for (const int judged : {INT_MIN, -13, -12, 12, 13, INT_MAX}) {
    const result expected = judged == 12 || judged == -12 ? E_SUCCESS : E_INVALID_ARG;
    EXPECT_EQ(effector->SetEffectLevel(AUDIO_EFFECT_BASS, judged), expected) << judged;
    EXPECT_EQ(Host::TakeCalls(),
              Lines{"player_audio_effect_set_value(1, " + std::to_string(judged) + ")"});
  }
}

TEST_F(EffectorTest, ResetClearsTheEffectsInOrderThenSelectsTheNeutralPreset) {
  effector->SetEffectLevel(AUDIO_EFFECT_BASS, 12);
  Host::TakeCalls();
  Lines steps;
  for (unsigned i = 1; i <= 5; ++i) {
    Host::FailCall("player_audio_effect_clear", -38, i);
    EXPECT_EQ(effector->ResetAllToDefault(), E_INVALID_ARG);
    steps.push_back("player_audio_effect_clear(" + std::to_string(i) + ")");
    EXPECT_EQ(Host::TakeCalls(), steps);
  }
  steps.push_back("player_audio_effect_set_preset(1)");
  EXPECT_EQ(effector->ResetAllToDefault(), E_SUCCESS);
  EXPECT_EQ(Host::TakeCalls(), steps);
  EXPECT_EQ(effector->GetEffectLevel(AUDIO_EFFECT_BASS, low), E_SUCCESS);
  EXPECT_EQ(low, 0);
}

TEST_F(EffectorTest, ListHoldsTheKnownValuesInThePlayersOrderAndIsNullWhenThePlayerFails) {
  for (const Kind* kind : {&kEffects, &kPresets}) {
    SCOPED_TRACE(kind->enumeration);
    const auto listOf = [kind](const Values& reported, int error) {
      Simulated::Effects effects;
      effects.*(kind->reported) = reported;
      effects.enumerationError = error;
      Simulated::SetEffects(effects);
      SetLastResult(kUntouched);
      return kind->get(*effector);
    };
    Values reported = kind->UnknownValues(), known;
    reported.insert(reported.end(), kind->numbers.begin(), kind->numbers.end());
    reported.push_back(kind->numbers.front());  // again
    for (int value = kind->lowest; value < kind->End(); ++value) known.push_back(value);
    known.push_back(kind->lowest);
    log.Take();
    EXPECT_EQ(listOf(reported, 0), known);
    EXPECT_EQ(log.Take().size(), 4u);  // one for each that isn't known
    EXPECT_EQ(listOf({}, 0), Values());
    EXPECT_EQ(GetLastResult(), kUntouched);
    EXPECT_EQ(listOf({1, 2}, -22), std::nullopt);
    EXPECT_EQ(GetLastResult(), E_INVALID_ARG);
  }
}

}  // namespace
