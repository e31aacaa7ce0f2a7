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
using testing::AllOf;
using testing::HasSubstr;
using testing::StartsWith;
using Text = testing::Matcher<const std::string&>;

std::string Read(const fs::path& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), {}};
}

/// Each test has an empty folder of its own to run in. "$Z" runs the program on the simulated
/// device.
class CommandLine : public testing::Test {
 protected:
  CommandLine() {
    setenv("LSAN_OPTIONS", "print_suppressions=0:suppressions=" LEAKS_OF_OTHERS, 0);
    setenv("ASAN_OPTIONS", "fast_unwind_on_malloc=0", 0);  // those libraries have no frame pointers
    setenv("TSAN_OPTIONS", "ignore_noninstrumented_modules=1:suppressions=" RACES_OF_OTHERS, 0);
    setenv("Z", PROGRAM " --device simulated", 1);
    std::string pattern = fs::temp_directory_path() / "zelkora-XXXXXX";
    base_ = mkdtemp(pattern.data());
    fs::create_directory(folder_ = base_ / "folder");
  }
  ~CommandLine() override { fs::remove_all(base_); }

  /// Expects what a command of the shell's does: exit code, output and errors.
  void Expect(const std::string& command, int code, const Text& output, const Text& errors = "") {
    SCOPED_TRACE(command);
    const std::string redirected =
        "cd " + folder_.string() + " && (" + command + ") >../output 2>../errors";
    const int status = std::system(redirected.c_str());
    EXPECT_EQ(WIFEXITED(status) ? WEXITSTATUS(status) : -1, code);
    EXPECT_THAT(Read(base_ / "output"), output);
    EXPECT_THAT(Read(base_ / "errors"), errors);
  }

  fs::path base_;
  fs::path folder_;
};

TEST_F(CommandLine, UsageAndVersionArePrintedWithSuccess) {
  Expect("$Z --help", 0, HasSubstr("filmstrip"));
  Expect("$Z filmstrip --help", 0, HasSubstr("strip.png"));
  Expect("$Z --version", 0, StartsWith("zelkora "));
}

TEST_F(CommandLine, UsageThatIsWrongIsExplainedOnStandardErrorAndExitsWith2) {
  for (const auto& [options, reason] : {std::pair{"", "no command"},
                                        {"frob", "frob"},
                                        {"seek a.mp4", "MS"},
                                        {"seek a.mp4 1:30", "'1:30'"},
                                        {"filmstrip a.mp4 -n 501", "1 to 500"},
                                        {"volume medi", "system, notification"},
                                        {"volume media x", "LEVEL"},
                                        {"call --mode voice media", "--for"},
                                        {"effects --set bass", "like bass=6"},
                                        {"effects --render a.wav", "FILE"},
                                        {"--device nix devices", "simulated"}}) {
    Expect("$Z " + std::string(options), 2, "", AllOf(StartsWith("zelkora: "), HasSubstr(reason)));
  }
}

TEST_F(CommandLine, SeekPrintsWhereEachPositionLandsAndFailsOutsideTheFileInThatRowAlone) {
  Expect("$Z seek a.mp4 0 4200 59999", 0,
         " asked  landed  key frame\n"
         "     0       0  yes\n"
         "  4200    4000  yes\n"
         " 59999   58000  yes\n");
  Expect("$Z seek a.mp4 -1 12345678 2000", 1,
         "   asked    landed  key frame\n"
         "      -1         -  E_INVALID_ARG\n"
         "12345678         -  E_INVALID_ARG\n"
         "    2000      2000  yes\n",
         AllOf(StartsWith("zelkora: cannot move to -1 ms: position -1 ms is outside"),
               HasSubstr("\nzelkora: cannot move to 12345678 ms: ")));
  Expect("$Z --verbose seek a.mp4 -1", 1, HasSubstr("E_INVALID_ARG"),
         HasSubstr("error module=60 result=E_INVALID_ARG"));
}

