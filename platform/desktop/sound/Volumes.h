/// \file
#pragma once

#include "Batch.h"
#include "Categories.h"
#include "Reports.h"
#include "Streams.h"

#include <array>
#include <string>

namespace Desktop {

/// The volume that the server keeps for a role.
struct StoredVolume {
  bool exists = false;
  pa_channel_map map = {};
  pa_cvolume volume = {};  ///< no channels: none is kept
  bool isMuted = false;
  std::string device;
  bool isToldByStream = false;  ///< concluded from a stream's volume, before it was read

  /// \return the level of the role's streams; they start at 100 % when nothing is kept
  int GetLevel() const;

  /// \return whether the volume is the same one for a stream that has it, whatever its channels
  bool IsSameForAll() const;

  /// \return the same with another level, keeping the balance
  StoredVolume WithLevel(int level) const;
};

/// The categories' levels, as last told by the server. A category's level is the one that was last
/// given to one of its roles or streams, by anybody. Under the loop's lock.
class Volumes {
 public:
  Volumes(Reports& reports, Streams& streams) : reports_(reports), streams_(streams) {}

  /// \return whether the server keeps volumes for roles at all
  bool AreStored() const { return areStored_; }

  int GetLevel(Category category) const { return levels_[ToIndex(category)]; }

  /// \name An answer to `pa_ext_stream_restore_read`
  /// @{
  void OnEntry(const pa_ext_stream_restore_info& entry);
  /// \return false when the answer may be older than what a stream told, so that it must be asked for
  /// once more
  bool OnEndOfEntries(bool succeeded);
  /// @}

  /// A stream of a category was moved.
  /// \param isStored whether the server stores the volume for the stream's role as well, and tells so
  void OnStreamMoved(const Stream& stream, bool isStored);

  /// Asks the server to store a level for a category's roles and to give it to its streams.
  /// \param movesStreams whether the server itself moves the streams with the stored volume
  void Send(pa_context* context, Category category, int level, bool movesStreams, Batch& batch);

  /// The server has done what `Send` asked for.
  void OnDone(Category category, int level);

 private:
  using Stored = std::array<StoredVolume, kRoles.size()>;

  static std::size_t ToIndex(Category category) { return static_cast<std::size_t>(category); }

  void Begin();
  void Change(Category category, int level);

  Reports& reports_;
  Streams& streams_;
  bool areStored_ = false;
  bool areKnown_ = false;
  std::array<int, kCategories> levels_ = {};
  Stored stored_;
  Stored answer_;  // what has come of it
};

}  // namespace Desktop
