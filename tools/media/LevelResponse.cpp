#include "LevelResponse.h"

#include "base/Failure.h"

#include <algorithm>
#include <cmath>
#include <random>

namespace CommandLine {
namespace {

constexpr double kSoftest = -60;  // in dB of full scale
constexpr double kStep = 2;       // in dB
constexpr int kSteps = 31;
constexpr std::size_t kStepLength = kSoundRate / 2;  // in samples; the first half settles
constexpr double kFrequency = 1000;

constexpr std::size_t kBurst = kSoundRate / 2;
constexpr std::size_t kSilence = std::size_t{kSoundRate} * 3;
constexpr std::size_t kWindow = kSoundRate / 50;  // of the decay
constexpr double kBurstLevel = 0.1;               // root mean square
constexpr double kNothing = 1e-12;                // a power far below what 16 bits hold

/// Of both sides, in a part of a recording.
double Power(const StereoSound& recording, std::size_t begin, std::size_t length) {
  if (begin + length > recording.left.size()) throw Failure("the player wrote too little sound");
  double power = 0;
  for (std::size_t i = begin; i < begin + length; ++i) {
    power += recording.left[i] * recording.left[i] + recording.right[i] * recording.right[i];
  }
  return std::max(power / double(2 * length), kNothing);
}

}  // namespace

StereoSound MakeStairs() {
  StereoSound stairs;
  for (std::size_t i = 0; i < kSteps * kStepLength; ++i) {
    const std::size_t step = i / kStepLength;
    const double level = kSoftest + kStep * double(step);
    stairs.left.push_back(std::pow(10, level / 20) *
                          std::sin(2 * M_PI * kFrequency * double(i) / kSoundRate));
  }
  stairs.right = stairs.left;
  return stairs;
}

std::vector<LevelPoint> MeasureStairs(const StereoSound& recording) {
  std::vector<LevelPoint> points;
  for (std::size_t step = 0; step < kSteps; ++step) {
    const double power =
        Power(recording, step * kStepLength + kStepLength / 2, kStepLength / 2 - kWindow);
    points.push_back({kSoftest + kStep * double(step), 10 * std::log10(2 * power)});
  }
  return points;
}

StereoSound MakeBurst() {
  StereoSound burst;
  std::mt19937 generator;  // seeded always the same
  std::normal_distribution<double> distribution(0, kBurstLevel);
  for (std::size_t i = 0; i < kBurst; ++i) {
    burst.left.push_back(distribution(generator));
    burst.right.push_back(distribution(generator));
  }
  burst.left.resize(kBurst + kSilence);
  burst.right.resize(kBurst + kSilence);
  return burst;
}

std::vector<DecayPoint> MeasureDecay(const StereoSound& recording) {
  const double sound = Power(recording, kBurst / 2, kBurst / 2);
  std::vector<DecayPoint> points;
  for (std::size_t begin = kBurst - 5 * kWindow; begin < kBurst + kSilence; begin += kWindow) {
    const double time = (double(begin) + kWindow / 2.0 - double(kBurst)) / kSoundRate;
    points.push_back({time, 10 * std::log10(Power(recording, begin, kWindow) / sound)});
  }
  return points;
}

}  // namespace CommandLine
