/// \file
/// A sound server of the test's own, and other programs that use it.
#pragma once

#include <sys/types.h>

#include <string>
#include <vector>

/// A program that runs beside the test; killed when this goes away.
class Program {
 public:
  /// Starts a program. Throws when there is no such program.
  explicit Program(std::vector<std::string> command);
  ~Program();

  Program(Program&& other) noexcept;
  Program& operator=(Program&&) = delete;

  /// Sends a signal.
  void Signal(int signal) const;

  /// Sends SIGKILL and waits for the end.
  void Kill();

  /// Closes the program's input and waits for its end. \return its exit status
  int Finish();

  /// \return the next line of the program's output; what there is of it when the program ends
  std::string ReadLine();

  /// \return the rest of the output, having waited for the program's end
  std::string ReadAll();

 private:
  void Wait();

  pid_t process_ = -1;
  int socket_ = -1;  // the program's input and output
  int status_ = 0;
};

/// \return whether the server is a PipeWire, as the environment variable ZELKORA_TEST_PIPEWIRE asks
bool IsOnPipeWire();

/// A PulseAudio, or a PipeWire, with a null sink "first", in directories of its own. Points this
/// process, and the programs that it starts, to the server. Running or not, it has always the same
/// address.
class SoundServer {
 public:
  static const std::vector<std::string> kModules;

  /// \param modules PulseAudio's
  explicit SoundServer(std::vector<std::string> modules = kModules);
  ~SoundServer();

  SoundServer(const SoundServer&) = delete;
  SoundServer& operator=(const SoundServer&) = delete;

  /// Starts the server and returns when it is ready. Throws when it doesn't come up.
  void Start();

  /// Kills the server as a fault would.
  void Kill();

  /// Has the next start find no stored volumes.
  void ForgetVolumes();

  /// Sends the server a signal.
  void Signal(int signal) const;

  /// Sends PipeWire's session manager a signal.
  void SignalSessionManager(int signal) const;

 private:
  void StartPipeWire();

  std::vector<std::string> modules_;
  std::vector<Program> processes_;  // one, or PipeWire's
};

/// What `pactl` tells of a playback stream.
struct ListedStream {
  int index = -1;
  int volume = -1;  ///< of the loudest channel; 65536 is 100 %
  bool isCorked = false;
  std::string description;  ///< all of it
};

/// Runs `pactl` and returns its output. Throws when it fails.
std::string Pactl(std::vector<std::string> arguments);

/// Takes a null sink away.
void UnloadSink(const std::string& name);

/// Ends another program's playback stream, which `pactl` can't. Throws when the server refuses.
void KillStream(int index);

/// \return the playback streams that have a line of this text: `media.role = "music"`
std::vector<ListedStream> ListStreams(const std::string& line);

/// Plays silence with `pacat`, and waits until `pactl` lists the stream on a sink.
/// \param properties the stream's, as "key=value"
class Player : public Program {
 public:
  explicit Player(std::vector<std::string> properties, int channels = 2);

  int GetIndex() const { return index_; }

 private:
  int index_ = -1;
};
