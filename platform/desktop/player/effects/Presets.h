/// \file
#pragma once

#include <array>
#include <cstddef>

namespace Desktop {

/// The middle frequencies of a preset's bands in Hz, an octave apart.
inline constexpr std::array<double, 10> kBandFrequencies{31.25, 62.5, 125,  250,  500,
                                                         1000,  2000, 4000, 8000, 16000};

struct Preset {
  double gain;  ///< in dB, of the whole sound: keeps pink noise as loud (BS.1770) as it was
  std::array<int, kBandFrequencies.size()> gains;  ///< in dB
  int reverb = 0;                                  ///< in percent, added to the reverb's level
};

/// By the player interface's number.
inline constexpr std::array<Preset, 20> kPresets{{
    // gain  31  62 125 250 500  1k  2k  4k  8k 16k Hz
    {-1.1, {-1, 1, 3, 4, 3, 0, -1, -1, 0, 1}},      //  0 pop
    {0, {0, 0, 0, 0, 0, 0, 0, 0, 0, 0}},            //  1 normal
    {-3.2, {5, 4, 2, 0, -2, -2, 0, 2, 4, 5}},       //  2 rock
    {-1.0, {6, 5, 2, 0, 0, -3, -3, -1, 2, 2}},      //  3 dance
    {-1.6, {3, 2, 1, 2, -2, -2, 0, 1, 2, 3}},       //  4 jazz
    {-1.5, {3, 3, 2, 1, 0, 0, -1, -1, 2, 3}},       //  5 classical
    {-2.5, {-4, -3, -1, 1, 3, 4, 4, 3, 1, -1}},     //  6 vocal
    {-1.9, {6, 6, 5, 3, 1, 0, 0, 0, 0, 0}},         //  7 bass boost
    {-5.4, {0, 0, 0, 0, 0, 1, 3, 5, 6, 6}},         //  8 treble boost
    {-3.0, {4, 4, 3, 1, 1, 1, 2, 3, 3, 2}},         //  9 acoustic
    {-2.9, {3, 6, 5, 1, -2, -2, 1, 2, 3, 3}},       // 10 rhythm and blues
    {-3.1, {5, 4, 1, -1, -3, 1, 0, 1, 4, 5}},       // 11 electronic
    {-1.7, {6, 5, 2, 3, -1, -1, 1, 0, 1, 2}},       // 12 hip-hop
    {-2.1, {4, 2, 0, 0, -2, -2, -2, 0, 3, 5}},      // 13 latin
    {-3.4, {3, 5, 4, 0, -4, -4, 0, 4, 5, 3}},       // 14 metal
    {-2.4, {1, 1, 0, 1, 2, 2, 1, 2, 3, 2}},         // 15 country
    {0.9, {2, 2, 1, 0, 0, 0, -1, -1, -2, -3}, 50},  // 16 concert hall
    {-2.1, {-10, -8, -4, 0, 2, 4, 5, 4, 0, -5}},    // 17 speech
    {-3.3, {7, 5, 2, 0, -1, -1, 0, 1, 3, 6}},       // 18 loudness
    {-2.2, {-12, -9, 0, 4, 3, 0, 1, 2, 3, 2}},      // 19 small speakers
}};

inline constexpr bool IsPreset(int preset) {
  return preset >= 0 && static_cast<std::size_t>(preset) < kPresets.size();
}

}  // namespace Desktop
