// Changes of the effects while sound goes through them, heard at the end of the chain that is in
// every player's pipeline. It runs alone here, without a clock, a change a buffer.

#include "GstreamerEnd.h"
#include "desktop/player/effects/Chain.h"

#include <gst/check/gstharness.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <memory>
#include <random>
#include <string>
#include <utility>
#include <vector>

namespace {

using namespace Desktop;

constexpr double kAmplitude = 0.75;
constexpr double kFrequency = 440;
constexpr double kFarBelow = 0.1;  // 20 dB

/// A chain that stereo sound goes through, on the test's thread.
class Listening {
 public:
  explicit Listening(const SharedSettings& settings, int rate = 48000)
      : rate_(rate),
        chain_(settings),
        harness_(gst_harness_new_with_element(chain_.GetElement(), "sink", "src")) {
    const std::string format =
        "audio/x-raw, format=(string)F32LE, layout=(string)interleaved, channels=(int)2, "
        "rate=(int)" +
        std::to_string(rate);
    gst_harness_set_src_caps_str(harness_.get(), format.c_str());
  }

  /// Sends a buffer of sound that begins at a frame, and takes what comes out.
  void Send(const std::vector<float>& samples, std::size_t begin) {
    GstBuffer* buffer = gst_buffer_new_memdup(samples.data(), samples.size() * sizeof(float));
    GST_BUFFER_PTS(buffer) = TimeOf(begin);
    ASSERT_EQ(gst_harness_push(harness_.get(), buffer), GST_FLOW_OK);
    TakeAll();
  }

  void SendTone(int frames) {
    std::vector<float> samples;
    for (int i = 0; i < frames; ++i) {
      const double value = kAmplitude * std::sin(2 * M_PI * kFrequency * double(sent_ + i) / rate_);
      samples.insert(samples.end(), 2, static_cast<float>(value));
    }
    Send(samples, sent_);
    sent_ += static_cast<std::size_t>(frames);
  }

  void SendEvent(GstEvent* event) {
    gst_harness_push_event(harness_.get(), event);
    TakeAll();
  }

  GstClockTime AskForLatency() const { return gst_harness_query_latency(harness_.get()); }

  GstClockTime TimeOf(std::size_t frame) const {
    return gst_util_uint64_scale_int_round(frame, GST_SECOND, rate_);
  }

  std::vector<float> heard;
  std::vector<std::pair<GstClockTime, std::size_t>> times;  // of the frames with that number

 private:
  void TakeAll() {
    while (GstBuffer* buffer = gst_harness_try_pull(harness_.get())) {
      times.emplace_back(GST_BUFFER_PTS(buffer), heard.size() / 2);
      const std::size_t before = heard.size(), size = gst_buffer_get_size(buffer);
      heard.resize(before + size / sizeof(float));
      gst_buffer_extract(buffer, 0, &heard[before], size);
      gst_buffer_unref(buffer);
    }
  }

