#include "Steering.h"
#include "base/Failure.h"
#include "base/Managers.h"
#include "base/Output.h"
#include "base/Quantities.h"
#include "commands/Commands.h"

#include <Host/Calls.h>
#include <Host/Capabilities.h>
#include <fmt/format.h>

#include <charconv>
#include <memory>
#include <optional>
#include <string>

namespace CommandLine {
namespace {

/// \return a result with the name that it has in the log
Named<result> NameResult(result r) noexcept { return {GetErrorMessage(r), r}; }

const Named<result> kResults[] = {
    NameResult(E_SUCCESS),
    NameResult(E_INVALID_ARG),
    NameResult(E_INVALID_OPERATION),
    NameResult(E_INVALID_STATE),
    NameResult(E_OBJ_NOT_FOUND),
    NameResult(E_OUT_OF_MEMORY),
    NameResult(E_PRIVILEGE_DENIED),
    NameResult(E_SYSTEM),
    NameResult(E_UNSUPPORTED_OPERATION),
};

constexpr Named<result> kPrivilegeAnswers[] = {{"granted", E_SUCCESS},
                                               {"denied", E_PRIVILEGE_DENIED}};

constexpr Named<result> kFeatureAnswers[] = {
    {"present", E_SUCCESS}, {"absent", Host::kFeatureAbsent}, {"unknown", E_OBJ_NOT_FOUND}};

/// One line's words after the command.
struct Words {
  std::string subject;
  std::string value;
  int number = 0;
  unsigned nth = 0;
};

using Action = int (*)(const Words&);

/// \return a code by its number or its result's name.
std::optional<int> ToCode(const std::string& text) {
  if (const auto* row = Find(kResults, text)) return static_cast<int>(row->value);
  int code = 0;
  const char* end = text.data() + text.size();
  const auto [rest, error] = std::from_chars(text.data(), end, code);
  return rest == end && error == std::errc() ? std::optional(code) : std::nullopt;
}

std::string CheckCode(const std::string& text) {
  if (ToCode(text)) return "";
  return fmt::format("'{}' is neither a number nor one of {}", text, NamesIn(kResults));
}

std::string CheckFeatureAnswer(std::string& text) {
  if (Find(kFeatureAnswers, text) != nullptr || Find(kResults, text) != nullptr) return "";
  return fmt::format("'{}' is none of {}, {}", text, NamesIn(kFeatureAnswers), NamesIn(kResults));
}

template <typename Names>
void RequireKnown(bool known, const char* kind, const std::string& name, const Names& names) {
  if (known) return;
  throw Failure(
      fmt::format("there is no {} '{}'; there are: {}", kind, name, fmt::join(names, ", ")));
}

int Interrupt(const Words& words) {
  Steering::Interrupt(words.number);
  return 0;
}

int ReportVolume(const Words& words) {
  const auto type = Find(kCategories, words.subject) - kCategories;
  Steering::ReportVolume(static_cast<int>(type), words.number);
  return 0;
}

int ReportMute(const Words& words) {
  Steering::ReportMuteAll(Find(kSwitch, words.value)->value);
  return 0;
}

int SetFeature(const Words& words) {
  const auto* named = Find(kFeatureAnswers, words.value);
  const auto answer = named != nullptr ? named->value : static_cast<result>(*ToCode(words.value));
  RequireKnown(Host::SetFeature(words.subject, answer), "feature", words.subject, Host::kFeatures);
  return 0;
}

int SetPrivilege(const Words& words) {
  const result answer = Find(kPrivilegeAnswers, words.value)->value;
  RequireKnown(Host::SetPrivilege(words.subject, answer), "privilege", words.subject,
               Host::kPrivileges);
  return 0;
}

int FailCall(const Words& words) {
  if (words.subject.empty()) {
    Host::ClearFailures();
  } else {
    Host::FailCall(words.subject.c_str(), *ToCode(words.value), words.nth);
  }
  return 0;
}

/// Every operation of the library asks these, which drowns the rest.
bool IsLookup(const std::string& call) {
  return call.rfind("AccessController::", 0) == 0 || call.rfind("SystemInfo::", 0) == 0;
}

int ShowCalls(bool all) {
  for (const std::string& call : Host::TakeCalls()) {
    if (all || !IsLookup(call)) Print("  " + call + "\n");
  }
  return 0;
}

/// Adds a command; its words are filled by the options that the caller adds.
CLI::App* Add(CLI::App& shell, const char* name, const char* description, Action action,
              const std::shared_ptr<Words>& words, Command& chosen) {
  auto* command = shell.add_subcommand(name, description);
  command->callback([=, &chosen] { chosen = [=] { return action(*words); }; });
  return command;
}

CLI::Option* AddWord(CLI::App* command, const char* name, std::string& word, std::string help) {
  return command->add_option(name, word, std::move(help))->required()->type_name("");
}

/// A type's name that tells the values.
template <typename Names>
std::string Values(const Names& names) {
  return fmt::format(":{}", fmt::join(names, " "));
}

}  // namespace

void AddReportCommand(CLI::App& shell, Command& chosen) {
  auto* report = shell.add_subcommand("report", "Something changes from outside");
  report->require_subcommand(1);
  auto words = std::make_shared<Words>();
  auto* volume = Add(*report, "volume", "A volume", ReportVolume, words, chosen);
  AddWord(volume, "CATEGORY", words->subject, NamesIn(kCategories))
      ->check(OneOf(kCategories, "category"));
  volume->add_option("LEVEL", words->number, "The new level")->required()->type_name("");
  auto* mute = Add(*report, "mute", "The muting of all sound", ReportMute, words, chosen);
  AddWord(mute, "SWITCH", words->value, NamesIn(kSwitch))->check(OneOf(kSwitch, "switch"));
}

void AddFailCommand(CLI::App& shell, Command& chosen) {
  auto words = std::make_shared<Words>();
  auto* fail = Add(shell, "fail", "Make a platform function fail; without words, end all failures",
                   FailCall, words, chosen);
  auto* function = fail->add_option("FUNCTION", words->subject, "Such as sound_manager_set_volume")
                       ->type_name("");
  auto* code = fail->add_option("CODE", words->value, "What it returns: a number or a result")
                   ->check(CheckCode)
                   ->type_name("");
  function->needs(code);
  fail->add_option("NTH", words->nth, "Which call from now on; without it every call")
      ->check(IsWholeNumber(1, 1000000000))
      ->type_name("");
}

void AddCallsCommand(CLI::App& shell, Command& chosen) {
  auto all = std::make_shared<bool>(false);
  auto* calls = shell.add_subcommand("calls", "Print the platform's calls since the last time");
  calls->add_flag("--all", *all, "Also the lookups of features and privileges");
  calls->callback([=, &chosen] { chosen = [=] { return ShowCalls(*all); }; });
}

void AddInterruptCommand(CLI::App& shell, Command& chosen) {
  auto words = std::make_shared<Words>();
  Add(shell, "interrupt", "The session is interrupted: 5, or the interruption ends: 0", Interrupt,
      words, chosen)
      ->add_option("CODE", words->number, "The platform's code")
      ->required()
      ->check(IsWholeNumber(-1000000000, 1000000000))
      ->type_name("");
}

void AddFeatureCommand(CLI::App& shell, Command& chosen) {
  auto words = std::make_shared<Words>();
  auto* feature =
      Add(shell, "feature", "Say whether the device offers a feature", SetFeature, words, chosen);
  AddWord(feature, "NAME", words->subject, "The feature")->type_name(Values(Host::kFeatures));
  AddWord(feature, "ANSWER", words->value, NamesIn(kFeatureAnswers) + ", or a result's name")
      ->check(CLI::Validator(CheckFeatureAnswer, NamesIn(kFeatureAnswers, " ")));
}

void AddPrivilegeCommand(CLI::App& shell, Command& chosen) {
  auto words = std::make_shared<Words>();
  auto* privilege =
      Add(shell, "privilege", "Grant or deny a privilege", SetPrivilege, words, chosen);
  AddWord(privilege, "NAME", words->subject, "The privilege")->type_name(Values(Host::kPrivileges));
  AddWord(privilege, "ANSWER", words->value, NamesIn(kPrivilegeAnswers))
      ->check(OneOf(kPrivilegeAnswers, "answer"));
}

}  // namespace CommandLine
