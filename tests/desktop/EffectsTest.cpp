// The desktop player's effects, on sound that sox makes and measures: it is rendered with the
// effects that are set, and the file is judged.

#include "PlayerOnMedia.h"

#include <Zelkora/Media/AudioEffector.h>

#include <array>
#include <cmath>
#include <cstdio>
#include <filesystem>
#include <memory>
#include <utility>
#include <valarray>

namespace {

using namespace Zelkora::Media;

std::string RunCommand(const std::string& command) {
  FILE* output = popen((command + " 2>&1").c_str(), "r");
  std::string text;
  for (int c = std::fgetc(output); c != EOF; c = std::fgetc(output)) text += static_cast<char>(c);
  EXPECT_EQ(pclose(output), 0) << command << "\n" << text;
  return text;
}

/// \param effects what sox does with the sound before it measures
/// \return a line of sox's statistics, in dB
double Measure(const std::string& file, const std::string& effects,
               const std::string& line = "RMS lev dB") {
  const std::string statistics = RunCommand("sox " + file + " -n " + effects + " stats");
  const std::size_t place = statistics.find(line);
  if (place != std::string::npos) return std::stod(statistics.substr(place + line.size()));
  ADD_FAILURE() << "no \"" << line << "\" in:\n" << statistics;
  return std::nan("");
}

/// \return the file's loudness as broadcasters measure it (BS.1770), in LUFS
double MeasureLoudness(const std::string& file) {
  const std::string summary = RunCommand("ffmpeg -hide_banner -nostats -i " + file +
                                         " -af ebur128=framelog=verbose -f null -");
  return std::stod(summary.substr(summary.rfind(" I:") + 3));
}

/// The level of the n-th second's middle.
double MeasureSecond(const std::string& file, std::size_t number) {
  return Measure(file, "trim " + std::to_string(number) + ".3 0.6");
}

template <typename T>
int Count(Tizen::Base::Collection::IListT<T>* list) {
  const std::unique_ptr<Tizen::Base::Collection::IListT<T>> owner(list);
  return list == nullptr ? -1 : list->GetCount();
}

constexpr char kStereo[] = "-r 44100 -c 2 -b 16";

struct Level {
  AudioEffectType type;
  int level;
};
constexpr std::array<Level, 5> kHighest{{{AUDIO_EFFECT_BASS, 12},
                                         {AUDIO_EFFECT_TREBLE, 12},
                                         {AUDIO_EFFECT_REVERB, 100},
                                         {AUDIO_EFFECT_STEREO_WIDTH, 100},
                                         {AUDIO_EFFECT_DYNAMICS, 100}}};

/// A player and its effector, and a directory of its own.
class EffectsTest : public PlayerOnMedia {
 protected:
  EffectsTest() {
    std::filesystem::create_directories(directory_);
    EXPECT_EQ(effector.Construct(player), E_SUCCESS);
  }

  ~EffectsTest() override { std::filesystem::remove_all(directory_); }

  std::string Path(const std::string& name) const { return (directory_ / name).string(); }

  /// \param sounds sox's effects that make one sound after the other
  std::string Make(const std::string& format, const std::vector<std::string>& sounds) {
    std::string files;
    for (const std::string& sound : sounds) {
      files += Path(std::to_string(++count_) + ".wav ");
      RunCommand("sox -R -n " + format + " " + Path(std::to_string(count_) + ".wav ") + sound);
    }
    const std::string file = Path("source" + std::to_string(count_) + ".wav");
    RunCommand("sox " + files + file + " && rm " + files);
    return file;
  }

  /// A second of each tone, at -29 dB.
  std::string MakeTones(const std::string& format, const std::vector<int>& frequencies) {
    std::vector<std::string> sounds;
    for (const int frequency : frequencies) {
      sounds.push_back("synth 1 sine " + std::to_string(frequency) + " gain -26");
    }
    return Make(format, sounds);
  }

  /// \return the file's sound with one effect and a preset
  std::string Render(const std::string& file, const Level& level,
                     int preset = AUDIO_EFFECT_PRESET_NORMAL) {
    EXPECT_EQ(effector.ResetAllToDefault(), E_SUCCESS);
    Set(level, preset);
    return Render(file);
  }

