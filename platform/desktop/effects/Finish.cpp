#include "Finish.h"

#include <algorithm>
#include <cmath>

namespace Desktop {
namespace {

constexpr double kGlideSeconds = 0.02;
constexpr double kAttackSeconds = 0.005;
constexpr double kReleaseSeconds = 0.2;

/// A hair below full scale, within what counts as unchanged.
constexpr float kCeiling = 0.99F;

/// Levels in dB. The dynamics lower what is louder than the one and raise what is softer; below the
/// other they raise all alike.
constexpr float kUnchanged = -15;
constexpr float kThreshold = -30;

constexpr float kSilence = 1e-5F;
constexpr float kSettled = 1e-4F;

float ToDecibels(float amplitude) { return 6.0206F * std::log2(amplitude); }
float ToFactor(float decibels) { return std::exp2(decibels / 6.0206F); }

float ShareOfFrame(double seconds, int samplesPerSecond) {
  return static_cast<float>(1 - std::exp(-1 / (seconds * samplesPerSecond)));
}

bool IsNeutral(const Finish::Parameters& parameters) {
  constexpr Finish::Parameters kNeutral;
  return std::fabs(parameters.gain - kNeutral.gain) < kSettled &&
         std::fabs(parameters.sideGain - kNeutral.sideGain) < kSettled &&
         std::fabs(parameters.compression - kNeutral.compression) < kSettled;
}

void Approach(float& value, float target, float share) { value += (target - value) * share; }

}  // namespace

void Finish::SetRate(int samplesPerSecond) {
  glide_ = ShareOfFrame(kGlideSeconds, samplesPerSecond);
  attack_ = ShareOfFrame(kAttackSeconds, samplesPerSecond);
  release_ = ShareOfFrame(kReleaseSeconds, samplesPerSecond);
}

void Finish::MoveTo(const Parameters& target, bool mayBeLouder) {
  target_ = target;
  mayBeLouder_ = mayBeLouder;
  Settle();
}

void Finish::BeginAt(const Parameters& target, bool mayBeLouder) {
  now_ = target;
  envelope_ = 0;
  reduction_ = 1;
  MoveTo(target, mayBeLouder);
}

void Finish::Process(float* samples, std::size_t frames) {
  if (isResting_) return;
  for (float* frame = samples; frame != samples + 2 * frames; frame += 2) {
    Glide();
    const float mid = (frame[0] + frame[1]) / 2;
    const float side = (frame[0] - frame[1]) / 2 * now_.sideGain;
    const float peak = std::fabs(mid) + std::fabs(side);
    const float gain = now_.gain * Compress(peak);
    const float limited = gain * Limit(peak * gain);
    frame[0] = (mid + side) * limited;
    frame[1] = (mid - side) * limited;
  }
  Settle();
}

void Finish::Glide() {
  Approach(now_.gain, target_.gain, glide_);
  Approach(now_.sideGain, target_.sideGain, glide_);
  Approach(now_.compression, target_.compression, glide_);
}

/// Once the neutral values are as good as reached, the samples can be left alone.
void Finish::Settle() {
  isResting_ =
      !mayBeLouder_ && IsNeutral(target_) && IsNeutral(now_) && reduction_ > kCeiling - kSettled;
  if (isResting_) reduction_ = 1;
}

/// Follows the sound's level. \return the dynamics' factor
float Finish::Compress(float peak) {
  Approach(envelope_, peak, peak > envelope_ ? attack_ : release_);
  if (now_.compression < kSettled) return 1;
  const float level = ToDecibels(std::max(envelope_, kSilence));
  return ToFactor(now_.compression * (kUnchanged - std::max(level, kThreshold)));
}

/// Acts at once, so that nothing exceeds the ceiling, and recovers slowly.
/// \param peak of the frame as it would be. \return the limiter's factor
float Finish::Limit(float peak) {
  Approach(reduction_, 1, release_);
  if (peak * reduction_ > kCeiling) reduction_ = kCeiling / peak;
  return reduction_;
}

}  // namespace Desktop
