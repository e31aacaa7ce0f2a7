// The desktop's sound manager on a PulseAudio or PipeWire of the test's own, with `pactl`, `pacat`
// and another process of this program as the other parties.

#include "SoundServer.h"
#include "support/NativeListener.h"

#include <Tizen/Media/Player.h>
#include <Tizen/Media/PlayerImpl.h>
#include <Zelkora/Media/AudioSessionManager.h>
#include <Zelkora/Media/AudioVolumeManager.h>
#include <Zelkora/Media/IAudioSessionEventListener.h>
#include <Zelkora/Media/IAudioVolumeEventListener.h>
#include <Zelkora/Media/VoipAudioSessionManager.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <malloc.h>
#include <sound_manager.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <functional>
#include <map>
#include <random>
#include <set>
#include <thread>

namespace {

using testing::ElementsAre;
using testing::IsEmpty;

constexpr int kSystem = 0;
constexpr int kMedia = 4;
constexpr int kCategories = 6;
constexpr int kMax = 15;
constexpr const char* kRoleOf[kCategories] = {"event",    "notification", "alarm",
                                              "ringtone", "music",        "phone"};

std::string Role(const std::string& role) { return "media.role=" + role; }
std::string RoleLine(const std::string& role) { return "media.role = \"" + role + "\""; }

int VolumeOf(int level) { return (level * 65536 + kMax / 2) / kMax; }

int GetLevel(int type) {
  int level = -1;
  EXPECT_EQ(sound_manager_get_volume(type, &level), 0);
  return level;
}

/// Another process of this program, with a call open.
class OtherCall : public Program {
 public:
  OtherCall() : Program({std::filesystem::read_symlink("/proc/self/exe"), "--call"}) {
    EXPECT_EQ(ReadLine(), "open");
  }
};

std::string IndexOf(const Player& player) { return std::to_string(player.GetIndex()); }

/// Runs another process of this program. \return its output
std::string RunOther(std::vector<std::string> arguments) {
  arguments.insert(arguments.begin(), std::filesystem::read_symlink("/proc/self/exe"));
  Program other(std::move(arguments));
  const std::string output = other.ReadAll();
  EXPECT_EQ(other.Finish(), 0);
  return output;
}

/// \return whether that comes true, each look at it being a round trip to a server or a thread
bool ComesTrue(const std::function<bool()>& condition) {
  const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(10);
  while (!condition()) {
    if (std::chrono::steady_clock::now() > end) return false;
  }
  return true;
}

class SoundManagerDesktop : public testing::Test {
 protected:
  SoundManagerDesktop() { server.Start(); }