  std::string Render(const std::string& file) {
    const std::string rendered = Path("rendered" + std::to_string(++count_) + ".wav");
    EXPECT_EQ(player.Close(), E_SUCCESS);  // settings are the player's, not the file's
    EXPECT_EQ(player.OpenFile(file.c_str()), E_SUCCESS);
    EXPECT_EQ(player.RenderAudio(rendered.c_str()), E_SUCCESS);
    return rendered;
  }

  void Set(const Level& level, int preset = AUDIO_EFFECT_PRESET_NORMAL) {
    int kept = -1;
    EXPECT_EQ(effector.SetEffectLevel(level.type, level.level), E_SUCCESS);
    EXPECT_EQ(effector.GetEffectLevel(level.type, kept), E_SUCCESS);
    EXPECT_EQ(kept, level.level);
    EXPECT_EQ(effector.SetEffectPreset(static_cast<AudioEffectPreset>(preset)), E_SUCCESS);
  }

  AudioEffector effector;

 private:
  const std::filesystem::path directory_ =
      std::filesystem::temp_directory_path() / ("zelkora-effects-" + std::to_string(getpid()));
  int count_ = 0;
};

/// In a process of its own. \return whether everything is as it should be.
bool WorksWithout(const char* element) {
  gst_init(nullptr, nullptr);
  GstRegistry* registry = gst_registry_get();
  gst_registry_remove_feature(registry, gst_registry_lookup_feature(registry, element));
  const bool hasReverb = std::string(element) != "freeverb";
  Tizen::Media::Player player;
  AudioEffector effector;
  return player.Construct() == E_SUCCESS && effector.Construct(player) == E_SUCCESS &&
         Count(effector.GetSupportedEffectListN()) == (hasReverb ? 5 : 4) &&
         effector.SetEffectLevel(AUDIO_EFFECT_REVERB, 1) ==
             (hasReverb ? E_SUCCESS : E_INVALID_OPERATION) &&
         effector.SetEffectLevel(AUDIO_EFFECT_BASS, 1) == E_SUCCESS &&
         effector.SetEffectPreset(AUDIO_EFFECT_PRESET_CONCERT_HALL) == E_SUCCESS &&
         player.OpenFile(Media("sound.ogg").c_str()) == E_SUCCESS && player.Play() == E_SUCCESS;
}

TEST(SystemWithoutElement, GivesTheOtherEffectsAndSaysWhatIsMissing) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  for (const std::string element :
       {"freeverb", "ladspa-fast-lookahead-limiter-1913-so-fastlookaheadlimiter"}) {
    EXPECT_EXIT(std::_Exit(WorksWithout(element.c_str()) ? 0 : 1), testing::ExitedWithCode(0),
                "\"" + element + "\" is missing");
  }
}

TEST_F(EffectsTest, EveryEffectAndPresetIsThereWithItsRange) {
  EXPECT_EQ(Count(effector.GetSupportedEffectListN()), 5);
  EXPECT_EQ(Count(effector.GetSupportedEffectPresetListN()), 20);
  for (const auto& [type, highest] : kHighest) {
    SCOPED_TRACE(type);
    int min = 1, max = 0;
    EXPECT_EQ(effector.GetEffectLevelRange(type, min, max), E_SUCCESS);
    EXPECT_EQ(max, highest);
    EXPECT_EQ(min, max == 12 ? -12 : 0);
  }
}

TEST_F(EffectsTest, DefaultSettingsKeepEverySampleAndResetBringsThemBack) {
  constexpr const char* kSources[][2] = {
      {kStereo, "synth 3 pinknoise synth 3 square 60 gain -n 0"},
      {"-r 8000 -c 1 -b 16", "synth 3 pinknoise gain -n -1"},
      {"-r 96000 -c 2 -b 16", "synth 3 sine 20-20000 gain -n 0"}};
  for (const auto& [format, sound] : kSources) {
    SCOPED_TRACE(format);
    const std::string source = Make(format, {sound});
    const std::string samples = RunCommand("sox " + source + " -c 2 -b 16 -t wav - | sha1sum");
    const auto render = [&] { return RunCommand("sox " + Render(source) + " -t wav - | sha1sum"); };
    EXPECT_EQ(render(), samples);
    for (const Level& level : kHighest) Set(level, AUDIO_EFFECT_PRESET_CONCERT_HALL);
    EXPECT_NE(render(), samples);
    EXPECT_EQ(effector.ResetAllToDefault(), E_SUCCESS);
    EXPECT_EQ(render(), samples);
  }
}

