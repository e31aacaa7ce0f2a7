#include "Commands.h"
#include "base/Failure.h"
#include "base/Managers.h"
#include "base/Output.h"
#include "base/StopSignal.h"

#include <fmt/format.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace CommandLine {
namespace {

using namespace Zelkora::Media;

constexpr double kLongest = 24 * 60 * 60;  // in seconds

struct Options {
  std::vector<std::string> modes;
  std::optional<double> seconds;  // for each mode
};

void Enter() { Check(CallManager().EnterCallSession(), "open a call session"); }

void Exit() { Check(CallManager().ExitCallSession(), "close the call session"); }

void SetMode(const std::string& mode) {
  Check(CallManager().SetCallSessionMode(Find(kCallModes, mode)->value),
        fmt::format("set the call's mode to {}", mode));
}

std::string GetMode() {
  ClearLastResult();
  const VoipAudioSessionMode mode = CallManager().GetCallSessionMode();
  Check(GetLastResult(), "read the call's mode");
  return NameOf(kCallModes, mode);
}

/// An open call session, which is closed whatever happens.
class Call {
 public:
  Call() { Enter(); }
  ~Call() {
    if (open_) CallManager().ExitCallSession();
  }
  Call(const Call&) = delete;
  Call& operator=(const Call&) = delete;

  void Close() {
    Exit();
    open_ = false;
  }

 private:
  bool open_ = true;
};

/// Keeps the call's mode for the time that the user wants. \return whether to go on
bool Keep(const Options& options, StopSignal& stop) {
  Print(fmt::format("in a call, mode {}\n", GetMode()));
  return !stop.Wait(options.seconds ? static_cast<int>(*options.seconds * 1000) : -1);
}

void PassThroughModes(const Options& options, StopSignal& stop) {
  if (options.modes.empty()) Keep(options, stop);
  for (const std::string& mode : options.modes) {
    SetMode(mode);
    if (!Keep(options, stop)) return;
  }
}

int MakeCall(const Options& options) {
  StopSignal stop;
  Call call;
  PassThroughModes(options, stop);
  call.Close();
  Print("call ended\n");
  return 0;
}

int ShowOrSetMode(const std::string& wanted) {
  if (!wanted.empty()) return SetMode(wanted), 0;
  Print(GetMode() + "\n");
  return 0;
}

}  // namespace

void AddCallCommand(CLI::App& program, Command& chosen) {
  auto options = std::make_shared<Options>();
  auto* command = program.add_subcommand("call", "Hold a call session until Ctrl-C");
  auto* modes = command->add_option(
      "--mode", options->modes,
      fmt::format("Mode or modes, one after the other: {}", NamesIn(kCallModes)));
  modes->check(OneOf(kCallModes, "mode"))->type_name("MODE");
  command->add_option("--for", options->seconds, "End each mode after so many seconds")
      ->check(CLI::Range(0.0, kLongest).description(""))
      ->type_name("SECONDS");
  command->footer("Example: zelkora call --mode ringtone voice --for 5");
  command->callback([options, &chosen] {
    if (options->modes.size() > 1 && !options->seconds) {
      throw CLI::ValidationError("--mode", "several modes need --for");
    }
    chosen = [options] { return MakeCall(*options); };
  });
}

void AddCallStepsCommand(CLI::App& shell, Command& chosen) {
  auto* call = shell.add_subcommand("call", "Open and close a call session, switch its mode");
  call->require_subcommand(1);
  call->add_subcommand("enter", "Open the session")->callback([&chosen] {
    chosen = [] { return Enter(), 0; };
  });
  call->add_subcommand("exit", "Close the session")->callback([&chosen] {
    chosen = [] { return Exit(), 0; };
  });
  auto wanted = std::make_shared<std::string>();
  auto* mode = call->add_subcommand("mode", "Show or set the session's mode");
  mode->add_option("MODE", *wanted, NamesIn(kCallModes))
      ->check(OneOf(kCallModes, "mode"))
      ->type_name("");
  mode->callback([wanted, &chosen] { chosen = [wanted] { return ShowOrSetMode(*wanted); }; });
}

}  // namespace CommandLine
