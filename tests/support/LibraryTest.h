/// \file
#pragma once

#include "LogCapture.h"
#include "World.h"

#include <Simulated/Device.h>

#include <gmock/gmock.h>

#include <algorithm>

/// The last result before each operation.
inline constexpr result kUntouched = 0xBEEF;

/// A result that has no name.
inline constexpr result kForeign = 0xA0001234;

/// A test of the library on a fresh device, with log and platform calls captured and
/// assertions returning.
class LibraryTest : public testing::Test {
 protected:
  LibraryTest() {
    World::Reset();
    Host::SetAssertionAction(Host::AssertionAction::kReturn);
    Forget();
  }
  ~LibraryTest() override {
    Host::WaitUntilDelivered();  // lest the next test hears it
    World::Reset();
  }

  /// Begins afresh what `ExpectLeft` sees.
  void Forget() {
    log.Take();
    Host::RecordCalls(true);
    SetLastResult(kUntouched);
  }

  /// Expects what was left behind since the last time: last result, log and platform calls, but for
  /// those by which the device's thread passes a change on.
  void ExpectLeft(result last, const Lines& lines, const Lines& calls,
                  int line = __builtin_LINE()) {
    testing::ScopedTrace trace("", line, "what was left behind");
    EXPECT_STREQ(GetErrorMessage(GetLastResult()), GetErrorMessage(last));
    Host::WaitUntilDelivered();
    EXPECT_THAT(log.Take(), testing::ElementsAreArray(lines));
    Lines made = Host::TakeCalls();
    made.erase(std::remove(made.begin(), made.end(), "_Event::FireAsync()"), made.end());
    EXPECT_THAT(made, testing::ElementsAreArray(calls));
    SetLastResult(kUntouched);
  }

  LogCapture log;
};