  SoundServer server;
};

/// \return the levels of the categories, as another process reads them
std::string GetLevelsElsewhere() { return RunOther({"--get"}); }

TEST_F(SoundManagerDesktop, EveryLevelComesBackOnceWhateverStreamsThereAre) {
  const std::vector<int> rows[] = {{}, {1}, {2}, {6}, {1, 6, 2}};  // channels of the streams
  NativeListener listener(NativeListener::kLevels);
  for (int type = 0; type < kCategories; ++type) {
    for (const auto& row : rows) {
      SCOPED_TRACE(kRoleOf[type] + testing::PrintToString(row));
      std::vector<Player> players;
      for (const int channels : row) {
        players.emplace_back(std::vector{Role(kRoleOf[type])}, channels);
      }
      for (std::size_t i = 0; i < row.size() && row.size() > 1; ++i) {
        std::vector<std::string> unbalanced(static_cast<std::size_t>(row[i]), "20%");
        unbalanced.back() = "60%";
        unbalanced.insert(unbalanced.begin(), {"set-sink-input-volume", IndexOf(players[i])});
        Pactl(std::move(unbalanced));
      }
      ASSERT_EQ(sound_manager_set_volume(type, 1), 0);
      listener.TakeAll();
      for (int level = kMax; level >= 0; --level) {
        ASSERT_EQ(sound_manager_set_volume(type, level), 0);
        EXPECT_EQ(GetLevel(type), level);
        EXPECT_THAT(listener.TakeAll(), ElementsAre(Level(type, level)));
        if (row.empty()) continue;
        for (const ListedStream& stream : ListStreams(RoleLine(kRoleOf[type]))) {
          EXPECT_EQ(stream.volume, VolumeOf(level)) << stream.description;
        }
      }
    }
    // A stream that still ends would store its balance.
    while (!ListStreams(RoleLine(kRoleOf[type])).empty()) std::this_thread::yield();
    ASSERT_EQ(sound_manager_set_volume(type, type + 3), 0);
  }
  EXPECT_EQ(GetLevelsElsewhere(), "3 4 5 6 7 8 ");
  for (int type = 0; type < kCategories; ++type) {
    const Player player({Role(kRoleOf[type])});
    EXPECT_EQ(ListStreams(RoleLine(kRoleOf[type])).at(0).volume, VolumeOf(type + 3));
  }
}

/// \return how often changes are made in a test of random ones
int CountChanges() {
  const char* given = std::getenv("ZELKORA_TEST_CHANGES");
  return given != nullptr ? std::atoi(given) : 60;
}

TEST_F(SoundManagerDesktop, ChangesOfAllPartiesAreToldTrulyAndOnce) {
  std::mt19937 random(7);
  const auto draw = [&](int count) { return static_cast<int>(random() % unsigned(count)); };
  const Player players[] = {Player({Role("music")}), Player({Role("alarm")})};
  constexpr int kTypes[] = {kMedia, 2};
  std::set<std::string> made;
  std::map<char, std::string> last;  // heard of a category
  NativeListener listener(NativeListener::kLevels);
  const auto hear = [&] {
    const auto heard = listener.TakeAll();
    for (const std::string& change : heard) {
      EXPECT_TRUE(made.count(change)) << change << " was made by nobody";
      EXPECT_NE(std::exchange(last[change[0]], change), change);
    }
    return heard;
  };
  for (int i = 0; i < CountChanges(); ++i) {
    SCOPED_TRACE(i);
    const int which = draw(2), type = kTypes[which], level = draw(kMax + 1), party = draw(3);
    made.insert(Level(type, level));
    if (party == 0) {
      hear();
      const bool isChange = GetLevel(type) != level;
      ASSERT_EQ(sound_manager_set_volume(type, level), 0);
      EXPECT_EQ(hear().size(), isChange ? 1u : 0u);
    } else if (party == 1) {
      RunOther({"--set", std::to_string(type), std::to_string(level)});
    } else {
      Pactl({"set-sink-input-volume", IndexOf(players[which]), std::to_string(VolumeOf(level))});
    }
    EXPECT_EQ(GetLevel(type), level);
  }
  hear();
  std::string levels;
  for (int type = 0; type < kCategories; ++type) levels += std::to_string(GetLevel(type)) + " ";
  EXPECT_EQ(GetLevelsElsewhere(), levels);
  for (const int which : {0, 1}) {
    EXPECT_EQ(last[Level(kTypes[which], 0)[0]], Level(kTypes[which], GetLevel(kTypes[which])));
    EXPECT_EQ(ListStreams(RoleLine(which == 0 ? "music" : "alarm")).at(0).volume,
              VolumeOf(GetLevel(kTypes[which])));
  }
}

TEST_F(SoundManagerDesktop, MediaIsMusicVideoGamesAndStreamsWithoutRole) {
  const Player music({Role("music")});
  const Player video({Role("video")});
  const Player game({Role("game")});
  const Player plain({});
  const Player other({Role("test")});
  ASSERT_EQ(sound_manager_set_volume(kMedia, 6), 0);
  for (const ListedStream& stream : ListStreams("Sink Input")) {
    const bool isOther = stream.index == other.GetIndex();
    EXPECT_EQ(stream.volume, VolumeOf(isOther ? kMax : 6)) << stream.description;
  }
}

TEST_F(SoundManagerDesktop, FirstRoleWithAStoredVolumeTellsTheLevelAtConnection) {
  int level = 3;
  for (const char* role : {"game", "video", "music"}) {  // the last one first
    const Player player({Role(role)});
    Pactl({"set-sink-input-volume", IndexOf(player), std::to_string(VolumeOf(++level))});
    const int stored = IsOnPipeWire() ? kMax : level;  // it stores nothing for the role
    const std::string levels = "15 15 15 15 " + std::to_string(stored) + " 15 ";
    EXPECT_TRUE(ComesTrue([&] { return GetLevelsElsewhere() == levels; })) << role;
  }
}

TEST_F(SoundManagerDesktop, StreamThatIsMovedByAnotherProgramIsReportedOnce) {
  NativeListener listener(NativeListener::kLevels);
  for (int type = 1; type < kCategories; ++type) {
    SCOPED_TRACE(kRoleOf[type]);
    const Player player({Role(kRoleOf[type])});
    Pactl({"set-sink-input-volume", IndexOf(player), "40%"});
    EXPECT_EQ(listener.Take(), Level(type, 6));
    EXPECT_THAT(listener.TakeAll(), IsEmpty());
    EXPECT_EQ(GetLevel(type), 6);
  }
  const Player plain({});
  EXPECT_THAT(listener.TakeAll(), IsEmpty());  // and the device knows the stream
  Pactl({"set-sink-input-volume", IndexOf(plain), "80%"});
  EXPECT_EQ(listener.Take(), Level(kMedia, 12));
  // Less than a step, and then nothing at all.
  Pactl({"set-sink-input-volume", IndexOf(plain), "81%"});
  Pactl({"set-sink-input-volume", IndexOf(plain), "81%"});
  EXPECT_THAT(listener.TakeAll(), IsEmpty());
}

TEST_F(SoundManagerDesktop, BalanceMuteAndSinksOutliveLevelZeroAndOthers) {
  const auto listSinks = [] { return Pactl({"list", "short", "sink-inputs"}); };
  const auto isBalanced = testing::ContainsRegex("left: .* 60% .*right: .* 30%");
  Pactl({"load-module", "module-null-sink", "sink_name=second"});
  const Player stays({Role("video")}), moved({Role("music"), "test.name=moved"});
  Pactl({"set-sink-input-volume", IndexOf(moved), "100%", "50%"});
  Pactl({"set-sink-input-mute", IndexOf(moved), "1"});
  const std::string together = listSinks();
  Pactl({"move-sink-input", IndexOf(moved), "second"});
  EXPECT_TRUE(ComesTrue([&] { return listSinks() != together; }));
  const std::string apart = listSinks();
  ASSERT_EQ(sound_manager_set_volume(kMedia, 0), 0);
  EXPECT_EQ(ListStreams("moved").at(0).volume, 0);
  ASSERT_EQ(sound_manager_set_volume(kMedia, 9), 0);
  EXPECT_EQ(listSinks(), apart);
  const ListedStream stream = ListStreams("moved").at(0);
  EXPECT_THAT(stream.description, testing::HasSubstr("Mute: yes"));
  EXPECT_THAT(stream.description, isBalanced);
  const Player later({Role("music"), "test.name=later"});
  EXPECT_THAT(ListStreams("later").at(0).description, isBalanced);
}

TEST_F(SoundManagerDesktop, StoredVolumeThatOthersChangeIsToldAtOnceOrOnPipeWireWhenAskedFor) {
  const Player music({Role("music")});
  NativeListener listener(NativeListener::kLevels);
  const auto hear = [&] { EXPECT_EQ(listener.Take(), Level(kSystem, 5)); };
  RunOther({"--set", std::to_string(kSystem), "5"});
  if (!IsOnPipeWire()) hear();
  Pactl({"set-sink-input-volume", IndexOf(music), "40%"});
  EXPECT_EQ(listener.Take(), Level(kMedia, 6));
  EXPECT_EQ(GetLevel(kSystem), 5);
  if (IsOnPipeWire()) hear();
}

TEST_F(SoundManagerDesktop, MuteAllIsTheDefaultSinksAndFollowsIt) {
  NativeListener listener(NativeListener::kMuteAll);
  bool isMuted = true;
  ASSERT_EQ(sound_manager_get_muteall(&isMuted), 0);
  EXPECT_FALSE(isMuted);

  ASSERT_EQ(sound_manager_set_muteall(true), 0);
  ASSERT_EQ(sound_manager_set_muteall(true), 0);
  EXPECT_EQ(listener.Take(), "muted");
  EXPECT_THAT(Pactl({"get-sink-mute", "first"}), testing::HasSubstr("yes"));
  Pactl({"set-sink-mute", "first", "0"});
  EXPECT_EQ(listener.Take(), "unmuted");

  Pactl({"load-module", "module-null-sink", "sink_name=second"});
  Pactl({"set-sink-mute", "second", "1"});
  Pactl({"set-default-sink", "second"});
  EXPECT_EQ(listener.Take(), "muted");
  ASSERT_EQ(sound_manager_set_muteall(false), 0);
  EXPECT_EQ(listener.Take(), "unmuted");
  EXPECT_THAT(Pactl({"get-sink-mute", "second"}), testing::HasSubstr("no"));
}

TEST_F(SoundManagerDesktop, CallsOfOtherProcessesInterruptOnceAltogether) {
  NativeListener listener(NativeListener::kInterruptions);
  const Player music({Role("music")});
  OtherCall first;
  EXPECT_EQ(listener.Take(), "code 5");
  OtherCall second;
  const std::string before = Pactl({"list", "short", "sink-inputs"});
  Pactl({"load-module", "module-null-sink", "sink_name=second"});
  Pactl({"set-default-sink", "second"});  // which the streams follow, on PipeWire as other ones
  EXPECT_TRUE(ComesTrue([&] { return Pactl({"list", "short", "sink-inputs"}) != before; }));
  Player alarm({Role("alarm")});
  EXPECT_EQ(first.Finish(), 0);
  alarm.Kill();
  EXPECT_EQ(ListStreams(RoleLine("phone")).size(), 1u);
  second.Kill();
  EXPECT_EQ(listener.Take(), "code 0");
  EXPECT_THAT(ListStreams(RoleLine("phone")), IsEmpty());

  sound_call_session_h own = nullptr;  // is no interruption
  ASSERT_EQ(sound_manager_call_session_create(1, &own), 0);
  EXPECT_FALSE(ListStreams(RoleLine("phone")).at(0).isCorked);
  ASSERT_EQ(sound_manager_call_session_destroy(own), 0);
  EXPECT_THAT(ListStreams(RoleLine("phone")), IsEmpty());

  const Player muted({Role("alarm")});
  EXPECT_EQ(listener.Take(), "code 6");
  for (const char* mute : {"1", "0"}) {
    Pactl({"set-sink-input-mute", IndexOf(muted), mute});
    EXPECT_EQ(listener.Take(), *mute == '1' ? "code 0" : "code 6");
  }
}

TEST_F(SoundManagerDesktop, CallThatRunsAlreadyIsReportedToEachWhoRegisters) {
  OtherCall call;
  for (int time = 0; time < 2; ++time) {
    NativeListener listener(NativeListener::kInterruptions);
    EXPECT_EQ(listener.Take(), "code 5");
  }
  NativeListener listener(NativeListener::kInterruptions);
  EXPECT_EQ(listener.Take(), "code 5");
  EXPECT_EQ(call.Finish(), 0);
  EXPECT_EQ(listener.Take(), "code 0");
}

TEST_F(SoundManagerDesktop, WhatIsTakenAwayDisrupts) {
  // pacat in the place of one of this process's players.
  const std::vector<std::string> asPlayer = {
      Role("music"), "application.process.id=" + std::to_string(getpid()), "zelkora.player=1"};
  NativeListener listener(NativeListener::kInterruptions);
  {
    const Player player(asPlayer);
    EXPECT_THAT(listener.TakeAll(), IsEmpty());  // and the device knows the stream
    KillStream(player.GetIndex());
    EXPECT_EQ(listener.Take(), "code 1");
  }
  Player player(asPlayer);
  Pactl({"suspend-sink", "first", "1"});
  if (IsOnPipeWire()) {  // whoever plays resumes it at once, so that code 1 can be missing
    EXPECT_TRUE(ComesTrue([] {
      return Pactl({"list", "short", "sinks"}).find("RUNNING") != std::string::npos;
    }));
    EXPECT_THAT(listener.TakeAll(), testing::Each("code 1"));
  } else {
    EXPECT_EQ(listener.Take(), "code 1");
    Pactl({"suspend-sink", "first", "0"});
  }

  Pactl({"load-module", "module-null-sink", "sink_name=second"});
  UnloadSink("first");  // the stream goes over to the second
  EXPECT_EQ(listener.Take(), "code 3");
}

TEST_F(SoundManagerDesktop, OnlySinkThatVanishesDisruptsOnceAndMuteAndCallsAreRefusedWithoutOne) {
  const Player player(
      {Role("music"), "application.process.id=" + std::to_string(getpid()), "zelkora.player=1"});
  sound_call_session_h call = nullptr, second = nullptr;
  bool isMuted = false;
  ASSERT_EQ(sound_manager_call_session_create(1, &call), 0);
  NativeListener listener(NativeListener::kInterruptions);
  UnloadSink("first");
  EXPECT_EQ(listener.Take(), "code 3");
  EXPECT_THAT(listener.TakeAll(), IsEmpty());
  const int code = IsOnPipeWire() ? 0 : -38;  // it makes a sink where there is none
  EXPECT_TRUE(ComesTrue([=] { return sound_manager_set_muteall(true) == code; }));
  EXPECT_TRUE(ComesTrue([] { return sound_manager_set_volume(kMedia, 7) == 0; }));
  EXPECT_EQ(sound_manager_get_muteall(&isMuted), code);
  EXPECT_EQ(sound_manager_call_session_create(1, &second), code);
  Pactl({"load-module", "module-null-sink"});
  EXPECT_TRUE(ComesTrue([] { return sound_manager_set_muteall(true) == 0; }));
  if (second == nullptr) {
    EXPECT_EQ(sound_manager_call_session_create(1, &second), 0);
  }
  EXPECT_TRUE(ComesTrue([] { return ListStreams(RoleLine("phone")).size() == 2; }));
  for (auto* open : {call, second}) EXPECT_EQ(sound_manager_call_session_destroy(open), 0);
}

TEST_F(SoundManagerDesktop, CallbackMayUseTheSoundManagerAndRemoveItself) {
  static Inbox done;
  const auto callback = [](int, int level, void*) {
    done.Put(std::to_string(sound_manager_set_volume(kMedia, level + 1)));
    done.Put(std::to_string(sound_manager_unset_volume_changed_cb()));
  };
  ASSERT_EQ(sound_manager_set_volume_changed_cb(callback, nullptr), 0);
  ASSERT_EQ(sound_manager_set_volume(kMedia, 7), 0);
  EXPECT_EQ(done.Take(), "0");
  EXPECT_EQ(done.Take(), "0");
  EXPECT_EQ(GetLevel(kMedia), 8);
}

std::string Media(const char* name) {
  return std::string(std::getenv("ZELKORA_TEST_MEDIA")) + "/" + name;
}
std::string Film() { return Media("sample.webm"); }

TEST_F(SoundManagerDesktop, SessionDecidesTheRoleOfPlayersStreams) {
  // A sink that takes up a new stream soon.
  Pactl({"load-module", "module-null-sink", "sink_name=prompt", "norewinds=1"});
  Pactl({"set-default-sink", "prompt"});
  const struct {
    int type, option;
    const char* role;
  } rows[] = {
      {1, 0, "alarm"}, {2, 0, "notification"}, {3, 0, "alarm"}, {0, 1, "game"}, {0, 0, "music"}};
  EXPECT_EQ(sound_manager_set_session_type(4), -22);
  NativeListener listener(NativeListener::kInterruptions);
  Tizen::Media::Player playing;
  Tizen::Media::Player paused;
  for (auto* player : {&playing, &paused}) {
    ASSERT_EQ(player->Construct(), E_SUCCESS);
    ASSERT_EQ(player->OpenFile(Film().c_str()), E_SUCCESS);
  }
  ASSERT_EQ(playing.Play(), E_SUCCESS);
  for (const auto& row : rows) {
    SCOPED_TRACE(row.role);
    const long position = playing.GetPosition();
    ASSERT_EQ(sound_manager_set_session_type(row.type), 0);
    ASSERT_EQ(sound_manager_set_media_session_option(row.option, 0), 0);
    Tizen::Media::Player opened;
    ASSERT_EQ(opened.Construct(), E_SUCCESS);
    ASSERT_EQ(opened.OpenFile(Film().c_str()), E_SUCCESS);
    ASSERT_EQ(paused.Play(), E_SUCCESS);
    EXPECT_TRUE(ComesTrue([&] { return ListStreams(RoleLine(row.role)).size() == 3; }));
    EXPECT_TRUE(ComesTrue([&] { return playing.GetPosition() > position; }));
    ASSERT_EQ(paused.Pause(), E_SUCCESS);
  }
  const auto isBridged = [] { return !ListStreams("media.name = \"silence\"").empty(); };
  ASSERT_EQ(sound_manager_set_session_type(2), 0);
  EXPECT_TRUE(ComesTrue(isBridged));
  ASSERT_EQ(playing.Pause(), E_SUCCESS);
  EXPECT_TRUE(ComesTrue([=] { return !isBridged(); })) << "the sink stays awake";
  ASSERT_EQ(sound_manager_set_session_type(0), 0);
  const Player alarm({Role("alarm")});  // the first that interrupts
  EXPECT_EQ(listener.Take(), "code 6");
}

void ExpectPlays(Tizen::Media::Player& player) {
  EXPECT_EQ(player.OpenFile(Film().c_str()), E_SUCCESS);
  EXPECT_EQ(player.Play(), E_SUCCESS);
  EXPECT_TRUE(ComesTrue([&] { return player.GetPosition() > 0; }));
}

TEST_F(SoundManagerDesktop, PlayerPlaysOnThoughTheServerWasSlowToPauseIt) {
  Tizen::Media::Player player;
  ASSERT_EQ(player.Construct(), E_SUCCESS);
  ExpectPlays(player);
  for (long position = 200; position <= 2000; position += 200) {
    ASSERT_TRUE(ComesTrue([&] { return player.GetPosition() > position; })) << position;
    server.Signal(SIGSTOP);
    std::thread slow([&] {
      std::this_thread::sleep_for(std::chrono::milliseconds(30));
      server.Signal(SIGCONT);
    });
    EXPECT_EQ(player.Pause(), E_SUCCESS);
    slow.join();
    ASSERT_EQ(player.Play(), E_SUCCESS);
  }
}

/// Runs \p call and expects \p code at once, that is without the bound of a wait that never ends.
void ExpectSoon(int code, const std::function<int()>& call) {
  const auto begin = std::chrono::steady_clock::now();
  EXPECT_EQ(call(), code);
  EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(3));
}

