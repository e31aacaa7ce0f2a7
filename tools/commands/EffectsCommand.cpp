#include "Commands.h"
#include "base/Failure.h"
#include "base/Managers.h"
#include "base/Output.h"
#include "base/OutputFile.h"
#include "base/Progress.h"
#include "base/Quantities.h"
#include "base/StopSignal.h"
#include "base/TemporaryFolder.h"
#include "media/FrequencyResponse.h"
#include "media/Sound.h"
#include "pictures/SoundPlot.h"

#include <fmt/format.h>

#include <algorithm>
#include <charconv>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace CommandLine {
namespace {

using Zelkora::Media::AudioEffector;

constexpr std::size_t kLineLength = 80;  // of the list of presets, in characters

// While playing, in milliseconds.
constexpr int kLookEvery = 100;
constexpr int kLongestStandstill = 3000;

struct Options {
  std::string file;  // "" for none
  std::vector<std::string> levels;
  std::vector<std::string> presets;
  std::vector<Sound::Change> changes;  // of both and of the resets, in the order given
  bool play = false;
  std::string rendering;  // "" for none
  std::string plot;       // "" for none
};

struct EffectLevel {
  Sound::Effect effect;
  int level;
};

/// \return the effect and the level in "bass=6", if that's what it is.
std::optional<EffectLevel> ToEffectLevel(const std::string& text) {
  const std::size_t equals = std::min(text.find('='), text.size());
  const auto* row = Find(kEffects, text.substr(0, equals));
  EffectLevel wanted{};
  const char* end = text.data() + text.size();
  const auto [rest, error] =
      std::from_chars(std::min(text.data() + equals + 1, end), end, wanted.level);
  if (row == nullptr || rest != end || error != std::errc()) return std::nullopt;
  wanted.effect = row->value;
  return wanted;
}

std::string CheckEffectLevel(std::string& text) {
  if (ToEffectLevel(text)) return "";
  return fmt::format("'{}' is not like bass=6; the effects are: {}", text, NamesIn(kEffects));
}

Sound::Change ChangeOfLevel(const std::string& text) {
  const EffectLevel wanted = *ToEffectLevel(text);
  return {fmt::format("{} {}", NameOf(kEffects, wanted.effect), wanted.level),
          [wanted](AudioEffector& effector) {
            return effector.SetEffectLevel(wanted.effect, wanted.level);
          },
          ""};
}

Sound::Change ChangeOfPreset(const std::string& name) {
  return {fmt::format("preset {}", name),
          [preset = Find(kPresets, name)->value](AudioEffector& effector) {
            return effector.SetEffectPreset(preset);
          },
          name};
}

Sound::Change ResetOfAll() {
  return {"all to default", [](AudioEffector& effector) { return effector.ResetAllToDefault(); },
          NameOf(kPresets, Zelkora::Media::AUDIO_EFFECT_PRESET_NORMAL)};
}

std::string Describe(const std::vector<Sound::Change>& changes) {
  std::string text;
  for (const Sound::Change& change : changes) text += (text.empty() ? "" : ", ") + change.text;
  return text.empty() ? "neutral" : text;
}

/// \return the preset that the changes leave.
std::string PresetAfter(const Options& options) {
  std::string preset = NameOf(kPresets, Zelkora::Media::AUDIO_EFFECT_PRESET_NORMAL);
  for (const Sound::Change& change : options.changes) {
    if (!change.preset.empty()) preset = change.preset;
  }
  return preset;
}

void PrintEffects(const Sound& sound) {
  Print("effect        level  lowest  highest\n");
  for (Sound::Effect effect : sound.Effects()) {
    const Sound::Level level = sound.LevelOf(effect);
    Print(fmt::format("{:<12}  {:>5}  {:>6}  {:>7}\n", NameOf(kEffects, effect), level.now,
                      level.min, level.max));
  }
}

void PrintPresets(const Sound& sound) {
  std::string line = "presets:";
  for (Sound::Preset preset : sound.Presets()) {
    const std::string name = NameOf(kPresets, preset);
    if (line.size() + 1 + name.size() > kLineLength) {
      Print(line + "\n");
      line = "        ";
    }
    line += " " + name;
  }
  Print(line + "\n");
}

/// Without a sound server a player plays all the same.
void NoteSilence() {
  ClearLastResult();
  if (VolumeManager().GetCurrentMediaVolumeLevel() >= 0) return;
  PrintError("note: nobody hears this; \"zelkora doctor\" tells why");
}

/// Plays to the end, or as long as the position changes.
void Play(Sound& sound) {
  StopSignal stop;
  NoteSilence();
  sound.Play();
  Progress progress;
  long before = -1;
  for (int still = 0; still < kLongestStandstill; still += kLookEvery) {
    if (stop.Wait(kLookEvery)) return sound.Pause();
    const long position = sound.Position();
    if (position >= sound.Duration()) return;
    if (position != before) still = 0;
    progress.Show(static_cast<double>(position) / static_cast<double>(sound.Duration()));
    before = position;
  }
  PrintError(fmt::format("note: the player stands still at {} ms", before));
}

/// What the user asked to be written.
struct Outputs {
  explicit Outputs(const Options& options) {
    if (!options.rendering.empty()) rendering.emplace(options.rendering);
    if (!options.plot.empty()) plot.emplace(options.plot);
  }

