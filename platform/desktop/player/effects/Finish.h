/// \file
#pragma once

#include <cstddef>

namespace Desktop {

/// Stereo width, dynamics and gain, on interleaved stereo samples, in place. Changes are spread
/// over some milliseconds, so that none is heard as a click. When it has nothing to do, the samples
/// stay as they are, bit by bit.
class Finish {
 public:
  /// The defaults leave the sound unchanged.
  struct Parameters {
    float gain = 1;         ///< a factor
    float sideGain = 1;     ///< a factor of the difference between left and right
    float compression = 0;  ///< how much of a change of level, in dB, is taken away
  };

  /// To be called before the first samples.
  void SetRate(int samplesPerSecond);

  void MoveTo(const Parameters& target);

  /// Goes there at once, because a new sound begins.
  void BeginAt(const Parameters& target);

  /// \return whether `Process` would change nothing
  bool IsResting() const { return isResting_; }

  void Process(float* samples, std::size_t frames);

 private:
  void Glide();
  void Settle();
  float Compress(float peak);

  Parameters target_;
  Parameters now_;
  float envelope_ = 0;  // the sound's level as the dynamics see it
  bool isResting_ = true;
  // Smoothing coefficients, for a step of one frame.
  float glide_ = 1;
  float attack_ = 1;
  float release_ = 1;
};

}  // namespace Desktop