TEST_F(EffectsTest, BassAndTrebleMoveTheirEndOfTheRange) {
  const std::string full = MakeTones(kStereo, {60, 1000, 10000});
  const std::string low = MakeTones("-r 8000 -c 1 -b 16", {500, 1000, 2000});
  const std::tuple<std::string, Level, AudioEffectPreset, std::array<double, 3>> cases[] = {
      {full, {AUDIO_EFFECT_BASS, 12}, AUDIO_EFFECT_PRESET_NORMAL, {-17, -29, -29}},
      {full, {AUDIO_EFFECT_BASS, -12}, AUDIO_EFFECT_PRESET_NORMAL, {-41, -29, -29}},
      {full, {AUDIO_EFFECT_TREBLE, 12}, AUDIO_EFFECT_PRESET_NORMAL, {-29, -29, -17}},
      {full, {AUDIO_EFFECT_TREBLE, -12}, AUDIO_EFFECT_PRESET_NORMAL, {-29, -29, -41}},
      {full, {AUDIO_EFFECT_BASS, 12}, AUDIO_EFFECT_PRESET_TREBLE_BOOST, {-23, -32, -26}},
      // What of the preset is above the low rate's range stays away.
      {low, {AUDIO_EFFECT_TREBLE, 0}, AUDIO_EFFECT_PRESET_TREBLE_BOOST, {-34, -33, -31}},
      {low, {AUDIO_EFFECT_TREBLE, 12}, AUDIO_EFFECT_PRESET_TREBLE_BOOST, {-32, -28, -23}}};
  for (const auto& [source, effect, preset, tones] : cases) {
    SCOPED_TRACE(testing::Message() << effect.type << " at " << effect.level << ", " << preset);
    const std::string rendered = Render(source, effect, preset);
    for (std::size_t tone = 0; tone < 3; ++tone) {
      EXPECT_NEAR(MeasureSecond(rendered, tone), tones[tone], 1) << "tone " << tone;
    }
  }
}

TEST_F(EffectsTest, ReverbWidthAndDynamicsChangeTheSound) {
  const std::string reverb =
      Render(Make(kStereo, {"synth 1 sine 440 gain -12 pad 0 2"}), {AUDIO_EFFECT_REVERB, 100});
  EXPECT_NEAR(Measure(reverb, "trim 0.3 0.5"), -15, 3);
  EXPECT_GT(Measure(reverb, "trim 1.1 0.2"), -35) << "the tone's end is the reverb's";
  EXPECT_LT(Measure(reverb, "trim 2.5 0.2"), -50) << "it doesn't die away";

  const std::string wide =
      Render(Make(kStereo, {"synth 3 sine 300 sine 800 remix 1v0.1,2v0.05 1v0.1,2v-0.05"}),
             {AUDIO_EFFECT_STEREO_WIDTH, 100});
  EXPECT_NEAR(Measure(wide, "remix 1v0.5,2v0.5"), -23, 0.1);
  EXPECT_NEAR(Measure(wide, "remix 1v0.5,2v-0.5"), -23, 0.1) << "6 dB above the source's";

  const std::string even =
      Render(Make(kStereo, {"synth 3 sine 440 gain -6", "synth 3 sine 440 gain -36"}),
             {AUDIO_EFFECT_DYNAMICS, 100});
  EXPECT_LT(MeasureSecond(even, 1), -9 - 4);
  EXPECT_GT(MeasureSecond(even, 4), -39 + 8);
}

