/// \file
/// What a device needs of the machine that it runs on, for who looks why something doesn't work.
#pragma once

#include <string>
#include <vector>

namespace Host {

/// Something that may be missing.
struct Need {
  std::string what;  ///< "decoder of H.264 video"
  bool isMet;
  std::string remedy;  ///< the command that mends it: "apt install gstreamer1.0-libav"
};

/// A device's player, and its sound manager, may define these; a device without one needs nothing.
/// They look anew at each call, which may take seconds.
std::vector<Need> ListPlayerNeeds();
std::vector<Need> ListSoundManagerNeeds();

}  // namespace Host
