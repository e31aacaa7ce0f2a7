#pragma once

#include "media/StereoSound.h"

#include <vector>

namespace CommandLine {

/// How loud a tone comes out, both in dB of full scale.
struct LevelPoint {
  double input;
  double output;
};

/// A tone of 1 kHz that gets louder, step by step.
StereoSound MakeStairs();
/// \param recording what became of it, by any change that keeps its length
std::vector<LevelPoint> MeasureStairs(const StereoSound& recording);

/// How loud it is after a sound's end: in seconds, and in dB of that sound.
struct DecayPoint {
  double time;
  double level;
};

/// Half a second of noise, the same each time, and silence.
StereoSound MakeBurst();
/// \param recording what became of it
std::vector<DecayPoint> MeasureDecay(const StereoSound& recording);

}  // namespace CommandLine
