// Measures changes of a sound whose effect is known.

#include "base/TemporaryFolder.h"
#include "media/FrequencyResponse.h"
#include "media/LevelResponse.h"

#include <gtest/gtest.h>

#include <cmath>
#include <vector>

namespace {

using namespace CommandLine;

TEST(FrequencyResponse, OfHalfTheSampleBeforeAddedFallsWithTheFrequency) {
  const TemporaryFolder folder;
  const StereoSound noise = MakeNoise();
  WriteStereoSound(folder.PathOf("noise.wav"), noise);
  StereoSound changed = ReadStereoSound(folder.PathOf("noise.wav"));
  for (auto* side : {&changed.left, &changed.right}) {
    for (std::size_t i = side->size() - 1; i >= 1; --i) (*side)[i] += (*side)[i - 1] / 2;
  }
  const auto response = CompareRecordings(noise, changed);
  EXPECT_NEAR(response.front().frequency, 20, 0.1);
  EXPECT_NEAR(response.back().frequency, 20000, 0.1);
  for (const auto& [frequency, gain] : response) {
    const double expected = 10 * std::log10(1.25 + std::cos(2 * M_PI * frequency / changed.rate));
    EXPECT_NEAR(gain, expected, 0.1) << frequency << " Hz";
  }
}

TEST(LevelResponse, TellsASquareRootAndATailOfTwentyDecibelsASecond) {
  StereoSound stairs = MakeStairs(), burst = MakeBurst();
  for (auto* side : {&stairs.left, &stairs.right}) {
    for (double& sample : *side) sample = std::copysign(std::sqrt(std::fabs(sample)), sample);
  }
  // A squared sine's mean is a half, that of its root's square 2 / pi.
  const double offset = 10 * std::log10(4 / M_PI);
  for (const auto& [input, output] : MeasureStairs(stairs)) {
    EXPECT_NEAR(output, input / 2 + offset, 0.1) << input;
  }
  const std::size_t end = std::size_t(burst.rate) / 2;
  for (std::size_t i = end; i < burst.left.size(); ++i) {
    const double level = 0.1 * std::pow(10, -double(i - end) / burst.rate);
    burst.left[i] = burst.right[i] = level;
  }
  for (const auto& [time, level] : MeasureDecay(burst)) {
    EXPECT_NEAR(level, time < 0 ? 0 : -20 * time, 0.5) << time;
  }
}

}  // namespace
