/// \file
/// Asynchronous events.
#pragma once

namespace Host {

/// Returns when what the device has been told before has reached the program's callbacks, and every
/// event fired before, on any thread, has been delivered and its argument freed. At once when
/// called from a listener. Not to be called from a device's callback, which it may wait for.
void WaitUntilDelivered();

/// For a device: what `WaitUntilDelivered` calls first, to return when the callbacks have been
/// called.
void SetDeviceWait(void (*wait)());

}  // namespace Host
