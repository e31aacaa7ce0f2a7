// Every kind of file, against what ffprobe and ffmpeg see in it. What comes out is a table, which
// is written into the build's folder.

#include "PlayerOnMedia.h"

#include <dlfcn.h>

#include <algorithm>
#include <atomic>
#include <cmath>
#include <iomanip>

namespace {

std::atomic<int> seeks{0};

#if defined(__SANITIZE_THREAD__)
constexpr int kThoroughness = 0;
#elif defined(__SANITIZE_ADDRESS__)
constexpr int kThoroughness = 1;
#else
constexpr int kThoroughness = 2;
#endif

struct Kind {
  const char* what;
  const char* file;
  int thoroughness = 2;  // from which on it is tested
  long duration = 12000;
  double seeks = 1.12;  // on average at most
};

constexpr Kind kKinds[] = {
    {"MP4, H.264 with B-frames", "h264.mp4", 1},
    {"MP4, H.264, open groups", "open.mp4", 2, 12000, 1.2},
    {"MP4, H.264, variable rate", "varying.mp4"},
    {"MP4, H.264, edit list", "edited.mp4", 2, 10320},
    {"MP4, H.264, fragmented", "fragmented.mp4", 1, 12080},
    {"MP4, H.264, late video", "late-video.mp4", 1, 13500},
    {"MP4, H.264, late sound", "late-sound.mp4", 2, 13500},
    {"MP4, H.264, rotated", "rotated.mp4"},
    {"MP4, H.264, narrow pixels", "narrow.mp4"},
    {"MP4, HEVC, open groups", "hevc.mp4", 2, 12000, 1.25},
    {"MP4, MPEG-4 with B-frames", "mpeg4.mp4", 2, 12000, 1.25},
    {"MOV, H.264, 29.97 a second", "ntsc.mov"},
    {"MOV, H.264, late video", "late-video.mov", 2, 13500},
    {"Matroska, H.264", "h264.mkv"},
    {"Matroska, H.264, variable rate", "varying.mkv"},
    {"Matroska, H.264, late video", "late-video.mkv", 2, 13500},
    {"Matroska, H.264, starts at 100 s", "offset.mkv"},
    {"Matroska, H.264, no index", "noindex.mkv", 1},
    {"WebM, VP8", "vp8.webm"},
    {"WebM, VP8, scenes of uneven lengths", "scenes.webm", 2, 20033},
    {"WebM, VP8, several key frames a cluster", "dense.webm", 1, 12000, 1.7},
    {"WebM, VP9", "vp9.webm"},
    {"WebM, VP8, no index", "noindex.webm"},
    {"AVI, MPEG-4", "mpeg4.avi"},
    {"FLV, H.264", "h264.flv"},
    {"Ogg, Theora", "theora.ogv"},
    {"MPEG-TS, H.264 with B-frames", "h264.ts", 1},
    {"MPEG-TS, H.264, open groups", "open.ts"},
    {"MPEG-TS, H.264, no sound", "silent.ts"},
    {"MPEG-TS, H.264, late sound", "late-sound.ts", 2, 13500},
    {"MPEG-TS, H.264, starts at 100 s", "offset.ts"},
    {"MPEG-TS, HEVC", "hevc.ts"},
    {"MPEG-TS, MPEG-2", "mpeg2.ts"},
    {"MPEG-PS, MPEG-2", "mpeg2.mpg"},
};

class KeyFramesTest : public PlayerOnMedia {
 protected:
  /// Opens a film, and reads what the others see in it.
  void OpenAndRead(const std::string& file) {
    EXPECT_EQ(Open(file), E_SUCCESS);
    std::ifstream list(Media(file) + ".keyframes");
    keyFrames.clear();
    std::transform(std::istream_iterator<long>(list), {}, std::back_inserter(keyFrames),
                   [](long microseconds) { return microseconds / 1000; });
    pictures = ReadFile(Media(file) + ".pictures");
    ASSERT_GT(keyFrames.size(), 7U) << "too few to test with";
  }

  /// The ends, and around the first key frames, one in the middle and the last.
  std::vector<long> Places() const {
    std::vector<long> places{0, player.GetDuration(), player.GetDuration() - 1};
    const std::size_t last = keyFrames.size() - 1;
    for (const std::size_t i : {std::size_t{0}, std::size_t{1}, last / 2, last - 1, last}) {
      for (const long beside : {-480, -40, -1, 0, 1, 40, 90}) {
        places.push_back(std::clamp(keyFrames[i] + beside, 0L, player.GetDuration()));
      }
    }
    return places;
  }

  std::size_t LastAtOrBefore(long asked) const {
    const auto after = std::upper_bound(keyFrames.begin(), keyFrames.end(), asked);
    return after == keyFrames.begin() ? 0 : static_cast<std::size_t>(after - keyFrames.begin()) - 1;
  }

  /// Of the first frame some demuxers tell the time of the sound.
  bool Is(std::size_t keyFrame, long position) const {
    const long tolerance = keyFrame == 0 ? 25 : 1;
    return std::labs(position - keyFrames[keyFrame]) <= tolerance;
  }

