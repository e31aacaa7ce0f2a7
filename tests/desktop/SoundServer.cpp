#include "SoundServer.h"

#include <fcntl.h>
#include <poll.h>
#include <pulse/pulseaudio.h>
#include <sys/prctl.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <stdexcept>
#include <utility>

namespace {

constexpr int kStartLimit = 10000;  // ms

void Require(bool condition, const std::string& what) {
  if (!condition) throw std::runtime_error(what);
}

/// The directory of this process's server, made at the first use and removed at exit.
class Home {
 public:
  static const Home& Get() {
    static const Home home;
    return home;
  }

  std::string operator/(const char* name) const { return path_ + "/" + name; }

 private:
  Home() : owner_(getpid()) {
    char path[] = "/tmp/zelkora-sound-XXXXXX";
    Require(mkdtemp(path) != nullptr, "no directory for the sound server");
    path_ = path;
    setenv("HOME", path, 1);
    setenv("XDG_RUNTIME_DIR", path, 1);
    setenv("PULSE_STATE_PATH", (*this / "state").c_str(), 1);
    setenv("PULSE_SERVER", ("unix:" + *this / "socket").c_str(), 1);
    setenv("LC_ALL", "C", 1);
  }
  ~Home() {
    if (getpid() == owner_) std::filesystem::remove_all(path_);
  }

  pid_t owner_;
  std::string path_;
};

/// A socket where a server that has started says so.
class ReadySocket {
 public:
  ReadySocket() : socket_(socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0)) {
    const std::string path = Home::Get() / "ready";
    unlink(path.c_str());
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    std::strncpy(address.sun_path, path.c_str(), sizeof address.sun_path - 1);
    Require(bind(socket_, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0,
            "no socket to hear of the sound server's start");
    setenv("NOTIFY_SOCKET", path.c_str(), 1);
  }
  ~ReadySocket() {
    unsetenv("NOTIFY_SOCKET");
    close(socket_);
  }

  ReadySocket(const ReadySocket&) = delete;
  ReadySocket& operator=(const ReadySocket&) = delete;

  bool Wait() {
    pollfd event = {socket_, POLLIN, 0};
    return poll(&event, 1, kStartLimit) == 1;
  }

 private:
  int socket_;
};

ListedStream ParseStream(const std::string& description) {
  ListedStream stream;
  stream.description = description;
  stream.index = std::stoi(description);
  const std::size_t volume = description.find("Volume: ");  // "Volume: mono: 39322 /  60% ..."
  if (volume != std::string::npos) {
    stream.volume = std::stoi(description.substr(description.find(": ", volume + 8) + 2));
  }
  stream.isCorked = description.find("Corked: yes") != std::string::npos;
  return stream;
}

}  // namespace

Program::Program(std::vector<std::string> command) {
  int in[2];
  int out[2];
  Require(pipe2(in, O_CLOEXEC) == 0 && pipe2(out, O_CLOEXEC) == 0, "no pipe");
  std::vector<char*> arguments;
  for (std::string& argument : command) arguments.push_back(argument.data());
  arguments.push_back(nullptr);
  process_ = fork();
  if (process_ == 0) {
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    dup2(in[0], STDIN_FILENO);
    dup2(out[1], STDOUT_FILENO);
    execvp(arguments[0], arguments.data());
    _exit(127);
  }
  close(in[0]);
  close(out[1]);
  input_ = in[1];
  output_ = out[0];
  Require(process_ > 0, "no process for " + command[0]);
}

Program::Program(Program&& other) noexcept
    : process_(std::exchange(other.process_, -1)),
      input_(std::exchange(other.input_, -1)),
      output_(std::exchange(other.output_, -1)) {}

Program::~Program() {
  Kill();
  if (input_ >= 0) close(input_);
  if (output_ >= 0) close(output_);
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
  close(std::exchange(input_, -1));
  Wait();
  return status_;
}

