/// \file
#pragma once

#include "Batch.h"
#include "Categories.h"
#include "Streams.h"

#include <array>
#include <optional>
#include <string>
#include <vector>

namespace Desktop {

/// The categories' levels. A category's level is that of its stored volume or live stream that
/// changed last, by anybody. Under the connection's lock.
///
/// The server answers a connection in order. So a value that differs from the one known is a
/// change, and what this process itself sets is known from its answer on: no change is told twice.
class Volumes {
 public:
  explicit Volumes(Streams& streams) : streams_(streams) {}

  /// There is a new connection: what it tells first isn't a change of anything.
  void Begin();

  /// \return whether the server keeps volumes for roles at all
  bool AreStored() const { return areStored_; }

  int GetLevel(Category category) const { return levels_[ToIndex(category)].value_or(kMaxLevel); }

  /// \name An answer to `pa_ext_stream_restore_read`
  /// @{
  void OnEntry(const pa_ext_stream_restore_info& info);
  void OnEndOfEntries(bool succeeded);
  /// @}

  /// What a stream's level changed to.
  void OnStreamMoved(const Stream& stream);

  /// Asks the server to store a level for a category's roles and to give it to its streams: their
  /// volumes alone, because the server can also give them the stored sink, mute and balance.
  /// \return the streams
  std::vector<std::uint32_t> Send(pa_context* context, Category category, int level, Batch& batch);

  /// The server has done what `Send` asked for, with these \p streams.
  void OnDone(Category category, int level, const std::vector<std::uint32_t>& streams);

  /// \return whether all that was told last of a category has this level
  bool IsToldAs(Category category, int level) const;

 private:
  /// What the server keeps for a role.
  struct Entry {
    bool exists = false;
    pa_channel_map map = {};
    Volume volume;
    bool isMuted = false;
    std::string device;

    /// \return the level of the role's streams; they start at 100 % when nothing is kept
    int GetLevel() const { return exists && volume.Exists() ? volume.GetLevel() : kMaxLevel; }

    /// \return the volume with another level; balanced where nothing is kept
    pa_cvolume At(int level) const;
  };
  using Entries = std::array<Entry, kRoles.size()>;

  static std::size_t ToIndex(Category category) { return static_cast<std::size_t>(category); }

  void SendEntries(pa_context* context, Category category, int level, Batch& batch);
  void PutLevelsAtStart();
  void Change(Category category, int level);

  Streams& streams_;
  bool isBeginning_ = true;
  bool areStored_ = false;
  std::array<std::optional<int>, kCategories> levels_;  // last reported, or known without a change
  Entries entries_;
  Entries answer_;  // what has come of it
};

}  // namespace Desktop
