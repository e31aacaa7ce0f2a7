#include "Volumes.h"

#include "Reports.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace Desktop {

pa_cvolume Volumes::Entry::At(int level) const {
  if (exists && volume.Exists()) return volume.At(level);
  pa_cvolume balanced;
  return *pa_cvolume_set(&balanced, 1, ToVolume(level));
}

void Volumes::Begin() {
  isBeginning_ = true;
  areStored_ = false;
  answer_ = {};
}

void Volumes::OnEntry(const pa_ext_stream_restore_info& info) {
  constexpr std::size_t kPrefixLength = sizeof kEntryPrefix - 1;
  if (std::strncmp(info.name, kEntryPrefix, kPrefixLength) != 0) return;
  const std::size_t role = FindRole(info.name + kPrefixLength);
  if (role == kNoRole) return;
  Entry& entry = answer_[role];
  entry.exists = true;
  entry.map = info.channel_map;
  entry.volume = entries_[role].volume;  // for its balance
  entry.volume.Put(info.volume);
  entry.isMuted = info.mute != 0;
  entry.device = info.device != nullptr ? info.device : "";
}

void Volumes::OnEndOfEntries(bool succeeded) {
  areStored_ = succeeded;
  Entries answer = std::exchange(answer_, {});
  if (!succeeded) return;  // the last one stays, to tell what has changed when they are back
  const Entries before = std::exchange(entries_, std::move(answer));
  if (std::exchange(isBeginning_, false)) return PutLevelsAtStart();
  for (std::size_t i = 0; i < kRoles.size(); ++i) {
    const int level = entries_[i].GetLevel();
    if (level != before[i].GetLevel()) Change(kRoles[i].category, level);
  }
}

void Volumes::PutLevelsAtStart() {
  std::array<int, kCategories> levels;
  levels.fill(kMaxLevel);
  for (std::size_t i = kRoles.size(); i-- > 0;) {
    if (entries_[i].exists) levels[ToIndex(kRoles[i].category)] = entries_[i].GetLevel();
  }
  for (std::size_t i = 0; i < kCategories; ++i) Change(static_cast<Category>(i), levels[i]);
}

void Volumes::OnStreamMoved(const Stream& stream) {
  if (areStored_ && !isBeginning_) Change(stream.category, stream.volume.GetLevel());
}

void Volumes::Change(Category category, int level) {
  const std::optional<int> before = std::exchange(levels_[ToIndex(category)], level);
  if (before && *before != level) Tell(Native::ReportLevel, category, level);
}

std::vector<std::uint32_t> Volumes::Send(pa_context* context, Category category, int level,
                                         Batch& batch) {
  SendEntries(context, category, level, batch);
  std::vector<std::uint32_t> sent;
  for (const auto& [index, stream] : streams_.All()) {
    if (stream.category != category || !stream.canChangeVolume) continue;
    sent.push_back(index);
    const pa_cvolume volume = stream.volume.At(level);
    batch.AddOptional([&](pa_context_success_cb_t onAnswer, void* data) {
      return pa_context_set_sink_input_volume(context, sent.back(), &volume, onAnswer, data);
    });
  }
  return sent;
}

void Volumes::SendEntries(pa_context* context, Category category, int level, Batch& batch) {
  std::array<std::string, kRoles.size()> names;
  std::array<pa_ext_stream_restore_info, kRoles.size()> written;
  unsigned count = 0;
  for (std::size_t i = 0; i < kRoles.size(); ++i) {
    if (kRoles[i].category != category) continue;
    const Entry& entry = entries_[i];
    names[i] = std::string(kEntryPrefix) + kRoles[i].role;
    const pa_cvolume volume = entry.At(level);
    pa_channel_map map = entry.map;
    if (!pa_cvolume_compatible_with_channel_map(&volume, &map)) pa_channel_map_init_mono(&map);
    written[count++] = {names[i].c_str(), map, volume,
                        entry.device.empty() ? nullptr : entry.device.c_str(), entry.isMuted};
  }
  batch.Add([&](pa_context_success_cb_t onAnswer, void* data) {
    return pa_ext_stream_restore_write(context, PA_UPDATE_REPLACE, written.data(), count, false,
                                       onAnswer, data);
  });
}

void Volumes::OnDone(Category category, int level, const std::vector<std::uint32_t>& streams) {
  for (std::size_t i = 0; i < kRoles.size(); ++i) {
    Entry& entry = entries_[i];
    if (kRoles[i].category != category) continue;
    entry.volume.Put(entry.At(level));
    entry.exists = true;
  }
  for (const std::uint32_t index : streams) {
    Stream* stream = streams_.Find(index);
    if (stream != nullptr) stream->volume.Put(stream->volume.At(level));
  }
  Change(category, level);
}

bool Volumes::IsToldAs(Category category, int level) const {
  bool isSame = true;
  for (std::size_t i = 0; i < kRoles.size(); ++i) {
    if (kRoles[i].category == category && entries_[i].GetLevel() != level) isSame = false;
  }
  for (const auto& [index, stream] : streams_.All()) {
    if (stream.category == category && stream.canChangeVolume &&
        stream.volume.GetLevel() != level) {
      isSame = false;
    }
  }
  return isSame;
}

}  // namespace Desktop
