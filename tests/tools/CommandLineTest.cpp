// Runs the command-line program and the device script the way a user does.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/wait.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <tuple>

namespace {

namespace fs = std::filesystem;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;

const std::string kSimulated = PROGRAM " --device simulated ";

std::string Read(const fs::path& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), {}};
}

/// Each test has an empty folder of its own to run in.
class CommandLine : public testing::Test {
 protected:
  struct Outcome {
    int code;
    std::string output;
    std::string errors;
  };

  CommandLine() {
    setenv("LSAN_OPTIONS", "print_suppressions=0:suppressions=" LEAKS_OF_OTHERS, 0);
    setenv("ASAN_OPTIONS", "fast_unwind_on_malloc=0", 0);  // those libraries have no frame pointers
    setenv("TSAN_OPTIONS", "ignore_noninstrumented_modules=1:suppressions=" RACES_OF_OTHERS, 0);
    std::string pattern = fs::temp_directory_path() / "zelkora-XXXXXX";
    base_ = mkdtemp(pattern.data());
    fs::create_directory(folder_ = base_ / "folder");
  }
  ~CommandLine() override { fs::remove_all(base_); }

  Outcome Run(const std::string& command) {
    const std::string redirected =
        "cd " + folder_.string() + " && (" + command + ") >../output 2>../errors";
    const int status = std::system(redirected.c_str());
    return {WIFEXITED(status) ? WEXITSTATUS(status) : -1, Read(base_ / "output"),
            Read(base_ / "errors")};
  }

  /// The width and height in a PNG file's header, which begins at byte 16.
  static std::pair<unsigned, unsigned> PictureSize(const std::string& png) {
    const auto number = [&](std::size_t at) {
      unsigned value = 0;
      for (std::size_t i = at; i < at + 4; ++i)
        value = value << 8 | static_cast<unsigned char>(png.at(i));
      return value;
    };
    EXPECT_THAT(png, StartsWith("\x89PNG\r\n"));
    return {number(16), number(20)};
  }

  fs::path base_;
  fs::path folder_;
};

class WrongUsage : public CommandLine {};
class Seek : public CommandLine {};
class Filmstrip : public CommandLine {};
class Managers : public CommandLine {};
class StopSignal : public CommandLine {};
class Shell : public CommandLine {};
class Effects : public CommandLine {};
class Devices : public CommandLine {};
class DeviceScript : public CommandLine {};

TEST_F(CommandLine, HelpAndVersionArePrintedWithSuccess) {
  for (const auto& [options, text] : {std::pair{"--help", "filmstrip"},
                                      {"seek --help", "MS"},
                                      {"filmstrip --help", "strip.png"},
                                      {"--version", "zelkora "}}) {
    SCOPED_TRACE(options);
    const Outcome outcome = Run(kSimulated + options);
    EXPECT_EQ(outcome.code, 0);
    EXPECT_THAT(outcome.output, HasSubstr(text));
    EXPECT_THAT(outcome.errors, IsEmpty());
  }
}

TEST_F(WrongUsage, IsExplainedOnStandardErrorAndExitsWith2) {
  for (const auto& [options, reason] : {std::pair{"", "no command"},
                                        {"frob", "frob"},
                                        {"seek", "FILE"},
                                        {"seek a.mp4", "MS"},
                                        {"seek a.mp4 1:30", "'1:30'"},
                                        {"filmstrip a.mp4 -n 0", "1 to 500"},
                                        {"filmstrip a.mp4 -n 501", "1 to 500"},
                                        {"volume medi", "system, notification"},
                                        {"volume media x", "LEVEL"},
                                        {"call --mode voice media", "--for"},
                                        {"effects --set bass", "like bass=6"},
                                        {"effects --render a.wav", "FILE"},
                                        {"--device nix devices", "simulated"}}) {
    SCOPED_TRACE(options);
    const Outcome outcome = Run(PROGRAM " " + std::string(options));
    EXPECT_EQ(outcome.code, 2);
    EXPECT_THAT(outcome.output, IsEmpty());
    EXPECT_THAT(outcome.errors, testing::AllOf(StartsWith("zelkora: "), HasSubstr(reason)));
  }
}

