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

Landed Landing::LandAtOrBefore(FilmTime time) {
  if (film_.IsTrusted()) {
    bool isFirst = false;
    const auto landed = CorrectByList(time, TryContainer(time, &isFirst));
    if (landed && (landed->time <= time || isFirst)) return *landed;
  }
  return film_.FindIndex() != nullptr ? LandByIndex(time) : LandSomewhere(time);
}

/// \return nothing when the container led to no key frame. It may be one after \p time: the file's
/// first one, if nothing comes before it.
std::optional<Landed> Landing::TryContainer(FilmTime time, bool* isFirst) {
  FilmTime target = time;
  std::optional<Landed> landed;
  // A time between a key frame's decoding and its showing leads to that key frame: once more, then.
  for (int i = 0; i < 2; ++i) {
    Seek(target, kToKeyFrame, std::nullopt);
    const auto shown = pipeline_.GetShown();
    if (!shown || shown->isBroken) return std::nullopt;
    const auto keyFrame = pipeline_.GetGate().Find(shown->stamp);
    if (!keyFrame) return std::nullopt;
    target = shown->time - static_cast<FilmTime>(keyFrame->reordering) - kRounding;
    *isFirst = target < 0 || (landed && landed->time == shown->time);
    landed = Landed{shown->time, true, true, shown->time};
    if (shown->time <= time || *isFirst) break;
  }
  return landed;
}

/// A demuxer goes to the first key frame of a cluster, though the container lists all of them.
/// \return nothing when there is no key frame at the listed time
std::optional<Landed> Landing::CorrectByList(FilmTime time, std::optional<Landed> landed) {
  const auto& listed = film_.GetListed();
  if (listed.empty() || !landed) return landed;
  const auto shown = pipeline_.GetShown();
  if (!shown) return landed;
  const FilmTime shift = static_cast<FilmTime>(shown->stamp) - shown->time;
  FilmTime limit = time;
  // Listed times are whole milliseconds: the key frame may be a little later, and then after the
  // time.
  for (int i = 0; i < 2; ++i) {
    const FilmTime keyFrame = *FindAtOrBefore(listed, limit + shift) - shift;
    if (Around(keyFrame).Holds(landed->time)) break;
    landed = LandAt(keyFrame);
    if (!landed || landed->time <= time) break;
    limit = keyFrame - 1;
  }
  return landed;
}

Landed Landing::LandByIndex(FilmTime time) {
  const auto& keyFrames = film_.GetIndex()->keyFrames;
  auto keyFrame = FindAtOrBefore(keyFrames, time);
  for (int broken = 0; broken <= kBrokenLimit; ++broken, --keyFrame) {
    if (const auto landed = LandAt(*keyFrame)) return *landed;
    if (!IsAtGate()) {
      throw Host::PlayerFailure(PLAYER_ERROR_IO, __LINE__,
                                "GStreamer doesn't find the key frame at %ld ms",
                                static_cast<long>(*keyFrame / GST_MSECOND));
    }
    if (keyFrame == keyFrames.begin()) break;
  }
  throw Host::PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the key frames there are damaged");
}

/// \return nothing when the key frame can't be shown
std::optional<Landed> Landing::LandAt(FilmTime keyFrame) {
  const TimeSpan expected = film_.GetSpan(keyFrame);
  for (FilmTime lead = lead_; lead <= kLastLead; lead = std::max(kFirstLead, 2 * lead)) {
    const FilmTime begin = std::max(keyFrame - lead, std::min(keyFrame, film_.GetFloor()));
    Seek(begin, kExact, expected);
    const auto shown = pipeline_.GetShown();
    if (IsAtGate() && shown && !shown->isBroken && expected.Holds(shown->time)) {
      lead_ = lead;
      return Landed{film_.IsTrusted() ? shown->time : keyFrame, true, false, begin};
    }
    if (IsAtGate() || begin <= film_.GetFloor()) break;
  }
  return std::nullopt;
}

/// \return whether the key frame that was waited for has come, whole or broken.
bool Landing::IsAtGate() const {
  const Passage passage = pipeline_.GetGate().GetPassage();
  return passage == Passage::kPassed || passage == Passage::kBroken;
}

/// What can be done without knowing the key frames.
Landed Landing::LandSomewhere(FilmTime time) {
  Seek(time, kToKeyFrame, std::nullopt);
  const auto shown = pipeline_.GetShown();
  if (!shown) {
    throw Host::PlayerFailure(PLAYER_ERROR_IO, __LINE__, "there is no frame near that position");
  }
  return {shown->time, IsKeyFrame(*shown), true, shown->time};
}

Landed Landing::Repeat(const Landed& landed) {
  if (landed.isKeyFrame) {
    if (const auto again = LandAt(landed.time)) return *again;
  }
  GoTo(landed.time);
  return {landed.time, landed.isKeyFrame, false, landed.time};
}

void Landing::GoTo(FilmTime time) { Seek(time, kExact, std::nullopt); }

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

void Landing::Seek(FilmTime time, GstSeekFlags manner, std::optional<TimeSpan> first) {
  pipeline_.GetGate().Prepare(first);
  pipeline_.Move(time, manner);
}

}  // namespace Desktop
