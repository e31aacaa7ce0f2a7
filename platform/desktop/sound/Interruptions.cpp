#include "Interruptions.h"

#include "Reports.h"

#include <utility>

namespace Desktop {
namespace {

/// \return false only for a port that is known to have nothing plugged in
bool IsPlugged(const pa_sink_info& info, const std::string& port) {
  for (std::uint32_t i = 0; i < info.n_ports; ++i) {
    if (info.ports[i]->name == port) return info.ports[i]->available != PA_PORT_AVAILABLE_NO;
  }
  return true;
}

}  // namespace

void DefaultSink::Put(const pa_sink_info& info) {
  const bool isSuspended = info.state == PA_SINK_SUSPENDED;
  if (Is(info.index)) {
    // A sink that is idle may be suspended by the server itself; one that plays only by a program.
    if (WasUnplugged(info)) {
      Tell(Native::ReportInterruption, kOutputGone);
    } else if (isSuspended && !sink_->isSuspended && streams_.IsPlayerHeardOn(info.index)) {
      Tell(Native::ReportInterruption, kTakenOver);
    }
  }
  const std::string port = info.active_port != nullptr ? info.active_port->name : "";
  last_ = info.index;
  sink_ = Sink{info.index, port, IsPlugged(info, port), isSuspended};
  OnMuted(info.mute != 0);
}

/// \return whether what was heard until now has just been unplugged; the server goes on to another
/// port by itself, before or after it tells
bool DefaultSink::WasUnplugged(const pa_sink_info& info) const {
  return sink_->isPlugged && !IsPlugged(info, sink_->port);
}

void DefaultSink::OnRemoved() {
  removed_ = std::exchange(last_, {});
  sink_.reset();
  Tell(Native::ReportInterruption, kOutputGone);
}

void DefaultSink::OnServerLost() {
  sink_.reset();
  last_.reset();
  removed_.reset();
}

void DefaultSink::OnMuted(bool isMuted) {
  const bool changed = isMuted_ && *isMuted_ != isMuted;
  isMuted_ = isMuted;
  if (changed) Tell(Native::ReportMuteAll, isMuted);
}

bool Interruptions::Update() {
  const bool isCall = streams_.IsHeardFromOthers(kCall);
  const bool isInterrupted = isCall || streams_.IsHeardFromOthers(kAlarm);
  if (isInterrupted && started_ == kFinished) {
    started_ = isCall ? kCallStarted : kAlarmStarted;
    Tell(Native::ReportInterruption, started_);
  }
  return (!isInterrupted && started_ != kFinished) || !killed_.empty();
}

void Interruptions::Settle() {
  for (const auto& [stream, sink] : std::exchange(killed_, {})) {
    if (streams_.Has(stream) || defaultSink_.WasRemoved(sink)) continue;
    Tell(Native::ReportInterruption, kTakenOver);
  }
  if (!Update()) return;
  started_ = kFinished;
  Tell(Native::ReportInterruption, kFinished);
}

void Interruptions::OnServerLost() {
  started_ = kFinished;
  killed_.clear();
  Tell(Native::ReportInterruption, kServerLost);
}

void Interruptions::Repeat() const {
  if (started_ != kFinished) Tell(Native::ReportInterruption, started_);
}

}  // namespace Desktop
