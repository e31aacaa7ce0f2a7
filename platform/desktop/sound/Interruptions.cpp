#include "Interruptions.h"

#include <utility>

namespace Desktop {

void Interruptions::Update() {
  const bool isCall = streams_.IsHeardFromOthers(kCall);
  const bool isInterrupted = isCall || streams_.IsHeardFromOthers(kAlarm);
  if (isInterrupted == (started_ != kFinished)) return;
  started_ = !isInterrupted ? kFinished : isCall ? kCallStarted : kAlarmStarted;
  reports_.ReportInterruption(started_);
}

void Interruptions::OnServerLost() {
  started_ = kFinished;
  reports_.ReportInterruption(kServerLost);
}

void Interruptions::Repeat() {
  if (started_ != kFinished) reports_.ReportInterruption(started_);
}

}  // namespace Desktop
