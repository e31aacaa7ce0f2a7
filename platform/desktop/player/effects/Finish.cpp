#include "Finish.h"

#include <algorithm>
#include <cmath>

namespace Desktop {
namespace {

constexpr double kGlideSeconds = 0.02;
constexpr double kAttackSeconds = 0.005;
constexpr double kReleaseSeconds = 0.2;

/// In dB. The dynamics lower what is louder than the unchanged level and raise what is softer;
/// below the threshold they raise everything alike.
constexpr float kUnchanged = -15;
constexpr float kThreshold = -30;

constexpr float kSilence = 1e-5F;
constexpr float kSettled = 1e-4F;

float ToDecibels(float amplitude) { return 6.0206F * std::log2(amplitude); }
float ToFactor(float decibels) { return std::exp2(decibels / 6.0206F); }

float SmoothingCoefficient(double seconds, int samplesPerSecond) {
  return static_cast<float>(1 - std::exp(-1 / (seconds * samplesPerSecond)));
}

bool IsNeutral(const Finish::Parameters& parameters) {
  constexpr Finish::Parameters kNeutral;
  return std::fabs(parameters.gain - kNeutral.gain) < kSettled &&
         std::fabs(parameters.sideGain - kNeutral.sideGain) < kSettled &&
         std::fabs(parameters.compression - kNeutral.compression) < kSettled;
}

void Approach(float& value, float target, float coefficient) {
  value += (target - value) * coefficient;
}

}  // namespace

void Finish::SetRate(int samplesPerSecond) {
  glide_ = SmoothingCoefficient(kGlideSeconds, samplesPerSecond);
  attack_ = SmoothingCoefficient(kAttackSeconds, samplesPerSecond);
  release_ = SmoothingCoefficient(kReleaseSeconds, samplesPerSecond);
}

void Finish::MoveTo(const Parameters& target) {
  target_ = target;
  Settle();
}

void Finish::BeginAt(const Parameters& target) {
  now_ = target;
  envelope_ = 0;
  MoveTo(target);
}

void Finish::Process(float* samples, std::size_t frames) {
  if (isResting_) return;
  for (float* frame = samples; frame != samples + 2 * frames; frame += 2) {
    Glide();
    const float mid = (frame[0] + frame[1]) / 2;
    const float side = (frame[0] - frame[1]) / 2 * now_.sideGain;
    const float gain = now_.gain * Compress(std::fabs(mid) + std::fabs(side));
    frame[0] = (mid + side) * gain;
    frame[1] = (mid - side) * gain;
  }
  Settle();
}

void Finish::Glide() {
  Approach(now_.gain, target_.gain, glide_);
  Approach(now_.sideGain, target_.sideGain, glide_);
  Approach(now_.compression, target_.compression, glide_);
}

/// Once the neutral values are as good as reached, the samples can be left alone.
void Finish::Settle() { isResting_ = IsNeutral(target_) && IsNeutral(now_); }

/// Follows the sound's level. \return the dynamics' factor
float Finish::Compress(float peak) {
  Approach(envelope_, peak, peak > envelope_ ? attack_ : release_);
  if (now_.compression < kSettled) return 1;
  const float level = ToDecibels(std::max(envelope_, kSilence));
  return ToFactor(now_.compression * (kUnchanged - std::max(level, kThreshold)));
}

}  // namespace Desktop
