#include "Commands.h"
#include "base/Failure.h"
#include "base/Managers.h"
#include "base/Output.h"

#include <memory>
#include <string>

namespace CommandLine {
namespace {

using namespace Zelkora::Media;

int ShowMute(const AudioVolumeManager& manager) {
  const AudioMuteStatus status = manager.GetMuteStatus();
  const bool muted = status == AUDIO_MUTE_STATUS_MUTED;
  if (!muted && status != AUDIO_MUTE_STATUS_UNMUTED) {
    Check(GetLastResult(), "tell whether all sound is muted");
  }
  Print(NameOf(kSwitch, muted) + "\n");
  return 0;
}

int ShowOrSetMute(const std::string& wanted) {
  AudioVolumeManager& manager = VolumeManager();
  if (wanted.empty()) return ShowMute(manager);
  const bool mute = Find(kSwitch, wanted)->value;
  Check(mute ? manager.MuteAll() : manager.UnmuteAll(),
        mute ? "mute all sound" : "unmute all sound");
  return 0;
}

}  // namespace

void AddMuteCommand(CLI::App& program, Command& chosen) {
  auto wanted = std::make_shared<std::string>();
  auto* command = program.add_subcommand("mute", "Show whether all sound is muted, or change it");
  command->add_option("SWITCH", *wanted, NamesIn(kSwitch))
      ->check(OneOf(kSwitch, "switch"))
      ->type_name("");
  command->callback([wanted, &chosen] { chosen = [wanted] { return ShowOrSetMute(*wanted); }; });
}

}  // namespace CommandLine