TEST_F(CommandLine, SeekWithoutAReaderFailsQuietlyAndOnAFullDiskInWords) {
  Expect("$Z seek a.mp4 0 1 2 >&-", 1, "");
  Expect("$Z seek a.mp4 0 1 2 >/dev/full", 1, "",
         "zelkora: cannot write to standard output: No space left on device\n");
}

TEST_F(CommandLine, SeekInAFileThatCannotBeOpenedTellsWhyOnce) {
#ifdef WITH_DESKTOP
  Expect(PROGRAM " --device desktop seek missing.mp4 0", 1, "",
         testing::MatchesRegex("zelkora: cannot open missing.mp4: .* \\(E_OBJ_NOT_FOUND\\)\n"));
#else
  Expect("$Z seek '' 0", 1, "", testing::MatchesRegex("zelkora: .* \\(E_INVALID_ARG\\)\n"));
#endif
}

TEST_F(CommandLine, FilmstripHasEachKeyFrameOnce) {
  for (const auto& [options, strip, note] :
       {std::tuple{"-n 1", "1 frame, 272 x 193", ""},
        {"", "12 frames, 1552 x 370", ""},
        {"-n 500", "30 frames, 1552 x 901",
         "zelkora: note: the video has only 30 key frames near the 500 positions\n"}}) {
    Expect("$Z filmstrip a.mp4 " + std::string(options), 0,
           "strip.png: " + std::string(strip) + " pixels\n", note);
    EXPECT_THAT(Read(folder_ / "strip.png"), StartsWith("\x89PNG\r\n"));
  }
}

TEST_F(CommandLine, FilmstripThatCannotBeWrittenLeavesNothing) {
  for (const std::string output : {"missing/strip.png", ".", "/dev/null"}) {
    Expect("$Z filmstrip a.mp4 -o " + output, 1, "",
           AllOf(StartsWith("zelkora: "), HasSubstr(output)));
  }
  Expect("(ulimit -f 0; trap '' XFSZ; $Z filmstrip a.mp4 2>&1) | cat", 0,
         "zelkora: cannot write strip.png: File too large\n");
  EXPECT_TRUE(fs::is_empty(folder_));
}

TEST_F(CommandLine, ManagersAreShownAndSetAndRefusalsExplained) {
  Expect("$Z volume media", 0, "media             7       15  #########...........\n");
  Expect("$Z volume media 15", 0, "");
  Expect("$Z volume media 16", 1, "",
         "zelkora: cannot set the media volume to 16: an argument is rejected (E_INVALID_ARG)\n");
  Expect("$Z mute", 0, "off\n");
  Expect("$Z mute on", 0, "");
  Expect("$Z session", 0, "media\n");
  Expect("$Z call --for 0", 0, "in a call, mode voice\ncall ended\n");
  Expect("$Z call --for 0 --mode ringtone media", 0,
         "in a call, mode ringtone\nin a call, mode media\ncall ended\n");
}

TEST_F(CommandLine, StopSignalEndsAMonitorWithSuccessAndClosesACall) {
  for (const std::string signal : {"INT", "TERM", "HUP"}) {
    Expect(
        "rm -f pipe; mkfifo pipe; $Z monitor --session alarm 2>pipe & read line <pipe;"
        "kill -" +
            signal + " $!; wait $!",
        0, "");
  }
  Expect(
      "rm pipe; mkfifo pipe; $Z call >pipe & exec 3<pipe; read line <&3; kill -INT $!;"
      "cat <&3; wait $!",
      0, "call ended\n");
}

TEST_F(CommandLine, ShellPlaysEachScenarioAsExpected) {
  int count = 0;
  for (fs::path file : fs::directory_iterator(SCENARIOS)) {
    if (file.extension() != ".txt") continue;
    ++count;
    const std::string command = "$Z shell " + file.string() + " 2>&1";
    Expect(command, 0, Read(file.replace_extension(".expected")));
  }
  EXPECT_GE(count, 3);
}

