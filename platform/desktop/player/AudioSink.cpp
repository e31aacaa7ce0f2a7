#include "AudioSink.h"

#include "desktop/sound/Session.h"

#include <gst/audio/gstaudiobasesink.h>
#include <pulse/pulseaudio.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdint>
#include <cstring>
#include <string>
#include <thread>
#include <utility>

namespace Desktop {
namespace {

using Clock = std::chrono::steady_clock;

/// A local server answers in some milliseconds.
constexpr std::chrono::milliseconds kServerLimit{300};

/// As far as a sink writes ahead of what is heard, and so the longest wait for it.
constexpr std::chrono::milliseconds kWrittenAhead{200};

/// By then a new stream is played.
constexpr GstClockTime kSilenceAfter = 500 * GST_MSECOND;

/// Runs one turn of the loop, at most until \p end. \return whether there may be another
bool RunUntil(pa_mainloop* loop, Clock::time_point end) {
  using std::chrono::microseconds;
  const auto left = std::chrono::duration_cast<microseconds>(end - Clock::now()).count();
  return left > 0 && pa_mainloop_prepare(loop, static_cast<int>(left)) >= 0 &&
         pa_mainloop_poll(loop) >= 0 && pa_mainloop_dispatch(loop) >= 0;
}

/// A connection to the sound server that works only while it is waited for.
class ServerVisit {
 public:
  ServerVisit() = default;
  ~ServerVisit() {
    if (context_ != nullptr) pa_context_disconnect(context_.get());
  }

  ServerVisit(const ServerVisit&) = delete;
  ServerVisit& operator=(const ServerVisit&) = delete;

  /// \return whether the server has answered in time; to be called once, and first
  bool Connect() {
    if (loop_ == nullptr) return false;
    context_.reset(pa_context_new(pa_mainloop_get_api(loop_.get()), "zelkora"));
    return context_ != nullptr &&
           pa_context_connect(context_.get(), nullptr, PA_CONTEXT_NOAUTOSPAWN, nullptr) >= 0 &&
           WaitUntil([this] { return pa_context_get_state(context_.get()) == PA_CONTEXT_READY; });
  }

  /// Begins to play silence, which goes on as long as this lives: a server plays it for a stream
  /// that isn't fed. \return whether the server plays it
  bool PlaySilence() {
    constexpr pa_sample_spec kFormat = {PA_SAMPLE_S16NE, 8000, 1};
    constexpr auto kAsItLikes = static_cast<std::uint32_t>(-1);
    constexpr std::uint32_t kAhead = 8000 * 2 / 20;  // bytes for a twentieth of a second
    constexpr pa_buffer_attr kBuffer = {kAsItLikes, kAhead, 0, kAhead / 4, kAsItLikes};
    stream_.reset(pa_stream_new(context_.get(), "silence", &kFormat, nullptr));
    return stream_ != nullptr &&
           pa_stream_connect_playback(stream_.get(), nullptr, &kBuffer, PA_STREAM_ADJUST_LATENCY,
                                      nullptr, nullptr) >= 0 &&
           WaitUntil([this] { return pa_stream_get_state(stream_.get()) == PA_STREAM_READY; });
  }

 private:
  template <typename Condition>
  bool WaitUntil(Condition condition) {
    const auto end = Clock::now() + kServerLimit;
    while (PA_CONTEXT_IS_GOOD(pa_context_get_state(context_.get())) && !condition() &&
           RunUntil(loop_.get(), end)) {
    }
    return condition();
  }

