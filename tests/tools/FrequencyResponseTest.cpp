// Measures a change of the noise whose response is known.

#include "FrequencyResponse.h"
#include "TemporaryFolder.h"

#include <gtest/gtest.h>
#include <sndfile.hh>

#include <cmath>
#include <vector>

namespace {

constexpr int kRate = 48000;  // of the noise

TEST(FrequencyResponse, OfHalfTheSampleBeforeAddedFallsWithTheFrequency) {
  const CommandLine::TemporaryFolder folder;
  const std::string noise = folder.PathOf("noise.wav"), changed = folder.PathOf("changed.wav");
  CommandLine::WriteNoise(noise);
  SndfileHandle in(noise);
  EXPECT_EQ(in.samplerate(), kRate);
  std::vector<double> samples(std::size_t(in.frames() * in.channels()));
  in.readf(samples.data(), in.frames());
  for (std::size_t i = samples.size() - 1; i >= 2; --i) samples[i] += samples[i - 2] / 2;
  SndfileHandle(changed, SFM_WRITE, in.format(), in.channels(), kRate)
      .write(samples.data(), sf_count_t(samples.size()));
  const auto response = CommandLine::CompareRecordings(noise, changed);
  EXPECT_NEAR(response.front().frequency, 20, 0.1);
  EXPECT_NEAR(response.back().frequency, 20000, 0.1);
  for (const auto& [frequency, gain] : response) {
    const double expected = 10 * std::log10(1.25 + std::cos(2 * M_PI * frequency / kRate));
    EXPECT_NEAR(gain, expected, 0.1) << frequency << " Hz";
  }
}

}  // namespace
