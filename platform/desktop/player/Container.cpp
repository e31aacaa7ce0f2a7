#include "Container.h"

#include <algorithm>
#include <cstdint>
#include <fstream>
#include <optional>

namespace Desktop {
namespace {

/// More elements than that in one place aren't worth reading.
constexpr int kElementLimit = 100000;

/// Reads numbers in network order. Once something couldn't be read, everything fails.
class Bytes {
 public:
  explicit Bytes(const char* path) : file_(path, std::ios::binary) {}

  bool AreGood() const { return file_.good(); }
  std::uint64_t GetPlace() const { return place_; }

  /// Seeking discards the stream's buffer, so a short distance is skipped by reading.
  void GoTo(std::uint64_t place) {
    constexpr std::uint64_t kShort = 4096;
    if (place > place_ && place - place_ < kShort) {
      file_.ignore(static_cast<std::streamsize>(place - place_));
    } else if (place != place_) {
      file_.seekg(static_cast<std::streamoff>(place));
    }
    place_ = place;
  }

  std::uint64_t Read(std::uint64_t size) {
    std::uint64_t number = 0;
    for (std::uint64_t i = 0; i < size; ++i) number = number << 8U | ReadByte();
    return number;
  }

  unsigned ReadByte() {
    ++place_;
    return static_cast<unsigned char>(file_.get());
  }

