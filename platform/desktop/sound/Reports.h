/// \file
#pragma once

#include "Log.h"
#include "native/Reports.h"

#include <array>
#include <cstddef>
#include <new>

namespace Desktop {

/// What the program hears; nothing of it throws. A kind that is silent isn't heard, while its new
/// callback learns how things are: what had changed before it was set is no change to it. Under the
/// connection's lock.
class Reports {
 public:
  using Kind = Native::Kind;

  void ReportLevel(int category, int level) const {
    Report(Kind::kVolume, [=] { Native::ReportLevel(category, level); });
  }
  void ReportMuteAll(bool isMuted) const {
    Report(Kind::kMuteAll, [=] { Native::ReportMuteAll(isMuted); });
  }
  void ReportInterruption(int code) const {
    Report(Kind::kInterruption, [=] { Native::ReportInterruption(code); });
  }

  void Silence(Kind kind) { ++silences_[ToIndex(kind)]; }
  void EndSilence(Kind kind) { --silences_[ToIndex(kind)]; }

 private:
  static std::size_t ToIndex(Kind kind) { return static_cast<std::size_t>(kind); }

  template <typename Function>
  void Report(Kind kind, Function report) const noexcept try {
    if (silences_[ToIndex(kind)] == 0) report();
  } catch (const std::bad_alloc&) {
    LogFailure("A report to the program is lost", "out of memory");
  }

  std::array<int, 3> silences_ = {};
};

}  // namespace Desktop
