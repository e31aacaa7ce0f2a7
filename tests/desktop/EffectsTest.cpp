// The desktop player's effects, on sound that sox makes and measures: it is rendered with the effects
// that are set, and the file is judged.

#include <Host/Log.h>
#include <Tizen/Base/Result.h>
#include <Tizen/Media/Player.h>
#include <Zelkora/Media/AudioEffector.h>
#include <gst/gst.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <array>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <mutex>
#include <sstream>
#include <string>
#include <vector>

namespace {

using namespace Zelkora::Media;
using Tizen::Media::Player;

/// Lets GStreamer look for leaks when it is told to.
class GstreamerEnd : public testing::Environment {
  void TearDown() override {
    if (gst_is_initialized()) gst_deinit();
  }
};
const auto* const kGstreamerEnd = testing::AddGlobalTestEnvironment(new GstreamerEnd);

std::string RunCommand(const std::string& command) {
  FILE* output = popen((command + " 2>&1").c_str(), "r");
  std::string text;
  for (int c = std::fgetc(output); c != EOF; c = std::fgetc(output)) text += static_cast<char>(c);
  EXPECT_EQ(pclose(output), 0) << command << "\n" << text;
  return text;
}

/// \param effects what sox does with the sound before it measures
/// \return a line of sox's statistics: "RMS lev dB", "Pk lev dB"
double Measure(const std::string& file, const std::string& line, const std::string& effects = "") {
  const std::string statistics = RunCommand("sox " + file + " -n " + effects + " stats");
  const std::size_t place = statistics.find(line);
  if (place == std::string::npos) {
    ADD_FAILURE() << "no \"" << line << "\" in:\n" << statistics;
    return std::nan("");
  }
  return std::strtod(statistics.c_str() + place + line.size(), nullptr);
}

double Loudness(const std::string& file, const std::string& effects = "") {
  return Measure(file, "RMS lev dB", effects);
}

/// The middle of the n-th of several sounds of \p length seconds each.
std::string Part(int number, double length) {
  std::ostringstream effect;
  effect << "trim " << (number + 0.3) * length << " " << length * 0.6;
  return effect.str();
}

std::string ReadFile(const std::string& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), {}};
}

/// A player and its effector without a sound server, and a directory of its own.
class EffectsTest : public testing::Test {
 protected:
  EffectsTest() {
    setenv("PULSE_SERVER", "unix:/nonexistent/pulse", 1);
    std::filesystem::create_directories(directory_);
    Host::SetLogSink(
        [](const Host::LogRecord& record, void* test) {
          auto* self = static_cast<EffectsTest*>(test);
          std::lock_guard lock(self->logMutex_);
          if (record.hasResult) self->log_ += std::string(record.message) + "\n";
        },
        this);
    EXPECT_EQ(player.Construct(), E_SUCCESS);
    EXPECT_EQ(effector.Construct(player), E_SUCCESS);
  }

  ~EffectsTest() override {
    Host::SetLogSink(nullptr, nullptr);
    std::filesystem::remove_all(directory_);
  }

  std::string Path(const std::string& name) const { return (directory_ / name).string(); }

  /// \param format sox's options \param sound sox's effects \return the path
  std::string Make(const std::string& format, const std::string& sound) const {
    const std::string file = Path("source" + std::to_string(++count_) + ".wav");
    RunCommand("sox -R -n " + format + " " + file + " " + sound);
    return file;
  }

  std::string Render(const std::string& file) const {
    std::string rendered = Path("rendered" + std::to_string(++count_) + ".wav");
    EXPECT_EQ(player.OpenFile(file.c_str()), E_SUCCESS);
    EXPECT_EQ(player.RenderAudio(rendered.c_str()), E_SUCCESS);
    return rendered;
  }

  /// A second of each tone.
  std::string MakeTones(const std::string& format, const std::vector<double>& frequencies) const {
    std::string files;
    for (const double frequency : frequencies) {
      files += Make(format, "synth 1 sine " + std::to_string(frequency) + " gain -26") + " ";
    }
    const std::string tones = Path("tones.wav");
    RunCommand("sox " + files + tones);
    return tones;
  }

