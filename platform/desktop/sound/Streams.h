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
  std::size_t role = kNoRole;
  std::uint32_t sink = PA_INVALID_INDEX;
  pa_cvolume volume = {};
  bool canChangeVolume = false;
  bool hasStoredVolume = false;  ///< the server keeps its volume under its role
  bool isMuted = false;
  bool isCorked = false;
  bool isOwn = false;     ///< of this process
  bool isPlayer = false;  ///< of one of this process's players
  bool isBeingRead = false;
  bool isToBeRead = false;  ///< though hardly anything new is known of it
  bool isEchoDue = false;   ///< this process has moved it, of which the server will tell

  bool IsHeard() const { return !isCorked && !isMuted; }
  bool HasRole() const { return role != kNoRole; }
  int GetLevel() const { return ToLevel(pa_cvolume_max(&volume)); }
};

/// The playback streams that are on the server, as last told. Under the loop's lock.
class Streams {
 public:
  using Map = std::unordered_map<std::uint32_t, Stream>;

  Streams();

  /// \return the stream as it is told now
  Stream Describe(const pa_sink_input_info& info) const;

  /// \return the stream with this number, or null
  Stream* Find(std::uint32_t index);

  void Put(std::uint32_t index, const Stream& stream) { streams_[index] = stream; }
  void Remove(std::uint32_t index) { streams_.erase(index); }
  void Clear() { streams_.clear(); }

  Map& All() { return streams_; }

  bool IsAnyMuted(Category category) const;

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
