#include "AudioSink.h"

#include "sound/Session.h"

#include <pulse/pulseaudio.h>

#include <chrono>

namespace Desktop {
namespace {

using Clock = std::chrono::steady_clock;

/// A local server answers in some milliseconds.
constexpr std::chrono::milliseconds kServerLimit{300};

using MainLoopPtr = std::unique_ptr<pa_mainloop, FreeWith<pa_mainloop_free>>;
using ContextPtr = std::unique_ptr<pa_context, FreeWith<pa_context_unref>>;

/// Runs one turn of the loop, at most until \p end. \return whether there may be another
bool RunUntil(pa_mainloop* loop, Clock::time_point end) {
  using std::chrono::microseconds;
  const auto left = std::chrono::duration_cast<microseconds>(end - Clock::now()).count();
  return left > 0 && pa_mainloop_prepare(loop, static_cast<int>(left)) >= 0 &&
         pa_mainloop_poll(loop) >= 0 && pa_mainloop_dispatch(loop) >= 0;
}

/// Asked before the sink is made, because a sink without a server fails loudly, and late.
bool IsSoundServerThere() {
  const MainLoopPtr loop(pa_mainloop_new());
  if (loop == nullptr) return false;
  const ContextPtr context(pa_context_new(pa_mainloop_get_api(loop.get()), "zelkora"));
  if (context == nullptr) return false;
  if (pa_context_connect(context.get(), nullptr, PA_CONTEXT_NOAUTOSPAWN, nullptr) < 0) return false;

  const auto end = Clock::now() + kServerLimit;
  while (PA_CONTEXT_IS_GOOD(pa_context_get_state(context.get())) &&
         pa_context_get_state(context.get()) != PA_CONTEXT_READY && RunUntil(loop.get(), end)) {
  }
  const bool isThere = pa_context_get_state(context.get()) == PA_CONTEXT_READY;
  pa_context_disconnect(context.get());
  return isThere;
}

/// Tells the server what the stream is: the session's role, and that it is a player's.
void SetStreamProperties(GstElement* sink) {
  const std::unique_ptr<GstStructure, FreeWith<gst_structure_free>> properties(
      gst_structure_new("properties", "media.role", G_TYPE_STRING, GetPlayerRole(), kPlayerProperty,
                        G_TYPE_STRING, "1", nullptr));
  g_object_set(sink, "stream-properties", properties.get(), nullptr);
}

}  // namespace

ElementPtr MakeAudioSink() {
  if (IsSoundServerThere()) {
    if (ElementPtr sink = MakeElement("pulsesink")) {
      SetStreamProperties(sink.get());
      return sink;
    }
  }
  ElementPtr sink = MakeElement("fakesink");
  if (sink != nullptr) g_object_set(sink.get(), "sync", TRUE, nullptr);
  return sink;
}

}  // namespace Desktop