/// Every call that needs the server.
void ExpectAll(int code) {
  int level = 0;
  bool isMuted = false;
  sound_call_session_h call = nullptr;
  ExpectSoon(code, [&] { return sound_manager_get_volume(kMedia, &level); });
  ExpectSoon(code, [&] { return sound_manager_set_volume(kMedia, 7); });
  ExpectSoon(code, [&] { return sound_manager_get_muteall(&isMuted); });
  ExpectSoon(code, [&] { return sound_manager_set_muteall(true); });
  ExpectSoon(code, [&] { return sound_manager_call_session_create(1, &call); });
}

TEST(SoundServerFaults, CallbacksReportAgainByThemselvesWhenTheServerIsBack) {
  SoundServer server;
  NativeListener listener(NativeListener::kAll);
  ExpectAll(-111);
  server.Start();
  listener.TakeAll();  // from those of the server before
  ASSERT_EQ(sound_manager_set_volume(kMedia, 4), 0);
  EXPECT_EQ(listener.Take(), Level(kMedia, 4));
  const Player call({Role("phone")});
  EXPECT_EQ(listener.Take(), "code 5");
  server.Kill();
  EXPECT_EQ(listener.Take(), "code 4");
  server.ForgetVolumes();

  server.Start();
  EXPECT_EQ(listener.Take(), Level(kMedia, kMax));
  const Player secondCall({Role("phone")});
  EXPECT_EQ(listener.Take(), "code 5");
}