  const std::unique_ptr<pa_mainloop, FreeWith<pa_mainloop_free>> loop_{pa_mainloop_new()};
  std::unique_ptr<pa_context, FreeWith<pa_context_unref>> context_;
  std::unique_ptr<pa_stream, FreeWith<pa_stream_unref>> stream_;
};

void EndVisit(gpointer visit) { delete static_cast<ServerVisit*>(visit); }

/// Ends a visit some time after, on the thread of GStreamer's clock.
void EndLater(std::unique_ptr<ServerVisit> visit, GstClockTime after) {
  const std::unique_ptr<GstClock, FreeWith<gst_object_unref>> clock(gst_system_clock_obtain());
  const std::unique_ptr<void, FreeWith<gst_clock_id_unref>> timer(
      gst_clock_new_single_shot_id(clock.get(), gst_clock_get_time(clock.get()) + after));
  gst_clock_id_wait_async(
      timer.get(), [](GstClock*, GstClockTime, GstClockID, gpointer) -> gboolean { return TRUE; },
      visit.release(), EndVisit);
}

/// Asked before the sink is made, because a sink without a server fails loudly, and late.
bool IsSoundServerThere() { return ServerVisit().Connect(); }

constexpr char kRoleProperty[] = "media.role";

/// The sink's own mark while it has no stream.
constexpr char kReplacing[] = "zelkora-replacing";

using StructurePtr = std::unique_ptr<GstStructure, FreeWith<gst_structure_free>>;

/// Tells the server what the sink's next stream is: its role, and that it is a player's.
void SetStreamProperties(GstElement* sink, const char* role) {
  const StructurePtr properties(gst_structure_new("properties", kRoleProperty, G_TYPE_STRING, role,
                                                  kPlayerProperty, G_TYPE_STRING, "1", nullptr));
  g_object_set(sink, "stream-properties", properties.get(), nullptr);
}

bool HasRole(GstElement* sink, const char* role) {
  GstStructure* got = nullptr;
  g_object_get(sink, "stream-properties", &got, nullptr);
  const StructurePtr properties(got);
  return std::strcmp(gst_structure_get_string(properties.get(), kRoleProperty), role) == 0;
}

/// Waits until what was written before \p next has been heard: a stream that ends drops it.
void AwaitEnd(GstElement* sink, GstBuffer* next) {
  const GstClockTime begin = gst_segment_to_running_time(&GST_BASE_SINK(sink)->segment,
                                                         GST_FORMAT_TIME, GST_BUFFER_PTS(next));
  const GstClockTime now = gst_element_get_current_running_time(sink);
  if (!GST_CLOCK_TIME_IS_VALID(begin) || !GST_CLOCK_TIME_IS_VALID(now) || begin < now) return;
  const std::chrono::nanoseconds ahead(begin - now);
  std::this_thread::sleep_for(std::min<std::chrono::nanoseconds>(ahead, kWrittenAhead));
}

/// A sink makes a new stream when the caps of its sound change. A field that nobody reads makes
/// them differ.
bool ReplaceStream(GstPad* pad, const char* role) {
  const CapsPtr sound(gst_pad_get_current_caps(pad));
  if (sound == nullptr) return true;
  const CapsPtr marked(gst_caps_copy(sound.get()));
  gst_caps_set_simple(marked.get(), kRoleProperty, G_TYPE_STRING, role, nullptr);
  return gst_pad_send_event(pad, gst_event_new_caps(marked.get()));
}

/// Has a sink's stream follow the session's role. On the streaming thread, which alone uses the
/// sink's properties by then.
///
/// A server's sink without a stream falls asleep, and is then two seconds late to the next one:
/// silence keeps it awake until the new stream is played.
GstPadProbeReturn FollowRole(GstPad* pad, GstPadProbeInfo* sound, gpointer data) {
  auto* sink = static_cast<GstElement*>(data);
  const char* role = GetPlayerRole();
  if (HasRole(sink, role)) return GST_PAD_PROBE_OK;
  auto silence = std::make_unique<ServerVisit>();
  if (silence->Connect()) silence->PlaySilence();
  AwaitEnd(sink, GST_PAD_PROBE_INFO_BUFFER(sound));
  SetStreamProperties(sink, role);
  NoteStreamReplaced();
  g_object_set_data(G_OBJECT(sink), kReplacing, sink);
  const bool isReplaced = ReplaceStream(pad, role);
  g_object_set_data(G_OBJECT(sink), kReplacing, nullptr);
  if (!isReplaced) {
    GST_ELEMENT_ERROR(sink, RESOURCE, FAILED, ("The sound server makes no new stream"), (nullptr));
  }
  EndLater(std::move(silence), kSilenceAfter);
  return GST_PAD_PROBE_OK;
}

/// A pulsesink's clock, which stands still for a moment when a pause ends.
///
/// libpulse 16 takes a stream to run only from some time after it was told to: as long as the last
/// message took to the server. Asked for the stream's time before, it tells one of some 580,000
/// years, and never an earlier one afterwards: the player would stand still for good.
class SinkClock {
 public:
  /// Takes the place of the sink's own one.
  static void Install(GstAudioBaseSink* sink) {
    GstClock*& provided = sink->provided_clock;
    auto clock = std::make_unique<SinkClock>(sink, GST_AUDIO_CLOCK(provided));
    provided = gst_audio_clock_new("zelkora", GetTime, clock.release(), Free);
  }

