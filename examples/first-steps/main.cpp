// Opens a film, moves it to a key frame, and plays its sound with more bass for a while.
//
//     first-steps FILE

#include <Tizen/Base/Result.h>
#include <Tizen/Media/Player.h>
#include <Zelkora/Media/AudioEffector.h>
#include <Zelkora/Media/VideoKeyFrameSeeker.h>

#include <chrono>
#include <iostream>
#include <thread>

using namespace Zelkora::Media;

int main(int count, char** arguments) {
  if (count != 2) {
    std::cerr << "usage: first-steps FILE\n";
    return 2;
  }

  Tizen::Media::Player player;  // before what is bound to it: it must outlive both
  if (player.Construct() != E_SUCCESS || player.OpenFile(arguments[1]) != E_SUCCESS) {
    std::cerr << arguments[1] << " can't be opened: " << GetErrorMessage(GetLastResult()) << '\n';
    return 1;
  }

  VideoKeyFrameSeeker seeker;
  if (seeker.Construct(player) == E_SUCCESS && seeker.SeekTo(4200) == E_SUCCESS) {
    std::cout << "asked for 4200 ms, landed at " << player.GetPosition() << " ms\n";
  }

  AudioEffector effector;
  if (effector.Construct(player) == E_SUCCESS) {
    int least = 0;
    int most = 0;
    effector.GetEffectLevelRange(AUDIO_EFFECT_BASS, least, most);
    effector.SetEffectLevel(AUDIO_EFFECT_BASS, most);
    std::cout << "bass " << most << " of " << least << " to " << most << '\n';
  }

  if (player.Play() != E_SUCCESS) return 1;
  std::this_thread::sleep_for(std::chrono::seconds(3));
}
