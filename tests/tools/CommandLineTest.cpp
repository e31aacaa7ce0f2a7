// Runs the command-line program and the device script the way a user does.

#include "base/Recording.h"
#include "base/TemporaryFolder.h"
#include "support/ReadFile.h"

#include <gmock/gmock.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <sstream>
#include <string>
#include <tuple>

namespace {

namespace fs = std::filesystem;
using namespace testing;
using Text = Matcher<const std::string&>;

/// Each test has an empty folder of its own to run in. "$Z" runs the program on the simulated
/// device, "$D" on the desktop one.
class CommandLine : public Test {
 protected:
  CommandLine() {
    setenv("LSAN_OPTIONS", "print_suppressions=0:suppressions=" LEAKS_OF_OTHERS, 0);
    setenv("ASAN_OPTIONS", "fast_unwind_on_malloc=0", 0);  // those libraries have no frame pointers
    setenv("TSAN_OPTIONS", "ignore_noninstrumented_modules=1:suppressions=" RACES_OF_OTHERS, 0);
    setenv("Z", PROGRAM " --device simulated", 1);
    setenv("D", PROGRAM " --device desktop", 1);
    fs::create_directory(folder_);
  }

  /// Expects what a command of the shell's does: exit code, output and errors.
  void Expect(const std::string& command, int code, const Text& output, const Text& errors = "") {
    SCOPED_TRACE(command);
    const std::string redirected =
        "cd " + folder_.string() + " && (" + command + ") >../output 2>../errors";
    const int status = std::system(redirected.c_str());
    EXPECT_EQ(WIFEXITED(status) ? WEXITSTATUS(status) : -1, code);
    EXPECT_THAT(ReadFile(base_.PathOf("output")), output);
    EXPECT_THAT(ReadFile(base_.PathOf("errors")), errors);
  }

