/// \file
#pragma once

#include "Categories.h"
#include "Pulse.h"

#include <cstdint>
#include <string>
#include <unordered_map>

namespace Desktop {

/// A playback stream on the server, of any program.
struct Stream {
  Category category = kNoCategory;
  std::uint32_t sink = PA_INVALID_INDEX;
  Volume volume;
  bool isVolumeKnown = false;
  bool canChangeVolume = false;
  bool isMuted = false;
  bool isCorked = true;
  bool isMoving = false;     ///< to another sink, and told as corked until it is there
  bool isOwn = false;        ///< of this process
  bool isPlayer = false;     ///< of one of this process's players
  bool isBeingRead = false;  ///< an answer about it is on its way

  bool IsHeard() const { return !isCorked && !isMuted; }
};

/// The playback streams that are on the server, as last told. Under the connection's lock.
class Streams {
 public:
  using Map = std::unordered_map<std::uint32_t, Stream>;

  Streams();

  /// Puts in what is told of a stream.
  /// \param isToldInParts whether a new stream is first told corked and with volume 0, whatever its
  /// volume is, and one that goes over to another sink corked
  /// \return the stream as it is now
  const Stream& Put(const pa_sink_input_info& info, bool isToldInParts);

  bool Has(std::uint32_t index) const { return streams_.count(index) > 0; }

  /// \return the stream with this number, or null
  Stream* Find(std::uint32_t index);

  void Remove(std::uint32_t index) { streams_.erase(index); }
  void Clear() { streams_.clear(); }

  Map& All() { return streams_; }

  /// \return whether another program's stream of the category is heard
  bool IsHeardFromOthers(Category category) const;

  /// \return whether one of this process's players is heard on a sink
  bool IsPlayerHeardOn(std::uint32_t sink) const;

 private:
  const std::string process_;
  std::string host_;
  Map streams_;
};

}  // namespace Desktop
