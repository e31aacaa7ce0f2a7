#pragma once

#include "Commands.h"
#include "Events.h"
#include "Input.h"
#include "StopSignal.h"

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
  /// \param stop made before anything starts threads
  /// \param name of the input, to tell the place of a mistake
  Shell(Input& input, StopSignal& stop, std::string name);
  ~Shell();
  Shell(const Shell&) = delete;
  Shell& operator=(const Shell&) = delete;

  /// \return the exit code.
  int Run();

 private:
  void Listen();
  void Wait();
  void RunLine(const std::string& line);
  void RunCommand(const std::string& text);
  void AddCommands(CLI::App& app, Command& chosen);
  void AddOwnCommands(CLI::App& app, Command& chosen);
  void Refuse(const std::string& reason);
  void End(int code);
  void Settle();
  void PrintReports();
  void ShowLog(const Host::LogRecord& record);

  Input& input_;
  StopSignal& stop_;
  const std::string name_;
  const std::thread::id mainThread_ = std::this_thread::get_id();
  std::atomic<bool> showsInformation_;  // in the log
  Lines reports_;
  Events events_{reports_, "< "};
  long lineNumber_ = 0;
  bool ended_ = false;
  int code_ = 0;
};

}  // namespace CommandLine
