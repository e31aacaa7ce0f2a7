#pragma once

#include <string>
#include <vector>

namespace CommandLine {

/// How loud a frequency comes out, against the neutral setting.
struct ResponsePoint {
  double frequency;  // in Hz
  double gain;       // in dB
};

/// From 20 Hz to 20 kHz, ascending.
using FrequencyResponse = std::vector<ResponsePoint>;

/// Writes white noise, the same each time and different on both sides, to a WAV file; quiet enough
/// to be amplified without being limited. Throws a `Failure` when it can't be written.
void WriteNoise(const std::string& file);

/// Compares two recordings of that noise. Throws a `Failure` when one can't be read or is too
/// short.
FrequencyResponse CompareRecordings(const std::string& neutral, const std::string& changed);

}  // namespace CommandLine
