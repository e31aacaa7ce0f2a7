/// \file
/// The program's callbacks, which are called on a thread of their own, one after the other.
#pragma once

#include "Reports.h"

namespace Native {

struct Report {
  Kind kind;
  int first;   ///< a volume's type, mute-all (0 or 1) or an interruption's code
  int second;  ///< a volume's level
  unsigned registration;
  bool isWithUserData;
};

/// Of a type that belongs to the kind.
using Callback = void (*)();

/// Sets the callback for reports of a kind, those from `BeginReports` on. Throws `std::bad_alloc`
/// or `std::system_error`.
/// \return false when nothing is told any more: in a forked child, and when the process is ending
bool SetCallback(Kind kind, Callback callback, void* userData);

/// Removes it. No call of it is running when this returns, unless this is called from inside a
/// callback.
void UnsetCallback(Kind kind);

/// Drops the reports that are queued.
void DropReports();

/// Whether reports made from now on carry null in place of the program's user data.
void ReportWithoutUserData(bool on);

/// Returns when the reports made before have been delivered; at once when called from a callback.
void WaitUntilReported();

}  // namespace Native
