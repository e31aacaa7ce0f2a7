// Measures changes of the noise whose response is known.

#include "FrequencyResponse.h"
#include "TemporaryFolder.h"

#include <gtest/gtest.h>
#include <sndfile.hh>

#include <cmath>
#include <functional>

namespace {

using CommandLine::FrequencyResponse;

constexpr int kRate = 48000;  // of the noise

/// \param change makes a sample from itself and the one before on the same side
FrequencyResponse Measure(const std::function<double(double, double)>& change) {
  const CommandLine::TemporaryFolder folder;
  const std::string noise = folder.PathOf("noise.wav"), changed = folder.PathOf("changed.wav");
  CommandLine::WriteNoise(noise);
  SndfileHandle in(noise);
  EXPECT_EQ(in.samplerate(), kRate);
  std::vector<double> samples(std::size_t(in.frames() * in.channels()));
  in.readf(samples.data(), in.frames());
  for (std::size_t i = samples.size() - 1; i >= 2; --i) {
    samples[i] = change(samples[i], samples[i - 2]);
  }
  SndfileHandle(changed, SFM_WRITE, in.format(), in.channels(), kRate)
      .write(samples.data(), sf_count_t(samples.size()));
  return CommandLine::CompareRecordings(noise, changed);
}

TEST(FrequencyResponse, OfTheNoiseItselfIsFlat) {
  const FrequencyResponse response = Measure([](double now, double) { return now; });
  EXPECT_NEAR(response.front().frequency, 20, 0.1);
  EXPECT_NEAR(response.back().frequency, 20000, 0.1);
  for (const auto& point : response) EXPECT_NEAR(point.gain, 0, 0.01) << point.frequency << " Hz";
}

TEST(FrequencyResponse, OfADifferenceRisesWithTheFrequency) {
  for (const auto& point : Measure([](double now, double before) { return now - before; })) {
    if (point.frequency < 500) continue;  // too quiet for 16 bits
    const double expected = 20 * std::log10(2 * std::sin(M_PI * point.frequency / kRate));
    EXPECT_NEAR(point.gain, expected, 0.3) << point.frequency << " Hz";
  }
}

}  // namespace
