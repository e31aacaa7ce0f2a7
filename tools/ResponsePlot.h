#pragma once

#include "FrequencyResponse.h"

#include <string>

namespace CommandLine {

/// Draws a frequency response: SVG when the file's name ends in ".svg", else PNG.
/// \param title the setting that was measured
void WriteResponsePlot(const std::string& file, const FrequencyResponse& response,
                       const std::string& title);

}  // namespace CommandLine
