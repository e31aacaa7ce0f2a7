#include "Shell.h"

#include "DeviceLog.h"
#include "Failure.h"
#include "Managers.h"
#include "Output.h"

#include <Host/Calls.h>
#include <Host/Capabilities.h>
#include <Host/Events.h>
#include <fmt/format.h>
#include <poll.h>

#include <iterator>
#include <memory>
#include <sstream>
#include <utility>

namespace CommandLine {
namespace {

constexpr int kFailed = 1;
constexpr int kWrongUsage = 2;

bool IsBlank(char character) { return character == ' ' || character == '\t' || character == '\r'; }

/// \return the line without its comment and the blanks at its end.
std::string WithoutComment(const std::string& line) {
  std::size_t end = 0;
  while (end < line.size() && !(line[end] == '#' && (end == 0 || IsBlank(line[end - 1])))) ++end;
  while (end > 0 && IsBlank(line[end - 1])) --end;
  return line.substr(0, end);
}

/// The result is left out where the message begins with it, as most do.
std::string Format(const Host::LogRecord& record) {
  std::string line = record.level == Host::LogLevel::kInfo ? "-" : "!";
  if (record.module != 0) line += fmt::format(" module {}", record.module);
  if (record.tag[0] != '\0') line += fmt::format(" tag {}", record.tag);
  if (record.hasResult && record.message[0] != '[')
    line += " " + std::string(GetErrorMessage(record.code));
  return line + ": " + record.message;
}

/// The help of all commands, not of the one that was chosen.
void PrintHelp(const CLI::App& app) {
  Print(app.get_formatter()->make_help(&app, "", CLI::AppFormatMode::Normal));
}

}  // namespace

Shell::Shell(Input& input, StopSignal& stop, std::string name)
    : input_(input),
      stop_(stop),
      name_(std::move(name)),
      showsInformation_(DeviceLog::IsVerbose()) {
  DeviceLog::ShowWith([this](const Host::LogRecord& record) { ShowLog(record); });
  Listen();
  Host::RecordCalls(true);
}

Shell::~Shell() {
  // Else the library might refuse to forget the listener, which is about to go.
  Host::ClearFailures();
  Host::ResetCapabilities();
  Host::RecordCalls(false);
  DeviceLog::ShowWith(nullptr);
}

void Shell::Listen() {
  for (auto listen : {&Events::ListenToVolumes, &Events::ListenToSession}) {
    try {
      (events_.*listen)();
    } catch (const Failure& failure) {  // other commands may do
      PrintError(failure.what());
    }
  }
}

int Shell::Run() {
  while (!ended_) {
    if (auto line = input_.TakeLine()) {
      RunLine(*line);
    } else if (input_.IsAtEnd()) {
      ended_ = true;
    } else {
      Wait();
    }
  }
  return code_;
}

void Shell::Wait() {
  input_.Prompt();
  pollfd ready[] = {{stop_.Descriptor(), POLLIN, 0},
                    {reports_.Descriptor(), POLLIN, 0},
                    {input_.Descriptor(), POLLIN, 0}};
  if (poll(ready, std::size(ready), -1) < 0) return;
  if (ready[0].revents != 0) {
    if (stop_.Take() != SIGINT || !input_.IsTerminal()) return End(kFailed);
    input_.Cancel();
  }
  if (ready[1].revents != 0) {
    input_.HideLine();
    PrintReports();
    input_.ShowLine();
  }
  if (ready[2].revents != 0) input_.Receive();
}

void Shell::RunLine(const std::string& line) {
  ++lineNumber_;
  const std::string text = WithoutComment(line);
  if (!input_.IsTerminal()) Print((text.empty() ? "" : "> ") + line + "\n");
  if (text.find_first_not_of(" \t") == std::string::npos) return;
  RunCommand(text);
  Settle();
}

void Shell::RunCommand(const std::string& text) {
  CLI::App app;
  Command chosen;
  AddCommands(app, chosen);
  try {
    app.parse(text);
    if (!chosen) return Refuse("no command is given");
    chosen();
  } catch (const CLI::ParseError& error) {
    if (error.get_exit_code() != 0) return Refuse(error.what());
    std::ostringstream help;
    app.exit(error, help);
    Print(help.str());
  } catch (const Failure& failure) {
    PrintError(failure.what());
  }
}

void Shell::AddCommands(CLI::App& app, Command& chosen) {
  app.get_formatter()->label("SUBCOMMAND", "COMMAND");
  app.require_subcommand(0, 1);
  AddVolumeCommand(app, chosen);
  AddMuteCommand(app, chosen);
  AddSessionCommand(app, chosen);
  AddCallStepsCommand(app, chosen);
  AddSeekCommand(app, chosen);
  AddEffectsCommand(app, chosen);
  AddSteeringCommands(app, chosen);
  AddOwnCommands(app, chosen);
  for (CLI::App* command : app.get_subcommands(nullptr)) command->group("Commands");
}

void Shell::AddOwnCommands(CLI::App& app, Command& chosen) {
  auto wanted = std::make_shared<std::string>();
  auto* log = app.add_subcommand("log", "Show also what is no failure in the library's log");
  log->add_option("SWITCH", *wanted, NamesIn(kSwitch))
      ->check(OneOf(kSwitch, "switch"))
      ->required()
      ->type_name("");
  log->callback([this, wanted, &chosen] {
    chosen = [this, wanted] { return showsInformation_ = Find(kSwitch, *wanted)->value, 0; };
  });
  app.add_subcommand("help", "List the commands")->callback([&app, &chosen] {
    chosen = [&app] { return PrintHelp(app), 0; };
  });
  app.add_subcommand("exit", "Leave the shell")->callback([this, &chosen] {
    chosen = [this] { return End(0), 0; };
  });
}

void Shell::Refuse(const std::string& reason) {
  if (input_.IsTerminal()) return PrintError(reason + "; \"help\" lists the commands");
  PrintError(fmt::format("{}:{}: {}", name_, lineNumber_, reason));
  End(kWrongUsage);
}

void Shell::End(int code) {
  ended_ = true;
  code_ = code;
}

void Shell::Settle() {
  Host::WaitUntilDelivered();
  PrintReports();
}

void Shell::PrintReports() {
  for (const std::string& line : reports_.Take()) Print(line + "\n");
}

void Shell::ShowLog(const Host::LogRecord& record) {
  if (record.level == Host::LogLevel::kInfo && !showsInformation_) return;
  // A line of another thread waits, so that lines keep the order of what happened.
  if (std::this_thread::get_id() != mainThread_) return reports_.Add(Format(record));
  Print(Format(record) + "\n");
}

}  // namespace CommandLine
