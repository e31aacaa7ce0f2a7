#pragma once

#include "media/FrequencyResponse.h"
#include "media/LevelResponse.h"

#include <string>
#include <vector>

namespace CommandLine {

class OutputFile;

/// What a setting does to sound.
struct SoundMeasurement {
  FrequencyResponse response;
  std::vector<LevelPoint> levels;
  std::vector<DecayPoint> decay, neutralDecay;
};

/// Draws of a measurement what there is to see: the response, the output against the input if the
/// gain depends on the level, and the decay if there is more of it than before. SVG when the file's
/// name ends in ".svg", else PNG.
/// \param title the setting that was measured
void WriteSoundPlot(OutputFile& file, const SoundMeasurement& measurement,
                    const std::string& title);

}  // namespace CommandLine
