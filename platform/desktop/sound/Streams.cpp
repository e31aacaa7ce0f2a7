#include "Streams.h"

#include "Session.h"

#include <unistd.h>

#include <algorithm>
#include <array>

namespace Desktop {
namespace {

template <typename Condition>
bool HasStream(const Streams::Map& streams, Condition condition) {
  return std::any_of(streams.begin(), streams.end(),
                     [&](const auto& entry) { return condition(entry.second); });
}

bool HasProperty(const pa_sink_input_info& info, const char* key, const std::string& expected) {
  const char* value = pa_proplist_gets(info.proplist, key);
  return value != nullptr && value == expected;
}

}  // namespace

Streams::Streams() : process_(std::to_string(getpid())) {
  std::array<char, 256> name = {};
  if (pa_get_host_name(name.data(), name.size()) != nullptr) host_ = name.data();
}

const Stream& Streams::Put(const pa_sink_input_info& info, bool isToldInParts) {
  Stream& stream = streams_[info.index];
  stream.category = FindCategory(pa_proplist_gets(info.proplist, PA_PROP_MEDIA_ROLE));
  const bool isLeavingSink = isToldInParts && stream.IsHeard() && stream.sink != info.sink;
  stream.isMoving = info.corked && (stream.isMoving || isLeavingSink);
  stream.sink = info.sink;
  stream.volume.Put(info.volume);
  stream.canChangeVolume = info.has_volume && info.volume_writable;
  stream.isMuted = info.mute;
  stream.isCorked = info.corked && !stream.isMoving;
  stream.isVolumeKnown = stream.isVolumeKnown || !isToldInParts || !stream.isCorked ||
                         !pa_cvolume_is_muted(&info.volume);
  stream.isOwn = HasProperty(info, PA_PROP_APPLICATION_PROCESS_ID, process_) &&
                 HasProperty(info, PA_PROP_APPLICATION_PROCESS_HOST, host_);
  stream.isPlayer = stream.isOwn && pa_proplist_contains(info.proplist, kPlayerProperty) != 0;
  stream.isBeingRead = false;
  return stream;
}

Stream* Streams::Find(std::uint32_t index) {
  const auto found = streams_.find(index);
  return found == streams_.end() ? nullptr : &found->second;
}

bool Streams::IsHeardFromOthers(Category category) const {
  return HasStream(streams_, [=](const Stream& stream) {
    return stream.category == category && !stream.isOwn && stream.IsHeard();
  });
}

bool Streams::IsPlayerHeardOn(std::uint32_t sink) const {
  return HasStream(streams_, [=](const Stream& stream) {
    return stream.isPlayer && stream.sink == sink && stream.IsHeard();
  });
}

}  // namespace Desktop
