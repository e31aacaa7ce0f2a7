#pragma once

#include <CLI/App.hpp>

#include <string>
#include <vector>

namespace CommandLine {

/// What a word that is being typed can become.
struct Completion {
  std::vector<std::string> words;  // an ending "=" awaits more
  bool isFile = false;             // or the name of a file
};

/// \param words those behind the program's name; the last one is being typed, and may be empty
Completion Complete(const CLI::App& program, const std::vector<std::string>& words);

}  // namespace CommandLine
