/// \file
#pragma once

#include "Finish.h"
#include "Limiter.h"
#include "Presets.h"
#include "Settings.h"
#include "desktop/player/Gst.h"

#include <array>

namespace Desktop {

/// \return whether the system has what the effect or the presets are made of.
bool IsEffectSupported(int effect);
bool IsPresetSupported(int preset);

/// An element that gives a pipeline's sound its effects: an equalizer for presets, bass and treble,
/// a reverb, what GStreamer has no good element for, and a limiter. It takes any sound and gives
/// stereo in floating point, in which nothing can be clipped between the stages. It is meant to be
/// in the pipeline from the start: neutral settings cost next to nothing and change nothing.
class EffectChain {
 public:
  /// \param settings followed as long as the pipeline runs. They and the chain must outlive its
  /// streaming threads.
  explicit EffectChain(const SharedSettings& settings);

  EffectChain(const EffectChain&) = delete;
  EffectChain& operator=(const EffectChain&) = delete;

  /// \return the element, with the pads "sink" and "src", or null when GStreamer's base plug-ins
  /// are missing.
  GstElement* GetElement() const { return bin_.get(); }

 private:
  static constexpr std::size_t kBassBand = kBandFrequencies.size();
  static constexpr std::size_t kTrebleBand = kBassBand + 1;
  static constexpr std::size_t kBands = kTrebleBand + 1;

  struct Target {
    std::array<double, kBands> gains{};  // in dB
    double reverb = 0;                   // the reverb's share of the sound
    Finish::Parameters finish;
  };

  /// One of the equalizer's.
  struct Band {
    void Shape(int type, double middle, double width) const;
    void MoveTo(double target, double step);

    std::unique_ptr<GObject, FreeWith<g_object_unref>> object;  // null without an equalizer
    double gain = 0;
  };

  GstElement* Append(ElementPtr element);
  void AddEqualizer();
  void AddReverb();
  void Expose(GstElement* element, const char* name);

  static GstPadProbeReturn OnInput(GstPad*, GstPadProbeInfo* info, gpointer chain);
  static GstPadProbeReturn OnOutput(GstPad*, GstPadProbeInfo* info, gpointer chain);
  void Begin(GstEvent* caps);
  void Follow();
  Target FindTarget(const EffectSettings& settings) const;
  void MoveReverb(double share, double step);
  bool IsEqualizerResting() const;

  const SharedSettings& settings_;
  ElementPtr bin_;
  GstElement* last_ = nullptr;    // the bin's, as is the reverb
  GstElement* reverb_ = nullptr;  // null when there is none
  std::array<Band, kBands> bands_;

  // Of the streaming thread.
  int rate_ = 0;
  bool isBeginning_ = true;
  double reverbShare_ = 0;
  Finish finish_;
  Limiter limiter_;
};

}  // namespace Desktop
