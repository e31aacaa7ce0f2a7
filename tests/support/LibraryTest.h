/// \file
#pragma once

#include "LogCapture.h"

#include <Simulated/Device.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

/// A test of the library on a fresh simulated device, with the log captured and assertions
/// returning.
class LibraryTest : public testing::Test {
 protected:
  LibraryTest() {
    Simulated::Reset();
    Host::SetAssertionAction(Host::AssertionAction::kReturn);
    ClearLastResult();
  }
  ~LibraryTest() override {
    Simulated::WaitUntilDelivered();  // lest the next test hears it
    Simulated::Reset();
  }

  LogCapture log;
};
