#include "SoundServer.h"

#include <sys/prctl.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <sstream>
#include <stdexcept>
#include <thread>
#include <utility>

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::seconds kStartLimit{10};
constexpr std::chrono::milliseconds kPause{1};
constexpr char kSocket[] = "/socket";

void Require(bool condition, const std::string& what) {
  if (!condition) throw std::runtime_error(what);
}

std::string MakeHome() {
  char path[] = "/tmp/zelkora-sound-XXXXXX";
  Require(mkdtemp(path) != nullptr, "no directory for the sound server");
  setenv("HOME", path, 1);
  setenv("XDG_RUNTIME_DIR", path, 1);
  for (const char* state : {"PULSE_STATE_PATH", "XDG_STATE_HOME"}) {
    setenv(state, (path + std::string("/state")).c_str(), 1);
  }
  setenv("PULSE_SERVER", (std::string("unix:") + path + kSocket).c_str(), 1);
  setenv("LC_ALL", "C", 1);
  return path;
}

/// \return the directory of this process's server, made at the first use and removed at exit.
const std::string& Home() {
  static const struct Directory {
    ~Directory() {
      if (getpid() == process) std::filesystem::remove_all(path);
    }
    const std::string path = MakeHome();
    const pid_t process = getpid();  // not a child that it forks
  } home;
  return home.path;
}

/// Waits until a program that starts listens at a socket.
void AwaitSocket(const std::string& path) {
  sockaddr_un address = {AF_UNIX, ""};
  path.copy(address.sun_path, sizeof address.sun_path - 1);
  const auto end = Clock::now() + kStartLimit;
  for (bool isThere = false; !isThere; std::this_thread::sleep_for(kPause)) {
    Require(Clock::now() < end, "nobody listens at " + path);
    const int probe = socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
    isThere = connect(probe, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0;
    close(probe);
  }
}

ListedStream ParseStream(const std::string& description) {
  ListedStream stream;
  stream.description = description;
  stream.index = std::stoi(description);
  // "Volume: front-left: 39322 /  60% / -13.31 dB,   front-right: ..."
  const std::size_t volume = description.find("Volume: ");
  std::istringstream channels(description.substr(volume, description.find('\n', volume) - volume));
  for (std::string word; channels >> word;) {
    const bool isVolume = word.find_first_not_of("0123456789") == std::string::npos;
    if (isVolume) stream.volume = std::max(stream.volume, std::stoi(word));
  }
  stream.isCorked = description.find("Corked: yes") != std::string::npos;
  return stream;
}

}  // namespace

Program::Program(std::vector<std::string> command) {
  int ends[2];
  Require(socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, ends) == 0, "no sockets");
  std::vector<char*> arguments;
  for (std::string& argument : command) arguments.push_back(argument.data());
  arguments.push_back(nullptr);
  process_ = fork();
  if (process_ == 0) {
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    for (const int stream : {STDIN_FILENO, STDOUT_FILENO}) dup2(ends[1], stream);
    execvp(arguments[0], arguments.data());
    _exit(127);
  }
  close(ends[1]);
  socket_ = ends[0];
  Require(process_ > 0, "no process for " + command[0]);
}

Program::Program(Program&& other) noexcept
    : process_(std::exchange(other.process_, -1)), socket_(std::exchange(other.socket_, -1)) {}

Program::~Program() {
  Kill();
  if (socket_ >= 0) close(socket_);
}

void Program::Signal(int signal) const { kill(process_, signal); }

void Program::Kill() {
  if (process_ < 0) return;
  Signal(SIGKILL);
  Wait();
}

void Program::Wait() {
  waitpid(process_, &status_, 0);
  process_ = -1;
}

int Program::Finish() {
  shutdown(socket_, SHUT_WR);
  Wait();
  return status_;
}

std::string Program::ReadLine() {
  std::string line;
  char character = '\0';
  while (read(socket_, &character, 1) == 1 && character != '\n') line += character;
  return line;
}

std::string Program::ReadAll() {
  std::string text;
  for (char character; read(socket_, &character, 1) == 1;) text += character;
  return text;
}

namespace {

std::string Output(std::vector<std::string> command) {
  Program program(command);
  const std::string output = program.ReadAll();
  Require(program.Finish() == 0, command[0] + " " + command[1] + " fails");
  return output;
}

}  // namespace

const std::vector<std::string> SoundServer::kModules = {"module-null-sink sink_name=first",
                                                        "module-stream-restore"};

SoundServer::SoundServer(std::vector<std::string> modules) : modules_(std::move(modules)) {
  ForgetVolumes();
  modules_.push_back("module-cli-protocol-unix");  // pacmd's
  modules_.push_back("module-native-protocol-unix socket=" + Home() + kSocket);
}

void SoundServer::ForgetVolumes() { std::filesystem::remove_all(Home() + "/state"); }

SoundServer::~SoundServer() { Kill(); }

bool IsOnPipeWire() { return std::getenv("ZELKORA_TEST_PIPEWIRE") != nullptr; }