  const ::CommandLine::TemporaryFolder base_;
  const fs::path folder_ = base_.PathOf("folder");
};

TEST_F(CommandLine, UsageIsPrintedOnRequestAndExplainedOnStandardErrorWhenItIsWrong) {
  Expect("$Z --help", 0, HasSubstr("filmstrip"));
  Expect("$Z filmstrip --help", 0, HasSubstr("strip.png"));
  Expect("$Z --version", 0, StartsWith("zelkora "));
  for (const auto& [options, reason] : {std::pair{"", "no command"},
                                        {"frob a b", "no command 'frob'"},
                                        {"seek a.mp4", "POSITION"},
                                        {"seek a.mp4 1.5", "1.5s"},
                                        {"seek a.mp4 1:60", "'1:60'"},
                                        {"seek a.mp4 1:2:3:4", "'1:2:3:4'"},
                                        {"seek a.mp4 1 --x", "no option '--x'"},
                                        {"seek a.mp4 --keys 4200", "--keys"},
                                        {"filmstrip a.mp4 b open", "'b open'"},
                                        {"filmstrip a.mp4 -o a.jpg", "'a.jpg' doesn't end in .png"},
                                        {"monitor --count 0", "'0' is no whole number from 1"},
                                        {"filmstrip a.mp4 -n 501", "1 to 500"},
                                        {"volume medi", "system, notification"},
                                        {"volume media x", "write 9, +1, -2 or 60%"},
                                        {"volume media +5%", "write 9"},
                                        {"call --mode voice media", "--for"},
                                        {"effects --set bass", "like bass=6"},
                                        {"effects --render a.wav", "FILE"},
                                        {"--device nix devices", "simulated"}}) {
    Expect("$Z " + std::string(options), 2, "", AllOf(StartsWith("zelkora: "), HasSubstr(reason)));
  }
}

TEST_F(CommandLine, SeekPrintsWhereEachPositionLandsAndWhyOneDoesNot) {
  Expect("$Z seek a.mp4 0 4200 59999", 0,
         " asked  landed  key frame\n"
         "     0       0  yes\n"
         "  4200    4000  yes\n"
         " 59999   58000  yes\n");
  Expect("$Z seek a.mp4 4200ms 4.2s 0:04.2 4s 0:00:59 | cut -c-6", 0,
         " asked\n  4200\n  4200\n  4200\n  4000\n 59000\n");
  Expect("$Z seek a.mp4 -1 12345678 2000", 1,
         "   asked    landed  key frame\n"
         "      -1         -  E_INVALID_ARG\n"
         "12345678         -  E_INVALID_ARG\n"
         "    2000      2000  yes\n",
         AllOf(StartsWith("zelkora: cannot move to -1 ms: position -1 ms is outside"),
               HasSubstr("\nzelkora: cannot move to 12345678 ms: ")));
  Expect("$Z --verbose seek a.mp4 -1", 1, HasSubstr("E_INVALID_ARG"),
         HasSubstr("debug module=60 result=E_INVALID_ARG"));
  Expect("$Z seek a.mp4 --keys", 0, AllOf(StartsWith("0\n2000\n4000\n"), EndsWith("\n60000\n")));
  Expect("$Z seek a.mp4 0 1 2 >&-", 1, "");
  Expect("$Z seek a.mp4 0 1 2 >/dev/full", 1, "",
         "zelkora: cannot write to standard output: No space left on device\n");
  Expect("$Z seek '' 0", 1, "", MatchesRegex("zelkora: .* \\(E_INVALID_ARG\\)\n"));
#ifdef WITH_DESKTOP
  Expect("$D seek missing.mp4 0", 1, "",
         MatchesRegex("zelkora: cannot open missing.mp4: .* \\(E_OBJ_NOT_FOUND\\)\n"));
#endif
}

TEST_F(CommandLine, FilmstripHasEachKeyFrameOnceOrLeavesNothing) {
  Expect("mkdir folder.png; ln -s /dev/null null.png", 0, "");
  for (const std::string output : {"missing/strip.png", "folder.png", "null.png"}) {
    Expect("$Z filmstrip a.mp4 -o " + output, 1, "",
           AllOf(StartsWith("zelkora: "), HasSubstr(output)));
  }
  Expect("$Z filmstrip a.mp4 -o - | head -c 4", 0, "\x89PNG");
// qemu and the runtime of ThreadSanitizer write files of their own, which ends them.
#if !defined(UNDER_EMULATION) && !defined(__SANITIZE_THREAD__)
  Expect("(ulimit -f 0; $Z filmstrip a.mp4 2>&1) | cat", 0,
         "zelkora: cannot write strip.png: File too large\n");
#endif
  Expect("ls -A", 0, "folder.png\nnull.png\n");
  for (const auto& [options, strip, note] :
       {std::tuple{"-n 1", "1 frame, 272 x 193", ""},
        {"", "12 frames, 1552 x 370", ""},
        {"-n 500", "30 frames, 1552 x 901",
         "zelkora: note: the video has only 30 key frames near the 500 positions\n"}}) {
    Expect("$Z filmstrip a.mp4 " + std::string(options), 0,
           "strip.png: " + std::string(strip) + " pixels\n", note);
    EXPECT_THAT(ReadFile(folder_ / "strip.png"), StartsWith("\x89PNG\r\n"));
  }
}

TEST_F(CommandLine, WhatIsReadIsNeverWrittenOver) {
  Expect("echo mine >a.png; ln a.png hard.png; ln -s a.png soft.png; ln a.png a.wav", 0, "");
  for (const std::string command :
       {"filmstrip a.png -o a.png", "filmstrip a.png -o soft.png", "filmstrip soft.png -o hard.png",
        "effects a.wav --render a.wav", "effects a.wav --plot hard.png"}) {
    Expect("$Z " + command, 2, "", HasSubstr(" would be written over "));
    EXPECT_EQ(ReadFile(folder_ / "a.png"), "mine\n");
  }
  Expect("$Z filmstrip b.mp4 -n 1 -o soft.png", 0, HasSubstr("1 frame"));
  EXPECT_TRUE(fs::is_symlink(folder_ / "soft.png"));
  EXPECT_THAT(ReadFile(folder_ / "a.png"), StartsWith("\x89PNG\r\n"));  // an older one is replaced
  EXPECT_EQ(ReadFile(folder_ / "hard.png"), "mine\n");
}

#ifdef WITH_DESKTOP
TEST_F(CommandLine, RenderingThatIsInterruptedLeavesNothingAndOnAPipeIsWhole) {
  Expect("head -c 100000000 /dev/zero | sox -t raw -r 48000 -e signed -b 16 -c 2 - a.wav", 0, "");
  for (const auto& [signal, code] : {std::pair{"INT", 130}, {"TERM", 143}}) {
    Expect(
        "$D effects a.wav --render b.wav >/dev/null & until ls .zelkora-*/*.part; do "
        "kill -0 $! || exit; done >/dev/null 2>&1; kill -" +
            std::string(signal) + " $!; wait $!",
        code, "", _);
    Expect("ls -A", 0, "a.wav\n");
  }
  Expect("$D effects a.wav --render - | sox -t wav - -t raw - | wc -c", 0, "100000000\n");
}
#endif

TEST_F(CommandLine, ManagersAreShownAndSetAndRefusalsExplained) {
  Expect("$Z volume media", 0, "media             7       15  #########...........\n");
  Expect("$Z volume media 15", 0, "");
  Expect("$Z volume media 16", 1, "",
         "zelkora: cannot set the media volume to 16: the levels are 0 to 15 (E_INVALID_ARG)\n");
  Expect("$Z volume media +1", 0, "media             8       15  ##########..........\n");
  Expect("$Z volume media -9", 0, HasSubstr(" 0 "));
  Expect("$Z volume media 60%", 0, HasSubstr(" 9 "));
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
    const std::string command = "$Z shell --no-wait " + file.string() + " 2>&1";
    Expect(command, 0, ReadFile(file.replace_extension(".expected")));
  }
  EXPECT_GE(count, 3);
}

