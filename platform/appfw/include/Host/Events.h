/// \file
/// Asynchronous events.
#pragma once

namespace Host {

/// Returns when every event fired before, on any thread, has been delivered and its argument freed;
/// at once when called from a listener.
void WaitUntilDelivered();

/// For a device that is about to fire an event, and only waits for what to say in it: keeps the
/// dispatcher awake for a moment, so that delivery doesn't wait for it to wake up.
void ExpectEvents();

}  // namespace Host
