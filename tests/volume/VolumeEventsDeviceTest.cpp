// What only the simulated device can be made to do.

#include "Listeners.h"
#include "support/Allocations.h"

#include <climits>
#include <deque>

namespace Zelkora::Media {
namespace {

using VolumeDevice = ManagerTest<Volume>;

TEST_F(VolumeDevice, GuardedOperationsAllocateNothing) {
  Host::RecordCalls(false);
  int min = 0, max = 0;
  const std::size_t before = CountAllocations();
  EXPECT_EQ(manager.SetMediaVolumeLevel(7), E_SUCCESS);
  EXPECT_EQ(manager.GetCurrentMediaVolumeLevel(), 7);
  EXPECT_EQ(manager.GetMediaVolumeRange(min, max), E_SUCCESS);
  EXPECT_EQ(manager.UnmuteAll(), E_SUCCESS);
  EXPECT_EQ(manager.GetMuteStatus(), AUDIO_MUTE_STATUS_UNMUTED);
  EXPECT_EQ(CountAllocations(), before);
}

/// Counts calls; whether they come in order and one at a time shows in a plain integer.
struct Counter : IAudioVolumeEventListener {
  void OnMediaVolumeChanged(int level) override {
    inOrder &= level == count;
    ++count;
  }

  int count = 0;
  bool inOrder = true;
};

/// \return how many changes are reported to that many listeners: `ZELKORA_TEST_SCALE` per cent of a
/// million. Unless the environment says it, 1 and 10 listeners get the whole million and 1,000 a
/// tenth of it, which is 100 million calls; in emulation and under sanitizers, which take some fifty
/// times as long, it is one per cent for all.
int Changes(int listeners) {
  const char* scale = std::getenv("ZELKORA_TEST_SCALE");
  const int usual = listeners < 1000 ? ZELKORA_TEST_SCALE : (ZELKORA_TEST_SCALE + 9) / 10;
  return std::max(10000 * (scale == nullptr ? usual : std::atoi(scale)), 2000);
}

class ManyChanges : public VolumeDevice, public testing::WithParamInterface<int> {};

TEST_P(ManyChanges, AreAllDeliveredInOrderInTheMemoryOfAFewAndUnknownTypesAreLogged) {
  constexpr int kBatch = 1000;
  constexpr std::ptrdiff_t kKeptByTheDevice = 8;  // such as room in its queues
  Host::RecordCalls(false);                       // the record would grow
  const int changes = Changes(GetParam());
  std::deque<Added<Counter>> listeners(static_cast<std::size_t>(GetParam()));
  std::ptrdiff_t live = 0;
  for (int level = 0; level < changes; ++level) {
    Simulated::ReportVolume(4, level);
    if ((level + 1) % kBatch != 0) continue;
    Lines lines;
    for (const int type : {6, -1, INT_MAX, INT_MIN}) {
      Simulated::ReportVolume(type, level);
      lines.push_back("80 info: sound type returned is wrong - " + std::to_string(type));
    }
    Host::WaitUntilDelivered();
    ASSERT_EQ(log.Take(), lines);
    if (level + 1 == kBatch) live = CountLiveAllocations();
    ASSERT_LT(CountLiveAllocations(), live + kKeptByTheDevice);
  }
  for (const Counter& listener : listeners) {
    ASSERT_EQ(listener.count, changes);
    ASSERT_TRUE(listener.inOrder);
  }
}

INSTANTIATE_TEST_SUITE_P(ToListeners, ManyChanges, testing::Values(1, 10, 1000),
                         testing::PrintToStringParamName());

}  // namespace
}  // namespace Zelkora::Media
