/// \file
#pragma once

#include "Reports.h"
#include "Streams.h"

namespace Desktop {

/// What is reported as an interruption; README.md tells which events lead to which.
enum InterruptionCode : int {
  kFinished = 0,
  kTakenOver = 1,   ///< The output, or a player's stream, was taken away.
  kOutputGone = 3,  ///< The output was unplugged or vanished.
  kServerLost = 4,
  kCallStarted = 5,
  kAlarmStarted = 6,
};

/// Interruptions by other programs' calls and alarms. They count as one: it starts with the first of
/// them and is finished with the last. Under the loop's lock.
class Interruptions {
 public:
  Interruptions(Reports& reports, const Streams& streams) : reports_(reports), streams_(streams) {}

  /// Compares with the streams that are there now.
  void Update();

  /// A disruption is the end: what ran when the server went is not reported as finished.
  void OnServerLost();

  /// Reports what runs to somebody who came later.
  void Repeat();

 private:
  Reports& reports_;
  const Streams& streams_;
  int started_ = kFinished;  // the code it started with
};

}  // namespace Desktop
