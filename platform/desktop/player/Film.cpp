#include "Film.h"

#include "native/PlayerError.h"

#include <Tizen/Base/Log.h>

namespace Desktop {
namespace {

/// Nobody waits longer for a seek.
constexpr std::chrono::seconds kIndexLimit{5};

}  // namespace

Film::Film(const char* path, const std::atomic<int>& isUnwanted, const std::string& demuxer,
           FilmTime first, FilmTime shift)
    : path_(path),
      isUnwanted_(isUnwanted),
      own_(ReadOwnIndex(demuxer, path)),
      origin_(HasOwnOrigin(demuxer) ? first : -1),
      floor_(IsLostBefore(demuxer) ? first : 0),
      excess_(CountsFromZero(demuxer) ? shift : 0) {}

FilmTime Film::FindDuration(FilmTime told) {
  if (IsTrusted()) return told - excess_;
  const KeyFrameIndex* index = FindIndex();
  return index == nullptr ? told : index->end - GetOrigin();
}

TimeSpan Film::GetSpan(FilmTime keyFrame) const {
  TimeSpan span = Around(keyFrame);
  if (!HasTrueFlags() || !index_ || index_->keyFrames.size() < 2) return span;
  if (span.Holds(index_->keyFrames[0])) span.to = index_->keyFrames[1] - kRounding;
  return span;
}

const KeyFrameIndex* Film::FindIndex() {
  if (!index_ && !isGivenUp_) {
    index_ = ReadKeyFrames(path_.c_str(), kIndexLimit, isUnwanted_);
    isGivenUp_ = !index_;
    if (isGivenUp_ && isUnwanted_ == 0) {
      SysLogInternal(Host::kPlayerModule, "", __LINE__,
                     "\"%s\" says nothing of its key frames, and reading all of it takes too long: "
                     "seeks land where its container can tell",
                     path_.c_str());
    }
  }
  return index_ && !index_->keyFrames.empty() ? &*index_ : nullptr;
}

const KeyFrameIndex* Film::FindIndexAtAnyRate() {
  if (!index_) index_ = ReadKeyFrames(path_.c_str(), std::nullopt, isUnwanted_);
  return GetIndex();
}

}  // namespace Desktop
