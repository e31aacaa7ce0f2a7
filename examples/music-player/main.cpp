// A music player's skeleton.
//
//     music-player FILE        reads "play", "pause" and "quit" from standard input

#include "MusicPlayer.h"

#include <iostream>
#include <string>

namespace {

MusicPlayer music;

}  // namespace

int main(int count, char** arguments) {
  if (count != 2) {
    std::cerr << "usage: music-player FILE\n";
    return 2;
  }
  if (!music.Open(arguments[1])) {
    std::cerr << "cannot open " << arguments[1] << '\n';
    return 1;
  }
  music.KeepVolume();
  music.FollowInterruptions();
  music.Play();
  for (std::string line; std::getline(std::cin, line) && line != "quit";) {
    if (line == "play") music.Play();
    if (line == "pause") music.Pause();
  }
}
