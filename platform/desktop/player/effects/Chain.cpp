#include "Chain.h"

#include "native/PlayerError.h"

#include <Tizen/Base/Log.h>
#include <gst/base/gstbasetransform.h>

#include <algorithm>
#include <cmath>

namespace Desktop {
namespace {

constexpr const char* kEqualizerFactory = "equalizer-nbands";
constexpr const char* kReverbFactory = "freeverb";

/// The equalizer's kinds of bands.
enum BandType : int { kPeak = 0, kLowShelf = 1, kHighShelf = 2 };

/// Widths as shares of the frequency: of a band an octave, of a shelf the steepest without a bump.
constexpr double kBandWidth = 0.7071;
constexpr double kShelfWidth = 1.6;
constexpr double kBassFrequency = 250;
constexpr double kTrebleFrequency = 4000;

/// As shares of the sample rate: the highest frequencies at which the equalizer's bands and shelves
/// keep their shape.
constexpr double kHighestBand = 0.45;
constexpr double kHighestShelf = 1.0 / 6;

/// What changes from one buffer to the next without being heard as a click.
constexpr double kGainStep = 1;  // in dB
/// While all gains are 0 the equalizer is bypassed; then its filters resume with their old state.
constexpr double kGainStepFromRest = 0.05;
constexpr double kReverbStep = 0.01;
constexpr double kAtOnce = 1000;  // steps as high as this reach any value

/// At the reverb's highest level the room is as loud as the room alone would be.
constexpr double kHighestReverbShare = 0.5;
constexpr double kRoomSize = 0.8;
constexpr double kDamping = 0.3;

constexpr double kHighestSideGain = 2;
constexpr double kHighestCompression = 2.0 / 3;  // three dB become one

constexpr std::size_t kFrameSize = 2 * sizeof(float);

bool Find(const char* factory) {
  if (IsInstalled(factory)) return true;
  SysLogInternal(Host::kPlayerModule, "", __LINE__,
                 "GStreamer's element \"%s\" is missing: effects made with it aren't supported",
                 factory);
  return false;
}

bool HasEqualizer() {
  static const bool has = Find(kEqualizerFactory);
  return has;
}

bool HasReverb() {
  static const bool has = Find(kReverbFactory);
  return has;
}

double Approach(double value, double target, double step) {
  return std::clamp(target, value - step, value + step);
}

}  // namespace

bool IsEffectSupported(int effect) {
  switch (effect) {
    case kBass:
    case kTreble: return HasEqualizer();
    case kReverb: return HasReverb();
    default: return IsEffect(effect);
  }
}

bool IsPresetSupported(int preset) {
  return HasEqualizer() ? IsPreset(preset) : preset == kNeutralPreset;
}

EffectChain::EffectChain(const SharedSettings& settings)
    : settings_(settings), bin_(GST_ELEMENT(gst_object_ref_sink(gst_bin_new("effects")))) {
  GstElement* converter = Append(MakeElement("audioconvert"));
  GstElement* format =
      Append(MakeElement("capsfilter caps=audio/x-raw,format=F32LE,layout=interleaved,channels=2"));
  if (converter == nullptr || format == nullptr) {
    bin_.reset();
    return;
  }
  Observe(format, "src", GST_PAD_PROBE_TYPE_BUFFER | GST_PAD_PROBE_TYPE_EVENT_DOWNSTREAM, OnInput,
          this);
  if (HasEqualizer()) AddEqualizer();
  if (HasReverb()) AddReverb();
  Observe(last_, "src", GST_PAD_PROBE_TYPE_BUFFER, OnOutput, this);
  if (GstElement* limiter = Append(Limiter::MakeElement())) limiter_.Attach(limiter);
  Expose(converter, "sink");
  Expose(last_, "src");
}

/// \return \p element, at the end of the chain and owned by the bin, or null if it is.
GstElement* EffectChain::Append(ElementPtr element) {
  if (element == nullptr) return nullptr;
  gst_bin_add(GST_BIN(bin_.get()), element.get());
  if (last_ != nullptr) gst_element_link(last_, element.get());
  last_ = element.get();
  return last_;
}

void EffectChain::AddEqualizer() {
  GstElement* equalizer = Append(MakeElement(kEqualizerFactory));
  if (equalizer == nullptr) return;
  g_object_set(equalizer, "num-bands", static_cast<guint>(kBands), nullptr);
  for (std::size_t i = 0; i < kBands; ++i) {
    bands_[i].object.reset(
        gst_child_proxy_get_child_by_index(GST_CHILD_PROXY(equalizer), static_cast<guint>(i)));
  }
  for (std::size_t i = 0; i < kBandFrequencies.size(); ++i) {
    bands_[i].Shape(kPeak, kBandFrequencies[i], kBandWidth);
  }
  bands_[kBassBand].Shape(kLowShelf, kBassFrequency, kShelfWidth);
}

void EffectChain::AddReverb() {
  reverb_ = Append(MakeElement(kReverbFactory));
  if (reverb_ == nullptr) return;
  g_object_set(reverb_, "level", 0.0, "room-size", kRoomSize, "damping", kDamping, nullptr);
  gst_base_transform_set_passthrough(GST_BASE_TRANSFORM(reverb_), TRUE);
}

void EffectChain::Expose(GstElement* element, const char* name) {
  const PadPtr pad(gst_element_get_static_pad(element, name));
  gst_element_add_pad(bin_.get(), gst_ghost_pad_new(name, pad.get()));
}

GstPadProbeReturn EffectChain::OnInput(GstPad*, GstPadProbeInfo* info, gpointer chain) {
  auto* self = static_cast<EffectChain*>(chain);
  if ((GST_PAD_PROBE_INFO_TYPE(info) & GST_PAD_PROBE_TYPE_BUFFER) != 0) {
    self->Follow();
  } else if (GST_EVENT_TYPE(GST_PAD_PROBE_INFO_EVENT(info)) == GST_EVENT_CAPS) {
    self->Begin(GST_PAD_PROBE_INFO_EVENT(info));
  }
  return GST_PAD_PROBE_OK;
}

GstPadProbeReturn EffectChain::OnOutput(GstPad*, GstPadProbeInfo* info, gpointer chain) {
  Finish& finish = static_cast<EffectChain*>(chain)->finish_;
  if (finish.IsResting()) return GST_PAD_PROBE_OK;
  GstBuffer* buffer = gst_buffer_make_writable(GST_PAD_PROBE_INFO_BUFFER(info));
  GST_PAD_PROBE_INFO_DATA(info) = buffer;
  GstMapInfo map;
  if (gst_buffer_map(buffer, &map, GST_MAP_READWRITE)) {
    // Buffers of sound are aligned for any sample.
    finish.Process(static_cast<float*>(static_cast<void*>(map.data)), map.size / kFrameSize);
    gst_buffer_unmap(buffer, &map);
  }
  return GST_PAD_PROBE_OK;
}

/// Sound of another format begins: nothing that was heard goes on, so that settings hold at once.
void EffectChain::Begin(GstEvent* caps) {
  GstCaps* format = nullptr;
  gst_event_parse_caps(caps, &format);
  gst_structure_get_int(gst_caps_get_structure(format, 0), "rate", &rate_);
  bands_[kTrebleBand].Shape(kHighShelf, std::min(kTrebleFrequency, rate_ * kHighestShelf),
                            kShelfWidth);
  finish_.SetRate(rate_);
  isBeginning_ = true;
}

/// Leads the elements a step further to what is chosen.
void EffectChain::Follow() {
  const Target target = FindTarget(settings_.Get());
  const double step = IsEqualizerResting() ? kGainStepFromRest : kGainStep;
  for (std::size_t i = 0; i < kBands; ++i) {
    bands_[i].MoveTo(target.gains[i], isBeginning_ ? kAtOnce : step);
  }
  MoveReverb(target.reverb, isBeginning_ ? kAtOnce : kReverbStep);
  isBeginning_ ? finish_.BeginAt(target.finish) : finish_.MoveTo(target.finish);
  limiter_.SetActive(!IsEqualizerResting() || reverbShare_ != 0 || !finish_.IsResting());
  isBeginning_ = false;
}

EffectChain::Target EffectChain::FindTarget(const EffectSettings& settings) const {
  const Preset& preset = kPresets[static_cast<std::size_t>(settings.preset)];
  Target target;
  for (std::size_t i = 0; i < kBandFrequencies.size(); ++i) {
    const bool isHeld = kBandFrequencies[i] < rate_ * kHighestBand;
    target.gains[i] = isHeld ? preset.gains[i] : 0;
  }
  target.gains[kBassBand] = settings.GetLevel(kBass);
  target.gains[kTrebleBand] = settings.GetLevel(kTreble);
  if (reverb_ != nullptr) {
    const int percent = std::min(settings.GetLevel(kReverb) + preset.reverb, 100);
    target.reverb = percent * kHighestReverbShare / 100;
  }
  // The reverb lowers what it is added to.
  const double gain = std::pow(10, preset.gain / 20) / (1 - target.reverb);
  target.finish.gain = static_cast<float>(gain);
  target.finish.sideGain =
      static_cast<float>(1 + (kHighestSideGain - 1) * settings.GetLevel(kStereoWidth) / 100);
  target.finish.compression =
      static_cast<float>(kHighestCompression * settings.GetLevel(kDynamics) / 100);
  return target;
}

void EffectChain::Band::Shape(int type, double middle, double width) const {
  if (object == nullptr) return;
  g_object_set(object.get(), "type", type, "freq", middle, "bandwidth", width * middle, "gain",
               gain, nullptr);
}

bool EffectChain::IsEqualizerResting() const {
  return std::all_of(bands_.begin(), bands_.end(), [](const Band& band) { return band.gain == 0; });
}

void EffectChain::Band::MoveTo(double target, double step) {
  if (gain == target || object == nullptr) return;
  gain = Approach(gain, target, step);
  g_object_set(object.get(), "gain", gain, nullptr);
}

void EffectChain::MoveReverb(double share, double step) {
  if (reverbShare_ == share) return;
  reverbShare_ = Approach(reverbShare_, share, step);
  g_object_set(reverb_, "level", reverbShare_, nullptr);
  // It doesn't rest by itself.
  gst_base_transform_set_passthrough(GST_BASE_TRANSFORM(reverb_), reverbShare_ == 0);
}

}  // namespace Desktop
