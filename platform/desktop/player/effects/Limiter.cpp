#include "Limiter.h"

#include "native/PlayerError.h"

#include <Tizen/Base/Log.h>

#include <algorithm>

namespace Desktop {
namespace {

constexpr const char* kFactory = "ladspa-fast-lookahead-limiter-1913-so-fastlookaheadlimiter";

constexpr double kCeiling = -0.1;  // in dB of full scale
constexpr double kReleaseSeconds = 0.2;
constexpr double kFadeSeconds = 0.005;

constexpr std::size_t kFrameSize = 2 * sizeof(float);

/// A buffer's samples, as long as this lives.
class Samples {
 public:
  Samples(GstBuffer* buffer, GstMapFlags access) : buffer_(buffer) {
    if (!gst_buffer_map(buffer, &map_, access)) map_ = GST_MAP_INFO_INIT;
  }
  ~Samples() {
    if (map_.memory != nullptr) gst_buffer_unmap(buffer_, &map_);
  }

  Samples(const Samples&) = delete;
  Samples& operator=(const Samples&) = delete;

  // Buffers of sound are aligned for any sample.
  float* begin() const { return static_cast<float*>(static_cast<void*>(map_.data)); }
  float* end() const { return begin() + map_.size / sizeof(float); }

 private:
  GstBuffer* const buffer_;
  GstMapInfo map_ = GST_MAP_INFO_INIT;
};

std::size_t CountFrames(GstBuffer* buffer) { return gst_buffer_get_size(buffer) / kFrameSize; }

bool Find() {
  if (IsInstalled(kFactory)) return true;
  SysLogInternal(Host::kPlayerModule, "", __LINE__,
                 "GStreamer's element \"%s\" is missing: effects that make the sound louder than "
                 "full scale cut it off",
                 kFactory);
  return false;
}

}  // namespace

ElementPtr Limiter::MakeElement() {
  static const bool isInstalled = Find();
  return isInstalled ? Desktop::MakeElement(kFactory) : nullptr;
}

void Limiter::Attach(GstElement* element) {
  element_ = element;
  g_object_set(element, "limit", kCeiling, "release-time", kReleaseSeconds, nullptr);
  constexpr int kData = GST_PAD_PROBE_TYPE_BUFFER | GST_PAD_PROBE_TYPE_EVENT_DOWNSTREAM;
  constexpr int kAnswers = GST_PAD_PROBE_TYPE_QUERY_UPSTREAM | GST_PAD_PROBE_TYPE_PULL;
  Observe(element, "sink", kData | GST_PAD_PROBE_TYPE_EVENT_FLUSH, OnInput, this);
  Observe(element, "src", GST_PAD_PROBE_TYPE_BUFFER, OnOutput, this);
  Observe(element, "src", kAnswers, OnLatencyQuery, this);
}

GstPadProbeReturn Limiter::OnInput(GstPad* pad, GstPadProbeInfo* info, gpointer limiter) {
  auto* self = static_cast<Limiter*>(limiter);
  if ((GST_PAD_PROBE_INFO_TYPE(info) & GST_PAD_PROBE_TYPE_BUFFER) != 0) {
    self->Keep(GST_PAD_PROBE_INFO_BUFFER(info));
  } else {
    self->HandleEvent(pad, GST_PAD_PROBE_INFO_EVENT(info));
  }
  return GST_PAD_PROBE_OK;
}

GstPadProbeReturn Limiter::OnOutput(GstPad*, GstPadProbeInfo* info, gpointer limiter) {
  auto* self = static_cast<Limiter*>(limiter);
  GstBuffer* buffer = gst_buffer_make_writable(GST_PAD_PROBE_INFO_BUFFER(info));
  GST_PAD_PROBE_INFO_DATA(info) = buffer;
  if (self->isBeginning_) self->Begin();
  if (!self->Trim(buffer)) return GST_PAD_PROBE_DROP;
  self->Mix(buffer);
  return GST_PAD_PROBE_OK;
}

GstPadProbeReturn Limiter::OnLatencyQuery(GstPad*, GstPadProbeInfo* info, gpointer limiter) {
  GstQuery* query = GST_PAD_PROBE_INFO_QUERY(info);
  if (GST_QUERY_TYPE(query) != GST_QUERY_LATENCY) return GST_PAD_PROBE_OK;
  const GstClockTime own = static_cast<Limiter*>(limiter)->latency_;
  gboolean isLive = FALSE;
  GstClockTime min = 0, max = 0;
  gst_query_parse_latency(query, &isLive, &min, &max);
  const bool isBounded = max != GST_CLOCK_TIME_NONE;
  gst_query_set_latency(query, isLive, min + own, isBounded ? max + own : max);
  return GST_PAD_PROBE_OK;
}

void Limiter::Keep(GstBuffer* buffer) {
  const Samples samples(buffer, GST_MAP_READ);
  waiting_.insert(waiting_.end(), samples.begin(), samples.end());
  const bool isTimed = GST_BUFFER_PTS_IS_VALID(buffer);
  end_ = isTimed ? GST_BUFFER_PTS(buffer) + ToTime(CountFrames(buffer)) : GST_CLOCK_TIME_NONE;
}

void Limiter::HandleEvent(GstPad* pad, GstEvent* event) {
  switch (GST_EVENT_TYPE(event)) {
    case GST_EVENT_FLUSH_STOP: Restart(); break;
    case GST_EVENT_CAPS:
    case GST_EVENT_SEGMENT:
    case GST_EVENT_GAP:
    case GST_EVENT_EOS: Drain(pad); break;
    default: break;
  }
  if (GST_EVENT_TYPE(event) != GST_EVENT_CAPS) return;
  GstCaps* format = nullptr;
  gst_event_parse_caps(event, &format);
  gst_structure_get_int(gst_caps_get_structure(format, 0), "rate", &rate_);
}

/// At a discontinuity the delayed end of the sound so far comes out first.
void Limiter::Drain(GstPad* pad) {
  if (isBeginning_) return;
  GstBuffer* silence = gst_buffer_new_allocate(nullptr, delay_ * kFrameSize, nullptr);
  gst_buffer_memset(silence, 0, 0, delay_ * kFrameSize);
  GST_BUFFER_PTS(silence) = end_;
  gst_pad_chain(pad, silence);
  Restart();
}

void Limiter::Restart() {
  waiting_.clear();
  isBeginning_ = true;
}

/// The plug-in tells its delay with the first sound.
void Limiter::Begin() {
  float frames = 0;
  g_object_get(element_, "latency", &frames, nullptr);
  delay_ = static_cast<std::size_t>(frames);
  skipped_ = 0;
  share_ = isActive_ ? 1 : 0;
  isBeginning_ = false;
  const GstClockTime latency = ToTime(delay_);
  if (latency_.exchange(latency) == latency) return;
  gst_element_post_message(element_, gst_message_new_latency(GST_OBJECT(element_)));
}

/// Takes the delay out of the sound's beginning and of the time stamps.
/// \return false if nothing is left of the buffer
bool Limiter::Trim(GstBuffer* buffer) {
  const std::size_t frames = CountFrames(buffer);
  const std::size_t skip = std::min(delay_ - skipped_, frames);
  skipped_ += skip;
  if (skip == frames) return false;
  gst_buffer_resize(buffer, static_cast<gssize>(skip * kFrameSize), -1);
  GST_BUFFER_OFFSET(buffer) = GST_BUFFER_OFFSET_END(buffer) = GST_BUFFER_OFFSET_NONE;
  GST_BUFFER_DURATION(buffer) = ToTime(frames - skip);
  if (!GST_BUFFER_PTS_IS_VALID(buffer)) return true;
  const GstClockTime time = GST_BUFFER_PTS(buffer) + ToTime(skip);
  GST_BUFFER_PTS(buffer) = time - std::min<GstClockTime>(time, latency_);
  return true;
}

/// Puts what went in, or a part of it, in the place of what the plug-in made of it.
void Limiter::Mix(GstBuffer* buffer) {
  const Samples samples(buffer, GST_MAP_READWRITE);
  const auto original = waiting_.begin();
  const auto end = original + (samples.end() - samples.begin());
  const float target = isActive_ ? 1 : 0;
  if (share_ != target) {
    Fade(samples.begin(), samples.end(), target);
  } else if (!isActive_) {
    std::copy(original, end, samples.begin());
  }
  waiting_.erase(original, end);
}

void Limiter::Fade(float* begin, const float* end, float target) {
  const auto step = static_cast<float>(1 / (kFadeSeconds * rate_));
  auto original = waiting_.begin();
  for (float* frame = begin; frame != end; frame += 2, original += 2) {
    share_ = std::clamp(target, share_ - step, share_ + step);
    frame[0] += (1 - share_) * (original[0] - frame[0]);
    frame[1] += (1 - share_) * (original[1] - frame[1]);
  }
}

GstClockTime Limiter::ToTime(std::size_t frames) const {
  return gst_util_uint64_scale_int_round(frames, GST_SECOND, rate_);
}

}  // namespace Desktop
