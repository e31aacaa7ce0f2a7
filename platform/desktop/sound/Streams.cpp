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

}  // namespace

Streams::Streams() : process_(std::to_string(getpid())) {
  std::array<char, 256> name = {};
  if (pa_get_host_name(name.data(), name.size()) != nullptr) host_ = name.data();
}

Stream Streams::Describe(const pa_sink_input_info& info) const {
  const auto property = [&](const char* key) { return pa_proplist_gets(info.proplist, key); };
  const auto is = [&](const char* key, const std::string& expected) {
    const char* value = property(key);
    return value != nullptr && value == expected;
  };
  Stream stream;
  const char* role = property(PA_PROP_MEDIA_ROLE);
  if (role == nullptr) {
    stream.category = kMedia;
  } else {
    stream.role = FindRole(role);
    if (stream.HasRole()) stream.category = kRoles[stream.role].category;
  }
  stream.hasStoredVolume =
      stream.HasRole() && is("module-stream-restore.id", std::string(kEntryPrefix) + role);
  stream.sink = info.sink;
  stream.volume = info.volume;
  stream.canChangeVolume = info.has_volume && info.volume_writable;
  stream.isMuted = info.mute;
  stream.isCorked = info.corked;
  stream.isOwn =
      is(PA_PROP_APPLICATION_PROCESS_ID, process_) && is(PA_PROP_APPLICATION_PROCESS_HOST, host_);
  stream.isPlayer = stream.isOwn && property(kPlayerProperty) != nullptr;
  return stream;
}

Stream* Streams::Find(std::uint32_t index) {
  const auto found = streams_.find(index);
  return found == streams_.end() ? nullptr : &found->second;
}

bool Streams::IsAnyMuted(Category category) const {
  return HasStream(streams_, [=](const Stream& stream) {
    return stream.category == category && stream.isMuted;
  });
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
