#include "Landing.h"

#include "native/PlayerError.h"

#include <algorithm>

namespace Desktop {
namespace {

using Passage = KeyFrameGate::Passage;

constexpr GstSeekFlags kExact = GST_SEEK_FLAG_ACCURATE;

/// Only the key frame is decoded. Without trick mode, a target that is a key frame itself is often
/// missed by a frame when there is sound, and then a whole group of pictures is decoded.
constexpr auto kToKeyFrame =
    static_cast<GstSeekFlags>(GST_SEEK_FLAG_KEY_UNIT | GST_SEEK_FLAG_TRICKMODE_KEY_UNITS);

/// A seek that comes out too late begins earlier by this, then by twice as much, and so on.
constexpr FilmTime kFirstLead = GST_SECOND, kLastLead = 8 * GST_SECOND;

/// So many key frames may be broken, one after the other.
constexpr int kBrokenLimit = 4;

}  // namespace

int Landing::LandAtOrBefore(FilmTime time, std::optional<Landed>* landed) {
  std::optional<Landed> reached;
  bool isFirst = false;
  if (film_.IsTrusted()) {
    if (const int error = TryContainer(time, &reached, &isFirst)) return error;
    if (const int error = CorrectByList(time, &reached)) return error;
  }
  if (!reached || (reached->time > time && !isFirst)) {
    const int error =
        film_.FindIndex() != nullptr ? LandByIndex(time, &reached) : LandSomewhere(time, &reached);
    if (error != PLAYER_ERROR_NONE) return error;
  }
  *landed = reached;
  return PLAYER_ERROR_NONE;
}

/// Leaves \p landed empty when the container led to no key frame. It may be one after \p time: the
/// file's first one, if nothing comes before it.
int Landing::TryContainer(FilmTime time, std::optional<Landed>* landed, bool* isFirst) {
  FilmTime target = time;
  std::optional<FilmTime> before;
  // A time between a key frame's decoding and its showing leads to that key frame: once more, then.
  for (int i = 0; i < 2; ++i) {
    landed->reset();
    if (const int error = Seek(target, kToKeyFrame, std::nullopt)) return error;
    const auto shown = pipeline_.GetShown();
    if (!shown || shown->isBroken) break;
    const auto keyFrame = pipeline_.GetGate().Find(shown->stamp);
    if (!keyFrame) break;
    *landed = Landed{shown->time, true, true, shown->time};
    target = shown->time - static_cast<FilmTime>(keyFrame->reordering) - kRounding;
    *isFirst = target < 0 || before == shown->time;
    if (shown->time <= time || *isFirst) break;
    before = shown->time;
  }
  return PLAYER_ERROR_NONE;
}

/// A demuxer goes to the first key frame of a cluster, though the container lists all of them.
/// Leaves \p landed empty when there is no key frame at the listed time.
int Landing::CorrectByList(FilmTime time, std::optional<Landed>* landed) {
  const auto& listed = film_.GetListed();
  if (listed.empty() || !*landed) return PLAYER_ERROR_NONE;
  const auto shown = pipeline_.GetShown();
  if (!shown) return PLAYER_ERROR_NONE;
  const FilmTime shift = static_cast<FilmTime>(shown->stamp) - shown->time;
  FilmTime limit = time;
  // Listed times are whole milliseconds: the key frame may be a little later, and then after the
  // time.
  for (int i = 0; i < 2; ++i) {
    const FilmTime keyFrame = *FindAtOrBefore(listed, limit + shift) - shift;
    if (*landed && Around(keyFrame).Holds((*landed)->time)) break;
    landed->reset();
    if (const int error = LandAt(keyFrame, landed)) return error;
    if (!*landed || (*landed)->time <= time) break;
    limit = keyFrame - 1;
  }
  return PLAYER_ERROR_NONE;
}

int Landing::LandByIndex(FilmTime time, std::optional<Landed>* landed) {
  const auto& keyFrames = film_.GetIndex()->keyFrames;
  auto keyFrame = FindAtOrBefore(keyFrames, time);
  for (int broken = 0; broken <= kBrokenLimit; ++broken, --keyFrame) {
    landed->reset();
    if (const int error = LandAt(*keyFrame, landed)) return error;
    if (*landed) return PLAYER_ERROR_NONE;
    if (!IsAtGate()) {
      return Host::PlayerFailure(PLAYER_ERROR_IO, __LINE__,
                                 "GStreamer doesn't find the key frame at %ld ms",
                                 static_cast<long>(*keyFrame / GST_MSECOND));
    }
    if (keyFrame == keyFrames.begin()) break;
  }
  return Host::PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the key frames there are damaged");
}

/// Leaves \p landed empty when the key frame can't be shown.
int Landing::LandAt(FilmTime keyFrame, std::optional<Landed>* landed) {
  const TimeSpan expected = film_.GetSpan(keyFrame);
  for (FilmTime lead = lead_; lead <= kLastLead; lead = std::max(kFirstLead, 2 * lead)) {
    const FilmTime begin = std::max(keyFrame - lead, std::min(keyFrame, film_.GetFloor()));
    if (const int error = Seek(begin, kExact, expected)) return error;
    const auto shown = pipeline_.GetShown();
    if (IsAtGate() && shown && !shown->isBroken && expected.Holds(shown->time)) {
      lead_ = lead;
      *landed = Landed{film_.IsTrusted() ? shown->time : keyFrame, true, false, begin};
    }
    if (IsAtGate() || begin <= film_.GetFloor()) break;
  }
  return PLAYER_ERROR_NONE;
}

/// \return whether the key frame that was waited for has come, whole or broken.
bool Landing::IsAtGate() const {
  const Passage passage = pipeline_.GetGate().GetPassage();
  return passage == Passage::kPassed || passage == Passage::kBroken;
}

/// What can be done without knowing the key frames.
int Landing::LandSomewhere(FilmTime time, std::optional<Landed>* landed) {
  if (const int error = Seek(time, kToKeyFrame, std::nullopt)) return error;
  const auto shown = pipeline_.GetShown();
  if (!shown) {
    return Host::PlayerFailure(PLAYER_ERROR_IO, __LINE__, "there is no frame near that position");
  }
  *landed = Landed{shown->time, IsKeyFrame(*shown), true, shown->time};
  return PLAYER_ERROR_NONE;
}

int Landing::Repeat(const Landed& landed, std::optional<Landed>* again) {
  if (landed.isKeyFrame) {
    if (const int error = LandAt(landed.time, again)) return error;
    if (*again) return PLAYER_ERROR_NONE;
  }
  if (const int error = GoTo(landed.time)) return error;
  *again = Landed{landed.time, landed.isKeyFrame, false, landed.time};
  return PLAYER_ERROR_NONE;
}

int Landing::GoTo(FilmTime time) { return Seek(time, kExact, std::nullopt); }

bool Landing::IsOnKeyFrame() const {
  const auto shown = pipeline_.GetShown();
  return shown && IsKeyFrame(*shown);
}

/// After a seek in MPEG-TS the flags alone say too much.
bool Landing::IsKeyFrame(const Shown& shown) const {
  const auto keyFrame = pipeline_.GetGate().Find(shown.stamp);
  if (!keyFrame || shown.isBroken) return false;
  const FilmTime begin = shown.time - static_cast<FilmTime>(shown.stamp - keyFrame->stamp);
  const KeyFrameIndex* index = film_.GetIndex();
  if (index == nullptr || index->keyFrames.empty()) return film_.HasTrueFlags();
  return Around(begin).Holds(*FindAtOrBefore(index->keyFrames, begin + kRounding));
}

int Landing::Seek(FilmTime time, GstSeekFlags manner, std::optional<TimeSpan> first) {
  pipeline_.GetGate().Prepare(first);
  return pipeline_.Move(time, manner);
}

}  // namespace Desktop
