// Provokes every row of docs/errors.md, each in a process of its own.

#include "support/Allocations.h"
#include "support/Operations.h"
#include "support/OwnProcess.h"
#include "support/ReadFile.h"

#include <Tizen/Media/PlayerImpl.h>

#include <regex>
#include <set>

namespace {

using namespace Zelkora::Media;

/// A row of the page, or a case of it: one class, one operation, one code.
struct Row {
  std::vector<std::string> classes, operations;
  std::string cause, returned, last;
  Lines log;

  std::string className = "", operation = "";
  int code = -38;
  result converted = E_INVALID_OPERATION;
};

/// The page's rows, and the results of the device's numbers.
struct Page {
  std::vector<Row> rows;
  std::map<int, result> soundManagerNumbers, playerNumbers;
};

std::string ReadSource(const std::string& path) { return ReadFile(ZELKORA_SOURCE_DIR "/" + path); }

/// \return what \p pattern's first group matches in \p text, each time
Lines FindAll(const std::string& text, const std::string& pattern) {
  static std::map<std::string, std::regex> known;  // making one takes long
  const std::regex& regex = known.try_emplace(pattern, pattern).first->second;
  Lines found;
  for (std::sregex_iterator i(text.begin(), text.end(), regex), end; i != end; ++i) {
    found.push_back((*i)[1]);
  }
  return found;
}

Lines Quoted(const std::string& text) { return FindAll(text, "`([^`]*)`"); }

/// \return the name in a cell, or its plain text
std::string Entry(const std::string& cell) {
  const Lines quoted = Quoted(cell);
  return quoted.empty() ? cell : quoted.front();
}

result FromName(const std::string& name) {
  for (const result r : {E_INVALID_ARG, E_INVALID_OPERATION, E_INVALID_STATE, E_OUT_OF_MEMORY}) {
    if (name == GetErrorMessage(r)) return r;
  }
  return E_SYSTEM;
}

Page ReadPage() {
  Page page;
  Lines classes;
  std::map<int, result>* numbers = nullptr;
  std::istringstream lines(ReadSource("docs/errors.md"));
  for (std::string line; std::getline(lines, line);) {
    if (line.rfind("## ", 0) == 0) classes = FindAll(line, "([A-Za-z]+)");
    if (line.rfind("| Sound manager's", 0) == 0) numbers = &page.soundManagerNumbers;
    if (line.rfind("| Player's", 0) == 0) numbers = &page.playerNumbers;
    const Lines cells = FindAll(line + " ", "\\| (.*?) (?=\\| )");
    if (cells.size() == 2 && line.find('`') != line.npos) {
      (*numbers)[std::stoi(cells[0].substr(cells[0].rfind('-')))] = FromName(Entry(cells[1]));
    } else if (cells.size() == 3 && line.rfind("| `", 0) == 0) {
      page.rows.push_back({Quoted(cells[0]), {""}, cells[1], "", "as it was", Quoted(cells[2])});
    } else if (cells.size() == 5 && line.rfind("| `", 0) == 0) {
      page.rows.push_back({classes, Quoted(cells[0]), cells[1], Entry(cells[2]), Entry(cells[3]),
                           Quoted(cells[4])});
    }
  }
  return page;
}

std::optional<FailingAllocation> failing;

void SetFeatures(result answer) {
  for (const auto feature : Host::kFeatures) Host::SetFeature(feature, answer);
}

void Mute() { Simulated::ReportMuteAll(true), Host::WaitUntilDelivered(); }
void Interrupt(int code) { Simulated::Interrupt(code), Host::WaitUntilDelivered(); }
void Change(int type) { Simulated::ReportVolume(type, 3), Host::WaitUntilDelivered(); }
std::string Name(const Row& row) { return row.className + "::" + row.operation; }
Answer Perform(const Row& row) { return kOperations.at(Name(row))(); }
void OpenFile() { player->OpenFile("movie"); }

/// The privilege that each class needs; the others are there.
std::map<std::string, std::string> privileges = {
    {"AudioSessionManager", Privilege<Session>()},
    {"VoipAudioSessionManager", Privilege<Call>()},
    {"AudioVolumeManager", Privilege<Volume>()},
};

const Simulated::Effects kNoEffects{{}, {}}, kUnknownEffect{{2, 6}, {}},
    kUnknownPreset{{}, {20, 2}};
const Simulated::Media kSoundAlone{60000, 2000, {}, false};

/// How each cause comes about, but for functions that merely refuse.
const std::map<std::string, std::function<void(const Row&)>> kCauses = {
    {"the privilege is missing",
     [](auto& row) { Host::SetPrivilege(privileges[row.className], E_SYSTEM); }},
    {"the device lacks the feature", [](auto&) { SetFeatures(Host::kFeatureAbsent); }},
    {"the platform doesn't know the feature", [](auto&) { SetFeatures(E_OBJ_NOT_FOUND); }},
    {"the feature can't be looked up", [](auto&) { SetFeatures(kForeign); }},
    {"no memory for the manager", [](auto&) { failing.emplace(0); }},
    {"no memory for the implementation",
     [](const Row& row) { failing.emplace(row.operation == "GetInstance" ? 1 : 0); }},
    {"no memory for the event", [](auto&) { failing.emplace(2); }},
    {"no memory for the list", [](auto&) { failing.emplace(0); }},
    {"the creation failed at an earlier call",
     [](auto& row) { failing.emplace(0), Perform(row), failing.reset(); }},
    {"a session is open already", [](auto&) { Call::GetInstance()->EnterCallSession(); }},
    {"no session is open", [](auto&) {}},
    {"the device succeeds and gives no session",
     [](auto&) { Simulated::SetCallSessionFault(Simulated::CallSessionFault::kNoSession); }},
    {"the mode is 5",
     [](auto& row) { MakeReady(row.operation), callMode = VoipAudioSessionMode(5); }},
    {"the level is out of range", [](auto&) { level = -1; }},
    {"the listener is added already", Perform},
    {"the listener isn't added", [](auto&) {}},
    {"the player was never constructed",
     [](auto&) { effector.emplace(), seeker.emplace(), player.emplace(); }},
    {"the player has no native handle",
     [](auto&) {
       effector.emplace(), seeker.emplace();  // or they would use what is gone
       auto& handle = Tizen::Media::_PlayerImpl::GetInstance(&*player)->__hPlayer;
       player_destroy(std::exchange(handle, nullptr));
     }},
    {"the player supports no effect and no preset",
     [](auto&) { Simulated::SetEffects(kNoEffects); }},
    {"it has succeeded before", Perform},
    {"`Construct` hasn't succeeded", [](auto&) { effector.emplace(), seeker.emplace(); }},
    {"the player reports an unknown effect, which is left out",
     [](auto&) { Simulated::SetEffects(kUnknownEffect); }},
    {"the player reports an unknown preset, which is left out",
     [](auto&) { Simulated::SetEffects(kUnknownPreset); }},
    {"the effect is 6", [](auto&) { effect = AudioEffectType(6); }},
    {"the preset is 20", [](auto&) { preset = AudioEffectPreset(20); }},
    {"no file is open", [](auto&) {}},
    {"the position is outside the film", [](auto&) { OpenFile(), position = -1; }},
    {"the file has no video", [](auto&) { Simulated::SetMedia(kSoundAlone), OpenFile(); }},
};

/// How each line without an operation comes about.
const std::map<std::string, std::function<void(const Row&)>> kChanges = {
    {"an interruption of code 0 to 6; the listener hears of it", [](auto&) { Interrupt(5); }},
    {"an interruption of another code", [](auto&) { Interrupt(7); }},
    {"an interruption without user data",
     [](auto&) { Simulated::ReportWithoutUserData(true), Interrupt(5); }},
    {"an interruption without memory for its event",
     [](auto&) { failing.emplace(0), Interrupt(5); }},
    {"an interruption that begins, and `_Event::FireAsync` refuses", [](auto&) { Interrupt(5); }},
    {"a disruption, and `_Event::FireAsync` refuses", [](auto&) { Interrupt(1); }},
    {"a session is open at exit, and `sound_manager_call_session_destroy` refuses",
     [](auto&) { call->EnterCallSession(); }},
    {"a change of an unknown sound type", [](auto&) { Change(6); }},
    {"a change without user data",
     [](auto&) { Simulated::ReportWithoutUserData(true), Change(4); }},
    {"a change without memory for its event", [](auto&) { failing.emplace(0), Change(4); }},
    {"a mute without user data", [](auto&) { Simulated::ReportWithoutUserData(true), Mute(); }},
    {"a change, and `_Event::FireAsync` refuses", [](auto&) { Change(4); }},
};

std::string Replace(std::string text, const std::string& from, const std::string& to) {
  const std::size_t at = text.find(from);
  return at == text.npos ? text : text.replace(at, from.size(), to);
}

/// \return the cases of the rows: each class, operation and code of each
std::vector<Row> Cases(const Page& page) {
  std::vector<Row> cases;
  for (Row row : page.rows) {
    const std::string answers = row.returned + row.last;
    const bool isPlatforms = row.cause.find("FireAsync") != row.cause.npos ||
                             answers.find("the platform's code") != answers.npos;
    const bool isConverted = answers.find("the converted code") != answers.npos;
    for (const std::string& className : row.classes) {
      std::map<int, result> codes = {isPlatforms ? std::pair{int(kForeign), kForeign}
                                                 : std::pair{-38, E_INVALID_OPERATION}};
      if (isConverted)
        codes = className == "AudioEffector" ? page.playerNumbers : page.soundManagerNumbers;
      row.className = className;
      for (const std::string& pattern : row.operations) {
        for (const Category& category : kCategories) {
          row.operation = Replace(pattern, "*", NameInOperations(category));
          for (const auto& [code, converted] : codes) {
            row.code = code;
            row.converted = converted;
            cases.push_back(row);
          }
          if (pattern.find('*') == pattern.npos) break;
        }
      }
    }
  }
  return cases;
}

/// \return what a row says: the answer, the last result, the log
Lines Told(const Row& row) {
  const auto meant = [&](const std::string& cell) -> std::string {
    if (cell == "as it was") return GetErrorMessage(kUntouched);
    return cell.find("code") == cell.npos ? cell : GetErrorMessage(row.converted);
  };
  char hex[16];
  std::snprintf(hex, sizeof hex, "0x%x", unsigned(row.code));
  Lines told = {meant(row.returned), meant(row.last == "same" ? row.returned : row.last)};
  for (const std::string& line : row.log) {
    const std::string named =
        Replace(Replace(line, "RESULT", GetErrorMessage(row.converted)), "\\t", "\t");
    told.push_back(Replace(Replace(named, "0xCODE", hex), "CODE", std::to_string(row.code)));
  }
  return told;
}

class ErrorReference : public LibraryTest {
 protected:
  void Arrange(const Row& row) {
    if (row.cause.find("` refuses") != row.cause.npos) {
      const std::string function = FindAll(row.cause, "`([^`]*)` refuses").front();
      if (row.operation != "GetInstance" && row.operation != "Construct") MakeReady(row.operation);
      if (row.operation == "SetAudioSessionEventListener") Perform(row);
      Host::FailCall(function.c_str(), row.code);
    }
    Forget();
    for (const auto* all : {&kCauses, &kChanges}) {
      if (all->count(row.cause) != 0) all->at(row.cause)(row);
    }
  }

