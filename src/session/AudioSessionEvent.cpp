#include "AudioSessionEvent.h"

#include "AudioSessionEventArg.h"
#include "base/Log.h"

#include <Zelkora/Media/IAudioSessionEventListener.h>

namespace Zelkora::Media {

result _AudioSessionEvent::Construct() {
  const result r = Initialize();
  return r == E_SUCCESS ? r : Propagate(r);
}

void _AudioSessionEvent::FireToListener(Tizen::Base::Runtime::IEventListener& listener,
                                        const Tizen::Base::Runtime::IEventArg& arg) {
  auto* pListener = dynamic_cast<IAudioSessionEventListener*>(&listener);
  if (pListener == nullptr) {
    Fail(E_SYSTEM, "[E_SYSTEM] A system error has been occureed. The value of listener is null.");
    return;
  }
  switch (static_cast<const _AudioSessionEventTypeArg&>(arg).GetEventType()) {
    case SESSION_EVENT_INTERRUPT_STARTED: return pListener->OnAudioSessionInterruptStarted();
    case SESSION_EVENT_INTERRUPT_FINISHED: return pListener->OnAudioSessionInterruptFinished();
    case SESSION_EVENT_DISRUPTED: return pListener->OnAudioSessionDisrupted();
    default: return LogDiagnostic("The event type is wrong.");
  }
}

}  // namespace Zelkora::Media
