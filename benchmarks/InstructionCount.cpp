// What benchmarks/count-instructions counts: one operation of the library, many times, on the
// simulated device.
//   instruction-count OPERATION TIMES

#include <Host/Events.h>
#include <Tizen/Media/Player.h>
#include <Zelkora/Media/AudioEffector.h>
#include <Zelkora/Media/AudioSessionManager.h>
#include <Zelkora/Media/AudioVolumeManager.h>
#include <Zelkora/Media/IAudioVolumeEventListener.h>
#include <Zelkora/Media/VideoKeyFrameSeeker.h>
#include <Zelkora/Media/VoipAudioSessionManager.h>
#include <sound_manager.h>

#include <cstdio>
#include <cstdlib>
#include <functional>
#include <map>
#include <string>

namespace {

using namespace Zelkora::Media;

void Demand(bool condition, const char* what) {
  if (condition) return;
  std::fprintf(stderr, "%s failed\n", what);
  std::exit(1);
}

using Operation = std::function<void()>;

template <typename Manager>
Manager& TheManager() {
  Manager* manager = Manager::GetInstance();
  Demand(manager != nullptr, "GetInstance");
  return *manager;
}

Operation SettingALevel() {
  auto& volume = TheManager<AudioVolumeManager>();
  return [&volume] { Demand(volume.SetMediaVolumeLevel(7) == E_SUCCESS, "SetMediaVolumeLevel"); };
}

Operation ReadingALevel() {
  auto& volume = TheManager<AudioVolumeManager>();
  return [&volume] { Demand(volume.GetCurrentMediaVolumeLevel() >= 0, "a level"); };
}

Operation SettingAMode() {
  auto& session = TheManager<AudioSessionManager>();
  return [&session] { Demand(session.SetMode(AUDIO_SESSION_MODE_ALARM) == E_SUCCESS, "SetMode"); };
}

Operation SettingACallMode() {
  auto& call = TheManager<VoipAudioSessionManager>();
  Demand(call.EnterCallSession() == E_SUCCESS, "EnterCallSession");
  return [&call] {
    Demand(call.SetCallSessionMode(VOIP_AUDIO_SESSION_MODE_MEDIA) == E_SUCCESS, "a call mode");
  };
}

Operation Constructing() {
  static Tizen::Media::Player player;
  Demand(player.Construct() == E_SUCCESS, "the player");
  return [] {
    VideoKeyFrameSeeker seeker;
    Demand(seeker.Construct(player) == E_SUCCESS, "Construct");
  };
}

Operation SettingAnEffect() {
  static Tizen::Media::Player player;
  static AudioEffector effector;
  Demand(player.Construct() == E_SUCCESS && effector.Construct(player) == E_SUCCESS, "Construct");
  return [] { Demand(effector.SetEffectLevel(AUDIO_EFFECT_BASS, 6) == E_SUCCESS, "an effect"); };
}

sound_manager_volume_changed_cb volumeChanged = nullptr;
void* volumeChangedData = nullptr;

Operation Firing() {
  static struct : IAudioVolumeEventListener {
  } listener;
  TheManager<AudioVolumeManager>().AddAudioVolumeEventListener(listener);
  std::atexit(Host::WaitUntilDelivered);  // before the manager goes
  return [] { volumeChanged(4, 7, volumeChangedData); };
}

}  // namespace

// In place of the device's: so the callback is called as a device would, without a device between.
extern "C" int sound_manager_set_volume_changed_cb(sound_manager_volume_changed_cb callback,
                                                   void* user_data) {
  volumeChanged = callback;
  volumeChangedData = user_data;
  return 0;
}

int main(int argc, char** argv) {
  const std::map<std::string, Operation (*)()> operations = {{"set-volume", SettingALevel},
                                                             {"get-volume", ReadingALevel},
                                                             {"set-mode", SettingAMode},
                                                             {"set-call-mode", SettingACallMode},
                                                             {"construct", Constructing},
                                                             {"effect", SettingAnEffect},
                                                             {"event", Firing}};
  const auto found = operations.find(argc == 3 ? argv[1] : "");
  if (found == operations.end()) {
    std::fprintf(stderr, "usage: instruction-count OPERATION TIMES\n");
    return 2;
  }
  const Operation operation = found->second();
  for (int times = std::atoi(argv[2]); times > 0; --times) operation();
}