TEST_F(CommandLine, WhatIsRecordedPlaysBackAsItWasHeard) {
  const std::string heard =
      "disruption\ninterruption started\ninterruption finished\ninterruption started\n"
      "volume call 10\nmute on\nmute off\ninterruption finished\n";
  ::CommandLine::Recording recording(folder_ / "a.txt", "alarm");
  std::istringstream lines(heard);
  for (std::string line; std::getline(lines, line);) recording.Add(line);
  usleep(20000);
  recording.Add("volume media 9");
  recording.Complete();
  EXPECT_THAT(ReadFile(folder_ / "a.txt"),
              AllOf(HasSubstr("session alarm\n"),
                    ContainsRegex("\nwait ([2-9][0-9]|[1-9][0-9][0-9])\n")));  // not sooner
  Expect("$Z shell a.txt | sed -n 's/^< //p'", 0, heard + "volume media 9\n");
}

TEST_F(CommandLine, ShellEndsAtALineThatIsNotUnderstoodButInATerminalPromptsAndGoesOn) {
  Expect("printf '# words\\nfrob\\nmute' | $Z shell", 2, "# words\n> frob\n",
         StartsWith("zelkora: standard input:2: "));
  Expect("printf 'frob\\nsession alarm\\nsession\\nexit\\n' | script -qec \"$Z shell\" /dev/null",
         0,
         AllOf(HasSubstr("zelkora> "), HasSubstr("no command 'frob'"), HasSubstr("\nalarm\r\n")));
}

