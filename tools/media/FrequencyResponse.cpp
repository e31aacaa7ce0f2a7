#include "FrequencyResponse.h"

#include "base/Failure.h"

#include <fftw3.h>

#include <algorithm>
#include <cmath>
#include <memory>
#include <random>
#include <type_traits>

namespace CommandLine {
namespace {

constexpr int kSeconds = 20;     // of the noise
constexpr double kLevel = 0.05;  // root mean square of the noise: -26 dB below full scale

constexpr int kWindow = 1 << 16;      // in samples; resolves 0.7 Hz
constexpr int kSkipped = kSoundRate;  // while filters settle

constexpr double kLowest = 20, kHighest = 20000;  // in Hz
constexpr int kPointsAnOctave = 24;
constexpr double kSmoothing = 1.0 / 6;  // in octaves

/// Sums up the power spectra of overlapping windows.
class Spectrum {
 public:
  /// \param rate in samples a second
  explicit Spectrum(int rate)
      : rate_(rate),
        input_(fftw_alloc_real(kWindow)),
        output_(fftw_alloc_complex(kWindow / 2 + 1)),
        plan_(fftw_plan_dft_r2c_1d(kWindow, input_.get(), output_.get(), FFTW_ESTIMATE)),
        powers_(kWindow / 2 + 1) {}

  /// \param samples of one channel
  void Add(const std::vector<double>& samples) {
    for (std::size_t begin = kSkipped; begin + kWindow <= samples.size(); begin += kWindow / 2) {
      for (std::size_t i = 0; i < kWindow; ++i) {
        const double hann = 0.5 - 0.5 * std::cos(2 * M_PI * double(i) / kWindow);
        input_.get()[i] = samples[begin + i] * hann;
      }
      fftw_execute(plan_.get());
      for (std::size_t i = 0; i < powers_.size(); ++i) {
        const auto& bin = output_.get()[i];
        powers_[i] += bin[0] * bin[0] + bin[1] * bin[1];
      }
    }
  }

  /// \return the power in a band around a frequency in Hz.
  double PowerAround(double frequency) const {
    const double half = std::exp2(kSmoothing / 2);
    const auto begin = static_cast<std::size_t>(std::lround(frequency / half * kWindow / rate_));
    const auto end = static_cast<std::size_t>(std::lround(frequency * half * kWindow / rate_)) + 1;
    double power = 0;
    for (std::size_t i = begin; i < std::min(end, powers_.size()); ++i) power += powers_[i];
    return power;
  }

 private:
  struct Free {
    void operator()(void* memory) const { fftw_free(memory); }
    void operator()(fftw_plan plan) const { fftw_destroy_plan(plan); }
  };

  const double rate_;
  std::unique_ptr<double, Free> input_;
  std::unique_ptr<fftw_complex, Free> output_;
  std::unique_ptr<std::remove_pointer_t<fftw_plan>, Free> plan_;
  std::vector<double> powers_;
};

Spectrum SpectrumOf(const StereoSound& recording) {
  if (recording.left.size() < kSkipped + kWindow)
    throw Failure("the player wrote too little sound");
  Spectrum spectrum(recording.rate);
  spectrum.Add(recording.left);
  spectrum.Add(recording.right);
  return spectrum;
}

}  // namespace

StereoSound MakeNoise() {
  std::mt19937 generator;  // seeded always the same
  std::normal_distribution<double> distribution(0, kLevel);
  StereoSound noise;
  for (int i = 0; i < kSoundRate * kSeconds; ++i) {
    noise.left.push_back(distribution(generator));
    noise.right.push_back(distribution(generator));
  }
  return noise;
}

FrequencyResponse CompareRecordings(const StereoSound& neutral, const StereoSound& changed) {
  const Spectrum before = SpectrumOf(neutral);
  const Spectrum after = SpectrumOf(changed);
  const int points = static_cast<int>(std::log2(kHighest / kLowest) * kPointsAnOctave);
  FrequencyResponse response;
  for (int i = 0; i <= points; ++i) {
    const double frequency = kLowest * std::pow(kHighest / kLowest, double(i) / points);
    const double ratio = after.PowerAround(frequency) / before.PowerAround(frequency);
    response.push_back({frequency, 10 * std::log10(ratio)});
  }
  return response;
}

}  // namespace CommandLine