  bool TakeStandardOutput() const {
    return (rendering && rendering->IsStandardOutput()) || (plot && plot->IsStandardOutput());
  }

  std::optional<OutputFile> rendering;
  std::optional<OutputFile> plot;
};

/// \return what a sound becomes, on a player of its own.
StereoSound Render(const StereoSound& recording, const std::vector<Sound::Change>& changes) {
  const TemporaryFolder folder;
  WriteStereoSound(folder.PathOf("sound.wav"), recording);
  Sound sound;
  sound.Open(folder.PathOf("sound.wav"));
  sound.Apply(changes);
  sound.Render(folder.PathOf("rendered.wav"));
  return ReadStereoSound(folder.PathOf("rendered.wav"));
}

/// Measures what the changes do.
SoundMeasurement Measure(const std::vector<Sound::Change>& changes) {
  const StereoSound noise = MakeNoise(), burst = MakeBurst();
  return {CompareRecordings(noise, Render(noise, changes)),
          MeasureStairs(Render(MakeStairs(), changes)), MeasureDecay(Render(burst, changes)),
          MeasureDecay(burst)};
}

/// Writes what is heard, and draws what the changes do.
void Write(Outputs& outputs, const Sound& sound, const Options& options) {
  const std::string setting = Describe(options.changes);
  std::string written;
  if (outputs.rendering) {
    sound.Render(outputs.rendering->Path());
    outputs.rendering->Complete();
    written += fmt::format("{}: {}\n", options.rendering, setting);
  }
  if (outputs.plot) {
    WriteSoundPlot(*outputs.plot, Measure(options.changes), setting);
    written += fmt::format("{}: {}\n", options.plot, setting);
  }
  if (!outputs.TakeStandardOutput()) Print(written);
}

int ShowOrChangeEffects(const Options& options) {
  Sound sound;
  if (!options.file.empty()) sound.Open(options.file);
  sound.Apply(options.changes);
  Outputs outputs(options);  // before the work, which may take long
  if (!outputs.TakeStandardOutput()) {
    PrintEffects(sound);
    Print(fmt::format("preset: {}\n", PresetAfter(options)));
    PrintPresets(sound);
  }
  Write(outputs, sound, options);
  if (options.play) Play(sound);
  if (!options.changes.empty() && !options.play && !outputs.rendering && !outputs.plot) {
    PrintError(
        "note: the changes are gone with this command; --play, --render and --plot use them");
  }
  return 0;
}

/// The changes in the order in which the user gave them.
std::vector<Sound::Change> ChangesIn(const CLI::App& command, const Options& options) {
  std::vector<Sound::Change> changes;
  auto level = options.levels.begin();
  auto preset = options.presets.begin();
  for (const CLI::Option* option : command.parse_order()) {
    if (option->check_name("--set")) changes.push_back(ChangeOfLevel(*level++));
    if (option->check_name("--preset")) changes.push_back(ChangeOfPreset(*preset++));
    if (option->check_name("--reset")) changes.push_back(ResetOfAll());
  }
  return changes;
}

void AddOptions(CLI::App* command, Options& options) {
  auto* file = command->add_option("FILE", options.file, "A file with sound")->type_name("");
  command->add_option("--set", options.levels, "Set an effect: " + NamesIn(kEffects))
      ->check(CLI::Validator(CheckEffectLevel, NamesIn(kEffects, "= ") + "="))
      ->allow_extra_args(false)
      ->type_name("EFFECT=LEVEL");
  command->add_option("--preset", options.presets, "Select a preset: " + NamesIn(kPresets))
      ->check(OneOf(kPresets, "preset"))
      ->allow_extra_args(false)
      ->type_name("PRESET");
  command->add_flag("--reset", "Put everything back to its default");
  command->add_flag("--play", options.play, "Play the file to its end or to Ctrl-C")->needs(file);
  command
      ->add_option("--render", options.rendering,
                   "Write what is heard, a WAV file; an older one is replaced")
      ->needs(file)
      ->check(EndsIn({".wav"}))
      ->type_name("FILE");
  command
      ->add_option("--plot", options.plot,
                   "Measure what the changes do and draw it, as SVG or PNG by the ending; "
                   "an older file is replaced")
      ->check(EndsIn({".svg", ".png"}))
      ->type_name("FILE");
}

}  // namespace

void AddEffectsCommand(CLI::App& program, Command& chosen) {
  auto options = std::make_shared<Options>();
  auto* command = program.add_subcommand("effects", "Show or change the sound of a player");
  AddOptions(command, *options);
  command->footer(
      "Changes are made in the order given.\n"
      "Example: zelkora effects song.ogg --preset rock --set bass=6 --play");
  command->callback([options, command, &chosen] {
    for (const std::string& output : {options->rendering, options->plot}) {
      RefuseSameFile(output, options->file);
    }
    options->changes = ChangesIn(*command, *options);
    chosen = [options] { return ShowOrChangeEffects(*options); };
  });
}

}  // namespace CommandLine