TEST_F(Seek, PrintsWhereEachPositionLands) {
  const Outcome outcome = Run(kSimulated + "seek a.mp4 0 4200 59999");
  EXPECT_EQ(outcome.output,
            " asked  landed  key frame\n"
            "     0       0  yes\n"
            "  4200    4000  yes\n"
            " 59999   58000  yes\n");
  EXPECT_THAT(outcome.errors, IsEmpty());
  EXPECT_EQ(outcome.code, 0);
}

TEST_F(Seek, OutsideTheFileFailsInItsRowAlone) {
  const Outcome outcome = Run(kSimulated + "seek a.mp4 -1 12345678 2000");
  EXPECT_EQ(outcome.output,
            "   asked    landed  key frame\n"
            "      -1         -  E_INVALID_ARG\n"
            "12345678         -  E_INVALID_ARG\n"
            "    2000      2000  yes\n");
  EXPECT_THAT(outcome.errors,
              HasSubstr("zelkora: cannot move to -1 ms: position -1 ms is outside"));
  EXPECT_THAT(outcome.errors, HasSubstr("zelkora: cannot move to 12345678 ms: "));
  EXPECT_THAT(outcome.errors, testing::Not(HasSubstr("module=60")));
  EXPECT_EQ(outcome.code, 1);
}

TEST_F(Seek, VerboseShowsTheLog) {
  EXPECT_THAT(Run(kSimulated + "--verbose seek a.mp4 -1").errors,
              HasSubstr("error module=60 result=E_INVALID_ARG"));
}

TEST_F(Seek, WithoutAReaderFailsQuietlyAndOnAFullDiskInWords) {
  for (const auto& [redirection, errors] :
       {std::pair{">&-", ""},
        {">/dev/full", "zelkora: cannot write to standard output: No space left on device\n"}}) {
    SCOPED_TRACE(redirection);
    const Outcome outcome = Run(kSimulated + "seek a.mp4 0 1 2 " + redirection);
    EXPECT_EQ(outcome.code, 1);
    EXPECT_EQ(outcome.errors, errors);
  }
}

TEST_F(Seek, InAFileThatCannotBeOpenedTellsWhyOnce) {
#ifdef WITH_DESKTOP
  const Outcome outcome = Run(PROGRAM " --device desktop seek missing.mp4 0");
  EXPECT_THAT(outcome.errors, StartsWith("zelkora: cannot open missing.mp4: "));
  EXPECT_THAT(outcome.errors, HasSubstr("(E_OBJ_NOT_FOUND)\n"));
#else
  const Outcome outcome = Run(kSimulated + "seek '' 0");
  EXPECT_THAT(outcome.errors, HasSubstr("(E_INVALID_ARG)\n"));
#endif
  EXPECT_EQ(std::count(outcome.errors.begin(), outcome.errors.end(), '\n'), 1);
  EXPECT_THAT(outcome.output, IsEmpty());
  EXPECT_EQ(outcome.code, 1);
}

TEST_F(Filmstrip, HasEachKeyFrameOnce) {
  for (const auto& [options, count, size] : {std::tuple{"-n 1", "1 frame,", std::pair{272u, 193u}},
                                             {"", "12 frames,", {1552u, 370u}},
                                             {"-n 500", "30 frames,", {1552u, 901u}}}) {
    SCOPED_TRACE(options);
    const Outcome outcome = Run(kSimulated + "filmstrip a.mp4 " + options);
    EXPECT_EQ(outcome.code, 0);
    EXPECT_THAT(outcome.output, StartsWith("strip.png: " + std::string(count)));
    EXPECT_EQ(PictureSize(Read(folder_ / "strip.png")), size);
  }
  EXPECT_THAT(Run(kSimulated + "filmstrip a.mp4 -n 31").errors, HasSubstr("only 30 key frames"));
}