  /// Settings in which every effect does as much as it can.
  void SetEverything(AudioEffectPreset preset) {
    for (const Extreme& extreme : kHighest) {
      EXPECT_EQ(effector.SetEffectLevel(extreme.type, extreme.level), E_SUCCESS);
    }
    EXPECT_EQ(effector.SetEffectPreset(preset), E_SUCCESS);
  }

  struct Extreme {
    AudioEffectType type;
    int level;
  };
  static constexpr std::array<Extreme, 5> kHighest{{{AUDIO_EFFECT_BASS, 12},
                                                    {AUDIO_EFFECT_TREBLE, 12},
                                                    {AUDIO_EFFECT_REVERB, 100},
                                                    {AUDIO_EFFECT_STEREO_WIDTH, 100},
                                                    {AUDIO_EFFECT_DYNAMICS, 100}}};
  static constexpr const char* kStereo = "-r 44100 -c 2 -b 16";

  std::string GetLog() {
    std::lock_guard lock(logMutex_);
    return log_;
  }

  mutable Player player;
  AudioEffector effector;

 private:
  const std::filesystem::path directory_ =
      std::filesystem::temp_directory_path() / ("zelkora-effects-" + std::to_string(getpid()));
  mutable int count_ = 0;
  std::mutex logMutex_;
  std::string log_;
};

TEST_F(EffectsTest, AllEffectsAndPresetsAreSupported) {
  const std::unique_ptr<Tizen::Base::Collection::IListT<AudioEffectType>> effects(
      effector.GetSupportedEffectListN());
  const std::unique_ptr<Tizen::Base::Collection::IListT<AudioEffectPreset>> presets(
      effector.GetSupportedEffectPresetListN());
  ASSERT_NE(effects, nullptr);
  ASSERT_NE(presets, nullptr);
  EXPECT_EQ(effects->GetCount(), 5);
  EXPECT_EQ(presets->GetCount(), 20);
}

/// In a process of its own. \return whether everything is as it should be.
bool WorksWithoutReverb() {
  gst_init(nullptr, nullptr);
  GstRegistry* registry = gst_registry_get();
  gst_registry_remove_feature(registry, gst_registry_lookup_feature(registry, "freeverb"));
  Player player;
  AudioEffector effector;
  if (player.Construct() != E_SUCCESS || effector.Construct(player) != E_SUCCESS) return false;
  const std::unique_ptr<Tizen::Base::Collection::IListT<AudioEffectType>> effects(
      effector.GetSupportedEffectListN());
  return effects->GetCount() == 4 &&
         effector.SetEffectLevel(AUDIO_EFFECT_REVERB, 1) == E_INVALID_OPERATION &&
         effector.SetEffectLevel(AUDIO_EFFECT_BASS, 1) == E_SUCCESS &&
         effector.SetEffectPreset(AUDIO_EFFECT_PRESET_CONCERT_HALL) == E_SUCCESS;
}

TEST(SystemWithoutReverb, SupportsTheOtherEffectsAndSaysWhatIsMissing) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  EXPECT_EXIT(std::_Exit(WorksWithoutReverb() ? 0 : 1), testing::ExitedWithCode(0),
              "\"freeverb\" is missing");
}

TEST_F(EffectsTest, DefaultSettingsKeepEverySample) {
  constexpr const char* kSources[][2] = {
      {"-r 44100 -c 2 -b 16", "synth 3 pinknoise synth 3 square 60 gain -n 0"},
      {"-r 8000 -c 1 -b 16", "synth 3 pinknoise gain -n -1"},
      {"-r 96000 -c 2 -b 16", "synth 3 sine 20-20000 gain -n 0"}};
  for (const auto& [format, sound] : kSources) {
    SCOPED_TRACE(format);
    const std::string source = Make(format, sound);
    const std::string rendered = Render(source);
    EXPECT_EQ(RunCommand("sox " + source + " -c 2 -t raw - | sha1sum"),
              RunCommand("sox " + rendered + " -t raw - | sha1sum"));
    EXPECT_EQ(RunCommand("soxi -r " + source), RunCommand("soxi -r " + rendered));
    EXPECT_EQ(RunCommand("soxi -c " + rendered), "2\n");
    EXPECT_EQ(RunCommand("soxi -b " + rendered), "16\n");
  }
}

