#pragma once

#include <Host/Log.h>
#include <Tizen/Base/Result.h>

#include <functional>
#include <string>

/// The platform's log, held back: a command tells the reason of a failure itself.
namespace CommandLine::DeviceLog {

/// Puts the log in the program's hands, for the rest of its life.
/// \param verbose whether every line is also written to standard error
void Install(bool verbose);

/// \return what `Install` was told.
bool IsVerbose();

/// Shows a line to the user, on the thread that logs.
using Show = std::function<void(const Host::LogRecord& record)>;

/// Gives every line to \p show in place of standard error; null ends that.
void ShowWith(Show show);

/// \return why the device failed with \p r last, or "" when it gave no reason; forgets it.
std::string TakeReason(result r);

}  // namespace CommandLine::DeviceLog
