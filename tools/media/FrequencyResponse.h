#pragma once

#include "media/StereoSound.h"

#include <vector>

namespace CommandLine {

/// How loud a frequency comes out, against the neutral setting.
struct ResponsePoint {
  double frequency;  // in Hz
  double gain;       // in dB
};

/// From 20 Hz to 20 kHz, ascending.
using FrequencyResponse = std::vector<ResponsePoint>;

/// \return white noise, the same each time and different on both sides; quiet enough to be
/// amplified without being limited.
StereoSound MakeNoise();

/// Compares two recordings of that noise. Throws a `Failure` when one is too short.
FrequencyResponse CompareRecordings(const StereoSound& neutral, const StereoSound& changed);

}  // namespace CommandLine
