/// \file
#pragma once

#include "Interruptions.h"
#include "Streams.h"
#include "Volumes.h"

namespace Desktop {

/// What the server has told, and what follows from it. Under the connection's lock.
struct ServerState {
  Streams streams;
  Volumes volumes{streams};
  DefaultSink defaultSink{streams};
  Interruptions interruptions{streams, defaultSink};
  bool isPipeWire = false;
};

}  // namespace Desktop