TEST(SoundServerFaults, PlayersFailWithTheServerAndCanBeOpenedOnTheNextWhileOthersCant) {
  SoundServer server;
  server.Start();
  Tizen::Media::Player players[3];
  for (auto& player : players) ASSERT_EQ(player.Construct(), E_SUCCESS);
  for (auto* player : {&players[0], &players[1]}) {
    ASSERT_EQ(player->OpenFile(Film().c_str()), E_SUCCESS);
    ASSERT_EQ(player->Play(), E_SUCCESS);
    EXPECT_TRUE(ComesTrue([&] { return player->GetPosition() > 100; }));
  }
  server.Kill();
  EXPECT_TRUE(ComesTrue([&] { return players[1].GetPosition() < 0; }));
  ExpectSoon(E_SYSTEM, [&] { return players[1].Play(); });
  ExpectSoon(E_SYSTEM, [&] { return players[1].Pause(); });
  ExpectSoon(E_SYSTEM,
             [&] { return Tizen::Media::_PlayerImpl::GetInstance(&players[1])->SeekTo(0, false); });
  server.Start();
  for (auto* player : {&players[1], &players[2]}) ExpectPlays(*player);  // reopened and new
  EXPECT_TRUE(ComesTrue([] { return ListStreams(RoleLine("music")).size() == 2; }));
}

