/// \file
/// Waiting for asynchronous events.
#pragma once

namespace Host {

/// Returns when every event fired before, on any thread, has been delivered and its argument freed;
/// at once when called from a listener.
void WaitUntilDelivered();

}  // namespace Host