TEST_F(Filmstrip, ThatCannotBeWrittenLeavesNothing) {
  for (const std::string output : {"missing/strip.png", ".", "/dev/null"}) {
    SCOPED_TRACE(output);
    const Outcome outcome = Run(kSimulated + "filmstrip a.mp4 -o " + output);
    EXPECT_EQ(outcome.code, 1);
    EXPECT_THAT(outcome.errors, testing::AllOf(StartsWith("zelkora: "), HasSubstr(output)));
    EXPECT_THAT(outcome.output, IsEmpty());
  }
  const Outcome limited =
      Run("(ulimit -f 0; trap '' XFSZ; " + kSimulated + "filmstrip a.mp4 2>&1) | cat");
  EXPECT_EQ(limited.output, "zelkora: cannot write strip.png: File too large\n");
  EXPECT_TRUE(fs::is_empty(folder_));
}

TEST_F(Managers, AreShownAndSet) {
  for (const auto& [command, output] :
       {std::pair{"volume media", "media             7       15  #########...........\n"},
        {"volume media 15", ""},
        {"mute", "off\n"},
        {"mute on", ""},
        {"session", "media\n"},
        {"session alarm", ""},
        {"call --for 0", "in a call, mode voice\ncall ended\n"},
        {"call --for 0 --mode ringtone media",
         "in a call, mode ringtone\nin a call, mode media\ncall ended\n"}}) {
    SCOPED_TRACE(command);
    const Outcome outcome = Run(kSimulated + command);
    EXPECT_EQ(outcome.output, output);
    EXPECT_THAT(outcome.errors, IsEmpty());
    EXPECT_EQ(outcome.code, 0);
  }
}

TEST_F(Managers, RefusalIsExplainedAndExitsWith1) {
  const Outcome outcome = Run(kSimulated + "volume media 16");
  EXPECT_EQ(
      outcome.errors,
      "zelkora: cannot set the media volume to 16: an argument is rejected (E_INVALID_ARG)\n");
  EXPECT_EQ(outcome.code, 1);
}

TEST_F(StopSignal, EndsAMonitorWithSuccess) {
  for (const std::string signal : {"INT", "TERM", "HUP"}) {
    SCOPED_TRACE(signal);
    const Outcome outcome =
        Run("rm -f pipe; mkfifo pipe; " + kSimulated +
            "monitor --session alarm 2>pipe & read line <pipe; kill -" + signal + " $!; wait $!");
    EXPECT_THAT(outcome.output, IsEmpty());
    EXPECT_EQ(outcome.code, 0);
  }
}

TEST_F(StopSignal, ClosesACall) {
  const Outcome outcome = Run("mkfifo pipe; " + kSimulated +
                              "call >pipe & exec 3<pipe; read line <&3; kill -INT $!; cat <&3;"
                              " wait $!");
  EXPECT_EQ(outcome.output, "call ended\n");
  EXPECT_EQ(outcome.code, 0);
}

TEST_F(Shell, PlaysEachScenarioAsExpected) {
  int count = 0;
  for (fs::path file : fs::directory_iterator(SCENARIOS)) {
    if (file.extension() != ".txt") continue;
    SCOPED_TRACE(file);
    ++count;
    const Outcome outcome = Run(kSimulated + "shell " + file.string() + " 2>&1");
    EXPECT_EQ(outcome.output, Read(file.replace_extension(".expected")));
    EXPECT_EQ(outcome.code, 0);
  }
  EXPECT_GE(count, 3);
}

TEST_F(Shell, EndsAtALineThatIsNotUnderstood) {
  const Outcome outcome = Run("printf '# words\\nfrob\\nmute' | " + kSimulated + "shell");
  EXPECT_EQ(outcome.output, "# words\n> frob\n");
  EXPECT_THAT(outcome.errors, StartsWith("zelkora: standard input:2: "));
  EXPECT_EQ(outcome.code, 2);
}

TEST_F(Shell, InATerminalPromptsAndGoesOnAfterAMistake) {
  const Outcome outcome = Run("printf 'frob\\nsession alarm\\nsession\\nexit\\n' | script -qec '" +
                              kSimulated + "shell' /dev/null");
  EXPECT_THAT(outcome.output, HasSubstr("zelkora> "));
  EXPECT_THAT(outcome.output, HasSubstr("not expected: frob"));
  EXPECT_THAT(outcome.output, HasSubstr("\nalarm\r\n"));
  EXPECT_EQ(outcome.code, 0);
}

