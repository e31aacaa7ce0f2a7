// What the desktop player's effects cost: the processor time of a whole film's decoding, as fast as
// it goes, without their chain, with it at rest and with all of it at work. Fails above the limits.

#include "desktop/player/effects/Chain.h"

#include <sys/resource.h>

#include <algorithm>
#include <array>
#include <cstdio>
#include <memory>
#include <random>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

using namespace Desktop;

constexpr int kRounds = 9;
constexpr double kLimitAtRest = 1.1;
constexpr double kLimitAtWork = 1.5;

enum Variant { kWithout, kAtRest, kAtWork };

void Require(bool condition, const char* what) {
  if (!condition) throw std::runtime_error(what);
}

/// Of all threads, in seconds.
double GetProcessorTime() {
  rusage usage{};
  getrusage(RUSAGE_SELF, &usage);
  const auto seconds = [](const timeval& time) {
    return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_usec) * 1e-6;
  };
  return seconds(usage.ru_utime) + seconds(usage.ru_stime);
}

ElementPtr MakeSink() {
  ElementPtr sink = MakeElement("fakesink");
  Require(sink != nullptr, "GStreamer's base plug-ins are missing");
  g_object_set(sink.get(), "sync", FALSE, nullptr);
  return sink;
}

ElementPtr MakePlayer(const std::string& path) {
  ElementPtr player = MakeElement("playbin");
  Require(player != nullptr, "GStreamer's base plug-ins are missing");
  const TextPtr uri(gst_filename_to_uri(path.c_str(), nullptr));
  const ElementPtr videoSink = MakeSink();
  const ElementPtr audioSink = MakeSink();
  constexpr int kNativeVideoAndAudio = 0x1 | 0x40 | 0x2;
  g_object_set(player.get(), "uri", uri.get(), "flags", kNativeVideoAndAudio, "video-sink",
               videoSink.get(), "audio-sink", audioSink.get(), nullptr);
  return player;
}

void PlayToTheEnd(GstElement* player) {
  gst_element_set_state(player, GST_STATE_PLAYING);
  const BusPtr bus(gst_element_get_bus(player));
  GstMessage* end =
      gst_bus_timed_pop_filtered(bus.get(), GST_CLOCK_TIME_NONE,
                                 static_cast<GstMessageType>(GST_MESSAGE_EOS | GST_MESSAGE_ERROR));
  const bool isPlayed = GST_MESSAGE_TYPE(end) == GST_MESSAGE_EOS;
  gst_message_unref(end);
  gst_element_set_state(player, GST_STATE_NULL);
  Require(isPlayed, "the film can't be played");
}

/// \return the processor time in seconds
double Measure(const std::string& path, Variant variant) {
  SharedSettings settings;
  if (variant == kAtWork) {
    for (int effect = kBass; IsEffect(effect); ++effect) settings.SetLevel(effect, 12);
    settings.SetPreset(2);
  }
  EffectChain chain(settings);
  const ElementPtr player = MakePlayer(path);
  if (variant != kWithout) {
    g_object_set(player.get(), "audio-filter", chain.GetElement(), nullptr);
  }
  const double begin = GetProcessorTime();
  PlayToTheEnd(player.get());
  return GetProcessorTime() - begin;
}

double Median(std::vector<double> values) {
  const auto middle = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2);
  std::nth_element(values.begin(), middle, values.end());
  return *middle;
}

bool Report(const char* what, const std::vector<double>& times, double without, double limit) {
  const double ratio = Median(times) / without;
  const bool holds = ratio <= limit;
  std::printf("  %s %.3f s, ratio %.3f, limit %.2f: %s\n", what, Median(times), ratio, limit,
              holds ? "holds" : "EXCEEDED");
  return holds;
}

bool Compare(const std::string& path) {
  std::array<std::vector<double>, 3> times;
  std::array<Variant, 3> order{kWithout, kAtRest, kAtWork};
  std::mt19937 random(1);
  for (const Variant variant : order) Measure(path, variant);  // warms up
  for (int round = 0; round < kRounds; ++round) {
    std::shuffle(order.begin(), order.end(), random);
    for (const Variant variant : order) times[variant].push_back(Measure(path, variant));
  }
  const double without = Median(times[kWithout]);
  std::printf("%s: without effects %.3f s\n", path.c_str(), without);
  const bool holds = Report("at rest", times[kAtRest], without, kLimitAtRest);
  return Report("all at work", times[kAtWork], without, kLimitAtWork) && holds;
}

}  // namespace

int main(int count, char** arguments) {
  if (count < 2) {
    std::fprintf(stderr, "usage: %s FILM...\n", arguments[0]);
    return 2;
  }
  gst_init(nullptr, nullptr);
  try {
    bool holds = true;
    for (int i = 1; i < count; ++i) holds = Compare(arguments[i]) && holds;
    return holds ? 0 : 1;
  } catch (const std::exception& exception) {
    std::fprintf(stderr, "%s\n", exception.what());
    return 2;
  }
}