/// Uses the sound manager as a forked child, and ends as programs do. \return does not
[[noreturn]] void UseAsForkedChild() {
  alarm(5);
  ExpectAll(-111);
  int value = 0;
  EXPECT_EQ(sound_manager_set_session_type(1), 0);
  EXPECT_EQ(sound_manager_get_session_type(&value), 0);
  EXPECT_EQ(sound_manager_get_max_volume(kMedia, &value), 0);
  EXPECT_EQ(sound_manager_unset_volume_changed_cb(), 0);
  const int status = testing::Test::HasFailure() ? 1 : 0;
#ifdef __SANITIZE_ADDRESS__
  _exit(status);  // what the parent's other threads hold would count as lost at `exit`
#endif
  std::exit(status);
}

TEST(SoundServerFaults, ForkedChildIsRefusedAtOnceWhateverTheParentDoes) {
  SoundServer server;
  server.Start();
  std::atomic<bool> isOver{false};
  std::thread user([&] {
    for (int level = 0; !isOver; level = (level + 1) % kMax) {
      sound_manager_set_volume(kMedia, level);
    }
  });
  {
    NativeListener listener(NativeListener::kAll);
    for (int i = 0; i < 20; ++i) {
      const pid_t child = fork();
      if (child == 0) UseAsForkedChild();
      int status = -1;
      waitpid(child, &status, 0);
      EXPECT_EQ(status, 0);
    }
  }
  isOver = true;
  user.join();
}