  /// Takes over \p own.
  SinkClock(const GstAudioBaseSink* sink, GstAudioClock* own) : sink_(sink), own_(own) {}

 private:
  /// Far longer than a message takes, and too short to be seen.
  static constexpr gint64 kMoment = 100 * G_TIME_SPAN_MILLISECOND;

  static constexpr gint64 kPaused = -1;

  /// \return the time; none: the one told last
  static GstClockTime GetTime(GstClock*, gpointer self) {
    auto& clock = *static_cast<SinkClock*>(self);
    GstAudioRingBuffer* stream = clock.sink_->ringbuffer;
    if (stream == nullptr) return GST_CLOCK_TIME_NONE;
    if (g_atomic_int_get(&stream->state) == GST_AUDIO_RING_BUFFER_STATE_PAUSED) {
      clock.resumed_ = kPaused;
      return GST_CLOCK_TIME_NONE;
    }
    const gint64 now = g_get_monotonic_time();
    gint64 resumed = kPaused;
    if (clock.resumed_.compare_exchange_strong(resumed, now)) return GST_CLOCK_TIME_NONE;
    if (now - resumed < kMoment) return GST_CLOCK_TIME_NONE;
    return gst_audio_clock_get_time(clock.own_.get());
  }

  static void Free(gpointer self) { delete static_cast<SinkClock*>(self); }

  const GstAudioBaseSink* sink_;
  std::unique_ptr<GstAudioClock, FreeWith<gst_object_unref>> own_;
  std::atomic<gint64> resumed_{0};
};

/// A name of its own for each sink: sinks of one name share a connection, and with it the end of a
/// server, which would keep new ones from the next server.
std::string MakeClientName() {
  static std::atomic<unsigned> last{0};
  const char* program = g_get_prgname();
  const std::string name = program != nullptr ? program : "zelkora";
  const unsigned number = ++last;
  return number == 1 ? name : name + " " + std::to_string(number);
}

ElementPtr MakePulseSink() {
  ElementPtr sink = MakeElement("pulsesink");
  if (sink == nullptr) return nullptr;
  g_object_set(sink.get(), "client-name", MakeClientName().c_str(), nullptr);
  SinkClock::Install(GST_AUDIO_BASE_SINK(sink.get()));
  SetStreamProperties(sink.get(), GetPlayerRole());
  Observe(sink.get(), "sink", GST_PAD_PROBE_TYPE_BUFFER, FollowRole, sink.get());
  return sink;
}

}  // namespace

bool IsReplacingStream(GstObject* object) {
  return g_object_get_data(G_OBJECT(object), kReplacing) != nullptr;
}

ElementPtr MakeAudioSink() {
  if (IsSoundServerThere()) {
    if (ElementPtr sink = MakePulseSink()) return sink;
  }
  return MakeElement("fakesink sync=true");
}

}  // namespace Desktop
