#include "EffectorTest.h"

#include <memory>
#include <optional>

namespace {

using testing::Optional;
using Tizen::Base::Collection::IListT;
using Zelkora::Media::AudioEffector;
using Zelkora::Media::AudioEffectPreset;
using Zelkora::Media::AudioEffectType;

using Values = std::vector<int>;

/// Gets a list twice, the \p nth allocation of the first time failing (0: none).
/// \return what the first holds after the second is gone; nothing when it is null
template <typename T, auto operation>
std::optional<Values> Get(const AudioEffector& effector, std::size_t nth) {
  std::unique_ptr<IListT<T>> list;
  {
    FailingAllocation failing(nth);
    list.reset((effector.*operation)());
  }
  if (list == nullptr) return std::nullopt;
  const std::unique_ptr<IListT<T>> another((effector.*operation)());
  EXPECT_NE(list, another);
  another->RemoveAll();
  Values values;
  for (T value; list->GetAt(static_cast<int>(values.size()), value) == E_SUCCESS;) {
    values.push_back(value);
  }
  return values;
}

struct SupportedList {
  ListTexts texts;
  Values Simulated::Effects::*reported;
  std::optional<Values> (*get)(const AudioEffector&, std::size_t nth);
  std::vector<std::pair<Values, Values>> reports;  // what the player reports, what the list holds
};

void PrintTo(const SupportedList& list, std::ostream* stream) { *stream << list.texts.operation; }

const SupportedList kLists[] = {
    {kEffects,
     &Simulated::Effects::effects,
     Get<AudioEffectType, &AudioEffector::GetSupportedEffectListN>,
     {{{}, {}},
      {{2, 7, 4}, {2, 4}},
      {{5, 3, 5, 1, 5}, {5, 3, 5, 1, 5}},
      {{INT_MIN, -1, 0, 1, 2, 3, 4, 5, 6, INT_MAX}, {1, 2, 3, 4, 5}}}},
    {kPresets,
     &Simulated::Effects::presets,
     Get<AudioEffectPreset, &AudioEffector::GetSupportedEffectPresetListN>,
     {{{}, {}},
      {{0, 1, 10}, {1, 0, 15}},
      {{19, 0, 19, 2}, {19, 1, 19, 2}},
      {{INT_MIN, -1, 0,  1,  2,  3,  4,  5,  6,  7,  8,  9,
        10,      11, 12, 13, 14, 15, 16, 17, 18, 19, 20, INT_MAX},
       {1, 0, 2, 3, 4, 5, 6, 7, 8, 9, 15, 10, 11, 12, 13, 14, 16, 17, 18, 19}}}},
};

class EffectList : public EffectorTest, public testing::WithParamInterface<SupportedList> {
 protected:
  EffectList() { Construct(); }

  static void SetReported(const Values& values, int enumerationError = 0) {
    Simulated::Effects effects;
    effects.*GetParam().reported = values;
    effects.enumerationError = enumerationError;
    Simulated::SetEffects(effects);
  }

  std::optional<Values> Get(std::size_t nth = 0) { return GetParam().get(effector, nth); }

  const ListTexts& texts = GetParam().texts;
};

INSTANTIATE_TEST_SUITE_P(, EffectList, testing::ValuesIn(kLists),
                         [](const auto& list) { return list.param.texts.type; });

TEST_P(EffectList, HoldsTheKnownValuesInThePlayersOrderAndReportsEachUnknownOne) {
  for (const auto& [reported, expected] : GetParam().reports) {
    SCOPED_TRACE(testing::PrintToString(reported));
    SetReported(reported);
    EXPECT_THAT(Get(), Optional(expected));
    const std::size_t unknown = 2 * (reported.size() - expected.size());
    ExpectLeft(unknown > 0 ? E_INVALID_ARG : kUntouched, Lines(unknown, texts.Unknown()),
               {texts.Call(), texts.Call()});
  }
}

TEST_P(EffectList, IsNullWhenThePlayerFailsAfterItReportedValues) {
  for (const auto& [code, expected] : {std::pair{-22, E_INVALID_ARG}, std::pair{5, E_SYSTEM}}) {
    SetReported({1, 2}, code);
    EXPECT_EQ(Get(), std::nullopt);
    ExpectLeft(expected, {texts.Failure(expected)}, {texts.Call()});
  }
}

TEST_P(EffectList, IsNullWithoutMemoryForItAndLacksWhatItCouldNotTakeIn) {
  SetReported({2, 3});
  Host::RecordCalls(false);  // the record would allocate
  EXPECT_THAT(Get(2), Optional(Values{3}));
  EXPECT_THAT(Get(3), Optional(Values{2}));
  EXPECT_THAT(Get(4), Optional(Values{2, 3}));
  ExpectLeft(kUntouched, {}, {});
  EXPECT_EQ(Get(1), std::nullopt);
  ExpectLeft(E_OUT_OF_MEMORY, {texts.NoMemory()}, {});
}

}  // namespace
