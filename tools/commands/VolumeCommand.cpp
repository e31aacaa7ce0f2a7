#include "Commands.h"
#include "base/Failure.h"
#include "base/Managers.h"
#include "base/Output.h"
#include "base/Quantities.h"

#include <fmt/format.h>

#include <algorithm>
#include <memory>
#include <string>

namespace CommandLine {
namespace {

using namespace Zelkora::Media;

constexpr int kBarWidth = 20;  // in characters

struct Options {
  std::string category;  // "" for all
  std::string level;     // "" to show it
};

struct Volume {
  int level = 0;
  int min = 0;
  int max = 0;
};

result Read(const AudioVolumeManager& manager, const Category& category, Volume& volume) {
  const result r = (manager.*category.range)(volume.min, volume.max);
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

  void AddMute(const AudioVolumeManager& manager) {
    const AudioMuteStatus status = manager.GetMuteStatus();
    if (status == AUDIO_MUTE_STATUS_MUTED) Print("all sound is muted\n");
    if (status == AUDIO_MUTE_STATUS_MUTED || status == AUDIO_MUTE_STATUS_UNMUTED) return;
    if (failure_.empty()) failure_ = Describe("tell whether all sound is muted", GetLastResult());
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
  table.AddMute(manager);
  return table.Finish();
}

int ShowOne(const AudioVolumeManager& manager, const Category& category) {
  Table table;
  table.Add(manager, category);
  return table.Finish();
}

void SetLevel(AudioVolumeManager& manager, const Category& category, int level) {
  const result r = (manager.*category.setLevel)(level);
  Volume volume;
  const std::string attempt = fmt::format("set the {} volume to {}", category.name, level);
  if (r == E_INVALID_ARG && Read(manager, category, volume) == E_SUCCESS &&
      (level < volume.min || level > volume.max)) {
    throw Failure(fmt::format("cannot {}: the levels are {} to {} ({})", attempt, volume.min,
                              volume.max, GetErrorMessage(r)));
  }
  Check(r, attempt);
}

/// A level that isn't told by its number is shown.
int ChangeLevel(AudioVolumeManager& manager, const Category& category, const LevelChange& change) {
  if (change.kind == LevelChange::Kind::kLevel) {
    return SetLevel(manager, category, change.number), 0;
  }
  Volume volume;
  Check(Read(manager, category, volume), fmt::format("read the {} volume", category.name));
  SetLevel(manager, category, change.ApplyTo(volume.level, volume.min, volume.max));
  return ShowOne(manager, category);
}

int ShowOrSetVolume(const Options& options) {
  AudioVolumeManager& manager = VolumeManager();
  if (options.category.empty()) return ShowAll(manager);
  const Category& category = *Find(kCategories, options.category);
  if (options.level.empty()) return ShowOne(manager, category);
  return ChangeLevel(manager, category, *ToLevelChange(options.level));
}

}  // namespace

void AddVolumeCommand(CLI::App& program, Command& chosen) {
  auto options = std::make_shared<Options>();
  auto* command = program.add_subcommand("volume", "Show the volumes, or set one");
  auto* category = command->add_option("CATEGORY", options->category, NamesIn(kCategories))
                       ->check(OneOf(kCategories, "category"))
                       ->type_name("");
  command->add_option("LEVEL", options->level, "The level to set: 9, +1, -2 or 60%")
      ->needs(category)
      ->check(IsLevelChange())
      ->type_name("");
  command->footer(
      "Examples: zelkora volume\n          zelkora volume media 9\n          zelkora volume media "
      "+1");
  command->callback(
      [options, &chosen] { chosen = [options] { return ShowOrSetVolume(*options); }; });
}

}  // namespace CommandLine
