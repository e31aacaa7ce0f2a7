#include "support/Operations.h"

#include <climits>

namespace Zelkora::Media {
namespace {

using Values = std::vector<int>;

constexpr char kFeature[] = "audio_effector";
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
  std::string Call() const { return enumeration + "()"; }
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

/// An operation on one effect or preset.
struct ValueOperation {
  std::string name, function;  // ours, the player's
  const Kind& kind;
  bool takesLevel = false;

  result Perform(int value) const {
    effect = AudioEffectType(value);
    preset = AudioEffectPreset(value);
    return kOperations.at("AudioEffector::" + name)().Result();
  }
  std::string Call(int number) const {
    const std::string set = takesLevel ? ", " + std::to_string(level) : "";
    return function + "(" + std::to_string(number) + set + ")";
  }
};
const ValueOperation kValueOperations[] = {
    {"SetEffectLevel", "player_audio_effect_set_value", kEffects, true},
    {"GetEffectLevel", "player_audio_effect_get_value", kEffects},
    {"GetEffectLevelRange", "player_audio_effect_get_value_range", kEffects},
    {"SetEffectPreset", "player_audio_effect_set_preset", kPresets},
};

class EffectorTest : public LibraryTest {
 protected:
  EffectorTest() {
    Prepare("SetEffectLevel");
    Forget();
  }
};

TEST_F(EffectorTest, FeatureIsAskedForFirstAndASecondConstructChangesNothing) {
  Tizen::Media::Player neverConstructed;
  Host::SetFeature(kFeature, Host::kFeatureAbsent);
  EXPECT_EQ(effector->Construct(neverConstructed), E_UNSUPPORTED_OPERATION);
  Host::SetFeature(kFeature, E_SUCCESS);
  EXPECT_EQ(effector->Construct(neverConstructed), E_INVALID_STATE);
  EXPECT_EQ(Host::TakeCalls(), (Lines{kEffectorQuery, kEffectorQuery}));
  EXPECT_EQ(effector->ResetAllToDefault(), E_SUCCESS);
}

TEST_F(EffectorTest, PlayerIsSupportedWithAnyKnownEffectOrPreset) {
  const struct {
    Simulated::Effects effects;
    const Kind* refused;
    result expected;
  } rows[] = {{{{3}, {}}, nullptr, E_SUCCESS},
              {{{}, {1}}, nullptr, E_SUCCESS},
              {{{6}, {20}}, nullptr, E_UNSUPPORTED_OPERATION},
              {{{1}, {}}, &kEffects, E_UNSUPPORTED_OPERATION},
              {{{1}, {1}}, &kPresets, E_SUCCESS}};
  for (const auto& row : rows) {
    AudioEffector another;
    Simulated::SetEffects(row.effects);
    if (row.refused != nullptr) Host::FailCall(row.refused->enumeration.c_str(), -1, 1);
    Forget();
    EXPECT_EQ(another.Construct(*player), row.expected);
    EXPECT_EQ(GetLastResult(), row.expected);
    EXPECT_EQ(Host::TakeCalls(), (Lines{kEffectorQuery, "_PlayerImpl::GetInstance()",
                                        kEffects.Call(), kPresets.Call()}));
  }
}

TEST_F(EffectorTest, KnownValuesAloneReachThePlayerUnderItsNumbers) {
  for (const ValueOperation& operation : kValueOperations) {
    SCOPED_TRACE(operation.function);
    const Kind& kind = operation.kind;
    for (int value = kind.lowest; value < kind.End(); ++value) {
      level = value;
      low = high = 0;
      EXPECT_EQ(operation.Perform(value), E_SUCCESS);
      EXPECT_EQ(GetLastResult(), E_SUCCESS);
      EXPECT_EQ(Host::TakeCalls(),
                Lines{operation.Call(kind.numbers[std::size_t(value - kind.lowest)])});
      const bool isRange = operation.name == "GetEffectLevelRange";
      const bool isGet = operation.name == "GetEffectLevel";
      EXPECT_EQ(low, isRange ? (value < 3 ? -12 : 0) : isGet ? value : 0);
      EXPECT_EQ(high, isRange ? (value < 3 ? 12 : 100) : 0);
    }
    low = 9;
    for (const int value : kind.UnknownValues()) {
      EXPECT_EQ(operation.Perform(value), E_INVALID_ARG);
      EXPECT_EQ(Host::TakeCalls(), Lines());
      EXPECT_EQ(low, 9);
    }
  }
  level = INT_MIN;  // the player judges levels
  EXPECT_EQ(kValueOperations[0].Perform(2), E_INVALID_ARG);
  EXPECT_EQ(Host::TakeCalls(), Lines{kValueOperations[0].Call(2)});
}

TEST_F(EffectorTest, ResetClearsTheEffectsInOrderThenSelectsTheNeutralPreset) {
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
}

TEST_F(EffectorTest, ListHoldsTheKnownValuesInThePlayersOrderAndIsNullWhenThePlayerFails) {
  for (const Kind* kind : {&kEffects, &kPresets}) {
    SCOPED_TRACE(kind->enumeration);
    log.Take();
    Simulated::Effects effects;
    Values& reported = effects.*(kind->reported);
    reported = kind->UnknownValues();
    reported.insert(reported.end(), kind->numbers.begin(), kind->numbers.end());
    reported.push_back(kind->numbers.front());  // again
    Values known;
    for (int value = kind->lowest; value < kind->End(); ++value) known.push_back(value);
    known.push_back(kind->lowest);
    Simulated::SetEffects(effects);
    EXPECT_EQ(kind->get(*effector), known);
    EXPECT_EQ(log.Take().size(), 4u);  // one for each that isn't known

    SetLastResult(kUntouched);
    reported = {};
    Simulated::SetEffects(effects);
    EXPECT_EQ(kind->get(*effector), Values());
    EXPECT_EQ(GetLastResult(), kUntouched);

    reported = {1, 2};
    effects.enumerationError = -22;
    Simulated::SetEffects(effects);
    EXPECT_EQ(kind->get(*effector), std::nullopt);
    EXPECT_EQ(GetLastResult(), E_INVALID_ARG);
  }
}

}  // namespace
}  // namespace Zelkora::Media
