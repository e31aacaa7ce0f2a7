/// \file
/// What interrupts and disrupts the session: other programs' calls and alarms, and the loss of a
/// stream, of the default sink, of the server. README.md tells which event leads to which code.
#pragma once

#include "Pulse.h"
#include "Streams.h"

#include <optional>
#include <string>
#include <vector>

namespace Desktop {

enum InterruptionCode : int {
  kFinished = 0,
  kTakenOver = 1,   ///< The output, or a player's stream, was taken away.
  kOutputGone = 3,  ///< The output was unplugged or vanished.
  kServerLost = 4,
  kCallStarted = 5,
  kAlarmStarted = 6,
};

/// The default sink: its mute is mute-all; losing it disrupts the session. Under the connection's
/// lock.
class DefaultSink {
 public:
  /// The server's name for the sink that is the default.
  static constexpr char kName[] = "@DEFAULT_SINK@";

  explicit DefaultSink(const Streams& streams) : streams_(streams) {}

  bool Exists() const { return sink_.has_value(); }
  bool Is(std::uint32_t sink) const { return sink_ && sink_->index == sink; }
  /// \return whether it was the default sink when there was one; PipeWire tells first that there is
  /// none, and then which has gone
  bool WasLast(std::uint32_t sink) const { return !sink_ && last_ == sink; }
  bool IsMuted() const { return isMuted_.value_or(false); }

  /// Applies the server's description of the default sink.
  void Put(const pa_sink_info& info);

  /// There is no default sink.
  void Clear() { sink_.reset(); }

  /// The default sink, or the last one, went away.
  void OnRemoved();

  void OnServerLost();

  /// \return whether a default sink with this number went away, and was reported so
  bool WasRemoved(std::uint32_t sink) const { return removed_ == sink; }

  void OnMuted(bool isMuted);

 private:
  struct Sink {
    std::uint32_t index;
    std::string port;  // the active one; "" without ports
    bool isPlugged;
    bool isSuspended;
  };

  bool WasUnplugged(const pa_sink_info& info) const;

  const Streams& streams_;
  std::optional<Sink> sink_;
  std::optional<std::uint32_t> last_;  // until it is told as gone
  std::optional<std::uint32_t> removed_;
  std::optional<bool> isMuted_;  // the last one known
};

/// The session's interruptions, which count as one: it starts with the first stream that interrupts
/// and is finished with the last. Under the connection's lock.
///
/// What seems to end is settled by another look at the streams: PipeWire tells of a stream that
/// moves to another sink as of one that ends and one that begins, and a sink that vanishes takes
/// its streams along, which is one event and not two.
class Interruptions {
 public:
  Interruptions(const Streams& streams, const DefaultSink& defaultSink)
      : streams_(streams), defaultSink_(defaultSink) {}

  /// Compares with the streams that are there now. \return whether something seems to have ended
  bool Update();

  /// A stream of this process has been ended by somebody, as it seems.
  void OnKilled(std::uint32_t stream, std::uint32_t sink) { killed_.push_back({stream, sink}); }

  /// All streams have been read again: what still seems to have ended has ended.
  void Settle();

  /// A disruption is the end: what ran when the server went is not reported as finished.
  void OnServerLost();

  /// Reports what runs to somebody who came later.
  void Repeat() const;

 private:
  struct Killed {
    std::uint32_t stream;
    std::uint32_t sink;
  };

  const Streams& streams_;
  const DefaultSink& defaultSink_;
  int started_ = kFinished;  // the code it started with
  std::vector<Killed> killed_;
};

}  // namespace Desktop
