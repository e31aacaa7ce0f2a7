// Changes of the effects while sound goes through them, heard at the end of the chain that is in every
// player's pipeline. It runs alone here, without a clock, a change a buffer.

#include "../../platform/desktop/effects/Chain.h"

#include <gst/check/gstharness.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <memory>
#include <random>
#include <vector>

namespace {

using namespace Desktop;

constexpr double kAmplitude = 0.25;
constexpr double kFrequency = 440;
constexpr double kRate = 48000;
constexpr double kFarBelow = 0.1;  // 20 dB

/// A tone that goes through a chain, on the test's thread.
class Tone {
 public:
  explicit Tone(const SharedSettings& settings)
      : chain_(settings),
        harness_(gst_harness_new_with_element(chain_.GetElement(), "sink", "src")) {
    gst_harness_set_src_caps_str(harness_.get(),
                                 "audio/x-raw, format=(string)F32LE, layout=(string)interleaved, "
                                 "channels=(int)2, rate=(int)48000");
  }

  /// Sends a buffer of the tone and appends the left channel of what comes out.
  void Hear(int frames, std::vector<double>* samples) {
    std::vector<float> sent;
    for (int i = 0; i < frames; ++i) {
      const double value = kAmplitude * std::sin(2 * M_PI * kFrequency * sent_++ / kRate);
      sent.insert(sent.end(), 2, static_cast<float>(value));
    }
    const gsize size = sent.size() * sizeof(float);
    const std::unique_ptr<GstBuffer, FreeWith<gst_buffer_unref>> heard(
        gst_harness_push_and_pull(harness_.get(), gst_buffer_new_memdup(sent.data(), size)));
    ASSERT_EQ(gst_buffer_extract(heard.get(), 0, sent.data(), size), size);
    for (std::size_t i = 0; i < sent.size(); i += 2) samples->push_back(sent[i]);
  }

 private:
  EffectChain chain_;
  std::unique_ptr<GstHarness, FreeWith<gst_harness_teardown>> harness_;
  int sent_ = 0;
};

/// \return the height of the highest step. The third difference, halved, is a step's height, and next
/// to nothing for a tone of 440 Hz.
double LoudestClick(const std::vector<double>& samples) {
  double loudest = 0;
  for (std::size_t i = 3; i < samples.size(); ++i) {
    const double difference = samples[i] - 3 * samples[i - 1] + 3 * samples[i - 2] - samples[i - 3];
    loudest = std::max(loudest, std::fabs(difference) / 2);
  }
  return loudest;
}

/// Does one thing that a listener can do, as far from what was before as can be.
void ChangeSomething(SharedSettings* settings, std::mt19937* random) {
  const int what = static_cast<int>((*random)() % 6) + 1;
  if (!IsEffect(what)) {
    settings->SetPreset(static_cast<int>((*random)() % kPresets.size()));
    return;
  }
  const LevelRange range = kLevelRanges[static_cast<std::size_t>(what - kBass)];
  settings->SetLevel(what, std::array{range.min, range.max, kDefaultLevel}[(*random)() % 3]);
}

/// Of buffers of so many frames.
class EffectClicks : public testing::TestWithParam<int> {};

TEST_P(EffectClicks, ThousandChangesStayFarBelowTheSound) {
  SharedSettings settings;
  Tone tone(settings);
  std::mt19937 random(1);
  std::vector<double> heard;
  for (int change = 0; change < 1000; ++change) {
    ASSERT_NO_FATAL_FAILURE(tone.Hear(GetParam(), &heard));
    ChangeSomething(&settings, &random);
  }
  const double loudest = *std::max_element(heard.begin(), heard.end());
  EXPECT_GT(loudest, kAmplitude * 1.2) << "nothing was changed";
  EXPECT_LT(LoudestClick(heard), kAmplitude * kFarBelow);
}

TEST_P(EffectClicks, FirstChangeFromRestStaysFarBelowTheSound) {
  SharedSettings settings;
  Tone tone(settings);
  std::vector<double> heard;
  for (int buffer = 0; buffer < 400; ++buffer) {
    ASSERT_NO_FATAL_FAILURE(tone.Hear(GetParam(), &heard));
    settings.SetLevel(kTreble, buffer / 100 % 2 == 0 ? 0 : 12);
  }
  EXPECT_LT(LoudestClick(heard), kAmplitude * kFarBelow / 4);
}

INSTANTIATE_TEST_SUITE_P(BuffersOf, EffectClicks, testing::Values(256, 1024, 4096),
                         testing::PrintToStringParamName());

}  // namespace

int main(int count, char** arguments) {
  testing::InitGoogleTest(&count, arguments);
  gst_init(nullptr, nullptr);
  const int failed = RUN_ALL_TESTS();
  // Then GStreamer tells what was leaked, if it was asked to look.
  gst_deinit();
  return failed;
}