TEST_F(CommandLine, ShellEndsAtALineThatIsNotUnderstoodButInATerminalPromptsAndGoesOn) {
  Expect("printf '# words\\nfrob\\nmute' | $Z shell", 2, "# words\n> frob\n",
         StartsWith("zelkora: standard input:2: "));
  Expect("printf 'frob\\nsession alarm\\nsession\\nexit\\n' | script -qec \"$Z shell\" /dev/null",
         0,
         AllOf(HasSubstr("zelkora> "), HasSubstr("not expected: frob"), HasSubstr("\nalarm\r\n")));
}

TEST_F(CommandLine, EffectsAreChangedInTheOrderGivenAndRefusedOutsideTheirRange) {
  for (const auto& [options, bass, treble] :
       {std::tuple{"", "bass              0", "treble            0"},
        {"--set bass=6 --preset rock --set treble=-12", "bass              6",
         "treble          -12"},
        {"--set bass=6 --reset --set treble=3", "bass              0", "treble            3"},
        {"--set bass=6 --set bass=-1 a.ogg", "bass             -1", "treble            0"}}) {
    Expect("$Z effects " + std::string(options), 0, AllOf(HasSubstr(bass), HasSubstr(treble)));
  }
  Expect("$Z effects --set bass=13", 1, "",
         StartsWith("zelkora: cannot set bass 13: level 13 is outside"));
}

TEST_F(CommandLine, EffectsArePlottedAndLeaveNoFileWhereTheyCannotBeHeard) {
  Expect("$Z effects a.ogg --render b.wav", 1, StartsWith("effect"), StartsWith("zelkora: "));
  Expect("$Z effects --plot b.svg", 1, StartsWith("effect"), StartsWith("zelkora: "));
  EXPECT_TRUE(fs::is_empty(folder_));
#ifdef WITH_DESKTOP
  Expect(PROGRAM " effects --set bass=6 --plot a.png", 0, HasSubstr("a.png: bass 6"));
  Expect(PROGRAM " effects --preset rock --plot b.svg", 0, HasSubstr("b.svg: preset rock"));
  EXPECT_THAT(Read(folder_ / "a.png"), StartsWith("\x89PNG\r\n"));
  EXPECT_THAT(Read(folder_ / "b.svg"), HasSubstr("</svg>"));
#endif
}

TEST_F(CommandLine, DevicesMarksTheOneInUse) {
  Expect("$Z devices", 0, HasSubstr("* simulated"));
#ifdef WITH_DESKTOP
  Expect(PROGRAM " devices", 0, HasSubstr("* desktop"));
  Expect(PROGRAM " devices --device desktop", 0, HasSubstr("* desktop"));
#endif
}

TEST_F(CommandLine, DeviceScriptRunsAProgramOnTheDeviceAndRefusesOneThatIsNotThere) {
  for (const std::string build : {"", "ZELKORA_BUILD=" BUILD_FOLDER " "}) {
    Expect(build + DEVICE_SCRIPT " simulated " PROGRAM " devices", 0,
           HasSubstr("* simulated  " BUILD_FOLDER));
  }
  Expect(DEVICE_SCRIPT " simulated " PROGRAM " frob", 2, "", HasSubstr("frob"));
  fs::create_directories(folder_ / "build/lib/zelkora-media");
  for (const auto& [command, code, reason] :
       {std::tuple{DEVICE_SCRIPT " nix echo run", 2, "there is no device 'nix'"},
        {"ZELKORA_BUILD=build " DEVICE_SCRIPT " desktop echo run", 1, "'desktop' is not built"},
        {"ZELKORA_BUILD=nowhere " DEVICE_SCRIPT " desktop echo run", 1, "no devices are built"},
        {DEVICE_SCRIPT " simulated", 2, "Usage"}}) {
    Expect(command, code, "", HasSubstr(reason));
  }
}

}  // namespace