TEST_F(Effects, AreChangedInTheOrderGiven) {
  for (const auto& [options, bass, treble] :
       {std::tuple{"", "bass              0", "treble            0"},
        {"--set bass=6 --preset rock --set treble=-12", "bass              6",
         "treble          -12"},
        {"--set bass=6 --reset --set treble=3", "bass              0", "treble            3"},
        {"--set bass=6 --set bass=-1 a.ogg", "bass             -1", "treble            0"}}) {
    SCOPED_TRACE(options);
    const Outcome outcome = Run(kSimulated + "effects " + options);
    EXPECT_THAT(outcome.output, testing::AllOf(HasSubstr(bass), HasSubstr(treble)));
    EXPECT_EQ(outcome.code, 0);
  }
}

TEST_F(Effects, OutsideTheirRangeAreRefused) {
  const Outcome outcome = Run(kSimulated + "effects --set bass=13");
  EXPECT_THAT(outcome.errors, StartsWith("zelkora: cannot set bass 13: level 13 is outside"));
  EXPECT_EQ(outcome.code, 1);
}

#ifdef WITH_DESKTOP
TEST_F(Effects, ArePlotted) {
  const Outcome outcome = Run(PROGRAM " effects --set bass=6 --plot a.png &&" PROGRAM
                                      " effects --preset rock --plot b.svg");
  EXPECT_EQ(outcome.code, 0) << outcome.errors;
  EXPECT_EQ(PictureSize(Read(folder_ / "a.png")), std::pair(900u, 480u));
  EXPECT_THAT(Read(folder_ / "b.svg"), HasSubstr("</svg>"));
}
#endif

TEST_F(Effects, ThatCannotBeHeardLeaveNoFile) {
  for (const std::string options : {"a.ogg --render b.wav", "--plot b.svg"}) {
    SCOPED_TRACE(options);
    EXPECT_EQ(Run(kSimulated + "effects " + options).code, 1);
    EXPECT_TRUE(fs::is_empty(folder_));
  }
}

TEST_F(Devices, MarksTheOneInUse) {
  EXPECT_THAT(Run(kSimulated + "devices").output, HasSubstr("* simulated"));
#ifdef WITH_DESKTOP
  EXPECT_THAT(Run(PROGRAM " devices").output, HasSubstr("* desktop"));
  EXPECT_THAT(Run(PROGRAM " devices --device desktop").output, HasSubstr("* desktop"));
#endif
}

TEST_F(DeviceScript, RunsAProgramOnTheDevice) {
  for (const std::string build : {"", "ZELKORA_BUILD=" BUILD_FOLDER " "}) {
    SCOPED_TRACE(build);
    const Outcome outcome = Run(build + DEVICE_SCRIPT " simulated " PROGRAM " devices");
    EXPECT_THAT(outcome.output, HasSubstr("* simulated  " BUILD_FOLDER));
    EXPECT_EQ(outcome.code, 0);
  }
  EXPECT_EQ(Run(DEVICE_SCRIPT " simulated " PROGRAM " frob").code, 2);
}

TEST_F(DeviceScript, RefusesADeviceThatIsNotThere) {
  fs::create_directories(folder_ / "build/lib/zelkora-media");
  for (const auto& [command, code, reason] :
       {std::tuple{DEVICE_SCRIPT " nix echo run", 2, "there is no device 'nix'"},
        {"ZELKORA_BUILD=build " DEVICE_SCRIPT " desktop echo run", 1, "'desktop' is not built"},
        {"ZELKORA_BUILD=nowhere " DEVICE_SCRIPT " desktop echo run", 1, "no devices are built"},
        {DEVICE_SCRIPT " simulated", 2, "Usage"}}) {
    SCOPED_TRACE(command);
    const Outcome outcome = Run(command);
    EXPECT_EQ(outcome.code, code);
    EXPECT_THAT(outcome.output, IsEmpty());
    EXPECT_THAT(outcome.errors, HasSubstr(reason));
  }
}

}  // namespace
