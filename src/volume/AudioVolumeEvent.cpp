#include "AudioVolumeEvent.h"

#include "AudioVolumeEventArg.h"
#include "base/Log.h"

#include <Zelkora/Media/IAudioVolumeEventListener.h>

#include <iterator>

namespace Zelkora::Media {
namespace {

using VolumeChanged = void (IAudioVolumeEventListener::*)(int);

/// The listener's operation for each sound type.
constexpr VolumeChanged kVolumeChanged[] = {
    &IAudioVolumeEventListener::OnSystemVolumeChanged,
    &IAudioVolumeEventListener::OnNotificationVolumeChanged,
    &IAudioVolumeEventListener::OnAlarmVolumeChanged,
    &IAudioVolumeEventListener::OnRingtoneVolumeChanged,
    &IAudioVolumeEventListener::OnMediaVolumeChanged,
    &IAudioVolumeEventListener::OnCallVolumeChanged,
};
static_assert(std::size(kVolumeChanged) == kSoundTypeCount);

void Tell(IAudioVolumeEventListener& listener, const _AudioVolumeEventArg& arg) {
  const int type = arg.GetEventType();
  if (type >= VOLUME_EVENT_SYSTEM && type <= kSoundTypeCount) {
    (listener.*kVolumeChanged[type - VOLUME_EVENT_SYSTEM])(arg.GetVolumeLevel());
  } else if (type == VOLUME_EVENT_MUTE) {
    listener.OnMuteAllStatusChanged(arg.GetMuteStatus());
    listener.OnMuteStatusChanged(arg.GetMuteStatus());
  } else {
    LogDiagnostic("The event type is wrong.");
  }
}

}  // namespace

result _AudioVolumeEvent::Construct() {
  const result r = Initialize();
  return r == E_SUCCESS ? r : Propagate(r);
}

void _AudioVolumeEvent::FireToListener(Tizen::Base::Runtime::IEventListener& listener,
                                       const Tizen::Base::Runtime::IEventArg& arg) {
  auto* pListener = dynamic_cast<IAudioVolumeEventListener*>(&listener);
  if (pListener == nullptr) {
    Fail(E_SYSTEM, "[E_SYSTEM] A system error has occurred. The value of listener is null.");
    return;
  }
  Tell(*pListener, static_cast<const _AudioVolumeEventArg&>(arg));
}

}  // namespace Zelkora::Media
