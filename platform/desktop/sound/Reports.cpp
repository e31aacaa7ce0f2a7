#include "Reports.h"

#include "Log.h"

#include <new>

namespace Desktop {

using Host::Kind;

void Reports::ReportLevel(Category category, int level) noexcept {
  Post(Kind::kVolume, category, level);
}

void Reports::ReportMuteAll(bool isMuted) noexcept { Post(Kind::kMuteAll, isMuted, 0); }

void Reports::ReportInterruption(int code) noexcept { Post(Kind::kInterruption, code, 0); }

void Reports::ExpectLevel() noexcept {
  std::lock_guard lock(mutex_);
  thread_.Expect(Kind::kVolume);
}

void Reports::Post(Kind kind, int first, int second) noexcept try {
  std::lock_guard lock(mutex_);
  thread_.Post({kind, first, second});
} catch (const std::bad_alloc&) {
  LogFailure("A report to the program is lost", "out of memory");
}

}  // namespace Desktop