 private:
  std::ifstream file_;
  std::uint64_t place_ = 0;
};

/// A fragmented MP4's index, if it has one, covers a part of it only.
bool IsFragmented(Bytes& file) {
  constexpr std::uint64_t kFragment = 0x6D6F6F66;  // "moof"
  for (int i = 0; i < kElementLimit; ++i) {
    const std::uint64_t begin = file.GetPlace();
    std::uint64_t size = file.Read(4);
    const std::uint64_t type = file.Read(4);
    if (size == 1) size = file.Read(8);
    if (!file.AreGood() || size < 8) return false;  // the last one has size 0: to the end
    if (type == kFragment) return true;
    file.GoTo(begin + size);
  }
  return true;
}

/// An element of a Matroska file.
struct Element {
  std::uint64_t id;
  std::uint64_t begin;  // of its content
  std::uint64_t end;
};

/// A number tells its length by the first bit that is set, which belongs to it in an id only.
std::optional<std::uint64_t> ReadVariable(Bytes& file, unsigned longest, bool isId) {
  const unsigned first = file.ReadByte();
  unsigned length = 1;
  while (length <= longest && (first & 0x80U >> (length - 1)) == 0) ++length;
  if (length > longest) return std::nullopt;
  const std::uint64_t begin = isId ? first : first & (0x7FU >> (length - 1));
  return begin << 8 * (length - 1) | file.Read(length - 1);
}

std::optional<Element> ReadElement(Bytes& file) {
  const auto id = ReadVariable(file, 4, true);
  if (!id) return std::nullopt;
  const auto size = ReadVariable(file, 8, false);
  if (!size || !file.AreGood()) return std::nullopt;
  const std::uint64_t begin = file.GetPlace();
  return Element{*id, begin, begin + *size};
}

constexpr std::uint64_t kSegment = 0x18538067, kSeekHead = 0x114D9B74, kSeek = 0x4DBB,
                        kSeekId = 0x53AB, kSeekPosition = 0x53AC, kInfo = 0x1549A966,
                        kTimestampScale = 0x2AD7B1, kTracks = 0x1654AE6B, kTrackNumber = 0xD7,
                        kTrackType = 0x83, kCues = 0x1C53BB6B, kCueTime = 0xB3,
                        kCueTrackPositions = 0xB7, kCueTrack = 0xF7, kCluster = 0x1F43B675;

/// Calls \p use with each element between two places, until it returns false.
template <typename Use>
void ForEach(Bytes& file, std::uint64_t begin, std::uint64_t end, Use use) {
  file.GoTo(begin);
  for (int i = 0; i < kElementLimit && file.GetPlace() < end; ++i) {
    const auto element = ReadElement(file);
    if (!element || !use(*element)) return;
    file.GoTo(element->end);
  }
}

std::uint64_t ReadNumber(Bytes& file, const Element& element) {
  return file.Read(std::min<std::uint64_t>(element.end - element.begin, 8));
}

/// \return the number that stands in \p element under \p id, else \p otherwise
std::uint64_t FindNumber(Bytes& file, const Element& element, std::uint64_t id,
                         std::uint64_t otherwise = 0) {
  std::uint64_t number = otherwise;
  ForEach(file, element.begin, element.end, [&](const Element& field) {
    if (field.id == id) number = ReadNumber(file, field);
    return field.id != id;
  });
  return number;
}

/// What a Matroska file tells before its first cluster.
struct Head {
  std::optional<Element> cues;  // its index
  std::uint64_t scale = GST_MSECOND;
  std::uint64_t video = 0;  // of several pictures the first is played
};

/// A truncated file promises an index that it doesn't have; a live recording promises none.
std::optional<Element> FindCues(Bytes& file, std::uint64_t place) {
  file.GoTo(place);
  const auto element = ReadElement(file);
  return element && element->id == kCues ? element : std::nullopt;
}

std::uint64_t FindVideo(Bytes& file, const Element& tracks) {
  constexpr std::uint64_t kVideo = 1;
  std::uint64_t number = 0;
  ForEach(file, tracks.begin, tracks.end, [&](const Element& entry) {
    if (FindNumber(file, entry, kTrackType) == kVideo) {
      number = FindNumber(file, entry, kTrackNumber);
    }
    return number == 0;
  });
  return number;
}

Head ReadHead(Bytes& file) {
  Head head;
  std::uint64_t segment = 0;
  const auto readContents = [&](const Element& entry) {
    const bool isOfCues = entry.id == kSeek && FindNumber(file, entry, kSeekId) == kCues;
    if (isOfCues) head.cues = FindCues(file, segment + FindNumber(file, entry, kSeekPosition));
    return true;
  };
  const auto read = [&](const Element& element) {
    switch (element.id) {
      case kSeekHead: ForEach(file, element.begin, element.end, readContents); break;
      case kInfo: head.scale = FindNumber(file, element, kTimestampScale, head.scale); break;
      case kTracks: head.video = FindVideo(file, element); break;
      case kCues: head.cues = element; break;
      default: break;
    }
    return element.id != kCluster;
  };
  ForEach(file, 0, UINT64_MAX, [&](const Element& element) {
    segment = element.begin;
    if (element.id == kSegment) ForEach(file, element.begin, element.end, read);
    return element.id != kSegment;
  });
  return head;
}

/// \return the time stamps that the index of a Matroska file lists for its video.
std::vector<FilmTime> ReadCues(Bytes& file, const Head& head) {
  constexpr std::uint64_t kLongest = 1ULL << 62U;  // damage beyond any film
  std::vector<FilmTime> times;
  ForEach(file, head.cues->begin, head.cues->end, [&](const Element& point) {
    std::uint64_t time = 0;
    ForEach(file, point.begin, point.end, [&](const Element& field) {
      if (field.id == kCueTime) time = ReadNumber(file, field) * head.scale;
      const bool isOfVideo =
          field.id == kCueTrackPositions && FindNumber(file, field, kCueTrack) == head.video;
      if (isOfVideo && time < kLongest) times.push_back(static_cast<FilmTime>(time));
      return true;
    });
    return true;
  });
  std::sort(times.begin(), times.end());
  return times;
}

}  // namespace

OwnIndex ReadOwnIndex(const std::string& demuxer, const char* path) {
  if (demuxer == "avidemux") return {true, {}};
  Bytes file(path);
  if (demuxer == "qtdemux") return {!IsFragmented(file), {}};
  if (demuxer != "matroskademux") return {};
  const Head head = ReadHead(file);
  if (!head.cues) return {};
  return {true, ReadCues(file, head)};
}

bool HasOwnOrigin(const std::string& demuxer) {
  return demuxer == "tsdemux" || demuxer == "mpegpsdemux";
}

bool IsLostBefore(const std::string& demuxer) { return demuxer == "tsdemux"; }

bool CountsFromZero(const std::string& demuxer) { return demuxer == "matroskademux"; }

}  // namespace Desktop
