#pragma once

#include <string>
#include <vector>

namespace CommandLine {

/// Of the sounds that are written, in samples a second.
inline constexpr int kSoundRate = 48000;

/// Sound in memory, full scale at 1.
struct StereoSound {
  int rate = kSoundRate;
  std::vector<double> left, right;
};

/// 16-bit WAV files. They throw a `Failure` when the file can't be written or read.
void WriteStereoSound(const std::string& file, const StereoSound& recording);
StereoSound ReadStereoSound(const std::string& file);

}  // namespace CommandLine
