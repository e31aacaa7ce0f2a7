/// \file
/// What native/ gives a device's sound manager: reports to the program, and the program's session.
#pragma once

namespace Native {

enum class Kind { kVolume, kMuteAll, kInterruption };

/// \name Reports
/// Queued for the program's callback, if there is one, which is called on another thread: a device
/// may report with its own lock held. Throw `std::bad_alloc`, with nothing done.
/// @{
void ReportLevel(int type, int level);
void ReportMuteAll(bool isMuted);
void ReportInterruption(int code);
/// @}

/// From now on, reports of a kind are for the callback that was set last.
void BeginReports(Kind kind);

/// The session's settings, which native/ keeps.
struct Session {
  int type = 0;
  int options[2] = {0, 0};
};

Session GetSession();
void SetSession(const Session& session);

}  // namespace Native
