#include "Volumes.h"

#include <cstring>
#include <utility>

namespace Desktop {
namespace {

/// \return the volume with another level, in the same balance
pa_cvolume Scale(pa_cvolume volume, int level) {
  pa_cvolume_scale(&volume, ToVolume(level));
  return volume;
}

}  // namespace

int StoredVolume::GetLevel() const {
  return exists && volume.channels > 0 ? ToLevel(pa_cvolume_max(&volume)) : kMaxLevel;
}

bool StoredVolume::IsSameForAll() const {
  return !exists || volume.channels == 0 || pa_cvolume_channels_equal_to(&volume, volume.values[0]);
}

StoredVolume StoredVolume::WithLevel(int level) const {
  StoredVolume changed = *this;
  changed.isToldByStream = false;
  if (!exists || volume.channels == 0) {
    changed.exists = true;
    pa_channel_map_init_mono(&changed.map);
    pa_cvolume_set(&changed.volume, 1, PA_VOLUME_NORM);
  }
  changed.volume = Scale(changed.volume, level);
  return changed;
}

void Volumes::OnEntry(const pa_ext_stream_restore_info& entry) {
  constexpr std::size_t kPrefixLength = sizeof kEntryPrefix - 1;
  if (std::strncmp(entry.name, kEntryPrefix, kPrefixLength) != 0) return;
  for (std::size_t i = 0; i < kRoles.size(); ++i) {
    if (std::strcmp(entry.name + kPrefixLength, kRoles[i].role) != 0) continue;
    answer_[i] = {true,
                  entry.channel_map,
                  entry.volume,
                  entry.mute != 0,
                  entry.device != nullptr ? entry.device : "",
                  false};
  }
}

bool Volumes::OnEndOfEntries(bool succeeded) {
  areStored_ = succeeded;
  const Stored answer = std::exchange(answer_, {});
  if (!succeeded) return true;  // the last one stays, to tell what has changed when they are back
  const Stored before = std::exchange(stored_, answer);
  if (!areKnown_) return Begin(), true;
  bool isUpToDate = true;
  for (std::size_t i = 0; i < kRoles.size(); ++i) {
    const int level = stored_[i].GetLevel();
    if (level == before[i].GetLevel()) continue;
    if (before[i].isToldByStream) {
      stored_[i] = before[i].WithLevel(before[i].GetLevel());
      isUpToDate = false;
    } else {
      Change(kRoles[i].category, level);
    }
  }
  return isUpToDate;
}

void Volumes::OnStreamMoved(const Stream& stream, bool isStored) {
  if (!IsCategory(stream.category)) return;
  if (isStored) {
    StoredVolume& stored = stored_[stream.role];
    if (!stored.IsSameForAll()) return;  // the stream's volume may be one that was fitted to it
    stored = stored.WithLevel(stream.GetLevel());
    stored.isToldByStream = true;
  }
  Change(stream.category, stream.GetLevel());
}

void Volumes::Begin() {
  areKnown_ = true;
  levels_.fill(kMaxLevel);
  for (std::size_t i = kRoles.size(); i-- > 0;) {
    if (stored_[i].exists) levels_[ToIndex(kRoles[i].category)] = stored_[i].GetLevel();
  }
}

void Volumes::Change(Category category, int level) {
  if (!areKnown_ || levels_[ToIndex(category)] == level) return;
  levels_[ToIndex(category)] = level;
  reports_.ReportLevel(category, level);
}

void Volumes::Send(pa_context* context, Category category, int level, bool movesStreams,
                   Batch& batch) {
  // The server would also give a stream the stored mute, and so make one heard that a call silenced.
  if (streams_.IsAnyMuted(category)) movesStreams = false;

  Stored changed;
  std::array<std::string, kRoles.size()> names;
  std::array<pa_ext_stream_restore_info, kRoles.size()> entries;
  unsigned count = 0;
  for (std::size_t i = 0; i < kRoles.size(); ++i) {
    if (kRoles[i].category != category) continue;
    const StoredVolume& entry = changed[i] = stored_[i].WithLevel(level);
    names[i] = std::string(kEntryPrefix) + kRoles[i].role;
    entries[count++] = {names[i].c_str(), entry.map, entry.volume,
                        entry.device.empty() ? nullptr : entry.device.c_str(), entry.isMuted};
  }
  batch.Add([&](pa_context_success_cb_t onAnswer, void* data) {
    return pa_ext_stream_restore_write(context, PA_UPDATE_REPLACE, entries.data(), count,
                                       movesStreams, onAnswer, data);
  });
  for (const auto& [index, stream] : streams_.All()) {
    if (stream.category != category || !stream.canChangeVolume) continue;
    if (movesStreams && stream.hasStoredVolume) continue;
    const pa_cvolume volume = Scale(stream.volume, level);
    batch.AddOptional([&, number = index](pa_context_success_cb_t onAnswer, void* data) {
      return pa_context_set_sink_input_volume(context, number, &volume, onAnswer, data);
    });
  }
}

void Volumes::OnDone(Category category, int level) {
  for (std::size_t i = 0; i < kRoles.size(); ++i) {
    if (kRoles[i].category == category) stored_[i] = stored_[i].WithLevel(level);
  }
  for (auto& [index, stream] : streams_.All()) {
    if (stream.category == category && stream.canChangeVolume) {
      const pa_cvolume before = std::exchange(stream.volume, Scale(stream.volume, level));
      stream.isEchoDue = !pa_cvolume_equal(&stream.volume, &before);
    }
  }
  Change(category, level);
}

}  // namespace Desktop
