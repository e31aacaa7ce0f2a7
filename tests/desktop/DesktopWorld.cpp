#include "SoundServer.h"
#include "support/World.h"

#include <Host/Calls.h>
#include <Host/Capabilities.h>
#include <Host/Events.h>
#include <sound_manager.h>

#include <map>
#include <stdexcept>

namespace World {
namespace {

constexpr const char* kRoles[] = {"event", "notification", "alarm", "ringtone", "music", "phone"};
constexpr const char* kModes[] = {"voice", "ringtone", "media"};
constexpr int kFirstLevel = 7;

std::string LoadSink(const std::string& name) {
  const std::string index = Pactl({"load-module", "module-null-sink", "sink_name=" + name});
  return index.substr(0, index.find('\n'));
}

/// What runs beside the test.
struct Others {
  SoundServer server;
  std::map<std::string, Player> players;  // by role
  std::string sinkModule;

  Others() : server({"module-stream-restore"}) {
    server.Start();
    sinkModule = LoadSink("first");
  }

  /// Returns when the device knows the player too: of one that has gone by then nothing is heard.
  const Player& Play(const std::string& role) {
    const auto found = players.find(role);
    if (found != players.end()) return found->second;
    const Player& player =
        players.emplace(role, Player({"media.role=" + role, "test.role=" + role})).first->second;
    Host::WaitUntilDelivered();
    return player;
  }

  /// Returns when the server knows that it has ended.
  void End(const std::string& role) {
    if (players.erase(role) == 0) return;
    while (!ListStreams("test.role = \"" + role + "\"").empty()) {
    }
  }

  static Others& Get() {
    static Others others;
    return others;
  }
};

void Require(int error) {
  if (error != 0) throw std::runtime_error("the device isn't reset: " + std::to_string(error));
}

}  // namespace

void Reset() {
  Host::ResetCapabilities();
  Host::ClearFailures();
  Host::RecordCalls(false);
  Host::TakeCalls();
  for (const char* role : kRoles) Others::Get().End(role);
  for (int type = 0; type < 6; ++type) Require(sound_manager_set_volume(type, kFirstLevel));
  Require(sound_manager_set_muteall(false));
  Require(sound_manager_set_session_type(0));
  Require(sound_manager_set_media_session_option(0, 0));
  Host::WaitUntilDelivered();
}

void ChangeLevel(int soundType, int level) {
  const int index = Others::Get().Play(kRoles[soundType]).GetIndex();
  const int volume = (level * 65536 + 7) / 15;
  Pactl({"set-sink-input-volume", std::to_string(index), std::to_string(volume)});
}

void ChangeMuteAll(bool isMuted) {
  Pactl({"set-sink-mute", "@DEFAULT_SINK@", isMuted ? "1" : "0"});
}

void BeginCall() { Others::Get().Play("phone"); }
void BeginAlarm() { Others::Get().Play("alarm"); }

void EndCallOrAlarm() {
  Others::Get().End("phone");
  Others::Get().End("alarm");
}

void TakeOutput() {
  std::string& module = Others::Get().sinkModule;
  const std::string next = LoadSink("sink" + module);
  Pactl({"unload-module", module});
  module = next;
}

std::vector<int> GetCallModes() {
  std::vector<int> modes;
  for (int mode = 0; mode < 3; ++mode) {
    const auto streams = ListStreams(std::string("call.mode = \"") + kModes[mode] + "\"");
    modes.insert(modes.end(), streams.size(), mode);
  }
  return modes;
}

}  // namespace World