TEST_F(EffectsTest, BassAndTrebleMoveTheirEndOfTheRange) {
  constexpr struct {
    AudioEffectType type;
    int level;
    std::array<double, 3> gains;  // at 60 Hz, 1 kHz and 10 kHz
  } kCases[] = {{AUDIO_EFFECT_BASS, 12, {12, 0, 0}},
                {AUDIO_EFFECT_BASS, -12, {-12, 0, 0}},
                {AUDIO_EFFECT_TREBLE, 12, {0, 0, 12}},
                {AUDIO_EFFECT_TREBLE, -12, {0, 0, -12}}};
  const std::string source = MakeTones(kStereo, {60, 1000, 10000});
  for (const auto& [type, level, gains] : kCases) {
    SCOPED_TRACE(testing::Message() << "effect " << type << " at " << level);
    EXPECT_EQ(effector.ResetAllToDefault(), E_SUCCESS);
    EXPECT_EQ(effector.SetEffectLevel(type, level), E_SUCCESS);
    const std::string rendered = Render(source);
    for (int tone = 0; tone < 3; ++tone) {
      const double gain = Loudness(rendered, Part(tone, 1)) - Loudness(source, Part(tone, 1));
      EXPECT_NEAR(gain, gains[static_cast<std::size_t>(tone)], 1) << "tone " << tone;
    }
  }
}

TEST_F(EffectsTest, ReverbGoesOnAfterTheToneEnds) {
  const std::string source = Make(kStereo, "synth 1 sine 440 gain -12 pad 0 2");
  effector.SetEffectLevel(AUDIO_EFFECT_REVERB, 100);
  const std::string rendered = Render(source);
  EXPECT_LT(Loudness(source, "trim 1.1 0.2"), -90);
  EXPECT_GT(Loudness(rendered, "trim 1.1 0.2"), -35);
  EXPECT_LT(Loudness(rendered, "trim 2.5 0.2"), -50) << "it doesn't die away";
  EXPECT_NEAR(Loudness(rendered, "trim 0.3 0.5"), Loudness(source, "trim 0.3 0.5"), 3);
}

TEST_F(EffectsTest, StereoWidthDoublesTheDifferenceOfTheSides) {
  const std::string source =
      Make(kStereo, "synth 3 sine 300 sine 800 remix 1v0.1,2v0.05 1v0.1,2v-0.05");
  effector.SetEffectLevel(AUDIO_EFFECT_STEREO_WIDTH, 100);
  const std::string rendered = Render(source);
  const auto gain = [&](const char* mix) {
    return Loudness(rendered, mix) - Loudness(source, mix);
  };
  EXPECT_NEAR(gain("remix 1v0.5,2v0.5"), 0, 0.1);
  EXPECT_NEAR(gain("remix 1v0.5,2v-0.5"), 6, 0.1);
}

TEST_F(EffectsTest, DynamicsBringLoudAndQuietTogether) {
  const std::string loud = Make(kStereo, "synth 3 sine 440 gain -6");
  const std::string quiet = Make(kStereo, "synth 3 sine 440 gain -36");
  const std::string source = Path("both.wav");
  RunCommand("sox " + loud + " " + quiet + " " + source);
  effector.SetEffectLevel(AUDIO_EFFECT_DYNAMICS, 100);
  const std::string rendered = Render(source);
  const auto gain = [&](int part) {
    return Loudness(rendered, Part(part, 3)) - Loudness(source, Part(part, 3));
  };
  EXPECT_LT(gain(0), -4);
  EXPECT_GT(gain(1), 8);
}