TEST(SoundServerFaults, OpenCallIsOpenedAgainByItself) {
  SoundServer server;
  server.Start();
  sound_call_session_h call = nullptr;
  ASSERT_EQ(sound_manager_call_session_create(1, &call), 0);
  ASSERT_EQ(sound_manager_call_session_set_mode(call, 2), 0);
  server.Kill();
  ExpectSoon(-111, [&] { return sound_manager_call_session_set_mode(call, 1); });
  server.Start();
  ASSERT_EQ(sound_manager_call_session_set_mode(call, 2), 0);
  EXPECT_EQ(ListStreams(RoleLine("phone")).size(), 1u);
  server.Kill();
  EXPECT_EQ(sound_manager_call_session_destroy(call), 0);
  server.Start();
  EXPECT_EQ(GetLevel(kMedia), kMax);
  EXPECT_THAT(ListStreams(RoleLine("phone")), IsEmpty());
}

TEST(SoundServerFaults, RefusedAccessIsAnErrorUntilItIsGranted) {
  if (IsOnPipeWire()) GTEST_SKIP() << "PipeWire asks for no cookie";
  const std::string port = std::to_string(10000 + getpid() % 20000);  // below the system's own
  SoundServer server(
      {"module-null-sink", "module-stream-restore",
       "module-native-protocol-tcp listen=127.0.0.1 port=" + port + " auth-cookie=right"});
  const std::string usual = std::getenv("PULSE_SERVER");
  setenv("PULSE_SERVER", ("tcp:127.0.0.1:" + port).c_str(), 1);
  setenv("PULSE_COOKIE", "wrong", 1);
  server.Start();
  ExpectAll(-13);
  setenv("PULSE_COOKIE", "right", 1);
  EXPECT_EQ(sound_manager_set_volume(kMedia, 7), 0);
  setenv("PULSE_SERVER", usual.c_str(), 1);
  unsetenv("PULSE_COOKIE");
}