  /// Brings a row's cause about, in a process of its own, and has what comes of it judged.
  /// \return whether that is well
  bool Provoke(const Row& row, const std::function<void(const Lines&)>& judge) {
    return StatusOfOwnProcess([&, this] {
             std::string answer;
             const auto finish = [&, this] {
               Lines outcome = {answer, GetErrorMessage(GetLastResult())};
               failing.reset();
               for (const std::string& line : log.Take()) outcome.push_back(line);
               judge(outcome);
             };
             const bool isAtExit = row.cause.find("at exit") != row.cause.npos;
             if (isAtExit) CheckAtExit(finish);  // what comes first is run last there
             Prepare(row.operation);
             Arrange(row);
             if (isAtExit) std::exit(0);
             if (!row.operation.empty()) {
               log.Take();
               log.operation = row.operation;
               SetLastResult(kUntouched);
               answer = Perform(row).Text();
             }
             finish();
           }) == 0;
  }

  const std::vector<Row> cases = Cases(ReadPage());
};

TEST_F(ErrorReference, SaysOfEachRowWhatTheLibraryDoes) {
  std::string untrue;
  for (const Row& row : cases) {
    const auto isTrue = [&](const Lines& outcome) { EXPECT_EQ(outcome, Told(row)); };
    if (!Provoke(row, isTrue)) untrue += Name(row) + ": " + row.cause + "\n";
  }
  EXPECT_EQ(untrue, "");
}

/// \return the operations that the headers declare
Lines Declared() {
  Lines declared;
  for (const std::string name : {"AudioEffector", "AudioSessionManager", "VoipAudioSessionManager",
                                 "AudioVolumeManager", "VideoKeyFrameSeeker"}) {
    std::string header = ReadSource("inc/Zelkora/Media/" + name + ".h");
    header = header.substr(header.find("\nclass ZELKORA_MEDIA_API"));
    header.resize(header.find("private:"));
    for (const std::string& operation : FindAll(header, "\n  [\\w:<>* ]* \\*?(\\w+)\\(")) {
      declared.push_back(name + "::" + operation);
    }
  }
  return declared;
}

TEST_F(ErrorReference, HasARowForEachFailureOfEachOperationOfTheHeaders) {
  std::set<Lines> told;
  for (const Row& row : cases) {
    told.insert({row.cause});
    told.insert({Name(row), row.cause.substr(0, row.cause.find(';'))});
    Lines outcome = Told(row);
    outcome.push_back(Name(row));
    told.insert(outcome);
  }
  std::string missing;
  Lines causes;
  for (const auto* all : {&kCauses, &kChanges}) {
    for (const auto& [cause, bring] : *all) {
      if (told.count({cause}) == 0) missing += cause + "\n";
      if (all == &kCauses) causes.push_back(cause);
    }
  }
  const std::string functions =
      "int _Event::Initialize( int _Event::AddListener( int _Event::RemoveListener( "
      "int _PlayerImpl::SeekTo(" +
      ReadSource("platform/include/sound_manager.h") + ReadSource("platform/include/player.h");
  for (const auto& function :
       FindAll(functions, "int ((_|sound_manager_(?!unset)|player_audio)[\\w:]+)\\(")) {
    causes.push_back("`" + function + "` refuses");
  }
  for (const std::string& name : Declared()) {
    for (const std::string& cause : causes) {
      Row row;
      row.className = name.substr(0, name.find(':'));
      row.operation = name.substr(name.rfind(':') + 1);
      row.cause = cause;
      const bool isOfItsOwn =
          !FindAll(name + cause, "(refuses|GetInstance.*feature|Construct.*feature)").empty();
      const auto isTold = [&](Lines outcome) {
        const std::string results = outcome[0] + outcome[1];
        outcome.push_back(name);
        EXPECT_TRUE(FindAll(results, "(null|E_[^S]|E_SY|0x[AF])").empty() ||
                    (!isOfItsOwn && told.count(outcome) != 0));
      };
      if (told.count({name, cause}) == 0 && !Provoke(row, isTold)) {
        missing += name + ": " + cause + "\n";
      }
    }
  }
  EXPECT_EQ(missing, "");
}

}  // namespace