TEST_F(EffectsTest, PresetsHaveTwentyDifferentResponsesAndOneIsFlat) {
  constexpr double kLeastDifference = 1;  // dB, in one band at least
  const std::vector<double> bands{31.25, 62.5, 125, 250, 500, 1000, 2000, 4000, 8000, 16000};
  const std::string source = MakeTones(kStereo, bands);
  std::vector<std::vector<double>> responses;
  for (int preset = 0; preset < 20; ++preset) {
    effector.SetEffectPreset(static_cast<AudioEffectPreset>(preset));
    const std::string rendered = Render(source);
    std::vector<double> response;
    double highest = 0;
    for (int band = 0; band < 10; ++band) {
      response.push_back(Loudness(rendered, Part(band, 1)) - Loudness(source, Part(band, 1)));
      highest = std::max(highest, std::fabs(response.back()));
    }
    EXPECT_EQ(highest < 0.1, preset == AUDIO_EFFECT_PRESET_NORMAL) << "preset " << preset;
    for (std::size_t other = 0; other < responses.size(); ++other) {
      double difference = 0;
      for (std::size_t band = 0; band < 10; ++band) {
        difference = std::max(difference, std::fabs(response[band] - responses[other][band]));
      }
      EXPECT_GT(difference, kLeastDifference) << "presets " << other << " and " << preset;
    }
    responses.push_back(response);
  }
}

TEST_F(EffectsTest, NothingClipsSoundOfFullScale) {
  const std::string source = Make(kStereo, "synth 4 pinknoise synth 4 sine mix 20-20000 gain -n 0");
  ASSERT_EQ(Measure(source, "Pk lev dB"), 0);
  for (int preset = 0; preset < 20; ++preset) {
    SCOPED_TRACE(preset);
    EXPECT_EQ(effector.ResetAllToDefault(), E_SUCCESS);
    effector.SetEffectPreset(static_cast<AudioEffectPreset>(preset));
    const bool isFlat = preset == AUDIO_EFFECT_PRESET_NORMAL;  // leaves the peak where it is
    EXPECT_LT(Measure(Render(source), "Pk lev dB"), isFlat ? 0.01 : 0);
    SetEverything(static_cast<AudioEffectPreset>(preset));
    EXPECT_LT(Measure(Render(source), "Pk lev dB"), 0);
  }
}

TEST_F(EffectsTest, WhatIsAboveALowRatesRangeStaysAway) {
  const std::string source = MakeTones("-r 8000 -c 1 -b 16", {500, 1000, 2000});
  effector.SetEffectPreset(AUDIO_EFFECT_PRESET_TREBLE_BOOST);
  const std::string rendered = Render(source);
  const auto gain = [&](int tone) {
    return Loudness(rendered, Part(tone, 1)) - Loudness(source, Part(tone, 1));
  };
  EXPECT_GT(gain(2), gain(0) + 2);
  EXPECT_LT(gain(2), 0);
  effector.SetEffectLevel(AUDIO_EFFECT_TREBLE, 12);
  const double before = gain(0);
  const std::string brighter = Render(source);
  EXPECT_NEAR(Loudness(brighter, Part(0, 1)) - Loudness(source, Part(0, 1)), before, 3);
  EXPECT_GT(Loudness(brighter, Part(2, 1)) - Loudness(source, Part(2, 1)), gain(2) + 6);
}

TEST_F(EffectsTest, ResetBringsTheSoundBack) {
  const std::string source = Make(kStereo, "synth 2 pinknoise synth 2 sine mix 440 gain -n -1");
  const std::string before = Render(source);
  SetEverything(AUDIO_EFFECT_PRESET_CONCERT_HALL);
  EXPECT_NE(ReadFile(Render(source)), ReadFile(before));
  EXPECT_EQ(effector.ResetAllToDefault(), E_SUCCESS);
  EXPECT_EQ(ReadFile(Render(source)), ReadFile(before));
}