void SoundServer::Start() {
  if (IsOnPipeWire()) return StartPipeWire();
  std::vector<std::string> command = {"pulseaudio", "-n", "--daemonize=no", "--exit-idle-time=-1",
                                      "--log-target=null"};
  for (const std::string& module : modules_) command.insert(command.end(), {"-L", module});
  processes_.emplace_back(std::move(command));
  AwaitSocket(Home() + kSocket);  // of the last module
}

/// PipeWire's session manager ends without a message bus, and is there when a stream can be heard.
/// Until then the server has another address.
void SoundServer::StartPipeWire() {
  const std::string bus = "unix:path=" + Home() + "/bus", socket = Home() + "/pulse/native";
  setenv("DBUS_SESSION_BUS_ADDRESS", bus.c_str(), 1);
  for (const char* debug : {"PIPEWIRE_DEBUG", "WIREPLUMBER_DEBUG"}) setenv(debug, "0", 1);
  std::filesystem::remove(Home() + kSocket);
  const auto start = [&](std::vector<std::string> command, const std::string& its) {
    processes_.emplace_back(std::move(command));
    AwaitSocket(its);
  };
  start({"dbus-daemon", "--session", "--nofork", "--address=" + bus}, Home() + "/bus");
  start({"pipewire"}, Home() + "/pipewire-0");
  processes_.emplace_back(std::vector<std::string>{"wireplumber"});
  start({"pipewire-pulse"}, socket);
  Pactl({"--server=" + socket, "load-module", "module-null-sink", "sink_name=first"});
  const std::string play =
      "timeout 2 pacat --raw --latency-msec=20 --property=media.role=test "
      "/proc/self/stat --server=" +
      socket;
  const auto end = Clock::now() + kStartLimit;
  while (Program({"sh", "-c", play}).Finish() != 0) {
    Require(Clock::now() < end, "PipeWire plays nothing");
  }
  Pactl({"--server=" + socket, "set-default-sink", "first"});
  std::filesystem::create_symlink(socket, Home() + kSocket);
}

void SoundServer::Kill() {
  while (!processes_.empty()) processes_.pop_back();
}

void SoundServer::Signal(int signal) const { processes_.back().Signal(signal); }

void SoundServer::SignalSessionManager(int signal) const { processes_.at(2).Signal(signal); }

std::string Pactl(std::vector<std::string> arguments) {
  arguments.insert(arguments.begin(), "pactl");
  return Output(std::move(arguments));
}

void UnloadSink(const std::string& name) {
  std::istringstream modules(Pactl({"list", "short", "modules"}));
  for (std::string line; std::getline(modules, line);) {
    const bool isIts = line.find("sink_name=" + name) != std::string::npos;
    if (isIts) Pactl({"unload-module", line.substr(0, line.find('\t'))});
  }
}

void KillStream(int index) {
  const std::string number = std::to_string(index);
  if (!IsOnPipeWire()) {
    const std::string answer = Output({"pacmd", "kill-sink-input", number});
    return Require(answer.empty(), "the sound server doesn't kill the stream: " + answer);
  }
  const auto stream = ListStreams("object.serial = \"" + number + "\"").at(0);
  const std::size_t id = stream.description.find("object.id = \"");
  Output({"pw-cli", "destroy", std::to_string(std::stoi(stream.description.substr(id + 13)))});
}

std::vector<ListedStream> ListStreams(const std::string& line) {
  constexpr char kHead[] = "Sink Input #";
  const std::string list = Pactl({"list", "sink-inputs"});
  std::vector<ListedStream> streams;
  for (std::size_t at = list.find(kHead); at != std::string::npos;) {
    const std::size_t next = list.find(kHead, at + 1);
    const std::string description = list.substr(at + sizeof kHead - 1, next - at);
    if (description.find(line) != std::string::npos) streams.push_back(ParseStream(description));
    at = next;
  }
  return streams;
}

namespace {

int lastPlayer = 0;

std::vector<std::string> MakePlayerCommand(const std::vector<std::string>& properties,
                                           int channels) {
  std::vector<std::string> command = {"pacat",
                                      "--raw",
                                      "--latency-msec=50",
                                      "/dev/zero",
                                      "--channels=" + std::to_string(channels),
                                      "--property=test.player=" + std::to_string(++lastPlayer)};
  for (const std::string& property : properties) command.push_back("--property=" + property);
  return command;
}

}  // namespace

Player::Player(std::vector<std::string> properties, int channels)
    : Program(MakePlayerCommand(properties, channels)) {
  const std::string mark = "test.player = \"" + std::to_string(lastPlayer) + "\"";
  // Each look is a round trip to the server, which makes the stream meanwhile.
  for (int look = 0; look < 1000 && index_ < 0; ++look) {
    for (const ListedStream& stream : ListStreams(mark)) {
      const bool hasSink = stream.description.find("Sink: 4294967295") == std::string::npos;
      if (hasSink) index_ = stream.index;
    }
  }
  Require(index_ >= 0, "pacat's stream doesn't come");
}
