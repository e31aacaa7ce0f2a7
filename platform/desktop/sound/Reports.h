/// \file
#pragma once

#include "Log.h"
#include "native/Reports.h"

#include <new>

namespace Desktop {

/// Reports something to the program by \p report, one of native/Reports.h, without throwing.
template <typename Report, typename... Values>
void Tell(Report report, Values... values) noexcept try {
  report(values...);
} catch (const std::bad_alloc&) {
  LogFailure("A report to the program is lost", "out of memory");
}

}  // namespace Desktop
