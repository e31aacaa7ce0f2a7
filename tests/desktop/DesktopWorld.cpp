#include "SoundServer.h"
#include "support/World.h"

#include <Host/Calls.h>
#include <Host/Capabilities.h>
#include <Host/Events.h>
#include <gtest/gtest.h>
#include <sound_manager.h>

namespace World {
void Reset() {
  static SoundServer server;
  [[maybe_unused]] static const bool isStarted = (server.Start(), true);
  Host::ResetCapabilities();
  Host::ClearFailures();
  Host::RecordCalls(false);
  Host::TakeCalls();
  for (int type = 0; type < 6; ++type) EXPECT_EQ(sound_manager_set_volume(type, 7), 0);
  EXPECT_EQ(sound_manager_set_muteall(false), 0);
  EXPECT_EQ(sound_manager_set_session_type(0), 0);
  EXPECT_EQ(sound_manager_set_media_session_option(0, 0), 0);
  Host::WaitUntilDelivered();
}

std::vector<int> GetCallModes() {
  std::vector<int> modes;
  int number = 0;
  for (const char* mode : {"voice", "ringtone", "media"}) {
    const auto streams = ListStreams(std::string("call.mode = \"") + mode + "\"");
    modes.insert(modes.end(), streams.size(), number++);
  }
  return modes;
}

}  // namespace World
