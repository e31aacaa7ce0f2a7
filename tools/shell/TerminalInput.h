#pragma once

#include "Input.h"

namespace CommandLine {

/// Lines that the user types, with editing, completion and a history that stays. One a process.
class TerminalInput : public Input {
 public:
  TerminalInput();
  ~TerminalInput() override;
  TerminalInput(const TerminalInput&) = delete;
  TerminalInput& operator=(const TerminalInput&) = delete;

  void Prompt() override;
  int Descriptor() const override;
  void Receive() override;
  bool IsTerminal() const override { return true; }
  void Cancel() override;
  void HideLine() override;
  void ShowLine() override;

 private:
  static void ReceiveLine(char* line);
  static char** OfferWords(const char* word, int begin, int end);
  void StopEditing();

  static TerminalInput* instance_;  // for the editor's callback
  bool editing_ = false;
};

}  // namespace CommandLine
