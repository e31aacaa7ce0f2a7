// Compares a seek through the library with the plain key-frame seek of a hand-made pipeline, both
// paused and on the same positions, and fails when the library's share is above a limit. Of a file
// whose container has no index, it measures the first seek, which makes one, and the others.

#include <Tizen/Media/Player.h>
#include <Zelkora/Media/VideoKeyFrameSeeker.h>
#include <gst/gst.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <random>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

namespace {

constexpr int kSeeks = 200;

void Require(bool condition, const char* what) {
  if (!condition) throw std::runtime_error(what);
}

/// A seek as the library does it.
class LibrarySide {
 public:
  explicit LibrarySide(const std::string& path) {
    Require(player_.Construct() == E_SUCCESS, "the player can't be constructed");
    Require(player_.OpenFile(path.c_str()) == E_SUCCESS, "the player can't open the file");
    Require(seeker_.Construct(player_) == E_SUCCESS, "the seeker can't be constructed");
  }

  long GetDuration() const { return player_.GetDuration(); }

  void Seek(long position) {
    Require(seeker_.SeekTo(position) == E_SUCCESS, "the seeker's seek fails");
    Require(player_.GetPosition() >= 0, "the player has no position");
  }

 private:
  Tizen::Media::Player player_;
  Zelkora::Media::VideoKeyFrameSeeker seeker_;
};

/// A seek as a program does it that uses GStreamer itself.
class PlainSide {
 public:
  explicit PlainSide(const std::string& path) {
    pipeline_ = gst_element_factory_make("playbin", nullptr);
    char* uri = gst_filename_to_uri(path.c_str(), nullptr);
    g_object_set(pipeline_, "uri", uri, "flags", 0x1 | 0x2, "video-sink", MakeSink("appsink"),
                 "audio-sink", MakeSink("fakesink"), nullptr);
    g_free(uri);
    bus_ = gst_element_get_bus(pipeline_);
    gst_element_set_state(pipeline_, GST_STATE_PAUSED);
    Await();
  }

  ~PlainSide() {
    gst_element_set_state(pipeline_, GST_STATE_NULL);
    gst_object_unref(bus_);
    gst_object_unref(pipeline_);
  }

  PlainSide(const PlainSide&) = delete;
  PlainSide& operator=(const PlainSide&) = delete;

  void Seek(long position) {
    constexpr auto kFlags = static_cast<GstSeekFlags>(GST_SEEK_FLAG_FLUSH | GST_SEEK_FLAG_KEY_UNIT);
    Require(gst_element_seek_simple(pipeline_, GST_FORMAT_TIME, kFlags, position * GST_MSECOND),
            "the plain seek fails");
    Await();
    gint64 landed = -1;
    Require(gst_element_query_position(pipeline_, GST_FORMAT_TIME, &landed),
            "the pipeline has no position");
  }

 private:
  static GstElement* MakeSink(const char* factory) {
    GstElement* sink = gst_element_factory_make(factory, nullptr);
    g_object_set(sink, "sync", TRUE, nullptr);
    return sink;
  }

  void Await() {
    constexpr auto kAnswers =
        static_cast<GstMessageType>(GST_MESSAGE_ASYNC_DONE | GST_MESSAGE_ERROR);
    GstMessage* answer = gst_bus_timed_pop_filtered(bus_, 10 * GST_SECOND, kAnswers);
    const bool isDone = answer != nullptr && GST_MESSAGE_TYPE(answer) == GST_MESSAGE_ASYNC_DONE;
    if (answer != nullptr) gst_message_unref(answer);
    Require(isDone, "the plain pipeline fails");
  }

  GstElement* pipeline_;
  GstBus* bus_;
};

/// A pipeline goes on decoding for a moment after a seek, which would be the next one's time.
template <typename Side>
double MeasureMilliseconds(Side& side, long position) {
  std::this_thread::sleep_for(std::chrono::milliseconds(20));
  const auto begin = std::chrono::steady_clock::now();
  side.Seek(position);
  return std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - begin)
      .count();
}

double Median(std::vector<double> values) {
  const auto middle = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2);
  std::nth_element(values.begin(), middle, values.end());
  return *middle;
}

/// \return the library's median time as a share of the plain one
double Compare(const std::string& path) {
  LibrarySide library(path);
  PlainSide plain(path);
  std::vector<double> libraryTimes;
  std::vector<double> plainTimes;
  std::mt19937 random(1);
  const long duration = library.GetDuration();
  for (int i = 0; i < kSeeks; ++i) {
    const long position = static_cast<long>(random()) % duration;
    const bool libraryFirst = random() % 2 == 0;
    if (libraryFirst) libraryTimes.push_back(MeasureMilliseconds(library, position));
    plainTimes.push_back(MeasureMilliseconds(plain, position));
    if (!libraryFirst) libraryTimes.push_back(MeasureMilliseconds(library, position));
  }
  const double ratio = Median(libraryTimes) / Median(plainTimes);
  std::printf("%s: library %.2f ms, plain %.2f ms, ratio %.2f", path.c_str(), Median(libraryTimes),
              Median(plainTimes), ratio);
  return ratio;
}

/// \param path of a file that has been read before
/// \param limits in milliseconds, of the first seek and of the median of the others: "1000/50"
bool HoldsLimits(const std::string& path, const std::string& limits) {
  LibrarySide library(path);
  const double first = MeasureMilliseconds(library, 5000);
  std::vector<double> times;
  std::mt19937 random(1);
  const auto duration = static_cast<unsigned long>(library.GetDuration());
  for (int i = 0; i < kSeeks; ++i) {
    times.push_back(MeasureMilliseconds(library, static_cast<long>(random() % duration)));
  }
  const bool holds =
      first <= std::stod(limits) && Median(times) <= std::stod(limits.substr(limits.find('/') + 1));
  std::printf("%s: first seek %.0f ms, later ones %.1f ms, limits %s ms: %s\n", path.c_str(), first,
              Median(times), limits.c_str(), holds ? "holds" : "EXCEEDED");
  return holds;
}

/// \param argument "FILE:LIMIT" or "FILE:FIRST/LATER"
bool HoldsLimit(const std::string& argument) {
  const std::size_t colon = argument.rfind(':');
  Require(colon != std::string::npos, "an argument is not FILE:LIMIT");
  if (argument.find('/', colon) != std::string::npos) {
    return HoldsLimits(argument.substr(0, colon), argument.substr(colon + 1));
  }
  const double limit = std::stod(argument.substr(colon + 1));
  const bool holds = Compare(argument.substr(0, colon)) <= limit;
  std::printf(", limit %.2f: %s\n", limit, holds ? "holds" : "EXCEEDED");
  return holds;
}

}  // namespace

int main(int count, char** arguments) {
  if (count < 2) {
    std::fprintf(stderr, "usage: %s FILE:LIMIT|FILE:FIRST/LATER...\n", arguments[0]);
    return 2;
  }
  // Both sides play into the same kind of sink.
  setenv("PULSE_SERVER", "unix:/nonexistent/pulse", 1);
  try {
    bool holds = true;
    for (int i = 1; i < count; ++i) holds = HoldsLimit(arguments[i]) && holds;
    return holds ? 0 : 1;
  } catch (const std::exception& exception) {
    std::fprintf(stderr, "%s\n", exception.what());
    return 2;
  }
}
