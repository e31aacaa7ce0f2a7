// What the music player does when it is interrupted. Linked with the simulated device, which does
// what it is told and calls the listeners before the next line.

#include "MusicPlayer.h"

#include <Simulated/Device.h>

#include <cstdlib>
#include <iostream>
#include <string>

namespace {

constexpr int kPhoneRings = 5, kPhoneIsDone = 0, kAnotherTakesOver = 2;  // the platform's codes

MusicPlayer music;

/// Interrupts, and expects what of its player the music player calls then: "player_pause", or "".
void Interrupt(int code, const std::string& expected) {
  Host::RecordCalls(true);
  Simulated::Interrupt(code);
  Simulated::WaitUntilDelivered();
  std::string called;
  for (const std::string& call : Host::TakeCalls()) {
    if (call.rfind("player_", 0) == 0) called += call.substr(0, call.find('('));
  }
  if (called == expected) return;
  std::cerr << "after code " << code << ": called '" << called << "' in place of '" << expected
            << "'\n";
  std::exit(1);
}

}  // namespace

int main() {
  if (!music.Open("song.ogg")) return 1;
  music.FollowInterruptions();

  music.Play();
  Interrupt(kPhoneRings, "player_pause");
  Interrupt(kPhoneIsDone, "player_play");

  music.Pause();  // by its user: nothing is resumed
  Interrupt(kPhoneRings, "");
  Interrupt(kPhoneIsDone, "");

  music.Play();
  Interrupt(kAnotherTakesOver, "player_pause");
  Interrupt(kPhoneIsDone, "");
}
