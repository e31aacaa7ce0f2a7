#include "Commands.h"
#include "Events.h"
#include "Failure.h"
#include "Managers.h"
#include "Output.h"
#include "StopSignal.h"

#include <poll.h>
#include <unistd.h>

#include <iterator>
#include <memory>
#include <string>

namespace CommandLine {
namespace {

struct Options {
  std::string mode;  // "" to leave the session as it is
  long count = 0;    // of events to end after; 0 for no end
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

/// \return the number of lines printed, at most \p most.
long PrintLines(Lines& lines, long most) {
  long printed = 0;
  for (const std::string& line : lines.Take()) {
    if (printed == most) break;
    Print(line + "\n");
    ++printed;
  }
  return printed;
}

int Monitor(const Options& options) {
  RequireOutput();
  StopSignal stop;
  Lines lines;
  Events events(lines);
  if (!options.mode.empty()) SetSessionMode(options.mode);
  events.ListenToVolumes();
  events.ListenToSession();
  PrintError("listening; Ctrl-C ends");
  long left = options.count == 0 ? -1 : options.count;
  while (left != 0 && WaitForLines(lines, stop)) left -= PrintLines(lines, left);
  return 0;
}

}  // namespace

void AddMonitorCommand(CLI::App& program, Command& chosen) {
  auto options = std::make_shared<Options>();
  auto* command = program.add_subcommand(
      "monitor", "Print changes of volumes and muting, and interruptions, as they come");
  command->add_option("--count", options->count, "End after so many events")
      ->check(CLI::PositiveNumber.description(""))
      ->type_name("N");
  command
      ->add_option("--session", options->mode,
                   "Set the session's mode before: " + NamesIn(kSessionModes))
      ->check(OneOf(kSessionModes, "mode"))
      ->type_name("MODE");
  command->footer("Ends with success on Ctrl-C.");
  command->callback([options, &chosen] { chosen = [options] { return Monitor(*options); }; });
}

}  // namespace CommandLine
