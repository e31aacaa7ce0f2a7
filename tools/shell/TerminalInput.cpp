#include "TerminalInput.h"

#include "base/Completion.h"
#include "base/Output.h"
#include "commands/Commands.h"

#include <unistd.h>

#include <cstdio>  // before the editor's header, which needs it
#include <cstdlib>
#include <cstring>
#include <deque>
#include <filesystem>
#include <iterator>
#include <sstream>
#include <vector>

#include <editline/readline.h>

namespace CommandLine {
namespace {

namespace fs = std::filesystem;

constexpr const char* kPrompt = "zelkora> ";
constexpr const char* kEraseLine = "\r\033[K";
constexpr int kLongestHistory = 1000;  // in lines

/// \return where the history is kept from one run to the next; "" for nowhere.
fs::path HistoryFile() {
  const char* state = std::getenv("XDG_STATE_HOME");
  const char* home = std::getenv("HOME");
  fs::path folder;
  if (state != nullptr && *state == '/') {
    folder = state;
  } else if (home != nullptr && *home == '/') {
    folder = fs::path(home) / ".local/state";
  } else {
    return {};
  }
  std::error_code error;
  fs::create_directories(folder / "zelkora", error);
  return error ? fs::path() : folder / "zelkora/history";
}

/// The words that are offered now; the editor fetches them one after the other.
std::deque<std::string> offered;

char* FetchWord(const char*, int) {
  if (offered.empty()) return nullptr;
  char* word = strdup(offered.front().c_str());
  offered.pop_front();
  return word;
}

}  // namespace

TerminalInput* TerminalInput::instance_ = nullptr;

TerminalInput::TerminalInput() {
  instance_ = this;
  rl_catch_signals = 0;  // signals are the shell's business
  rl_attempted_completion_function = OfferWords;
  rl_completer_word_break_characters = const_cast<char*>(" \t");
  using_history();
  stifle_history(kLongestHistory);
  if (const fs::path file = HistoryFile(); !file.empty()) read_history(file.c_str());
}

TerminalInput::~TerminalInput() {
  StopEditing();
  if (const fs::path file = HistoryFile(); !file.empty()) write_history(file.c_str());
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

/// \param begin of the word in the line \param end where the cursor is
char** TerminalInput::OfferWords(const char* word, int begin, int) {
  CLI::App app;
  Command ignored;
  AddCommands(app, ignored, kInShell);
  std::istringstream line(std::string(rl_line_buffer, std::size_t(begin)));
  std::vector<std::string> words{std::istream_iterator<std::string>(line), {}};
  words.emplace_back(word);
  Completion completion = Complete(app, words);
  offered.assign(completion.words.begin(), completion.words.end());
  rl_attempted_completion_over = completion.isFile ? 0 : 1;  // else files are offered
  const bool isOpen = offered.size() == 1 && offered.front().back() == '=';
  rl_completion_append_character = isOpen ? 0 : int{' '};
  return offered.empty() ? nullptr : completion_matches(const_cast<char*>(word), FetchWord);
}

void TerminalInput::StopEditing() {
  if (editing_) rl_callback_handler_remove();
  editing_ = false;
}

}  // namespace CommandLine
