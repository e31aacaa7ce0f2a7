#include "TerminalInput.h"

#include "Output.h"

#include <unistd.h>

#include <cstdio>  // before the editor's header, which needs it
#include <cstdlib>

#include <editline/readline.h>

namespace CommandLine {
namespace {

constexpr const char* kPrompt = "zelkora> ";
constexpr const char* kEraseLine = "\r\033[K";

}  // namespace

TerminalInput* TerminalInput::instance_ = nullptr;

TerminalInput::TerminalInput() {
  instance_ = this;
  rl_catch_signals = 0;  // signals are the shell's business
  using_history();
}

TerminalInput::~TerminalInput() {
  StopEditing();
  instance_ = nullptr;
}

void TerminalInput::Prompt() {
  if (editing_) return;
  rl_callback_handler_install(kPrompt, ReceiveLine);
  editing_ = true;
}

int TerminalInput::Descriptor() const { return STDIN_FILENO; }

void TerminalInput::Receive() { rl_callback_read_char(); }

void TerminalInput::Cancel() {
  StopEditing();
  Print("\n");
}

void TerminalInput::HideLine() { Print(kEraseLine); }

void TerminalInput::ShowLine() {
  if (editing_) rl_forced_update_display();
}

void TerminalInput::ReceiveLine(char* line) {
  instance_->StopEditing();  // commands find the terminal as it usually is
  if (line == nullptr) {
    instance_->ended_ = true;
    Print("\n");
    return;
  }
  if (*line != '\0') add_history(line);
  instance_->lines_.emplace_back(line);
  std::free(line);
}

void TerminalInput::StopEditing() {
  if (editing_) rl_callback_handler_remove();
  editing_ = false;
}

}  // namespace CommandLine