std::string Program::ReadLine() {
  std::string line;
  char character = '\0';
  while (read(output_, &character, 1) == 1 && character != '\n') line += character;
  return line;
}

std::string Program::ReadAll() {
  std::string text;
  char buffer[4096];
  for (ssize_t size; (size = read(output_, buffer, sizeof buffer)) > 0;) {
    text.append(buffer, static_cast<std::size_t>(size));
  }
  return text;
}

const std::vector<std::string> SoundServer::kModules = {"module-null-sink sink_name=first",
                                                        "module-stream-restore"};

SoundServer::SoundServer(std::vector<std::string> modules) : modules_(std::move(modules)) {
  ForgetVolumes();
}

void SoundServer::ForgetVolumes() { std::filesystem::remove_all(Home::Get() / "state"); }

SoundServer::~SoundServer() { Kill(); }

void SoundServer::Start() {
  std::vector<std::string> command = {"pulseaudio",          "-n",
                                      "--daemonize=no",      "--use-pid-file=no",
                                      "--exit-idle-time=-1", "--log-target=null"};
  std::vector<std::string> modules = modules_;
  modules.push_back("module-native-protocol-unix socket=" + Home::Get() / "socket");
  for (const std::string& module : modules) command.insert(command.end(), {"-L", module});
  ReadySocket ready;
  process_.emplace_back(std::move(command));
  Require(ready.Wait(), "the sound server doesn't start");
}

void SoundServer::Kill() { process_.clear(); }

void SoundServer::Signal(int signal) const { process_.front().Signal(signal); }

std::string Pactl(std::vector<std::string> arguments) {
  arguments.insert(arguments.begin(), "pactl");
  Program pactl(arguments);
  const std::string output = pactl.ReadAll();
  Require(pactl.Finish() == 0, "pactl " + arguments[1] + " fails");
  return output;
}

void KillStream(int index) {
  pa_mainloop* loop = pa_mainloop_new();
  pa_context* context = pa_context_new(pa_mainloop_get_api(loop), "killer");
  bool isKilled = false;
  pa_context_connect(context, nullptr, PA_CONTEXT_NOAUTOSPAWN, nullptr);
  while (PA_CONTEXT_IS_GOOD(pa_context_get_state(context)) &&
         pa_context_get_state(context) != PA_CONTEXT_READY) {
    pa_mainloop_iterate(loop, 1, nullptr);
  }
  pa_operation* operation = pa_context_kill_sink_input(
      context, static_cast<std::uint32_t>(index),
      [](pa_context*, int success, void* result) { *static_cast<bool*>(result) = success != 0; },
      &isKilled);
  Require(operation != nullptr, "the sound server can't be reached");
  while (pa_operation_get_state(operation) == PA_OPERATION_RUNNING) {
    pa_mainloop_iterate(loop, 1, nullptr);
  }
  pa_operation_unref(operation);
  pa_context_disconnect(context);
  pa_context_unref(context);
  pa_mainloop_free(loop);
  Require(isKilled, "the sound server doesn't kill the stream");
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

constexpr char kMark[] = "test.player";

std::vector<std::string> MakePlayerCommand(const std::vector<std::string>& properties, int number) {
  std::vector<std::string> command = {
      "pacat", "--raw", "--latency-msec=50", "/dev/zero",
      std::string("--property=") + kMark + "=" + std::to_string(number)};
  for (const std::string& property : properties) command.push_back("--property=" + property);
  return command;
}

int lastPlayer = 0;

}  // namespace

Player::Player(std::vector<std::string> properties)
    : Program(MakePlayerCommand(properties, ++lastPlayer)) {
  const std::string mark = std::string(kMark) + " = \"" + std::to_string(lastPlayer) + "\"";
  // Each look is a round trip to the server, which makes the stream meanwhile.
  for (int look = 0; look < 1000 && index_ < 0; ++look) {
    const auto streams = ListStreams(mark);
    if (!streams.empty()) index_ = streams.front().index;
  }
  Require(index_ >= 0, "pacat's stream doesn't come");
}
