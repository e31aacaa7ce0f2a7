/// \file
#pragma once

#include <gst/gst.h>
#include <gtest/gtest.h>

/// Lets GStreamer look for leaks when it is told to.
class GstreamerEnd : public testing::Environment {
  void TearDown() override {
    if (gst_is_initialized()) gst_deinit();
  }
};
inline const auto* const kGstreamerEnd = testing::AddGlobalTestEnvironment(new GstreamerEnd);
