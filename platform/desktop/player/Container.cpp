#include "Container.h"

#include <cstdint>
#include <fstream>
#include <optional>

namespace Desktop {
namespace {

/// More elements than that at a file's top aren't worth reading.
constexpr int kElementLimit = 10000;

/// Reads numbers in network order. Once something couldn't be read, everything fails.
class Bytes {
 public:
  explicit Bytes(const char* path) : file_(path, std::ios::binary) {}

  bool AreGood() const { return file_.good(); }
  std::uint64_t GetPlace() { return static_cast<std::uint64_t>(file_.tellg()); }
  void GoTo(std::uint64_t place) { file_.seekg(static_cast<std::streamoff>(place)); }

  std::uint64_t Read(std::uint64_t size) {
    std::uint64_t number = 0;
    for (std::uint64_t i = 0; i < size; ++i) number = number << 8U | ReadByte();
    return number;
  }

  unsigned ReadByte() { return static_cast<unsigned char>(file_.get()); }

 private:
  std::ifstream file_;
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

std::optional<Element> ReadElement(Bytes& file) {
  const auto readLength = [](unsigned first) {
    int length = 1;
    while (length < 9 && (first & 0x80U >> (length - 1)) == 0) ++length;
    return length;
  };
  const unsigned firstOfId = file.ReadByte();
  const int idLength = readLength(firstOfId);
  if (idLength > 4) return std::nullopt;
  std::uint64_t id = firstOfId;
  for (int i = 1; i < idLength; ++i) id = id << 8U | file.ReadByte();
  const unsigned firstOfSize = file.ReadByte();
  const int sizeLength = readLength(firstOfSize);
  if (sizeLength > 8) return std::nullopt;
  std::uint64_t size = firstOfSize & (0x7FU >> (sizeLength - 1));
  for (int i = 1; i < sizeLength; ++i) size = size << 8U | file.ReadByte();
  if (!file.AreGood()) return std::nullopt;
  const std::uint64_t begin = file.GetPlace();
  return Element{id, begin, begin + size};
}

constexpr std::uint64_t kSegment = 0x18538067, kSeekHead = 0x114D9B74, kSeek = 0x4DBB,
                        kSeekId = 0x53AB, kSeekPosition = 0x53AC, kCues = 0x1C53BB6B,
                        kCluster = 0x1F43B675;

/// \return where an entry of the table of contents points to, if that is the index.
std::optional<std::uint64_t> ReadEntry(Bytes& file, std::uint64_t end) {
  std::uint64_t id = 0;
  std::optional<std::uint64_t> place;
  while (file.GetPlace() < end) {
    const auto field = ReadElement(file);
    if (!field || field->end - field->begin > 8) return std::nullopt;
    const std::uint64_t value = file.Read(field->end - field->begin);
    if (field->id == kSeekId) id = value;
    if (field->id == kSeekPosition) place = value;
  }
  return id == kCues ? place : std::nullopt;
}

/// \return whether the table of contents points to an index that is there.
bool PointsToCues(Bytes& file, const Element& contents, std::uint64_t segment) {
  while (file.GetPlace() < contents.end) {
    const auto entry = ReadElement(file);
    if (!entry || entry->end > contents.end) return false;
    if (entry->id == kSeek) {
      if (const auto place = ReadEntry(file, entry->end)) {
        file.GoTo(segment + *place);
        return file.Read(4) == kCues;
      }
    }
    file.GoTo(entry->end);
  }
  return false;
}

/// A truncated file promises an index that it doesn't have; a live recording promises none.
bool HasCues(Bytes& file) {
  std::uint64_t segment = 0;
  for (int i = 0; i < kElementLimit; ++i) {
    const auto element = ReadElement(file);
    if (!element || element->id == kCluster) return false;
    switch (element->id) {
      case kSegment: segment = element->begin; break;  // and on with what is in it
      case kCues: return true;
      case kSeekHead:
        if (PointsToCues(file, *element, segment)) return true;
        [[fallthrough]];
      default: file.GoTo(element->end); break;
    }
  }
  return false;
}

}  // namespace

bool HasTrustedIndex(const std::string& demuxer, const char* path) {
  if (demuxer == "avidemux") return true;
  Bytes file(path);
  if (demuxer == "qtdemux") return !IsFragmented(file);
  return demuxer == "matroskademux" && HasCues(file);
}

bool HasOwnOrigin(const std::string& demuxer) {
  return demuxer == "tsdemux" || demuxer == "mpegpsdemux";
}

bool IsLostBefore(const std::string& demuxer) { return demuxer == "tsdemux"; }

bool CountsFromZero(const std::string& demuxer) { return demuxer == "matroskademux"; }

}  // namespace Desktop
