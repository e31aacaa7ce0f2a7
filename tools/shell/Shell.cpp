#include "Shell.h"

#include "base/DeviceLog.h"
#include "base/Failure.h"
#include "base/Help.h"
#include "base/Output.h"

#include <Host/Calls.h>
#include <Host/Capabilities.h>
#include <Host/Events.h>
#include <fmt/format.h>
#include <poll.h>

#include <algorithm>
#include <chrono>
#include <csignal>
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

/// \return what is wrong with a line.
std::string ExplainLine(const CLI::App& app, const CLI::ParseError& error) {
  const std::vector<std::string> extras = app.remaining(true);
  if (app.get_subcommands().empty() && !extras.empty() && IsForAnotherDevice(extras[0], kInShell)) {
    return fmt::format("this device has no command '{}'; the simulated one has", extras[0]);
  }
  return Explain(app, error);
}

Shell* current = nullptr;

}  // namespace

Shell* Shell::Current() { return current; }

Shell::Shell(Input& input, std::string name)
    : input_(input), name_(std::move(name)), showsInformation_(DeviceLog::IsVerbose()) {
  current = this;
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
  current = nullptr;
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
  if (ready[0].revents != 0) Stop();
  if (ended_) return;
  if (ready[1].revents != 0) {
    input_.HideLine();
    PrintReports();
    input_.ShowLine();
  }
  if (ready[2].revents != 0) input_.Receive();
}

/// Ctrl-C in a terminal only drops what is being done.
void Shell::Stop() {
  if (stop_.Take() != SIGINT || !input_.IsTerminal()) return End(kFailed);
  input_.Cancel();
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
  app.formatter(std::make_shared<HelpFormatter>());
  app.require_subcommand(0, 1);
  AddCommands(app, chosen, kInShell);
  try {
    app.parse(text);
    if (!chosen) return Refuse(app, "no command is given");
    chosen();
  } catch (const CLI::ParseError& error) {
    if (error.get_exit_code() != 0) return Refuse(app, ExplainLine(app, error));
    std::ostringstream help;
    app.exit(error, help);
    Print(help.str());
  } catch (const Failure& failure) {
    PrintError(failure.what());
  }
}

/// A scenario ends where it isn't understood.
void Shell::Refuse(const CLI::App& app, const std::string& reason) {
  if (!input_.IsTerminal()) {
    PrintError(fmt::format("{}:{}: {}", name_, lineNumber_, reason));
    return End(kWrongUsage);
  }
  const CLI::App& command = InnermostCommand(app);
  const std::string help = &command == &app ? "help" : "help " + command.get_name();
  PrintError(fmt::format("{}; \"{}\" tells more", reason, help));
}

void Shell::End(int code) {
  ended_ = true;
  code_ = code;
}

void Shell::Pause(long milliseconds) {
  using Clock = std::chrono::steady_clock;
  if (skipsPauses_) return;
  const Clock::time_point end = Clock::now() + std::chrono::milliseconds(milliseconds);
  for (;;) {
    const auto left = std::chrono::ceil<std::chrono::milliseconds>(end - Clock::now()).count();
    if (left <= 0) return;
    pollfd ready[] = {{stop_.Descriptor(), POLLIN, 0}, {reports_.Descriptor(), POLLIN, 0}};
    poll(ready, std::size(ready), static_cast<int>(left));
    if (ready[0].revents != 0) return Stop();
    PrintReports();
  }
}

void Shell::Settle() {
  Host::WaitUntilDelivered();
  PrintReports();
}

void Shell::PrintReports() {
  for (const std::string& line : reports_.Take()) Print(line + "\n");
}

void Shell::ShowLog(const Host::LogRecord& record) {
  if (record.level <= Host::LogLevel::kInfo && !showsInformation_) return;
  // A line of another thread waits, so that lines keep the order of what happened.
  if (std::this_thread::get_id() != mainThread_) return reports_.Add(Format(record));
  Print(Format(record) + "\n");
}

}  // namespace CommandLine