  const int rate_;
  EffectChain chain_;
  std::unique_ptr<GstHarness, FreeWith<gst_harness_teardown>> harness_;
  std::size_t sent_ = 0;
};

/// \return the height of the highest step. The third difference, halved, is a step's height, and
/// next to nothing for a tone of 440 Hz.
double LoudestClick(const std::vector<float>& samples) {
  double loudest = 0;
  for (std::size_t i = 6; i < samples.size(); i += 2) {
    const double difference = samples[i] - samples[i - 6] - 3 * (samples[i - 2] - samples[i - 4]);
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
class EffectClicks : public testing::TestWithParam<int> {
 protected:
  static void SetUpTestSuite() { gst_init(nullptr, nullptr); }

  SharedSettings settings;
};

TEST_P(EffectClicks, ThousandChangesStayFarBelowTheSound) {
  Listening tone(settings);
  std::mt19937 random(1);
  for (int change = 0; change < 1000; ++change) {
    ASSERT_NO_FATAL_FAILURE(tone.SendTone(GetParam()));
    ChangeSomething(&settings, &random);
  }
  const double loudest = *std::max_element(tone.heard.begin(), tone.heard.end());
  EXPECT_GT(loudest, kAmplitude * 1.2) << "nothing was changed";
  EXPECT_LT(loudest, 0.99) << "nothing was limited";
  EXPECT_LT(LoudestClick(tone.heard), kAmplitude * kFarBelow);
}

TEST_P(EffectClicks, FirstChangeFromRestStaysFarBelowTheSound) {
  Listening tone(settings);
  for (int buffer = 0; buffer < 400; ++buffer) {
    ASSERT_NO_FATAL_FAILURE(tone.SendTone(GetParam()));
    settings.SetLevel(kTreble, buffer / 100 % 2 == 0 ? 0 : 12);
  }
  EXPECT_LT(LoudestClick(tone.heard), kAmplitude * kFarBelow / 4);
}

INSTANTIATE_TEST_SUITE_P(BuffersOf, EffectClicks, testing::Values(256, 1024, 4096),
                         testing::PrintToStringParamName());

/// At so many frames a second.
class EffectsAtRest : public EffectClicks {};

TEST_P(EffectsAtRest, EverySampleComesOutAtItsTimeBehindTheSameDelay) {
  Listening listening(settings, GetParam());
  std::mt19937 random(1);
  std::vector<float> sent;
  std::size_t begin = 0;
  const auto send = [&](std::size_t frames) {
    std::vector<float> samples(2 * frames);
    for (float& sample : samples) {  // also above full scale
      sample = std::uniform_real_distribution<float>(-1.5, 1.5)(random);
    }
    ASSERT_NO_FATAL_FAILURE(listening.Send(samples, begin));
    sent.insert(sent.end(), samples.begin(), samples.end());
    begin += frames;
  };
  const auto expectAllAsSent = [&](std::size_t first) {
    EXPECT_EQ(listening.heard, sent);
    for (const auto& [time, frame] : listening.times) {
      EXPECT_NEAR(double(time), double(listening.TimeOf(first + frame)), 2) << frame;
    }
  };
  for (const std::size_t frames : {1, 10, 3000, 7, 4096, 100}) send(frames);
  const GstClockTime latency = listening.AskForLatency();
  EXPECT_NEAR(double(latency), 5e6, 2e5);
  listening.SendEvent(gst_event_new_eos());
  expectAllAsSent(0);

  // A seek drops what is on its way.
  listening.SendEvent(gst_event_new_flush_start());
  listening.SendEvent(gst_event_new_flush_stop(TRUE));
  GstSegment segment;
  gst_segment_init(&segment, GST_FORMAT_TIME);
  listening.SendEvent(gst_event_new_segment(&segment));
  send(5000);
  listening.SendEvent(gst_event_new_flush_start());
  listening.SendEvent(gst_event_new_flush_stop(TRUE));
  listening.SendEvent(gst_event_new_segment(&segment));
  for (auto* past : {&sent, &listening.heard}) past->clear();
  listening.times.clear();
  const std::size_t first = begin = 1000000;
  for (int i = 0; i < 10; ++i) send(1000);
  listening.SendEvent(gst_event_new_segment(&segment));
  expectAllAsSent(first);

  // At work, and at rest again.
  settings.SetLevel(kBass, 12);
  for (int i = 0; i < 100; ++i) send(1000);
  EXPECT_EQ(listening.AskForLatency(), latency);
  EXPECT_NE(listening.heard, sent);
  settings.SetLevel(kBass, 0);
  for (int i = 0; i < 100; ++i) send(1000);
  sent.clear();
  listening.heard.clear();
  for (int i = 0; i < 100; ++i) send(1000);
  EXPECT_EQ(listening.AskForLatency(), latency);
  const std::size_t late = 2 * static_cast<std::size_t>(0.005 * GetParam());
  EXPECT_TRUE(std::equal(sent.begin(), sent.end() - std::ptrdiff_t(late),
                         listening.heard.begin() + std::ptrdiff_t(late)));
}

INSTANTIATE_TEST_SUITE_P(At, EffectsAtRest, testing::Values(8000, 11025, 48000, 192000),
                         testing::PrintToStringParamName());

}  // namespace