TEST_F(EffectsTest, LevelsAndPresetLiveInThePlayerAndActTogether) {
  const std::string tone = Make(kStereo, "synth 1 sine 60 gain -26");
  EXPECT_EQ(effector.SetEffectLevel(AUDIO_EFFECT_BASS, 6), E_SUCCESS);
  EXPECT_EQ(effector.SetEffectPreset(AUDIO_EFFECT_PRESET_TREBLE_BOOST), E_SUCCESS);
  const double both = Loudness(Render(tone));
  EXPECT_EQ(player.Close(), E_SUCCESS);
  int level = 0;
  EXPECT_EQ(effector.GetEffectLevel(AUDIO_EFFECT_BASS, level), E_SUCCESS);
  EXPECT_EQ(level, 6);
  EXPECT_NEAR(Loudness(Render(Make(kStereo, "synth 1 sine 60 gain -26"))), both, 0.1);
  EXPECT_EQ(effector.SetEffectLevel(AUDIO_EFFECT_BASS, 0), E_SUCCESS);
  EXPECT_NEAR(Loudness(Render(tone)), both - 6, 0.5);
}

TEST_F(EffectsTest, LevelOutsideItsRangeIsRefusedAndChangesNothing) {
  for (const Extreme& extreme : kHighest) {
    SCOPED_TRACE(extreme.type);
    int min = 1;
    int max = 0;
    EXPECT_EQ(effector.GetEffectLevelRange(extreme.type, min, max), E_SUCCESS);
    EXPECT_EQ(max, extreme.level);
    EXPECT_EQ(min, max == 12 ? -12 : 0);
    EXPECT_EQ(effector.SetEffectLevel(extreme.type, max), E_SUCCESS);
    EXPECT_EQ(effector.SetEffectLevel(extreme.type, max + 1), E_INVALID_ARG);
    EXPECT_EQ(effector.SetEffectLevel(extreme.type, min - 1), E_INVALID_ARG);
    int level = 0;
    EXPECT_EQ(effector.GetEffectLevel(extreme.type, level), E_SUCCESS);
    EXPECT_EQ(level, max);
  }
}

TEST_F(EffectsTest, RenderThatFailsLeavesNoFile) {
  const std::string sound = Make(kStereo, "synth 1 sine 440");
  const std::string film = Path("silent.mp4");
  RunCommand("ffmpeg -v error -f lavfi -i testsrc2=size=160x90:rate=25 -t 1 " + film);
  const std::string target = Path("target.wav");
  EXPECT_EQ(player.RenderAudio(target.c_str()), E_INVALID_STATE);

  ASSERT_EQ(player.OpenFile(film.c_str()), E_SUCCESS);
  EXPECT_EQ(player.RenderAudio(target.c_str()), E_INVALID_OPERATION);

  ASSERT_EQ(player.OpenFile(sound.c_str()), E_SUCCESS);
  EXPECT_EQ(player.RenderAudio(nullptr), E_INVALID_ARG);
  EXPECT_EQ(player.RenderAudio(""), E_INVALID_ARG);
  EXPECT_EQ(player.RenderAudio(Path("no/such/place.wav").c_str()), E_SYSTEM);
  std::filesystem::create_directory(Path("folder"));
  EXPECT_EQ(player.RenderAudio(Path("folder").c_str()), E_SYSTEM);
  std::filesystem::remove(sound);
  EXPECT_EQ(player.RenderAudio(target.c_str()), E_SYSTEM);
  EXPECT_EQ(RunCommand("ls " + Path("")), "folder\nsilent.mp4\n");
}

/// What is heard meanwhile is measured in EffectClicksTest.
TEST_F(EffectsTest, ThousandChangesWhilePlayingGoWithoutAnError) {
  const std::string source = Make(kStereo, "synth 60 sine 440 gain -12");
  ASSERT_EQ(player.OpenFile(source.c_str()), E_SUCCESS);
  ASSERT_EQ(player.Play(), E_SUCCESS);
  for (int i = 0; i < 1000; ++i) {
    const Extreme& extreme = kHighest[static_cast<std::size_t>(i) % kHighest.size()];
    ASSERT_EQ(effector.SetEffectLevel(extreme.type, i / 5 % 2 == 0 ? extreme.level : 0), E_SUCCESS);
    ASSERT_EQ(effector.SetEffectPreset(static_cast<AudioEffectPreset>(i % 20)), E_SUCCESS);
    const long position = player.GetPosition();
    while (player.GetPosition() <= position && GetLog().empty()) {
    }
  }
  EXPECT_EQ(GetLog(), "");
  EXPECT_GE(player.GetPosition(), 1000);
}

}  // namespace