TEST_F(EffectsTest, PresetsDifferAreEquallyLoudOneIsFlatAndNothingClips) {
  const std::string tones =
      MakeTones(kStereo, {31, 63, 125, 250, 500, 1000, 2000, 4000, 8000, 16000});
  const std::string loud =
      Make(kStereo, {"synth 4 pinknoise pinknoise synth 4 sine mix 20-20000 gain -n 0"});
  ASSERT_GT(Measure(loud, "", "Pk lev dB"), -0.1);
  const std::string noise = Make(kStereo, {"synth 8 pinknoise gain -12.8"});
  const double loudness = MeasureLoudness(noise);
  ASSERT_NEAR(loudness, -23, 0.5);
  const std::valarray<double> even(-29, 10);
  std::vector<std::valarray<double>> responses;
  for (int preset = 0; preset < 20; ++preset) {
    SCOPED_TRACE(preset);
    const bool isFlat = preset == AUDIO_EFFECT_PRESET_NORMAL;
    const std::string rendered = Render(tones, {AUDIO_EFFECT_BASS, 0}, preset);
    EXPECT_LT(Measure(Render(loud), "", "Pk lev dB"), isFlat ? 0.01 : 0);
    EXPECT_NEAR(MeasureLoudness(Render(noise)), loudness, isFlat ? 0.01 : 0.5);
    std::valarray<double> response(10);
    for (std::size_t tone = 0; tone < 10; ++tone) response[tone] = MeasureSecond(rendered, tone);
    EXPECT_EQ(abs(response - even).max() < 0.1, isFlat);
    for (const auto& other : responses) {
      EXPECT_GT(abs(response - other).max(), 1) << "as preset " << &other - responses.data();
    }
    responses.push_back(response);
    for (const Level& level : kHighest) Set(level, preset);
    EXPECT_LT(Measure(Render(loud), "", "Pk lev dB"), 0);
  }
}

TEST_F(EffectsTest, BassRaisedAtFullScaleStaysATone) {
  for (const auto& [frequency, percent] : {std::pair("30", 2), {"60", 1}, {"120", 1}}) {
    SCOPED_TRACE(frequency);
    const std::string rendered =
        Render(Make(kStereo, {"synth 4 sine " + std::string(frequency) + " gain -n 0"}),
               {AUDIO_EFFECT_BASS, 12});
    const std::string notch = "bandreject " + std::string(frequency) + " 2q ";
    const double whole = Measure(rendered, "trim 1 2");
    EXPECT_NEAR(whole, -3.1, 0.2);
    EXPECT_LT(Measure(rendered, notch + notch + "trim 1 2"),
              whole + 20 * std::log10(percent / 100.0));
  }
}

TEST_F(EffectsTest, RenderThatFailsLeavesNoFile) {
  const std::string sound = Make(kStereo, {"synth 1 sine 440"}), film = Path("silent.mp4");
  RunCommand("ffmpeg -v error -f lavfi -i testsrc2=size=160x90:rate=25 -t 1 " + film);
  std::filesystem::create_directory(Path("folder"));
  const std::string target = Path("target.wav");
  EXPECT_EQ(player.RenderAudio(target.c_str()), E_INVALID_STATE);
  for (const std::string& silent : {film, Make(kStereo, {"trim 0 0"})}) {
    ASSERT_EQ(player.OpenFile(silent.c_str()), E_SUCCESS);
    EXPECT_EQ(player.RenderAudio(target.c_str()), E_INVALID_OPERATION);
  }
  ASSERT_EQ(player.OpenFile(sound.c_str()), E_SUCCESS);
  EXPECT_EQ(player.RenderAudio(nullptr), E_INVALID_ARG);
  EXPECT_EQ(player.RenderAudio(""), E_INVALID_ARG);
  EXPECT_EQ(player.RenderAudio(Path("no/such/place.wav").c_str()), E_SYSTEM);
  EXPECT_EQ(player.RenderAudio(Path("folder").c_str()), E_SYSTEM);
  std::filesystem::remove(sound);
  EXPECT_EQ(player.RenderAudio(target.c_str()), E_SYSTEM);
  EXPECT_EQ(RunCommand("ls " + Path("")), "folder\nsilent.mp4\nsource2.wav\n");
}

/// What is heard meanwhile is measured in EffectClicksTest.
TEST_F(EffectsTest, ThousandChangesWhilePlayingGoWithoutAnError) {
  ASSERT_EQ(player.OpenFile(Make(kStereo, {"synth 60 sine 440 gain -12"}).c_str()), E_SUCCESS);
  ASSERT_EQ(player.Play(), E_SUCCESS);
  testing::internal::CaptureStderr();
  for (int i = 0; i < 1000; ++i) {
    const auto& [type, highest] = kHighest[static_cast<std::size_t>(i) % kHighest.size()];
    Set({type, i / 5 % 2 == 0 ? highest : 0}, i % 20);
    const long before = player.GetPosition();
    for (long now = before; now <= before; now = player.GetPosition()) ASSERT_GE(now, 0);
  }
  EXPECT_THAT(testing::internal::GetCapturedStderr(), testing::Not(testing::HasSubstr("[E_")));
  EXPECT_GE(player.GetPosition(), 1000);
}

}  // namespace
