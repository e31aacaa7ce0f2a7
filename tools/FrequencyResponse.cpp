#include "FrequencyResponse.h"

#include "Failure.h"

#include <fftw3.h>
#include <fmt/format.h>
#include <sndfile.h>

#include <algorithm>
#include <cmath>
#include <memory>
#include <random>
#include <type_traits>

namespace CommandLine {
namespace {

constexpr int kRate = 48000;  // of the noise, in samples a second
constexpr int kSeconds = 20;  // of the noise
constexpr int kChannels = 2;
constexpr double kLevel = 0.05;  // root mean square of the noise: -26 dB below full scale

constexpr int kWindow = 1 << 16;  // in samples; resolves 0.7 Hz
constexpr int kSkipped = kRate;   // while filters settle

constexpr double kLowest = 20, kHighest = 20000;  // in Hz
constexpr int kPointsAnOctave = 24;
constexpr double kSmoothing = 1.0 / 6;  // in octaves

struct FileCloser {
  void operator()(SNDFILE* file) const { sf_close(file); }
};
using SoundFile = std::unique_ptr<SNDFILE, FileCloser>;

SoundFile OpenSound(const std::string& path, int mode, SF_INFO& info) {
  SoundFile file(sf_open(path.c_str(), mode, &info));
  if (file == nullptr) throw Failure(fmt::format("cannot open {}: {}", path, sf_strerror(nullptr)));
  return file;
}

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

std::vector<double> Channel(const std::vector<double>& frames, int channels, int channel) {
  std::vector<double> samples;
  samples.reserve(frames.size() / std::size_t(channels));
  for (std::size_t i = std::size_t(channel); i < frames.size(); i += std::size_t(channels)) {
    samples.push_back(frames[i]);
  }
  return samples;
}

Spectrum SpectrumOf(const std::string& path) {
  SF_INFO info{};
  const SoundFile file = OpenSound(path, SFM_READ, info);
  if (info.frames < kSkipped + kWindow) throw Failure("the player wrote too little sound");
  std::vector<double> frames(static_cast<std::size_t>(info.frames * info.channels));
  sf_readf_double(file.get(), frames.data(), info.frames);
  Spectrum spectrum(info.samplerate);
  for (int channel = 0; channel < info.channels; ++channel) {
    spectrum.Add(Channel(frames, info.channels, channel));
  }
  return spectrum;
}

}  // namespace

void WriteNoise(const std::string& path) {
  SF_INFO info{};
  info.samplerate = kRate;
  info.channels = kChannels;
  info.format = SF_FORMAT_WAV | SF_FORMAT_PCM_16;
  const SoundFile file = OpenSound(path, SFM_WRITE, info);
  std::mt19937 generator;  // seeded always the same
  std::normal_distribution<double> distribution(0, kLevel);
  std::vector<double> frames(kRate * kSeconds * kChannels);
  for (double& sample : frames) sample = distribution(generator);
  if (sf_writef_double(file.get(), frames.data(), kRate * kSeconds) != kRate * kSeconds) {
    throw Failure(fmt::format("cannot write {}: {}", path, sf_strerror(file.get())));
  }
}

FrequencyResponse CompareRecordings(const std::string& neutral, const std::string& changed) {
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
