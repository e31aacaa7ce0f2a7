#include "Commands.h"
#include "Failure.h"
#include "Managers.h"
#include "Output.h"

#include <fmt/format.h>

#include <algorithm>
#include <memory>
#include <optional>
#include <string>

namespace CommandLine {
namespace {

using Zelkora::Media::AudioVolumeManager;

constexpr int kBarWidth = 20;  // in characters

struct Options {
  std::string category;  // "" for all
  std::optional<int> level;
};

struct Volume {
  int level = 0;
  int max = 0;
};

result Read(const AudioVolumeManager& manager, const Category& category, Volume& volume) {
  int min = 0;
  const result r = (manager.*category.range)(min, volume.max);
  if (r != E_SUCCESS) return r;
  volume.level = (manager.*category.level)();
  return volume.level < 0 ? GetLastResult() : E_SUCCESS;
}

std::string Bar(const Volume& volume) {
  const int filled = volume.max > 0 ? volume.level * kBarWidth / volume.max : 0;
  const int within = std::clamp(filled, 0, kBarWidth);
  return std::string(std::size_t(within), '#') + std::string(std::size_t(kBarWidth - within), '.');
}

/// Prints one row after the other, so that the table stays whole. The first failure is told at the
/// end: as a rule the others have the same reason.
class Table {
 public:
  void AddHeading() { Print("category      level  highest\n"); }

  void Add(const AudioVolumeManager& manager, const Category& category) {
    Volume volume;
    const result r = Read(manager, category, volume);
    if (r == E_SUCCESS) {
      Print(fmt::format("{:<12}  {:>5}  {:>7}  {}\n", category.name, volume.level, volume.max,
                        Bar(volume)));
      return;
    }
    Print(fmt::format("{:<12}  {:>5}  {:>7}  {}\n", category.name, "-", "-", GetErrorMessage(r)));
    if (failure_.empty()) failure_ = Describe(fmt::format("read the {} volume", category.name), r);
  }

  /// \return the exit code.
  int Finish() const {
    if (!failure_.empty()) PrintError(failure_);
    return failure_.empty() ? 0 : 1;
  }

 private:
  std::string failure_;  // "" for none
};

int ShowAll(const AudioVolumeManager& manager) {
  Table table;
  table.AddHeading();
  for (const Category& category : kCategories) table.Add(manager, category);
  return table.Finish();
}

int ShowOne(const AudioVolumeManager& manager, const Category& category) {
  Table table;
  table.Add(manager, category);
  return table.Finish();
}

int ShowOrSetVolume(const Options& options) {
  AudioVolumeManager& manager = VolumeManager();
  if (options.category.empty()) return ShowAll(manager);
  const Category& category = *Find(kCategories, options.category);
  if (!options.level) return ShowOne(manager, category);
  Check((manager.*category.setLevel)(*options.level),
        fmt::format("set the {} volume to {}", category.name, *options.level));
  return 0;
}

}  // namespace

void AddVolumeCommand(CLI::App& program, Command& chosen) {
  auto options = std::make_shared<Options>();
  auto* command = program.add_subcommand("volume", "Show the volumes, or set one");
  auto* category = command->add_option("CATEGORY", options->category, NamesIn(kCategories))
                       ->check(OneOf(kCategories, "category"))
                       ->type_name("");
  command->add_option("LEVEL", options->level, "The level to set, from 0 to the highest")
      ->needs(category)
      ->type_name("");
  command->footer("Examples: zelkora volume\n          zelkora volume media 9");
  command->callback(
      [options, &chosen] { chosen = [options] { return ShowOrSetVolume(*options); }; });
}

}  // namespace CommandLine