  /// How much the picture differs from a key frame's, on average of its bytes.
  double Differ(const std::vector<unsigned char>& picture, std::size_t keyFrame) const {
    const std::size_t size = picture.size();
    if (pictures.size() != size * keyFrames.size()) return 255;  // not even the same shape
    double sum = 0;
    for (std::size_t i = 0; i < size; ++i) {
      sum += std::abs(picture[i] - static_cast<unsigned char>(pictures[keyFrame * size + i]));
    }
    return sum / static_cast<double>(size);
  }

  void ExpectShown(long asked) {
    SCOPED_TRACE("asked for " + std::to_string(asked));
    ASSERT_EQ(seeker.SeekTo(asked), E_SUCCESS);
    EXPECT_TRUE(player.IsKeyFrame());
    const std::size_t expected = LastAtOrBefore(asked);
    const long landed = player.GetPosition();
    EXPECT_TRUE(Is(expected, landed)) << landed << " isn't " << keyFrames[expected];
    const double difference = Differ(Capture(), expected);
    EXPECT_LT(difference, 8);
    onKeyFrame += Is(LastAtOrBefore(landed + 1), landed);
    right += Is(expected, landed);
    intact += difference < 8;
  }

  /// Seeks everywhere and writes what came of it as a row.
  void ExpectShownEverywhere(const char* what, std::ostream& table) {
    onKeyFrame = right = intact = seeks = 0;
    const std::vector<long> places = Places();
    for (const long asked : places) ExpectShown(asked);
    const auto count = static_cast<int>(places.size());
    table << "| " << what << " | " << count;
    for (const int part : {onKeyFrame, right, intact}) table << " | " << part * 100 / count << " %";
    table << " | " << std::fixed << std::setprecision(2) << double(seeks) / count << " |\n";
  }

  /// Of the last picture of MPEG-2 a parser may say too much.
  void ExpectListed() {
    std::vector<long> listed;
    ASSERT_EQ(player.GetKeyFrames(listed), E_SUCCESS);
    ASSERT_GE(listed.size(), keyFrames.size());
    for (std::size_t i = 0; i < keyFrames.size(); ++i) EXPECT_TRUE(Is(i, listed[i])) << listed[i];
  }

  void ExpectPlaysOnFrom(std::size_t keyFrame) {
    SCOPED_TRACE("plays on from " + std::to_string(keyFrames[keyFrame]));
    ASSERT_EQ(seeker.SeekTo(keyFrames[keyFrame] + 90), E_SUCCESS);
    EXPECT_TRUE(player.IsKeyFrame());
    const auto picture = Capture();
    ASSERT_EQ(player.Play(), E_SUCCESS);
    ExpectPlaying(keyFrames[keyFrame] - 25);
    EXPECT_NE(Capture(), picture) << "still shows key frames only";
  }

  std::vector<long> keyFrames;  // in milliseconds
  std::string pictures;
  int onKeyFrame = 0, right = 0, intact = 0;
};

TEST_F(KeyFramesTest, SeekShowsTheLastOneAtOrBeforeThePlaceAndPlaysOnFromThere) {
  if (kThoroughness == 0) GTEST_SKIP() << "too slow under ThreadSanitizer";
  std::ofstream table(std::string(std::getenv("ZELKORA_BUILD")) + "/key-frames.md");
  table << "| File | Positions | On a key frame | The last at or before | Intact | Seeks |\n"
           "| --- | --- | --- | --- | --- | --- |\n";
  for (const auto& [what, file, thoroughness, duration, mostSeeks] : kKinds) {
    SCOPED_TRACE(std::string(file) + ": " + what);
    if (thoroughness > kThoroughness) continue;
    ASSERT_NO_FATAL_FAILURE(OpenAndRead(file));
    EXPECT_LE(std::labs(player.GetDuration() - duration), 100) << player.GetDuration();
    ExpectShownEverywhere(what, table);
    EXPECT_LE(seeks, mostSeeks * static_cast<double>(Places().size()));
    ExpectListed();
    for (const std::size_t keyFrame : {0, 5}) {
      ExpectPlaysOnFrom(keyFrame);
      ASSERT_EQ(player.Pause(), E_SUCCESS);
    }
    ASSERT_EQ(player.Play(), E_SUCCESS);
    ASSERT_EQ(seeker.SeekTo(keyFrames[1] + 90), E_SUCCESS);
    EXPECT_TRUE(player.IsKeyFrame());
    ExpectPlaying(keyFrames[1]);
  }
}

}  // namespace

/// Counts what the player does, in place of GStreamer's own.
extern "C" __attribute__((visibility("default"))) gboolean gst_element_seek_simple(
    GstElement* element, GstFormat format, GstSeekFlags flags, gint64 position) {
  static const auto seek =
      reinterpret_cast<decltype(&gst_element_seek_simple)>(dlsym(RTLD_NEXT, __func__));
  ++seeks;
  return seek(element, format, flags, position);
}