TEST_F(CommandLine, EffectsAreChangedInTheOrderGivenAndRefusedOutsideTheirRange) {
  for (const auto& [options, bass, treble] :
       {std::tuple{"", "bass              0", "treble            0"},
        {"--set bass=6 --preset rock --set treble=-12", "bass              6",
         "treble          -12"},
        {"--set bass=6 --reset --set treble=3", "bass              0", "treble            3"},
        {"--set bass=6 --set bass=-1 a.ogg", "bass             -1", "treble            0"}}) {
    Expect("$Z effects " + std::string(options), 0, AllOf(HasSubstr(bass), HasSubstr(treble)),
           *options == '\0' ? Text("") : HasSubstr("note: the changes are gone"));
  }
  Expect("$Z effects --set bass=13", 1, "",
         StartsWith("zelkora: cannot set bass 13: level 13 is outside"));
  Expect("$Z effects", 0, Not(ContainsRegex("(\n|presets:.* )[0-9]")));  // all have names
}

TEST_F(CommandLine, EffectsArePlottedAndLeaveNoFileWhereTheyCannotBeHeard) {
  for (const std::string output : {"a.ogg --render b.wav", "--plot b.svg"}) {
    Expect("$Z effects " + output, 1, StartsWith("effect"), StartsWith("zelkora: "));
  }
  EXPECT_TRUE(fs::is_empty(folder_));
#ifdef WITH_DESKTOP
  Expect("$D effects --set bass=6 --plot a.png", 0, HasSubstr("a.png: bass 6"));
  Expect("$D effects --preset rock --plot b.svg", 0, HasSubstr("b.svg: preset rock"));
  EXPECT_THAT(ReadFile(folder_ / "a.png"), StartsWith("\x89PNG\r\n"));
  EXPECT_THAT(ReadFile(folder_ / "b.svg"), HasSubstr("</svg>"));
#endif
}

TEST_F(CommandLine, WordsAreCompletedFromTheCommandsAndValuesThatThereAre) {
  for (const auto& [words, completed] : {std::pair{"vol", "volume\n"},
                                         {"effects --preset r", "rhythm-and-blues\nrock\n"},
                                         {"effects --set s", "stereo-width=\n"},
                                         {"--device sim", "simulated\n"},
                                         {"call --for 1 --mode v", "voice\n"},
                                         {"filmstrip ''", "FILE\n"},
                                         {"mute on ''", ""}}) {
    Expect(PROGRAM " --complete " + std::string(words), 0, completed);
  }
}

TEST_F(CommandLine, DoctorTellsWhatIsMissingAndWhatMendsIt) {
  Expect("$Z doctor", 0, "device: simulated\nnothing is missing\n");
#ifdef WITH_DESKTOP
  Expect("PULSE_SERVER=unix:none $D doctor", 1,
         AllOf(HasSubstr("ok       video: H.264\n"),
               HasSubstr("missing  sound server\n"
                         "         mend it: apt install pulseaudio; pulseaudio --start\n")));
#endif
}

TEST_F(CommandLine, ProgramRunsOnTheDeviceThatIsNamedUnlessThatIsNotThere) {
  for (const std::string build : {"", "ZELKORA_BUILD=" BUILD_FOLDER " "}) {
    Expect(build + DEVICE_SCRIPT " simulated " PROGRAM " devices", 0,
           HasSubstr("* simulated  " BUILD_FOLDER));
  }
#ifdef WITH_DESKTOP
  Expect(PROGRAM " devices", 0, HasSubstr("* desktop"));
  Expect(PROGRAM " devices --device desktop", 0, HasSubstr("* desktop"));
#endif
  Expect(DEVICE_SCRIPT " simulated " PROGRAM " frob", 2, "", HasSubstr("frob"));
  fs::create_directories(folder_ / "build/lib/zelkora-media");
  for (const auto& [command, code, reason] :
       {std::tuple{DEVICE_SCRIPT " nix echo run", 2, "there is no device 'nix'"},
        {"ZELKORA_BUILD=build " DEVICE_SCRIPT " desktop echo run", 1, "no devices are built"},
        {"ZELKORA_BUILD=nowhere " DEVICE_SCRIPT " desktop echo run", 1, "no devices are built"},
        {DEVICE_SCRIPT " simulated", 2, "Usage"}}) {
    Expect(command, code, "", HasSubstr(reason));
  }
}

}  // namespace
