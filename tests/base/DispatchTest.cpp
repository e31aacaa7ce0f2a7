// The events' dispatch, which only the platform calls. The library's sources are part of this
// program.

#include "managers/Listeners.h"
#include "session/AudioSessionEvent.h"
#include "session/AudioSessionEventArg.h"
#include "volume/AudioVolumeEvent.h"
#include "volume/AudioVolumeEventArg.h"

#include <climits>

namespace {

using namespace Zelkora::Media;

static_assert(std::size(kCategories) == kSoundTypeCount, "a category has no name");

template <typename Event>
struct Dispatch : Event {
  using Event::FireToListener;
};

using DispatchTest = LibraryTest;

TEST_F(DispatchTest, ForeignListenersAndUnknownEventTypesAreLoggedAndSkipped) {
  SessionListener session;
  IAudioVolumeEventListener volume;
  _AudioSessionEventArg sessionArg;
  _AudioVolumeEventArg volumeArg;
  for (const int type : {0, 8, -1, INT_MAX, INT_MIN}) {
    sessionArg.SetEventType(type);
    Dispatch<_AudioSessionEvent>().FireToListener(session, sessionArg);
    volumeArg.SetEventType(type);
    Dispatch<_AudioVolumeEvent>().FireToListener(volume, volumeArg);
    ExpectLeft(kUntouched, Lines(2, "80 info: The event type is wrong."), {});
  }
  const std::string system = "80: [E_SYSTEM] A system error has ";
  Dispatch<_AudioSessionEvent>().FireToListener(volume, sessionArg);
  Dispatch<_AudioVolumeEvent>().FireToListener(session, volumeArg);
  ExpectLeft(E_SYSTEM,
             {system + "been occureed. The value of listener is null.",
              system + "occurred. The value of listener is null."},
             {});
}

}  // namespace
