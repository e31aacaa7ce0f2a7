#include "Commands.h"
#include "base/Events.h"
#include "base/Failure.h"
#include "base/Managers.h"
#include "base/Output.h"
#include "base/Quantities.h"
#include "base/Recording.h"
#include "base/StopSignal.h"

#include <poll.h>
#include <unistd.h>

#include <iterator>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace CommandLine {
namespace {

struct Options {
  std::string mode;    // "" to leave the session as it is
  long count = 0;      // of events to end after; 0 for no end
  std::string record;  // "" for none
};

/// Waits for lines. \return false when it is time to end: a signal came, or nobody reads any more
bool WaitForLines(const Lines& lines, const StopSignal& stop) {
  pollfd ready[] = {{lines.Descriptor(), POLLIN, 0},
                    {stop.Descriptor(), POLLIN, 0},
                    {STDOUT_FILENO, 0, 0}};  // tells an error when the reader of a pipe is gone
  while (poll(ready, std::size(ready), -1) < 0) {
  }
  if ((ready[2].revents & POLLERR) != 0) throw OutputIsClosed();
  return ready[1].revents == 0;
}

/// Tells what is heard, and records it.
class Teller {
 public:
  explicit Teller(const Options& options) : left_(options.count == 0 ? -1 : options.count) {
    if (!options.record.empty()) recording_.emplace(options.record, options.mode);
  }

  /// \return whether there is more to tell.
  bool Tell(const std::vector<std::string>& lines) {
    for (auto line = lines.begin(); line != lines.end() && left_ != 0; ++line, --left_) {
      if (recording_) recording_->Add(*line);
      if (!recording_ || !recording_->IsStandardOutput()) Print(*line + "\n");
    }
    return left_ != 0;
  }

  void Finish() {
    if (recording_) recording_->Complete();
  }

 private:
  long left_;  // negative for no end
  std::optional<Recording> recording_;
};

int Monitor(const Options& options) {
  RequireOutput();
  StopSignal stop;
  Lines lines;
  Teller teller(options);
  Events events(lines);
  if (!options.mode.empty()) SetSessionMode(options.mode);
  events.ListenToVolumes();
  events.ListenToSession();
  PrintError("listening; Ctrl-C ends");
  while (WaitForLines(lines, stop) && teller.Tell(lines.Take())) {
  }
  teller.Finish();
  return 0;
}

}  // namespace

void AddMonitorCommand(CLI::App& program, Command& chosen) {
  auto options = std::make_shared<Options>();
  auto* command = program.add_subcommand(
      "monitor", "Print changes of volumes and muting, and interruptions, as they come");
  command->add_option("--count", options->count, "End after so many events")
      ->check(IsWholeNumber(1, 1000000000))
      ->type_name("N");
  command
      ->add_option("--session", options->mode,
                   "Set the session's mode before: " + NamesIn(kSessionModes))
      ->check(OneOf(kSessionModes, "mode"))
      ->type_name("MODE");
  command
      ->add_option("--record", options->record,
                   "Write what happens as a scenario, which \"zelkora --device simulated shell "
                   "FILE\" plays back; an older file is replaced")
      ->type_name("FILE");
  command->footer("Ends with success on Ctrl-C.");
  command->callback([options, &chosen] { chosen = [options] { return Monitor(*options); }; });
}

}  // namespace CommandLine
