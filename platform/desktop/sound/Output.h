/// \file
#pragma once

#include "Pulse.h"
#include "Reports.h"
#include "Streams.h"

#include <optional>
#include <string>

namespace Desktop {

/// The default sink: its mute is mute-all; losing it disrupts the session. Under the loop's lock.
class Output {
 public:
  /// The server's name for the sink that is the default.
  static constexpr char kName[] = "@DEFAULT_SINK@";

  Output(Reports& reports, const Streams& streams) : reports_(reports), streams_(streams) {}

  bool Exists() const { return sink_.has_value(); }
  bool Is(std::uint32_t sink) const { return sink_ && sink_->index == sink; }
  bool IsMuted() const { return isMuted_.value_or(false); }

  /// What the default sink is told to be like.
  void OnTold(const pa_sink_info& info);

  /// There is no default sink.
  void OnNone() { sink_.reset(); }

  /// The default sink went away.
  void OnRemoved();

  void OnMuted(bool isMuted);

 private:
  struct Sink {
    std::uint32_t index;
    std::string port;  // the active one; "" without ports
    bool isPlugged;
    bool isSuspended;
  };

  bool WasUnplugged(const pa_sink_info& info) const;

  Reports& reports_;
  const Streams& streams_;
  std::optional<Sink> sink_;
  std::optional<bool> isMuted_;  // the last one known
};

}  // namespace Desktop
