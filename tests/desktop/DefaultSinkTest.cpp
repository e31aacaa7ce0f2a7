// Null sinks have no ports, so what the server would tell of headphones is made up here.

#include "desktop/sound/Interruptions.h"
#include "native/Callbacks.h"

#include <sound_manager.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace Desktop {
namespace {

constexpr int kNo = PA_PORT_AVAILABLE_NO;
constexpr int kYes = PA_PORT_AVAILABLE_YES;
constexpr int kUnknown = PA_PORT_AVAILABLE_UNKNOWN;

/// Tells of a sink with headphones and a speaker.
void Tell(DefaultSink& defaultSink, int headphones, bool isSpeakerActive) {
  pa_sink_port_info ports[2] = {};
  ports[0].name = "headphones";
  ports[0].available = headphones;
  ports[1].name = "speaker";
  pa_sink_port_info* list[] = {&ports[0], &ports[1], nullptr};
  pa_sink_info sink = {};
  sink.index = 7;
  sink.state = PA_SINK_RUNNING;
  sink.n_ports = 2;
  sink.ports = list;
  sink.active_port = list[isSpeakerActive ? 1 : 0];
  defaultSink.Put(sink);
}

TEST(Headphones, DisruptWhenTheyAreUnpluggedAndOnlyThen) {
  const struct {
    const char* name;
    int before, after;
    bool goesToSpeaker;
    bool disrupts;
  } rows[] = {
      {"unplugged", kYes, kNo, false, true},
      {"unplugged, which the server has acted on already", kYes, kNo, true, true},
      {"unplugged, of which nothing was known before", kUnknown, kNo, true, true},
      {"plugged in", kNo, kYes, false, false},
      {"not used though plugged in", kYes, kYes, true, false},
      {"left for the speaker, having been unplugged before", kNo, kNo, true, false},
      {"not watched", kUnknown, kUnknown, false, false},
  };
  for (const auto& row : rows) {
    std::vector<int> codes;
    const Streams streams;
    DefaultSink defaultSink(streams);
    const sound_manager_session_interrupted_cb callback = [](int code, void* data) {
      static_cast<std::vector<int>*>(data)->push_back(code);
    };
    Native::SetCallback(Native::Kind::kInterruption, reinterpret_cast<Native::Callback>(callback),
                        &codes);
    Native::BeginReports(Native::Kind::kInterruption);
    Tell(defaultSink, row.before, false);
    for (int i = 0; i < 2; ++i) Tell(defaultSink, row.after, row.goesToSpeaker);
    Native::WaitUntilReported();
    EXPECT_EQ(codes, row.disrupts ? std::vector<int>{3} : std::vector<int>{}) << row.name;
    Native::UnsetCallback(Native::Kind::kInterruption);
  }
}

}  // namespace
}  // namespace Desktop
