#include "Completion.h"

#include "Help.h"

#include <algorithm>

namespace CommandLine {
namespace {

bool IsOption(const std::string& word) { return word.size() > 1 && word[0] == '-'; }

/// Where the words so far have led.
class Place {
 public:
  explicit Place(const CLI::App& program) : command_(&program) {}

  void Pass(const std::string& word) {
    if (awaited_ != nullptr) {
      awaited_ = nullptr;
    } else if (IsOption(word)) {
      const CLI::Option* option = OptionOf(word);
      if (option != nullptr && option->get_type_size() != 0) awaited_ = option;
    } else if (const CLI::App* next = FindCommand(*command_, word); next != nullptr) {
      command_ = next;
      passed_ = 0;
    } else {
      ++passed_;
    }
  }

  Completion Offer(const std::string& begin) const {
    if (awaited_ != nullptr) return ValuesFor(*awaited_);
    if (!begin.empty() && begin[0] == '-') return {OptionNames(), false};
    Completion completion;
    if (const CLI::Option* positional = Positional()) completion = ValuesFor(*positional);
    if (passed_ > 0) return completion;
    for (const CLI::App* command : command_->get_subcommands({})) {
      completion.words.push_back(command->get_name());
    }
    return completion;
  }

 private:
  /// A command understands the program's options too.
  const CLI::Option* OptionOf(const std::string& word) const {
    for (const CLI::App* app = command_; app != nullptr; app = app->get_parent()) {
      if (const CLI::Option* option = app->get_option_no_throw(word)) return option;
    }
    return nullptr;
  }

  std::vector<std::string> OptionNames() const {
    std::vector<std::string> names;
    for (const CLI::App* app = command_; app != nullptr; app = app->get_parent()) {
      for (const CLI::Option* option : app->get_options({})) {
        for (const std::string& name : option->get_lnames()) names.push_back("--" + name);
      }
    }
    return names;
  }

  /// \return what is to stand here; the last of a command's may stand several times.
  const CLI::Option* Positional() const {
    std::size_t index = 0;
    for (const CLI::Option* option : command_->get_options({})) {
      if (!option->get_positional()) continue;
      const bool isMany = option->get_expected_max() >= CLI::detail::expected_max_vector_size;
      if (index++ == passed_ || isMany) return option;
    }
    return nullptr;
  }

  static Completion ValuesFor(const CLI::Option& option) {
    const bool isFile = ValueNameOf(option) == "FILE" || option.get_name(true) == "FILE";
    return {ValuesOf(option), isFile};
  }

  const CLI::App* command_;
  const CLI::Option* awaited_ = nullptr;  // whose value is next
  std::size_t passed_ = 0;                // words behind the command that are no option
};

}  // namespace

Completion Complete(const CLI::App& program, const std::vector<std::string>& words) {
  const std::string begin = words.empty() ? "" : words.back();
  Place place(program);
  for (std::size_t i = 0; i + 1 < words.size(); ++i) place.Pass(words[i]);
  Completion completion = place.Offer(begin);
  auto& found = completion.words;
  found.erase(std::remove_if(found.begin(), found.end(),
                             [&](const std::string& word) { return word.rfind(begin, 0) != 0; }),
              found.end());
  std::sort(found.begin(), found.end());
  return completion;
}

}  // namespace CommandLine
