#include "KeyFrameIndex.h"

#include "PipelineWatch.h"

#include <algorithm>
#include <deque>
#include <mutex>

namespace Desktop {
namespace {

using Clock = std::chrono::steady_clock;

/// How soon it is noticed that the index isn't wanted any more.
constexpr std::chrono::milliseconds kGlance{20};

/// A file that gives nothing for so long is stuck in GStreamer.
constexpr std::chrono::seconds kStandstillLimit{10};

/// One stream of the file. Of its streaming thread, until that has ended.
struct Track {
  bool isVideo = false;
  FilmClock clock;
  std::vector<FilmTime> keyFrames;
  FilmTime end = 0;
  std::atomic<unsigned> buffers{0};

  void Read(const GstBuffer* buffer);
};

void Track::Read(const GstBuffer* buffer) {
  ++buffers;
  const auto time = clock.Convert(GST_BUFFER_PTS(buffer));
  if (!time) return;
  const GstClockTime length =
      GST_BUFFER_DURATION_IS_VALID(buffer) ? GST_BUFFER_DURATION(buffer) : 0;
  end = std::max(end, *time + static_cast<FilmTime>(length));
  if (isVideo && *time >= 0 && IsKeyFrame(buffer)) keyFrames.push_back(*time);
}

bool IsVideo(GstPad* pad) {
  const CapsPtr caps(gst_pad_query_caps(pad, nullptr));
  if (gst_caps_is_empty(caps.get()) || gst_caps_is_any(caps.get())) return false;
  const char* type = gst_structure_get_name(gst_caps_get_structure(caps.get(), 0));
  return g_str_has_prefix(type, "video/") || g_str_has_prefix(type, "image/");
}

/// A pipeline that takes a file apart and throws everything away.
class Reader {
 public:
  bool Start(const char* path);
  bool Wait(std::optional<Clock::time_point> deadline, const std::atomic<int>& isUnwanted);
  KeyFrameIndex TakeIndex();

 private:
  static void OnStream(GstElement*, GstPad* pad, gpointer reader);
  static GstPadProbeReturn OnData(GstPad*, GstPadProbeInfo* info, gpointer track);
  unsigned CountBuffers();

  const ElementPtr pipeline_{MakeElement("pipeline")};
  PipelineWatch watch_{pipeline_.get()};
  std::mutex mutex_;
  std::deque<Track> tracks_;                 // whose places in memory stay
  StreamingPtr streaming_{pipeline_.get()};  // uses all of them
};

bool Reader::Start(const char* path) {
  const ElementPtr source = MakeElement("filesrc");
  const ElementPtr parser = MakeElement("parsebin");
  if (source == nullptr || parser == nullptr) return false;
  g_object_set(source.get(), "location", path, nullptr);
  g_signal_connect(parser.get(), "pad-added", G_CALLBACK(OnStream), this);
  gst_bin_add_many(GST_BIN(pipeline_.get()), source.get(), parser.get(), nullptr);
  return gst_element_link(source.get(), parser.get()) &&
         gst_element_set_state(pipeline_.get(), GST_STATE_PLAYING) != GST_STATE_CHANGE_FAILURE;
}

void Reader::OnStream(GstElement*, GstPad* pad, gpointer data) {
  auto* reader = static_cast<Reader*>(data);
  const ElementPtr sink = MakeElement("fakesink sync=false async=false");
  if (sink == nullptr) return;
  gst_bin_add(GST_BIN(reader->pipeline_.get()), sink.get());
  Track* track = nullptr;
  {
    std::lock_guard lock(reader->mutex_);
    track = &reader->tracks_.emplace_back();
  }
  track->isVideo = IsVideo(pad);
  constexpr int kWhat = GST_PAD_PROBE_TYPE_BUFFER | GST_PAD_PROBE_TYPE_EVENT_DOWNSTREAM;
  Observe(sink.get(), "sink", kWhat, OnData, track);
  const PadPtr input(gst_element_get_static_pad(sink.get(), "sink"));
  gst_pad_link(pad, input.get());
  gst_element_sync_state_with_parent(sink.get());
}

GstPadProbeReturn Reader::OnData(GstPad*, GstPadProbeInfo* info, gpointer data) {
  auto* track = static_cast<Track*>(data);
  if (GST_PAD_PROBE_INFO_TYPE(info) & GST_PAD_PROBE_TYPE_BUFFER) {
    track->Read(GST_PAD_PROBE_INFO_BUFFER(info));
  } else if (GST_EVENT_TYPE(GST_PAD_PROBE_INFO_EVENT(info)) == GST_EVENT_SEGMENT) {
    track->clock.Follow(GST_PAD_PROBE_INFO_EVENT(info));
  }
  return GST_PAD_PROBE_OK;
}

unsigned Reader::CountBuffers() {
  std::lock_guard lock(mutex_);
  unsigned count = 0;
  for (const Track& track : tracks_) count += track.buffers;
  return count;
}

/// \return whether what can be read was read.
bool Reader::Wait(std::optional<Clock::time_point> deadline, const std::atomic<int>& isUnwanted) {
  unsigned seen = 0;
  auto lastProgress = Clock::now();
  while (!watch_.WaitForEnd(kGlance)) {
    const auto now = Clock::now();
    if (isUnwanted != 0 || (deadline && now > *deadline)) return false;
    if (const unsigned count = CountBuffers(); count != seen) {
      seen = count;
      lastProgress = now;
    }
    if (now - lastProgress > kStandstillLimit) return false;
  }
  return true;
}

/// Of several pictures the first is taken, as it is played.
KeyFrameIndex Reader::TakeIndex() {
  streaming_.reset();
  KeyFrameIndex index;
  for (Track& track : tracks_) {
    if (index.keyFrames.empty()) index.keyFrames = std::move(track.keyFrames);
    index.end = std::max(index.end, track.end);
  }
  std::sort(index.keyFrames.begin(), index.keyFrames.end());
  return index;
}

}  // namespace

std::optional<KeyFrameIndex> ReadKeyFrames(const char* path,
                                           std::optional<std::chrono::milliseconds> limit,
                                           const std::atomic<int>& isUnwanted) {
  std::optional<Clock::time_point> deadline;
  if (limit) deadline = Clock::now() + *limit;
  Reader reader;
  if (!reader.Start(path) || !reader.Wait(deadline, isUnwanted)) return std::nullopt;
  return reader.TakeIndex();
}

}  // namespace Desktop
