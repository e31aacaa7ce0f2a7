#pragma once

#include "Input.h"
#include "base/Events.h"
#include "base/StopSignal.h"
#include "commands/Commands.h"

#include <Host/Log.h>

#include <atomic>
#include <string>
#include <thread>

namespace CommandLine {

/// Runs the lines of an input as commands and prints what the library and the platform report.
///
/// On the simulated device everything that a command causes is printed before the next one; on
/// others it is printed when it comes.
class Shell {
 public:
  /// \param name of the input, to tell the place of a mistake; "" for a terminal
  Shell(Input& input, std::string name);
  ~Shell();
  Shell(const Shell&) = delete;
  Shell& operator=(const Shell&) = delete;

  /// \return the shell that runs, for its own commands; null outside of a shell.
  static Shell* Current();

  /// \return the exit code.
  int Run();

  // What its own commands do.
  void ShowInformation(bool on) { showsInformation_ = on; }
  void SkipPauses() { skipsPauses_ = true; }
  void Pause(long milliseconds);
  void End(int code);

 private:
  void Listen();
  void Wait();
  void Stop();
  void RunLine(const std::string& line);
  void RunCommand(const std::string& text);
  void Refuse(const CLI::App& app, const std::string& reason);
  void Settle();
  void PrintReports();
  void ShowLog(const Host::LogRecord& record);

  Input& input_;
  StopSignal stop_;
  const std::string name_;
  const std::thread::id mainThread_ = std::this_thread::get_id();
  std::atomic<bool> showsInformation_;  // in the log
  Lines reports_;
  Events events_{reports_, "< "};
  long lineNumber_ = 0;
  bool skipsPauses_ = false;
  bool ended_ = false;
  int code_ = 0;
};

}  // namespace CommandLine
