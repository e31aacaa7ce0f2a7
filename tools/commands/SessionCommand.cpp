#include "Commands.h"
#include "base/Failure.h"
#include "base/Managers.h"
#include "base/Output.h"
#include "shell/Shell.h"

#include <memory>
#include <string>

namespace CommandLine {
namespace {

using namespace Zelkora::Media;

int ShowOrSetMode(const std::string& wanted) {
  if (!wanted.empty()) {
    SetSessionMode(wanted);
    if (Shell::Current() == nullptr) {
      PrintError("note: the mode is gone with this command; \"zelkora monitor --session " + wanted +
                 "\" keeps it");
    }
    return 0;
  }
  const AudioSessionManager& manager = SessionManager();
  ClearLastResult();  // the mode alone doesn't tell a failure
  const AudioSessionMode mode = manager.GetMode();
  Check(GetLastResult(), "read the session's mode");
  Print(NameOf(kSessionModes, mode) + "\n");
  return 0;
}

}  // namespace

void AddSessionCommand(CLI::App& program, Command& chosen) {
  auto wanted = std::make_shared<std::string>();
  auto* command = program.add_subcommand("session", "Show or set the audio session's mode");
  command->add_option("MODE", *wanted, NamesIn(kSessionModes))
      ->check(OneOf(kSessionModes, "mode"))
      ->type_name("");
  command->footer(
      "The mode is this program's own. After media-mix, media is read as media-mix.\n"
      "To hear of interruptions in a mode: zelkora monitor --session MODE");
  command->callback([wanted, &chosen] { chosen = [wanted] { return ShowOrSetMode(*wanted); }; });
}

}  // namespace CommandLine
