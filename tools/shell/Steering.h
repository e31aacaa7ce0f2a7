#pragma once

/// What only the simulated device can do; on another device nothing but `IsPossible` may be called.
namespace CommandLine::Steering {

bool IsPossible() noexcept;

// As the functions of the same names in Simulated/Device.h.
void ReportVolume(int type, int level);
void ReportMuteAll(bool muted);
void Interrupt(int code);

}  // namespace CommandLine::Steering
