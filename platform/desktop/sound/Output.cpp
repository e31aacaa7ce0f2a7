#include "Output.h"

#include "Interruptions.h"

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

void Output::OnTold(const pa_sink_info& info) {
  const bool isSuspended = info.state == PA_SINK_SUSPENDED;
  if (Is(info.index)) {
    if (WasUnplugged(info)) reports_.ReportInterruption(kOutputGone);
    // A sink that is idle may be suspended by the server itself; one that plays only by a program.
    if (isSuspended && !sink_->isSuspended && streams_.IsPlayerHeardOn(info.index)) {
      reports_.ReportInterruption(kTakenOver);
    }
  }
  const std::string port = info.active_port != nullptr ? info.active_port->name : "";
  sink_ = Sink{info.index, port, IsPlugged(info, port), isSuspended};
  OnMuted(info.mute != 0);
}

/// \return whether what was heard until now has just been unplugged; the server goes on to another
/// port by itself, before or after it tells
bool Output::WasUnplugged(const pa_sink_info& info) const {
  return sink_->isPlugged && !IsPlugged(info, sink_->port);
}

void Output::OnRemoved() {
  sink_.reset();
  reports_.ReportInterruption(kOutputGone);
}

void Output::OnMuted(bool isMuted) {
  const bool changed = isMuted_ && *isMuted_ != isMuted;
  isMuted_ = isMuted;
  if (changed) reports_.ReportMuteAll(isMuted);
}

}  // namespace Desktop