TEST(SoundServerFaults, ServerThatDoesNotAnswerIsATimeOutAndCallsStayAsTheyWere) {
  SoundServer server;
  server.Start();
  server.Signal(SIGSTOP);  // before it is connected
  int level = 0;
  ExpectSoon(-110, [&] { return sound_manager_get_volume(kMedia, &level); });
  server.Signal(SIGCONT);
  EXPECT_EQ(GetLevel(kMedia), kMax);
  sound_call_session_h call = nullptr;
  ASSERT_EQ(sound_manager_call_session_create(1, &call), 0);
  server.Signal(SIGSTOP);
  ExpectAll(-110);
  ExpectSoon(-110, [&] { return sound_manager_call_session_set_mode(call, 2); });
  server.Signal(SIGCONT);
  EXPECT_EQ(sound_manager_set_volume(kMedia, 5), 0);
  EXPECT_EQ(GetLevel(kMedia), 5);
  EXPECT_TRUE(ComesTrue([] { return ListStreams(RoleLine("phone")).size() == 1; }));
  EXPECT_EQ(ListStreams("zelkora.call.mode = \"voice\"").size(), 1u);
  EXPECT_EQ(sound_manager_call_session_destroy(call), 0);
}

TEST(SoundServerFaults, StoredVolumeThatPipeWireLosesIsATimeOut) {
  if (!IsOnPipeWire()) GTEST_SKIP() << "PulseAudio keeps what it acknowledges";
  SoundServer server;
  server.Start();
  ASSERT_EQ(sound_manager_set_volume(kSystem, 5), 0);
  server.SignalSessionManager(SIGSTOP);
  ExpectSoon(-110, [] { return sound_manager_set_volume(kSystem, 7); });
  server.SignalSessionManager(SIGCONT);
  EXPECT_EQ(sound_manager_set_volume(kSystem, 7), 0);
}

TEST(SoundServerFaults, WithoutStoredVolumesLevelsAreRefusedUntilThereAre) {
  if (IsOnPipeWire()) GTEST_SKIP() << "PipeWire always keeps volumes";
  SoundServer server({"module-null-sink sink_name=first"});
  server.Start();
  int level = 0;
  EXPECT_EQ(sound_manager_set_volume(kMedia, 7), -38);
  EXPECT_EQ(sound_manager_get_volume(kMedia, &level), -38);
  EXPECT_EQ(sound_manager_set_muteall(true), 0);
  Pactl({"load-module", "module-stream-restore"});
  NativeListener listener(NativeListener::kLevels);
  ASSERT_EQ(sound_manager_set_volume(kMedia, 7), 0);
  const Player music({Role("music")});
  Pactl({"set-sink-input-volume", IndexOf(music), "20%"});
  EXPECT_EQ(listener.Take(), Level(kMedia, 7));
  EXPECT_EQ(listener.Take(), Level(kMedia, 3));
}

struct Footprint {
  std::ptrdiff_t files;
  std::ptrdiff_t threads;
  std::size_t bytes;

  static Footprint Take() {
    std::this_thread::sleep_for(std::chrono::seconds(1));  // GStreamer frees some things later
    const auto count = [](const char* directory) {
      return std::distance(std::filesystem::directory_iterator(directory), {});
    };
    return {count("/proc/self/fd"), count("/proc/self/task"), mallinfo2().uordblks};
  }
};

TEST(SoundServerFaults, HundredDeathsOfTheServerLeaveNothingBehind) {
  if (IsOnPipeWire()) GTEST_SKIP() << "some of a hundred PipeWires come up keeping no volumes";
  constexpr int kWarmUp = 10;
  constexpr int kDeaths = 100;
  constexpr std::size_t kNoise = 64 * 1024;  // buffers that libpulse and the C library keep
  SoundServer server;
  server.Start();
  NativeListener listener(NativeListener::kAll);
  sound_call_session_h call = nullptr;
  ASSERT_EQ(sound_manager_call_session_create(1, &call), 0);
  Footprint before = {};
  for (int i = 0; i < kWarmUp + kDeaths; ++i) {
    SCOPED_TRACE(i);
    if (i == kWarmUp) before = Footprint::Take();
    Tizen::Media::Player players[2];
    for (auto& player : players) {
      ASSERT_EQ(player.Construct(), E_SUCCESS);
      ExpectPlays(player);
    }
    std::thread user([] {
      while (sound_manager_set_volume(kMedia, rand() % 10) == 0) {
      }
    });
    server.Kill();
    user.join();
    ASSERT_TRUE(ComesTrue([&] { return listener.Take() == "code 4"; }));
    server.Start();
    const auto begin = std::chrono::steady_clock::now();
    ASSERT_EQ(sound_manager_call_session_set_mode(call, i % 3), 0);
    ASSERT_EQ(sound_manager_set_volume(kMedia, 10 + i % 2), 0);
    ASSERT_EQ(sound_manager_set_muteall(true), 0);
    ASSERT_TRUE(ComesTrue([&] { return listener.Take() == Level(kMedia, 10 + i % 2); }));
    ASSERT_EQ(listener.Take(), "muted");
    ExpectPlays(players[0]);
    ASSERT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(2));
    listener.TakeAll();
  }
  const Footprint after = Footprint::Take();
  EXPECT_LE(after.files, before.files);
  EXPECT_LE(after.threads, before.threads);
  EXPECT_TRUE(ComesTrue([&] { return Footprint::Take().bytes <= before.bytes + kNoise; }));
  ASSERT_EQ(sound_manager_call_session_destroy(call), 0);
}

/// Hears through the library.
struct LibraryListener : Zelkora::Media::IAudioVolumeEventListener,
                         Zelkora::Media::IAudioSessionEventListener {
  void OnMediaVolumeChanged(int level) override { heard.Put(Level(kMedia, level)); }
  void OnAudioSessionInterruptStarted() override { heard.Put("started"); }
  void OnAudioSessionInterruptFinished() override { heard.Put("finished"); }
  void OnAudioSessionDisrupted() override { heard.Put("disrupted"); }
  Inbox heard;
};

/// Uses all managers on one server after the other, and leaves them and their listeners alive.
void UseTheLibraryAndExit() {
  using namespace Zelkora::Media;
  static SoundServer server;
  static LibraryListener listener;
  Inbox& heard = listener.heard;
  AudioVolumeManager* volume = AudioVolumeManager::GetInstance();  // there is no server yet
  VoipAudioSessionManager* call = VoipAudioSessionManager::GetInstance();
  AudioSessionManager* session = AudioSessionManager::GetInstance();
  bool good = volume->AddAudioVolumeEventListener(listener) == E_SUCCESS &&
              session->SetAudioSessionEventListener(&listener) == E_SUCCESS &&
              volume->SetMediaVolumeLevel(3) == E_SYSTEM && call->EnterCallSession() == E_SYSTEM;
  for (const result entered : {E_SUCCESS, E_INVALID_OPERATION}) {
    server.Start();
    if (entered != E_SUCCESS) good = good && heard.Take() == Level(kMedia, kMax);  // by itself
    good = good && volume->SetMediaVolumeLevel(3) == E_SUCCESS && heard.Take() == "4=3" &&
           call->EnterCallSession() == entered;
    {
      const Player alarm({Role("alarm")});
      good = good && heard.Take() == "started";
    }
    good = good && heard.Take() == "finished";
    server.Kill();
    server.ForgetVolumes();
    good = good && heard.Take() == "disrupted";
  }
  std::exit(good ? 0 : 1);
}

TEST(SoundServerFaultsDeathTest, LibraryOutlivesTheServerAndTheProcessEndsCleanly) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  EXPECT_EXIT(UseTheLibraryAndExit(), testing::ExitedWithCode(0), "");
}

/// The other process of `OtherCall`.
int HoldCall() {
  sound_call_session_h call = nullptr;
  if (sound_manager_call_session_create(1, &call) != 0) return 1;
  std::puts("open");
  std::fflush(stdout);
  while (std::getchar() != EOF) {
  }
  return sound_manager_call_session_destroy(call) == 0 ? 0 : 1;
}

int PrintLevels() {
  for (int type = 0; type < kCategories; ++type) std::printf("%d ", GetLevel(type));
  return 0;
}

}  // namespace

int main(int count, char** arguments) {
  const std::string first = count > 1 ? arguments[1] : "";
  if (first == "--call") return HoldCall();
  if (first == "--get") return PrintLevels();
  if (first == "--set") {
    return sound_manager_set_volume(std::atoi(arguments[2]), std::atoi(arguments[3]));
  }
  testing::InitGoogleMock(&count, arguments);
  return RUN_ALL_TESTS();
}
